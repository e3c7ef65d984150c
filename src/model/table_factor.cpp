#include "model/table_factor.h"

#include "model/factor_lists.h"

#include <algorithm>
#include <cstdlib>
#include <vector>

namespace ingester {

namespace {

/// Level values that are present, and no two the same.
bool Tell_Levels_Apart(const Sheet& table, std::span<const Column* const> columns)
{
    std::vector<double> values;
    for (const Column* column : columns) {
        if (!Is_Present(table, column->table_margin_value))
            return false;
        values.push_back(column->table_margin_value);
    }
    std::sort(values.begin(), values.end());
    return std::adjacent_find(values.begin(), values.end()) == values.end();
}

}  // namespace

void Take_Column_Factor_Look(const Sheet& table, Column& factor)
{
    factor.extra = table.column_label_name.view();
    if (table.column_factor_format == 0)
        return;  // nothing was said
    factor.format = table.column_factor_format;
    factor.decimals = table.column_factor_decimals;
    factor.date_format = std::abs(table.column_factor_date);
    factor.date_form = static_cast<std::int16_t>(table.column_factor_date < 0);
}

void Keep_As_Column_Factor(Sheet& table, const Column& factor)
{
    table.row_label_name = factor.name.view();
    table.column_label_name = factor.extra.view();
    table.column_factor_format = factor.format;
    table.column_factor_decimals = factor.decimals;
    table.column_factor_date = factor.date_form == 0 ? factor.date_format : -factor.date_format;
}

bool Take_Column_Levels(const Sheet& table, std::span<const Column* const> columns, Column& factor)
{
    const std::int32_t state = table.label_state;
    const bool valued = state != labels_by_text && Tell_Levels_Apart(table, columns);
    const bool labelled = state >= labels_by_text || (state == labels_by_level && !valued);
    factor.nlevels = static_cast<std::int32_t>(columns.size());
    if (columns.empty()
        || !Put_Level_Values(factor, valued ? factor.nlevels : 0,
                             [column = columns.begin()]() mutable { return (*column++)->table_margin_value; })
        || !Put_Labels(factor, labelled ? factor.nlevels : 0, [&, column = columns.begin()]() mutable {
               return factor.texts.Store(Label_Text(**column++));
           }))
        return false;
    factor.factor_kind = Factor_Kind_Of(factor);
    return true;
}

}  // namespace ingester

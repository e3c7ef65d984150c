#include "model/join/column_copies.h"

#include "model/factor_lists.h"
#include "model/factors.h"
#include "model/names.h"

namespace ingester {

namespace {

std::int32_t Plain_Type(std::int32_t type)
{
    return type == units_text_column ? text_column : type == units_variate_column ? variate_column : type;
}

}  // namespace

Column* Copy_Column_Aside(const Column& column)
{
    Sheet* const current = Current_Sheet;
    Sheet* const aside = New_Sheet();
    Current_Sheet = current;
    aside->settings = column.sheet->settings;
    aside->missing_value = column.sheet->missing_value;
    Column* const copy = New_Data_Column(aside, Plain_Type(column.type), column.name, column.length);
    if (copy == nullptr)
        return nullptr;
    const Cell_Node* from = column.first_cell;  // texts stay where they are: the request keeps them
    for (Cell_Node* cell = copy->first_cell; cell != nullptr && from != nullptr; cell = cell->next) {
        cell->value = from->value;
        from = from->next;
    }
    copy->format = column.format;
    copy->decimals = column.decimals;
    copy->date_form = column.date_form;
    copy->date_format = column.date_format;
    aside->row_count = column.length;
    aside->rows_due = true;
    return copy;
}

bool Has_Data(const Column& column)
{
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        if (Cell_Is_Present(column, *cell))
            return true;
    return false;
}

namespace {

/// Values that only count aren't kept by themselves.
bool List_Values(Column& factor)
{
    if (factor.level_values_count > 0)
        return true;
    if (!Put_Level_Values(factor, factor.nlevels, [level = 0.0]() mutable { return ++level; }))
        return false;
    factor.factor_kind = Factor_Kind_Of(factor);
    return true;
}

}  // namespace

bool Turn_Into_Factor(Column& copy, bool ignore_case)
{
    if (Is_Text_Like(copy.type))
        return Text_To_Factor(&copy, ignore_case, false, 0);
    copy.type = variate_column;
    if (Has_Data(copy))
        return Variate_To_Factor(&copy, true, 0) && List_Values(copy);
    copy.type = factor_column;
    copy.nlevels = 0;
    return true;
}

namespace {

/// The type by which a Sheet takes data like those of `source`; `row_column` when it can't.
std::int32_t Type_In(const Sheet& sheet, const Column& source)
{
    const bool has_units = sheet.leading_columns > 1;
    switch (sheet.type) {
    case vector_sheet:
        if (Is_Text_Like(source.type) || source.type == factor_column)
            return has_units ? Plain_Type(source.type) : source.type;
        return variate_column;
    case table_sheet:
        return sheet.has_margins != 0 || Is_Text_Like(source.type) ? row_column : table_column;
    case matrix_sheet:
        return Is_Text_Like(source.type) ? row_column : matrix_column;
    case diagonal_matrix_sheet:
        return row_column;  // it has one column of data
    default:
        return source.type;
    }
}

void Copy_Look(Column& column, const Column& source)
{
    column.format = source.format;
    column.justify = source.justify;
    column.date_format = source.date_format;
    column.date_form = source.date_form;
    column.width = source.width;
    column.extra = source.extra;
    column.range_low = source.range_low;
    column.range_high = source.range_high;
    column.decimals = source.decimals;
    if (column.type == factor_column)
        column.factor_kind = source.factor_kind;
    Change_Missing_Value(&column, column.sheet->missing_value, source.sheet->missing_value);
}

}  // namespace

Column* Add_Column_Like(Sheet& sheet, const Column& source)
{
    const std::int32_t type = Type_In(sheet, source);
    if (type == row_column)
        return nullptr;
    Column_Request wanted{type, source.name, source.decimals, source.nlevels, ""};
    if (source.type == factor_column) {
        wanted.level_values = source.level_values;
        wanted.level_values_count = source.level_values_count;
        wanted.labels = source.labels;
        wanted.label_count = source.label_count;
    }
    Column* const column = Add_Column(&sheet, wanted, sheet.column_count + 1, true);
    if (column == nullptr)
        return nullptr;
    Copy_Look(*column, source);
    if (column->type == factor_column)  // one of the labels may be empty
        for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            cell->value.number = sheet.missing_value;
    return column;
}

}  // namespace ingester

#include "model/convert_column.h"

#include "model/factors.h"
#include "model/text_columns.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

bool Turn_Units(Column* column, std::int32_t from, std::int32_t to)
{
    if (column == nullptr || column->type != from)
        return false;
    Set_Column_Type(*column, to);
    return true;
}

/// No column but `Row` stands at the head.
bool Head_Is_Free(const Column& column)
{
    return column.sheet->leading_columns <= 1;
}

bool Turn_Into_Units(Column* column, std::int32_t from, std::int32_t to, std::int32_t format)
{
    if (column == nullptr || column->type != from || !Head_Is_Free(*column) || column->sheet->read_only != 0)
        return false;
    Set_Column_Type(*column, to);
    column->format = format;
    return true;
}

}  // namespace

bool Units_Variate_To_Variate(Column* column)
{
    return Turn_Units(column, units_variate_column, variate_column);
}

bool Units_Text_To_Text(Column* column)
{
    return Turn_Units(column, units_text_column, text_column);
}

bool Variate_To_Units(Column* column)
{
    return Turn_Into_Units(column, variate_column, units_variate_column, significant_digits_format);
}

bool Text_To_Units(Column* column)
{
    return Turn_Into_Units(column, text_column, units_text_column, general_format);
}

namespace {

struct Label_Rules {
    bool by_case_free;
    bool trim;
};

struct Conversion {
    std::int32_t from;
    std::int32_t to;
    bool (*convert)(Column& column, const Label_Rules& rules);
};

bool To_Labels(Column& column, const Label_Rules& rules)
{
    return Text_To_Factor(&column, rules.by_case_free, rules.trim, 0);
}

bool To_Levels(Column& column, const Label_Rules&)
{
    return Variate_To_Factor(&column, true, 0);
}

bool To_Text(Column& column, const Label_Rules&)
{
    return Variate_To_Text(&column);
}

bool To_Numbers(Column& column, const Label_Rules&)
{
    return Text_Column_To_Number(&column);
}

constexpr Conversion Conversions[] = {
    {units_variate_column, variate_column,
     [](Column& column, const Label_Rules&) { return Units_Variate_To_Variate(&column); }},
    {units_variate_column, text_column, To_Text},
    {units_variate_column, factor_column, To_Levels},
    {units_text_column, text_column,
     [](Column& column, const Label_Rules&) { return Units_Text_To_Text(&column); }},
    {units_text_column, factor_column, To_Labels},
    {units_text_column, variate_column, To_Numbers},
    {factor_column, units_variate_column,
     [](Column& column, const Label_Rules&) {
         return Head_Is_Free(column) && Factor_To_Variate(&column, false) && Variate_To_Units(&column);
     }},
    {factor_column, units_text_column,
     [](Column& column, const Label_Rules&) {
         return Head_Is_Free(column) && Factor_To_Text(&column, true) && Text_To_Units(&column);
     }},
    {factor_column, text_column, [](Column& column, const Label_Rules&) { return Factor_To_Text(&column); }},
    {factor_column, variate_column,
     [](Column& column, const Label_Rules&) { return Factor_To_Variate(&column, true); }},
    {variate_column, text_column, To_Text},
    {variate_column, factor_column, To_Levels},
    {variate_column, units_variate_column,
     [](Column& column, const Label_Rules&) { return Variate_To_Units(&column); }},
    {text_column, variate_column, To_Numbers},
    {text_column, factor_column, To_Labels},
    {text_column, units_text_column,
     [](Column& column, const Label_Rules&) { return Text_To_Units(&column); }},
};

}  // namespace

bool Convert_Column(Column* column, std::int32_t from, std::int32_t to, bool by_case_free, bool trim)
{
    if (column == nullptr || column->type != from)
        return false;
    if (from == to)
        return true;
    if (column->sheet->read_only != 0 || column->protected_column != 0)
        return false;  // silent by design
    const std::int32_t family = from == long_text_column ? text_column : from;
    const auto* const way =
        std::find_if(std::begin(Conversions), std::end(Conversions), [&](const Conversion& conversion) {
            return conversion.from == family && conversion.to == to;
        });
    if (way == std::end(Conversions))
        return false;
    Mark_Column_Changed(column, true);
    return way->convert(*column, {by_case_free, trim});
}

}  // namespace ingester

#include "model/number_format.h"

#include "model/date_format.h"
#include "request/people_rules.h"
#include "request/request.h"
#include "support/number_text.h"

#include <algorithm>
#include <cmath>

namespace ingester {

namespace {

constexpr int Default_Digits = 6;  // of "%g", "%e" and "%f"
constexpr int Most_Decimals = 40;

/// "%.{decimals}g" where the digits in front of the point leave room for it, else "%g".
char* Print_Significant(char* target, double value, std::int32_t decimals)
{
    const double size = std::fabs(value);
    if (size >= 1e-12 && size <= 1e12 && std::fabs(std::trunc(std::log10(size)) + 1.0) < decimals)
        return Print_General(target, value, decimals);
    return Print_General(target, value, Default_Digits);
}

}  // namespace

char* Format_Number(char* target, double value, std::int32_t format, std::int32_t decimals, double missing)
{
    if (!(value > missing)) {
        *target = '*';
        return target + 1;
    }
    decimals = std::min(decimals, Most_Decimals);
    switch (format) {
    case significant_digits_format:
        return Print_Significant(target, value, decimals);
    case exponent_format:
        return Print_Exponent(target, value, decimals < 1 ? Default_Digits : decimals);
    case fixed_format:
        return Print_Fixed(target, value, decimals < 0 ? Default_Digits : decimals);
    case date_format_mark:
        return Format_Date_Time(target, value, request.Current_Date_Form, request.Current_Date_Format);
    default:
        return Print_General(target, value, Default_Digits);
    }
}

char* Format_Cell_Number(char* target, const Column& column, double value)
{
    if (column.format == date_format_mark && Is_Present(*column.sheet, value))
        return Format_Date_Time(target, value, column.date_form, column.date_format);
    return Format_Number(target, value, column.format, column.decimals, column.sheet->missing_value);
}

namespace {

constexpr int Usual_Digits = 15;

/// All digits that tell a number from others, where fifteen don't.
char* Print_In_Full(char* target, double value)
{
    char* const end = Print_General(target, value, Usual_Digits);
    double back;
    const bool enough = Whole_Number_Text({target, end}, back) && back == value;
    return enough ? end : Print_Shortest(target, value);
}

bool Decides_Itself(const Column& column, double value)
{
    return column.decimals >= 0 || column.format == date_format_mark || !Is_Present(*column.sheet, value);
}

}  // namespace

char* Format_Cell_Fully(char* target, const Column& column, double value)
{
    if (Decides_Itself(column, value))
        return Format_Cell_Number(target, column, value);
    return For_People(People_Rule::kept_levels) ? Print_In_Full(target, value)
                                                : Print_General(target, value, Usual_Digits);
}

char* Format_Level_Value(char* target, const Column& factor, double value)
{
    return Decides_Itself(factor, value) ? Format_Cell_Number(target, factor, value)
                                         : Print_In_Full(target, value);
}

std::string_view Factor_Label_Or_Level(const Column& column, std::int32_t level, char* target)
{
    const Level_Node* node = column.factor_kind == factor_with_labels   ? column.labels
                             : column.factor_kind == factor_with_levels ? column.level_values
                                                                        : nullptr;
    for (std::int32_t i = 1; i < level && node != nullptr; ++i)
        node = node->next;
    if (node != nullptr && column.factor_kind == factor_with_labels)
        return node->Text();
    char* const end = node != nullptr ? Format_Level_Value(target, column, node->value.number)
                                      : Print_Integer(target, level);
    return {target, static_cast<std::size_t>(end - target)};
}

std::string_view Format_Cell(const Column& column, const Cell_Node& cell, char* target)
{
    if (Is_Text_Like(column.type))
        return cell.Text();
    const double value = cell.value.number;
    if (column.type != factor_column)
        return {target, static_cast<std::size_t>(Format_Cell_Fully(target, column, value) - target)};
    if (Cell_Is_Present(column, cell) && value <= column.nlevels)
        return Factor_Label_Or_Level(column, static_cast<std::int32_t>(value), target);
    *target = '*';
    return {target, column.factor_kind == factor_with_labels ? 0U : 1U};
}

}  // namespace ingester

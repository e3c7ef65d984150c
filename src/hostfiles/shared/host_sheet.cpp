#include "hostfiles/shared/host_sheet.h"

#include <algorithm>
#include <bit>
#include <cmath>

namespace ingester {

namespace {

/// All but the lowest byte.
std::uint64_t Upper_Bytes(double value)
{
    return std::bit_cast<std::uint64_t>(value) >> 8;
}

}  // namespace

bool Is_Missing_In_File(double value, double sheet_missing)
{
    if (!std::isfinite(value))
        return true;
    if (value >= Least_Sure_Number)
        return false;
    return !(value > sheet_missing) || !(value > Missing_Value)
           || Upper_Bytes(value) == Upper_Bytes(sheet_missing)
           || Upper_Bytes(value) == Upper_Bytes(Missing_Value);
}

double Missing_Marker(double value)
{
    constexpr double first_level = 1.0;
    return std::isfinite(value) && value < first_level ? value : Missing_Value;
}

std::string_view Name_Or_Label(const Column& column)
{
    const std::int32_t state = column.sheet->label_state;
    const bool by_text = state == labels_by_text || state == labels_by_text_and_level;
    return column.type == table_column && by_text ? Label_Text(column) : column.name.view();
}

std::int32_t Label_State_In_File(const Sheet& sheet)
{
    return std::clamp<std::int32_t>(sheet.label_state, labels_by_position,
                                    sheet.type == table_sheet ? labels_by_text_and_level : labels_by_text);
}

void Set_Margin_Level(Sheet& sheet)
{
    const Column* const last_leading = Column_At(&sheet, sheet.leading_columns - 1);
    if (sheet.type == table_sheet && sheet.has_margins != 0 && last_leading != nullptr
        && last_leading->type == factor_column)
        sheet.margin_level = last_leading->nlevels + 1;
}

bool Has_Range_Limits(const Column& column)
{
    const Sheet& sheet = *column.sheet;
    if (column.type == row_column || column.type == factor_column || Is_Text_Like(column.type)
        || (!Is_Present(sheet, column.range_low) && !Is_Present(sheet, column.range_high)))
        return false;
    const bool each_its_own = sheet.type == vector_sheet || sheet.type == scalar_sheet
                              || (sheet.type == table_sheet && sheet.table_ways == 1);
    return each_its_own || column.index == sheet.leading_columns
           || (column.type == units_variate_column && column.index == 1);
}

bool Define_Pointer(Sheet* sheet, std::string_view name, std::int32_t kind)
{
    constexpr std::int32_t removal = 8;
    if (sheet == nullptr)
        return false;
    auto found = std::ranges::find(sheet->pointers, name, &Host_Pointer::name);
    if (kind == removal) {
        if (found == sheet->pointers.end())
            return false;
        sheet->pointers.erase(found);
        return true;
    }
    if (found == sheet->pointers.end())
        found = sheet->pointers.insert(found, Host_Pointer{.name = std::string(name), .members = {}});
    found->kind = kind;
    found->members.clear();
    if (kind != 0)
        return true;
    for (const Column* column = sheet->first_column; column != nullptr; column = column->next)
        if (column->range_selected != 0)
            found->members.emplace_back(column->name.view());
    return true;
}

}  // namespace ingester

// What the host's spreadsheet file and its book hold in common.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <limits>
#include <string_view>

namespace ingester {

/// A finite number from here on is present in any file; what is below may be a missing marker.
constexpr double Least_Sure_Number = -1e36;

[[nodiscard]] constexpr bool Is_Surely_Present(double value)
{
    return value >= Least_Sure_Number && value <= std::numeric_limits<double>::max();
}

/// Whether a number of a file stands for "missing" in a Sheet that marks it by `sheet_missing`. Markers
/// may have lost their lowest byte to a rounding.
[[nodiscard]] bool Is_Missing_In_File(double value, double sheet_missing);

/// A number as files hold it.
[[nodiscard]] inline double Number_In_File(double value, const Sheet& sheet)
{
    return !Is_Surely_Present(value) && Is_Missing_In_File(value, sheet.missing_value) ? Missing_Value
                                                                                       : value;
}

/// A Table whose columns are labelled: one of two or more ways.
[[nodiscard]] inline bool Is_Many_Way_Table(const Sheet& sheet)
{
    return sheet.type == table_sheet && sheet.table_ways >= 2;
}

/// The marker that a file gives must lie below the numbers and the levels that it is told from.
[[nodiscard]] double Missing_Marker(double value);

/// What files name a column by: the label, in a Table whose columns are labelled by texts. May be empty.
[[nodiscard]] std::string_view Name_Or_Label(const Column& column);

/// The state of a Sheet's labels as files hold it: one without a code of its own is that of columns named
/// by their place.
[[nodiscard]] std::int32_t Label_State_In_File(const Sheet& sheet);

/// Tells the margin from the levels of the last classifying Factor, when all columns are there.
void Set_Margin_Level(Sheet& sheet);

/// Whether the files hold limits of the values that a Column shows. The body of a Sheet other than a
/// Vector, a Scalar or a one-way Table shares one pair, on its first data column.
[[nodiscard]] bool Has_Range_Limits(const Column& column);

/// Adds a pointer to the Sheet or replaces it; kind 8 removes it. The members of kind 0 are the columns
/// that are marked by `range_selected`. False for a pointer to remove that isn't there.
bool Define_Pointer(Sheet* sheet, std::string_view name, std::int32_t kind);

/// Turns names of pointer members with quoted suffixes, `stem['text']`, into numbered ones, and keeps the
/// texts in `extra`. Nothing happens while suffixes become numbers by themselves.
void Restore_Pointer_Names(Sheet* sheet);

/// Turns Factors whose labels are all genotype codes into Factors of the codes in one order and in the
/// colours of genotypes.
void Recode_Genotype_Factors(Sheet* sheet);

/// Levels that a recoded Factor's cells may have, more than it has labels at times.
constexpr std::int32_t Greatest_Genotype_Level = 6;

}  // namespace ingester

// The one way in which text enters a cell.
#pragma once

#include "model/sheet.h"
#include "support/letters.h"

#include <string_view>

namespace ingester {

/// Whether `text` means "missing": none at all (null) does. No other does while
/// `Missing_Input_Text` is empty; otherwise blanks do, and that text in any case.
[[nodiscard]] bool Is_Missing_Text(std::string_view text);

/// Puts `text` into a cell by its column's type: text is kept up to the cell's width, a Factor takes
/// the level that the text names, anything else the number or the date that it is, or the missing value.
void Set_Cell_From_Text(Column& column, Cell_Node& cell, std::string_view text);

/// The same by row number, from 0. False where there is no such cell.
bool Set_Cell_From_Text(Column* column, std::int32_t row, std::string_view text);

/// A Text column becomes Long Text when `text` is too wide for a cell of it.
inline void Make_Room_For(Column& column, std::string_view text)
{
    if (column.type == text_column && Has_More_Letters(text, Text_Cell_Width)) [[unlikely]]
        column.type = long_text_column;
}

/// Puts a text that a file holds as it stands into a cell of a text-like column, which becomes Long Text with
/// the first that needs it. What is wider still is cut, and entered in the ledger with `row` (from 1; 0:
/// none).
void Set_Wide_Text(Column& column, Cell_Node& cell, std::string_view text, std::int64_t row = 0);

/// The number a numeric cell takes from `text`: plain decimal, with a "*" behind it allowed; out of
/// range or anything else is `missing`. At most `Greatest_Number`.
[[nodiscard]] double Cell_Number(std::string_view text, double missing);

/// The same, or the date in a column of dates; the Sheet's missing value for anything else.
[[nodiscard]] double Number_Or_Date(const Column& column, std::string_view text);

}  // namespace ingester

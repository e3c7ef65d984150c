// The list file beside an input that renames, retypes and drops its columns, and the one that is written.
//
// A text: a count of names (or none), and one line a column; a blank line keeps the name, "*" drops the
// column, and marks tell what it becomes: ":D" and ":T" dates and times, ":E" and ":n" how its numbers are
// shown, "!" a Factor, "#" a Variate, "$" Text. Structures with a name of their own take one more line.
// A list that begins with a line "@names" has lines "old=new" instead, for some columns in any order.
#pragma once

#include "model/sheet.h"
#include "platform/files.h"

#include <string_view>

namespace ingester {

/// The first line of a list that goes by the columns' own names.
constexpr std::string_view By_Names_Line = "@names";

/// Takes the types that a list's marks ask for into `Column_Wanted_Types`, for the reader. Nothing happens
/// when there is no such file; false when it is there and can't be read.
[[nodiscard]] bool Read_Var_File(std::string_view file_name);

/// Carries out a list on what was read. Names too many, or of no column, are told. False when the
/// list can't be read.
[[nodiscard]] bool Apply_Var_File(Sheet* sheet, std::string_view file_name);
/// The same from an open list; always true.
bool Apply_Var_List(Sheet& sheet, Input_File& file);

/// Writes the names of the columns, or of the structure, as a list that `/v` takes; into the
/// temporary folder when `file_name` can't be made. False, and no such list, when neither can.
bool Write_Var_File(const Sheet& sheet, std::string_view file_name);

}  // namespace ingester

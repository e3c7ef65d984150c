// What the writers of the structures share.
#pragma once

#include "hostfiles/script/script_text.h"
#include "model/sheet.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace ingester {

// --- One for each type of Sheet; false when there is nothing to declare ------------------------

bool Write_Vector_Script(Sheet& sheet, Script_Buffer& script);
bool Write_Matrix_Script(Sheet& sheet, Script_Buffer& script);
bool Write_Symmetric_Script(Sheet& sheet, Script_Buffer& script);
bool Write_Diagonal_Script(Sheet& sheet, Script_Buffer& script);
bool Write_Table_Script(Sheet& sheet, Script_Buffer& script);
bool Write_Scalar_Script(Sheet& sheet, Script_Buffer& script);

// --- Columns -----------------------------------------------------------------------------------

/// Declares a column of a Vector and reads its data. False for a type that no Vector has.
bool Write_Column_Script(Column& column, Script_Buffer& script);

/// Declares a Factor with its levels, for `length` units.
void Write_Factor_Declaration(Column& column, std::int32_t length, Script_Buffer& script);

/// What the declaration calls it.
[[nodiscard]] std::string Factor_Name(const Column& column);

/// Restricts the columns to the included rows, or frees them from an older restriction.
[[nodiscard]] bool Write_Restrictions(Sheet& sheet, Script_Buffer& script);

/// The first column of `type`, or null.
Column* First_Of_Type(const Sheet& sheet, std::int32_t type);

// --- Pieces ------------------------------------------------------------------------------------

/// "DELETE [redefine=yes] name" and a line feed.
void Write_Delete(std::string_view name, Script_Buffer& script);

/// "READ name", on a new line and with a line feed behind it.
void Write_Read(std::string_view name, Script_Buffer& script);

/// `before` and the first name, then a comma and a name for each further one. An item is a name or
/// whatever `name_of` takes one from; `before` goes once.
template <class Names, class Name_Of>
void Write_Names(std::string_view before, const Names& items, Name_Of name_of, Script_Buffer& script)
{
    Write_Statement(before, script);
    bool first = true;
    for (const auto& item : items) {
        const std::string_view name = name_of(item);
        Write_Statement(first ? std::string(name) : std::string(",").append(name), script);
        first = false;
    }
}

/// How the attributes of a structure are spelled.
struct Attribute_Words {
    std::string_view decimals;
    std::string_view extra;
    std::string_view date;
};
constexpr Attribute_Words Small_Words = {"; decimals=", "; extra=", "; drep="};
constexpr Attribute_Words Capital_Words = {"; DECIMALS=", "; EXTRA=", "; DREP="};

/// Each writes what its column has set.
void Write_Decimals(const Column& column, const Attribute_Words& words, Script_Buffer& script);
void Write_Extra(const Column& column, const Attribute_Words& words, Script_Buffer& script);
void Write_Date_Format(const Column& column, const Attribute_Words& words, Script_Buffer& script);
void Write_Attributes(const Column& column, const Attribute_Words& words, Script_Buffer& script);

/// Serial dates go out in the host's day count.
[[nodiscard]] Script_Number_Form Number_Form_Of(const Column& column);

/// "'text' " for each cell.
void Write_Data_Texts(const Cell_Node* first, Script_Buffer& script);

/// Where a sweep by rows stands in a column.
struct Cell_Position {
    const Cell_Node* cell;
    Script_Number_Form form;
};

/// The first cell of a column.
[[nodiscard]] Cell_Position Start_Of(const Column& column);

/// The next cell of each column, a missing value where one has no more.
void Write_Next_Cells(std::span<Cell_Position> positions, Script_Buffer& script);

}  // namespace ingester

// Files and Sheets of the text tests.
#pragma once

#include "model/cell_text.h"
#include "platform/folders.h"
#include "support/number_text.h"

#include <fstream>
#include <iterator>
#include <string>
#include <vector>

namespace ingester {

using Texts = std::vector<std::string>;

inline std::string Temp_Name(const char* name)
{
    return Get_Temp_Folder() + name;
}

inline std::string Content_Of(const std::string& name)
{
    std::ifstream file(Native_Path(name), std::ios::binary);
    return {std::istreambuf_iterator<char>(file), {}};
}

/// Adds a column with a cell for each text.
inline Column* Add_Cells(Sheet* sheet, std::int32_t type, const std::string& name, const Texts& cells)
{
    Column* const column = New_Data_Column(sheet, type, name, static_cast<std::int32_t>(cells.size()));
    for (std::size_t row = 0; row < cells.size(); ++row)
        Set_Cell_From_Text(column, static_cast<std::int32_t>(row), cells[row]);
    return column;
}

/// "*" for a missing number; texts of 90 and more as their length.
inline std::string Render(const Column& column, const Cell_Node& cell)
{
    if (Is_Text_Like(column.type))
        return cell.Text().size() < 90 ? std::string(cell.Text())
                                       : std::to_string(cell.Text().size()) + " characters";
    char text[Number_Text_Room];
    const double value = cell.value.number;
    return Is_Present(*column.sheet, value) ? std::string(text, Print_General(text, value, 15)) : "*";
}

/// A column as "V1|*|3" or "Tx||y": the first letter of its type (L for Long Text) and its cells.
inline std::string Render(const Column& column)
{
    std::string text(column.type == long_text_column ? "L" : Column_Type_Name(column).substr(0, 1));
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        text.append(cell == column.first_cell ? "" : "|").append(Render(column, *cell));
    return text;
}

/// All columns, as "name V1|*|3; name Tx||y".
inline std::string Render(const Sheet* sheet)
{
    std::string text;
    for (const Column* column = sheet->first_column->next; column != nullptr; column = column->next)
        text.append(text.empty() ? "" : "; ").append(column->name).append(" ").append(Render(*column));
    return text;
}

}  // namespace ingester

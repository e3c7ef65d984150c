// Cells, level values and labels from plain lists, and Sheets as texts.
#pragma once

#include "model/cell_text.h"
#include "support/number_text.h"
#include "support/request_fixture.h"

namespace ingester {

/// Adds a column with a cell for each text.
inline Column* Add_Cells(Sheet* sheet, std::int32_t type, const std::string& name, const Texts& cells)
{
    Column* const column = New_Data_Column(sheet, type, name, static_cast<std::int32_t>(cells.size()));
    for (std::size_t row = 0; row < cells.size(); ++row)
        Set_Cell_From_Text(column, static_cast<std::int32_t>(row), cells[row]);
    return column;
}

/// A column in a Sheet of its own.
inline Column* Lone_Column(std::int32_t type, const Texts& cells)
{
    return Add_Cells(New_Sheet_With_Rows(static_cast<std::int32_t>(cells.size())), type, "x", cells);
}

/// Makes `column` a Factor with these level values, these labels, or one of each for a level.
inline void Put_Levels(Column& column, const std::vector<double>& values, const Texts& labels = {})
{
    column.factor_kind = labels.empty() ? factor_with_levels : factor_with_labels;
    column.nlevels = static_cast<std::int32_t>(std::max(values.size(), labels.size()));
    EXPECT_EQ(Make_Level_Values(column, static_cast<std::int32_t>(values.size())), !values.empty());
    EXPECT_EQ(Make_Labels(column, static_cast<std::int32_t>(labels.size())), !labels.empty());
    const double* value = values.data();
    for (Level_Node* node = column.level_values; node != nullptr; node = node->next)
        node->value.number = *value++;
    const std::string* label = labels.data();
    for (Level_Node* node = column.labels; node != nullptr; node = node->next)
        node->value.text = column.texts.Store(*label++);
}

[[nodiscard]] inline std::vector<double> Numbers_Of(const Column& column)
{
    std::vector<double> numbers;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        numbers.push_back(cell->value.number);
    return numbers;
}

/// Of all columns, the Row column's first.
[[nodiscard]] inline Texts Names_Of(const Sheet* sheet)
{
    Texts names;
    for (const Column* column = sheet->first_column; column != nullptr; column = column->next)
        names.emplace_back(column->name.view());
    return names;
}

/// "*" for a missing number; texts of 90 and more as their length.
inline std::string Render(const Column& column, const Cell_Node& cell)
{
    char number[Number_Text_Room];
    if (Is_Text_Like(column.type))
        return cell.Text().size() < 90 ? std::string(cell.Text())
                                       : std::to_string(cell.Text().size()) + " characters";
    if (!Is_Present(*column.sheet, cell.value.number))
        return "*";
    return {number, Print_General(number, cell.value.number, 15)};
}

/// All columns, as "name V1|*|3; name Tx||y": the first letter of the type (L for Long Text) and the cells.
inline std::string Render(const Sheet* sheet, bool with_names = true)
{
    std::string text;
    const Column* column = sheet == nullptr ? nullptr : sheet->first_column->next;
    for (; column != nullptr; column = column->next) {
        text.append(text.empty() ? "" : "; ").append(with_names ? std::string(column->name) + " " : "");
        text.append(column->type == long_text_column ? "L" : Column_Type_Name(*column).substr(0, 1));
        for (const Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            text.append(cell == column->first_cell ? "" : "|").append(Render(*column, *cell));
    }
    return text;
}

}  // namespace ingester

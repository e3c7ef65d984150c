// Cells, level values and labels from and to plain lists.
#pragma once

#include "model/sheet.h"

#include <string>
#include <vector>

namespace ingester {

inline void Put_Numbers(Cell_Node* first, const std::vector<double>& numbers)
{
    for (const double number : numbers) {
        first->value.number = number;
        first = first->next;
    }
}

inline void Put_Texts(Column& column, Cell_Node* first, const std::vector<std::string>& texts)
{
    for (const std::string& text : texts) {
        first->value.text = column.texts.Store(text);
        first = first->next;
    }
}

/// Makes `column` a Factor with these level values, and with these labels if there are any.
inline bool Put_Levels(Column& column, const std::vector<double>& values,
                       const std::vector<std::string>& labels = {})
{
    column.nlevels = static_cast<std::int32_t>(values.size());
    column.factor_kind = labels.empty() ? factor_with_levels : factor_with_labels;
    if (!Make_Level_Values(column, column.nlevels) || !Make_Labels(column, column.nlevels))
        return false;
    Put_Numbers(column.level_values, values);
    Put_Texts(column, column.labels, labels);
    return true;
}

[[nodiscard]] inline std::vector<double> Numbers_Of(const Column& column)
{
    std::vector<double> numbers;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        numbers.push_back(cell->value.number);
    return numbers;
}

}  // namespace ingester

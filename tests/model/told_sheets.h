// Sheets from words, and Factors in words, beside what `Render` tells.
#pragma once

#include "support/cell_lists.h"
#include "support/check_sheet.h"

namespace ingester {

[[nodiscard]] inline Texts Split(const std::string& text, const std::string& separator)
{
    Texts parts;
    for (std::size_t at = 0, end = 0; end != text.npos; at = end + separator.size()) {
        end = text.find(separator, at);
        parts.push_back(text.substr(at, end - at));
    }
    return parts;
}

/// A Sheet of columns as `Render` tells them: "name V1|*; name Tx|". Row labels are U for texts and N for
/// numbers, and B is a Table's column.
[[nodiscard]] inline Sheet* Sheet_Of(const std::string& told, std::int32_t type = vector_sheet)
{
    constexpr std::string_view letters = "VTLFSMYBUN";
    constexpr std::int32_t types[] = {variate_column,          text_column,   long_text_column,
                                      factor_column,           scalar_column, matrix_column,
                                      symmetric_matrix_column, table_column,  units_text_column,
                                      units_variate_column};
    Sheet* sheet = nullptr;
    for (const std::string& column : Split(told, "; ")) {
        const std::size_t at = column.find(' ') + 1;
        const Texts cells = Split(column.substr(at + 1), "|");
        if (sheet == nullptr)
            sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(cells.size()));
        sheet->type = type;
        Add_Cells(sheet, types[letters.find(column[at])], column.substr(0, at - 1), cells);
    }
    return sheet;
}

/// "#2" for two levels without lists, else as "a,b", "10,20" or "a=10,b=20".
[[nodiscard]] inline std::string Levels_Of(const Column& factor)
{
    const Level_Node* label = factor.labels;
    const Level_Node* value = factor.level_values;
    std::string text = label == nullptr && value == nullptr ? "#" + std::to_string(factor.nlevels) : "";
    while (label != nullptr || value != nullptr) {
        text.append(text.empty() ? "" : ",").append(label != nullptr ? label->Text() : "");
        text.append(label != nullptr && value != nullptr ? "=" : "");
        text.append(value != nullptr ? Format_Text("%g", value->value.number) : "");
        label = label != nullptr ? label->next : nullptr;
        value = value != nullptr ? value->next : nullptr;
    }
    return text;
}

}  // namespace ingester

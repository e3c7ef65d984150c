// What the types of columns mean for their place in a Sheet.
#pragma once

#include "model/sheet.h"

#include <cstdint>

namespace ingester {

/// Columns that a Matrix or a Table has one of for each of its labels.
[[nodiscard]] inline bool Holds_Labels(std::int32_t type)
{
    return type == matrix_column || type == symmetric_matrix_column || type == table_column
           || type == table_margin_column;
}

[[nodiscard]] inline bool Is_Units(std::int32_t type)
{
    return type == units_text_column || type == units_variate_column;
}

[[nodiscard]] inline bool Is_Any_Matrix(const Sheet& sheet)
{
    return sheet.type == matrix_sheet || sheet.type == symmetric_matrix_sheet
           || sheet.type == diagonal_matrix_sheet;
}

/// Long texts in a Matrix are those of its units.
[[nodiscard]] inline bool Is_Leading(const Sheet& sheet, std::int32_t type)
{
    return type == row_column || Is_Units(type) || (type == factor_column && sheet.type == table_sheet)
           || (type == long_text_column && Is_Any_Matrix(sheet));
}

}  // namespace ingester

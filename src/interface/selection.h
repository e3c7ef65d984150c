// Which columns and rows of what was read go on.
#pragma once

#include "model/sheet.h"

#include <cstdint>

namespace ingester {

/// Removes the rows without data; the last one stays. Warns when all are empty.
bool Delete_Empty_Rows(Sheet* sheet);

enum class Subset_Result : std::uint8_t { kept, no_columns, no_rows };

/// Leaves the columns and rows of the request's lists, where the reader of the input's `type` hasn't done so
/// already. Names of
/// the list that aren't there are told.
[[nodiscard]] Subset_Result Apply_Subset(Sheet* sheet, std::int32_t type);

/// Keeps the data columns from `first` to `last`, counted from 1; below 1 is the first. Columns that
/// aren't there are told. False after a message when nothing would be kept.
bool Keep_Column_Range(Sheet* sheet, std::int32_t first, std::int32_t last);

}  // namespace ingester

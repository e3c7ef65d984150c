// Which columns and rows of what was read go on.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <string_view>

namespace ingester {

/// Removes the rows without data; the last one stays. Warns when all are empty.
bool Delete_Empty_Rows(Sheet* sheet);

/// Keeps the data columns from `first` to `last`, counted from 1; below 1 is the first. Columns that
/// aren't there are told. False after a message when nothing would be kept.
bool Keep_Column_Range(Sheet* sheet, std::int32_t first, std::int32_t last);

/// Writes the names of the columns, or of the structure, as a list that `/v` takes; into the
/// temporary folder when `file_name` can't be made. False when neither can.
bool Write_Var_File(const Sheet& sheet, std::string_view file_name);

}  // namespace ingester

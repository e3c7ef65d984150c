// What the columns of a Sheet hold, told to the user.
#pragma once

#include "model/sheet.h"

#include <string>
#include <string_view>

namespace ingester {

/// Writes a description of every column to standard output. `output_name` is what the Sheet goes to.
bool Print_Column_Summary(const Sheet* sheet, std::string_view output_name);

/// The text of it.
[[nodiscard]] std::string Column_Summary_Text(const Sheet& sheet, std::string_view output_name);

}  // namespace ingester

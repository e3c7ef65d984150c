// The list files that name the columns and rows to keep.
#pragma once

#include <string_view>

namespace ingester {

/// Reads and deletes a list of columns into `Subset_Names`: a count, a line whose first character
/// is "V" for names or anything else for numbers, and one entry a line. False when it can't be read.
[[nodiscard]] bool Read_Column_Subset(std::string_view name);

/// Reads and deletes a list of flags into `Subset_Row_Flags`: a count, and one integer a line for
/// each row of the input, 0 to drop it. False when it can't be read.
[[nodiscard]] bool Read_Row_Subset(std::string_view name);

}  // namespace ingester

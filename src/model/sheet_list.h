// The list of a file's sheets, which is a Sheet itself.
#pragma once

#include <string>
#include <vector>

namespace ingester {

/// Makes a Sheet of the names, in the column "Worksheets"; it becomes the `Current_Sheet`. False where there
/// is none, or no memory.
[[nodiscard]] bool Make_Sheet_List(const std::vector<std::string>& names);

}  // namespace ingester

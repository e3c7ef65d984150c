// Which sheet of an existing output a request adds to.
#pragma once

#include <string>

namespace ingester {

/// Finds the sheet of the output that the new data are joined with: the one that was asked for, or of the
/// name of the sheet that was asked of the input, or the first one, which is told. `Update_Sheet_Name` and
/// `Output_Sheet_Name` take its name, and `Sheet_Already_There` tells whether it is there. False when the
/// sheets can't be listed.
[[nodiscard]] bool Find_Output_Sheet(const std::string& output_name);

}  // namespace ingester

// `ingester sheets FILE`: the sheets that a file holds.
#pragma once

namespace ingester {

/// Prints the names of the sheets, a line each. Arguments are those behind "sheets". Returns the exit
/// status.
[[nodiscard]] int Run_Sheets(int argc, const char* const* argv);

}  // namespace ingester

// `ingester formats`: what this build reads and writes.
#pragma once

namespace ingester {

/// Prints the formats, as a table or as JSON. Arguments are those behind "formats". Returns the exit
/// status.
[[nodiscard]] int Run_Formats(int argc, const char* const* argv);

}  // namespace ingester

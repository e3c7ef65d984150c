// The host that the library needs: it writes the request, calls, and tells the user what came of it.
#pragma once

#include "command/options.h"

namespace ingester {

/// Runs one conversion. Returns the exit status.
[[nodiscard]] int Run_Command(const Command_Options& options);

}  // namespace ingester

// `ingester info` and `ingester head`: what a file holds, and how it begins.
#pragma once

#include "command/options.h"
#include "interface/sheet_viewer.h"

namespace ingester {

/// What shows the table that was read; none for tasks that write it.
[[nodiscard]] Sheet_Viewer Viewer_Of(const Command_Options& options);

}  // namespace ingester

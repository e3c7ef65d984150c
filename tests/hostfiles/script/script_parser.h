// Reads a script as the host would, from its text alone, so that tests see what a Sheet has become.
#pragma once

#include <string>

namespace ingester {

/// What the script leaves in the host, one line each: structures as "KIND name option=... attribute=...:
/// values", with "|" between the values, and what else it does. Structures that only feed another one
/// show there. The last line begins with "FAULT" when the host would stumble.
[[nodiscard]] std::string Run_Script(const std::string& script);

}  // namespace ingester

// Reads a script as the host would, from its text alone, so that tests see what it is told.
#pragma once

#include <string>

namespace ingester {

/// The script without comments and without the breaks that only its lines need; texts stand in their quotes
/// as the host takes them. Behind "FAULT", why the host would stumble.
[[nodiscard]] std::string Heard_Of(const std::string& script);

}  // namespace ingester

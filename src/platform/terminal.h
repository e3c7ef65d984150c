// The terminal that standard output may be.
#pragma once

#include <cstddef>

namespace ingester {

/// Places in a line of it; 0 where standard output is no terminal.
[[nodiscard]] std::size_t Terminal_Width();

}  // namespace ingester

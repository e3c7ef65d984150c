// How far two words are from each other.
#pragma once

#include <cstddef>
#include <string_view>

namespace ingester {

/// How many letters must be put in, taken out or changed to make one text of the other. Takes as many steps
/// as the product of their lengths.
[[nodiscard]] std::size_t Edit_Distance(std::string_view a, std::string_view b);

}  // namespace ingester

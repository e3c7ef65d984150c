// Numbers as they stand in files.
#pragma once

#include <algorithm>
#include <array>
#include <bit>
#include <string>

namespace ingester {

template <class T> std::string Bytes_Of(T value, std::endian order)
{
    auto bytes = std::bit_cast<std::array<char, sizeof(T)>>(value);
    if (order != std::endian::native)
        std::ranges::reverse(bytes);
    return {bytes.begin(), bytes.end()};
}

}  // namespace ingester

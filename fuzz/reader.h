// What the target of a reader is put together from.
#pragma once

#include "platform/files.h"

#include <cstddef>
#include <span>
#include <string_view>

namespace ingester {

/// Sets options of the request by the first bytes, which are cut off; gives the name of the file that the
/// others are. Each file in prepare/ defines it; a target has one of them.
[[nodiscard]] std::string_view Prepare_Input(std::span<const std::byte>& bytes);

/// The reader that the target's row names.
[[nodiscard]] bool Read_Input(Input_File& file);

/// Cuts `size` characters off the front and gives them; nothing, and cuts nothing, where there are fewer.
[[nodiscard]] inline std::span<const std::byte> Take_Head(std::span<const std::byte>& bytes, std::size_t size)
{
    if (bytes.size() < size)
        return {};
    const auto head = bytes.first(size);
    bytes = bytes.subspan(size);
    return head;
}

/// The choice that one character of the head makes among `count`; '0' is the first.
[[nodiscard]] inline std::size_t Choice(std::byte character, std::size_t count)
{
    return (std::to_integer<std::size_t>(character) & 15U) % count;
}

}  // namespace ingester

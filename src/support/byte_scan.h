// Quick looks at many bytes: where some characters stand, and which occur at all.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// A set of bytes, made for finding its members in long texts.
class Byte_Finder {
public:
    Byte_Finder() = default;
    explicit Byte_Finder(std::string_view members);

    [[nodiscard]] bool Holds(char c) const { return holds_[static_cast<unsigned char>(c)]; }

    /// Writes the offsets in `text` of all members to `offsets`, which has room for `text.size()`
    /// rounded up to 64. Returns how many there are. Fewer than 4 GB at a time. `ascii` becomes false when a
    /// byte is beyond ASCII.
    std::size_t Find_All(std::string_view text, std::uint32_t* offsets, bool& ascii) const;

private:
    std::array<bool, 256> holds_{};
    std::string members_;
};

}  // namespace ingester

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
    /// rounded up to 64. Returns how many there are. Fewer than 4 GB at a time.
    std::size_t Find_All(std::string_view text, std::uint32_t* offsets) const;

private:
    std::array<bool, 256> holds_{};
    std::string members_;
};

/// What a text is made of, found in one pass.
struct Text_Facts {
    std::int64_t line_feeds = 0;
    std::int64_t returns = 0;       ///< CR
    std::int64_t return_feeds = 0;  ///< CR with LF behind it
    bool empty_lines = false;       ///< LF at the start, or behind another line end
    bool nuls = false;
    bool tabs = false;
    bool commas = false;
    bool double_quotes = false;
    bool single_quotes = false;
    std::size_t longest_line = 0;  ///< from one LF to the next; not told below 64
};

[[nodiscard]] Text_Facts Look_At_Text(std::string_view text);

}  // namespace ingester

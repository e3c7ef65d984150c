// Text of a fixed greatest width, as the host's records hold it.
#pragma once

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

/// At most `Width` bytes and a NUL. Longer text is cut in `assign`, and nowhere else.
template <std::size_t Width> class Fixed_Text {
public:
    static constexpr std::size_t width = Width;

    constexpr Fixed_Text() = default;
    constexpr Fixed_Text(std::string_view text) { assign(text); }
    constexpr Fixed_Text(const char* text) { assign(text); }

    constexpr Fixed_Text& operator=(std::string_view text)
    {
        assign(text);
        return *this;
    }

    // A literal would otherwise convert as well to a view as to a text.
    constexpr Fixed_Text& operator=(const char* text) { return *this = std::string_view(text); }

    /// Takes up to the first NUL of `text`, cut at the width. `text` may lie inside this one.
    constexpr void assign(std::string_view text)
    {
        text = text.substr(0, std::min(text.find('\0'), Width));
        std::copy(text.begin(), text.end(), bytes_.begin());
        length_ = static_cast<std::uint16_t>(text.size());
        bytes_[length_] = '\0';
    }

    /// Puts `text` behind what is held, cut at the width.
    constexpr void append(std::string_view text)
    {
        text = text.substr(0, std::min(text.find('\0'), Width - length_));
        std::copy(text.begin(), text.end(), bytes_.begin() + length_);
        length_ = static_cast<std::uint16_t>(length_ + text.size());
        bytes_[length_] = '\0';
    }

    constexpr void clear() { assign({}); }
    [[nodiscard]] constexpr bool empty() const { return length_ == 0; }
    [[nodiscard]] constexpr std::size_t size() const { return length_; }
    [[nodiscard]] constexpr std::string_view view() const { return {bytes_.data(), length_}; }
    [[nodiscard]] constexpr const char* c_str() const { return bytes_.data(); }
    constexpr operator std::string_view() const { return view(); }

    friend constexpr bool operator==(const Fixed_Text& a, std::string_view b) { return a.view() == b; }

private:
    static_assert(Width < 65536);
    std::array<char, Width + 1> bytes_{};
    std::uint16_t length_ = 0;
};

}  // namespace ingester

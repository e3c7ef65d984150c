// Text of a fixed greatest width, as the host's records hold it.
#pragma once

#include "support/letters.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>
#include <type_traits>

namespace ingester {

/// At most `Width` letters and a NUL. Longer text is cut in `assign` and `append`, and nowhere else.
/// A text of more than `Width` bytes, which only letters beyond ASCII make, lies on the heap: so a Column is
/// no larger than names in ASCII make it.
template <std::size_t Width> class Fixed_Text {
public:
    static constexpr std::size_t width = Width;

    constexpr Fixed_Text() = default;
    constexpr Fixed_Text(std::string_view text) { assign(text); }
    constexpr Fixed_Text(const char* text) { assign(text); }
    constexpr Fixed_Text(const Fixed_Text& other) { Take(other.view()); }
    constexpr Fixed_Text& operator=(const Fixed_Text& other)
    {
        Take(other.view());
        return *this;
    }
    constexpr ~Fixed_Text() { delete[] long_bytes_; }

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
        text = text.substr(0, text.find('\0'));
        Take(text.size() <= Width ? text : Cut(text, Width));
    }

    /// Puts `text` behind what is held, cut at the width.
    constexpr void append(std::string_view text)
    {
        text = text.substr(0, text.find('\0'));
        if (length_ + text.size() > Width)
            text = Cut(text, Width - std::min(Count(view()), Width))
                       .substr(0, Width * Longest_Letter - length_);  // of malformed letters
        const std::size_t length = length_ + text.size();
        char* const bytes = length > Width ? Long_Bytes() : bytes_.data();
        if (length > Width && length_ <= Width)
            std::copy_n(bytes_.data(), length_, bytes);
        std::copy(text.begin(), text.end(), bytes + length_);
        End_At(bytes, length);
    }

    constexpr void clear() { assign({}); }
    [[nodiscard]] constexpr bool empty() const { return length_ == 0; }
    /// In bytes.
    [[nodiscard]] constexpr std::size_t size() const { return length_; }
    [[nodiscard]] constexpr std::string_view view() const { return {c_str(), length_}; }
    [[nodiscard]] constexpr const char* c_str() const
    {
        return length_ > Width ? long_bytes_ : bytes_.data();
    }
    constexpr operator std::string_view() const { return view(); }

    friend constexpr bool operator==(const Fixed_Text& a, std::string_view b) { return a.view() == b; }

private:
    /// Literals are ASCII.
    [[nodiscard]] static constexpr std::string_view Cut(std::string_view text, std::size_t letters)
    {
        return std::is_constant_evaluated() ? text.substr(0, letters) : First_Letters(text, letters);
    }
    [[nodiscard]] static constexpr std::size_t Count(std::string_view text)
    {
        return std::is_constant_evaluated() ? text.size() : Letter_Count(text);
    }

    [[nodiscard]] constexpr char* Long_Bytes()
    {
        if (long_bytes_ == nullptr)
            long_bytes_ = new char[Width * Longest_Letter + 1];
        return long_bytes_;
    }

    /// `text` is no longer than can be held.
    constexpr void Take(std::string_view text)
    {
        char* const bytes = text.size() > Width ? Long_Bytes() : bytes_.data();
        std::copy(text.begin(), text.end(), bytes);
        End_At(bytes, text.size());
    }

    constexpr void End_At(char* bytes, std::size_t length)
    {
        length_ = static_cast<std::uint16_t>(length);
        bytes[length] = '\0';
    }

    static_assert(Width * Longest_Letter < 65536);
    char* long_bytes_ = nullptr;  ///< holds the text while it has more than `Width` bytes
    std::array<char, Width + 1> bytes_{};
    std::uint16_t length_ = 0;
};

}  // namespace ingester

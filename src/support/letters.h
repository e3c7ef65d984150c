// The letters of a text, in the one code that all texts of a request have.
//
// A letter is a byte of Windows-1252, or a character of UTF-8. Case is folded for the letters A to Z under
// Windows-1252, and for those of all scripts under UTF-8, whatever the locale.
#pragma once

#include "support/text.h"
#include "support/utf8.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

enum class Letter_Code : std::uint8_t { windows_1252, utf_8 };

/// The code of the texts in memory. A request sets it where it sets its rules, see `Use_Utf8_Text`.
inline constinit Letter_Code letter_code = Letter_Code::windows_1252;

[[nodiscard]] inline bool Letters_Are_Utf8()
{
    return letter_code == Letter_Code::utf_8;
}

/// Bytes that a letter takes at most.
constexpr std::size_t Longest_Letter = 4;

namespace letters {

[[nodiscard]] std::size_t Count_Utf8(std::string_view text);
[[nodiscard]] std::string_view Cut_Utf8(std::string_view text, std::size_t limit);
[[nodiscard]] int Compare_Folded_Utf8(std::string_view a, std::string_view b);

/// What a text begins with, folded: one letter can become three.
struct Folded_Letter {
    char bytes[4 * Longest_Letter];
    std::uint8_t size = 0;
    std::uint8_t taken = 0;  ///< bytes of the text
};
[[nodiscard]] Folded_Letter Fold_First_Utf8(std::string_view text);

}  // namespace letters

[[nodiscard]] inline std::size_t Letter_Count(std::string_view text)
{
    return !Letters_Are_Utf8() || Is_Ascii(text) ? text.size() : letters::Count_Utf8(text);
}

/// The first `limit` letters, never more than four bytes for each.
[[nodiscard]] inline std::string_view First_Letters(std::string_view text, std::size_t limit)
{
    if (text.size() <= limit)
        return text;
    return Letters_Are_Utf8() ? letters::Cut_Utf8(text, limit) : text.substr(0, limit);
}

[[nodiscard]] inline bool Has_More_Letters(std::string_view text, std::size_t limit)
{
    return text.size() > limit && Letter_Count(text) > limit;
}

/// `width`, or the letters of a text where they are more.
[[nodiscard]] inline std::int32_t Wider(std::int32_t width, std::string_view text)
{
    if (static_cast<std::int64_t>(text.size()) <= width)
        return width;
    const auto letters = static_cast<std::int32_t>(Letter_Count(text));
    return letters > width ? letters : width;
}

/// The bytes of the letter that a text, which isn't empty, begins with; one that is malformed is a letter.
[[nodiscard]] inline std::string_view First_Letter(std::string_view text)
{
    const std::size_t length = Letters_Are_Utf8() ? First_Utf8(text).length : 1;
    return text.substr(0, length == 0 ? 1 : length);
}

/// How many bytes the starts of both texts share, no letter taken apart.
[[nodiscard]] std::size_t Common_Letters(std::string_view a, std::string_view b);

/// A letter of any script, or a mark that belongs to the letter in front of it.
[[nodiscard]] bool Is_Letter_Of_Any_Script(char32_t character);
[[nodiscard]] bool Is_Mark_Of_Any_Script(char32_t character);
[[nodiscard]] bool Is_Digit_Of_Any_Script(char32_t character);

// --- Without case: for data. What is spelt in formats and options is compared by support/text.h. -----

/// Below 0, 0 or above 0, as the first text stands to the second.
[[nodiscard]] int Compare_Folded(std::string_view a, std::string_view b);

[[nodiscard]] inline bool Equal_Folded(std::string_view a, std::string_view b)
{
    if (!Letters_Are_Utf8() || a.empty() || b.empty())
        return Equal_Ignoring_Case(a, b);
    // No sign or digit of ASCII is another letter folded, so most texts differ at once.
    const char first_of_a = To_Lower(a.front());
    const char first_of_b = To_Lower(b.front());
    const auto stands_alone = [](char c) { return static_cast<unsigned char>(c) < 0x80 && !Is_Letter(c); };
    if (first_of_a != first_of_b && (stands_alone(first_of_a) || stands_alone(first_of_b)))
        return false;
    return letters::Compare_Folded_Utf8(a, b) == 0;
}

[[nodiscard]] inline bool Less_Folded(std::string_view a, std::string_view b)
{
    return Compare_Folded(a, b) < 0;
}

[[nodiscard]] bool Starts_Folded(std::string_view text, std::string_view start);

/// Texts are equal without case when these are equal, and less when these are less, byte by byte.
[[nodiscard]] std::string Folded(std::string_view text);

/// The first eight bytes of that, as a number that sorts as they do.
[[nodiscard]] std::uint64_t Folded_Start(std::string_view text);

/// Hands the bytes of `Folded` to `take`, one by one.
template <class Take> void For_Folded_Bytes(std::string_view text, Take take)
{
    if (!Letters_Are_Utf8() || Is_Ascii(text)) {
        for (const char c : text)
            take(To_Lower(c));
        return;
    }
    while (!text.empty()) {
        const letters::Folded_Letter letter = letters::Fold_First_Utf8(text);
        for (const char c : std::string_view(letter.bytes, letter.size))
            take(c);
        text.remove_prefix(letter.taken);
    }
}

}  // namespace ingester

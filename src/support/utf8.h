// UTF-8, letter by letter and as a whole.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <string_view>

namespace ingester {

/// Whether no byte of a text is beyond ASCII.
[[nodiscard]] inline bool Is_Ascii(std::string_view text)
{
    constexpr std::uint64_t high_bits = 0x8080808080808080U;
    const auto word_at = []<class Word>(const char* at, Word word) {
        std::memcpy(&word, at, sizeof word);
        return word;
    };
    const char* const first = text.data();
    const char* const last = first + text.size();
    std::uint64_t seen = 0;
    if (text.size() >= sizeof seen) {
        for (const char* at = first; last - at > std::ptrdiff_t{sizeof seen}; at += sizeof seen)
            seen |= word_at(at, std::uint64_t{});
        seen |= word_at(last - sizeof seen, std::uint64_t{});  // which may overlap the one before
    } else if (text.size() >= sizeof(std::uint32_t)) {
        seen = word_at(first, std::uint32_t{}) | word_at(last - sizeof(std::uint32_t), std::uint32_t{});
    } else {
        for (const char c : text)
            seen |= static_cast<unsigned char>(c);
    }
    return (seen & high_bits) == 0;
}

/// A byte that goes on with a letter.
[[nodiscard]] constexpr bool Goes_On(char c)
{
    return (static_cast<unsigned char>(c) & 0xC0U) == 0x80;
}

struct Utf8_Character {
    char32_t character = 0;
    std::size_t length = 0;  ///< 0: not valid
};

/// The character that a text, which isn't empty, begins with.
[[nodiscard]] constexpr Utf8_Character First_Utf8(std::string_view text)
{
    constexpr char32_t smallest[] = {0, 0, 0x80, 0x800, 0x10000};
    const auto lead = static_cast<unsigned char>(text.front());
    if (lead < 0x80)
        return {lead, 1};
    const std::size_t length = lead >= 0xF0 ? 4 : (lead >= 0xE0 ? 3 : 2);
    if (lead < 0xC0 || lead > 0xF7 || text.size() < length)
        return {};
    char32_t character = lead & (0x7FU >> length);
    for (std::size_t i = 1; i < length; ++i) {
        if (!Goes_On(text[i]))
            return {};
        character = (character << 6U) | (static_cast<unsigned char>(text[i]) & 0x3FU);
    }
    const bool surrogate = character >= 0xD800 && character <= 0xDFFF;
    return character < smallest[length] || character > 0x10FFFF || surrogate
               ? Utf8_Character{}
               : Utf8_Character{character, length};
}

/// Writes a character to `target`, which has room for four bytes. Returns the end.
constexpr char* Put_Utf8(char* target, char32_t character)
{
    const auto put = [&](char32_t bits) { *target++ = static_cast<char>(bits); };
    const auto put_rest = [&](unsigned shift) { put(0x80U | ((character >> shift) & 0x3FU)); };
    if (character < 0x80) {
        put(character);
    } else if (character < 0x800) {
        put(0xC0U | (character >> 6U));
        put_rest(0);
    } else if (character < 0x10000) {
        put(0xE0U | (character >> 12U));
        put_rest(6);
        put_rest(0);
    } else {
        put(0xF0U | (character >> 18U));
        put_rest(12);
        put_rest(6);
        put_rest(0);
    }
    return target;
}

inline void Append_Utf8(std::string& text, char32_t character)
{
    char bytes[4];
    text.append(bytes, Put_Utf8(bytes, character));
}

/// Looks at a text that comes in parts.
class Utf8_Check {
public:
    /// False from the first part on that makes the text malformed.
    bool Take(std::string_view part);

    /// Whether what was taken ends with a whole letter.
    [[nodiscard]] bool Is_Whole() const;

private:
    std::uint64_t state_ = 6;  ///< a row of the table of steps begins there, see `Take`
};

[[nodiscard]] bool Is_Utf8(std::string_view text);

}  // namespace ingester

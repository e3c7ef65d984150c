#include "support/windows_1252.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

/// Sixteen bytes a line, from 128. Letters of two fold to the first of them.
constexpr std::string_view Folded_Letters = "___f______S_O_Z_"
                                            "__________s_o_zY"
                                            "__________a_____"
                                            "_____u____o_____"
                                            "AAAAAAACEEEEIIII"
                                            "DNOOOOOxOUUUUYPB"
                                            "aaaaaaaceeeeiiii"
                                            "dnooooo_ouuuuyp";

constexpr std::array<char, 127> Make_Fold_Table()
{
    std::array<char, 127> table{};
    std::copy(Folded_Letters.begin(), Folded_Letters.end(), table.begin());
    return table;
}

static_assert(Folded_Letters.size() == 127);

}  // namespace

const std::array<char, 127> Latin_Fold_Table = Make_Fold_Table();

namespace {

/// The characters of the bytes from 128, of which the others have their own numbers.
constexpr char32_t Signs[] = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
    0x2039, 0x0152, 0x008D, 0x017D, 0x008F, 0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,
};
constexpr unsigned char First_Sign = 128;
static_assert(std::size(Signs) == 32);

char32_t Character_Of(unsigned char byte)
{
    const bool sign = byte >= First_Sign && byte < First_Sign + std::size(Signs);
    return sign ? Signs[byte - First_Sign] : byte;
}

char Byte_Of(char32_t character)
{
    if (character < First_Sign || (character >= First_Sign + std::size(Signs) && character <= 255))
        return static_cast<char>(character);
    const auto* const sign = std::ranges::find(Signs, character);
    return sign == std::end(Signs) ? '?' : static_cast<char>(First_Sign + (sign - std::begin(Signs)));
}

struct Utf8_Character {
    char32_t character = 0;
    std::size_t length = 0;  ///< 0: not valid
};

/// The character that a text begins with.
Utf8_Character First_Of(std::string_view text)
{
    constexpr char32_t smallest[] = {0, 0, 0x80, 0x800, 0x10000};
    const auto lead = static_cast<unsigned char>(text.front());
    if (lead < First_Sign)
        return {lead, 1};
    const std::size_t length = lead >= 0xF0 ? 4 : (lead >= 0xE0 ? 3 : 2);
    if (lead < 0xC0 || lead > 0xF7 || text.size() < length)
        return {};
    char32_t character = lead & (0x7FU >> length);
    for (const char c : text.substr(1, length - 1)) {
        const auto byte = static_cast<unsigned char>(c);
        if ((byte & 0xC0U) != 0x80)
            return {};
        character = (character << 6U) | (byte & 0x3FU);
    }
    const bool surrogate = character >= 0xD800 && character <= 0xDFFF;
    return character < smallest[length] || character > 0x10FFFF || surrogate
               ? Utf8_Character{}
               : Utf8_Character{character, length};
}

}  // namespace

bool Is_Utf8(std::string_view text)
{
    while (!text.empty()) {
        const std::size_t length = First_Of(text).length;
        if (length == 0)
            return false;
        text.remove_prefix(length);
    }
    return true;
}

std::string Utf8_To_Windows_1252(std::string_view text)
{
    std::string bytes;
    bytes.reserve(text.size());
    while (!text.empty()) {
        const auto [character, length] = First_Of(text);
        bytes += Byte_Of(character);
        text.remove_prefix(std::max<std::size_t>(length, 1));
    }
    return bytes;
}

std::string Windows_1252_To_Utf8(std::string_view text)
{
    std::string utf8;
    utf8.reserve(text.size());
    for (const char c : text) {
        const char32_t character = Character_Of(static_cast<unsigned char>(c));
        if (character < First_Sign) {
            utf8 += c;
            continue;
        }
        if (character >= 0x800)
            utf8 += static_cast<char>(0xE0U | (character >> 12U));
        utf8 += static_cast<char>(character >= 0x800 ? 0x80U | ((character >> 6U) & 0x3FU)
                                                     : 0xC0U | (character >> 6U));
        utf8 += static_cast<char>(0x80U | (character & 0x3FU));
    }
    return utf8;
}

}  // namespace ingester

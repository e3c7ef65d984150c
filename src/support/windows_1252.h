// Windows-1252: its characters, and its upper half folded to plain letters.
#pragma once

#include <array>

namespace ingester {

/// For the bytes 128 to 254, in order: the letter without its accent, or "_" for a sign.
extern const std::array<char, 127> Latin_Fold_Table;

/// The fold of one byte from 128 to 254.
[[nodiscard]] inline char Latin_Fold(unsigned char byte)
{
    return Latin_Fold_Table[byte - 128U];
}

/// The character of a byte. Bytes that stand for no letter are controls of their number.
[[nodiscard]] char32_t Windows_1252_Character(unsigned char byte);

}  // namespace ingester

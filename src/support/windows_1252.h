// The upper half of Windows-1252, folded to plain letters.
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

}  // namespace ingester

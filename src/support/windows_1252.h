// Windows-1252: the upper half folded to plain letters, and texts of it in UTF-8 and back.
#pragma once

#include <array>
#include <string>
#include <string_view>

namespace ingester {

/// For the bytes 128 to 254, in order: the letter without its accent, or "_" for a sign.
extern const std::array<char, 127> Latin_Fold_Table;

/// The fold of one byte from 128 to 254.
[[nodiscard]] inline char Latin_Fold(unsigned char byte)
{
    return Latin_Fold_Table[byte - 128U];
}

[[nodiscard]] bool Is_Utf8(std::string_view text);

/// A valid UTF-8 text in Windows-1252, with "?" for characters that it lacks.
[[nodiscard]] std::string Utf8_To_Windows_1252(std::string_view text);

/// Every byte comes back as it was: those that stand for no letter become controls of their number.
[[nodiscard]] std::string Windows_1252_To_Utf8(std::string_view text);

}  // namespace ingester

// The codes that texts of files are in, and how they get into the request's code and out of it.
#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// How bytes stand for letters.
enum class Code_Kind : std::uint8_t {
    utf_8,
    utf_16_little,
    utf_16_big,
    utf_32_little,
    utf_32_big,
    one_byte,           ///< a letter a byte
    system,             ///< only the system knows
    system_over_ascii,  ///< the same, and texts of ASCII bytes are ASCII
};

struct Text_Code_Facts {
    std::int32_t page = 0;  ///< number of the code page; 0: it has none
    std::string_view name;
    std::string_view aliases;  ///< further names: small letters and digits, a blank between two
    Code_Kind kind = Code_Kind::one_byte;
    const char* system_name = nullptr;
};

/// One of the codes that are offered; null for none.
using Text_Code = const Text_Code_Facts*;

/// Whether a code has every letter, and a mark that tells it at the head of a file.
[[nodiscard]] inline bool Is_Unicode(Text_Code code)
{
    return code->kind < Code_Kind::one_byte;
}

/// By a name, as "Latin1" or "ISO_8859-1", or a page, as "cp1252" or "65001": case and signs don't count.
[[nodiscard]] Text_Code Find_Text_Code(std::string_view name);
[[nodiscard]] Text_Code Text_Code_Of_Page(std::int32_t page);

/// The names, three at most, that come nearest to one that isn't known.
[[nodiscard]] std::vector<std::string_view> Nearest_Code_Names(std::string_view name);

[[nodiscard]] Text_Code Utf_8_Code();
[[nodiscard]] Text_Code Windows_1252_Code();

/// The code of all texts in memory.
[[nodiscard]] Text_Code Code_Of_Letters();

/// The code that the bytes of a file tell by a mark at their head, which has `mark_length` bytes; else null.
[[nodiscard]] Text_Code Code_Of_Mark(std::string_view bytes, std::size_t& mark_length);

/// UTF-16 without a mark, as mostly ASCII letters in it look; else null.
[[nodiscard]] Text_Code Code_Of_Pattern(std::string_view bytes);

/// The code of a file that tells none: what is declared (null for nothing); else, where letters are UTF-8,
/// what its mark tells, or UTF-8 when all bytes are such and Windows-1252 when not; else that of all letters.
[[nodiscard]] Text_Code Code_Of_Bytes(std::string_view bytes, Text_Code declared);

/// Brings lines of a file that tells no code into that of all letters; a mark at the head of the first goes.
void Take_Lines_Into_Letters(std::vector<std::string>& lines);

/// Brings texts from one code into another. Malformed bytes, and letters that the target lacks, become "?".
class Text_Converter {
public:
    Text_Converter();
    ~Text_Converter();
    Text_Converter(Text_Converter&&) noexcept;
    Text_Converter& operator=(Text_Converter&&) noexcept;

    /// False when the system lacks one of the codes, or has no memory for it. Never so from or to UTF-8,
    /// UTF-16, UTF-32 and Windows-1252.
    [[nodiscard]] bool Open(Text_Code from, Text_Code to);

    /// A whole text in the new code, valid until the next call; the text itself where nothing changes.
    [[nodiscard]] std::string_view Convert(std::string_view text);

    /// How many "?" stand for something else since the last call.
    [[nodiscard]] std::int64_t Take_Losses();

private:
    class Steps;
    std::unique_ptr<Steps> steps_;
};

/// A text of the request as the world outside knows it.
[[nodiscard]] std::string In_Utf8(std::string_view text);

/// A converter that can always be had, between UTF-8, UTF-16, UTF-32 and Windows-1252.
[[nodiscard]] Text_Converter Sure_Converter(Text_Code from, Text_Code to);

}  // namespace ingester

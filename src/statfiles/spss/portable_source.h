// The characters of a portable file, and the numbers and texts that they spell.
#pragma once

#include "platform/files.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// Lines of 80 characters, whatever ends them or whether anything does: a shorter one stands for one filled
/// up with blanks.
class Portable_Source {
public:
    explicit Portable_Source(Input_File& file) : file_(&file) {}

    /// Whether the file's end, or the mark "Z" between two fields, has been met.
    [[nodiscard]] bool Ended() const { return ended_; }

    /// A character as it stands.
    [[nodiscard]] char Next()
    {
        if (at_ == end_ && !Fill()) [[unlikely]] {
            ended_ = true;
            return '\0';
        }
        return line_[at_++];
    }
    /// The same for `count` of them; fewer at the end of the file.
    [[nodiscard]] std::string Next_Text(std::size_t count);

    /// All characters that are at hand; empty at the end of the file.
    [[nodiscard]] std::string_view Next_Piece();

    /// A tag.
    [[nodiscard]] char Portable_Char();

    /// Numbers; false where one is cut by the end, or isn't one.
    [[nodiscard]] bool Portable_Int(std::int32_t& value);
    [[nodiscard]] bool Portable_Real(double& value);

    /// A text behind its length, of which `most` bytes are kept. False for a negative length, or at the end.
    [[nodiscard]] bool Portable_String(std::string& text, std::size_t most);

private:
    [[nodiscard]] bool Fill();
    void Take_Piece();
    [[nodiscard]] bool Usual_Real(double& value);
    [[nodiscard]] char Next_Of_Number();

    Input_File* file_;
    std::vector<char> buffer_;  ///< of the file
    std::size_t buffer_at_ = 0;
    std::size_t buffer_end_ = 0;
    std::size_t line_length_ = 0;  ///< of the line under way
    bool behind_return_ = false;
    std::vector<char> line_;  ///< lines without their ends
    std::size_t at_ = 0;
    std::size_t end_ = 0;
    bool ended_ = false;
};

/// The number that is nearest to `mantissa` times 30 to the power of `exponent`.
__extension__ using Portable_Mantissa = unsigned __int128;
[[nodiscard]] double Portable_Number(Portable_Mantissa mantissa, std::int64_t exponent);

}  // namespace ingester

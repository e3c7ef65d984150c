// Texts that cross the border between a file and the request, with what gets lost on the way in the ledger.
#pragma once

#include "platform/text_codes.h"
#include "support/letters.h"

#include <cstdint>
#include <string_view>

namespace ingester {

/// The code that the user has declared the input's texts to be in; null for none.
[[nodiscard]] Text_Code Declared_Code();

/// The code of an input: what was declared; else `told`, which the file says of itself (null for nothing);
/// else what `bytes` look like, all of the file's text that the reader has at hand.
[[nodiscard]] Text_Code Code_Of_Input(Text_Code told, std::string_view bytes);

/// Makes `converter` ready. False after a message, where the system can't convert.
[[nodiscard]] bool Open_Converter(Text_Converter& converter, Text_Code from, Text_Code to);

/// One way across. Until it is opened texts pass as they are.
class Text_Crossing {
public:
    /// Texts of a file in `code` come into the code of all letters, or go from there into a file. False after
    /// a message, where the system can't convert them.
    [[nodiscard]] bool Open_Input(Text_Code code);
    [[nodiscard]] bool Open_Output(Text_Code code);

    /// What follows is of this column, and of a row from 1, or of none; the ledger tells so. The name must
    /// stay where it is.
    void Go_To(std::string_view column, std::int64_t row = 0)
    {
        column_ = column;
        row_ = row;
    }
    void Go_To_Row(std::int64_t row) { row_ = row; }

    /// A text on the other side, valid until the next call. ASCII passes without a look where it may.
    [[nodiscard]] std::string_view Cross(std::string_view text)
    {
        return passes_ || (passes_ascii_ && Is_Ascii(text)) ? text : Converted(text);
    }

private:
    [[nodiscard]] bool Open(Text_Code from, Text_Code to);
    [[nodiscard]] std::string_view Converted(std::string_view text);

    Text_Converter converter_;
    bool comes_in_ = false;
    bool passes_ = true;
    bool passes_ascii_ = true;
    std::string_view column_;
    std::int64_t row_ = 0;
};

}  // namespace ingester

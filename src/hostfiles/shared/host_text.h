// Texts of the host's files, which are Windows-1252 whatever the code of the request is.
#pragma once

#include "platform/text_codes.h"
#include "support/letters.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// A text of a file in the request's code; `room` holds it where it is another there.
[[nodiscard]] std::string_view From_Host(std::string_view bytes, std::string& room);

/// The same in place.
void Take_From_Host(std::string& text);

/// Brings texts into the code of the files, where each letter is a byte.
class Host_Text_Out {
public:
    /// What follows is of this column, and of a row from 1, or of none; the ledger tells so.
    void Go_To(std::string_view column, std::int64_t row = 0)
    {
        column_ = column;
        row_ = row;
    }
    void Go_To_Row(std::int64_t row) { row_ = row; }

    /// Valid until the next call. Letters that the code lacks are entered in the ledger.
    [[nodiscard]] std::string_view In_File(std::string_view text)
    {
        return !Letters_Are_Utf8() || Is_Ascii(text) ? text : Converted(text);
    }

private:
    [[nodiscard]] std::string_view Converted(std::string_view text);

    Text_Converter converter_ = Sure_Converter(Utf_8_Code(), Windows_1252_Code());
    std::string_view column_;
    std::int64_t row_ = 0;
};

/// A text as it will come back out of a file.
[[nodiscard]] std::string As_Held_By_Host(std::string_view text);

}  // namespace ingester

// What an input file is, judged by its first bytes and its name.
#pragma once

#include <cstdint>
#include <string_view>

namespace ingester {

/// Codes of file types, for inputs and outputs alike.
enum File_Code : std::int32_t {
    unknown_file = 0,
    script_file = 4,
    text_file = 6,         ///< output: comma or fixed-width text
    unreadable_file = 24,  ///< can't be opened, or is empty
    plain_text_file = 25,  ///< input: delimited or other text
    tab_text_file = 29,    ///< output
    zip_file = 56,         ///< of no known kind
    book_file = 58,
    spreadsheet_file = 1,
};

/// The code of a file's type; 0 for none, 24 after a message that says why it can't be read.
[[nodiscard]] std::int32_t Detect_File_Type(std::string_view file_name);

}  // namespace ingester

// What an input file is, judged by its first bytes and its name.
#pragma once

#include <cstdint>
#include <string_view>

namespace ingester {

/// Codes of file types that have a name in the code, for inputs and outputs alike; the table of
/// formats knows them all.
enum File_Code : std::int32_t {
    unknown_file = 0,
    spreadsheet_file = 1,
    script_file = 4,
    workbook_file = 5,
    text_file = 6,         ///< output: comma or fixed-width text
    unreadable_file = 24,  ///< can't be opened, or is empty
    plain_text_file = 25,  ///< input: delimited or other text
    tab_text_file = 29,    ///< output
    r_data_file = 42,
    r_text_file = 43,
    zip_file = 56,  ///< of no known kind
    compressed_file = 57,
    book_file = 58,
    xml_workbook_file = 59,
    open_document_file = 67,
    qtl_locus_file = 73,
};

/// The code of a file's type; 0 for none, 24 after a message that says why it can't be read. Reads
/// the first 200 bytes.
[[nodiscard]] std::int32_t Detect_File_Type(std::string_view file_name);

/// The same for what a compressed file holds, from its first 100 bytes; 0 after a message when it
/// can't be opened or closed.
[[nodiscard]] std::int32_t Detect_Compressed_File_Type(std::string_view file_name);

/// Whether an unread file is one of ecological data, of the Cornell condensed form.
[[nodiscard]] bool Looks_Like_Cornell(std::string_view file_name);

}  // namespace ingester

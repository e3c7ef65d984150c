// Where the sheets of a book are, and what they are called.
#pragma once

#include "hostfiles/tbk/book_source.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// Where the record `sheet_start_record` of each sheet is.
using Sheet_Offsets = std::vector<std::int32_t>;

/// Reads the record `sheet_table_record`, which must hold `sheets` of them.
[[nodiscard]] bool Read_Sheet_Table(Book_Source& source, std::int32_t sheets, Sheet_Offsets& offsets);

/// The names of the sheets of an open book. False, and nobody is told, for what is no sound book.
[[nodiscard]] bool List_Pages(Input_File& file, Sheet_Offsets& offsets, std::vector<std::string>& names);

/// The sheet number that a request is as a whole, from 1; 0 for a request that is none up to `sheets`.
[[nodiscard]] std::size_t Sheet_Number_Of(std::string_view request_text, std::size_t sheets);

/// The name that a Sheet gets in a book.
[[nodiscard]] std::string Page_Name_Of(const Sheet& sheet);

}  // namespace ingester

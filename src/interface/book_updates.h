// Sheets that come into an existing book, which may be compressed as a whole.
#pragma once

#include "model/sheet.h"

#include <string_view>

namespace ingester {

/// Adds a Sheet to a book. False after a message, and the book is as it was.
[[nodiscard]] bool Add_Sheet(Sheet* sheet, const char* file_name);

/// Puts a Sheet in the place of a book's sheet `page`, a name or a number. The same holds.
[[nodiscard]] bool Replace_Sheet(Sheet* sheet, const char* file_name, std::string_view page);

}  // namespace ingester

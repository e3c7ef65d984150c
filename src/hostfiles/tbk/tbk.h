// The host's book: several Sheets in one file, each of which can be reached, added or replaced alone.
#pragma once

#include "model/sheet.h"
#include "platform/files.h"

#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// Reads the sheet that the request names by its name or number into the `Current_Sheet`; without a
/// request all in turn, so that the last one stays. A request to list the sheets gives a Sheet of their
/// names. False after a message, and no `Current_Sheet`.
bool Read_TBK_File(const char* file_name);

/// The same from an open file.
bool Read_TBK(Input_File& file);

/// The names of a book's sheets, in order and of up to 32 characters. Nothing, and no message, when the
/// file is no sound book.
[[nodiscard]] std::optional<std::vector<std::string>> Read_Page_Names(const char* file_name);

/// Writes a new book of one Sheet, or of several. False after a message, or when the book wasn't written
/// whole.
bool Write_TBK_File(Sheet* sheet, const char* file_name);
bool Write_TBK_File(std::span<Sheet* const> sheets, const char* file_name);

/// Adds Sheets at the end of a book, under names that are free in it. Until the new book is complete the
/// old one stays, and it stays as it is when that fails: false after a message, which calls the book
/// `shown` where that is given.
bool Add_Sheets_To_TBK(const char* file_name, std::span<Sheet* const> sheets, std::string_view shown = {});

/// Puts a Sheet in the place of a book's sheet `page`, a name or a number. The same holds.
bool Replace_Sheet_In_TBK(const char* file_name, Sheet* sheet, std::string_view page,
                          std::string_view shown = {});

/// Adds `name` to the names of a book's sheets, changed where it is one of them. What it became.
std::string Add_Unique_Page_Name(std::vector<std::string>& names, std::string_view name);

}  // namespace ingester

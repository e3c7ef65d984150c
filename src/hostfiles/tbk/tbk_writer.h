// What the steps of the writer, and the updater, hand to each other.
#pragma once

#include "hostfiles/tbk/book_sink.h"
#include "hostfiles/tbk/page_names.h"
#include "model/sheet.h"

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

/// A book that is made has all records; what is added to one leaves out those that came later.
enum class Group_Form : std::uint8_t { of_new_book, of_update };

/// Writes all of a Sheet under the name `page`. False when rows that were put off could not be made, or
/// when a write was refused.
[[nodiscard]] bool Write_Sheet_Group(Sheet& sheet, Book_Sink& sink, std::string_view page, Group_Form form);

/// The same for a Sheet that comes into an existing book; its offset goes to `table[position]`.
[[nodiscard]] bool Write_One_Sheet(Sheet& sheet, Book_Sink& sink, Sheet_Offsets& table, std::size_t position,
                                   std::string_view page);

/// Writes the records of a column.
void Write_Column_Group(Column& column, Book_Sink& sink, Group_Form form);

/// Puts the words of `offsets` in the place of a table that was written as a stand-in.
void Rewrite_Offsets(Book_Sink& sink, std::int64_t position, const Sheet_Offsets& offsets);

}  // namespace ingester

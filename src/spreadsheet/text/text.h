// Delimited and fixed-width text: tables of fields in lines, as RFC 4180 describes them for commas,
// but with one record to a line.
#pragma once

#include "model/sheet.h"
#include "platform/files.h"

#include <cstdint>

namespace ingester {

/// Reads a text table into the `Current_Sheet`. False after a message, or when there is no table.
bool Read_CSV_File(const char* file_name);

/// The same from an open file; its name's extension (".csv", ".tab") is a hint at the separator.
bool Read_CSV(Input_File& file);

/// Skips `Fixed_Lines` lines and reads the fields of the next one into the rows of one Text column.
bool Read_Text_Lines(const char* file_name);
bool Read_Text_Lines(Input_File& file);

/// Copies a text, joining lines until they hold `fields_per_record` commas.
bool Reflow_Lines_By_Fields(const char* input, const char* output, std::int32_t fields_per_record);

/// Whether the fields of a text that was written in columns of fixed width stand in them. Where a text with a
/// blank and an empty one make up for each other, nothing else tells.
bool Fields_Stand_In_Columns(Input_File& file);

/// Writes a Sheet as text: with tabs in `tab_mode`, with commas under `CSV_Output`, else in columns
/// of fixed width. An empty name writes to standard output. False when there is nothing to write, or
/// when the file could not be written whole.
bool Write_Text_File(Sheet* sheet, const char* file_name, bool tab_mode);

}  // namespace ingester

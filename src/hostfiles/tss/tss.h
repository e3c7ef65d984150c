// The host's spreadsheet file: one Sheet, with all that the host's window keeps beside its data.
#pragma once

#include "model/sheet.h"
#include "platform/files.h"

namespace ingester {

/// Reads a file of any version and byte order into the `Current_Sheet`, without the columns and rows that
/// the request leaves out. False, mostly after a message, when no Sheet was made; a file that ends or
/// breaks behind its first column gives what stood in front.
bool Read_TSS_File(const char* file_name);

/// The same from where an open file stands, to the end of the Sheet.
bool Read_TSS(Input_File& file);

/// Writes a Sheet in version 3, little-endian. Empty labels and names that the format can't do without
/// are filled in the Sheet as well. False when there is nothing to write, or it wasn't written whole.
bool Write_TSS_File(Sheet* sheet, const char* file_name);

/// The same into an open file, which stays open.
bool Write_TSS(Sheet* sheet, Output_File& file);

}  // namespace ingester

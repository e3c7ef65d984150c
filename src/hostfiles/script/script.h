// A Sheet as a script in the host's command language: it deletes old structures of the same names,
// declares each one, reads the data that follow in the script, and returns control.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Writes the Sheet as a script. False when it is of no type that has one, holds nothing to declare,
/// or the file could not be written whole; the caller tells. Restrictions of a Vector count as saved.
bool Write_Host_Script(Sheet* sheet, const char* file_name);

}  // namespace ingester

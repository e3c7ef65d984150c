// The columns of one Sheet beside those of another.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Moves the data columns of `source` behind those of `target`, which has as many rows. With
/// `replace_equal_names` columns of a name that is there, in any case, take the place of that one. False,
/// and nothing has changed, for Sheets that don't fit or when there is nothing to move.
bool Concatenate_Sheets(Sheet* target, Sheet* source, bool replace_equal_names);

}  // namespace ingester

// Columns and rows that go between reading and writing.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Removes the rows that hold no data. The last row stays whatever it holds; a warning says so when
/// all of them are empty.
bool Delete_Empty_Rows(Sheet* sheet);

}  // namespace ingester

// Rows become columns.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Makes a Sheet whose columns are the rows of `sheet`; it becomes the `Current_Sheet`. Names of columns
/// become row labels. A Vector's first Text column gives the names of the new columns, unless the request
/// keeps names out; where other texts are left, the new columns are texts. False after a message for a
/// Sheet without rows for columns: a square Matrix, a Table of many ways, more rows than columns may be.
bool Transpose_Sheet(Sheet* sheet);

}  // namespace ingester

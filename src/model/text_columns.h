// Text columns that become numbers.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Turns a text-like column into a Variate. Texts that don't say their number plainly are told in
/// the request's messages. False for a column of another type.
bool Text_Column_To_Number(Column* column);

}  // namespace ingester

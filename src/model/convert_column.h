// A Column moves from one type to another.
#pragma once

#include "model/sheet.h"

#include <cstdint>

namespace ingester {

/// A units column becomes data, behind the columns at the head.
bool Units_Variate_To_Variate(Column* column);
bool Units_Text_To_Text(Column* column);

/// A Column becomes the units column of a Sheet without other leading columns. False where there are
/// some, or in a Sheet that is read only.
bool Variate_To_Units(Column* column);
bool Text_To_Units(Column* column);

/// The one entry for all pairs: whether the Column, which is of type `from`, now is of type `to`
/// (texts that are too wide for Text make it Long Text).
/// Nothing happens in a Sheet that is read only, to a protected Column, and for a pair without a way.
bool Convert_Column(Column* column, std::int32_t from, std::int32_t to, bool by_case_free, bool trim);

}  // namespace ingester

// Columns that are made after others.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// A copy of a Column in a Sheet of its own, as Text or Variate when it is a units column: for
/// conversions that must leave the Column itself alone. Null for want of room.
[[nodiscard]] Column* Copy_Column_Aside(const Column& column);

/// Makes a Factor of such a copy: with a label for each text, or a level value for each number even where
/// they only count. Without data it has no levels. False for want of room.
[[nodiscard]] bool Turn_Into_Factor(Column& copy, bool ignore_case);

/// Whether any cell holds data.
[[nodiscard]] bool Has_Data(const Column& column);

/// Adds a Column like `source`, with its look and its levels but without its data, behind those of `sheet`.
/// Null when the Sheet can't have it, mostly after a message.
[[nodiscard]] Column* Add_Column_Like(Sheet& sheet, const Column& source);

}  // namespace ingester

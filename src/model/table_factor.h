// The factor across the columns of a Table: its Sheet and its columns say what other Factors say themselves.
#pragma once

#include "model/sheet.h"

#include <span>

namespace ingester {

/// Gives `factor`, of the same Sheet or of another, what the Table says of its look: description, number
/// format, decimals and the form of its dates.
void Take_Column_Factor_Look(const Sheet& table, Column& factor);

/// The other way: `factor` goes across the columns of `table` from now on. Without labels or level values.
void Keep_As_Column_Factor(Sheet& table, const Column& factor);

/// Gives `factor` a level for each column of `table`, which are those of its levels: its level value and its
/// label, where they tell, and its place else. False for no columns and for want of memory.
[[nodiscard]] bool Take_Column_Levels(const Sheet& table, std::span<const Column* const> columns,
                                      Column& factor);

}  // namespace ingester

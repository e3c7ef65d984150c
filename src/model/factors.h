// Columns of categories: numbers and texts become Factors, and Factors numbers and texts again.
//
// A conversion that fails leaves the Column as it was.
#pragma once

#include "model/factor_lists.h"
#include "model/sheet.h"

#include <cstddef>
#include <cstdint>

namespace ingester {

/// The most bytes of a table of distinct values, or of places of distinct labels.
constexpr std::size_t Greatest_Level_Table = 160000000;

/// A Variate's distinct values become the levels, ascending with `auto_factors`, else as they come;
/// levels 1, 2, ..., n are not kept. Without `make_levels` the values are level numbers themselves. A
/// Variate without values gets `wanted_levels` levels, or one. `table_bytes` is for tests.
bool Variate_To_Factor(Column* column, bool make_levels, std::int32_t wanted_levels,
                       std::size_t table_bytes = Greatest_Level_Table);

/// A text-like column's distinct texts become the labels, sorted with `auto_factors` and in a natural
/// order where they have one, else as they come. Of texts that differ in case only, the first is kept
/// `by_case_free`.
bool Text_To_Factor(Column* column, bool by_case_free, bool trim, std::int32_t wanted_levels,
                    std::size_t table_bytes = Greatest_Level_Table);

/// Cells get their level's value if asked to and there are level values, else keep its number.
bool Factor_To_Variate(Column* column, bool use_levels);

/// Cells get what they print as. Where that is wider than Text holds the column becomes Long Text,
/// unless `text_only`: then it fails.
bool Factor_To_Text(Column* column, bool text_only = false);

/// Present values are printed by the Column's format; missing ones become empty texts.
bool Variate_To_Text(Column* column);

}  // namespace ingester

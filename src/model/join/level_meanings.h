// The levels of two Factors matched by what they say.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <vector>

namespace ingester {

/// Like `Merge_Factor_Levels`, for Factors that don't have the same lists, and without losing a level: one is
/// told by its label, or else by its value, or its number where there are no values. A label that is a number
/// stands for that number. A target that can't hold what a new level says gets labels for all of its own.
/// Labels that are words throughout go by their numbers where the other's levels can be such numbers, which
/// is reported. `added` holds the levels of `source` that were put behind those of `target`.
[[nodiscard]] bool Match_Meanings(Column& target, const Column& source, std::vector<std::int32_t>& map,
                                  std::vector<std::int32_t>& added, bool ignore_case);

}  // namespace ingester

// The levels of two Factors become those of one.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <vector>

namespace ingester {

/// Gives `target` the levels of `source` that it lacks, behind its own: told by their labels, or by their
/// level values within a ratio of `tolerance` (1.0 to 1.001). `map` holds the level of `target` for each of
/// `source`, from 1 at 0; empty, all keep their numbers. Factors that can't be told so are matched by
/// number, which is reported; for people by what their levels say. False for want of room.
bool Merge_Factor_Levels(Column& target, const Column& source, std::vector<std::int32_t>& map,
                         double tolerance, bool ignore_case);

/// Reports that the levels of two Factors had to be matched by their numbers.
void Warn_Of_Unlike_Lists(const Column& target, const Column& source);

/// Changes how many levels a Factor has. Cells that stand for the margin of a Table, one behind the last
/// level, do so still.
void Set_Level_Count(Column& factor, std::int32_t nlevels);

}  // namespace ingester

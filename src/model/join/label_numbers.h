// Labels that are what numbers print as.
#pragma once

#include "model/level_finder.h"

namespace ingester {

/// The level of a Factor with just the label that a present number of `source` prints as, by its Column's
/// format or with the fewest digits that tell it; 0 for none.
[[nodiscard]] std::int32_t Level_Labelled_As(Level_Finder& levels, const Column& source, double number);

}  // namespace ingester

// The columns and rows that a request keeps of the host's files, which are left out while they are read.
#pragma once

#include "model/sheet.h"
#include "model/subset.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// A cleaned name that no Column gets: what its brackets held must not come to the next Column that is made.
[[nodiscard]] std::string Valid_Name_Of_No_Column(std::string_view name);

/// Whether the request's list of columns keeps the column of that place, or of that name when it is cleaned.
[[nodiscard]] bool Is_Column_Selected(const Column_Subset& subset, std::int32_t ordinal,
                                      std::string_view name);

/// Leaves out rows of a Symmetric Matrix, and their columns with them. False when none would be left.
[[nodiscard]] bool Select_Symmetric(Sheet& sheet);

}  // namespace ingester

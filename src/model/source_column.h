// The Factor that tells where rows came from.
#pragma once

#include "model/sheet.h"

#include <string_view>

namespace ingester {

/// The column that tells where rows came from: of that name, or of what it becomes as a host's name.
[[nodiscard]] Column* Find_Source_Column(const Sheet* sheet, std::string_view name);

/// Gives a Sheet without a column of the request's `Merge_Key` one: a Factor of one level, labelled by
/// `Merge_With` where that is given. False when it can't have one.
bool Add_Source_Column(Sheet* sheet);

}  // namespace ingester

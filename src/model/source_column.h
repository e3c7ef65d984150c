// The Factor that tells where rows came from.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Gives a Sheet without a column of the request's `Merge_Key` one: a Factor of one level, labelled by
/// `Merge_With` where that is given. False when it can't have one.
bool Add_Source_Column(Sheet* sheet);

}  // namespace ingester

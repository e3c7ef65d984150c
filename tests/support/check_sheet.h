// The invariants that every Sheet keeps, whatever made it.
#pragma once

#include "model/sheet.h"

#include <string>

namespace ingester {

/// What is wrong with `sheet`, one line a fault and at most a few lines; empty when all is well.
/// Lists are walked no further than their stated length, so broken ones are safe to check.
[[nodiscard]] std::string Check_Sheet(const Sheet& sheet);

}  // namespace ingester

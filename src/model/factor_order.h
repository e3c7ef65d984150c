// The order of a Factor's levels.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <span>

namespace ingester {

/// Orders that labels have by nature.
enum Natural_Order : std::int32_t {
    compass_order = 0,
    day_order = 1,
    short_month_order = 2,
    month_order = 3,
    season_order = 4,
};

/// Whether every label of a Factor stands in the list of that order.
[[nodiscard]] bool Has_Natural_Order(const Column* column, std::int32_t order_code);

/// Sorts the labels by their places in that list; those of one place stay as they are. False where
/// a label has none, or the levels may not be moved.
bool Apply_Natural_Order(Column* column, std::int32_t order_code);

/// Applies the first order that a Factor of few labels has, if there is one.
void Order_Labels_Naturally(Column& column);

/// Moves the levels, with values, labels and cells, so that level i becomes the one that was
/// `new_positions[i - 1]`. False for less than two levels, a table that is no permutation, or a Sheet
/// or Column that may not change.
bool Reorder_Factor_Levels(Column* column, std::span<const std::int32_t> new_positions);

}  // namespace ingester

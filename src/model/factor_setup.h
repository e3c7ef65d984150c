// The levels of a Factor while a reader finds them out, step by step.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <vector>

namespace ingester {

struct Factor_Setup {
    Column* column = nullptr;
    std::int32_t nlevels = 0;                              ///< levels now known
    std::vector<double> values = {};                       ///< empty: no table yet
    std::vector<Fixed_Text<Text_Cell_Width>> labels = {};  ///< empty: no table yet
    std::vector<double> order = {};                        ///< for reordering; may be absent
    bool dirty = false;                                    ///< cleared by `Setup_Factor_Data`
};

/// Makes the table of values, or the one of labels for `text_side`, or fits it to `nlevels`, and any
/// other table that is there with it. New entries come from the Column, or stand for their position.
bool Setup_Factor_Data(Factor_Setup& setup, bool text_side);

}  // namespace ingester

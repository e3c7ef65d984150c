// Which rows of two Sheets meet.
#pragma once

#include "model/join/merge_keys.h"

#include <cstdint>
#include <vector>

namespace ingester {

/// One row of the result.
struct Merged_Row {
    enum class Kind : std::uint8_t {
        kept,    ///< the next row of the target
        copied,  ///< one more, like the row above
        added,   ///< one more, with the keys of the source
    };
    Kind kind;
    std::int32_t source;  ///< the row that is written into it; -1 for none
};

/// The rows of the result, in their order.
[[nodiscard]] std::vector<Merged_Row> Plan_Merged_Rows(const Merge_Request& wanted, const Merge_Keys& keys);

}  // namespace ingester

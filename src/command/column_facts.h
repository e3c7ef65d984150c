// What a column holds, in a user's words.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

struct Level_Facts {
    std::string label;
    std::string value;  ///< the level's number, where it has both
    std::int64_t count = 0;
};

/// All texts are UTF-8.
struct Column_Facts {
    std::string name;
    std::string_view type;  ///< as --type spells it; also "date-time"
    std::int64_t missing = 0;
    bool numeric = false;  ///< `low` and `high` are plain numbers
    std::string low;       ///< the least number or date; empty for none
    std::string high;
    std::vector<Level_Facts> levels;  ///< of a factor
    std::size_t longest = 0;          ///< letters of the longest text
    std::string description;
};

[[nodiscard]] Column_Facts Facts_Of(const Column& column);

}  // namespace ingester

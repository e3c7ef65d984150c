// Tables as people see them: columns of texts beside each other.
#pragma once

#include <cstddef>
#include <string>
#include <vector>

namespace ingester {

struct Shown_Column {
    std::string title;
    bool right = false;  ///< its texts stand at the right side
    std::vector<std::string> cells = {};
};

/// The columns beside each other, on lines of `width` places; 0: as wide as they are. What doesn't fit is
/// cut, columns at the end are left out; `shown` is how many are there.
[[nodiscard]] std::string Aligned_Lines(const std::vector<Shown_Column>& columns, std::size_t width,
                                        std::size_t& shown);

/// The same with tabs between the texts, for programs.
[[nodiscard]] std::string Tabbed_Lines(const std::vector<Shown_Column>& columns);

}  // namespace ingester

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

/// The rows that the request keeps.
struct Row_Selection {
    bool active = false;
    std::span<const std::int32_t> flags;  ///< rows beyond are left out

    [[nodiscard]] bool Keeps(std::int32_t row) const
    {
        return !active
               || (row < static_cast<std::int32_t>(flags.size())
                   && flags[static_cast<std::size_t>(row)] != 0);
    }
    /// How many of the first `rows`.
    [[nodiscard]] std::int32_t Count(std::int32_t rows) const;
    /// The places (from 0) that an active selection gives the first `rows`, -1 for one that is left out.
    [[nodiscard]] std::vector<std::int32_t> New_Rows(std::int32_t rows) const;
};

/// A cleaned name that no Column gets: what its brackets held must not come to the next Column that is made.
[[nodiscard]] std::string Valid_Name_Of_No_Column(std::string_view name);

/// Whether the request's list of columns keeps the column of that place, or of that name when it is cleaned.
[[nodiscard]] bool Is_Column_Selected(const Column_Subset& subset, std::int32_t ordinal,
                                      std::string_view name);

/// Leaves out rows of a Symmetric Matrix, and their columns with them. False when none would be left.
[[nodiscard]] bool Select_Symmetric(Sheet& sheet);

}  // namespace ingester

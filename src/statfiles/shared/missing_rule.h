// Which numbers of a variable its users have declared to be missing.
#pragma once

#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>

namespace ingester {

/// Up to three values, and ranges, whose ends belong to them.
struct Missing_Rule {
    struct Range {
        double low = -std::numeric_limits<double>::infinity();
        double high = std::numeric_limits<double>::infinity();
    };
    static constexpr std::size_t most = 3;

    std::array<double, most> values{};
    std::array<Range, most> ranges{};
    std::uint8_t value_count = 0;
    std::uint8_t range_count = 0;

    [[nodiscard]] bool Is_Empty() const { return value_count == 0 && range_count == 0; }

    /// More than three of a kind are let go.
    void Add_Value(double value)
    {
        if (value_count < most)
            values[value_count++] = value;
    }
    void Add_Range(const Range& range)
    {
        if (range_count < most)
            ranges[range_count++] = range;
    }

    [[nodiscard]] bool Holds(double value) const
    {
        for (std::size_t i = 0; i < value_count; ++i)
            if (value == values[i])
                return true;
        for (std::size_t i = 0; i < range_count; ++i)
            if (value >= ranges[i].low && value <= ranges[i].high)
                return true;
        return false;
    }
};

/// Whether a number of a variable is to be a missing cell: it is none that a Sheet holds, or the variable's
/// rule says so.
[[nodiscard]] inline bool Is_Spss_Missing(const Missing_Rule& variable, double sheet_missing, double value)
{
    return !(value > sheet_missing) || value > std::numeric_limits<double>::max() || variable.Holds(value);
}

}  // namespace ingester

// From which day, and in which unit, another program counts time: the one place that shifts either way.
#pragma once

namespace ingester {

constexpr double Seconds_Per_Day = 86400;

struct Epoch {
    double day_zero = 0;       ///< the day count of its 0
    double units_per_day = 1;  ///< 1 for days, `Seconds_Per_Day` for seconds

    [[nodiscard]] double To_Days(double value) const { return value / units_per_day + day_zero; }
    [[nodiscard]] double From_Days(double days) const { return (days - day_zero) * units_per_day; }
};

}  // namespace ingester

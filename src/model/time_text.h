// Times of day out of texts, and the numbers that dates and times are made of.
#pragma once

#include <cstdint>
#include <string_view>

namespace ingester {

/// No part is as great; numbers grow no further.
constexpr std::int32_t Too_Great_Part = 100'000'000;

/// A number at the start of `text`, or nothing but digits; below 0 for none.
[[nodiscard]] std::int32_t Read_Part_Number(std::string_view text, bool strict);

constexpr bool In_Range(std::int32_t value, std::int32_t least, std::int32_t most)
{
    return value >= least && value <= most;
}

constexpr std::int32_t Hours_A_Day = 24;

/// Reads "h:mm", "h:mm:ss" or "h:mm:ss.cc" as a part of a day, or as more of it. `marker_allowed`: strict
/// readings take "am" and "pm", the others always do. False for no time.
[[nodiscard]] bool Read_Time(std::string_view text, bool strict, bool marker_allowed, std::int32_t most_hours,
                             double& value);

}  // namespace ingester

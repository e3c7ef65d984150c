// Dates of SAS: how far they are from ours, and which formats tell that a variable holds some.
#pragma once

#include "statfiles/shared/epoch.h"

#include <cstdint>
#include <string_view>

namespace ingester {

/// The day count of SAS day 0: for people that of 1 January 1960, for hosts the day before, in both
/// directions.
[[nodiscard]] double Sas_Day_Zero();

/// A variable's display code by the name of its format, all of its field; 0 for one that is none of dates.
[[nodiscard]] std::int32_t Date_Format_Of_Sas(std::string_view nform);

/// How the values of a display code are counted.
[[nodiscard]] Epoch Sas_Epoch(std::int32_t date_format);

}  // namespace ingester

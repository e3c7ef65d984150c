// The two day counts that dates are held in.
//
// A serial (`date_form` 0) is the spreadsheet count: 1 is 1 January 1900, and 1900 has a false
// 29 February. A day count (`date_form` 1) is the host's: days since the end of February 1600.
// The fraction of either is the time of day.
#pragma once

#include <cstdint>

namespace ingester {

/// What a day count is ahead of the serial of the same day, from 1 March 1900 on.
constexpr double Serial_Offset = 109512.0;

/// Serials below are those in front of the false 29 February 1900; they lag by one more.
constexpr double First_True_Serial = 60.0;

/// Turns a serial into the day count of the same moment; a negative one becomes `missing`.
void Serial_To_Day_Count(double& value, double missing);

/// Turns a day count into the serial of the same moment; one before 1900 becomes `missing`.
void Day_Count_To_Serial(double& value, double missing);

/// The greatest day of a form: 0 serials, 1 day counts.
[[nodiscard]] std::int32_t Max_Date(std::int32_t form);

}  // namespace ingester

// The two day counts that dates are held in.
//
// A serial (`date_form` 0) is the spreadsheet count: 1 is 1 January 1900, and 1900 has a false
// 29 February. A day count (`date_form` 1) is the host's: days since the end of February 1600.
// The fraction of either is the time of day.
#pragma once

#include <cstddef>
#include <cstdint>

namespace ingester {

/// What a day count is ahead of the serial of the same day, from 1 March 1900 on.
constexpr double Serial_Offset = 109512.0;

/// The false 29 February 1900. Serials below it lag by one more.
constexpr double False_Serial = 60.0;

constexpr double Seconds_A_Day = 86400.0;

struct Calendar_Date {
    std::int64_t day;
    std::int64_t month;
    std::int64_t year;
};

/// Whether a month has such a day; every fourth year has a 29 February.
[[nodiscard]] inline bool Is_Calendar_Day(std::int32_t day, std::int32_t month, std::int32_t year)
{
    constexpr std::int8_t lengths[] = {0, 31, 29, 31, 30, 31, 30, 31, 31, 30, 31, 30, 31};
    const std::size_t known = month >= 0 && month <= 12 ? static_cast<std::size_t>(month) : 0;
    const auto fits = static_cast<unsigned>(day >= 1) & static_cast<unsigned>(day <= lengths[known]);
    const bool leap_day = day == 29 && month == 2;
    return fits != 0 && !(leap_day && year % 4 != 0);
}

/// The day number of a date in a form, or `Missing_Value` for a day that no calendar has. Years of two
/// digits are those of the 1900s; every fourth year has a 29 February. Serials of dates in front of 1900
/// are negative.
[[nodiscard]] double Date_To_Number(std::int32_t day, std::int32_t month, std::int32_t year,
                                    std::int32_t form);

/// The same in the request's `Current_Date_Form`.
[[nodiscard]] double Date_To_Number(std::int32_t day, std::int32_t month, std::int32_t year);

/// The date of a whole day number that is not negative.
[[nodiscard]] Calendar_Date Number_To_Date(std::int64_t number, std::int32_t form);

/// The date and time of now.
[[nodiscard]] double Today_Number(std::int32_t form);

/// Turns a serial into the day count of the same moment; a negative one becomes `missing`.
void Serial_To_Day_Count(double& value, double missing);

/// Turns a day count into the serial of the same moment; one before 1900 becomes `missing`.
void Day_Count_To_Serial(double& value, double missing);

/// The greatest day of a form: 0 serials, 1 day counts.
[[nodiscard]] std::int32_t Max_Date(std::int32_t form);

}  // namespace ingester

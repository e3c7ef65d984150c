// Dates and times as they are shown.
#pragma once

#include <cstdint>

namespace ingester {

/// Display codes that rules speak of; the table of `Format_Date_Time` has them all.
enum Date_Format : std::int32_t {
    day_month_year_format = 2,     ///< dd/mm/yyyy
    year_format = 31,              ///< of two digits; 32 of four
    date_time_format = 33,         ///< dd/mm/yy hh:mm:ss.cc; codes from here on show the time of day
    full_date_time_format = 34,    ///< yyyy-mm-dd hh:mm:ss
    marked_date_time_format = 35,  ///< d-Month-yyyy h:mm:ss and a marker
    time_format = 36,              ///< h:mm:ss; codes from here on show no date
    marked_time_format = 37,       ///< h:mm:ss am or pm
    total_hours_format = 38,
    seconds_format = 39,
    plain_format = 40,
};

/// Prints a day number of a form (0 serials, 1 day counts) by a display code; a negative one prints "*".
/// `target` has `Number_Text_Room`. Returns the end of the text.
char* Format_Date_Time(char* target, double value, std::int32_t form, std::int32_t format);

}  // namespace ingester

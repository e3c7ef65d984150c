// Dates and times as they are shown.
#pragma once

#include <cstdint>

namespace ingester {

/// All display codes. Where the year is `short_year` it has two digits in the 1900s and four elsewhere. Parts
/// are separated but where they are `packed`; `bare` days and months have no zero in front; `name` is the
/// month's short name and `month_name` its long one.
enum Date_Format : std::int32_t {
    day_month_short_year_format = 1,              ///< dd/mm/yy
    day_month_year_format = 2,                    ///< dd/mm/yyyy
    bare_day_month_short_year_format = 3,         ///< d/m/yy
    bare_day_month_year_format = 4,               ///< d/m/yyyy
    packed_day_month_short_year_format = 5,       ///< ddmmyy; codes without a layout print so, too
    packed_day_month_year_format = 6,             ///< ddmmyyyy
    packed_day_name_short_year_format = 7,        ///< ddMonyy
    packed_day_name_year_format = 8,              ///< ddMonyyyy
    day_name_short_year_format = 9,               ///< dd-Mon-yy
    day_name_year_format = 10,                    ///< dd-Mon-yyyy
    packed_bare_day_name_short_year_format = 11,  ///< dMonyy
    packed_bare_day_name_year_format = 12,        ///< dMonyyyy
    bare_day_name_short_year_format = 13,         ///< d-Mon-yy
    bare_day_name_year_format = 14,               ///< d-Mon-yyyy
    bare_day_month_name_short_year_format = 15,   ///< d-Month-yy
    bare_day_month_name_year_format = 16,         ///< d-Month-yyyy
    packed_short_year_month_day_format = 17,      ///< yymmdd
    packed_year_month_day_format = 18,            ///< yyyymmdd
    short_year_month_day_format = 19,             ///< yy/mm/dd
    year_month_day_format = 20,                   ///< yyyy/mm/dd
    packed_month_day_short_year_format = 21,      ///< mmddyy
    packed_month_day_year_format = 22,            ///< mmddyyyy
    month_day_short_year_format = 23,             ///< mm/dd/yy
    month_day_year_format = 24,                   ///< mm/dd/yyyy
    dashed_year_month_day_format = 27,            ///< yyyy-mm-dd
    short_year_format = 31,                       ///< is read as a year, and has no layout
    year_format = 32,                             ///< the same
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

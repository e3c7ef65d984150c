#include "model/date_format.h"

#include "model/calendar.h"
#include "model/sheet.h"
#include "request/settings.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <string_view>

namespace ingester {

namespace {

struct Date_Layout {
    std::int32_t format;
    std::string_view layout;
};

/// What each code prints. D and M are day and month of two digits, d the day as it is and m the month;
/// N is the month's short name and L its long one; Y is the year, y two digits of it in the 1900s. H is the
/// hour of two digits, h blank in front, i as it is, t the hours of all days; n minutes, s seconds and
/// c hundredths of two digits. All else stands for itself.
constexpr Date_Layout Date_Layouts[] = {
    {1, "D/M/y"},        {2, "D/M/Y"},
    {3, "d/m/y"},        {4, "d/m/Y"},
    {5, "DMy"},          {6, "DMY"},
    {7, "DNy"},          {8, "DNY"},
    {9, "D-N-y"},        {10, "D-N-Y"},
    {11, "dNy"},         {12, "dNY"},
    {13, "d-N-y"},       {14, "d-N-Y"},
    {15, "d-L-y"},       {16, "d-L-Y"},
    {17, "yMD"},         {18, "YMD"},
    {19, "y/M/D"},       {20, "Y/M/D"},
    {21, "MDy"},         {22, "MDY"},
    {23, "M/D/y"},       {24, "M/D/Y"},
    {27, "Y-M-D"},       {33, "D/M/y H:n:s.c"},
    {34, "Y-M-D H:n:s"}, {35, "d-L-Y i:n:s"},
    {36, "h:n:s"},       {37, "h:n:s"},
    {38, "t:n:s"},
};

constexpr std::string_view Other_Layout = "DMy";
constexpr std::size_t Layout_Limit = 39;

/// By code.
constexpr auto Layout_Table = [] {
    std::array<std::string_view, Layout_Limit> table;
    table.fill(Other_Layout);
    for (const Date_Layout& entry : Date_Layouts)
        table[static_cast<std::size_t>(entry.format)] = entry.layout;
    return table;
}();

/// A moment taken apart.
struct Moment {
    Calendar_Date date;
    std::int64_t days;  ///< whole ones, of the number itself
    std::int64_t hour;
    std::int64_t minute;
    std::int64_t second;
    std::int64_t hundredth;
};

constexpr double Greatest_Day = 1e9;  // what is beyond is a number, and no date

/// With `timed`, to the nearest hundredth of a second, which may be the next day's first.
Moment Take_Apart(double value, std::int32_t form, bool timed)
{
    constexpr std::int64_t hundredths_a_day = 8640000;
    Moment moment{};
    const double day = std::floor(value);
    moment.days = static_cast<std::int64_t>(day);
    if (timed) {
        std::int64_t time = std::llround((value - day) * static_cast<double>(hundredths_a_day));
        moment.days += time / hundredths_a_day;
        time %= hundredths_a_day;
        moment.hundredth = time % 100;
        moment.second = time / 100 % 60;
        moment.minute = time / 6000 % 60;
        moment.hour = time / 360000;
    }
    moment.date = Number_To_Date(moment.days, form);
    return moment;
}

char* Put(char* target, std::string_view text)
{
    return std::copy(text.begin(), text.end(), target);
}

/// At least two characters, with `filler` in front.
char* Put_Two(char* target, std::int64_t value, char filler = '0')
{
    if (value < 10)
        *target++ = filler;
    return Print_Integer(target, value);
}

char* Put_Part(char* target, char part, const Moment& moment, bool short_months)
{
    const Calendar_Date& date = moment.date;
    const auto month = static_cast<std::size_t>(date.month);
    switch (part) {
    case 'D':
        return Put_Two(target, date.day);
    case 'd':
        return Print_Integer(target, date.day);
    case 'M':
        return Put_Two(target, date.month);
    case 'm':
        return Print_Integer(target, date.month);
    case 'L':
        if (!short_months)
            return Put(target, Get_Settings().month_names[month]);
        [[fallthrough]];
    case 'N':
        return Put(target, Get_Settings().month_abbreviations[month]);
    case 'Y':
        return Print_Integer(target, date.year);
    case 'y':
        return Put_Two(target, date.year / 100 == 19 ? date.year % 100 : date.year);
    case 'H':
        return Put_Two(target, moment.hour);
    case 'h':
        return Put_Two(target, moment.hour, ' ');
    case 'i':
        return Print_Integer(target, moment.hour);
    case 't':
        return Put_Two(target, moment.days * 24 + moment.hour, ' ');
    case 'n':
        return Put_Two(target, moment.minute);
    case 's':
        return Put_Two(target, moment.second);
    case 'c':
        return Put_Two(target, moment.hundredth);
    default:
        *target = part;
        return target + 1;
    }
}

}  // namespace

char* Format_Date_Time(char* target, double value, std::int32_t form, std::int32_t format)
{
    if (!(value >= 0.0))
        return Put(target, "*");
    if (format == seconds_format)
        return Print_Fixed(target, std::min(value * Seconds_A_Day, Greatest_Number), 3);
    if (format == plain_format)
        return Print_General(target, value, 6);
    if (value > Greatest_Day)
        return Print_General(target, value, 15);
    const bool known = format > 0 && format < static_cast<std::int32_t>(Layout_Limit);
    const std::string_view layout = known ? Layout_Table[static_cast<std::size_t>(format)] : Other_Layout;
    Moment moment = Take_Apart(value, form, known && format >= date_time_format);
    const bool marked = format == marked_date_time_format || format == marked_time_format;
    const bool late = marked && moment.hour > 12;
    if (late)
        moment.hour -= 12;
    // The one with a date has its months and markers crossed, as everybody who reads it knows.
    const bool crossed = format == marked_date_time_format;
    for (const char part : layout)
        target = Put_Part(target, part, moment, crossed && late);
    return marked ? Put(target, late != crossed ? " pm" : " am") : target;
}

}  // namespace ingester

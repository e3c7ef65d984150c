#include "model/calendar.h"

#include "model/sheet.h"
#include "platform/folders.h"
#include "request/request.h"

#include <array>

namespace ingester {

namespace {

// Years begin in March, so that a leap day comes last. A century of 36524.25 days, a year of 365.25 and a
// month of 30.6 are counted in quarters and tenths of days: in integers, no rounding can miss a day.
constexpr std::int64_t Century_Quarters = 146097;
constexpr std::int64_t Year_Quarters = 1461;
constexpr std::int64_t Month_Tenths = 306;

constexpr std::int64_t Days_Before_Century(std::int64_t century)
{
    return (century * Century_Quarters) >> 2;  // rounds down below 0 as well
}

constexpr std::int64_t Days_Before_Year(std::int64_t year)
{
    return (year * Year_Quarters) >> 2;
}

constexpr std::int64_t Days_Before_Month(std::int64_t month)
{
    return (month * Month_Tenths + 5) / 10;
}

/// By month; January and February are the last two of the year before.
constexpr auto Days_Before = [] {
    std::array<std::int32_t, 13> days{};
    for (std::size_t month = 1; month <= 12; ++month)
        days[month] =
            static_cast<std::int32_t>(Days_Before_Month(static_cast<std::int64_t>((month + 9) % 12)));
    return days;
}();

constexpr std::int32_t First_Year = 1600;
constexpr std::int32_t Two_Digit_Years = 100;  // below, a year is one of the 1900s

}  // namespace

double Date_To_Number(std::int32_t day, std::int32_t month, std::int32_t year, std::int32_t form)
{
    if (!Is_Calendar_Day(day, month, year))
        return Missing_Value;
    std::int32_t years = year >= Two_Digit_Years ? year - First_Year : year + 300;
    if (years < 0)
        return 0.0;
    years -= month < 3 ? 1 : 0;
    const std::int32_t century = (years + 100) / 100 - 1;
    const std::int64_t count = Days_Before_Century(century) + Days_Before_Year(years - 100 * century)
                               + Days_Before[static_cast<std::size_t>(month)] + day;
    const auto value = static_cast<double>(count);
    if (form != 0 || count <= 1)
        return value;
    if (day == 29 && month == 2 && years == 299)  // 1900, which has none but in serials
        return False_Serial;
    const double serial = value - Serial_Offset;
    return serial <= False_Serial ? serial - 1.0 : serial;
}

double Date_To_Number(std::int32_t day, std::int32_t month, std::int32_t year)
{
    return Date_To_Number(day, month, year, request.Current_Date_Form);
}

Calendar_Date Number_To_Date(std::int64_t number, std::int32_t form)
{
    if (form == 0) {
        auto value = static_cast<double>(number);
        if (value == False_Serial)
            return {29, 2, 1900};
        Serial_To_Day_Count(value, 0.0);
        number = static_cast<std::int64_t>(value);
    }
    const std::int64_t century = 4 * number / Century_Quarters;
    std::int64_t rest = number - Days_Before_Century(century);
    std::int64_t year = 4 * rest / Year_Quarters;
    rest -= Days_Before_Year(year);
    const std::int64_t m = (10 * rest - 5) / Month_Tenths;
    std::int64_t day = rest - Days_Before_Month(m);
    std::int64_t month = m + 3;
    if (month > 12) {
        month -= 12;
        ++year;
    }
    if (day < 1) {  // the leap day in front of the first year
        --month;
        day += 29;
    }
    return {day, month, First_Year + century * 100 + year};
}

double Today_Number(std::int32_t form)
{
    const Local_Time now = Local_Time_Now();
    const double seconds = (now.hour * 60.0 + now.minute) * 60.0 + now.second;
    return Date_To_Number(now.day, now.month, now.year, form) + seconds / Seconds_A_Day;
}

void Serial_To_Day_Count(double& value, double missing)
{
    if (value < 0.0) {
        value = missing;
        return;
    }
    if (value < False_Serial)
        value += 1.0;
    value += Serial_Offset;
}

void Day_Count_To_Serial(double& value, double missing)
{
    if (value < Serial_Offset) {
        value = missing;
        return;
    }
    value -= Serial_Offset;
    if (value < False_Serial + 1.0)
        value -= 1.0;
}

std::int32_t Max_Date(std::int32_t form)
{
    return form == 0 ? 2958466 : 3067978;
}

}  // namespace ingester

#include "statfiles/sas/sas_dates.h"

#include "model/date_format.h"
#include "request/people_rules.h"
#include "support/text.h"

#include <algorithm>
#include <span>

namespace ingester {

namespace {

using namespace std::string_view_literals;

constexpr double Calendar_Day_Zero = 131428;  // 1 January 1960
constexpr double Host_Day_Zero = 131427;

struct Sas_Date_Format {
    std::string_view start;  ///< an end mark in it is compared as well
    std::int32_t display;
};

constexpr Sas_Date_Format Date_Formats[] = {
    {"DATETIME", date_time_format},
    {"TOD\0"sv, date_time_format},
    {"DATE", day_name_year_format},
    {"WEEK", day_name_year_format},
    {"YEAR", day_name_year_format},
    {"MMYY", day_name_year_format},
    {"YYMM", day_name_year_format},
    {"YYQR", day_name_year_format},
    {"DDMMYY", day_name_year_format},
    {"MMDDYY", day_name_year_format},
    {"YYMMDD", day_name_year_format},
    {"JULDAY", day_name_year_format},
    {"JULIAN", day_name_year_format},
    {"MONTH", day_name_year_format},
    {"YYMON", day_name_year_format},
    {"MONYY", day_name_year_format},
    {"NENGO", day_name_year_format},
    {"MONNAME", day_name_year_format},
    {"DOWNAME", day_name_year_format},
    {"WORDDAT", day_name_year_format},
    {"DAY\0"sv, day_name_year_format},
    {"YYQ\0"sv, day_name_year_format},
    {"QTR", day_name_year_format},
    {"TIME", time_format},
    {"HOUR", time_format},
    {"HHMM", time_format},
};

/// What people's files hold beside; looked at first.
constexpr Sas_Date_Format People_Date_Formats[] = {
    {"DATEAMPM", date_time_format},
    {"DTDATE", date_time_format},
    {"DTMONYY", date_time_format},
    {"DTYEAR", date_time_format},
    {"DTYYQC", date_time_format},
    {"DTWKDATX", date_time_format},
    {"E8601DT", full_date_time_format},
    {"E8601DZ", full_date_time_format},
    {"E8601DX", full_date_time_format},
    {"E8601DN", full_date_time_format},
    {"E8601DA", dashed_year_month_day_format},
    {"E8601TM", time_format},
    {"E8601TZ", time_format},
    {"E8601LZ", time_format},
    {"B8601DT", full_date_time_format},
    {"B8601DZ", full_date_time_format},
    {"B8601DN", full_date_time_format},
    {"B8601DA", dashed_year_month_day_format},
    {"B8601TM", time_format},
    {"B8601TZ", time_format},
    {"IS8601DT", full_date_time_format},
    {"IS8601DZ", full_date_time_format},
    {"IS8601DN", full_date_time_format},
    {"IS8601DA", dashed_year_month_day_format},
    {"IS8601TM", time_format},
    {"IS8601TZ", time_format},
    {"NLDATM", date_time_format},
    {"NLDATE", day_name_year_format},
    {"NLTIMAP", time_format},
    {"NLTIME", time_format},
    {"MDYAMPM", date_time_format},
    {"TIMEAMPM", time_format},
    {"TOD ", time_format},
    {"MMSS", time_format},
    {"DAY ", day_name_year_format},
    {"YYQ ", day_name_year_format},
    {"EURDFDT", date_time_format},
    {"EURDF", day_name_year_format},
    {"MINGUO", day_name_year_format},
    {"YYWEEK", day_name_year_format},
};

std::int32_t Find_Display(std::span<const Sas_Date_Format> formats, std::string_view nform)
{
    const auto found = std::ranges::find_if(
        formats, [&](const Sas_Date_Format& format) { return Starts_Ignoring_Case(nform, format.start); });
    return found == formats.end() ? 0 : found->display;
}

}  // namespace

double Sas_Day_Zero()
{
    return For_People(People_Rule::calendar_dates) ? Calendar_Day_Zero : Host_Day_Zero;
}

std::int32_t Date_Format_Of_Sas(std::string_view nform)
{
    const std::int32_t display =
        For_People(People_Rule::calendar_dates) ? Find_Display(People_Date_Formats, nform) : 0;
    return display != 0 ? display : Find_Display(Date_Formats, nform);
}

Epoch Sas_Epoch(std::int32_t date_format)
{
    const bool days = date_format == day_name_year_format || date_format == dashed_year_month_day_format;
    return {Sas_Day_Zero(), days ? 1.0 : Seconds_Per_Day};
}

}  // namespace ingester

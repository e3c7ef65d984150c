#include "model/iso_dates.h"

#include "model/calendar.h"
#include "model/date_format.h"
#include "support/number_text.h"

#include <cmath>

namespace ingester {

namespace {

constexpr std::int64_t Thousandths_A_Day = 86400000;

/// A moment as whole thousandths of a second; doubles tell them apart on every day that a column can hold.
struct Whole_Moment {
    std::int64_t day;
    std::int64_t thousandth;
};

Whole_Moment Whole_Moment_Of(double value)
{
    const double day = std::floor(value);
    const std::int64_t rounded = std::llround((value - day) * static_cast<double>(Thousandths_A_Day));
    return {static_cast<std::int64_t>(day) + rounded / Thousandths_A_Day, rounded % Thousandths_A_Day};
}

/// What the numbers of a column hold, whether it shows that or not.
struct Held_Parts {
    bool days = false;
    bool times = false;

    void Take(const Sheet& sheet, double value)
    {
        if (!Is_Present(sheet, value))
            return;
        const Whole_Moment moment = Whole_Moment_Of(value);
        days = days || moment.day != 0;
        times = times || moment.thousandth != 0;
    }
};

Held_Parts Parts_In(const Column& column)
{
    Held_Parts parts;
    if (column.type == factor_column)
        for (const Level_Node* level = column.level_values; level != nullptr; level = level->next)
            parts.Take(*column.sheet, level->value.number);
    else
        for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
            parts.Take(*column.sheet, cell->value.number);
    return parts;
}

/// Serials in front of 1900 are those days of the other count, which begins in 1600.
void Leave_Serials_Before_1900(std::int64_t& day, std::int32_t& date_form)
{
    if (date_form != 0 || day >= 0)
        return;
    day += static_cast<std::int64_t>(Serial_Offset) + 1;
    date_form = 1;
}

char* Put_Digits(char* target, std::int64_t number, int width)
{
    for (std::int64_t limit = 10; --width > 0; limit *= 10)
        if (number < limit)
            *target++ = '0';
    return Print_Integer(target, number);
}

char* Print_Day(char* target, std::int64_t day, std::int32_t date_form)
{
    Leave_Serials_Before_1900(day, date_form);
    const Calendar_Date date = Number_To_Date(day, date_form);
    target = Put_Digits(target, date.year, 4);
    *target++ = '-';
    target = Put_Digits(target, date.month, 2);
    *target++ = '-';
    return Put_Digits(target, date.day, 2);
}

char* Print_Time(char* target, std::int64_t hours_before, std::int64_t thousandth)
{
    target = Put_Digits(target, hours_before + thousandth / 3600000, 2);
    *target++ = ':';
    target = Put_Digits(target, thousandth / 60000 % 60, 2);
    *target++ = ':';
    target = Put_Digits(target, thousandth / 1000 % 60, 2);
    if (thousandth % 1000 == 0)
        return target;
    *target++ = '.';
    return Put_Digits(target, thousandth % 1000, 3);
}

}  // namespace

Iso_Form Iso_Form_Of(const Column& column)
{
    switch (column.date_format) {
    case seconds_format:
    case plain_format:
        return Iso_Form::number;
    case total_hours_format:
        return Iso_Form::time;
    case time_format:
    case marked_time_format:
        return Parts_In(column).days ? Iso_Form::date_time : Iso_Form::time;
    case date_time_format:
    case full_date_time_format:
    case marked_date_time_format:
        return Iso_Form::date_time;
    default:
        return Parts_In(column).times ? Iso_Form::date_time : Iso_Form::date;
    }
}

namespace {

bool Iso_Can_Write(double value, std::int32_t date_form, Iso_Form form)
{
    constexpr double most_hours = 1e9;
    if (form == Iso_Form::time)
        return value >= 0 && value < most_hours;
    const double serial = date_form == 0 ? value : value - Serial_Offset;
    return serial < Max_Date(0) && serial >= -Serial_Offset;
}

char* Print_Iso(char* target, double value, std::int32_t date_form, Iso_Form form)
{
    const Whole_Moment moment = Whole_Moment_Of(value);
    if (form == Iso_Form::time)
        return Print_Time(target, moment.day * 24, moment.thousandth);
    target = Print_Day(target, moment.day, date_form);
    if (form == Iso_Form::date)
        return target;
    *target++ = ' ';
    return Print_Time(target, 0, moment.thousandth);
}

}  // namespace

char* Print_For_Others(char* target, const Column& column, Iso_Form form, double value)
{
    constexpr double thousandths = 1000;
    if (column.format != date_format_mark || column.date_format == plain_format)
        return Print_Shortest(target, value);
    if (column.date_format == seconds_format)
        return Print_Shortest(target, std::round(value * Seconds_A_Day * thousandths) / thousandths);
    return Iso_Can_Write(value, column.date_form, form) ? Print_Iso(target, value, column.date_form, form)
                                                        : target;
}

}  // namespace ingester

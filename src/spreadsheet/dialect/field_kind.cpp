#include "spreadsheet/dialect/field_kind.h"

#include "model/calendar.h"
#include "model/sheet.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <string>

namespace ingester {

namespace {

constexpr std::size_t Longest_Number = 400;

/// "1234567" of "1,234,567": every group but the first has three digits.
bool Is_In_Groups(std::string_view digits, char mark)
{
    constexpr std::size_t group = 3;
    const std::size_t head = digits.find(mark);
    if (head == 0 || head > group)
        return false;
    for (std::string_view rest = digits.substr(head); !rest.empty(); rest.remove_prefix(group + 1))
        if (rest.front() != mark || rest.size() < group + 1
            || !std::all_of(rest.begin() + 1, rest.begin() + 1 + group, Is_Digit)
            || (rest.size() > group + 1 && rest[group + 1] != mark))
            return false;
    return std::all_of(digits.begin(), digits.begin() + static_cast<std::ptrdiff_t>(head), Is_Digit);
}

/// The number as it is written with a point and no groups; empty when its marks are no such.
std::string_view Without_Marks(std::string_view text, Number_Marks marks,
                               std::array<char, Longest_Number>& room)
{
    const std::size_t sign = text.front() == '-' || text.front() == '+' ? 1 : 0;
    const std::string_view whole = text.substr(sign, text.find(marks.decimal) - sign);
    const bool grouped = marks.thousands != '\0' && whole.find(marks.thousands) != std::string_view::npos;
    if (grouped && !Is_In_Groups(whole, marks.thousands))
        return {};
    std::size_t size = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        if (grouped && i < sign + whole.size() && text[i] == marks.thousands)
            continue;
        if (text[i] == '.' && marks.decimal != '.')
            return {};
        room[size++] = text[i] == marks.decimal ? '.' : text[i];
    }
    return {room.data(), size};
}

/// Digits alone that a double doesn't hold, or that begin with zeros, name something.
bool Is_Number_By_Name(std::string_view text)
{
    constexpr std::size_t surely_exact = 15;
    if (text.front() == '-' || text.front() == '+')
        text.remove_prefix(1);
    if (text.size() > 1 && text[0] == '0' && Is_Digit(text[1]))
        return true;
    if (text.size() <= surely_exact || !std::all_of(text.begin(), text.end(), Is_Digit))
        return false;
    double value;
    if (text.size() >= Longest_Number || !Whole_Number_Text(text, value))
        return true;
    char room[Number_Text_Room];
    return std::string_view(room, Print_Fixed(room, value, 0)) != text;
}

/// Beyond doubles: too great, or so near to 0 that it is 0. By the place of its first digit that isn't 0.
bool Is_Too_Great(std::string_view text)
{
    const std::size_t exponent = std::min(text.find_first_of("eE"), text.size());
    const std::string_view digits = text.substr(0, exponent);
    const std::size_t point = std::min(digits.find('.'), digits.size());
    const std::size_t first = std::min(digits.find_first_of("123456789"), digits.size());
    double shift = 0;
    if (exponent < text.size() && !Whole_Number_Text(text.substr(exponent + 1), shift))
        return text[exponent + 1] != '-';  // an exponent that is beyond doubles itself
    return shift + static_cast<double>(point) > static_cast<double>(first);
}

}  // namespace

bool Read_Number(std::string_view text, Number_Marks marks, Field_Number& number)
{
    if (text.empty() || text.size() > Longest_Number
        || !(Is_Digit(text.back()) || text.back() == marks.decimal))
        return false;
    std::array<char, Longest_Number> room;
    if (marks.decimal != '.' || marks.thousands != '\0') {
        text = Without_Marks(text, marks, room);
        if (text.empty())
            return false;
    }
    const char* const last = text.data() + text.size();
    const Parsed_Number parsed = Parse_Number(text.data(), last);
    if (parsed.end != last || parsed.status == Number_Status::none || Is_Number_By_Name(text))
        return false;
    const double greatest = text.front() == '-' ? -Greatest_Number : Greatest_Number;
    number = {parsed.value, false};
    if (parsed.status == Number_Status::out_of_range && Is_Too_Great(text))
        number = {greatest, true};
    else if (parsed.value > Greatest_Number)
        number = {Greatest_Number, true};
    return true;
}

std::string_view Plain_Number(std::string_view text, Number_Marks marks, std::string& room)
{
    if (text.empty() || text.size() > Longest_Number || (marks.decimal == '.' && marks.thousands == '\0'))
        return text;
    std::array<char, Longest_Number> plain;
    room = Without_Marks(text, marks, plain);
    return room;
}

bool Is_Missing_Word(std::string_view text)
{
    constexpr std::size_t longest = 4;
    return text.empty()
           || (text.size() <= longest && std::ranges::find(Missing_Words, text) != std::end(Missing_Words));
}

namespace {

/// Two or four digits at `at`; -1 for none.
std::int32_t Digits_At(std::string_view text, std::size_t at, std::size_t count)
{
    std::int32_t value = 0;
    if (at + count > text.size())
        return -1;
    for (const char c : text.substr(at, count)) {
        if (!Is_Digit(c))
            return -1;
        value = value * 10 + (c - '0');
    }
    return value;
}

bool Is_Leap_Year(std::int32_t year)
{
    return (year % 4 == 0 && year % 100 != 0) || year % 400 == 0;
}

/// "2024-02-29"
bool Read_Day(std::string_view text, double& day)
{
    constexpr std::int32_t form = 1;
    constexpr std::int32_t first_year = 1601;
    const std::int32_t year = Digits_At(text, 0, 4);
    const std::int32_t month = Digits_At(text, 5, 2);
    const std::int32_t number = Digits_At(text, 8, 2);
    if (text.size() != 10 || text[4] != '-' || text[7] != '-' || year < first_year || month < 1
        || !Is_Calendar_Day(number, month, year) || (month == 2 && number == 29 && !Is_Leap_Year(year)))
        return false;
    day = Date_To_Number(number, month, year, form);
    if (!(day > 0) || day > Max_Date(form))
        return false;
    const Calendar_Date back = Number_To_Date(static_cast<std::int64_t>(day), form);
    return back.year == year && back.month == month && back.day == number;
}

/// "25" of "23:59:59.25", as seconds.
bool Read_Fraction(std::string_view digits, double& seconds, Iso_Moment& moment)
{
    constexpr std::size_t held = 3;
    if (digits.empty() || !std::ranges::all_of(digits, Is_Digit))
        return false;
    double unit = 1;
    double thousandths = 0;
    for (const char digit : digits.substr(0, held)) {
        thousandths = thousandths * 10 + (digit - '0');
        unit *= 10;
    }
    seconds += thousandths / unit;
    moment.fraction = thousandths != 0;
    moment.finer = digits.size() > held && digits.find_first_not_of('0', held) != std::string_view::npos;
    return true;
}

/// "23:59", "23:59:59" or "23:59:59.25", as seconds.
bool Read_Time(std::string_view text, double& seconds, Iso_Moment& moment)
{
    const std::int32_t hour = Digits_At(text, 0, 2);
    const std::int32_t minute = Digits_At(text, 3, 2);
    const std::int32_t second = text.size() > 5 ? Digits_At(text, 6, 2) : 0;
    if (text.size() < 5 || text[2] != ':' || hour < 0 || hour > 23 || minute < 0 || minute > 59 || second < 0
        || second > 59 || (text.size() > 5 && text[5] != ':'))
        return false;
    seconds = hour * 3600.0 + minute * 60.0 + second;
    return text.size() == 5 || text.size() == 8
           || (text[8] == '.' && Read_Fraction(text.substr(9), seconds, moment));
}

}  // namespace

Iso_Moment Read_Iso_Moment(std::string_view text)
{
    constexpr std::size_t shortest = 5;
    constexpr std::size_t longest = 32;
    constexpr std::size_t day_width = 10;
    if (text.size() < shortest || text.size() > longest || !Is_Digit(text[0])
        || (text[2] != ':' && text[4] != '-'))
        return {};
    Iso_Moment moment;
    double seconds = 0;
    if (text[2] == ':') {
        if (!Read_Time(text, seconds, moment))
            return {};
        moment.sense = Field_Sense::time;
        moment.value = seconds / Seconds_A_Day;
        return moment;
    }
    double day;
    if (text.size() == day_width)
        return Read_Day(text, day) ? Iso_Moment{Field_Sense::date, day} : Iso_Moment{};
    if (text.size() < day_width || (text[day_width] != 'T' && text[day_width] != ' ')
        || !Read_Day(text.substr(0, day_width), day)
        || !Read_Time(text.substr(day_width + 1), seconds, moment))
        return {};
    moment.sense = Field_Sense::date_time;
    moment.value = day + seconds / Seconds_A_Day;
    return moment;
}

Field_Sense Sense_Of_Field(std::string_view text, Number_Marks marks)
{
    Field_Number number;
    if (Is_Missing_Word(text))
        return Field_Sense::nothing;
    if (Read_Number(text, marks, number))
        return Field_Sense::number;
    return Read_Iso_Moment(text).sense;
}

Mark_Evidence Evidence_Of(std::string_view text)
{
    if (!text.empty() && (text.front() == '-' || text.front() == '+'))
        text.remove_prefix(1);
    const std::size_t strange = text.find_first_not_of("0123456789.,");
    if (text.empty() || (strange != std::string_view::npos && text[strange] != 'e' && text[strange] != 'E'))
        return Mark_Evidence::none;
    text = text.substr(0, strange);
    const auto commas = std::ranges::count(text, ',');
    const auto points = std::ranges::count(text, '.');
    const std::size_t comma = text.find(',');
    const std::size_t point = text.find('.');
    if (commas + points == 0)
        return Mark_Evidence::none;
    if (commas > 0 && points > 0) {
        if (points == 1 && Is_In_Groups(text.substr(0, point), ','))
            return Mark_Evidence::comma_groups;
        return commas == 1 && Is_In_Groups(text.substr(0, comma), '.') ? Mark_Evidence::point_groups
                                                                       : Mark_Evidence::none;
    }
    const bool by_comma = commas > 0;
    const bool grouped = text.front() != '0' && Is_In_Groups(text, by_comma ? ',' : '.');
    if (commas + points > 1)
        return !grouped ? Mark_Evidence::none
                        : (by_comma ? Mark_Evidence::comma_groups : Mark_Evidence::point_groups);
    if (grouped)
        return by_comma ? Mark_Evidence::comma_or_groups : Mark_Evidence::point_or_groups;
    return by_comma ? Mark_Evidence::comma : Mark_Evidence::point;
}

}  // namespace ingester

#include "model/date_text.h"

#include "model/calendar.h"
#include "model/date_format.h"
#include "model/sheet.h"
#include "model/time_text.h"
#include "model/usual_dates.h"
#include "request/settings.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <bit>

namespace ingester {

namespace {

enum class Reading : std::uint8_t {
    date,        ///< a time may follow
    date_time,   ///< a time follows
    time,        ///< the time of a day
    hours,       ///< a time of any number of hours
    seconds,     ///< a number of seconds
    day_number,  ///< the number itself
};

enum class Joint : std::uint8_t { apart, together, either };

/// The parts of a text in their order: d day, m month, y year, Y a year of four digits, n a day of one or
/// two digits, N a month's short name, L its long one, B either name, A either or a number, w a weekday.
/// Parts that stand apart are divided by a separator; those together have two characters (N three) or
/// what is left.
struct Text_Layout {
    std::string_view parts;
    Joint joint;
    Reading reading;
    std::uint64_t formats;  ///< the codes that read so, a bit each
    bool numbers = false;   ///< the parts are three numbers apart, at these places:
    std::uint8_t day = 0;
    std::uint8_t month = 0;
    std::uint8_t year = 0;

    constexpr Text_Layout(std::string_view the_parts, Joint the_joint, Reading the_reading,
                          std::uint64_t the_formats)
        : parts(the_parts), joint(the_joint), reading(the_reading), formats(the_formats)
    {
        numbers = reading == Reading::date && joint == Joint::apart && parts.size() == 3
                  && parts.find_first_not_of("dmy") == std::string_view::npos;
        if (!numbers)
            return;
        day = static_cast<std::uint8_t>(parts.find('d'));
        month = static_cast<std::uint8_t>(parts.find('m'));
        year = static_cast<std::uint8_t>(parts.find('y'));
    }
};

template <class... Format> constexpr std::uint64_t Bits(Format... formats)
{
    return (... | (std::uint64_t{1} << formats));
}

constexpr Text_Layout Text_Layouts[] = {
    {"dmy", Joint::apart, Reading::date, Bits(1, 2, 3, 4)},
    {"dmy", Joint::together, Reading::date, Bits(5, 6)},
    {"dNy", Joint::together, Reading::date, Bits(7, 8)},
    {"dNy", Joint::apart, Reading::date, Bits(9, 10, 13, 14)},
    {"nNy", Joint::together, Reading::date, Bits(11, 12)},
    {"dLy", Joint::apart, Reading::date, Bits(15, 16)},
    {"ymd", Joint::together, Reading::date, Bits(17)},
    {"Ymd", Joint::together, Reading::date, Bits(18)},
    {"ymd", Joint::apart, Reading::date, Bits(19, 20, 27)},
    {"mdy", Joint::together, Reading::date, Bits(21, 22)},
    {"mdy", Joint::apart, Reading::date, Bits(23, 24)},
    {"Ndy", Joint::either, Reading::date, Bits(25, 26)},
    {"wdAy", Joint::apart, Reading::date, Bits(28)},
    {"w", Joint::apart, Reading::date, Bits(29)},
    {"Ny", Joint::either, Reading::date, Bits(30)},
    {"y", Joint::apart, Reading::date, Bits(31, 32)},
    {"dmy", Joint::apart, Reading::date_time, Bits(33)},
    {"ymd", Joint::apart, Reading::date_time, Bits(34)},
    {"dBy", Joint::apart, Reading::date_time, Bits(35)},
    {"", Joint::apart, Reading::time, Bits(36)},
    {"", Joint::apart, Reading::time, Bits(37)},
    {"", Joint::apart, Reading::hours, Bits(38)},
    {"", Joint::apart, Reading::seconds, Bits(39)},
    {"", Joint::apart, Reading::day_number, Bits(40)},
};

static_assert(std::size(Text_Layouts) == No_Layout);

/// By code.
constexpr auto Layout_By_Format = [] {
    std::array<std::size_t, Greatest_Date_Format + 1> table{};
    table.fill(No_Layout);
    for (std::size_t layout = 0; layout < std::size(Text_Layouts); ++layout)
        for (std::size_t format = 0; format < table.size(); ++format)
            if ((Text_Layouts[layout].formats >> format & 1) != 0)
                table[format] = layout;
    return table;
}();

constexpr std::uint64_t Marked_Formats = Bits(marked_date_time_format, marked_time_format);

bool Is_Marked(const Text_Layout& layout)
{
    return (layout.formats & Marked_Formats) != 0;
}

constexpr bool Is_Separator(char c)
{
    return c == '/' || c == '-' || c == ' ';
}

/// What stands between two separators.
struct Piece {
    const char* first = nullptr;
    std::size_t size = 0;
    std::int32_t number = 0;  ///< when it is digits throughout, at least one; else below 0

    [[nodiscard]] std::string_view Text() const { return {first, size}; }
};

constexpr std::size_t Most_Pieces = 4;  // of any layout

/// A text cut once for all layouts.
struct Cut_Text {
    std::string_view whole;
    std::string_view date;  ///< the whole, or what stands in front of the time
    std::string_view time;  ///< what stands behind the blank before the first colon, if anything does
    std::array<Piece, Most_Pieces + 1> pieces;  ///< of the date; the last is what all others leave
    std::size_t count;
    bool colon;  ///< one stands in the pieces
    bool words;  ///< a piece is no number

    [[nodiscard]] constexpr bool Has_Time() const { return colon || !time.empty(); }
    [[nodiscard]] constexpr bool Is_Three_Numbers() const { return count == 3 && !words && time.empty(); }
};

inline void Cut_At_Separators(std::string_view text, Cut_Text& cut)
{
    constexpr std::ptrdiff_t most_digits = 9;
    const char* at = text.data();
    const char* const last = at + text.size();
    cut.date = text;
    cut.count = 0;
    cut.colon = false;
    cut.words = false;
    for (;; ++at) {
        const char* const first = at;
        std::uint32_t digits = 0;  // of more than fit, the rest is of no interest
        for (; at != last && Is_Digit(*at); ++at)
            digits = digits * 10 + static_cast<std::uint32_t>(*at - '0');
        std::int32_t number = at - first > most_digits ? Too_Great_Part : static_cast<std::int32_t>(digits);
        if (at == first || (at != last && !Is_Separator(*at)) || cut.count == Most_Pieces) [[unlikely]] {
            for (; at != last && !(Is_Separator(*at) && cut.count < Most_Pieces); ++at)
                cut.colon = cut.colon || *at == ':';
            number = -1;
            cut.words = true;
        }
        cut.pieces[cut.count++] = {first, static_cast<std::size_t>(at - first), number};
        if (at == last)
            return;
    }
}

/// Cuts a trimmed text; a time goes by itself.
inline void Cut(std::string_view text, Cut_Text& cut)
{
    cut.whole = text;
    cut.time = {};
    Cut_At_Separators(text, cut);
    if (!cut.colon)
        return;
    const std::size_t blank = text.rfind(' ', text.find(':'));
    if (blank == std::string_view::npos)
        return;
    Cut_At_Separators(Trim_Copy(text.substr(0, blank)), cut);
    cut.time = text.substr(blank + 1);
}

struct Date_Parts {
    std::int32_t day = 1;
    std::int32_t month = 1;
    std::int32_t year = 0;
};

std::int32_t Weekday_Of(std::string_view text)
{
    const auto& names = Get_Settings().day_names;
    for (std::size_t day = 1; day <= 7; ++day)
        if (Equal_Ignoring_Case(text, names[day]))
            return static_cast<std::int32_t>(day);
    return 0;
}

std::int32_t Month_From_Any(std::string_view text, bool strict)
{
    const std::int32_t month = Month_From_Name(text, strict);
    return month != 0 ? month : Month_From_Short(text, strict);
}

constexpr std::int32_t First_Serial_Year = 1900;  // dates in front of it have no serials

bool Is_Year(std::int32_t year)
{
    return In_Range(year, 0, 99) || In_Range(year, 1600, 9999);
}

/// Takes one part out of what stands for it.
bool Take_Part(char part, const Piece& piece, bool strict, Date_Parts& date)
{
    const std::int32_t number =
        piece.number >= 0 || strict ? piece.number : Read_Part_Number(piece.Text(), false);
    const auto fits = [&](std::size_t digits) { return !strict || piece.size <= digits; };
    switch (part) {
    case 'd':
    case 'n':
        date.day = number;
        return fits(2) && In_Range(number, 1, 31);
    case 'm':
        date.month = number;
        return fits(2) && In_Range(number, 1, 12);
    case 'y':
    case 'Y':
        date.year = number;
        return fits(4) && Is_Year(number);
    case 'N':
        return (date.month = Month_From_Short(piece.Text(), strict)) != 0;
    case 'L':
        return (date.month = Month_From_Name(piece.Text(), strict)) != 0;
    case 'A':
        if (number >= 0)
            return Take_Part('m', piece, strict, date);
        [[fallthrough]];
    case 'B':
        return (date.month = Month_From_Any(piece.Text(), strict)) != 0;
    default:  // a weekday says nothing in a date, and by itself stands for the day that begins the serials
        date.day = Weekday_Of(piece.Text());
        return date.day != 0;
    }
}

bool Take_Parts_Apart(const Text_Layout& layout, const Cut_Text& cut, bool strict, Date_Parts& date)
{
    const std::size_t count = layout.parts.size();
    if (strict ? cut.count != count : cut.count < count)
        return false;
    for (std::size_t i = 0; i < count; ++i)
        if (!Take_Part(layout.parts[i], cut.pieces[i], strict, date))
            return false;
    return true;
}

/// How many characters a part takes of `text` where no separators tell.
std::size_t Width_Of_Part(char part, bool first, std::string_view text)
{
    switch (part) {
    case 'N':
        return 3;
    case 'n':
        return text.size() > 1 && Is_Digit(text[1]) ? 2 : 1;
    case 'Y':
        return 4;
    case 'y':
        return !first ? text.size() : text.size() == 8 ? 4 : 2;
    default:
        return 2;
    }
}

bool Take_Parts_Together(const Text_Layout& layout, std::string_view text, bool strict, Date_Parts& date)
{
    bool first = true;
    for (const char part : layout.parts) {
        const std::size_t width = Width_Of_Part(part, first, text);
        if (text.size() < width || (part == 'y' && width != 4 && (width < 2 || (strict && width != 2))))
            return false;
        const std::string_view own = text.substr(0, width);
        const Piece piece = {own.data(), width, Read_Part_Number(own, true)};
        if (!Take_Part(part, piece, strict, date))
            return false;
        text.remove_prefix(width);
        first = false;
    }
    return text.empty() || !strict;
}

/// The value of a date's parts; false for a day that there isn't.
inline bool Value_Of(const Date_Parts& date, std::int32_t form, double& value)
{
    if (!Is_Year(date.year))
        return false;
    value = Date_To_Number(date.day, date.month, date.year, form);
    return value != Missing_Value;
}

bool Take_Parts(const Text_Layout& layout, const Cut_Text& cut, bool strict, Date_Parts& date)
{
    const bool together =
        layout.joint == Joint::together || (layout.joint == Joint::either && cut.count == 1);
    if (!together)
        return Take_Parts_Apart(layout, cut, strict, date);
    return (!strict || cut.count == 1) && Take_Parts_Together(layout, cut.date, strict, date);
}

bool Is_Day_Number(std::string_view text, double& value)
{
    const bool number = Whole_Number_Text(text, value);
    value = std::min(value, Greatest_Number);
    return number;
}

/// A date, with the time behind it if there is one.
bool Read_Date(const Text_Layout& layout, const Cut_Text& cut, std::int32_t form, bool strict, double& value)
{
    Date_Parts date;
    if (!Take_Parts(layout, cut, strict, date) || !Value_Of(date, form, value))
        return false;
    if (cut.time.empty())
        return !strict || layout.reading == Reading::date;
    double time;
    if (!Read_Time(cut.time, strict, Is_Marked(layout), Hours_A_Day, time))
        return false;
    value += time;
    return true;
}

bool Read_Otherwise(const Text_Layout& layout, const Cut_Text& cut, std::int32_t form, bool strict,
                    double& value)
{
    switch (layout.reading) {
    case Reading::date:
    case Reading::date_time:
        return Read_Date(layout, cut, form, strict, value);
    case Reading::time:
        return Read_Time(cut.whole, strict, Is_Marked(layout), Hours_A_Day, value);
    case Reading::hours:
        return Read_Time(cut.whole, strict, false, Too_Great_Part - 1, value);
    case Reading::seconds:
        if (!Whole_Number_Text(cut.whole, value) || value < 0.0)
            return false;
        value /= Seconds_A_Day;
        return true;
    case Reading::day_number:
        return Is_Day_Number(cut.whole, value) && value >= 0.0;
    }
    return false;
}

/// The parts of the usual date, three numbers and nothing else, in the order of a layout.
inline Date_Parts Numbers_Of(const Text_Layout& layout, const Cut_Text& cut)
{
    return {cut.pieces[layout.day].number, cut.pieces[layout.month].number, cut.pieces[layout.year].number};
}

/// Whether a strict reading takes numbers of so many digits.
inline bool Are_Short_Enough(const Text_Layout& layout, const Cut_Text& cut)
{
    return cut.pieces[layout.day].size <= 2 && cut.pieces[layout.month].size <= 2
           && cut.pieces[layout.year].size <= 4;
}

inline bool Read_By_Layout(const Text_Layout& layout, const Cut_Text& cut, std::int32_t form, bool strict,
                           double& value)
{
    if (!layout.numbers || !cut.Is_Three_Numbers())
        return Read_Otherwise(layout, cut, form, strict, value);
    return (!strict || Are_Short_Enough(layout, cut)) && Value_Of(Numbers_Of(layout, cut), form, value);
}

/// Layouts that a text may have when read strictly, by the shape of the text: a bit a layout. All others
/// would fail in the end.
class Possible_Layouts {
public:
    constexpr Possible_Layouts()
    {
        for (const bool colon : {false, true})
            for (const bool words : {false, true})
                for (std::size_t count = 1; count <= Most_Pieces + 1; ++count)
                    for (std::size_t i = 0; i < std::size(Text_Layouts); ++i)
                        if (May_Have(Text_Layouts[i], colon, words, count))
                            table_[colon][words][count] |= std::uint64_t{1} << i;
    }

    [[nodiscard]] constexpr std::uint64_t Of(const Cut_Text& cut) const
    {
        return table_[cut.Has_Time()][cut.words][cut.count];
    }

private:
    static constexpr bool May_Have(const Text_Layout& layout, bool colon, bool words, std::size_t count)
    {
        switch (layout.reading) {
        case Reading::time:
        case Reading::hours:
            return colon;
        case Reading::seconds:
        case Reading::day_number:
            return !colon && (words || count == 1);  // words for a point or an exponent
        case Reading::date_time:
            if (!colon)
                return false;
            break;
        case Reading::date:
            break;
        }
        const bool apart = layout.joint != Joint::together && layout.parts.size() == count;
        const bool together = layout.joint != Joint::apart && count == 1;
        return (apart || together) && words == (layout.parts.find_first_of("NLBw") != std::string_view::npos);
    }

    std::array<std::array<std::array<std::uint64_t, Most_Pieces + 2>, 2>, 2> table_{};
};

constexpr Possible_Layouts Possible;

/// The last resort: six digits or more in front of something else, or a day number. A time isn't cut off.
bool Read_Without_Layout(std::string_view text, std::int32_t form, double& value)
{
    constexpr std::size_t day_and_month = 4;
    const std::size_t end = text.find_first_of("/-:,\\ ");
    if (end == std::string_view::npos)
        return Is_Day_Number(text, value) && value > 0.0;
    if (end <= day_and_month || text.find(':', end + 1) != std::string_view::npos)
        return false;
    const Date_Parts date = {Read_Part_Number(text.substr(0, 2), false),
                             Read_Part_Number(text.substr(2, 2), false),
                             Read_Part_Number(text.substr(day_and_month, end - day_and_month), false)};
    return Value_Of(date, form, value);
}

/// Whether a text that could not be read has all parts of its layout: then it is that of no day, or no time,
/// and nothing else.
bool Has_Parts_Of_Layout(const Text_Layout& layout, const Cut_Text& cut)
{
    Date_Parts date;
    double number;
    switch (layout.reading) {
    case Reading::date:
    case Reading::date_time:
        return Take_Parts(layout, cut, false, date) && Is_Year(date.year);
    case Reading::time:
    case Reading::hours:
        return cut.Has_Time();
    default:
        return Whole_Number_Text(cut.whole, number);
    }
}

bool Read_Loosely(std::size_t layout, const Cut_Text& cut, std::int32_t form, bool strict, double& value)
{
    if (layout != No_Layout && Read_By_Layout(Text_Layouts[layout], cut, form, strict, value))
        return true;
    return !strict && (layout == No_Layout || !Has_Parts_Of_Layout(Text_Layouts[layout], cut))
           && Read_Without_Layout(cut.whole, form, value);
}

bool Says_No_Date(std::string_view trimmed)
{
    return trimmed.empty() || trimmed.front() == '*';
}

}  // namespace

std::size_t Date_Layout_Of(std::int32_t format)
{
    return In_Range(format, 1, Greatest_Date_Format) ? Layout_By_Format[static_cast<std::size_t>(format)]
                                                     : No_Layout;
}

bool Text_To_Date(std::string_view text, double& value, std::int32_t form, std::int32_t format,
                  double missing, bool strict)
{
    Date_Text_Room room;
    text = Usual_Date_Text(Trim_Copy(text, Text_Cell_Width), room);
    value = missing;
    if (Says_No_Date(text))
        return true;
    Cut_Text cut;
    Cut(text, cut);
    double read;
    if (!Read_Loosely(Date_Layout_Of(format), cut, form, strict, read) || read > Max_Date(form))
        return false;
    value = read;
    return true;
}

namespace {

/// The layouts of three numbers apart.
constexpr auto Number_Layouts = [] {
    std::array<std::size_t, 3> layouts{};
    std::size_t count = 0;
    for (std::size_t i = 0; i < std::size(Text_Layouts); ++i)
        if (Text_Layouts[i].numbers)
            layouts[count++] = i;
    return layouts;
}();

/// All orders of three numbers. Whether a day can be a month as well changes from cell to cell, so nothing
/// branches on it.
inline Strict_Readings Read_Numbers_By_All(const Cut_Text& cut)
{
    Strict_Readings readings;
    for (const std::size_t i : Number_Layouts) {
        const Text_Layout& layout = Text_Layouts[i];
        const Date_Parts date = Numbers_Of(layout, cut);
        if (!Are_Short_Enough(layout, cut) || !Is_Year(date.year))
            continue;
        const auto good = static_cast<std::uint64_t>(Is_Calendar_Day(date.day, date.month, date.year));
        const auto early = static_cast<std::uint64_t>(date.year >= 100 && date.year < First_Serial_Year);
        readings.good |= good << i;
        readings.early |= (good & early) << i;
    }
    if (readings.good != 0) {
        const Date_Parts date = Numbers_Of(Text_Layouts[std::countr_zero(readings.good)], cut);
        readings.value = Date_To_Number(date.day, date.month, date.year, 1);
    }
    return readings;
}

}  // namespace

Strict_Readings Read_By_All_Layouts(std::string_view text)
{
    constexpr double first_day = Serial_Offset + 1.0;  // of the serials
    Date_Text_Room room;
    text = Usual_Date_Text(Trim_Copy(text, Text_Cell_Width), room);
    if (Says_No_Date(text))
        return {.blank = true};
    Cut_Text cut;
    Cut(text, cut);
    if (cut.Is_Three_Numbers())
        return Read_Numbers_By_All(cut);
    Strict_Readings readings;
    for (std::uint64_t left = Possible.Of(cut); left != 0; left &= left - 1) {
        const Text_Layout& layout = Text_Layouts[std::countr_zero(left)];
        double value;
        if (!Read_By_Layout(layout, cut, 1, true, value) || value > Max_Date(1))
            continue;
        const std::uint64_t bit = left & (~left + 1);
        if (readings.good == 0)
            readings.value = value;
        readings.good |= bit;
        if (value < first_day && !layout.parts.empty())
            readings.early |= bit;
    }
    readings.colon = cut.Has_Time();
    return readings;
}

std::int32_t Month_From_Short(std::string_view text, bool strict)
{
    const auto& names = Get_Settings().month_abbreviations;
    for (std::size_t month = 1; month <= 12; ++month)
        if (strict ? Equal_Ignoring_Case(text, names[month]) : Starts_Ignoring_Case(text, names[month]))
            return static_cast<std::int32_t>(month);
    return 0;
}

std::int32_t Month_From_Name(std::string_view text, bool strict)
{
    const auto& names = Get_Settings().month_names;
    for (std::size_t month = 1; month <= 12; ++month)
        if (strict ? Equal_Ignoring_Case(text, names[month]) : Starts_Ignoring_Case(text, names[month]))
            return static_cast<std::int32_t>(month);
    return 0;
}

}  // namespace ingester

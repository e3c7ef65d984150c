#include "model/usual_dates.h"

#include "model/time_text.h"
#include "request/settings.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>

namespace ingester {

namespace {

/// A text that is changed where it stands.
class Changing_Text {
public:
    Changing_Text(std::string_view text, Date_Text_Room& room)
        : first_(room.data()), size_(text.copy(first_, room.size()))
    {}

    [[nodiscard]] std::string_view View() const { return {first_, size_}; }
    [[nodiscard]] char& At(std::size_t place) { return first_[place]; }

    void Replace(std::size_t from, std::size_t count, std::string_view by)
    {
        std::memmove(first_ + from + by.size(), first_ + from + count, size_ - from - count);
        by.copy(first_ + from, by.size());
        size_ = size_ - count + by.size();
    }

private:
    char* first_;
    std::size_t size_;
};

bool Stands_Between_Digits(std::string_view text, std::size_t place)
{
    return place > 0 && place + 1 < text.size() && Is_Digit(text[place - 1]) && Is_Digit(text[place + 1]);
}

/// "2020-01-05T10:30Z" is "2020-01-05 10:30".
void Part_At_T(Changing_Text& text)
{
    const std::size_t at = text.View().find_first_of("Tt");
    if (at == std::string_view::npos || !Stands_Between_Digits(text.View(), at)
        || text.View().find(':', at) == std::string_view::npos)
        return;
    text.At(at) = ' ';
    if (text.View().ends_with('Z'))
        text.Replace(text.View().size() - 1, 1, {});
}

/// "10:30 PM" is "22:30".
void Take_Half_Of_Day(Changing_Text& text)
{
    const std::string_view all = text.View();
    const std::size_t digit = all.find_last_of("0123456789");
    const std::size_t colon = all.find(':');
    if (colon == std::string_view::npos || digit == std::string_view::npos)
        return;
    const std::string_view marker = Trim_Copy(all.substr(digit + 1));
    const bool after_noon = Equal_Ignoring_Case(marker, "pm");
    if (!after_noon && !Equal_Ignoring_Case(marker, "am"))
        return;
    text.Replace(digit + 1, all.size() - digit - 1, {});
    const std::size_t hour_at = all.substr(0, colon).find_last_not_of("0123456789") + 1;
    std::int32_t hour = Read_Part_Number(all.substr(hour_at, colon - hour_at), true);
    if (!In_Range(hour, 1, 12))
        return;
    hour = hour % 12 + (after_noon ? 12 : 0);
    char number[Number_Text_Room];
    text.Replace(hour_at, colon - hour_at, {number, Print_Integer(number, hour)});
}

/// "3.1.2020" is "3/1/2020".
void Part_At_Points(Changing_Text& text)
{
    const std::string_view date = text.View().substr(0, text.View().find_first_of(" :"));
    const std::size_t first = date.find('.');
    const std::size_t second = first == std::string_view::npos ? first : date.find('.', first + 1);
    if (second == std::string_view::npos || date.find_first_not_of("0123456789.") != std::string_view::npos
        || !Stands_Between_Digits(date, first) || !Stands_Between_Digits(date, second)
        || date.find('.', second + 1) != std::string_view::npos)
        return;
    text.At(first) = text.At(second) = '/';
}

/// "5, 2020" and "5,2020" are "5 2020".
void Drop_Comma(Changing_Text& text)
{
    const std::size_t comma = text.View().find(',');
    if (comma == std::string_view::npos || comma == 0 || !Is_Digit(text.View()[comma - 1]))
        return;
    const bool parted = text.View().substr(comma + 1).starts_with(' ');
    text.Replace(comma, 1, parted ? "" : " ");
}

/// "January 5" and "Sept. 5" are "Jan 5" and "Sep 5".
void Shorten_Leading_Month(Changing_Text& text)
{
    constexpr std::size_t least_letters = 3;
    const Settings& settings = Get_Settings();
    const std::string_view word = text.View().substr(0, text.View().find_first_of(" ."));
    for (std::size_t month = 1; month <= 12 && word.size() >= least_letters; ++month)
        if (Starts_Ignoring_Case(settings.month_names[month], word)) {
            const bool pointed = text.View().substr(word.size()).starts_with('.');
            text.Replace(0, word.size() + (pointed ? 1 : 0), settings.month_abbreviations[month]);
            return;
        }
}

/// Digits and their separators are what the layouts take as they stand.
bool Holds_Other_Signs(std::string_view text)
{
    return text.find_first_not_of("0123456789/-: ") != std::string_view::npos;
}

}  // namespace

std::string_view Rewritten_Date_Text(std::string_view text, Date_Text_Room& room)
{
    if (!Holds_Other_Signs(text))
        return text;
    Changing_Text changing(text, room);
    Part_At_T(changing);
    Take_Half_Of_Day(changing);
    if (Is_Digit(text.front()))
        Part_At_Points(changing);
    else
        Shorten_Leading_Month(changing);
    Drop_Comma(changing);
    return changing.View();
}

}  // namespace ingester

#include "model/time_text.h"

#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

namespace {

/// Cuts "am", "pm" or their first letter off the end; gives the letter, small, or NUL.
char Cut_Marker(std::string_view& text)
{
    const std::size_t digits = text.find_last_of("0123456789.:");
    const std::string_view marker = Trim_Copy(text.substr(digits + 1));
    const char letter = marker.empty() ? '\0' : To_Lower(marker.front());
    if ((letter != 'a' && letter != 'p')
        || (marker.size() != 1 && !(marker.size() == 2 && To_Lower(marker.back()) == 'm')))
        return '\0';
    text = text.substr(0, digits + 1);
    return letter;
}

/// The letter that tells the half of the day in a text with other words; small, or NUL.
char Find_Marker(std::string_view text)
{
    const std::size_t at = text.find_first_of("aApP");
    return at == std::string_view::npos ? '\0' : To_Lower(text[at]);
}

}  // namespace

std::int32_t Read_Part_Number(std::string_view text, bool strict)
{
    if (text.empty() || !(strict ? std::all_of(text.begin(), text.end(), Is_Digit) : Is_Digit(text.front())))
        return -1;
    return static_cast<std::int32_t>(std::min<long>(Leading_Integer(text), Too_Great_Part));
}

bool Read_Time(std::string_view text, bool strict, bool marker_allowed, std::int32_t most_hours,
               double& value)
{
    char marker = '\0';
    if (!strict)
        marker = Find_Marker(text);
    else if (marker_allowed)
        marker = Cut_Marker(text);
    if (strict && text.find_first_not_of("0123456789:.") != std::string_view::npos)
        return false;
    const std::size_t colon = text.find(':');
    if (colon == std::string_view::npos)
        return false;
    const std::size_t second_colon = std::min(text.find(':', colon + 1), text.size());
    std::int32_t hours = Read_Part_Number(text.substr(0, colon), true);
    const std::int32_t minutes = Read_Part_Number(text.substr(colon + 1, second_colon - colon - 1), strict);
    double seconds = 0.0;
    if (second_colon < text.size()) {
        const Parsed_Number parsed = Parse_Number(text.data() + second_colon + 1, text.data() + text.size());
        if (parsed.status != Number_Status::good || (strict && parsed.end != text.data() + text.size()))
            return false;
        seconds = parsed.value;
    }
    if (!In_Range(hours, 0, most_hours) || !In_Range(minutes, 0, 60) || !(seconds >= 0.0 && seconds <= 60.0))
        return false;
    if (marker == 'p' && hours < 12)
        hours += 12;
    else if (marker == 'a' && hours == 12)
        hours = 0;
    value = ((seconds / 60.0 + minutes) / 60.0 + hours) / 24.0;
    return true;
}

}  // namespace ingester

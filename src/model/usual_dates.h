// Dates as people write them, in the words of the layouts.
#pragma once

#include "model/sheet.h"
#include "request/people_rules.h"

#include <array>
#include <string_view>

namespace ingester {

/// Room for a date that is rewritten: an hour may grow by a digit.
using Date_Text_Room = std::array<char, 4 * Text_Cell_Width + 8>;

/// What `Usual_Date_Text` makes of a text for people.
[[nodiscard]] std::string_view Rewritten_Date_Text(std::string_view text, Date_Text_Room& room);

/// For people, a trimmed text in a form that the layouts know: "2020-01-05T10:30:00.5Z", "1/5/2020 10:30 PM",
/// "January 5, 2020" and "5.1.2020" become "2020-01-05 10:30:00.5", "1/5/2020 22:30", "Jan 5 2020" and
/// "5/1/2020". All else, and all text for hosts, stays as it stands.
[[nodiscard]] inline std::string_view Usual_Date_Text(std::string_view text, Date_Text_Room& room)
{
    return For_People(People_Rule::further_dates) ? Rewritten_Date_Text(text, room) : text;
}

}  // namespace ingester

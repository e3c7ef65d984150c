// Numbers out of labels that people typed: slips are repaired, units behind the number put up with.
#pragma once

#include <string_view>

namespace ingester {

/// How far `Text_To_Number` goes to see a number in a label: the values of `/t=n`.
enum Text_Number_Modes : int {
    exact_numbers = 0,    ///< the number fills the text
    one_slip = 1,         ///< one repair at most; what follows the number begins with a blank
    plain_slips = 2,      ///< letters and marks that numbers are seldom mistyped with stay
    any_slips = 3,        ///< whatever follows the number
    digits_wherever = 4,  ///< what cannot belong to a number is dropped
};

/// The number that `text` is under the request's `Text_Number_Mode`, or `missing`. `changed` tells
/// that the text says something else than the result.
[[nodiscard]] double Text_To_Number(std::string_view text, double missing, bool& changed);

}  // namespace ingester

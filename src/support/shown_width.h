// How much of a terminal's line a text takes.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace ingester {

/// Places of a text in UTF-8: wide letters take two, accents that stand over others none.
[[nodiscard]] std::size_t Shown_Width(std::string_view text);

/// The text on one line: control characters are blanks. What goes beyond `width` places is cut, and a mark
/// says so.
[[nodiscard]] std::string Fit_To_Width(std::string_view text, std::size_t width);

}  // namespace ingester

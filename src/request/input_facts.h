// What a reader found out of the form of its file, beside the table in it.
#pragma once

#include <string>
#include <string_view>
#include <utility>
#include <vector>

namespace ingester {

/// Facts by their names, as "encoding" and "UTF-8", in the order in which they were noted.
using Input_Facts = std::vector<std::pair<std::string, std::string>>;

/// Enters a fact of the input, for those who look at it; a later one of the same name takes its place.
void Note_Input_Fact(std::string_view name, std::string_view value);

}  // namespace ingester

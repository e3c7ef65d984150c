// The cells that a link to another program names.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// One reference or two with ":" between, as "B3:c5" or "R1C2", in upper case and in the form with numbers:
/// "R3C2:R5C3". An item that is none is in upper case only.
[[nodiscard]] std::string R1C1_Item(std::string_view item);

}  // namespace ingester

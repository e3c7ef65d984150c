// Texts of the host's files, which are Windows-1252 whatever the code of the request is.
#pragma once

#include "request/text_crossing.h"

#include <string>
#include <string_view>

namespace ingester {

/// A text of a file in the request's code; `room` holds it where it is another there.
[[nodiscard]] std::string_view From_Host(std::string_view bytes, std::string& room);

/// The same in place.
void Take_From_Host(std::string& text);

/// The way out into the files, where each letter is a byte.
class Host_Text_Out : public Text_Crossing {
public:
    Host_Text_Out();
};

/// A text as it will come back out of a file.
[[nodiscard]] std::string As_Held_By_Host(std::string_view text);

}  // namespace ingester

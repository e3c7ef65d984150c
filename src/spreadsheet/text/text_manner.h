// The manner in which a text table that is there was written, for one that takes its place.
#pragma once

#include "platform/text_codes.h"

#include <string_view>

namespace ingester {

struct Text_Manner {
    Text_Code code = nullptr;
    bool code_mark = false;  ///< the mark of Unicode comes first
    char separator = ',';
    bool crlf = false;
    bool marks = false;  ///< types are told behind names
    bool stars = false;  ///< missing is "*"
};

/// By the bytes of the whole text, or of its head.
[[nodiscard]] Text_Manner Manner_Of_Text(std::string_view bytes);

/// Has the request write as the text with these bytes was written, where it doesn't say otherwise. A code
/// that lacks letters is not kept, which is told by `name`.
void Keep_Manner_Of_Text(std::string_view bytes, const char* name);

}  // namespace ingester

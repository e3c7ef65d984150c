// What a text that is written looks like.
#pragma once

#include "platform/text_codes.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

enum class Layout : std::uint8_t { tabs, commas, fixed };

struct Text_Layout {
    Layout layout;
    bool padded;               ///< fields fill their column's width
    bool quoted;               ///< texts stand in quotes
    char separator;            ///< between fields, and where a line that is too long is broken
    bool plain = false;        ///< as other programs take it: no host reads it again
    bool marked = true;        ///< types are told behind names
    bool tells_texts = false;  ///< texts that would be read as something else stand in quotes
    std::string missing = {};  ///< as a missing value prints, but for quotes that it needs
    std::string_view line_end = "\r\n";
    std::size_t longest_line = 65535;  ///< what is longer is broken
    Text_Code code = nullptr;          ///< of the file; null: that of all letters
    bool code_mark = false;            ///< the mark of Unicode comes first
};

/// What the request that runs asks for.
[[nodiscard]] Text_Layout Layout_Of_Request(bool tab_mode);

/// Whether a text alone in its field would be read as a number, a date, a time or as missing.
[[nodiscard]] bool Looks_Like_Data(std::string_view text);

/// Whether it would be read as missing, in quotes or among texts.
[[nodiscard]] bool Looks_Missing(std::string_view text);

/// Whether a name in the first line would make that a line of data, by one of its words.
[[nodiscard]] bool Name_Looks_Like_Data(std::string_view name);

}  // namespace ingester

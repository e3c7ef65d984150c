// The first lines of the lists that requests come with.
#pragma once

#include "platform/text_codes.h"
#include "support/letters.h"

#include <string>

namespace ingester {

/// Takes the mark of UTF-8 off a list's first line, which counts the others.
inline void Cut_Mark(std::string& line)
{
    std::size_t length;
    if (Letters_Are_Utf8() && Code_Of_Mark(line, length) == Utf_8_Code())
        line.erase(0, length);
}

}  // namespace ingester

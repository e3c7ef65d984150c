// What the target of a function that takes a text is put together from.
#pragma once

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <string_view>

namespace ingester {

/// Calls the function as the two characters of the head choose, and holds what comes of it against what must
/// be. Each file in try/ defines it; a target has one of them.
void Try_Function(std::string_view head, std::string_view text);

/// The choice that one character of the head makes among `count`; '0' is the first.
[[nodiscard]] inline std::int32_t Choice(char character, unsigned count)
{
    return static_cast<std::int32_t>((static_cast<unsigned char>(character) + 256U - '0') % count);
}

inline void Must(bool holds, const char* what)
{
    if (holds)
        return;
    std::fprintf(stderr, "%s\n", what);
    std::abort();
}

}  // namespace ingester

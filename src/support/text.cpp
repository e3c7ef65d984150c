#include "support/text.h"

#include <algorithm>
#include <cstdarg>
#include <cstdio>
#include <limits>

namespace ingester {

void Copy_Trimmed(char* target, std::string_view text, std::size_t limit, bool zero_fill)
{
    text = Trim_Copy(text, limit);
    char* const end = std::copy(text.begin(), text.end(), target);
    std::fill(end, zero_fill ? target + limit + 1 : end + 1, '\0');
}

long Leading_Integer(std::string_view text)
{
    constexpr long greatest = std::numeric_limits<long>::max();
    text = Trim_Copy(text);
    const bool negative = text.starts_with('-');
    if (negative || text.starts_with('+'))
        text.remove_prefix(1);
    long value = 0;
    for (const char c : text) {
        if (!Is_Digit(c))
            break;
        const long digit = c - '0';
        value = value > (greatest - digit) / 10 ? greatest : value * 10 + digit;
    }
    return negative ? -value : value;
}

std::string Format_Text(const char* format, ...)
{
    va_list arguments;
    va_start(arguments, format);
    va_list again;
    va_copy(again, arguments);
    const int length = std::vsnprintf(nullptr, 0, format, arguments);
    va_end(arguments);
    std::string text(length > 0 ? static_cast<std::size_t>(length) : 0, '\0');
    if (length > 0)
        std::vsnprintf(text.data(), text.size() + 1, format, again);
    va_end(again);
    return text;
}

}  // namespace ingester

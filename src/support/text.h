// Text helpers of every floor. Case is folded for ASCII letters only, whatever the locale.
#pragma once

#include <cstddef>
#include <string>
#include <string_view>

namespace ingester {

[[nodiscard]] constexpr bool Is_Digit(char c)
{
    return c >= '0' && c <= '9';
}

[[nodiscard]] constexpr bool Is_Letter(char c)
{
    return (c >= 'A' && c <= 'Z') || (c >= 'a' && c <= 'z');
}

[[nodiscard]] constexpr char To_Upper(char c)
{
    return c >= 'a' && c <= 'z' ? static_cast<char>(c - 'a' + 'A') : c;
}

[[nodiscard]] constexpr char To_Lower(char c)
{
    return c >= 'A' && c <= 'Z' ? static_cast<char>(c - 'A' + 'a') : c;
}

/// Blanks and control characters, 1 to 32. A NUL is an end, not a blank.
[[nodiscard]] constexpr bool Is_Blank_Or_Control(char c)
{
    return c > 0 && c <= 32;
}

/// `text` without the blanks and controls at its ends, then cut at `limit`.
[[nodiscard]] constexpr std::string_view Trim_Copy(std::string_view text,
                                                   std::size_t limit = std::string_view::npos)
{
    while (!text.empty() && Is_Blank_Or_Control(text.front()))
        text.remove_prefix(1);
    while (!text.empty() && Is_Blank_Or_Control(text.back()))
        text.remove_suffix(1);
    return text.substr(0, limit);
}

/// The same into `target`, which has room for `limit` and a NUL; clears what is left of it if asked to.
void Copy_Trimmed(char* target, std::string_view text, std::size_t limit, bool zero_fill);

[[nodiscard]] constexpr bool Equal_Ignoring_Case(std::string_view a, std::string_view b)
{
    if (a.size() != b.size())
        return false;
    for (std::size_t i = 0; i < a.size(); ++i)
        if (To_Lower(a[i]) != To_Lower(b[i]))
            return false;
    return true;
}

[[nodiscard]] constexpr bool Starts_Ignoring_Case(std::string_view text, std::string_view start)
{
    return text.size() >= start.size() && Equal_Ignoring_Case(text.substr(0, start.size()), start);
}

[[nodiscard]] constexpr bool Ends_Ignoring_Case(std::string_view text, std::string_view end)
{
    return text.size() >= end.size() && Equal_Ignoring_Case(text.substr(text.size() - end.size()), end);
}

/// Ends with one of `ends`, which have a blank between them.
[[nodiscard]] constexpr bool Ends_With_One_Of(std::string_view text, std::string_view ends)
{
    while (!ends.empty()) {
        const std::size_t blank = ends.find(' ');
        if (Ends_Ignoring_Case(text, ends.substr(0, blank)))
            return true;
        ends.remove_prefix(blank == std::string_view::npos ? ends.size() : blank + 1);
    }
    return false;
}

/// Where `wanted` first stands in `text`, or npos.
[[nodiscard]] constexpr std::size_t Find_Ignoring_Case(std::string_view text, std::string_view wanted)
{
    for (std::size_t at = 0; at + wanted.size() <= text.size(); ++at)
        if (Equal_Ignoring_Case(text.substr(at, wanted.size()), wanted))
            return at;
    return std::string_view::npos;
}

/// How many characters the starts of both texts share.
[[nodiscard]] constexpr std::size_t Common_Start(std::string_view a, std::string_view b)
{
    std::size_t n = 0;
    while (n < a.size() && n < b.size() && a[n] == b[n])
        ++n;
    return n;
}

/// The integer that `text` starts with, as C's atol reads it: leading blanks, a sign, digits; else 0.
/// A number beyond `long` gives the nearest one.
[[nodiscard]] long Leading_Integer(std::string_view text);

/// `text` formatted as printf does, of any length.
[[nodiscard]] std::string Format_Text(const char* format, ...) __attribute__((format(printf, 1, 2)));

}  // namespace ingester

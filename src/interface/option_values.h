// How the tables of options take what stands behind a key, and how the command line offers it.
#pragma once

#include "interface/slash_options.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

/// The end of an option in its string.
using Taken = std::size_t;

/// A value and where it ends.
struct Option_Value {
    std::string_view text;
    Taken end;
};

inline Option_Value Up_To(std::string_view text, std::size_t at, std::string_view ends)
{
    const std::size_t end = std::min(text.find_first_of(ends, at), text.size());
    return {text.substr(at, end - at), end};
}

inline bool Stands_At(std::string_view text, std::size_t at, std::string_view characters)
{
    return at < text.size() && characters.find(text[at]) != std::string_view::npos;
}

/// From a quote to the same quote, or to the end; else bare, up to one of `ends`.
inline Option_Value Quoted_Or_Bare(std::string_view text, std::size_t at, std::string_view quotes,
                                   std::string_view ends)
{
    if (!Stands_At(text, at, quotes))
        return Up_To(text, at, ends);
    const std::size_t close = text.find(text[at], at + 1);
    if (close == std::string_view::npos)
        return {text.substr(at + 1), text.size()};
    return {text.substr(at + 1, close - at - 1), close + 1};
}

inline std::size_t Behind_Equals(std::string_view text, std::size_t at)
{
    return Stands_At(text, at, "=") ? at + 1 : at;
}

constexpr std::string_view Quotes = "\"'";
constexpr std::string_view Quotes_And_Backquote = "\"'`";
constexpr std::string_view Option_Start = "/";
constexpr std::string_view Name_End = "/ ";

template <auto Member, auto Value> Taken Set(std::string_view, std::size_t at)
{
    request.*Member = Value;
    return at;
}

template <auto Member, auto Value> Taken Set_Setting(std::string_view, std::size_t at)
{
    Get_Settings().*Member = Value;
    return at;
}

/// A quoted or bare value into a text; `optional_equals` takes the "=" that the key lacks.
template <auto Member, bool optional_equals = false> Taken Take_Text(std::string_view text, std::size_t at)
{
    const auto quotes = optional_equals ? Quotes_And_Backquote : Quotes;
    const Option_Value value =
        Quoted_Or_Bare(text, optional_equals ? Behind_Equals(text, at) : at, quotes, Option_Start);
    request.*Member = value.text;
    return value.end;
}

/// A quoted value, or a bare name.
template <auto Member> Taken Take_Name(std::string_view text, std::size_t at)
{
    const Option_Value value = Quoted_Or_Bare(text, at, Quotes, Name_End);
    request.*Member = value.text;
    return value.end;
}

template <auto Member> Taken Take_Number(std::string_view text, std::size_t at)
{
    const Option_Value value = Up_To(text, at, Option_Start);
    request.*Member =
        static_cast<std::int32_t>(std::clamp(Leading_Integer(value.text), -2147483648L, 2147483647L));
    return value.end;
}

using R = Request_Globals;

// How the command line offers an option.

constexpr Named_Option Flag_Of_Two_Names(std::string_view name, std::string_view other_name)
{
    return {.name = name, .other_name = other_name};
}

constexpr Named_Option Flag(std::string_view name)
{
    return {name};
}

constexpr Named_Option Bare(std::string_view name, std::string_view value, std::string_view join = "=")
{
    return {name, Value_Form::bare, value, join};
}

constexpr Named_Option Range(std::string_view name, std::string_view value)
{
    return {name, Value_Form::range, value};
}

constexpr Named_Option Quoted(std::string_view name, std::string_view value)
{
    return {name, Value_Form::quoted, value};
}

constexpr Named_Option Quoted_Or_Empty(std::string_view name, std::string_view value)
{
    return {.name = name, .form = Value_Form::quoted, .value = value, .takes_empty = true};
}

constexpr Named_Option Optional(std::string_view name, std::string_view value, std::string_view join = "=")
{
    return {name, Value_Form::optional, value, join};
}

/// A key that another begins with must be searched behind it, or it would cut the other short.
template <std::size_t Count> constexpr bool No_Key_Hides_A_Later_One(const Slash_Option (&options)[Count])
{
    for (std::size_t early = 0; early < Count; ++early)
        for (std::size_t late = early + 1; late < Count; ++late)
            if (options[late].key.starts_with(options[early].key))
                return false;
    return true;
}

}  // namespace ingester

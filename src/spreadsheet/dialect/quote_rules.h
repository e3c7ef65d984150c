// When a field in quotes ends: one answer for those who sample a text and those who read it.
#pragma once

#include <cstring>
#include <string_view>

namespace ingester {

struct Quote_Close {
    const char* quote = nullptr;  ///< that closes the field; null when none does
    const char* open_until =
        nullptr;  ///< no quote in front of it is closed either; null where that isn't sure
};

/// How the fields of a text are quoted. `Ends` tells whether a field ends at a place, be it behind the text.
template <typename Ends> class Quote_Rules {
public:
    Quote_Rules(char quote, char escape, const Ends& ends) : quote_(quote), escape_(escape), ends_(ends) {}

    /// Over line ends only a quote closes that follows the rules; in its line also one behind stray quotes,
    /// unless another field begins with a quote before.
    [[nodiscard]] Quote_Close Find_Close(const char* open, const char* last) const
    {
        for (const char* from = open + 1;;) {
            const char* const mark = Next_Quote(from, last);
            if (mark == nullptr)
                return {nullptr, last};
            if (escape_ != '\0' && Is_Escaped(open, mark)) {
                from = mark + 1;
            } else if (Closes(mark, last)) {
                return {mark, nullptr};
            } else if (escape_ == '\0' && mark + 1 != last && mark[1] == quote_) {
                from = mark + 2;
            } else {
                return Holds_Line_End(open, mark) ? Quote_Close{nullptr, mark}
                                                  : Quote_Close{Close_In_Line(open, mark, last), nullptr};
            }
        }
    }

private:
    static constexpr std::string_view line_ends = "\r\n";

    [[nodiscard]] static bool Holds_Line_End(const char* first, const char* last)
    {
        return std::string_view(first, static_cast<std::size_t>(last - first)).find_first_of(line_ends)
               != std::string_view::npos;
    }
    [[nodiscard]] const char* Next_Quote(const char* from, const char* last) const
    {
        return from < last ? static_cast<const char*>(
                   std::memchr(from, quote_, static_cast<std::size_t>(last - from)))
                           : nullptr;
    }
    /// Blanks may follow that separate nothing.
    [[nodiscard]] bool Closes(const char* mark, const char* last) const
    {
        const char* end = mark + 1;
        while (end != last && (*end == ' ' || *end == '\t') && !ends_(end))
            ++end;
        return ends_(end);
    }
    /// Whether the quote has an odd number of escapes in front of it.
    [[nodiscard]] bool Is_Escaped(const char* open, const char* mark) const
    {
        std::ptrdiff_t count = 0;
        while (mark - count - 1 > open && mark[-count - 1] == escape_)
            ++count;
        return count % 2 == 1;
    }
    /// Behind a stray quote.
    [[nodiscard]] const char* Close_In_Line(const char* open, const char* stray, const char* last) const
    {
        for (const char* mark = stray + 1; mark < last && *mark != '\n' && *mark != '\r'; ++mark) {
            if (*mark != quote_ || (escape_ != '\0' && Is_Escaped(open, mark)))
                continue;
            if (Closes(mark, last))
                return mark;
            if (escape_ == '\0' && mark + 1 != last && mark[1] == quote_)
                ++mark;
            else if (ends_(mark - 1))
                return nullptr;
        }
        return nullptr;
    }

    char quote_;
    char escape_;
    const Ends& ends_;
};

}  // namespace ingester

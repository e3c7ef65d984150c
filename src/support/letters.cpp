#include "support/letters.h"

#include <algorithm>
#include <cstring>
#include <utf8proc.h>

namespace ingester {

namespace letters {

/// Every letter has one byte that doesn't go on with another.
std::size_t Count_Utf8(std::string_view text)
{
    constexpr std::uint64_t low_bits = 0x0101010101010101U;
    std::uint64_t word;
    std::size_t going_on = 0;
    std::string_view rest = text;
    for (; rest.size() >= sizeof word; rest.remove_prefix(sizeof word)) {
        std::memcpy(&word, rest.data(), sizeof word);
        going_on += (((word >> 7U) & ~(word >> 6U) & low_bits) * low_bits) >> 56U;  // the sum of all bytes
    }
    for (const char c : rest)
        going_on += Goes_On(c) ? 1 : 0;
    return text.size() - going_on;
}

std::string_view Cut_Utf8(std::string_view text, std::size_t limit)
{
    if (limit < text.size() / Longest_Letter)
        text = text.substr(0, limit * Longest_Letter + 1);  // no more can be looked at
    std::size_t count = 0;
    std::size_t at = 0;
    for (; at < text.size(); ++at)
        if (!Goes_On(text[at]) && count++ == limit)
            break;
    return text.substr(0, std::min(at, limit * Longest_Letter));
}

Folded_Letter Fold_First_Utf8(std::string_view text)
{
    Folded_Letter folded;
    const auto [character, length] = First_Utf8(text);
    if (length <= 1) {
        folded.bytes[folded.size++] = To_Lower(text.front());
        folded.taken = 1;
        return folded;
    }
    utf8proc_int32_t characters[4];
    int boundary_class = 0;
    const auto count = utf8proc_decompose_char(static_cast<utf8proc_int32_t>(character), characters, 4,
                                               UTF8PROC_CASEFOLD, &boundary_class);
    char* end = folded.bytes;
    for (utf8proc_ssize_t i = 0; i < std::min<utf8proc_ssize_t>(count, 4); ++i)
        end = Put_Utf8(end, static_cast<char32_t>(characters[i]));
    folded.size = static_cast<std::uint8_t>(end - folded.bytes);
    folded.taken = static_cast<std::uint8_t>(length);
    return folded;
}

namespace {

/// The folded bytes of a text, one at a time.
class Folded_Bytes {
public:
    explicit Folded_Bytes(std::string_view text) : rest_(text) {}

    /// From 0 to 255; -1 behind the last one.
    [[nodiscard]] int Next()
    {
        if (next_ == letter_.size) {
            if (rest_.empty())
                return -1;
            letter_ = Fold_First_Utf8(rest_);
            rest_.remove_prefix(letter_.taken);
            next_ = 0;
        }
        return static_cast<unsigned char>(letter_.bytes[next_++]);
    }

private:
    std::string_view rest_;
    Folded_Letter letter_;
    std::size_t next_ = 0;
};

bool Is_Ascii_Byte(char c)
{
    return static_cast<unsigned char>(c) < 0x80;
}

int Compare_Bytes(char a, char b)
{
    return static_cast<unsigned char>(a) - static_cast<unsigned char>(b);
}

}  // namespace

/// Letters beyond ASCII may become one of ASCII, and more than one, so lengths tell nothing.
int Compare_Folded_Utf8(std::string_view a, std::string_view b)
{
    std::size_t at = 0;
    for (; at < a.size() && at < b.size() && Is_Ascii_Byte(a[at]) && Is_Ascii_Byte(b[at]); ++at)
        if (const int order = Compare_Bytes(To_Lower(a[at]), To_Lower(b[at])); order != 0)
            return order;
    Folded_Bytes rest_of_a(a.substr(at));
    Folded_Bytes rest_of_b(b.substr(at));
    for (;;) {
        const int byte = rest_of_a.Next();
        if (const int order = byte - rest_of_b.Next(); order != 0 || byte < 0)
            return order;
    }
}

}  // namespace letters

std::size_t Common_Letters(std::string_view a, std::string_view b)
{
    std::size_t common = Common_Start(a, b);
    const auto inside = [&](std::string_view text) { return common < text.size() && Goes_On(text[common]); };
    while (Letters_Are_Utf8() && common > 0 && (inside(a) || inside(b)))
        --common;
    return common;
}

namespace {

utf8proc_category_t Category_Of(char32_t character)
{
    return utf8proc_category(static_cast<utf8proc_int32_t>(character));
}

}  // namespace

bool Is_Letter_Of_Any_Script(char32_t character)
{
    const utf8proc_category_t category = Category_Of(character);
    return category >= UTF8PROC_CATEGORY_LU && category <= UTF8PROC_CATEGORY_LO;
}

bool Is_Mark_Of_Any_Script(char32_t character)
{
    const utf8proc_category_t category = Category_Of(character);
    return category >= UTF8PROC_CATEGORY_MN && category <= UTF8PROC_CATEGORY_ME;
}

bool Is_Digit_Of_Any_Script(char32_t character)
{
    return Category_Of(character) == UTF8PROC_CATEGORY_ND;
}

int Compare_Folded(std::string_view a, std::string_view b)
{
    if (Letters_Are_Utf8())
        return letters::Compare_Folded_Utf8(a, b);
    const std::size_t shared = std::min(a.size(), b.size());
    for (std::size_t i = 0; i < shared; ++i)
        if (const int order = letters::Compare_Bytes(To_Lower(a[i]), To_Lower(b[i])); order != 0)
            return order;
    return a.size() < b.size() ? -1 : a.size() > b.size() ? 1 : 0;
}

bool Starts_Folded(std::string_view text, std::string_view start)
{
    if (!Letters_Are_Utf8())
        return Starts_Ignoring_Case(text, start);
    letters::Folded_Bytes bytes(text);
    letters::Folded_Bytes wanted(start);
    for (int byte = wanted.Next(); byte >= 0; byte = wanted.Next())
        if (bytes.Next() != byte)
            return false;
    return true;
}

std::string Folded(std::string_view text)
{
    std::string folded;
    folded.reserve(text.size());
    For_Folded_Bytes(text, [&](char c) { folded += c; });
    return folded;
}

std::uint64_t Folded_Start(std::string_view text)
{
    std::uint64_t start = 0;
    std::size_t taken = 0;
    const std::size_t needed = sizeof start * (Letters_Are_Utf8() ? Longest_Letter : 1);
    For_Folded_Bytes(text.substr(0, needed), [&](char c) {
        if (taken++ < sizeof start)
            start = start << 8 | static_cast<unsigned char>(c);
    });
    for (; taken < sizeof start; ++taken)
        start <<= 8;
    return start;
}

}  // namespace ingester

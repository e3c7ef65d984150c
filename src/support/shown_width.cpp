#include "support/shown_width.h"

#include "support/utf8.h"

#include <utf8proc.h>

namespace ingester {

namespace {

std::size_t Places_Of(char32_t character)
{
    const int places = utf8proc_charwidth(static_cast<utf8proc_int32_t>(character));
    return places < 0 ? 0 : static_cast<std::size_t>(places);
}

/// The letter that a text begins with; a malformed byte stands alone.
Utf8_Character First_Letter(std::string_view text)
{
    const Utf8_Character first = First_Utf8(text);
    return first.length > 0 ? first : Utf8_Character{U'?', 1};
}

}  // namespace

std::size_t Shown_Width(std::string_view text)
{
    if (Is_Ascii(text))
        return text.size();
    std::size_t places = 0;
    while (!text.empty()) {
        const Utf8_Character letter = First_Letter(text);
        places += Places_Of(letter.character);
        text.remove_prefix(letter.length);
    }
    return places;
}

std::string Fit_To_Width(std::string_view text, std::size_t width)
{
    constexpr std::string_view cut_mark = "\xE2\x80\xA6";
    std::string fitted;
    std::size_t places = 0;
    std::size_t room_for_mark = 0;  // where the mark would go
    while (!text.empty()) {
        const Utf8_Character letter = First_Letter(text);
        const bool control = letter.character < U' ' || letter.character == U'\x7F';
        const std::size_t wanted = control ? 1 : Places_Of(letter.character);
        if (places + wanted > width) {
            fitted.resize(room_for_mark);
            return width > 0 ? fitted.append(cut_mark) : fitted;
        }
        fitted.append(control ? " " : text.substr(0, letter.length));
        places += wanted;
        if (places < width)
            room_for_mark = fitted.size();
        text.remove_prefix(letter.length);
    }
    return fitted;
}

}  // namespace ingester

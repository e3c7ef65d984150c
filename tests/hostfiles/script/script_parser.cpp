#include "hostfiles/script/script_parser.h"

#include <string_view>

namespace ingester {

std::string Heard_Of(const std::string& script)
{
    const char* fault = script.ends_with('\n') ? nullptr : "an open last line";
    std::string heard;
    bool data = false;
    std::size_t line = 0;  // where it begins
    int texts = 0;         // in the line
    std::size_t first_text = 0;
    const auto at = [&](std::size_t i) { return i < script.size() ? script[i] : '\0'; };
    for (std::size_t i = 0; i < script.size() && fault == nullptr; ++i) {
        const char c = script[i];
        if (c == '\'' || c == '"') {
            const std::string_view doubled = c == '"' ? "\"" : "'\"\\`";
            const std::size_t start = heard.size();
            first_text = texts++ == 0 ? i - line : first_text;
            for (heard += c, ++i; fault == nullptr && (at(i) != c || at(i + 1) == c); ++i) {
                if (static_cast<unsigned char>(at(i)) < ' ')
                    fault = "a control character, or no end, in a text";
                else if (const bool special = doubled.find(at(i)) != doubled.npos;
                         special && at(i + 1) != at(i))
                    fault = "a single special character";
                else
                    i += special ? 1 : 0;
                heard += at(i);
            }
            heard += c;
            if (c == '"')
                heard.resize(start);  // a comment
        } else if (c == '\n') {
            const std::string_view text = std::string_view(script).substr(line, i - line);
            const bool levels = text.find_first_not_of("0123456789* :") == text.npos;
            // Only what can't be divided is longer: a text, or levels without blanks.
            if (text == "\\" || (text.size() > 78 && !levels && (texts > 1 || first_text > 9)))
                fault = "a bad line";
            if (!data && !text.ends_with('\\')) {
                data = heard.find("READ ", heard.rfind('\n') + 1) != heard.npos;
                heard += c;
            }
            line = i + 1;
            texts = 0;
        } else if (c != '\\') {
            heard += c;
            data = data && c != ':';
        } else if (at(i + 1) != '\n') {
            fault = "a backslash inside a line";
        }
    }
    return fault == nullptr ? heard : heard + "FAULT " + fault;
}

}  // namespace ingester

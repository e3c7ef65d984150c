// How a line is cut into fields, and what a field says.
#include "interface/request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>

namespace ingester {

namespace {

constexpr std::string_view Number_Characters = "0123456789+-.eE";

bool Is_Blank_Or_Tab(char c)
{
    return c == ' ' || c == '\t';
}

}  // namespace

Field_Cutter::Field_Cutter(const Text_Scan_Options& options) : quotes_(options.separators_given)
{
    ends_['\n'] = true;
    const std::string_view separators = options.separators_given ? options.separators.view() : " \t";
    for (const char c : separators) {
        ends_[static_cast<unsigned char>(c)] = true;
        numbers_run_on_ = numbers_run_on_ || Number_Characters.find(c) != std::string_view::npos;
    }
}

/// A doubled quote doesn't close; without a close the field runs to the end of the line.
Text_Field Field_Cutter::Cut_Quoted(const char* at) const
{
    const char quote = *at;
    const char* end = at + 1;
    for (; *end != '\n'; ++end) {
        if (*end != quote)
            continue;
        if (end[1] != quote)
            return {at, Field_End(end + 1), true};
        ++end;
    }
    return {at, end, false};
}

const char* Field_Cutter::First_Line(std::string_view text) const
{
    const char* at = text.data();
    const char* const last = at + text.size();
    while (!quotes_ && at != last && *at == '"')
        at = static_cast<const char*>(std::memchr(at, '\n', static_cast<std::size_t>(last - at))) + 1;
    return at;
}

std::string_view Field_Cutter::Content(const Text_Field& field) const
{
    std::string_view text(field.first, static_cast<std::size_t>(field.last - field.first));
    if (!quotes_)
        return text;
    while (!text.empty() && Is_Blank_Or_Tab(text.front()))
        text.remove_prefix(1);
    if (text.empty() || (text.front() != '"' && text.front() != '\''))
        return text;
    std::string_view bare = text;
    while (Is_Blank_Or_Tab(bare.back()))
        bare.remove_suffix(1);
    // Where the other quote of the pair is missing, the text stands as it is.
    if (bare.size() < 2 || bare.back() != bare.front())
        return text;
    return bare.substr(1, bare.size() - 2);
}

Field_Kind Kind_Of_Field(std::string_view content, bool quoted, double& value)
{
    while (!content.empty() && static_cast<unsigned char>(content.back()) <= 32)
        content.remove_suffix(1);
    value = 0.0;
    const std::string_view missing = request.Missing_Input_Text;
    if (content.empty() || (missing != "*" && Equal_Ignoring_Case(content, missing)))
        return Field_Kind::nothing;
    const char* const last = content.data() + content.size();
    const Parsed_Number parsed = Parse_Number(content.data(), last);
    const bool starred = !quoted && parsed.end + 1 == last && *parsed.end == '*';
    if (parsed.end != last && !starred)
        return Field_Kind::text;
    if (parsed.status != Number_Status::good)
        return Field_Kind::nothing;
    value = std::min(parsed.value, Greatest_Number);
    return Field_Kind::number;
}

}  // namespace ingester

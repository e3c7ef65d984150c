// How a line is cut into fields, and what a field says.
#include "interface/request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

constexpr std::string_view Number_Characters = "0123456789+-.eE";

/// Small enough that the window and its places stay in the nearest caches while they are used.
constexpr std::size_t Window_Size = 1 << 12;

bool Is_Blank_Or_Tab(char c)
{
    return c == ' ' || c == '\t';
}

}  // namespace

Field_Walker::Field_Walker(const Text_Scan_Options& options, const Text_Buffer& buffer)
    : text_(buffer.text), quotes_(options.separators_given), at_(text_.data()), window_(text_.substr(0, 0)),
      places_(Window_Size)
{
    std::string marks = buffer.facts.returns > 0 ? "\n\r" : "\n";
    marks += options.separators_given ? options.separators.view() : " \t";
    numbers_run_on_ = marks.find_first_of(Number_Characters) != std::string::npos;
    ends_ = Byte_Finder(marks);
    const auto add_quote = [&](char quote, bool present) {
        if (!quotes_ || !present || ends_.Holds(quote))
            return;
        marks += quote;
        quotes_inside_ = true;
    };
    add_quote('"', buffer.facts.double_quotes);
    add_quote('\'', buffer.facts.single_quotes);
    marks_ = Byte_Finder(marks);
}

void Field_Walker::Go_To(const char* at)
{
    at_ = at;
    window_ = text_.substr(static_cast<std::size_t>(at - text_.data()), 0);
    next_ = found_ = 0;
}

/// The text ends with LF, so there is always another place until its end has been taken.
void Field_Walker::Look_At_Next_Window()
{
    do {
        const auto start = static_cast<std::size_t>(window_.data() + window_.size() - text_.data());
        window_ = text_.substr(start, Window_Size);
        found_ = marks_.Find_All(window_, places_.data());
    } while (found_ == 0);
    next_ = 0;
}

const char* Field_Walker::Next_Quote(const char* from, char quote)
{
    const char* mark;
    do {
        if (next_ == found_)
            Look_At_Next_Window();
        mark = window_.data() + places_[next_++];
    } while (mark < from || (*mark != quote && *mark != '\n' && *mark != '\r'));
    return mark;
}

/// A doubled quote doesn't close; without a close the field runs to the end of the line.
Text_Field Field_Walker::Next_Quoted()
{
    const char* const first = at_;
    const char quote = *first;
    for (const char* mark = first;;) {
        mark = Next_Quote(mark + 1, quote);
        if (*mark != quote) {
            at_ = mark;
            return {first, at_, false};
        }
        if (mark[1] != quote) {
            at_ = Next_End(mark + 1);
            return {first, at_, true};
        }
        ++mark;
    }
}

/// Behind a blank, or the CR of a CR LF, that has been stepped over.
bool Field_Walker::More_Behind(char end)
{
    while (end == ' ' && *at_ == ' ')
        ++at_;
    if (*at_ == '\r')
        ++at_;
    if (*at_ != '\n')
        return true;
    ++at_;
    return false;
}

void Field_Walker::Skip_Line()
{
    while (*at_ != '\n')
        at_ = Next_End(at_ + 1);
    ++at_;
}

const char* Field_Walker::First_Line() const
{
    std::string_view rest = text_;
    while (!quotes_ && rest.starts_with('"'))
        rest.remove_prefix(rest.find('\n') + 1);
    return rest.data();
}

std::string_view Field_Walker::Content(const Text_Field& field) const
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

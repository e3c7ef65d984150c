// How a line is cut into fields, and what a field says.
#include "request/request.h"
#include "spreadsheet/dialect/quote_rules.h"
#include "spreadsheet/text/text_format.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>
#include <string>

namespace ingester {

namespace {

/// Small enough that the window and its places stay in the nearest caches while they are used.
constexpr std::ptrdiff_t Window_Size = 1 << 12;
constexpr std::string_view Line_Ends = "\r\n";

bool Is_Blank_Or_Tab(char c)
{
    return c == ' ' || c == '\t';
}

}  // namespace

Field_Walker::Field_Walker(const Text_Scan_Options& options, const Text_Buffer& buffer)
    : text_(buffer), quotes_(options.separators_given), dialect_(options.dialect), places_(Window_Size)
{
    if (dialect_ != nullptr)
        quotes_ = dialect_->quote != '\0';
    std::string marks = "\n\r";
    marks += options.separators_given ? options.separators.view() : " \t";
    ends_ = Byte_Finder(marks);
    for (const char quote : {'"', '\''})
        if (quotes_ && !ends_.Holds(quote) && (dialect_ == nullptr || dialect_->quote == quote))
            marks += quote;
    if (dialect_ != nullptr && quotes_ && marks.find(dialect_->quote) == std::string::npos)
        marks += dialect_->quote;
    marks_ = Byte_Finder(marks);
    Go_To(buffer.first);
}

void Field_Walker::Go_To(const char* at)
{
    at_ = at;
    window_ = window_end_ = clean_end_ = text_.first + (at - text_.first);
    next_ = found_ = 0;
    Blank_Out_Nuls();
}

/// The last line is ended like the others, so there is another place until that one is taken.
void Field_Walker::Look_At_Next_Window()
{
    do {
        if (window_end_ == text_.last)
            throw Text_Changed();
        window_ = window_end_;
        window_end_ += std::min(text_.last - window_, Window_Size);
        const auto size = static_cast<std::size_t>(window_end_ - window_);
        bool ascii = true;
        found_ = marks_.Find_All({window_, size}, places_.data(), ascii);
        if (text_.watched && (!ascii || !check_.Is_Whole()))
            Check_Window();
        Blank_Out_Nuls();
    } while (found_ == 0);
    next_ = 0;
}

/// Windows that the walk comes to again were found good. One that it jumped to begins a line.
void Field_Walker::Check_Window()
{
    const char* const first = std::max<const char*>(window_, checked_);
    if (first >= window_end_)
        return;
    if (first != checked_)
        check_ = Utf8_Check();
    checked_ = window_end_;
    if (!check_.Take({first, static_cast<std::size_t>(window_end_ - first)}))
        throw Text_Malformed();
}

/// A NUL would end the text for everything that reads it. A window ahead, so that whoever looks at the
/// next field's start, or steps over blanks, sees none.
void Field_Walker::Blank_Out_Nuls()
{
    char* const first = clean_end_;
    clean_end_ = window_end_ + std::min(text_.last - window_end_, Window_Size);
    if (std::string_view(first, static_cast<std::size_t>(clean_end_ - first)).find('\0')
        == std::string_view::npos) [[likely]]
        return;
    nuls_ += std::count(first, clean_end_, '\0');
    std::replace(first, clean_end_, '\0', ' ');
}

bool Field_Walker::Is_Blank_Line(const char* line) const
{
    return std::all_of(line, at_, Is_Blank_Or_Control);
}

const char* Field_Walker::Next_Quote(const char* from, char quote)
{
    const char* mark;
    do {
        if (next_ == found_)
            Look_At_Next_Window();
        mark = window_ + places_[next_++];
    } while (mark < from || (*mark != quote && *mark != '\n' && *mark != '\r'));
    return mark;
}

/// A doubled quote doesn't close; without a close the field runs to the end of the line.
Text_Field Field_Walker::Next_Quoted()
{
    const char* const first = at_;
    const char quote = *first;
    if (dialect_ != nullptr)
        return Next_Quoted_For_People();
    for (const char* mark = first;;) {
        mark = Next_Quote(mark + 1, quote);
        if (*mark != quote) {
            at_ = mark;
            return {first, at_};
        }
        if (mark[1] != quote) {
            at_ = Next_End(mark + 1);
            return {first, at_};
        }
        ++mark;
    }
}

/// A quote that isn't closed is a letter like others.
Text_Field Field_Walker::Next_Quoted_For_People()
{
    const char* const first = at_;
    at_ = Next_End(*first == dialect_->quote ? Behind_Quotes(first) : first);
    return {first, at_};
}

/// However long the text in quotes is, its line is not torn, but found too long.
const char* Field_Walker::Behind_Quotes(const char* first)
{
    const auto ends = [this](const char* at) { return ends_.Holds(*at); };
    if (first >= open_until_) {
        const Quote_Rules rules(dialect_->quote, dialect_->escape, ends);
        const Quote_Close close = rules.Find_Close(first, text_.last);
        if (close.quote != nullptr)
            return close.quote + 1;
        open_until_ = std::max(open_until_, close.open_until);
    }
    ++open_quotes_;
    return first;
}

/// With as many fields as a row has a line is none, whatever it begins with.
bool Field_Walker::Is_Comment() const
{
    const char mark = dialect_->late_comments ? '#' : dialect_->comment;
    if (*at_ != mark || mark == '\0' || dialect_->columns < 2)
        return false;
    std::int32_t fields = 1;
    for (const char* at = at_; *at != '\n' && *at != '\r'; ++at)
        fields += ends_.Holds(*at) && !(dialect_->runs && at[1] == ' ') ? 1 : 0;
    if (dialect_->late_comments)
        return fields == 1;
    return dialect_->runs ? at_[1] == ' ' || fields != dialect_->columns : fields < dialect_->columns;
}

bool Field_Walker::Find_Row()
{
    while (at_ < text_.last) {
        const char* end = at_;
        while (*end == ' ')
            ++end;
        if (*end == '\n' || *end == '\r') {
            passed_empty_ = true;
            at_ = end + 1;
        } else if (Is_Comment()) {
            ++comments_;
            at_ = std::find_first_of(at_, static_cast<const char*>(text_.last), Line_Ends.begin(),
                                     Line_Ends.end());
            at_ += at_ != text_.last ? 1 : 0;
            at_ += at_ != text_.last && at_[-1] == '\r' && *at_ == '\n' ? 1 : 0;
        } else {
            return true;
        }
    }
    return false;
}

/// Behind a blank or a CR that has been stepped over. Both may stand in front of the line's end.
bool Field_Walker::More_Behind(char end)
{
    while (end == ' ' && *at_ == ' ')
        ++at_;
    const bool at_end = end == '\r' || *at_ == '\r' || *at_ == '\n';
    if (end != '\r' && *at_ == '\r')
        ++at_;
    if (at_end && at_ != text_.last && *at_ == '\n')
        ++at_;
    return !at_end;
}

void Field_Walker::Skip_Line()
{
    while (*at_ != '\n' && *at_ != '\r')
        at_ = Next_End(at_ + 1);
    static_cast<void>(Has_More());
}

const char* Field_Walker::First_Line() const
{
    const char* line = text_.first;
    while (!quotes_ && line != text_.last && *line == '"') {
        line = std::find_first_of(line, static_cast<const char*>(text_.last), Line_Ends.begin(),
                                  Line_Ends.end());
        while (line != text_.last && Line_Ends.find(*line) != std::string_view::npos)
            ++line;
    }
    return line;
}

Field_Content Field_Walker::Content(const Text_Field& field) const
{
    std::string_view text(field.first, static_cast<std::size_t>(field.last - field.first));
    if (!quotes_ && dialect_ == nullptr)
        return {text};
    while (!text.empty() && Is_Blank_Or_Tab(text.front()))
        text.remove_prefix(1);
    const char quote = dialect_ != nullptr ? dialect_->quote : '\0';
    if (text.empty()
        || (dialect_ == nullptr ? text.front() != '"' && text.front() != '\'' : text.front() != quote))
        return {text};
    std::string_view bare = text;
    while (Is_Blank_Or_Tab(bare.back()))
        bare.remove_suffix(1);
    // Where the other quote of the pair is missing, the text stands as it is.
    if (bare.size() < 2 || bare.back() != bare.front())
        return {text};
    return {bare.substr(1, bare.size() - 2), bare.front()};
}

Field_Kind Kind_Of_Field(const Field_Content& content, double& value)
{
    const std::string_view text = Trim_Copy(content.text);
    value = 0.0;
    const std::string_view missing = request.Missing_Input_Text;
    if (text.empty() || (missing != "*" && Equal_Folded(text, missing)))
        return Field_Kind::nothing;
    const char* const last = text.data() + text.size();
    const Parsed_Number parsed = Parse_Number(text.data(), last);
    const bool starred = content.quote == '\0' && parsed.end + 1 == last && *parsed.end == '*';
    if (parsed.end != last && !starred)
        return Field_Kind::text;
    if (parsed.status != Number_Status::good)
        return Field_Kind::nothing;
    value = std::min(parsed.value, Greatest_Number);
    return Field_Kind::number;
}

}  // namespace ingester

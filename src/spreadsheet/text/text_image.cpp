// The memory image of a text: the lines that the request keeps, one LF behind each.
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>

namespace ingester {

namespace {

/// A NUL would end the text for everything that reads it; blanks keep the fields in their places.
void Blank_Out_Nuls(File_Image& image)
{
    char* const last = image.Bytes() + image.Size();
    long count = 0;
    for (char* at = image.Bytes(); at != last; ++at, ++count) {
        at = static_cast<char*>(std::memchr(at, '\0', static_cast<std::size_t>(last - at)));
        if (at == nullptr)
            break;
        *at = ' ';
    }
    if (count > 0)
        Report_Message_Long("Warning: %li NUL characters in the text were read as blanks.\n", count);
}

/// The lines of the loaded file, in order.
class Line_Source {
public:
    explicit Line_Source(std::string_view text, bool has_returns)
        : at_(text.data()), last_(at_ + text.size()), has_returns_(has_returns)
    {}

    [[nodiscard]] std::int64_t Number() const { return number_; }

    bool Next(std::string_view& line)
    {
        if (at_ == last_)
            return false;
        const auto left = static_cast<std::size_t>(last_ - at_);
        const void* const feed = std::memchr(at_, '\n', left);
        const char* end = feed == nullptr ? last_ : static_cast<const char*>(feed);
        const char* next = feed == nullptr ? last_ : end + 1;
        if (has_returns_)
            End_At_Return(end, next);
        line = {at_, static_cast<std::size_t>(end - at_)};
        at_ = next;
        ++number_;
        return true;
    }

private:
    void End_At_Return(const char*& end, const char*& next) const
    {
        const void* const found = std::memchr(at_, '\r', static_cast<std::size_t>(end - at_));
        if (found == nullptr)
            return;
        const char* const return_at = static_cast<const char*>(found);
        if (return_at + 1 != end || end == last_)
            next = return_at + 1;
        end = return_at;
    }

    const char* at_;
    const char* last_;
    bool has_returns_;
    std::int64_t number_ = 0;
};

/// The lines that `Cell_Range` keeps: "first:last", digits only counting.
struct Line_Range {
    std::int64_t first = 0;
    std::int64_t last = 2147483647;
};

std::int64_t Digits_Of(std::string_view text, std::int64_t otherwise)
{
    constexpr std::int64_t greatest = 2147483647;
    std::int64_t value = 0;
    bool any = false;
    for (const char c : text)
        if (Is_Digit(c)) {
            value = std::min(value * 10 + (c - '0'), greatest);
            any = true;
        }
    return any ? value : otherwise;
}

Line_Range Range_Of(std::string_view text)
{
    Line_Range range;
    const std::size_t colon = text.find(':');
    range.first = Digits_Of(text.substr(0, colon), range.first);
    if (colon != std::string_view::npos)
        range.last = Digits_Of(text.substr(colon + 1), range.last);
    return range;
}

bool Is_Title_Line(std::string_view line)
{
    return line.size() >= 2 && line.front() == '"' && line.back() == '"';
}

/// Copies the kept lines to the head of the image; they never outrun the lines still to be read.
class Line_Keeper {
public:
    Line_Keeper(File_Image& image, const Text_Facts& facts, bool strip_titles)
        : image_(image), lines_({image.Bytes(), image.Size()}, facts.returns > 0), next_(image.Bytes()),
          titles_pending_(strip_titles), start_pending_(!request.Start_Text.empty())
    {}

    /// The kept lines are `text` then. False after a message.
    bool Keep(const Line_Range& range, std::string_view& text);

private:
    bool Starts_Data(std::string_view line);
    bool Is_Title(std::string_view line);
    void Take_Line(std::string_view line);
    void Take_Record(std::string_view line);
    bool Append_To_Record(std::size_t& length, std::string_view line, bool last);
    void End_Line();
    void Report_Missed_Marks(bool end_found) const;

    File_Image& image_;
    Line_Source lines_;
    char* next_;
    bool titles_pending_;
    bool start_pending_;
    bool content_kept_ = false;
};

/// `Start_Text` not yet met: its line is the first that counts.
bool Line_Keeper::Starts_Data(std::string_view line)
{
    if (!start_pending_)
        return true;
    if (!line.starts_with(request.Start_Text.view()))
        return false;
    start_pending_ = false;
    next_ = image_.Bytes();
    content_kept_ = false;
    return true;
}

bool Line_Keeper::Is_Title(std::string_view line)
{
    titles_pending_ = titles_pending_ && Is_Title_Line(line);
    return titles_pending_;
}

/// Leading blank lines vanish, later ones stay.
void Line_Keeper::End_Line()
{
    if (content_kept_)
        *next_++ = '\n';
}

void Line_Keeper::Take_Line(std::string_view line)
{
    if (Is_Title(line))
        return;
    if (next_ != line.data())
        std::memmove(next_, line.data(), line.size());
    next_ += line.size();
    content_kept_ = content_kept_ || !line.empty();
    End_Line();
}

/// Puts a line behind the record, with a "," unless it is the record's last. False when it is full.
bool Line_Keeper::Append_To_Record(std::size_t& length, std::string_view line, bool last)
{
    if (!last)
        while (!line.empty() && (line.back() == ' ' || line.back() == '\t'))
            line.remove_suffix(1);
    const std::size_t taken = std::min(line.size(), Greatest_Line - length);
    std::memmove(next_ + length, line.data(), taken);
    length += taken;
    if (!last && taken == line.size() && (line.empty() || line.back() != ',') && length < Greatest_Line)
        next_[length++] = ',';
    else if (taken < line.size())
        return Fail("Error: Combined CSV line length > %li.\n", static_cast<long>(Greatest_Line));
    return true;
}

/// Joins `Lines_Per_Record` lines. Lines of a record that ran full are passed over, so that the
/// records behind it begin where they should.
void Line_Keeper::Take_Record(std::string_view line)
{
    std::size_t length = 0;
    bool open = true;
    for (std::int32_t i = 1;; ++i) {
        const bool last = i >= request.Lines_Per_Record;
        open = open && Append_To_Record(length, line, last);
        if (last || !lines_.Next(line))
            break;
    }
    Take_Line({next_, length});
}

void Line_Keeper::Report_Missed_Marks(bool end_found) const
{
    if (start_pending_)
        Report_Message_Text("Warning: Starting cell contents '%s' NOT found.\n", request.Start_Text.c_str());
    if (!request.End_Text.empty() && !end_found)
        Report_Message_Text("Warning: Ending line start text '%s' NOT found.\n", request.End_Text.c_str());
}

bool Line_Keeper::Keep(const Line_Range& range, std::string_view& text)
{
    bool end_found = false;
    std::string_view line;
    while (lines_.Next(line)) {
        if (lines_.Number() < range.first)
            continue;
        if (lines_.Number() > range.last)
            break;
        const bool pending = start_pending_;
        if (!Starts_Data(line))
            continue;
        end_found = !pending && !request.End_Text.empty() && line.starts_with(request.End_Text.view());
        if (end_found)
            break;
        if (line.size() > Greatest_Line)
            return Fail("Error: Line %li has more than %li characters.\n", static_cast<long>(lines_.Number()),
                        static_cast<long>(Greatest_Line));
        if (request.Lines_Per_Record >= 2)
            Take_Record(line);
        else
            Take_Line(line);
    }
    Report_Missed_Marks(end_found);
    if (start_pending_)
        next_ = image_.Bytes();
    text = {image_.Bytes(), static_cast<std::size_t>(next_ - image_.Bytes())};
    return true;
}

/// Whether every line is kept, but for blank lines and titles at the head, and ends with LF or CR LF.
bool Stands_As_It_Is(const Line_Range& range, const Text_Facts& facts)
{
    return range.first <= 1 && range.last == Line_Range{}.last && request.Start_Text.empty()
           && request.End_Text.empty() && request.Lines_Per_Record < 2 && facts.returns == facts.return_feeds
           && facts.longest_line <= Greatest_Line;
}

/// The text without its leading blank lines and titles, ended by LF.
void Cut_Head(File_Image& image, bool strip_titles, Text_Buffer& buffer)
{
    buffer.text = {image.Bytes(), image.Size()};
    if (buffer.text.back() != '\n') {
        image.Bytes()[image.Size()] = '\n';
        buffer.text = {image.Bytes(), image.Size() + 1};
        ++buffer.facts.line_feeds;
    }
    while (!buffer.text.empty()) {
        const std::size_t end = buffer.text.find('\n');
        std::string_view line = buffer.text.substr(0, end);
        if (line.ends_with('\r'))
            line.remove_suffix(1);
        strip_titles = strip_titles && Is_Title_Line(line);
        if (!line.empty() && !strip_titles)
            break;
        buffer.text.remove_prefix(end + 1);
        --buffer.facts.line_feeds;
    }
}

}  // namespace

bool Load_Text_Image(Input_File& file, bool strip_titles, File_Image& image, Text_Buffer& buffer)
{
    const Line_Range range = Range_Of(request.Cell_Range);
    if (range.first > range.last)
        return Fail("Error: First line > Last line in cell range.\n");
    if (!image.Load(file))
        return Fail("Error: Could not read all of file %.500s.\n", file.Name().c_str());
    if (image.Size() == 0)
        return true;
    buffer.facts = Look_At_Text({image.Bytes(), image.Size()});
    if (buffer.facts.nuls)
        Blank_Out_Nuls(image);
    if (Stands_As_It_Is(range, buffer.facts)) {
        Cut_Head(image, strip_titles, buffer);
        return true;
    }
    if (!Line_Keeper(image, buffer.facts, strip_titles).Keep(range, buffer.text))
        return false;
    buffer.facts = Look_At_Text(buffer.text);
    return true;
}

bool Next_Text_Line(std::string_view text, std::string_view& line, bool& has_end)
{
    static std::string_view rest;
    if (text.data() != nullptr)
        rest = text;
    if (rest.empty())
        return false;
    const std::size_t end = rest.find_first_of("\r\n");
    has_end = end != std::string_view::npos;
    line = rest.substr(0, end);
    rest.remove_prefix(has_end ? end : rest.size());
    if (has_end)
        rest.remove_prefix(rest.starts_with("\r\n") ? 2 : 1);
    return true;
}

}  // namespace ingester

// The memory image of a text: the lines that the request keeps, one LF behind each.
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>

namespace ingester {

namespace {

/// The lines of a text, in order; LF, CR and CR LF end one.
class Line_Source {
public:
    explicit Line_Source(std::string_view text) : at_(text.data()), last_(at_ + text.size()) {}

    [[nodiscard]] std::int64_t Number() const { return number_; }

    bool Next(std::string_view& line)
    {
        if (at_ == last_)
            return false;
        // Each LF is looked for once, however many lines that end with a CR stand in front of it.
        if (feed_ == nullptr || feed_ < at_)
            feed_ = Find('\n', last_);
        const char* const end = Find('\r', feed_);
        line = {at_, static_cast<std::size_t>(end - at_)};
        at_ = end == last_ ? end : end + 1;
        if (end != feed_ && at_ == feed_ && feed_ != last_)
            ++at_;
        ++number_;
        return true;
    }

private:
    [[nodiscard]] const char* Find(char c, const char* otherwise) const
    {
        const void* const found = std::memchr(at_, c, static_cast<std::size_t>(otherwise - at_));
        return found == nullptr ? otherwise : static_cast<const char*>(found);
    }

    const char* at_;
    const char* last_;
    const char* feed_ = nullptr;  ///< the next LF, or the text's end
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

/// Tabs are content where they separate fields.
std::string_view Blanks_Of(std::string_view file_name)
{
    const bool tabs_separate = Ends_Ignoring_Case(file_name, ".tab")
                               || request.Custom_Separators.view().find('\t') != std::string_view::npos;
    return tabs_separate ? " " : " \t";
}

/// Copies the kept lines to the head of the image; they never outrun the lines still to be read.
class Line_Keeper {
public:
    Line_Keeper(File_Image& image, std::size_t head, const Line_Range& range, std::string_view blanks,
                bool strip_titles)
        : image_(image), range_(range), blanks_(blanks),
          lines_(std::string_view(image.Bytes(), image.Size()).substr(head)), next_(image.Bytes()),
          titles_pending_(strip_titles), start_pending_(!request.Start_Text.empty())
    {}

    /// The kept lines are in `buffer` then. False after a message.
    bool Keep(Text_Buffer& buffer);

private:
    bool Next_In_Range(std::string_view& line);
    bool Starts_Data(std::string_view line);
    bool Ends_Data(std::string_view line);
    bool Is_Title(std::string_view line);
    void Take_Line(std::string_view line);
    void Take_Record(std::string_view line);
    bool Append_To_Record(std::size_t& length, std::string_view line, bool first);
    void Report_Missed_Marks() const;

    File_Image& image_;
    Line_Range range_;
    std::string_view blanks_;
    Line_Source lines_;
    char* next_;
    bool titles_pending_;
    bool start_pending_;
    bool end_found_ = false;
    bool content_kept_ = false;
};

bool Line_Keeper::Next_In_Range(std::string_view& line)
{
    return !end_found_ && lines_.Number() < range_.last && lines_.Next(line);
}

/// `Start_Text` not yet met: its line is the first that counts.
bool Line_Keeper::Starts_Data(std::string_view line)
{
    if (!start_pending_)
        return true;
    if (!line.starts_with(request.Start_Text.view()))
        return false;
    start_pending_ = false;
    return true;
}

bool Line_Keeper::Ends_Data(std::string_view line)
{
    end_found_ = !request.End_Text.empty() && line.starts_with(request.End_Text.view());
    return end_found_;
}

bool Line_Keeper::Is_Title(std::string_view line)
{
    titles_pending_ = titles_pending_ && Is_Title_Line(line);
    return titles_pending_;
}

/// Leading blank lines vanish, later ones stay.
void Line_Keeper::Take_Line(std::string_view line)
{
    if (Is_Title(line))
        return;
    content_kept_ = content_kept_ || line.find_first_not_of(blanks_) != std::string_view::npos;
    if (!content_kept_)
        return;
    if (next_ != line.data())
        std::memmove(next_, line.data(), line.size());
    next_ += line.size();
    *next_++ = '\n';
}

/// Puts a line behind those of the record so far, which end with a "," then. False when it is full.
bool Line_Keeper::Append_To_Record(std::size_t& length, std::string_view line, bool first)
{
    if (!first) {
        while (length > 0 && (next_[length - 1] == ' ' || next_[length - 1] == '\t'))
            --length;
        if ((length == 0 || next_[length - 1] != ',') && length < Greatest_Line)
            next_[length++] = ',';
    }
    const std::size_t taken = std::min(line.size(), Greatest_Line - length);
    std::memmove(next_ + length, line.data(), taken);
    length += taken;
    return taken == line.size()
           || Fail("Error: Combined CSV line length > %li.\n", static_cast<long>(Greatest_Line));
}

/// Joins `Lines_Per_Record` lines. Lines of a record that ran full are passed over, so that the
/// records behind it begin where they should. The last one ends where the lines do.
void Line_Keeper::Take_Record(std::string_view line)
{
    std::size_t length = 0;
    bool open = true;
    for (std::int32_t i = 1;; ++i) {
        open = open && Append_To_Record(length, line, i == 1);
        if (i >= request.Lines_Per_Record || !Next_In_Range(line) || Ends_Data(line))
            break;
    }
    Take_Line({next_, length});
}

void Line_Keeper::Report_Missed_Marks() const
{
    if (start_pending_)
        Report_Message_Text("Warning: Starting cell contents '%s' NOT found.\n", request.Start_Text.c_str());
    if (!request.End_Text.empty() && !end_found_)
        Report_Message_Text("Warning: Ending line start text '%s' NOT found.\n", request.End_Text.c_str());
}

bool Line_Keeper::Keep(Text_Buffer& buffer)
{
    std::string_view line;
    while (Next_In_Range(line)) {
        if (lines_.Number() < range_.first)
            continue;
        const bool pending = start_pending_;
        if (!Starts_Data(line))
            continue;
        if (!pending && Ends_Data(line))
            break;
        if (!Line_Is_Short_Enough(line, lines_.Number()))
            return false;
        if (request.Lines_Per_Record >= 2)
            Take_Record(line);
        else
            Take_Line(line);
    }
    Report_Missed_Marks();
    buffer = {image_.Bytes(), next_};
    return true;
}

/// Whether every line is kept, but for blank lines and titles at the head.
bool Keeps_Every_Line(const Line_Range& range)
{
    return range.first <= 1 && range.last == Line_Range{}.last && request.Start_Text.empty()
           && request.End_Text.empty() && request.Lines_Per_Record < 2;
}

/// The text without its leading blank lines and titles.
void Cut_Head(const File_Image& image, std::size_t head, std::string_view blanks, bool strip_titles,
              Text_Buffer& buffer)
{
    buffer = {image.Bytes() + head, image.Bytes() + image.Size()};
    if (buffer.last[-1] != '\n' && buffer.last[-1] != '\r')
        *buffer.last++ = '\n';
    Line_Source lines(buffer.Text());
    for (std::string_view line; lines.Next(line);) {
        strip_titles = strip_titles && Is_Title_Line(line);
        const bool own_title = lines.Number() == 1 && line.find(Title_Words) != std::string_view::npos;
        if (strip_titles && !own_title)
            request.losses.Note_Unread("lines in quotes at its head");
        if (!strip_titles && line.find_first_not_of(blanks) != std::string_view::npos) {
            buffer.first += line.data() - buffer.first;
            buffer.lines_before = lines.Number() - 1;
            return;
        }
    }
    buffer.first = buffer.last;
}

}  // namespace

bool Line_Is_Short_Enough(std::string_view line, std::int64_t number)
{
    if (line.size() <= Greatest_Line)
        return true;
    if (line.ends_with('\n'))
        line.remove_suffix(1);
    if (line.ends_with('\r'))
        line.remove_suffix(1);
    return line.size() <= Greatest_Line
           || Fail("Error: Line %li has more than %li characters.\n", static_cast<long>(number),
                   static_cast<long>(Greatest_Line));
}

bool Load_Text_Image(Input_File& file, bool strip_titles, File_Image& image, Text_Buffer& buffer,
                     Text_Code_State& code, bool& rewritten)
{
    const Line_Range range = Range_Of(request.Cell_Range);
    rewritten = false;
    if (range.first > range.last)
        return Fail("Error: First line > Last line in cell range.\n");
    if (!image.Load(file))
        return Fail_To_Read(file.Name());
    if (!Settle_Code(file.Name(), image, code))
        return false;
    if (image.Size() <= code.head)
        return true;
    const std::string_view blanks = Blanks_Of(file.Name());
    rewritten = !Keeps_Every_Line(range);
    if (rewritten && !Line_Keeper(image, code.head, range, blanks, strip_titles).Keep(buffer))
        return false;
    if (!rewritten)
        Cut_Head(image, code.head, blanks, strip_titles, buffer);
    buffer.watched = code.watched;
    return true;
}

}  // namespace ingester

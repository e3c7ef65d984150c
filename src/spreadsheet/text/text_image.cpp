// The memory image of a text: the lines that the request keeps, one LF behind each.
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>

namespace ingester {

namespace {

/// Room behind the text, for line ends and a NUL that the file lacks.
constexpr std::size_t Image_Slack = 8198;
constexpr std::size_t Read_Block = std::size_t{16} << 20;

bool Grow_Image(Text_Image& image, std::size_t& room)
{
    room *= 2;
    void* const bytes = Realloc_Checked(image.bytes.get(), room + Image_Slack);
    if (bytes == nullptr)
        return false;
    static_cast<void>(image.bytes.release());
    image.bytes.reset(static_cast<char*>(bytes));
    return true;
}

/// Reads the whole file. Its size is what the system says; a pipe's grows as it comes.
bool Read_Whole_File(Input_File& file, Text_Image& image)
{
    const std::int64_t size = file.Size();
    auto room = static_cast<std::size_t>(size > 0 ? size : 1 << 20);
    image.bytes.reset(static_cast<char*>(Alloc_Zeroed(room + Image_Slack)));
    if (image.bytes == nullptr)
        return false;
    for (;;) {
        if (image.length == room + 1 && !Grow_Image(image, room))
            return false;
        // One byte more than the size: where it comes, the file has grown meanwhile.
        const std::size_t wanted = std::min(room + 1 - image.length, Read_Block);
        const std::size_t got = file.Read(image.bytes.get() + image.length, wanted);
        image.length += got;
        Show_Progress("Loading", file.Position(), size);
        if (got < wanted)
            break;
    }
    return !file.Failed() || Fail("Error: Could not read all of file %.500s.\n", file.Name().c_str());
}

/// A NUL would end the text for everything that reads it; blanks keep the fields in their places.
void Blank_Out_Nuls(Text_Image& image)
{
    char* const last = image.bytes.get() + image.length;
    long count = 0;
    for (char* at = image.bytes.get(); at != last; ++at, ++count) {
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
    explicit Line_Source(const Text_Image& image)
        : at_(image.bytes.get()), last_(at_ + image.length),
          has_returns_(image.length > 0 && std::memchr(at_, '\r', image.length) != nullptr)
    {
    }

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

/// Copies the kept lines to the head of the image; they never outrun the lines still to be read.
class Line_Keeper {
public:
    Line_Keeper(Text_Image& image, bool strip_titles)
        : image_(image), lines_(image), next_(image.bytes.get()), titles_pending_(strip_titles),
          start_pending_(!request.Start_Text.empty())
    {
    }

    bool Keep(const Line_Range& range);

private:
    bool Starts_Data(std::string_view line);
    bool Is_Title(std::string_view line);
    void Take_Line(std::string_view line);
    void Take_Record(std::string_view line);
    bool Append_To_Record(std::size_t& length, std::string_view line, bool last);
    void End_Line();
    void Report_Missed_Marks(bool end_found) const;

    Text_Image& image_;
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
    next_ = image_.bytes.get();
    content_kept_ = false;
    return true;
}

bool Line_Keeper::Is_Title(std::string_view line)
{
    if (!titles_pending_)
        return false;
    titles_pending_ = line.size() >= 2 && line.front() == '"' && line.back() == '"';
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

bool Line_Keeper::Keep(const Line_Range& range)
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
        next_ = image_.bytes.get();
    image_.length = static_cast<std::size_t>(next_ - image_.bytes.get());
    *next_ = '\0';
    return true;
}

}  // namespace

bool Load_Text_Image(Input_File& file, bool strip_titles, Text_Image& image)
{
    const Line_Range range = Range_Of(request.Cell_Range);
    if (range.first > range.last)
        return Fail("Error: First line > Last line in cell range.\n");
    if (!Read_Whole_File(file, image))
        return false;
    if (image.length == 0)
        return true;
    Blank_Out_Nuls(image);
    return Line_Keeper(image, strip_titles).Keep(range);
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

#include "spreadsheet/dialect/sample_rows.h"

#include <algorithm>
#include <map>

namespace ingester {

namespace {

constexpr std::size_t Whole_Size = std::size_t{1} << 16;
constexpr std::size_t Head_Size = std::size_t{1} << 15;
constexpr std::size_t Other_Size = std::size_t{1} << 13;
constexpr std::string_view Line_Ends = "\r\n";

/// Behind the line end at or behind `at`.
std::size_t Next_Line(std::string_view text, std::size_t at)
{
    at = text.find_first_of(Line_Ends, at);
    if (at == std::string_view::npos)
        return text.size();
    return at + (text.substr(at, 2) == "\r\n" ? 2 : 1);
}

}  // namespace

bool Text_Sample::Holds(std::string_view found) const
{
    return std::ranges::any_of(
        pieces, [&](std::string_view piece) { return piece.find(found) != std::string_view::npos; });
}

/// Lines so long that a piece ends inside its first one are cut there.
Text_Sample Take_Sample(std::string_view text)
{
    if (text.size() <= Whole_Size)
        return {{text}, true};
    Text_Sample sample;
    const std::size_t head = text.substr(0, Head_Size).find_last_of(Line_Ends);
    sample.pieces.push_back(text.substr(0, head == std::string_view::npos ? Whole_Size : head + 1));
    for (const std::size_t at : {text.size() / 2, text.size() - Other_Size}) {
        std::string_view piece = text.substr(at, Other_Size);
        piece.remove_prefix(Next_Line(piece, 0));
        if (at + Other_Size < text.size()) {
            const std::size_t end = piece.find_last_of(Line_Ends);
            piece = piece.substr(0, end == std::string_view::npos ? 0 : end + 1);
        }
        if (!piece.empty())
            sample.pieces.push_back(piece);
    }
    return sample;
}

namespace {

bool Is_Line_End(char c)
{
    return c == '\n' || c == '\r';
}

/// Cuts fields of one line.
struct Field_Cutter {
    const char* last;
    char separator;
    bool runs;
    char quote;
    char escape;

    [[nodiscard]] bool Separates(char c) const { return c == separator || (runs && c == '\t'); }
    [[nodiscard]] bool Is_Blank(char c) const { return (c == ' ' || c == '\t') && (runs || c != separator); }
    [[nodiscard]] bool Ends(const char* at) const { return at == last || Is_Line_End(*at) || Separates(*at); }
    [[nodiscard]] const char* Skip_Blanks(const char* at) const
    {
        while (at != last && Is_Blank(*at))
            ++at;
        return at;
    }
    [[nodiscard]] const char* Close_Of(const char* open) const;
    Sample_Field Next(const char*& at) const;
};

/// The quote that closes a field; null when none does. Over line ends only a quote that follows the rules
/// does; in its line also one behind stray quotes.
const char* Field_Cutter::Close_Of(const char* open) const
{
    bool stray = false;
    bool lines = false;
    for (const char* at = open + 1; at < last; ++at) {
        if (escape != '\0' && *at == escape) {
            ++at;
            continue;
        }
        lines = lines || Is_Line_End(*at);
        if (lines && stray)
            return nullptr;
        if (*at != quote)
            continue;
        const bool doubled = escape == '\0' && at + 1 < last && at[1] == quote;
        const bool closes = Ends(runs ? at + 1 : Skip_Blanks(at + 1));
        if (closes)
            return at;
        if (doubled)
            ++at;
        else
            stray = true;
    }
    return nullptr;
}

Sample_Field Field_Cutter::Next(const char*& at) const
{
    at = Skip_Blanks(at);
    const char* const first = at;
    if (quote != '\0' && at != last && *at == quote) {
        if (const char* const close = Close_Of(at)) {
            at = Skip_Blanks(close + 1);
            if (runs)
                at = close + 1;
            const std::string_view text(first + 1, static_cast<std::size_t>(close - first - 1));
            return {text, true, false};
        }
    }
    while (!Ends(at))
        ++at;
    const char* end = at;
    while (end != first && Is_Blank(end[-1]))
        --end;
    const std::string_view text(first, static_cast<std::size_t>(end - first));
    const bool odd = !text.empty() && (text.front() == '"' || text.back() == '"' || text.front() == '\'');
    return {text, false, odd};
}

}  // namespace

Sample_Rows::Sample_Rows(const Text_Sample& sample, const Text_Dialect& dialect)
{
    for (const std::string_view piece : sample.pieces) {
        tail_start_ = rows_.size();
        Cut_Piece(piece, dialect);
        if (head_rows_ == 0)
            head_rows_ = rows_.size();
    }
}

void Sample_Rows::Cut_Piece(std::string_view piece, const Text_Dialect& dialect)
{
    const char* at = piece.data();
    const char* const last = at + piece.size();
    while (at < last)
        Cut_Row(at, last, dialect);
}

void Sample_Rows::Cut_Row(const char*& at, const char* last, const Text_Dialect& dialect)
{
    const Field_Cutter cutter{last, dialect.separator, dialect.runs, dialect.quote, dialect.escape};
    Sample_Row row{at, fields_.size(), 0, true, *at == '#' || *at == '%'};
    for (;;) {
        const bool first = row.count == 0;
        const Sample_Field field = cutter.Next(at);
        const bool ends = at == last || Is_Line_End(*at);
        if (first || !ends || !dialect.runs || !field.text.empty()) {  // blanks at a line's end
            fields_.push_back(field);
            ++row.count;
            row.empty = row.empty && field.text.empty() && !field.quoted;
        }
        if (ends)
            break;
        ++at;
    }
    if (at != last)
        at += *at == '\r' && at + 1 != last && at[1] == '\n' ? 2 : 1;
    rows_.push_back(row);
}

Usual_Count Find_Usual_Count(std::span<const Sample_Row> rows)
{
    std::map<std::int32_t, std::int64_t> counts;
    Usual_Count usual;
    const bool only_comments =
        std::ranges::all_of(rows, [](const Sample_Row& row) { return row.empty || row.comment; });
    for (const Sample_Row& row : rows)
        if (!row.empty && (only_comments || !row.comment)) {
            ++counts[row.count];
            ++usual.all;
        }
    for (const auto& [count, times] : counts)
        if (times > usual.rows || (times == usual.rows && usual.count == 1))
            usual = {count, times, 0, usual.all};
    for (const std::int32_t near : {usual.count - 1, usual.count + 1})
        if (const auto found = counts.find(near); found != counts.end() && near > 1)
            usual.near_rows += found->second;
    return usual;
}

}  // namespace ingester

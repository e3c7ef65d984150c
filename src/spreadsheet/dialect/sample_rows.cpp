#include "spreadsheet/dialect/sample_rows.h"

#include "spreadsheet/dialect/quote_rules.h"

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
    Text_Sample sample{{}, false, text.data() + text.size()};
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
    const char* reach;  ///< how far quotes are looked for
    char separator;
    bool runs;
    char quote;
    char escape;

    [[nodiscard]] bool Separates(char c) const { return c == separator || (runs && c == '\t'); }
    [[nodiscard]] bool Is_Blank(char c) const { return (c == ' ' || c == '\t') && (runs || c != separator); }
    [[nodiscard]] bool Ends(const char* at) const { return at == last || Is_Line_End(*at) || Separates(*at); }
    [[nodiscard]] const char* Close_Of(const char* open) const;
    [[nodiscard]] const char* Skip_Blanks(const char* at) const
    {
        while (at != last && Is_Blank(*at))
            ++at;
        return at;
    }
    Sample_Field Next(const char*& at);
};

/// The quote that closes a field, be it behind the piece; null when none does.
const char* Field_Cutter::Close_Of(const char* open) const
{
    const auto ends = [this](const char* at) { return at == reach || Is_Line_End(*at) || Separates(*at); };
    return Quote_Rules(quote, escape, ends).Find_Close(open, reach).quote;
}

Sample_Field Field_Cutter::Next(const char*& at)
{
    at = Skip_Blanks(at);
    const char* const first = at;
    if (quote != '\0' && at != last && *at == quote) {
        if (const char* const close = Close_Of(at)) {
            if (close >= last)  // the piece ends inside the quotes
                last = reach;
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
    constexpr std::ptrdiff_t most_behind = 1 << 20;
    for (const std::string_view piece : sample.pieces) {
        const char* const end = piece.data() + piece.size();
        tail_start_ = rows_.size();
        Cut_Piece(piece, sample.last == nullptr ? end : end + std::min(sample.last - end, most_behind),
                  dialect);
        if (head_rows_ == 0)
            head_rows_ = rows_.size();
        else if (dialect.quote != '\0')
            Drop_Inside_Of_Quotes(tail_start_, dialect.quote);
    }
}

void Sample_Rows::Cut_Piece(std::string_view piece, const char* reach, const Text_Dialect& dialect)
{
    const char* at = piece.data();
    const char* const last = at + piece.size();
    while (at < last)
        Cut_Row(at, last, reach, dialect);
}

/// A piece may begin inside a text in quotes: then the first quote at a field's edge closes. Without any, all
/// of it may be inside.
void Sample_Rows::Drop_Inside_Of_Quotes(std::size_t first, char quote)
{
    const auto begin = rows_.begin() + static_cast<std::ptrdiff_t>(first);
    for (auto row = begin; row != rows_.end(); ++row)
        for (const Sample_Field& field : Fields(*row)) {
            if (field.quoted)
                return;
            if (!field.text.empty() && (field.text.front() == quote || field.text.back() == quote)) {
                rows_.erase(begin, row + 1);
                return;
            }
        }
    const std::int32_t usual = rows_[head_rows_ - 1].count;
    const bool is_usual =
        std::any_of(begin, rows_.end(), [usual](const Sample_Row& row) { return row.count == usual; });
    if (reads_on_ && !is_usual)
        rows_.erase(begin, rows_.end());
}

void Sample_Rows::Cut_Row(const char*& at, const char* last, const char* reach, const Text_Dialect& dialect)
{
    Field_Cutter cutter{last, reach, dialect.separator, dialect.runs, dialect.quote, dialect.escape};
    Sample_Row row{at, fields_.size(), 0, true, *at == '#' || *at == '%'};
    for (;;) {
        const bool first = row.count == 0;
        const Sample_Field field = cutter.Next(at);
        const bool ends = at == cutter.last || Is_Line_End(*at);
        if (first || !ends || !dialect.runs || !field.text.empty()) {  // blanks at a line's end
            fields_.push_back(field);
            ++row.count;
            row.empty = row.empty && field.text.empty() && !field.quoted;
        }
        if (ends)
            break;
        ++at;
    }
    reads_on_ = reads_on_ || cutter.last != last;
    if (at != cutter.last)
        at += *at == '\r' && at + 1 != cutter.last && at[1] == '\n' ? 2 : 1;
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

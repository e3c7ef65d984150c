#include "spreadsheet/dialect/text_dialect.h"

#include "request/input_facts.h"
#include "request/request.h"
#include "spreadsheet/dialect/dialect_steps.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

/// Lines of `text`, whatever ends them.
std::int64_t Count_Lines(std::string_view text)
{
    std::int64_t lines = 0;
    for (std::size_t at = 0; at < text.size(); ++at) {
        const bool pair = text[at] == '\r' && text.substr(at + 1, 1) == "\n";
        lines += text[at] == '\n' || (text[at] == '\r' && !pair) ? 1 : 0;
    }
    return lines;
}

std::string_view Between(const char* first, const char* last)
{
    return {first, static_cast<std::size_t>(last - first)};
}

/// Past the sign of a comment and blanks.
const char* Behind_Mark(const Sample_Row& comment)
{
    const char* at = comment.first + 1;
    while (*at == ' ' || *at == '\t')
        ++at;
    return at;
}

}  // namespace

namespace {

constexpr std::string_view Separator_Words[] = {"sep=", "\"sep="};

}  // namespace

std::size_t Separator_Line(std::string_view text)
{
    constexpr std::string_view signs = ",;\t|: ";
    for (const std::string_view words : Separator_Words) {
        if (!text.starts_with(words))
            continue;
        const std::string_view rest = text.substr(words.size());
        const std::size_t sign_and_quote = words.front() == '"' ? 2 : 1;
        const std::size_t end = std::min(rest.find_first_of("\r\n"), rest.size());
        if (end != sign_and_quote)
            continue;
        const bool quoted = sign_and_quote == 1 || rest[1] == '"';
        if (quoted && signs.find(rest.front()) != std::string_view::npos)
            return std::min(words.size() + end + (rest.substr(end, 2) == "\r\n" ? 2 : 1), text.size());
    }
    return 0;
}

namespace {

Found_Table Find_By_Sample(std::string_view text, const Told_Dialect& told)
{
    const Text_Sample sample = Take_Sample(text);
    Found_Table found;
    Text_Dialect& dialect = found.dialect;
    dialect = Find_Separation(sample, told);
    found.last = text.size();
    const Sample_Rows rows(sample, dialect);
    if (rows.Rows().empty())
        return found;
    const Table_Place place = Find_Place(rows, told, dialect);
    const std::span all(rows.Rows());
    const std::size_t last = std::max(std::min(place.last, place.footer), place.first);
    const auto table = all.subspan(place.first, last - place.first);
    Find_Marks(rows, table, told, dialect);
    Find_Names(rows, table, told, dialect);
    const char* first = all[place.first].first;
    if (place.names_in_comment && told.names_lines < 0) {
        first = Behind_Mark(all[place.first - 1]);
        dialect.names_lines = 1;
        dialect.rows_are_named = false;
    }
    found.first = static_cast<std::size_t>(first - text.data());
    dialect.lines_in_front = Count_Lines(Between(text.data(), first));
    if (place.footer < all.size()) {
        found.last = static_cast<std::size_t>(all[place.footer].first - text.data());
        found.lines_behind = static_cast<std::size_t>(Count_Lines(text.substr(found.last)));
    }
    return found;
}

}  // namespace

Found_Table Find_Dialect(std::string_view text, const Told_Dialect& told)
{
    const std::size_t line = Separator_Line(text);
    if (line == 0)
        return Find_By_Sample(text, told);
    Told_Dialect by_line = told;
    if (told.separators.empty())
        by_line.separators = text.substr(text.find('=') + 1, 1);
    Found_Table found = Find_By_Sample(text.substr(line), by_line);
    found.first += line;
    found.last += line;
    ++found.dialect.lines_in_front;
    return found;
}

bool Begins_Other_Table(std::string_view text, const Text_Dialect& dialect)
{
    constexpr std::size_t looked_at = 4096;
    constexpr std::int64_t most_rows = 20;
    std::string_view piece = text.substr(0, looked_at);
    if (piece.size() < text.size())
        piece = piece.substr(0, piece.find_last_of("\r\n") + 1);
    const Sample_Rows cut({{piece}, true}, dialect);
    const std::vector<Sample_Row>& rows = cut.Rows();
    const auto first = std::ranges::find_if(rows, [](const Sample_Row& row) { return !row.empty; });
    auto last = std::find_if(first, rows.end(), [](const Sample_Row& row) { return row.empty; });
    last = first + std::min<std::ptrdiff_t>(last - first, most_rows);
    const std::span block(first, last);
    const Usual_Count usual = Find_Usual_Count(block);
    if (usual.count < 2 || usual.all < 2 || block[0].count != usual.count)
        return false;
    if (usual.count != dialect.columns)
        return usual.rows == usual.all;
    Text_Dialect own = dialect;
    Find_Names(cut, block, {}, own);
    const auto is_text = [&](const Sample_Field& field) {
        return Sense_Of_Field(field.text, Marks_Of(dialect)) == Field_Sense::text;
    };
    const auto is_number = [&](const Sample_Field& field) {
        return Sense_Of_Field(field.text, Marks_Of(dialect)) == Field_Sense::number;
    };
    return own.names_lines > 0 && dialect.names_lines > 0
           && std::ranges::all_of(cut.Fields(block[0]), is_text)
           && std::ranges::any_of(cut.Fields(block[1]), is_number);
}

namespace {

/// Behind the next empty line at or behind `at`, and the empty ones that follow it; else the text's size.
std::size_t Behind_Empty_Line(std::string_view text, std::size_t at)
{
    constexpr std::string_view ends = "\r\n";
    while ((at = text.find_first_of(ends, at)) != std::string_view::npos) {
        at += text.substr(at, 2) == ends ? 2 : 1;
        const std::size_t next = std::min(text.find_first_not_of(" \r\n", at), text.size());
        if (text.substr(at, next - at).find_first_of(ends) != std::string_view::npos)
            return next;
    }
    return text.size();
}

/// Where another table begins behind the one that was found; else the text's size.
std::size_t Start_Of_Next(std::string_view text, const Found_Table& found)
{
    constexpr int most_looks = 64;
    std::size_t at = found.first;
    for (int looks = 0; looks < most_looks; ++looks) {
        at = Behind_Empty_Line(text, at);
        if (at == text.size() || Begins_Other_Table(text.substr(at), found.dialect))
            return at;
    }
    return text.size();
}

}  // namespace

std::size_t Start_Of_Table(std::string_view text, std::int32_t table, const Told_Dialect& told)
{
    std::size_t start = 0;
    for (std::int32_t number = 1; number < table && start < text.size(); ++number)
        start += Start_Of_Next(text.substr(start), Find_Dialect(text.substr(start), told));
    return start;
}

const Text_Dialect* Found_Dialect()
{
    return request.Found_Text_Dialect.get();
}

namespace {

/// Signs that don't show, or that stand between the words about them.
std::string Words_Of_Sign(char sign)
{
    switch (sign) {
    case ',':
        return "comma";
    case ';':
        return "semicolon";
    case '\t':
        return "tab";
    case ' ':
        return "blank";
    case '|':
        return "bar";
    case No_Separator:
        return "none";
    case '.':
        return "point";
    case '"':
        return "double";
    case '\'':
        return "single";
    default:
        return {sign};
    }
}

void Note_Sign(std::string_view fact, char sign)
{
    if (sign != '\0')
        Note_Input_Fact(fact, Words_Of_Sign(sign));
}

/// What those who look at the text are told of it.
void Note_Facts(const Text_Dialect& dialect)
{
    if (dialect.code != nullptr)
        Note_Input_Fact("encoding", dialect.code->name);
    Note_Input_Fact("separator", dialect.runs ? "blanks" : Words_Of_Sign(dialect.separator));
    Note_Sign("quote", dialect.quote);
    Note_Sign("escape", dialect.escape);
    Note_Sign("decimal", dialect.decimal);
    Note_Sign("thousands", dialect.thousands);
    Note_Sign("comment", dialect.comment);
    Note_Input_Fact("lines of names", std::to_string(dialect.names_lines));
    if (dialect.lines_in_front > 0)
        Note_Input_Fact("lines in front", std::to_string(dialect.lines_in_front));
}

}  // namespace

void Set_Found_Dialect(const Text_Dialect& dialect)
{
    request.Found_Text_Dialect = std::make_shared<const Text_Dialect>(dialect);
    Note_Facts(dialect);
}

}  // namespace ingester

#include "spreadsheet/dialect/dialect_steps.h"
#include "support/text.h"

#include <algorithm>
#include <vector>

namespace ingester {

namespace {

/// The separators that are tried, the plainest first: it stands where others do no better.
struct Tried_Separator {
    char separator;
    bool runs;
    std::string_view endings;  ///< of files that mostly have it
};
constexpr Tried_Separator Tried_Separators[] = {
    {',', false, ".csv"}, {';', false, ""}, {'\t', false, ".tsv .tab"}, {'|', false, ".psv"}, {' ', true, ""},
};

constexpr std::string_view Separating = ",;\t|";
constexpr double Clearly_Better = 1.02;
constexpr double Ending_Tells = 1.05;

/// Whether other separators would cut the field, too.
bool Holds_Separator(std::string_view text)
{
    return text.find_first_of(Separating) != std::string_view::npos;
}

/// How much a field looks like one, 0 to 1.
double Soundness(const Sample_Field& field)
{
    constexpr double cut_short = 0.3;
    if (field.quoted)
        return 1.0;
    if (field.odd)
        return cut_short;
    if (!Holds_Separator(field.text))
        return 1.0;
    const Mark_Evidence evidence = Evidence_Of(field.text);
    const bool number = evidence == Mark_Evidence::comma || evidence == Mark_Evidence::comma_or_groups
                        || evidence == Mark_Evidence::point_groups;
    return number ? 1.0 : cut_short;
}

bool Is_Number(const Sample_Field& field)
{
    Field_Number number;
    return Read_Number(field.text, {}, number) || Read_Number(field.text, {',', '\0'}, number);
}

/// What speaks for a way of cutting.
struct Score {
    double value = 0;
    double steadiness = 0;       ///< how many rows have the usual number of fields, 0 to 1
    bool holds_numbers = false;  ///< a column is mostly numbers
    std::int32_t columns = 0;
};

std::vector<Sample_Row> Without_Comments(const std::vector<Sample_Row>& rows)
{
    std::vector<Sample_Row> kept;
    std::ranges::copy_if(rows, std::back_inserter(kept), [](const Sample_Row& row) { return !row.comment; });
    return kept.empty() ? rows : kept;
}

Score Score_Of(const Text_Sample& sample, const Text_Dialect& dialect)
{
    constexpr double single_column = 0.001;
    const Sample_Rows cut(sample, dialect);
    const std::vector<Sample_Row> rows = Without_Comments(cut.Rows());
    const Usual_Count usual = Find_Usual_Count(rows);
    Score score;
    if (usual.all == 0)
        return score;
    score.columns = usual.count;
    const auto near = usual.count > 2 ? static_cast<double>(usual.near_rows) / 2.0 : 0.0;
    score.steadiness = (static_cast<double>(usual.rows) + near) / static_cast<double>(usual.all);
    double sound = 0;
    std::int64_t fields = 0;
    std::vector<std::int64_t> numbers(static_cast<std::size_t>(usual.count));
    for (const Sample_Row& row : rows) {
        if (row.empty || row.count != usual.count)
            continue;
        std::size_t place = 0;
        for (const Sample_Field& field : cut.Fields(row)) {
            sound += Soundness(field);
            ++fields;
            if (dialect.runs)
                numbers[place] += Is_Number(field) ? 1 : 0;
            ++place;
        }
    }
    score.holds_numbers = std::ranges::any_of(
        numbers, [&](std::int64_t count) { return count * 5 >= usual.rows * 4 - 5 && count > 0; });
    const double width = usual.count > 1 ? 1.0 - 1.0 / usual.count : single_column;
    score.value = score.steadiness * width * sound / static_cast<double>(fields);
    return score;
}

/// Words of a text have blanks between them, too: blanks separate only where all else agrees.
bool May_Separate(const Tried_Separator& tried, const Score& score, std::string_view name)
{
    constexpr double steady = 0.8;
    if (!tried.runs)
        return true;
    const bool other = Ends_With_One_Of(name, ".csv .tsv .tab .psv");
    return score.steadiness >= steady && score.columns > 1
           && (score.holds_numbers || (!other && score.steadiness >= 1.0));
}

/// Whether a quote behind a backslash goes on inside its text.
bool Is_Escaped_Inside(const Text_Sample& sample, std::string_view escaped)
{
    constexpr std::string_view outside = ",;\t|\r\n";
    for (const std::string_view piece : sample.pieces)
        for (std::size_t at = piece.find(escaped); at != std::string_view::npos;
             at = piece.find(escaped, at + 1))
            if (at + escaped.size() < piece.size()
                && outside.find(piece[at + escaped.size()]) == std::string_view::npos)
                return true;
    return false;
}

/// The quotes and escapes that are tried with each separator, the plainest first.
std::vector<Text_Dialect> Quotings(const Text_Sample& sample, const Told_Dialect& told)
{
    std::vector<Text_Dialect> tried;
    const auto add = [&](char quote, char escape) {
        Text_Dialect dialect;
        dialect.quote = quote;
        dialect.escape = escape;
        tried.push_back(dialect);
    };
    for (const char quote : {'"', '\''}) {
        const bool wanted = told.quote ? *told.quote == quote : quote == '"' || sample.Holds("'");
        if (!wanted)
            continue;
        const char escaped[] = {'\\', quote, '\0'};
        const bool inside = Is_Escaped_Inside(sample, escaped);
        if (inside)
            add(quote, '\\');
        add(quote, '\0');
        if (!inside && sample.Holds(escaped))
            add(quote, '\\');
    }
    if (tried.empty())
        add(*told.quote, '\0');
    return tried;
}

/// By the separators that were told, whichever of them stand in the text.
Tried_Separator Told_Separator(const Text_Sample& sample, std::string_view told)
{
    for (const char separator : told)
        if (sample.Holds({&separator, 1}))
            return {separator, separator == ' ', {}};
    return {told.front(), told.front() == ' ', {}};
}

}  // namespace

Text_Dialect Find_Separation(const Text_Sample& sample, const Told_Dialect& told)
{
    std::vector<Tried_Separator> separators(std::begin(Tried_Separators), std::end(Tried_Separators));
    if (!told.separators.empty())
        separators = {Told_Separator(sample, told.separators)};
    Text_Dialect best;
    double best_value = -1;
    for (Text_Dialect dialect : Quotings(sample, told))
        for (const Tried_Separator& tried : separators) {
            dialect.separator = tried.separator;
            dialect.runs = tried.runs;
            if (!sample.Holds({&tried.separator, 1}) && separators.size() > 1)
                continue;
            const Score score = Score_Of(sample, dialect);
            if (separators.size() > 1 && !May_Separate(tried, score, told.file_name))
                continue;
            const double value =
                Ends_With_One_Of(told.file_name, tried.endings) ? score.value * Ending_Tells : score.value;
            if (value > best_value * Clearly_Better) {
                best_value = value;
                best = dialect;
            }
        }
    if (best_value < 0) {  // one column
        best = Quotings(sample, told).front();
        best.separator = separators.front().separator;
        best.runs = separators.front().runs;
    }
    return best;
}

}  // namespace ingester

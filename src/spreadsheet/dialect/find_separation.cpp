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
    double share = 0;          ///< of the rows that have the usual number of fields
    double steadiness = 0;     ///< the same, and half of those with a field more or less
    double odd = 0;            ///< fields with a stray quote, for each row
    std::int32_t columns = 0;  ///< as most rows have
    std::int32_t first = 0;    ///< as the first row has
    std::int32_t numbers = 0;  ///< columns that are mostly numbers
    bool last_is_number = false;
    bool spaced = true;  ///< a blank stands behind each separator, as in prose
    bool even_block = false;
};

std::vector<Sample_Row> Without_Comments(const std::vector<Sample_Row>& rows)
{
    std::vector<Sample_Row> kept;
    std::ranges::copy_if(rows, std::back_inserter(kept), [](const Sample_Row& row) { return !row.comment; });
    return kept.empty() ? rows : kept;
}

/// Whether lines between empty ones are all cut alike, or at least three at their end are.
bool Has_Even_Block(std::span<const Sample_Row> rows)
{
    constexpr std::ptrdiff_t surely_even = 3;
    const auto is_empty = [](const Sample_Row& row) { return row.empty; };
    for (auto first = rows.begin(); first != rows.end();) {
        first = std::find_if_not(first, rows.end(), is_empty);
        const auto last = std::find_if(first, rows.end(), is_empty);
        std::ptrdiff_t alike = 0;
        while (alike < last - first && last[-1 - alike].count == last[-1].count)
            ++alike;
        if (alike > 1 && last[-1].count > 1 && (alike == last - first || alike >= surely_even))
            return true;
        first = last;
    }
    return false;
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
    score.first = std::ranges::find_if(rows, [](const Sample_Row& row) { return !row.empty; })->count;
    score.even_block = usual.count > 1 || Has_Even_Block(rows);
    const auto all = static_cast<double>(usual.all);
    const auto near = usual.count > 2 ? static_cast<double>(usual.near_rows) / 2.0 : 0.0;
    score.share = static_cast<double>(usual.rows) / all;
    score.steadiness = score.share + near / all;
    double sound = 0;
    std::int64_t odd = 0;
    std::vector<std::int64_t> numbers(static_cast<std::size_t>(usual.count));
    for (const Sample_Row& row : rows) {
        if (row.empty)
            continue;
        const auto fields = cut.Fields(row);
        score.spaced = score.spaced && Is_Spaced(fields);
        if (row.count != usual.count)
            continue;
        for (std::size_t place = 0; place < fields.size(); ++place) {
            sound += Soundness(fields[place]);
            odd += fields[place].odd ? 1 : 0;
            if (dialect.runs || score.first == 1)
                numbers[place] += Is_Number(fields[place]) ? 1 : 0;
        }
    }
    const auto is_number = [&](std::int64_t count) { return count * 5 >= usual.rows * 4 - 5 && count > 0; };
    score.numbers = static_cast<std::int32_t>(std::ranges::count_if(numbers, is_number));
    score.last_is_number = is_number(numbers.back());
    const double width = usual.count > 1 ? 1.0 - 1.0 / usual.count : single_column;
    score.odd = static_cast<double>(odd) / static_cast<double>(usual.rows);
    score.value = score.steadiness * width * sound / static_cast<double>(usual.rows * usual.count);
    return score;
}

/// Below a name of its own every line is a number with a decimal comma.
bool Are_Decimals_Below_A_Name(const Text_Sample& sample)
{
    Text_Dialect whole;
    whole.separator = No_Separator;
    const Sample_Rows cut(sample, whole);
    bool name = true;
    for (const Sample_Row& row : cut.Rows()) {
        const std::string_view text = cut.Fields(row)[0].text;
        Field_Number number;
        if (row.empty || row.comment)
            continue;
        if (Read_Number(text, {',', '\0'}, number) == name || (!name && cut.Fields(row)[0].quoted))
            return false;
        name = false;
    }
    return !name;
}

/// Whether the sign stands in the texts of a single column: some of its lines have it and others don't, or it
/// is the comma of prose or of numbers below a name that has none.
bool Stands_In_Texts(const Tried_Separator& tried, const Score& score, const Text_Sample& sample)
{
    if (score.columns == 1)
        return !score.even_block && (score.first == 1 || score.spaced);
    if (score.first > 1)
        return false;
    return (score.spaced && score.numbers == 0)
           || (tried.separator == ',' && score.columns == 2 && Are_Decimals_Below_A_Name(sample));
}

/// Words of a text have blanks between them, too: blanks separate only where all else agrees, and no plainer
/// sign, which cuts `plainer` of the rows alike, does as well.
bool May_Blanks_Separate(const Score& score, double plainer, std::string_view name)
{
    constexpr double steady = 0.8;
    const bool comma_file = Ends_With_One_Of(name, ".csv .tsv .tab .psv");
    if (score.columns < 2 || score.steadiness < steady || score.share <= plainer)
        return false;
    const bool lone_name = score.first == 1;
    if (lone_name
        && (comma_file || score.numbers * 2 < score.columns || (score.columns == 2 && !score.last_is_number)))
        return false;
    return score.numbers > 0 || (!comma_file && score.steadiness >= 1.0);
}

/// The share of rows that a sign other than a blank cuts alike, as far as its fields look like such.
double Share_Of_Plainer(const Score& score)
{
    constexpr double few = 0.25;
    return score.columns > 1 && score.odd < few ? score.share : 0.0;
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

bool Is_Spaced(std::span<const Sample_Field> fields)
{
    return std::ranges::all_of(fields.subspan(1), [](const Sample_Field& field) {
        return !field.quoted && !field.text.empty() && field.text.data()[-1] == ' ';
    });
}

Text_Dialect Find_Separation(const Text_Sample& sample, const Told_Dialect& told)
{
    std::vector<Tried_Separator> separators(std::begin(Tried_Separators), std::end(Tried_Separators));
    if (!told.separators.empty())
        separators = {Told_Separator(sample, told.separators)};
    Text_Dialect best;
    double best_value = -1;
    double plainer = 0;
    for (Text_Dialect dialect : Quotings(sample, told))
        for (const Tried_Separator& tried : separators) {
            dialect.separator = tried.separator;
            dialect.runs = tried.runs;
            if (!sample.Holds({&tried.separator, 1}) && separators.size() > 1)
                continue;
            const Score score = Score_Of(sample, dialect);
            const bool may = tried.runs ? May_Blanks_Separate(score, plainer, told.file_name)
                                        : !Stands_In_Texts(tried, score, sample);
            if (separators.size() > 1 && !may)
                continue;
            if (!tried.runs)
                plainer = std::max(plainer, Share_Of_Plainer(score));
            const double value =
                Ends_With_One_Of(told.file_name, tried.endings) ? score.value * Ending_Tells : score.value;
            if (value > best_value * Clearly_Better) {
                best_value = value;
                best = dialect;
            }
        }
    if (best_value < 0) {  // one column
        best = Quotings(sample, told).front();
        best.separator = separators.size() > 1 ? No_Separator : separators.front().separator;
        best.runs = separators.size() == 1 && separators.front().runs;
    }
    return best;
}

}  // namespace ingester

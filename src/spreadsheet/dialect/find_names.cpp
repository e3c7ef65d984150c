#include "spreadsheet/dialect/dialect_steps.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <functional>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

using Rows = std::vector<const Sample_Row*>;

/// Evidence in the fields of a table for one use of commas and points, by kind.
struct Mark_Counts {
    std::int64_t counts[7] = {};

    [[nodiscard]] std::int64_t Of(Mark_Evidence kind) const { return counts[static_cast<std::size_t>(kind)]; }
};

}  // namespace

void Find_Marks(const Sample_Rows& rows, std::span<const Sample_Row> table, const Told_Dialect& told,
                Text_Dialect& dialect)
{
    Mark_Counts seen;
    for (const Sample_Row& row : table)
        for (const Sample_Field& field : rows.Fields(row))
            ++seen.counts[static_cast<std::size_t>(Evidence_Of(field.text))];
    const std::int64_t commas = seen.Of(Mark_Evidence::comma) + seen.Of(Mark_Evidence::point_groups);
    const std::int64_t points = seen.Of(Mark_Evidence::point) + seen.Of(Mark_Evidence::comma_groups);
    const bool comma =
        dialect.separator != ',' || points == 0
            ? commas > points
                  || (points == 0 && dialect.separator != ',' && seen.Of(Mark_Evidence::comma_or_groups) > 0)
            : false;
    dialect.decimal = told.decimal != '\0' ? told.decimal : comma ? ',' : '.';
    // beside numbers that show which mark is the decimal one, the other can only part groups
    const std::int64_t comma_groups =
        seen.Of(Mark_Evidence::comma_groups) + (points > 0 ? seen.Of(Mark_Evidence::comma_or_groups) : 0);
    const std::int64_t point_groups =
        seen.Of(Mark_Evidence::point_groups) + (commas > 0 ? seen.Of(Mark_Evidence::point_or_groups) : 0);
    if (dialect.decimal == '.' && comma_groups > 0 && commas == 0)
        dialect.thousands = ',';
    if (dialect.decimal == ',' && point_groups > 0 && points == 0)
        dialect.thousands = '.';
}

namespace {

constexpr std::size_t Most_Names_Lines = 3;

/// What the columns below some lines hold.
class Names_Finder {
public:
    Names_Finder(const Sample_Rows& cut, std::span<const Sample_Row> table, const Text_Dialect& dialect)
        : cut_(cut), dialect_(dialect)
    {
        for (const Sample_Row& row : table)
            if (!row.empty && (dialect.comment == '\0' || *row.first != dialect.comment))
                rows_.push_back(&row);
        Find_Data_Columns();
    }

    [[nodiscard]] std::int32_t Lines() const;
    [[nodiscard]] bool Rows_Are_Named() const;

private:
    [[nodiscard]] std::span<const Sample_Field> Fields(std::size_t row) const
    {
        return cut_.Fields(*rows_[row]);
    }
    [[nodiscard]] Field_Sense Sense(const Sample_Field& field) const
    {
        return Sense_Of_Field(field.text, Marks_Of(dialect_));
    }
    [[nodiscard]] bool Is_Name_Over_Data(const Sample_Field& field, std::size_t place, bool first) const;
    void Find_Data_Columns();
    [[nodiscard]] bool Is_One_Line_Of_Names() const;
    [[nodiscard]] bool Names_Stand_Over_Data(std::size_t row) const;
    [[nodiscard]] bool Goes_On_Naming(std::size_t row) const;
    [[nodiscard]] bool Comes_Again() const;
    [[nodiscard]] bool Counts_Up() const;

    const Sample_Rows& cut_;
    const Text_Dialect& dialect_;
    Rows rows_;
    std::vector<bool> data_;     ///< columns of numbers, dates or times
    std::vector<bool> numbers_;  ///< columns of numbers alone
    std::vector<bool> moments_;  ///< columns of dates or times alone
    std::vector<bool> bare_;     ///< columns of data without quotes
    std::int64_t data_columns_ = 0;
};

namespace {

/// What the fields of a column hold, by count.
struct Column_Count {
    std::int64_t numbers = 0;
    std::int64_t moments = 0;
    std::int64_t texts = 0;
    std::int64_t quoted = 0;

    void Take(Field_Sense sense, bool in_quotes)
    {
        numbers += sense == Field_Sense::number ? 1 : 0;
        texts += sense == Field_Sense::text ? 1 : 0;
        moments += Is_Moment(sense) ? 1 : 0;
        quoted += in_quotes ? 1 : 0;
    }
    static bool Is_Moment(Field_Sense sense)
    {
        return sense == Field_Sense::date || sense == Field_Sense::time || sense == Field_Sense::date_time;
    }
};

}  // namespace

/// By the lines that can't be names, if there are such.
void Names_Finder::Find_Data_Columns()
{
    constexpr std::int64_t of_ten = 8;
    if (rows_.size() < 2)
        return;
    std::vector<Column_Count> columns;
    for (std::size_t i = std::min(Most_Names_Lines, rows_.size() - 1); i < rows_.size(); ++i) {
        const auto fields = Fields(i);
        columns.resize(std::max(columns.size(), fields.size()));
        for (std::size_t place = 0; place < fields.size(); ++place)
            columns[place].Take(Sense(fields[place]), fields[place].quoted);
    }
    for (const Column_Count& column : columns) {
        const std::int64_t data = column.numbers + column.moments;
        data_.push_back(data > 0 && data * 10 >= (data + column.texts) * of_ten);
        data_columns_ += data_.back() ? 1 : 0;
        numbers_.push_back(column.numbers > 0 && column.moments + column.texts == 0);
        moments_.push_back(column.moments > 0 && column.numbers + column.texts == 0);
        bare_.push_back(column.quoted == 0);
    }
}

/// A text, a date over numbers or a number over dates; in the first line also what stands in quotes over a
/// column without any.
bool Names_Finder::Is_Name_Over_Data(const Sample_Field& field, std::size_t place, bool first) const
{
    const Field_Sense sense = Sense(field);
    if (sense == Field_Sense::text || sense == Field_Sense::nothing
        || (first && field.quoted && bare_[place]))
        return true;
    return first && (Column_Count::Is_Moment(sense) ? numbers_[place] : moments_[place]);
}

/// No datum stands over data, and some name does.
bool Names_Finder::Names_Stand_Over_Data(std::size_t row) const
{
    bool name = false;
    std::size_t place = 0;
    for (const Sample_Field& field : Fields(row)) {
        const bool over_data = place < data_.size() && data_[place];
        const std::size_t column = place++;
        if (!over_data)
            continue;
        if (!Is_Name_Over_Data(field, column, row == 0))
            return false;
        name = name || Sense(field) != Field_Sense::nothing;
    }
    return name;
}

/// A text of the first line stands below in its column once more, as a name wouldn't.
bool Names_Finder::Comes_Again() const
{
    const auto first = Fields(0);
    for (std::size_t i = 1; i < rows_.size(); ++i) {
        const auto fields = Fields(i);
        for (std::size_t place = 0; place < std::min(first.size(), fields.size()); ++place)
            if (!first[place].text.empty() && first[place].text == fields[place].text)
                return true;
    }
    return false;
}

namespace {

/// Numbers in equal steps, or years that go up.
bool Go_Up(std::span<const double> numbers)
{
    constexpr double first_year = 1500;
    constexpr double last_year = 2200;
    const auto is_year = [](double a) { return a >= first_year && a <= last_year && a == std::floor(a); };
    if (numbers.size() < 2 || std::ranges::adjacent_find(numbers, std::greater_equal()) != numbers.end())
        return false;
    const auto uneven = [&](double a, double b) { return b - a != numbers[1] - numbers[0]; };
    return std::ranges::all_of(numbers, is_year)
           || std::ranges::adjacent_find(numbers, uneven) == numbers.end();
}

}  // namespace

/// Numbers in equal steps, or years, over data, and a word or an empty corner in front of them.
bool Names_Finder::Counts_Up() const
{
    std::vector<double> numbers;
    bool word = false;
    std::size_t place = 0;
    for (const Sample_Field& field : Fields(0)) {
        const bool over_data = place < data_.size() && data_[place];
        Field_Number number;
        if (Read_Number(field.text, {}, number) && over_data)
            numbers.push_back(number.value);
        else if (over_data)
            return false;
        else
            word = true;
        ++place;
    }
    return word && Go_Up(numbers);
}

bool Names_Finder::Is_One_Line_Of_Names() const
{
    const auto is_text = [this](const Sample_Field& field) { return Sense(field) == Field_Sense::text; };
    const auto may_name = [&](const Sample_Field& field) { return field.quoted || is_text(field); };
    if (rows_.size() == 1)
        return std::ranges::all_of(Fields(0), may_name) && std::ranges::any_of(Fields(0), is_text);
    if (data_columns_ > 0 && Names_Stand_Over_Data(0))
        return true;
    const auto senses = Fields(0);
    bool over_data = false;
    for (std::size_t i = 0; i < std::min(data_.size(), senses.size()); ++i)
        over_data = over_data || (data_[i] && !senses[i].text.empty());
    if (over_data)
        return Counts_Up();
    return std::ranges::any_of(senses, [](const Sample_Field& field) { return !field.text.empty(); })
           && !Comes_Again();
}

/// A further line of names: words, or units in brackets, over nearly all data.
bool Names_Finder::Goes_On_Naming(std::size_t row) const
{
    if (row + 1 >= rows_.size() || !Names_Stand_Over_Data(row))
        return false;
    std::int64_t words = 0;
    bool bracket = true;
    std::size_t place = 0;
    for (const Sample_Field& field : Fields(row)) {
        const bool over_data = place < data_.size() && data_[place];
        ++place;
        if (!over_data || Sense(field) != Field_Sense::text)
            continue;
        ++words;
        bracket = bracket && (field.text.front() == '(' || field.text.front() == '[');
    }
    return bracket || (words >= 2 && words * 2 >= data_columns_);
}

std::int32_t Names_Finder::Lines() const
{
    if (rows_.empty() || !Is_One_Line_Of_Names())
        return 0;
    std::int32_t lines = 1;
    while (lines < static_cast<std::int32_t>(Most_Names_Lines) && data_columns_ > 0
           && Goes_On_Naming(static_cast<std::size_t>(lines)))
        ++lines;
    return lines;
}

/// All rows have a field more than there are names, and the first of each is its own.
bool Names_Finder::Rows_Are_Named() const
{
    if (rows_.size() < 3)
        return false;
    const auto names = static_cast<std::size_t>(rows_[0]->count);
    std::vector<std::string_view> seen;
    bool last_says = false;
    for (std::size_t i = 1; i < rows_.size(); ++i) {
        const auto fields = Fields(i);
        if (fields.size() != names + 1)
            return false;
        seen.push_back(fields.front().text);
        last_says = last_says || !fields.back().text.empty();
    }
    std::ranges::sort(seen);
    return last_says && std::ranges::adjacent_find(seen) == seen.end();
}

}  // namespace

void Find_Names(const Sample_Rows& rows, std::span<const Sample_Row> table, const Told_Dialect& told,
                Text_Dialect& dialect)
{
    const Names_Finder finder(rows, table, dialect);
    dialect.names_lines = told.names_lines >= 0 ? told.names_lines : finder.Lines();
    dialect.rows_are_named = dialect.names_lines == 1 && finder.Rows_Are_Named();
}

}  // namespace ingester

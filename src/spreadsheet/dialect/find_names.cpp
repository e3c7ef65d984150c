#include "spreadsheet/dialect/dialect_steps.h"
#include "support/text.h"

#include <algorithm>
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
    if (dialect.decimal == '.' && seen.Of(Mark_Evidence::comma_groups) > 0 && commas == 0)
        dialect.thousands = ',';
    if (dialect.decimal == ',' && seen.Of(Mark_Evidence::point_groups) > 0 && points == 0)
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
    void Find_Data_Columns();
    [[nodiscard]] bool Is_One_Line_Of_Names() const;
    [[nodiscard]] bool Names_Stand_Over_Data(std::size_t row) const;
    [[nodiscard]] bool Goes_On_Naming(std::size_t row) const;
    [[nodiscard]] bool Comes_Again() const;
    [[nodiscard]] bool Counts_Up() const;

    const Sample_Rows& cut_;
    const Text_Dialect& dialect_;
    Rows rows_;
    std::vector<bool> data_;  ///< columns of numbers, dates or times
    std::int64_t data_columns_ = 0;
};

/// By the lines that can't be names, if there are such.
void Names_Finder::Find_Data_Columns()
{
    constexpr std::int64_t of_ten = 8;
    if (rows_.size() < 2)
        return;
    std::vector<std::int64_t> data;
    std::vector<std::int64_t> texts;
    for (std::size_t i = std::min(Most_Names_Lines, rows_.size() - 1); i < rows_.size(); ++i) {
        std::size_t place = 0;
        for (const Sample_Field& field : Fields(i)) {
            if (place == data.size()) {
                data.push_back(0);
                texts.push_back(0);
            }
            const Field_Sense sense = Sense(field);
            data[place] += sense != Field_Sense::nothing && sense != Field_Sense::text ? 1 : 0;
            texts[place] += sense == Field_Sense::text ? 1 : 0;
            ++place;
        }
    }
    for (std::size_t i = 0; i < data.size(); ++i) {
        data_.push_back(data[i] > 0 && data[i] * 10 >= (data[i] + texts[i]) * of_ten);
        data_columns_ += data_.back() ? 1 : 0;
    }
}

/// No datum stands over data, and some word does.
bool Names_Finder::Names_Stand_Over_Data(std::size_t row) const
{
    bool word = false;
    std::size_t place = 0;
    for (const Sample_Field& field : Fields(row)) {
        const bool over_data = place < data_.size() && data_[place];
        ++place;
        if (!over_data)
            continue;
        const Field_Sense sense = Sense(field);
        if (sense != Field_Sense::text && sense != Field_Sense::nothing)
            return false;
        word = word || sense == Field_Sense::text;
    }
    return word;
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

/// Numbers in equal steps, as years are, over data, and a word or an empty corner in front of them.
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
    if (!word || numbers.size() < 2 || numbers[1] <= numbers[0])
        return false;
    const auto uneven = [&](double a, double b) { return b - a != numbers[1] - numbers[0]; };
    return std::ranges::adjacent_find(numbers, uneven) == numbers.end();
}

bool Names_Finder::Is_One_Line_Of_Names() const
{
    const auto is_text = [this](const Sample_Field& field) { return Sense(field) == Field_Sense::text; };
    if (rows_.size() == 1)
        return std::ranges::all_of(Fields(0), is_text);
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

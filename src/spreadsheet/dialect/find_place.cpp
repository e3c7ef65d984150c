#include "spreadsheet/dialect/dialect_steps.h"
#include "support/text.h"

#include <algorithm>
#include <optional>
#include <vector>

namespace ingester {

namespace {

using Rows = std::span<const Sample_Row>;

/// Rows without an empty one between them.
struct Block {
    std::size_t first;
    std::size_t last;
    Usual_Count usual;

    [[nodiscard]] bool Is_Table() const { return usual.count > 1 && usual.all > 1; }
};

std::vector<Block> Blocks_Of(Rows rows)
{
    std::vector<Block> blocks;
    for (std::size_t i = 0; i < rows.size(); ++i) {
        if (rows[i].empty)
            continue;
        if (i > 0 && !rows[i - 1].empty && !blocks.empty())
            blocks.back().last = i + 1;
        else
            blocks.push_back({i, i + 1, {}});
    }
    for (Block& block : blocks)
        block.usual = Find_Usual_Count(rows.subspan(block.first, block.last - block.first));
    return blocks;
}

/// Rows go on behind empty lines where they have as many fields.
std::vector<Block> Joined(std::span<const Block> blocks, Rows rows)
{
    std::vector<Block> joined;
    for (const Block& block : blocks) {
        const bool goes_on =
            !joined.empty() && block.usual.count > 1
            && rows[joined.back().last - 1].count == block.usual.count
            && (joined.back().usual.count == 1 || joined.back().usual.count == block.usual.count);
        if (!goes_on) {
            joined.push_back(block);
            continue;
        }
        Block& before = joined.back();
        if (before.usual.count != block.usual.count)  // names behind lines of a title
            before.first = before.last - 1;
        before.last = block.last;
        before.usual = Find_Usual_Count(rows.subspan(before.first, before.last - before.first));
    }
    return joined;
}

/// A few pairs of a word and a value in front of a wider and longer table tell of it.
bool Describes(const Block& block, const Block& next, const Sample_Rows& rows)
{
    constexpr std::int64_t most_pairs = 12;
    const bool may_be = block.usual.count == 2 && block.usual.all <= most_pairs && next.usual.count > 2
                        && next.usual.all >= block.usual.all;
    const auto begins_with_word = [&](const Sample_Row& row) {
        return row.empty || Sense_Of_Field(rows.Fields(row)[0].text, {}) == Field_Sense::text;
    };
    const Rows all(rows.Rows());
    return may_be
           && std::ranges::all_of(all.subspan(block.first, block.last - block.first), begins_with_word);
}

/// The first block that is a table.
std::optional<Block> First_Table(const std::vector<Block>& blocks, const Sample_Rows& rows)
{
    for (std::size_t i = 0; i < blocks.size(); ++i) {
        if (!blocks[i].Is_Table())
            continue;
        const auto next = std::find_if(blocks.begin() + static_cast<std::ptrdiff_t>(i) + 1, blocks.end(),
                                       [](const Block& block) { return block.Is_Table(); });
        if (next == blocks.end() || !Describes(blocks[i], *next, rows))
            return blocks[i];
    }
    return std::nullopt;
}

/// Whether a line behind the sign has the fields of a row. At the head only where the sign alone is its first
/// field, or has a number behind it.
bool Is_Marked_Row(std::span<const Sample_Field> fields, bool at_head, const Text_Dialect& dialect)
{
    const std::string_view first = fields.front().text;
    if (static_cast<std::int32_t>(fields.size()) != dialect.columns)
        return false;
    if (first.size() == 1)
        return !dialect.runs;
    return !at_head || Sense_Of_Field(first.substr(1), {}) == Field_Sense::number;
}

/// Lines that begin with "#" or "%" are comments where the others don't, and where they don't have the
/// fields of a row. Among rows of one field there are none.
void Find_Comments(const Sample_Rows& rows, Text_Dialect& dialect)
{
    std::int64_t marked = 0;
    std::int64_t rowlike = 0;
    std::int64_t others = 0;
    char mark = '\0';
    for (const Sample_Row& row : rows.Rows()) {
        if (row.empty)
            continue;
        others += row.comment ? 0 : 1;
        const bool at_head = others == 0;
        if (!row.comment || (!at_head && dialect.columns == 1))
            continue;
        ++marked;
        mark = mark == '\0' ? *row.first : mark;
        rowlike += Is_Marked_Row(rows.Fields(row), at_head, dialect) ? 1 : 0;
    }
    const bool sign_is_name =
        dialect.columns > 1 || marked == 1;  // in one column it may also frame a comment
    dialect.comment = marked > 0 && others > 0 && (rowlike == 0 || !sign_is_name) ? mark : '\0';
    dialect.late_comments = marked == 0 && dialect.columns > 1 && !dialect.runs;
}

class Place_Finder {
public:
    Place_Finder(const Sample_Rows& rows, const Text_Dialect& dialect) : rows_(rows), dialect_(dialect) {}

    /// The first row of a block that belongs to the table: one with all fields, or one that lacks a field
    /// and goes with the next.
    [[nodiscard]] std::size_t First_Row(const Block& block, std::int32_t columns) const
    {
        for (std::size_t i = block.first; i < block.last; ++i) {
            const Sample_Row& row = Row(i);
            if (Is_Comment(row) || Is_Title(i, block.last, columns))
                continue;
            if (row.count == columns || Begins_Unevenly(i, block.last, columns))
                return i;
        }
        return block.first;
    }

    /// From where on the end of the sample is no row: lines of one field behind an empty line, comments, or
    /// words in the place of a number.
    [[nodiscard]] std::size_t Footer(std::size_t first, std::int32_t columns) const
    {
        const std::size_t all = rows_.Rows().size();
        const std::size_t start = std::max(first + 1, rows_.Tail_Start());
        std::size_t footer = all;
        for (std::size_t i = all; i-- > start;) {
            const Sample_Row& row = Row(i);
            if (row.empty || Is_Comment(row))
                continue;
            if (row.count > 1 || columns < 2 || May_Be_Row(row, columns))
                break;
            if (Row(i - 1).empty || Speaks(row, i))
                footer = i;
        }
        return footer;
    }

private:
    [[nodiscard]] const Sample_Row& Row(std::size_t i) const { return rows_.Rows()[i]; }
    [[nodiscard]] bool Is_Comment(const Sample_Row& row) const
    {
        return dialect_.comment != '\0' && *row.first == dialect_.comment;
    }
    [[nodiscard]] Field_Sense Sense(const Sample_Field& field) const
    {
        return Sense_Of_Field(field.text, {dialect_.separator == ';' ? ',' : '.', '\0'});
    }
    [[nodiscard]] bool Holds_Data(const Sample_Row& row) const
    {
        return std::ranges::any_of(rows_.Fields(row), [&](const Sample_Field& field) {
            const Field_Sense sense = Sense(field);
            return sense != Field_Sense::text && sense != Field_Sense::nothing;
        });
    }
    /// Prose that happens to have the commas of a row: names without blanks, and data, follow it.
    [[nodiscard]] bool Is_Title(std::size_t i, std::size_t last, std::int32_t columns) const
    {
        if (Row(i).count != columns || columns < 2 || !Is_Spaced(rows_.Fields(Row(i))))
            return false;
        std::size_t names = i + 1;
        while (names < last && Row(names).count != columns)
            ++names;
        if (names + 1 >= last || Row(names + 1).count != columns || (names == i + 1 && !Holds_Data(Row(i))))
            return false;
        return !Is_Spaced(rows_.Fields(Row(names))) && Are_Words(Row(names)) && Holds_Data(Row(names + 1));
    }
    [[nodiscard]] bool Are_Words(const Sample_Row& row) const
    {
        return std::ranges::all_of(
            rows_.Fields(row), [&](const Sample_Field& field) { return Sense(field) == Field_Sense::text; });
    }
    [[nodiscard]] bool Begins_Unevenly(std::size_t i, std::size_t last, std::int32_t columns) const
    {
        const Sample_Row& row = Row(i);
        if (row.count < 2 || row.count < columns - 1 || row.count > columns + 1)
            return false;
        const bool colon = rows_.Fields(row)[0].text.find(": ") != std::string_view::npos;
        return !colon && (i + 1 == last || Row(i + 1).count == columns)
               && (Holds_Data(row) || (i + 1 < last && Holds_Data(Row(i + 1))));
    }
    /// Whether another separator cuts a line of one field into a row.
    [[nodiscard]] bool May_Be_Row(const Sample_Row& row, std::int32_t columns) const
    {
        const std::string_view text = rows_.Fields(row)[0].text;
        return std::ranges::any_of(std::string_view(",;\t|"), [&](char separator) {
            return std::ranges::count(text, separator) >= columns - 1;
        });
    }
    /// Words where the row above has a number, a date or a short text.
    [[nodiscard]] bool Speaks(const Sample_Row& row, std::size_t i) const
    {
        const std::string_view text = rows_.Fields(row)[0].text;
        const Sample_Row& above = Row(i - 1);
        const bool words = text.find(' ') != std::string_view::npos && !rows_.Fields(row)[0].quoted;
        return words && above.count > 1 && Sense(rows_.Fields(row)[0]) == Field_Sense::text
               && Sense(rows_.Fields(above)[0]) != Field_Sense::text;
    }

    const Sample_Rows& rows_;
    const Text_Dialect& dialect_;
};

bool Is_All_Text(std::span<const Sample_Field> fields)
{
    return std::ranges::all_of(fields, [](const Sample_Field& field) {
        return Sense_Of_Field(field.text, {}) == Field_Sense::text;
    });
}

/// The comment in front of a row of data may name its columns; in front of texts only where its sign touches
/// a word as long as names are, and no names follow.
bool Names_In_Comment(const Sample_Rows& rows, std::size_t first, const Text_Dialect& dialect)
{
    if (first == 0 || dialect.comment == '\0' || dialect.columns < 2)
        return false;
    const std::span<const Sample_Row> all(rows.Rows());
    const Sample_Row& comment = all[first - 1];
    if (*comment.first != dialect.comment || comment.count < dialect.columns
        || comment.count > dialect.columns + (dialect.runs ? 1 : 0) || !Is_All_Text(rows.Fields(comment)))
        return false;
    if (!Is_All_Text(rows.Fields(all[first])))
        return true;
    const bool touches = rows.Fields(comment)[0].text.find(' ') == std::string_view::npos && !dialect.runs;
    return touches && std::ranges::all_of(all.subspan(first), [&](const Sample_Row& row) {
               return row.empty || Is_All_Text(rows.Fields(row));
           });
}

}  // namespace

Table_Place Find_Place(const Sample_Rows& rows, const Told_Dialect& told, Text_Dialect& dialect)
{
    const std::vector<Sample_Row>& all = rows.Rows();
    const Rows head = Rows(all).first(rows.Head_Rows());
    const std::vector<Block> blocks = Joined(Blocks_Of(head), head);
    Table_Place place{0, head.size(), all.size(), false};
    const std::optional<Block> table = First_Table(blocks, rows);
    dialect.columns = table ? table->usual.count : Find_Usual_Count(head).count;
    Find_Comments(rows, dialect);
    const Place_Finder finder(rows, dialect);
    if (blocks.empty())
        return place;
    if (told.lines_in_front_told)
        place.first = blocks.front().first;
    else
        place.first = table ? finder.First_Row(*table, dialect.columns)
                            : finder.First_Row({blocks.front().first, head.size(), {}}, dialect.columns);
    for (const Block& block : blocks)
        if (block.first > place.first && block.Is_Table() && block.usual.count != dialect.columns
            && place.last == head.size())
            place.last = block.first;
    place.footer = finder.Footer(place.first, dialect.columns);
    place.names_in_comment = Names_In_Comment(rows, place.first, dialect);
    return place;
}

}  // namespace ingester

#include "model/sort.h"

#include "model/level_tables.h"
#include "model/row_fields.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <numeric>

namespace ingester {

std::string_view Sort_Key::Text(std::size_t row) const
{
    const std::string_view text = Text_Arena::View(texts[row]);
    return First_Letters(trimmed ? Trim_Copy(text) : text, width);
}

namespace {

const char* Text_Or_Empty(const char* stored)
{
    return stored == nullptr ? Text_Arena::Empty() : stored;
}

/// Hands the first `rows` cells to `take`; returns how many there are.
template <class Take> void For_Cells(const Column& column, std::size_t rows, Take take)
{
    std::size_t row = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr && row < rows; cell = cell->next)
        take(row++, cell->value);
}

}  // namespace

Sort_Key Make_Sort_Key(const Column& column, std::size_t rows, Factor_Mode mode)
{
    Sort_Key key;
    const bool factor = column.type == factor_column;
    if (Is_Text_Like(column.type)) {
        key.texts.assign(rows, Text_Arena::Empty());
        key.width = column.type == long_text_column ? Long_Text_Width : Text_Cell_Width;
        For_Cells(column, rows,
                  [&](std::size_t row, Cell_Value value) { key.texts[row] = Text_Or_Empty(value.text); });
        return key;
    }
    if (factor && mode == Factor_Mode::label && column.labels != nullptr) {
        const std::vector<const char*> labels = Label_Table(column);
        key.texts.assign(rows, Text_Arena::Empty());
        For_Cells(column, rows, [&](std::size_t row, Cell_Value value) {
            key.texts[row] = Of_Level(labels, value.number, Text_Arena::Empty());
        });
        return key;
    }
    const double missing = column.sheet->missing_value;
    const bool by_value = factor && mode == Factor_Mode::level_value;
    const std::vector<double> values = by_value ? Level_Table(column) : std::vector<double>{};
    key.numbers.assign(rows, missing);
    For_Cells(column, rows, [&](std::size_t row, Cell_Value value) {
        const double number = Of_Level(values, value.number, value.number);
        key.numbers[row] = std::isnan(number) ? missing : number;
    });
    return key;
}

namespace {

/// A row, and a part of its key as a word that sorts as the key does.
struct Place {
    std::uint64_t image;
    std::uint32_t row;
};

bool Comes_First(const Place& a, const Place& b)
{
    return a.image != b.image ? a.image < b.image : a.row < b.row;
}

/// Stable, in time that grows as the number of rows does: by a byte at a time, from the last one. Bytes
/// that all rows share cost nothing.
void Sort_By_Bytes(std::span<Place> places, std::vector<Place>& room)
{
    constexpr std::size_t bytes = sizeof(std::uint64_t);
    std::array<std::array<std::uint32_t, 256>, bytes> counts{};
    for (const Place& place : places)
        for (std::size_t byte = 0; byte < bytes; ++byte)
            ++counts[byte][place.image >> 8 * byte & 0xFF];
    room.resize(places.size());
    Place* from = places.data();
    Place* to = room.data();
    for (std::size_t byte = 0; byte < bytes; ++byte) {
        auto& starts = counts[byte];
        if (starts[from->image >> 8 * byte & 0xFF] == places.size())
            continue;
        std::exclusive_scan(starts.begin(), starts.end(), starts.begin(), 0U);
        for (std::size_t i = 0; i < places.size(); ++i)
            to[starts[from[i].image >> 8 * byte & 0xFF]++] = from[i];
        std::swap(from, to);
    }
    if (from != places.data())
        std::copy_n(from, places.size(), places.data());
}

/// Sorts by parts of keys: rows that share all parts so far are a group, which the next part sorts.
class Row_Sorter {
public:
    Row_Sorter(std::span<const Sort_Key> keys, bool ascending, bool ignore_case,
               std::vector<std::uint8_t>* parted_by)
        : keys_(keys), ascending_(ascending), ignore_case_(ignore_case), parted_by_(parted_by)
    {}

    [[nodiscard]] std::vector<std::uint32_t> Sort(std::size_t rows)
    {
        places_.resize(rows);
        for (std::size_t row = 0; row < rows; ++row)
            places_[row].row = static_cast<std::uint32_t>(row);
        if (parted_by_ != nullptr)
            parted_by_->assign(rows, static_cast<std::uint8_t>(keys_.size()));
        waiting_.push_back({0, rows, 0, 0});
        while (!waiting_.empty()) {
            const Group group = waiting_.back();
            waiting_.pop_back();
            Sort_Group(group);
        }
        std::vector<std::uint32_t> order(rows);
        std::transform(places_.begin(), places_.end(), order.begin(),
                       [](const Place& place) { return place.row; });
        return order;
    }

private:
    struct Group {
        std::size_t begin, end;
        std::size_t key;
        std::size_t offset;  ///< into the texts of the key, whose starts are all the same
    };

    void Sort_Group(const Group& group)
    {
        constexpr std::size_t few = 2000;
        const std::span<Place> places(places_.data() + group.begin, group.end - group.begin);
        bool texts_go_on = false;
        for (std::size_t i = 0; i < places.size(); ++i) {
            if (i + 2 * Sort_Key::ahead < places.size())
                keys_[group.key].Prefetch(places[i + Sort_Key::ahead].row,
                                          places[i + 2 * Sort_Key::ahead].row);
            Place& place = places[i];
            place.image = Image_Of(group, place.row, texts_go_on) ^ (ascending_ ? 0 : ~std::uint64_t{0});
        }
        if (places.size() < few)
            std::sort(places.begin(), places.end(), Comes_First);
        else
            Sort_By_Bytes(places, room_);
        if (parted_by_ != nullptr)
            Note_Parts(group);
        Group next = group;
        if (texts_go_on) {
            next.offset += sizeof(std::uint64_t);
        } else {
            ++next.key;
            next.offset = 0;
        }
        if (next.key < keys_.size())
            Add_Groups(next);
    }

    void Note_Parts(const Group& group)
    {
        for (std::size_t i = group.begin + 1; i < group.end; ++i)
            if (places_[i].image != places_[i - 1].image)
                (*parted_by_)[i] = static_cast<std::uint8_t>(group.key);
    }

    /// The runs of equal images in a group that was sorted have to wait for the next part.
    void Add_Groups(const Group& group)
    {
        for (std::size_t begin = group.begin; begin < group.end;) {
            std::size_t end = begin + 1;
            while (end < group.end && places_[end].image == places_[begin].image)
                ++end;
            if (end > begin + 1)
                waiting_.push_back({begin, end, group.key, group.offset});
            begin = end;
        }
    }

    [[nodiscard]] std::uint64_t Image_Of(const Group& group, std::size_t row, bool& texts_go_on) const
    {
        const Sort_Key& key = keys_[group.key];
        if (key.texts.empty())
            return Number_Image(key.numbers[row]);
        const std::string_view text = key.Text(row);
        texts_go_on = texts_go_on || text.size() > group.offset + sizeof(std::uint64_t);
        return Text_Image(text.substr(std::min(group.offset, text.size())));
    }

    [[nodiscard]] static std::uint64_t Number_Image(double number)
    {
        constexpr std::uint64_t sign = std::uint64_t{1} << 63;
        const auto bits = std::bit_cast<std::uint64_t>(number + 0.0);  // both zeros are one
        return (bits & sign) != 0 ? ~bits : bits | sign;
    }

    [[nodiscard]] std::uint64_t Text_Image(std::string_view text) const
    {
        std::uint64_t image = 0;
        for (std::size_t i = 0; i < sizeof image; ++i) {
            const char c = i < text.size() ? text[i] : '\0';
            image = image << 8 | static_cast<unsigned char>(ignore_case_ ? To_Lower(c) : c);
        }
        return image;
    }

    std::span<const Sort_Key> keys_;
    bool ascending_;
    bool ignore_case_;
    std::vector<std::uint8_t>* parted_by_;
    std::vector<Place> places_;
    std::vector<Place> room_;
    std::vector<Group> waiting_;
};

bool Folds_Beyond_Ascii(const Sort_Key& key)
{
    const auto ascii = [](const char* text) { return Is_Ascii(Text_Arena::View(text)); };
    return Letters_Are_Utf8() && !std::ranges::all_of(key.texts, ascii);
}

/// A key whose texts, kept in `texts`, are compared byte by byte.
Sort_Key Folded_Key(const Sort_Key& key, Text_Arena& texts)
{
    Sort_Key folded{key.numbers, {}, Text_Arena::greatest_length};
    for (std::size_t row = 0; row < key.texts.size(); ++row)
        folded.texts.push_back(texts.Store(Folded(key.Text(row))));
    return folded;
}

}  // namespace

std::vector<std::uint32_t> Sorted_Rows(std::span<const Sort_Key> keys, bool ascending, bool ignore_case,
                                       std::vector<std::uint8_t>* parted_by)
{
    const std::size_t rows = keys.empty() ? 0 : keys.front().Rows();
    if (ignore_case && std::ranges::any_of(keys, Folds_Beyond_Ascii)) {
        Text_Arena texts;
        std::vector<Sort_Key> folded;
        for (const Sort_Key& key : keys)
            folded.push_back(Folded_Key(key, texts));
        return Row_Sorter(folded, ascending, false, parted_by).Sort(rows);
    }
    return Row_Sorter(keys, ascending, ignore_case, parted_by).Sort(rows);
}

std::int32_t Movable_Rows(const Sheet& sheet)
{
    const bool margin_row = sheet.type == table_sheet && sheet.table_ways <= 2 && sheet.has_margins != 0;
    return margin_row ? sheet.row_count - 1 : sheet.row_count;
}

namespace {

bool Make_Sort_Keys(const Sort_Request& wanted, std::size_t rows, std::vector<Sort_Key>& keys)
{
    for (const std::int32_t index : wanted.key_index) {
        const Column* const column = Column_At(wanted.sheet, index);
        if (column == nullptr || (column->type == row_column && !Need_Rows(wanted.sheet)))
            return false;
        keys.push_back(Make_Sort_Key(*column, rows, wanted.factor_mode));
        keys.back().trimmed = wanted.trim_keys;
    }
    return true;
}

/// Gives the nodes of a list the values in their new order. Nodes beyond it stay as they are.
template <class Node, class Value> void Reorder(Node* first, Value Node::*member,
                                                const std::vector<std::uint32_t>& order, Value blank,
                                                std::vector<Value>& room)
{
    room.assign(order.size(), blank);
    std::size_t row = 0;
    for (const Node* node = first; node != nullptr && row < order.size(); node = node->next)
        room[row++] = node->*member;
    const std::uint32_t* from = order.data();
    for (Node* node = first; node != nullptr && from != order.data() + order.size(); node = node->next)
        node->*member = room[*from++];
}

/// What is kept by row numbers goes with the rows.
void Move_Fields(Sheet& sheet, const std::vector<std::uint32_t>& order)
{
    std::vector<std::int32_t> new_rows(static_cast<std::size_t>(sheet.row_count));
    std::iota(new_rows.begin(), new_rows.end(), 0);
    for (std::size_t place = 0; place < order.size(); ++place)
        new_rows[order[place]] = static_cast<std::int32_t>(place);
    Move_Row_Fields(sheet, new_rows);
}

/// Row numbers run 1, 2, ... whatever stands beside them, so that column stays.
void Apply_Order(Sheet& sheet, const std::vector<std::uint32_t>& order)
{
    std::vector<std::int32_t> flags;
    if (!sheet.rows_due)
        Reorder(sheet.first_row, &Row_Node::restricted, order, 0, flags);
    std::vector<Cell_Value> values;
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        Cell_Value blank;
        if (Is_Text_Like(column->type))
            blank.text = Text_Arena::Empty();
        else
            blank.number = sheet.missing_value;
        Reorder(column->first_cell, &Cell_Node::value, order, blank, values);
    }
}

}  // namespace

bool Sort_Sheet(const Sort_Request& wanted)
{
    if (wanted.sheet == nullptr)
        return false;
    Sheet& sheet = *wanted.sheet;
    if (wanted.key_index.empty() || sheet.type == scalar_sheet)
        return true;
    if (sheet.type == symmetric_matrix_sheet || sheet.row_count < 1 || !Fill_Short_Columns(&sheet))
        return false;
    std::vector<Sort_Key> keys;
    if (!Make_Sort_Keys(wanted, static_cast<std::size_t>(Movable_Rows(sheet)), keys))
        return false;
    const std::vector<std::uint32_t> order = Sorted_Rows(keys, wanted.ascending, wanted.ignore_case);
    Apply_Order(sheet, order);
    if (Has_Row_Fields(sheet))
        Move_Fields(sheet, order);
    return true;
}

}  // namespace ingester

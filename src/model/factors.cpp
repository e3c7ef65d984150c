#include "model/factors.h"

#include "model/column_printer.h"
#include "model/factor_order.h"
#include "model/level_tables.h"
#include "model/number_format.h"
#include "request/losses.h"
#include "request/messages.h"
#include "support/distinct_keys.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstdint>
#include <numeric>
#include <string_view>
#include <utility>
#include <vector>

namespace ingester {

namespace {

/// Cell width of a Factor with labels, with the byte behind a label of usual length.
constexpr std::int32_t Label_Cell_Width = 91;

/// The distinct keys of a column, and which of them each cell holds: its number from 1, or 0 for a
/// missing cell.
template <class Key> struct Gathering {
    std::vector<Key> keys;
    std::vector<std::uint32_t> numbers;
};

std::size_t Cells_Of(const Column& column)
{
    return static_cast<std::size_t>(std::max(column.length, 0));
}

/// Numbers the keys of a column's rows, a batch at a time.
template <class Key, class Rules> class Key_Numberer {
    using Distinct = Distinct_Keys<Key, Rules>;

public:
    explicit Key_Numberer(const Column& column) { gathered_.numbers.resize(Cells_Of(column)); }

    void Take(std::size_t row, const Key& key)
    {
        keys_[waiting_] = key;
        rows_[waiting_] = row;
        if (++waiting_ == keys_.size())
            Number_Waiting();
    }

    void Put(std::size_t row, std::uint32_t number) { gathered_.numbers[row] = number; }

    /// 0 for a row without a key, or whose key waits.
    [[nodiscard]] std::uint32_t Number_Of_Row(std::size_t row) const { return gathered_.numbers[row]; }

    /// Distinct keys so far, those that wait not counted.
    [[nodiscard]] std::size_t Count() const { return distinct_.Keys().size(); }

    [[nodiscard]] Gathering<Key> Finish()
    {
        Number_Waiting();
        gathered_.keys = distinct_.Take_Keys();
        return std::move(gathered_);
    }

private:
    void Number_Waiting()
    {
        std::array<std::uint32_t, Distinct::batch> numbers;
        distinct_.Number_Keys_Of(keys_.data(), waiting_, numbers.data());
        for (std::size_t i = 0; i < waiting_; ++i)
            gathered_.numbers[rows_[i]] = numbers[i];
        waiting_ = 0;
    }

    Distinct distinct_;
    Gathering<Key> gathered_;
    std::array<Key, Distinct::batch> keys_;
    std::array<std::size_t, Distinct::batch> rows_;
    std::size_t waiting_ = 0;
};

/// The level number of each key number, when level i + 1 is key `order[i]`.
std::vector<double> Levels_Of_Numbers(const std::vector<std::uint32_t>& order, double missing)
{
    std::vector<double> levels(order.size() + 1, missing);
    for (std::size_t i = 0; i < order.size(); ++i)
        levels[order[i] + 1] = static_cast<double>(i + 1);
    return levels;
}

std::vector<std::uint32_t> Order_Of_Appearance(std::size_t count)
{
    std::vector<std::uint32_t> order(count);
    std::iota(order.begin(), order.end(), 0U);
    return order;
}

/// From here on nothing can fail: the cells get their levels in place, since nodes of numbers and of
/// texts have one size.
void Put_Level_Numbers(Column& column, const std::vector<std::uint32_t>& numbers,
                       const std::vector<double>& levels)
{
    const std::uint32_t* number = numbers.data();
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = levels[*number++];
    column.cursor_node = nullptr;
    column.cursor_index = -1;
}

std::int32_t Levels_Without_Data(std::int32_t wanted_levels)
{
    return std::max(wanted_levels, 1);
}

// --- Variate to Factor ---------------------------------------------------------------------------

void Finish_Variate_Factor(Column& column, std::int32_t nlevels)
{
    Set_Column_Type(column, factor_column);
    Free_Cell_Nodes(&column, label_nodes);
    column.label_width = 0;
    column.nlevels = nlevels;
    column.factor_kind = Factor_Kind_Of(column);
    if (column.format != date_format_mark)
        column.format = significant_digits_format;
}

/// The level that a number stands for, or `missing`.
double Level_Of_Number(double value, double missing)
{
    constexpr double greatest_level = 65535;
    if (!(value > missing) || value > greatest_level)
        return missing;
    return std::max(std::floor(value + 0.5), 1.0);
}

bool Take_Numbers_As_Levels(Column& column)
{
    const double missing = column.sheet->missing_value;
    double greatest = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        greatest = std::max(greatest, Level_Of_Number(cell->value.number, missing));
    if (greatest < 1)
        return Fail(
            "Spreadsheet Error: Cannot convert variate %s to factor\nNo factor levels - all units missing.\n",
            column.name.c_str());
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = Level_Of_Number(cell->value.number, missing);
    column.cursor_node = nullptr;
    column.cursor_index = -1;
    Free_Cell_Nodes(&column, level_value_nodes);
    Finish_Variate_Factor(column, static_cast<std::int32_t>(greatest));
    return true;
}

/// Which of two faults too many values are: with this many distinct ones in the first half of a column
/// whose levels are sorted, it counts as one of many values throughout.
constexpr std::uint32_t Many_Values = 37;

bool Fail_Of_Many_Values(const Column& column, std::size_t limit, const std::vector<std::uint32_t>& numbers)
{
    const auto half = numbers.begin() + static_cast<std::ptrdiff_t>(numbers.size() / 2);
    const bool many = column.sheet->settings.auto_factors != 0 && limit >= Many_Values
                      && std::find(numbers.begin(), half, Many_Values) != half;
    return Fail(many ? "Cannot convert this Variate to a Factor: too many distinct values.\n"
                     : "Cannot convert this variate to a factor: too many distinct values.\n");
}

bool Gather_Values(const Column& column, std::size_t limit, Gathering<double>& gathered)
{
    Key_Numberer<double, Number_Keys> numberer(column);
    std::size_t row = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next, ++row) {
        if (Is_Present(*column.sheet, cell->value.number))
            numberer.Take(row, cell->value.number);
        if (numberer.Count() > limit)
            break;
    }
    gathered = numberer.Finish();
    return gathered.keys.size() <= limit || Fail_Of_Many_Values(column, limit, gathered.numbers);
}

void Sort_Values(const std::vector<double>& keys, std::vector<std::uint32_t>& order)
{
    std::vector<std::pair<double, std::uint32_t>> places;  // a comparison finds its values at hand
    places.reserve(order.size());
    for (const std::uint32_t key : order)
        places.emplace_back(keys[key], key);
    std::sort(places.begin(), places.end());
    std::transform(places.begin(), places.end(), order.begin(),
                   [](const auto& place) { return place.second; });
}

/// Levels 1, 2, ..., n say nothing that the cells don't.
bool Are_Positions(const std::vector<double>& keys, const std::vector<std::uint32_t>& order)
{
    for (std::size_t i = 0; i < order.size(); ++i)
        if (keys[order[i]] != static_cast<double>(i + 1))
            return false;
    return true;
}

bool Keep_Level_Values(Column& column, const std::vector<double>& keys,
                       const std::vector<std::uint32_t>& order)
{
    const std::size_t count = Are_Positions(keys, order) ? 0 : order.size();
    return Put_Level_Values(column, static_cast<std::int32_t>(count),
                            [&, key = order.begin()]() mutable { return keys[*key++]; });
}

}  // namespace

bool Variate_To_Factor(Column* column, bool make_levels, std::int32_t wanted_levels, std::size_t table_bytes)
{
    if (column == nullptr || (column->type != variate_column && column->type != units_variate_column))
        return false;
    if (!make_levels)
        return Take_Numbers_As_Levels(*column);
    Gathering<double> gathered;
    if (!Gather_Values(*column, table_bytes / sizeof(double), gathered))
        return false;
    const std::vector<double>& keys = gathered.keys;
    std::vector<std::uint32_t> order = Order_Of_Appearance(keys.size());
    if (column->sheet->settings.auto_factors != 0)
        Sort_Values(keys, order);
    const std::vector<double> levels = Levels_Of_Numbers(order, column->sheet->missing_value);
    if (!Keep_Level_Values(*column, keys, order))
        return false;
    Put_Level_Numbers(*column, gathered.numbers, levels);
    Finish_Variate_Factor(*column, order.empty() ? Levels_Without_Data(wanted_levels)
                                                 : static_cast<std::int32_t>(order.size()));
    return true;
}

namespace {

// --- Text to Factor ------------------------------------------------------------------------------

/// A text met of late, by where it is stored: cells with equal texts often share one.
struct Recent_Text {
    const char* stored = nullptr;
    std::uint32_t number = 0;  ///< 0 until it is known
    std::size_t row = 0;       ///< the first that held it
};

class Recent_Texts {
public:
    /// The entry of `stored`, which is a cell of `row`.
    [[nodiscard]] Recent_Text& Of(const char* stored, std::size_t row)
    {
        Recent_Text& entry = entries_[std::bit_cast<std::uintptr_t>(stored) * 0x9E3779B97F4A7C15U >> 55];
        if (entry.stored != stored)
            entry = {stored, 0, row};
        return entry;
    }

private:
    std::array<Recent_Text, 512> entries_{};
};

template <class Rules>
bool Gather_Texts(const Column& column, bool trim, std::size_t limit, Gathering<std::string_view>& gathered)
{
    Key_Numberer<std::string_view, Rules> numberer(column);
    Recent_Texts recent;
    std::size_t row = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next, ++row) {
        if (cell->value.text == nullptr)
            continue;
        Recent_Text& met = recent.Of(cell->value.text, row);
        if (met.number == 0)
            met.number = numberer.Number_Of_Row(met.row);
        if (met.number != 0) {
            numberer.Put(row, met.number);
            continue;
        }
        const std::string_view whole = cell->Text();
        const std::string_view label = trim ? Trim_Copy(whole) : whole;
        const std::string_view text = First_Letters(label, Long_Label_Width);
        if (text.size() < label.size()) [[unlikely]]
            Note_Loss(Loss_Kind::text_cut, column.name, 0, label);
        if (!text.empty())
            numberer.Take(row, text);
        if (numberer.Count() > limit)
            break;
    }
    gathered = numberer.Finish();
    return gathered.keys.size() <= limit
           || Fail("Cannot convert this text to a factor: too many distinct labels.\n");
}

/// A label's place in the order of appearance, with the first characters by which labels differ, where
/// a comparison sees them without a walk to the text.
struct Label_Place {
    std::uint64_t start;
    std::uint32_t key;
};

std::uint64_t Start_Of(std::string_view text, bool by_case_free)
{
    if (by_case_free)
        return Folded_Start(text);
    std::uint64_t start = 0;
    for (std::size_t i = 0; i < sizeof start; ++i)
        start = start << 8 | static_cast<unsigned char>(i < text.size() ? text[i] : '\0');
    return start;
}

/// Bytes that all labels begin with, no letter taken apart.
std::size_t Shared_Start(const std::vector<std::string_view>& keys)
{
    std::size_t shared = keys.empty() ? 0 : keys.front().size();
    for (const std::string_view key : keys)
        shared = std::min(shared, Common_Letters(key, keys.front()));
    return shared;
}

void Sort_Labels(const std::vector<std::string_view>& keys, bool by_case_free,
                 std::vector<std::uint32_t>& order)
{
    const std::size_t shared = Shared_Start(keys);
    std::vector<Label_Place> places;
    places.reserve(order.size());
    for (const std::uint32_t key : order)
        places.push_back({Start_Of(keys[key].substr(shared), by_case_free), key});
    std::sort(places.begin(), places.end(), [&](const Label_Place& a, const Label_Place& b) {
        if (a.start != b.start)
            return a.start < b.start;
        return by_case_free ? Less_Folded(keys[a.key], keys[b.key]) : keys[a.key] < keys[b.key];
    });
    std::transform(places.begin(), places.end(), order.begin(),
                   [](const Label_Place& place) { return place.key; });
}

/// Makes the list of labels; their texts go to `texts`.
bool Keep_Labels(Column& column, const std::vector<std::string_view>& keys,
                 const std::vector<std::uint32_t>& order, Text_Arena& texts)
{
    std::vector<const char*> stored;
    stored.reserve(order.size());
    for (const std::uint32_t key : order)
        stored.push_back(texts.Store(keys[key]));
    column.label_width = 0;
    return Put_Labels(column, stored);
}

void Finish_Text_Factor(Column& column, std::int32_t wanted_levels)
{
    const bool labelled = column.label_count > 0;
    Set_Column_Type(column, factor_column);
    Free_Cell_Nodes(&column, level_value_nodes);
    column.nlevels = labelled ? column.label_count : Levels_Without_Data(wanted_levels);
    column.factor_kind = labelled ? factor_with_labels : plain_factor;
    column.format = labelled ? general_format : significant_digits_format;
    column.decimals = -1;
    column.text_cell_width = Label_Cell_Width;
}

}  // namespace

bool Text_To_Factor(Column* column, bool by_case_free, bool trim, std::int32_t wanted_levels,
                    std::size_t table_bytes)
{
    if (column == nullptr || !Is_Text_Like(column->type))
        return false;
    const std::size_t limit = table_bytes / sizeof(const char*);
    Gathering<std::string_view> gathered;
    if (by_case_free ? !Gather_Texts<Case_Free_Keys>(*column, trim, limit, gathered)
                     : !Gather_Texts<Exact_Keys>(*column, trim, limit, gathered))
        return false;
    const bool sorted = column->sheet->settings.auto_factors != 0;
    std::vector<std::uint32_t> order = Order_Of_Appearance(gathered.keys.size());
    if (sorted)
        Sort_Labels(gathered.keys, by_case_free, order);
    const std::vector<double> levels = Levels_Of_Numbers(order, column->sheet->missing_value);
    Text_Arena texts;
    if (!Keep_Labels(*column, gathered.keys, order, texts))
        return false;
    Put_Level_Numbers(*column, gathered.numbers, levels);
    column->texts = std::move(texts);
    Finish_Text_Factor(*column, wanted_levels);
    if (sorted)
        Order_Labels_Naturally(*column);
    return true;
}

namespace {

// --- Factors back --------------------------------------------------------------------------------

void Drop_Levels(Column& column)
{
    Free_Cell_Nodes(&column, label_nodes);
    Free_Cell_Nodes(&column, level_value_nodes);
    column.label_width = 0;
    column.factor_kind = plain_factor;
}

}  // namespace

bool Factor_To_Variate(Column* column, bool use_levels)
{
    if (column == nullptr || column->type != factor_column)
        return false;
    const std::vector<double> values = use_levels ? Level_Table(*column) : std::vector<double>{};
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next) {
        double& value = cell->value.number;
        value =
            Cell_Is_Present(*column, *cell) ? Of_Level(values, value, value) : column->sheet->missing_value;
    }
    Drop_Levels(*column);
    column->texts = Text_Arena{};
    column->nlevels = 0;
    if (column->format == general_format)
        column->format = significant_digits_format;
    Set_Column_Type(*column, variate_column);
    return true;
}

namespace {

/// Gives each cell the stored text that `text_of` gives for it. The texts are all there before the
/// first cell changes.
template <class Text_Of> bool Turn_Into_Text(Column& column, bool text_only, Text_Of text_of)
{
    std::vector<const char*> texts;
    texts.reserve(Cells_Of(column));
    constexpr auto text_width = static_cast<std::int32_t>(Text_Cell_Width);
    std::int32_t widest = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        texts.push_back(Cell_Is_Present(column, *cell) ? text_of(cell->value.number) : Text_Arena::Empty());
        widest = Wider(widest, Text_Arena::View(texts.back()));
    }
    if (text_only && widest > text_width)
        return false;
    const char* const* text = texts.data();
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        cell->value.text = *text++;
    Drop_Levels(column);
    column.nlevels = widest;
    column.format = general_format;
    column.text_cell_width = Text_Cell_Width;
    Set_Column_Type(column, widest > text_width ? long_text_column : text_column);
    return true;
}

}  // namespace

bool Factor_To_Text(Column* column, bool text_only)
{
    constexpr int level_digits = 15;
    if (column == nullptr || column->type != factor_column)
        return false;
    const std::vector<const char*> stored =
        Printed_Levels(*column, Number_Print::as_said, level_digits, column->texts);
    return Turn_Into_Text(*column, text_only, [&](double level) {
        if (const char* const text = Of_Level<const char*>(stored, level, nullptr); text != nullptr)
            return text;
        char number[Number_Text_Room];
        return column->texts.Store({number, Print_General(number, level, level_digits)});
    });
}

bool Variate_To_Text(Column* column)
{
    if (column == nullptr || (column->type != variate_column && column->type != units_variate_column))
        return false;
    return Turn_Into_Text(*column, false, [&](double value) {
        char text[Number_Text_Room];
        return column->texts.Store({text, Format_Cell_Fully(text, *column, value)});
    });
}

}  // namespace ingester

#include "model/factor_order.h"

#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

/// Labels of a Factor that is tried for natural orders, and names of the longest.
constexpr std::size_t Most_Ordered_Labels = 16;

using Name_List = std::array<std::string_view, Most_Ordered_Labels>;  // ended by empty names

/// As data spells them: "NEE" and its like are meant so.
constexpr Name_List Compass_Names = {"N", "NNE", "NE", "NEE", "E", "SEE", "SE", "SSE",
                                     "S", "SSW", "SW", "SWW", "W", "NWW", "NW", "NNW"};
constexpr Name_List Season_Names = {"Winter", "Spring", "Summer", "Autumn"};

/// The names of a settings table, which has a mark at each end.
template <class Table> Name_List Names_Between_Marks(const Table& table)
{
    Name_List names;
    std::copy(table.begin() + 1, table.end() - 1, names.begin());
    return names;
}

struct Order_Entry {
    std::int32_t code;
    std::size_t compared;  ///< characters by which a label is told
    Name_List (*names)(const Settings&);
};

/// In the order in which they are tried.
constexpr Order_Entry Natural_Orders[] = {
    {compass_order, 5, [](const Settings&) { return Compass_Names; }},
    {day_order, 3, [](const Settings& s) { return Names_Between_Marks(s.day_names); }},
    {month_order, 4, [](const Settings& s) { return Names_Between_Marks(s.month_names); }},
    {short_month_order, 3, [](const Settings& s) { return Names_Between_Marks(s.month_abbreviations); }},
    {season_order, 3, [](const Settings&) { return Season_Names; }},
};

/// Each label's place in the list; empty when some label has none.
std::vector<std::size_t> Natural_Places(const Column* column, std::int32_t order_code)
{
    std::vector<std::size_t> places;
    if (column == nullptr || column->type != factor_column)
        return places;
    const auto* const order =
        std::find_if(std::begin(Natural_Orders), std::end(Natural_Orders),
                     [&](const Order_Entry& entry) { return entry.code == order_code; });
    if (order == std::end(Natural_Orders))
        return places;
    const Name_List names = order->names(column->sheet->settings);
    for (const Level_Node* label = column->labels; label != nullptr; label = label->next) {
        const std::string_view start = First_Letters(label->Text(), order->compared);
        const auto* const name = std::find_if(names.begin(), names.end(), [&](std::string_view entry) {
            return !entry.empty() && Equal_Folded(start, First_Letters(entry, order->compared));
        });
        if (name == names.end())
            return {};
        places.push_back(static_cast<std::size_t>(name - names.begin()));
    }
    return places;
}

}  // namespace

bool Has_Natural_Order(const Column* column, std::int32_t order_code)
{
    return !Natural_Places(column, order_code).empty();
}

bool Apply_Natural_Order(Column* column, std::int32_t order_code)
{
    const std::vector<std::size_t> places = Natural_Places(column, order_code);
    std::vector<std::int32_t> new_positions;
    for (std::size_t i = 1; i <= places.size(); ++i)
        new_positions.push_back(static_cast<std::int32_t>(i));
    std::stable_sort(new_positions.begin(), new_positions.end(), [&](std::int32_t a, std::int32_t b) {
        return places[static_cast<std::size_t>(a) - 1] < places[static_cast<std::size_t>(b) - 1];
    });
    return Reorder_Factor_Levels(column, new_positions);
}

void Order_Labels_Naturally(Column& column)
{
    if (column.label_count > static_cast<std::int32_t>(Most_Ordered_Labels))
        return;
    for (const Order_Entry& order : Natural_Orders)
        if (Has_Natural_Order(&column, order.code)) {
            Apply_Natural_Order(&column, order.code);
            return;
        }
}

namespace {

/// A list of level values or labels that has any has one for each level.
bool Has_All_Or_None(std::int32_t count, std::int32_t nlevels)
{
    return count <= 0 || count >= nlevels;
}

/// The values of a list in their new order; none of an empty list.
std::vector<Cell_Value> Reordered(const Level_Node* first, std::span<const std::int32_t> new_positions)
{
    std::vector<Cell_Value> values;
    for (const Level_Node* node = first; node != nullptr; node = node->next)
        values.push_back(node->value);
    std::vector<Cell_Value> reordered;
    if (!values.empty())
        for (const std::int32_t old : new_positions)
            reordered.push_back(values[static_cast<std::size_t>(old) - 1]);
    return reordered;
}

void Put_Values(Level_Node* node, const std::vector<Cell_Value>& values)
{
    for (const Cell_Value value : values) {
        node->value = value;
        node = node->next;
    }
}

}  // namespace

bool Reorder_Factor_Levels(Column* column, std::span<const std::int32_t> new_positions)
{
    if (column == nullptr || column->type != factor_column || column->nlevels < 2
        || column->sheet->read_only != 0 || column->protected_column != 0)
        return false;
    const std::int32_t nlevels = column->nlevels;
    if (new_positions.size() != static_cast<std::size_t>(nlevels)
        || !Has_All_Or_None(column->level_values_count, nlevels)
        || !Has_All_Or_None(column->label_count, nlevels))
        return false;
    std::vector<double> new_level(new_positions.size());  // by the old one
    double level = 0;
    for (const std::int32_t old : new_positions) {
        if (old < 1 || old > nlevels || new_level[static_cast<std::size_t>(old) - 1] != 0)
            return false;
        new_level[static_cast<std::size_t>(old) - 1] = ++level;
    }
    const std::vector<Cell_Value> level_values = Reordered(column->level_values, new_positions);
    const std::vector<Cell_Value> labels = Reordered(column->labels, new_positions);
    Put_Values(column->level_values, level_values);
    Put_Values(column->labels, labels);
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
        if (cell->value.number >= 1 && cell->value.number <= nlevels)
            cell->value.number = new_level[static_cast<std::size_t>(cell->value.number) - 1];
    return true;
}

}  // namespace ingester

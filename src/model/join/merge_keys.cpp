#include "model/join/merge_keys.h"

#include "model/calendar.h"
#include "model/factor_lists.h"
#include "model/factors.h"
#include "model/level_tables.h"
#include "request/messages.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <string_view>

namespace ingester {

namespace {

/// Below 0, 0 or above 0, as the first text stands to the second.
int Compare_Texts(std::string_view a, std::string_view b, bool ignore_case)
{
    return ignore_case ? Compare_Folded(a, b) : a.compare(b);
}

int Compare_Numbers(double a, double b, double tolerance)
{
    if (a == b || std::fabs(a - b) <= tolerance)
        return 0;
    return a < b ? -1 : 1;
}

}  // namespace

Key_Order Compare_Key_Rows(std::span<const Sort_Key> a, std::span<const Sort_Key> b, std::size_t row_a,
                           std::size_t row_b, double tolerance, bool ignore_case, std::size_t& key)
{
    for (; key < a.size(); ++key) {
        if (row_a >= a[key].Rows())
            return Key_Order::first_ended;
        if (row_b >= b[key].Rows())
            return Key_Order::second_ended;
        const int order = a[key].texts.empty()
                              ? Compare_Numbers(a[key].numbers[row_a], b[key].numbers[row_b], tolerance)
                              : Compare_Texts(a[key].Text(row_a), b[key].Text(row_b), ignore_case);
        if (order != 0)
            return order < 0 ? Key_Order::below : Key_Order::above;
    }
    return Key_Order::equal;
}

namespace {

/// What is known of the pairs so far: some mixtures sort in ways that don't go together.
struct Mixtures {
    bool factor_pair = false;
    bool labels_unordered = false;
    bool levels_unordered = false;
    const Column* mixed_target = nullptr;  ///< of the pair that isn't in order
    const Column* mixed_source = nullptr;
};

bool Labels_Ascend(const Column& factor)
{
    const std::vector<const char*> labels = Label_Table(factor);
    return std::is_sorted(labels.begin(), labels.end(), [](const char* a, const char* b) {
        return Text_Arena::View(a) < Text_Arena::View(b);
    });
}

bool Levels_Ascend(const Column& factor)
{
    const std::vector<double> values = Level_Table(factor);
    return std::is_sorted(values.begin(), values.end());
}

void Note_Unordered(Mixtures& mixtures, bool& flag, const Column& target, const Column& source)
{
    flag = true;
    mixtures.mixed_target = &target;
    mixtures.mixed_source = &source;
}

bool Check_Text_With_Factor(const Column& target, const Column& source, Mixtures& mixtures)
{
    const bool factor_first = target.type == factor_column;
    const Column& factor = factor_first ? target : source;
    const Column& text = factor_first ? source : target;
    if (factor.label_count < 1)
        return Fail("Factor %s does not have labels to match with text column %s.\n", factor.name.c_str(),
                    text.name.c_str());
    if (!factor_first && !Labels_Ascend(source))
        Note_Unordered(mixtures, mixtures.labels_unordered, target, source);
    return true;
}

bool Check_Pair(const Column& target, const Column& source, Mixtures& mixtures)
{
    const bool factors[] = {target.type == factor_column, source.type == factor_column};
    const bool texts[] = {Is_Text_Like(target.type), Is_Text_Like(source.type)};
    if (factors[0] && factors[1]) {
        mixtures.factor_pair = true;
        return true;
    }
    if ((factors[0] && texts[1]) || (texts[0] && factors[1]))
        return Check_Text_With_Factor(target, source, mixtures);
    if (texts[0] != texts[1])
        return Fail("Columns %s and %s data types do not match.\n", target.name.c_str(), source.name.c_str());
    if (factors[1] && !Levels_Ascend(source))
        Note_Unordered(mixtures, mixtures.levels_unordered, target, source);
    return true;
}

bool Check_Key_Pairs(const Merge_Request& wanted)
{
    Mixtures mixtures;
    for (std::size_t key = 0; key < static_cast<std::size_t>(wanted.key_count); ++key)
        if (!Check_Pair(*wanted.target_keys[key], *wanted.source_keys[key], mixtures))
            return false;
    const bool unordered = mixtures.labels_unordered || mixtures.levels_unordered;
    const bool clash =
        (mixtures.labels_unordered && mixtures.levels_unordered) || (unordered && mixtures.factor_pair);
    return !clash
           || Fail("Mixed column types for %s and %s caused a clash of sort orders.\n",
                   mixtures.mixed_target->name.c_str(), mixtures.mixed_source->name.c_str());
}

/// Numbers that are no level's are the keys of no row.
void Part_From_All_Levels(const Column& source, Sort_Key& key)
{
    constexpr double no_key = -2.0;
    std::size_t row = 0;
    for (const Cell_Node* cell = source.first_cell; cell != nullptr && row < key.numbers.size();
         cell = cell->next, ++row)
        if (Cell_Is_Present(source, *cell) && !Is_Level_Number(cell->value.number))
            key.numbers[row] = no_key;
}

/// Numbers that are to match the levels of a Factor. Where it has no level values they are level numbers;
/// where it has, they become values even if 1, 2, ... need no list.
const Column* Numbers_As_Levels(const Column& target, const Column& source)
{
    const bool valued = target.level_values_count > 0;
    Column* const copy = Copy_Column_Aside(source);
    if (copy == nullptr)
        return nullptr;
    copy->type = variate_column;
    bool present = false;
    for (Cell_Node* cell = copy->first_cell; cell != nullptr; cell = cell->next) {
        if (!valued && !Is_Level_Number(cell->value.number))
            cell->value.number = copy->sheet->missing_value;
        present = present || Cell_Is_Present(*copy, *cell);
    }
    if (!present) {
        copy->type = factor_column;
        copy->nlevels = 0;
        return copy;
    }
    if (!Variate_To_Factor(copy, valued, 0))
        return nullptr;
    if (!valued || copy->level_values_count > 0)
        return copy;
    if (!Put_Level_Values(*copy, copy->nlevels, [level = 0.0]() mutable { return ++level; }))
        return nullptr;
    copy->factor_kind = Factor_Kind_Of(*copy);
    return copy;
}

void Count_From_Days(const Column& column, const Column& other, Sort_Key& key)
{
    if (column.format != date_format_mark || other.format != date_format_mark
        || column.date_form == other.date_form || column.date_form != 0)
        return;
    for (double& number : key.numbers)
        if (Is_Present(*column.sheet, number))
            Serial_To_Day_Count(number, column.sheet->missing_value);
}

/// Missing numbers of both Sheets are one key.
void Unite_Missing(const Column& column, double missing, Sort_Key& key)
{
    const bool factor = column.type == factor_column;
    for (double& number : key.numbers)
        if (factor ? !(number >= 1.0) : !Is_Present(*column.sheet, number))
            number = missing;
}

/// The levels of the target that the cells of the source stand for.
Sort_Key Transferred_Levels(Cell_Transfer& transfer, std::size_t rows)
{
    Sort_Key key;
    key.numbers.assign(rows, 0.0);
    Cell_Node cell{};
    std::size_t row = 0;
    for (const Cell_Node* from = transfer.Source().first_cell; from != nullptr && row < rows;
         from = from->next) {
        transfer.Put(cell, from->value);
        key.numbers[row++] = std::max(cell.value.number, 0.0);
    }
    return key;
}

Sort_Key Target_Key(const Column& target, const Column& source, std::size_t rows)
{
    Sort_Key key = Make_Sort_Key(target, rows, Factor_Mode::level_number);
    if (target.type == factor_column)
        Unite_Missing(target, 0.0, key);
    else if (key.texts.empty())
        Unite_Missing(target, target.sheet->missing_value, key);
    Count_From_Days(target, source, key);
    return key;
}

Sort_Key Source_Key(const Column& target, const Column& source, Cell_Transfer& transfer, std::size_t rows)
{
    if (target.type == factor_column)
        return Transferred_Levels(transfer, rows);
    const bool text = Is_Text_Like(target.type);
    Sort_Key key = Make_Sort_Key(source, rows, text ? Factor_Mode::label : Factor_Mode::level_value);
    if (text) {
        key.width = std::max(key.width, target.type == long_text_column ? Long_Text_Width : Text_Cell_Width);
        return key;
    }
    if (source.type != factor_column || source.level_values_count < 1)
        Unite_Missing(source, target.sheet->missing_value, key);
    else
        for (double& number : key.numbers)
            if (!Is_Present(*source.sheet, number))
                number = target.sheet->missing_value;
    Count_From_Days(source, target, key);
    return key;
}

}  // namespace

bool Make_Merge_Keys(const Merge_Request& wanted, Merge_Keys& keys)
{
    if (!Check_Key_Pairs(wanted))
        return false;
    const auto target_rows = static_cast<std::size_t>(Movable_Rows(*wanted.target));
    const auto source_rows = static_cast<std::size_t>(Movable_Rows(*wanted.source));
    for (std::size_t key = 0; key < static_cast<std::size_t>(wanted.key_count); ++key) {
        Column& target = *wanted.target_keys[key];
        const Column* source = wanted.source_keys[key];
        const bool numbers = !Is_Text_Like(source->type) && source->type != factor_column;
        if (target.type == factor_column && numbers)
            source = Numbers_As_Levels(target, *source);
        if (source == nullptr)
            return false;
        // Before the levels of the target grow, which changes nothing in its cells.
        keys.target.push_back(Target_Key(target, *source, target_rows));
        if (!keys.transfers[key].Prepare(target, *source, wanted.tolerance, wanted.ignore_case))
            return Fail("Column cannot merge factors %s and %s.\n", target.name.c_str(),
                        source->name.c_str());
        keys.source.push_back(Source_Key(target, *source, keys.transfers[key], source_rows));
        if (numbers && target.type == factor_column && target.level_values_count < 1)
            Part_From_All_Levels(*wanted.source_keys[key], keys.source.back());
    }
    return true;
}

}  // namespace ingester

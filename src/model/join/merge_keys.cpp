#include "model/join/merge_keys.h"

#include "model/calendar.h"
#include "model/cell_text.h"
#include "model/factor_lists.h"
#include "model/factors.h"
#include "model/join/column_copies.h"
#include "model/level_tables.h"
#include "request/messages.h"
#include "request/people_rules.h"
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

bool Fail_Of_Unlike_Types(const Column& target, const Column& source)
{
    return Fail("Columns %s and %s data types do not match.\n", target.name.c_str(), source.name.c_str());
}

bool Check_Text_With_Factor(const Column& target, const Column& source, Mixtures& mixtures)
{
    const bool factor_first = target.type == factor_column;
    const Column& factor = factor_first ? target : source;
    const Column& text = factor_first ? source : target;
    if (factor_first && For_People(People_Rule::kept_levels))
        return true;
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
        return Fail_Of_Unlike_Types(target, source);
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

/// What the numbers of a key column are to a Factor without level values.
struct Key_Numbers {
    std::int32_t present = 0;
    std::int32_t labels = 0;  ///< of them that labels answer to
    std::int32_t levels = 0;  ///< that can be level numbers
};

/// Numbers that labels answer to, as texts that these labels are.
bool Turn_Into_Labels(Column& copy, const std::vector<std::string_view>& labels)
{
    copy.type = long_text_column;
    auto label = labels.begin();
    for (Cell_Node* cell = copy.first_cell; cell != nullptr; cell = cell->next)
        cell->value.text = copy.texts.Store(*label++);
    return Turn_Into_Factor(copy, false);
}

/// Numbers that are to match the levels of a Factor without level values: those that its labels answer to, or
/// else its level numbers. No key may get lost, so that one which is neither ends the merge.
const Column* Numbers_As_Level_Numbers(const Column& target, const Column& source)
{
    Column* const copy = Copy_Column_Aside(source);
    if (copy == nullptr)
        return nullptr;
    copy->type = variate_column;
    Level_Finder finder;
    finder.Look_In(target);
    Key_Numbers numbers;
    std::vector<std::string_view> labels;
    for (Cell_Node* cell = copy->first_cell; cell != nullptr; cell = cell->next) {
        const bool present = Cell_Is_Present(*copy, *cell);
        const std::int32_t level = present ? Level_Labelled_As(finder, source, cell->value.number) : 0;
        labels.push_back(finder.Label_Of(level));
        numbers.present += present ? 1 : 0;
        numbers.labels += level > 0 ? 1 : 0;
        numbers.levels += present && Is_Level_Number(cell->value.number) ? 1 : 0;
    }
    if (numbers.labels > 0 && numbers.labels == numbers.present)
        return Turn_Into_Labels(*copy, labels) ? copy : nullptr;
    if (numbers.labels > 0 || numbers.levels < numbers.present) {
        Fail_Of_Unlike_Types(target, source);
        return nullptr;
    }
    if (numbers.present > 0)
        return Variate_To_Factor(copy, false, 0) ? copy : nullptr;
    return Turn_Into_Factor(*copy, false) ? copy : nullptr;
}

/// Dates as they are counted in the target.
void Count_As(const Column& target, Column& copy)
{
    const bool dates = target.format == date_format_mark && copy.format == date_format_mark;
    if (!dates || target.date_form == copy.date_form)
        return;
    for (Cell_Node* cell = copy.first_cell; cell != nullptr; cell = cell->next) {
        double& number = cell->value.number;
        if (Is_Present(*copy.sheet, number) && copy.date_form == 0)
            Serial_To_Day_Count(number, copy.sheet->missing_value);
        else if (Is_Present(*copy.sheet, number))
            Day_Count_To_Serial(number, copy.sheet->missing_value);
    }
    copy.date_form = target.date_form;
}

/// Dates of both counts are compared as day counts.
void Count_From_Days(const Column& column, const Column& other, Sort_Key& key)
{
    if (column.format != date_format_mark || other.format != date_format_mark
        || column.date_form == other.date_form || column.date_form != 0)
        return;
    for (double& number : key.numbers)
        if (Is_Present(*column.sheet, number))
            Serial_To_Day_Count(number, column.sheet->missing_value);
}

/// Where the Factor has level values, numbers become values even if 1, 2, ... need no list.
const Column* Numbers_As_Levels(const Column& target, const Column& source)
{
    if (target.level_values_count < 1)
        return Numbers_As_Level_Numbers(target, source);
    Column* const copy = Copy_Column_Aside(source);
    if (copy == nullptr)
        return nullptr;
    Count_As(target, *copy);
    return Turn_Into_Factor(*copy, false) ? copy : nullptr;
}

/// How the labels of a Factor's levels stand to the numbers of a key column.
struct Label_Words {
    bool numbers = false;  ///< some are numbers
    bool words = false;    ///< some aren't
};

/// Of the levels that cells hold.
Label_Words Words_Among(const Column& target, const Column& source)
{
    Label_Words found;
    const std::vector<const char*> labels = Label_Table(source);
    for (const Cell_Node* cell = source.first_cell; cell != nullptr; cell = cell->next)
        if (const char* const label = Of_Level<const char*>(labels, cell->value.number, nullptr)) {
            const bool number = Is_Present(*target.sheet, Number_Or_Date(target, Text_Arena::View(label)));
            found.numbers = found.numbers || number;
            found.words = found.words || !number;
        }
    return found;
}

bool Is_Told_By_Labels(const Column& factor)
{
    return factor.type == factor_column && factor.level_values_count < 1 && factor.label_count > 0;
}

/// Labels that are to match numbers are numbers themselves, or all stand for the numbers of their levels.
/// False after a message.
bool Match_Words_With_Numbers(const Column& target, const Column& source, bool& by_number)
{
    if (Is_Text_Like(target.type) || target.type == factor_column || !Is_Told_By_Labels(source))
        return true;
    const Label_Words found = Words_Among(target, source);
    by_number = found.words;
    if (found.numbers && found.words)
        return Fail_Of_Unlike_Types(target, source);
    if (by_number && For_People(People_Rule::kept_levels))
        Warn("Warning: the labels of %s are no numbers; the numbers of its levels were matched with %s.\n",
             source.name.c_str(), target.name.c_str());
    return true;
}

/// Missing numbers of both Sheets are one key.
void Unite_Missing(const Column& column, double missing, Sort_Key& key)
{
    const bool factor = column.type == factor_column;
    for (double& number : key.numbers)
        if (factor ? !(number >= 1.0) : !Is_Present(*column.sheet, number))
            number = missing;
}

/// What the cells of the source become in the target; there is no level below 0.
Sort_Key Transferred_Numbers(Cell_Transfer& transfer, std::size_t rows)
{
    const bool levels = transfer.Target().type == factor_column;
    Sort_Key key;
    key.numbers.assign(rows, levels ? 0.0 : transfer.Target().sheet->missing_value);
    Cell_Node cell{};
    std::size_t row = 0;
    for (const Cell_Node* from = transfer.Source().first_cell; from != nullptr && row < rows;
         from = from->next) {
        transfer.Put(cell, from->value);
        key.numbers[row++] = levels ? std::max(cell.value.number, 0.0) : cell.value.number;
    }
    return key;
}

Sort_Key Target_Key(const Column& target, const Column& source, std::size_t rows)
{
    Sort_Key key = Make_Sort_Key(target, rows, Factor_Mode::level_number);
    if (target.type == factor_column) {
        Unite_Missing(target, 0.0, key);
        return key;
    }
    if (key.texts.empty())
        Unite_Missing(target, target.sheet->missing_value, key);
    Count_From_Days(target, source, key);
    return key;
}

Sort_Key Source_Key(const Column& target, const Column& source, Cell_Transfer& transfer, std::size_t rows)
{
    const bool text = Is_Text_Like(target.type);
    if (target.type == factor_column || (!text && Is_Told_By_Labels(source)))
        return Transferred_Numbers(transfer, rows);
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
        Transfer_Rules rules{.tolerance = wanted.tolerance, .ignore_case = wanted.ignore_case};
        if (target.type == factor_column && numbers && !For_People(People_Rule::kept_levels))
            source = Numbers_As_Levels(target, *source);
        if (source == nullptr || !Match_Words_With_Numbers(target, *source, rules.words_by_number))
            return false;
        // Before the levels of the target grow; only cells of margins, which no row is joined by, change with
        // them.
        keys.target.push_back(Target_Key(target, *source, target_rows));
        if (!keys.transfers[key].Prepare(target, *source, rules))
            return Fail("Column cannot merge factors %s and %s.\n", target.name.c_str(),
                        source->name.c_str());
        keys.source.push_back(Source_Key(target, *source, keys.transfers[key], source_rows));
    }
    return true;
}

}  // namespace ingester

#include "model/join/factor_levels.h"

#include "model/factor_lists.h"
#include "model/factors.h"
#include "model/join/level_meanings.h"
#include "model/level_tables.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "support/distinct_keys.h"
#include "support/letters.h"
#include "support/number_text.h"

#include <algorithm>
#include <cmath>
#include <string_view>
#include <utility>

namespace ingester {

namespace {

/// Levels by number that a Factor with lists may be given.
constexpr std::int32_t Most_Added_Levels = Greatest_Level_Table / sizeof(const char*);

std::vector<std::string_view> Listed_Labels(const Column& factor)
{
    std::vector<std::string_view> labels;
    for (const Level_Node* label = factor.labels;
         label != nullptr && std::ssize(labels) < std::max(factor.nlevels, 0); label = label->next)
        labels.push_back(label->Text());
    return labels;
}

/// The key numbers of all labels.
template <class Distinct>
std::vector<std::uint32_t> Number_Labels(Distinct& distinct, const std::vector<std::string_view>& labels)
{
    std::vector<std::uint32_t> numbers(labels.size());
    for (std::size_t begin = 0; begin < labels.size(); begin += Distinct::batch)
        distinct.Number_Keys_Of(&labels[begin], std::min(Distinct::batch, labels.size() - begin),
                                &numbers[begin]);
    return numbers;
}

/// Maps each label; those that are new are noted in `added`, by their level of `source`.
template <class Rules> void Match_Labels(const Column& target, const Column& source,
                                         std::vector<std::int32_t>& map, std::vector<std::int32_t>& added)
{
    Distinct_Keys<std::string_view, Rules> distinct;
    std::vector<std::int32_t> levels;  // of the target, by key number
    std::int32_t level = 0;
    for (const std::uint32_t number : Number_Labels(distinct, Listed_Labels(target))) {
        ++level;
        if (number > levels.size())
            levels.push_back(level);
    }
    std::int32_t next = target.nlevels;
    level = 0;
    for (const std::uint32_t number : Number_Labels(distinct, Listed_Labels(source))) {
        ++level;
        if (number > levels.size()) {
            levels.push_back(++next);
            added.push_back(level);
        }
        map.push_back(levels[number - 1]);
    }
    while (level < source.nlevels) {  // those without a label have no partner
        added.push_back(++level);
        map.push_back(++next);
    }
}

/// Level values, sorted, with their levels.
using Sorted_Values = std::vector<std::pair<double, std::int32_t>>;

bool Is_Within(double a, double b, double ratio)
{
    return a == b || (a != 0.0 && b != 0.0 && a / b <= ratio && b / a <= ratio && a / b > 0.0);
}

/// The level of an equal value, or else of one within the ratio; 0 for none.
std::int32_t Find_Value(const Sorted_Values& values, double value, double ratio)
{
    const auto exact = std::lower_bound(values.begin(), values.end(), std::pair(value, 0));
    if (exact != values.end() && exact->first == value)
        return exact->second;
    if (exact != values.end() && Is_Within(exact->first, value, ratio))
        return exact->second;
    return exact != values.begin() && Is_Within(std::prev(exact)->first, value, ratio)
               ? std::prev(exact)->second
               : 0;
}

void Match_Values(const Column& target, const Column& source, double tolerance,
                  std::vector<std::int32_t>& map, std::vector<std::int32_t>& added)
{
    const double ratio = std::clamp(tolerance, 1.0, 1.001);
    Sorted_Values values;
    std::int32_t level = 0;
    for (const double value : Level_Table(target))
        if (++level <= target.nlevels && !std::isnan(value))
            values.emplace_back(value, level);
    std::sort(values.begin(), values.end());
    std::int32_t next = target.nlevels;
    level = 0;
    for (const double value : Level_Table(source)) {
        if (++level > source.nlevels)
            break;
        const std::int32_t found = Find_Value(values, value, ratio);
        map.push_back(found > 0 ? found : ++next);
        if (found == 0)
            added.push_back(level);
    }
}

/// The rest of the levels has no name but its number.
bool Match_Numbers(const Column& target, const Column& source, std::vector<std::int32_t>& added)
{
    Warn_Of_Unlike_Lists(target, source);
    const std::int32_t more = source.nlevels - std::max(target.nlevels, 0);
    if (more > Most_Added_Levels)
        return false;
    for (std::int32_t level = source.nlevels - std::max(more, 0); level < source.nlevels; ++level)
        added.push_back(level + 1);
    return true;
}

/// Makes a list longer; what has no entry in `source_table` gets what `by_number` makes of its level.
template <class Value, class By_Number>
void Lengthen(std::vector<Value>& table, std::int32_t nlevels, const std::vector<Value>& source_table,
              const std::vector<std::int32_t>& added, By_Number by_number)
{
    table.resize(std::min(table.size(), static_cast<std::size_t>(std::max(nlevels, 0))));
    while (table.size() < static_cast<std::size_t>(std::max(nlevels, 0)))
        table.push_back(by_number(table.size() + 1));
    for (const std::int32_t level : added) {
        const auto at = static_cast<std::size_t>(level) - 1;
        table.push_back(at < source_table.size() ? source_table[at] : by_number(table.size() + 1));
    }
}

bool Add_Labels(Column& target, const Column& source, const std::vector<std::int32_t>& added)
{
    if (target.label_count < 1)
        return true;
    char text[Number_Text_Room];
    std::vector<const char*> labels = Label_Table(target);
    Lengthen(labels, target.nlevels, Label_Table(source), added, [&](std::size_t level) {
        char* const end = Print_Integer(text, static_cast<std::int64_t>(level));
        return target.texts.Store({text, static_cast<std::size_t>(end - text)});
    });
    return Put_Labels(
        target, static_cast<std::int32_t>(labels.size()),
        [&, label = labels.begin()]() mutable { return target.texts.Store(Text_Arena::View(*label++)); });
}

bool Add_Values(Column& target, const Column& source, const std::vector<std::int32_t>& added)
{
    if (target.level_values_count < 1)
        return true;
    std::vector<double> values = Level_Table(target);
    Lengthen(values, target.nlevels, Level_Table(source), added,
             [](std::size_t level) { return static_cast<double>(level); });
    return Put_Level_Values(target, values);
}

bool Is_Bare(const Column& factor)
{
    return factor.label_count < 1 && factor.level_values_count < 1;
}

bool Are_Both_Labelled(const Column& target, const Column& source)
{
    return target.label_count > 0 && source.label_count > 0;
}

/// As hosts have it: by the lists that both have, else by number. False for want of room.
bool Match_Lists(Column& target, const Column& source, std::vector<std::int32_t>& map,
                 std::vector<std::int32_t>& added, double tolerance, bool ignore_case)
{
    if (Are_Both_Labelled(target, source)) {
        if (ignore_case)
            Match_Labels<Case_Free_Keys>(target, source, map, added);
        else
            Match_Labels<Exact_Keys>(target, source, map, added);
    } else if (target.level_values_count > 0 && source.level_values_count > 0) {
        Match_Values(target, source, tolerance, map, added);
    } else if (!Match_Numbers(target, source, added)) {
        return false;
    }
    return added.empty() || (Add_Labels(target, source, added) && Add_Values(target, source, added));
}

}  // namespace

void Warn_Of_Unlike_Lists(const Column& target, const Column& source)
{
    Warn("Factors %s and %s do not match with respect to the presence of labels and levels.\n"
         "The matched rows may not be as expected.\n",
         target.name.c_str(), source.name.c_str());
}

void Set_Level_Count(Column& factor, std::int32_t nlevels)
{
    Sheet& sheet = *factor.sheet;
    const double old_margin = factor.nlevels + 1.0;
    factor.nlevels = nlevels;
    if (sheet.type != table_sheet || sheet.has_margins == 0)
        return;
    const bool last_one = factor.next == nullptr || factor.next->type != factor_column;
    if (last_one && sheet.margin_level == static_cast<std::int32_t>(old_margin))
        sheet.margin_level = nlevels + 1;
    for (Cell_Node* cell = factor.first_cell; cell != nullptr; cell = cell->next)
        if (cell->value.number == old_margin)
            cell->value.number = nlevels + 1.0;
}

bool Merge_Factor_Levels(Column& target, const Column& source, std::vector<std::int32_t>& map,
                         double tolerance, bool ignore_case)
{
    map.clear();
    if (Is_Bare(target) && Is_Bare(source)) {
        Set_Level_Count(target, std::max(target.nlevels, source.nlevels));
        return true;
    }
    if (std::max(target.nlevels, source.nlevels) > Most_Added_Levels)
        return false;
    std::vector<std::int32_t> added;
    const bool by_meaning = For_People(People_Rule::kept_levels) && !Are_Both_Labelled(target, source);
    if (!(by_meaning ? Match_Meanings(target, source, map, added, ignore_case)
                     : Match_Lists(target, source, map, added, tolerance, ignore_case)))
        return false;
    Set_Level_Count(target, target.nlevels + static_cast<std::int32_t>(added.size()));
    return true;
}

}  // namespace ingester

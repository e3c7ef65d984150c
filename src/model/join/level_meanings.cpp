#include "model/join/level_meanings.h"

#include "model/factor_lists.h"
#include "model/join/factor_levels.h"
#include "model/level_tables.h"
#include "model/number_format.h"
#include "request/messages.h"
#include "support/distinct_keys.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <string>
#include <string_view>

namespace ingester {

namespace {

/// What one level says.
struct Meaning {
    std::string_view said;  ///< as it prints
    std::string_view key;   ///< the same, but of a number its own spelling
    double number;          ///< not a number for words
};

std::string_view Printed(Text_Arena& room, const char* first, const char* last)
{
    return Text_Arena::View(room.Store({first, static_cast<std::size_t>(last - first)}));
}

Meaning Meaning_Of_Label(std::string_view label, Text_Arena& room)
{
    double number;
    if (!Whole_Number_Text(Trim_Copy(label), number))
        return {label, label, std::nan("")};
    char text[Number_Text_Room];
    return {label, Printed(room, text, Print_Shortest(text, number)), number};
}

/// Dates say what they print as: that is what labels hold.
Meaning Meaning_Of_Value(const Column& factor, double value, Text_Arena& room)
{
    char text[Number_Text_Room];
    const std::string_view said = Printed(room, text, Format_Cell_Fully(text, factor, value));
    if (factor.format == date_format_mark || !Is_Present(*factor.sheet, value))
        return {said, said, value};
    return {said, Printed(room, text, Print_Shortest(text, value)), value};
}

Meaning Meaning_Of_Number(std::int32_t level, Text_Arena& room)
{
    char text[Number_Text_Room];
    const std::string_view said = Printed(room, text, Print_Integer(text, level));
    return {said, said, static_cast<double>(level)};
}

/// What all levels of a Factor say, by level from 1 at 0. `by_value` they are told by their values, or else
/// their numbers, whatever their labels are.
std::vector<Meaning> Meanings_Of(const Column& factor, bool by_value, Text_Arena& room)
{
    std::vector<Meaning> meanings;
    const Level_Node* label = factor.labels;
    const Level_Node* value = factor.level_values;
    for (std::int32_t level = 1; level <= factor.nlevels; ++level) {
        Meaning meaning = value != nullptr ? Meaning_Of_Value(factor, value->value.number, room)
                                           : Meaning_Of_Number(level, room);
        if (label != nullptr && by_value)
            meaning.said = label->Text();
        else if (label != nullptr)
            meaning = Meaning_Of_Label(label->Text(), room);
        meanings.push_back(meaning);
        label = label == nullptr ? nullptr : label->next;
        value = value == nullptr ? nullptr : value->next;
    }
    return meanings;
}

bool Is_Labelled(const Column& factor)
{
    return factor.label_count > 0;
}

/// Whether the levels have values, be they their numbers.
bool Has_Values(const Column& factor)
{
    return factor.level_values_count > 0 || !Is_Labelled(factor);
}

/// Whether the labels of one Factor are words, and all levels of the other, which has none, can be their
/// numbers.
bool Words_Meet_Their_Numbers(const Column& labelled, const std::vector<Meaning>& words, const Column& other,
                              const std::vector<Meaning>& numbers)
{
    return Is_Labelled(labelled) && !Is_Labelled(other)
           && std::ranges::all_of(words, [](const Meaning& one) { return std::isnan(one.number); })
           && std::ranges::all_of(numbers, [&](const Meaning& one) {
                  return Is_Level_Number(one.number) && one.number <= labelled.nlevels;
              });
}

/// The numbers of the other are levels of the labelled one.
void Go_By_Number(const std::vector<Meaning>& words, std::vector<Meaning>& numbers)
{
    for (Meaning& one : numbers)
        one = words[static_cast<std::size_t>(one.number) - 1];
}

template <class Rules> void Match_Keys(const std::vector<Meaning>& target, const std::vector<Meaning>& source,
                                       std::vector<std::int32_t>& map, std::vector<std::int32_t>& added)
{
    Distinct_Keys<std::string_view, Rules> distinct;
    std::vector<std::int32_t> levels;  // of the target, by key number
    const auto number_of = [&](const Meaning& meaning) {
        std::uint32_t number;
        distinct.Number_Keys_Of(&meaning.key, 1, &number);
        return number;
    };
    std::int32_t level = 0;
    for (const Meaning& meaning : target) {
        ++level;
        if (number_of(meaning) > levels.size())
            levels.push_back(level);
    }
    std::int32_t next = level;
    level = 0;
    for (const Meaning& meaning : source) {
        const std::uint32_t number = number_of(meaning);
        ++level;
        if (number > levels.size()) {
            levels.push_back(++next);
            added.push_back(level);
        }
        map.push_back(levels[number - 1]);
    }
}

bool Put_What_Is_Said(Column& factor, const std::vector<Meaning>& all)
{
    return Put_Labels(factor, static_cast<std::int32_t>(all.size()),
                      [&, one = all.begin()]() mutable { return factor.texts.Store((one++)->said); });
}

bool Put_Numbers(Column& factor, const std::vector<Meaning>& all)
{
    return Put_Level_Values(factor, static_cast<std::int32_t>(all.size()),
                            [one = all.begin()]() mutable { return (one++)->number; });
}

/// Values that count the levels need no list.
bool Count_Levels(const std::vector<Meaning>& all)
{
    double level = 0;
    return std::ranges::all_of(all, [&](const Meaning& one) { return one.number == ++level; });
}

/// Gives `target` the lists that say all of `levels`, its own and those that are new.
bool Put_Meanings(Column& target, const std::vector<Meaning>& levels, bool labelled, bool valued)
{
    const bool listed = valued && (labelled || !Count_Levels(levels));
    if (!Put_What_Is_Said(target, labelled ? levels : std::vector<Meaning>{})
        || !Put_Numbers(target, listed ? levels : std::vector<Meaning>{}))
        return false;
    target.factor_kind = Factor_Kind_Of(target);
    if (labelled)
        target.format = general_format;
    return true;
}

/// What a level of the source says that a level of an unlabelled target is, too.
void Take_Labels(std::vector<Meaning>& ours, const std::vector<Meaning>& theirs,
                 const std::vector<std::int32_t>& map)
{
    for (std::size_t level = 0; level < theirs.size(); ++level)
        if (const auto at = static_cast<std::size_t>(map[level]) - 1; at < ours.size())
            ours[at].said = theirs[level].said;
}

}  // namespace

bool Match_Meanings(Column& target, const Column& source, std::vector<std::int32_t>& map,
                    std::vector<std::int32_t>& added, bool ignore_case)
{
    Text_Arena room;
    const bool by_value = Has_Values(target) && Has_Values(source);
    std::vector<Meaning> ours = Meanings_Of(target, by_value, room);
    std::vector<Meaning> theirs = Meanings_Of(source, by_value, room);
    const bool by_our_number = !by_value && Words_Meet_Their_Numbers(target, ours, source, theirs);
    const bool by_their_number = !by_value && Words_Meet_Their_Numbers(source, theirs, target, ours);
    if (by_our_number)
        Go_By_Number(ours, theirs);
    if (by_their_number)
        Go_By_Number(theirs, ours);
    if (by_our_number || by_their_number)
        Warn_Of_Unlike_Lists(target, source);
    if (ignore_case)
        Match_Keys<Case_Free_Keys>(ours, theirs, map, added);
    else
        Match_Keys<Exact_Keys>(ours, theirs, map, added);
    const bool takes_labels = by_value && Is_Labelled(source);
    if (added.empty() && !by_their_number && !takes_labels)
        return true;
    if (takes_labels)
        Take_Labels(ours, theirs, map);
    for (const std::int32_t level : added)
        ours.push_back(theirs[static_cast<std::size_t>(level) - 1]);
    const bool words = std::ranges::any_of(ours, [](const Meaning& one) { return std::isnan(one.number); });
    const bool labelled = takes_labels || words || Is_Labelled(target);
    return Put_Meanings(target, ours, labelled, by_value || !labelled);
}

}  // namespace ingester

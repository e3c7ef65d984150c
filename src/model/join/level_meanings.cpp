#include "model/join/level_meanings.h"

#include "model/calendar.h"
#include "model/factor_lists.h"
#include "model/join/factor_levels.h"
#include "model/level_tables.h"
#include "model/number_format.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <unordered_map>
#include <utility>

namespace ingester {

namespace {

/// What one level says.
struct Meaning {
    std::string_view said;     ///< as it prints
    std::string_view in_full;  ///< the same, but of a number all its digits
    double number;             ///< not a number for words
};

std::string_view Printed(Text_Arena& room, const char* first, const char* last)
{
    return Text_Arena::View(room.Store({first, static_cast<std::size_t>(last - first)}));
}

Meaning Meaning_Of_Label(std::string_view label)
{
    double number;
    return {label, label, Whole_Number_Text(Trim_Copy(label), number) ? number : std::nan("")};
}

Meaning Meaning_Of_Value(const Column& factor, double value, Text_Arena& room)
{
    char text[Number_Text_Room];
    const std::string_view said = Printed(room, text, Format_Level_Value(text, factor, value));
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
            meaning = Meaning_Of_Label(label->Text());
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

/// Dates of the source in the form of the target's.
void Move_Dates(const Column& target, const Column& source, std::vector<Meaning>& theirs)
{
    const bool dates = target.format == date_format_mark && source.format == date_format_mark;
    if (!dates || target.date_form == source.date_form || source.level_values_count < 1)
        return;
    for (Meaning& one : theirs)
        if (source.date_form == 0)
            Serial_To_Day_Count(one.number, target.sheet->missing_value);
        else
            Day_Count_To_Serial(one.number, target.sheet->missing_value);
}

bool Are_Words(const std::vector<Meaning>& labels)
{
    return std::ranges::all_of(labels, [](const Meaning& one) { return std::isnan(one.number); });
}

/// Numbers that can be levels of a Factor whose labels are words stand for these. False where there is none.
bool Go_By_Number(const std::vector<Meaning>& words, std::vector<Meaning>& numbers)
{
    bool any = false;
    for (Meaning& one : numbers)
        if (Is_Level_Number(one.number) && one.number <= static_cast<double>(words.size())) {
            one = words[static_cast<std::size_t>(one.number) - 1];
            any = true;
        }
    return any;
}

/// Which level of the target each of the source is, 0 for none of them. The closest likeness comes first, and
/// levels that say different things are never the same one.
class Level_Match {
public:
    Level_Match(const std::vector<Meaning>& ours, const std::vector<Meaning>& theirs)
        : ours_(ours), theirs_(theirs), map_(theirs.size()), taken_(ours.size())
    {}

    /// `key_of` gives nothing for a level that has no such likeness. `shared`: those of one key are the same.
    template <class Key_Of> void Match_By(Key_Of key_of, bool shared = false)
    {
        std::unordered_map<std::decay_t<decltype(*key_of(ours_.front()))>, std::size_t> places;
        for (std::size_t place = 0; place < ours_.size(); ++place)
            if (const auto key = key_of(ours_[place]); key && !taken_[place])
                places.try_emplace(*key, place);
        for (std::size_t level = 0; level < theirs_.size(); ++level) {
            const auto key = key_of(theirs_[level]);
            const auto found = key && map_[level] == 0 ? places.find(*key) : places.end();
            if (found == places.end() || (taken_[found->second] && !shared))
                continue;
            taken_[found->second] = true;
            map_[level] = static_cast<std::int32_t>(found->second) + 1;
        }
    }

    [[nodiscard]] std::vector<std::int32_t> Map() && { return std::move(map_); }

private:
    const std::vector<Meaning>& ours_;
    const std::vector<Meaning>& theirs_;
    std::vector<std::int32_t> map_;
    std::vector<bool> taken_;
};

std::optional<double> Number_Of(const Meaning& one)
{
    return std::isnan(one.number) ? std::nullopt : std::optional(one.number + 0.0);
}

std::vector<std::int32_t> Match(const std::vector<Meaning>& ours, const std::vector<Meaning>& theirs,
                                bool by_value, bool ignore_case)
{
    Level_Match match(ours, theirs);
    if (!by_value) {
        match.Match_By([](const Meaning& one) { return std::optional(one.said); }, true);
        match.Match_By([](const Meaning& one) { return std::optional(one.in_full); });
    }
    match.Match_By(Number_Of);
    if (ignore_case && !by_value)
        match.Match_By([](const Meaning& one) { return std::optional(Folded(one.said)); });
    return std::move(match).Map();
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
        if (map[level] > 0)
            ours[static_cast<std::size_t>(map[level]) - 1].said = theirs[level].said;
}

/// Puts the levels without a partner behind those of the target.
void Add_Rest(std::vector<Meaning>& ours, const std::vector<Meaning>& theirs, std::vector<std::int32_t>& map,
              std::vector<std::int32_t>& added)
{
    for (std::size_t level = 0; level < theirs.size(); ++level) {
        if (map[level] > 0)
            continue;
        ours.push_back(theirs[level]);
        map[level] = static_cast<std::int32_t>(ours.size());
        added.push_back(static_cast<std::int32_t>(level) + 1);
    }
}

}  // namespace

bool Match_Meanings(Column& target, const Column& source, std::vector<std::int32_t>& map,
                    std::vector<std::int32_t>& added, bool ignore_case)
{
    Text_Arena room;
    const bool by_value = Has_Values(target) && Has_Values(source);
    std::vector<Meaning> ours = Meanings_Of(target, by_value, room);
    std::vector<Meaning> theirs = Meanings_Of(source, by_value, room);
    Move_Dates(target, source, theirs);
    const bool by_our_number =
        !by_value && Is_Labelled(target) && Are_Words(ours) && Go_By_Number(ours, theirs);
    const bool by_their_number =
        !by_value && Is_Labelled(source) && Are_Words(theirs) && Go_By_Number(theirs, ours);
    if (by_our_number || by_their_number)
        Warn_Of_Unlike_Lists(target, source);
    map = Match(ours, theirs, by_value, ignore_case);
    const bool takes_labels = by_value && Is_Labelled(source);
    if (takes_labels && !Is_Labelled(target))
        Take_Labels(ours, theirs, map);
    Add_Rest(ours, theirs, map, added);
    if (added.empty() && !by_their_number && !takes_labels)
        return true;
    const bool labelled =
        takes_labels || Is_Labelled(target)
        || std::ranges::any_of(ours, [](const Meaning& one) { return std::isnan(one.number); });
    return Put_Meanings(target, ours, labelled, by_value || !labelled);
}

}  // namespace ingester

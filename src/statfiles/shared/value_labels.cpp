#include "statfiles/shared/value_labels.h"

#include "model/factor_lists.h"
#include "model/factors.h"
#include "model/level_tables.h"
#include "request/losses.h"
#include "statfiles/shared/row_filler.h"
#include "support/number_text.h"

#include <algorithm>
#include <cstdint>
#include <numeric>
#include <span>

namespace ingester {

namespace {

constexpr double Match_Distance = 1e-12;
constexpr std::size_t Nothing = static_cast<std::size_t>(-1);

/// Finds the first of some numbers, in the order in which they were given, that is near to another.
class Near_Finder {
public:
    explicit Near_Finder(const std::vector<double>& values) : order_(values.size())
    {
        std::iota(order_.begin(), order_.end(), std::size_t{0});
        std::erase_if(order_, [&](std::size_t i) { return values[i] != values[i]; });
        std::ranges::stable_sort(order_, {}, [&](std::size_t i) { return values[i]; });
        for (const std::size_t i : order_)
            sorted_.push_back(values[i]);
        least_.assign(order_.begin(), order_.end());
        least_.insert(least_.begin(), order_.size(), Nothing);
        for (std::size_t node = order_.size(); node-- > 1;)
            least_[node] = std::min(least_[2 * node], least_[2 * node + 1]);
    }

    [[nodiscard]] std::size_t Find(double value)
    {
        const auto is_below = [value](double other) { return !(value - other < Match_Distance); };
        if (at_ > 0 && !is_below(sorted_[at_ - 1]))
            at_ = 0;
        // Levels mostly ascend, so the next one is a few steps away.
        for (int steps = 0; at_ < sorted_.size() && is_below(sorted_[at_]); ++at_)
            if (++steps > most_steps) {
                at_ = static_cast<std::size_t>(
                    std::partition_point(sorted_.begin() + static_cast<std::ptrdiff_t>(at_), sorted_.end(),
                                         is_below)
                    - sorted_.begin());
                break;
            }
        std::size_t end = at_;
        while (end < sorted_.size() && end - at_ < static_cast<std::size_t>(most_steps)
               && sorted_[end] - value < Match_Distance)
            ++end;
        if (end - at_ == static_cast<std::size_t>(most_steps))
            end = static_cast<std::size_t>(
                std::partition_point(sorted_.begin() + static_cast<std::ptrdiff_t>(end), sorted_.end(),
                                     [value](double other) { return other - value < Match_Distance; })
                - sorted_.begin());
        return Least_Of(at_, end);
    }

private:
    static constexpr int most_steps = 8;

    /// The least of the places in a range of the sorted values.
    [[nodiscard]] std::size_t Least_Of(std::size_t first, std::size_t end) const
    {
        std::size_t least = Nothing;
        for (first += order_.size(), end += order_.size(); first < end; first /= 2, end /= 2) {
            if (first % 2 != 0)
                least = std::min(least, least_[first++]);
            if (end % 2 != 0)
                least = std::min(least, least_[--end]);
        }
        return least;
    }

    std::vector<std::size_t> order_;
    std::vector<double> sorted_;
    std::vector<std::size_t> least_;  ///< a tree of the least place below each node
    std::size_t at_ = 0;
};

/// The same of texts that are equal.
class Text_Finder {
public:
    explicit Text_Finder(const std::vector<std::string>& texts) : texts_(texts), order_(texts.size())
    {
        std::iota(order_.begin(), order_.end(), std::size_t{0});
        std::ranges::stable_sort(order_, {}, [&](std::size_t i) -> std::string_view { return texts_[i]; });
    }

    [[nodiscard]] std::size_t Find(std::string_view text) const
    {
        const auto found = std::ranges::lower_bound(
            order_, text, {}, [&](std::size_t i) -> std::string_view { return texts_[i]; });
        return found != order_.end() && texts_[*found] == text ? *found : Nothing;
    }

private:
    const std::vector<std::string>& texts_;
    std::vector<std::size_t> order_;
};

/// A column on its way to a Factor with labels.
struct Labelling {
    Column& column;
    const Label_Set& set;
    Label_Terms& terms;
    std::vector<const char*> labels = {};  ///< of the levels, in the column's arena
    std::vector<bool> used = std::vector<bool>(set.labels.size());

    [[nodiscard]] std::string_view Crossed(std::string_view text) const
    {
        return terms.crossing != nullptr ? terms.crossing->Cross(text) : text;
    }

    const char* Stored_Label(std::size_t entry)
    {
        const std::string_view label = Crossed(Text_Arena::View(set.labels[entry]));
        const std::string_view kept = First_Letters(label, terms.width);
        if (kept.size() < label.size())
            Note_Loss(Loss_Kind::text_cut, column.name, 0, label);
        return column.texts.Store(kept);
    }

    void Take(std::size_t entry)
    {
        labels.push_back(Stored_Label(entry));
        used[entry] = true;
    }

    /// Whether one more label that no cell has may be taken.
    [[nodiscard]] bool May_Take_Unused() { return terms.unused_left-- > 0; }
};

/// The values of the set as the cells hold them.
std::vector<double> Shifted_Values(const Labelling& work)
{
    std::vector<double> values = work.set.values;
    if (work.terms.dated)
        std::ranges::transform(values, values.begin(), [&](double v) { return work.terms.epoch.To_Days(v); });
    return values;
}

std::vector<std::string> Trimmed_Texts(const Labelling& work)
{
    std::vector<std::string> texts;
    texts.reserve(work.set.texts.size());
    for (const std::string_view text : work.set.texts)
        texts.emplace_back(work.Crossed(Without_Blanks(text, work.terms.trim_front)));
    return texts;
}

bool Has_No_Data(const Column& column)
{
    const Cell_Node* cell = column.first_cell;
    while (cell != nullptr && !Cell_Is_Present(column, *cell))
        cell = cell->next;
    return cell == nullptr;
}

void Print_Value(Labelling& work, double value)
{
    constexpr int digits = 12;
    char room[Number_Text_Room];
    work.labels.push_back(
        work.column.texts.Store(std::string_view(room, Print_General(room, value, digits))));
}

void Label_Numbers(Labelling& work, const std::vector<double>& values)
{
    Near_Finder finder(values);
    const auto label_of = [&](double value) {
        const std::size_t entry = finder.Find(value);
        if (entry == Nothing)
            Print_Value(work, value);
        else
            work.Take(entry);
    };
    work.labels.reserve(static_cast<std::size_t>(work.column.nlevels));
    for (const Level_Node* node = work.column.level_values; node != nullptr; node = node->next)
        label_of(node->value.number);
    if (work.column.level_values == nullptr)
        for (std::int32_t level = 1; level <= work.column.nlevels; ++level)
            label_of(level);
}

void Label_Texts(Labelling& work)
{
    const std::vector<std::string> texts = Trimmed_Texts(work);
    const Text_Finder finder(texts);
    for (const char* const label : Label_Table(work.column)) {
        const std::size_t entry = finder.Find(Text_Arena::View(label));
        if (entry == Nothing)
            work.labels.push_back(label);
        else
            work.Take(entry);
    }
}

/// Level values of the levels that there are, and of those to come.
bool Lengthen_Values(Labelling& work, const std::vector<double>& values,
                     const std::vector<std::size_t>& unused)
{
    std::vector<double> all = Level_Table(work.column);
    for (auto level = static_cast<std::int32_t>(all.size()); level < work.column.nlevels; ++level)
        all.push_back(level + 1);
    for (const std::size_t entry : unused)
        all.push_back(values[entry]);
    return Put_Level_Values(work.column, all);
}

/// The labels that no level has yet, as far as they may be taken.
std::vector<std::size_t> Unused_Labels(Labelling& work)
{
    std::vector<std::size_t> unused;
    for (std::size_t entry = 0; entry < work.used.size(); ++entry) {
        if (work.used[entry])
            continue;
        if (!work.May_Take_Unused()) {
            Note_Loss(Loss_Kind::label_dropped, work.column.name, 0,
                      "labels that no cell has, beyond a limit");
            break;
        }
        unused.push_back(entry);
    }
    return unused;
}

/// Adds the labels that no level has; of numbers with their `values`.
bool Add_Unused(Labelling& work, const std::vector<double>* values)
{
    if (!work.terms.add_unused || std::ranges::find(work.used, false) == work.used.end())
        return true;
    const std::vector<std::size_t> unused = Unused_Labels(work);
    if (values != nullptr && !Lengthen_Values(work, *values, unused))
        return false;
    for (const std::size_t entry : unused)
        work.Take(entry);
    work.column.nlevels = static_cast<std::int32_t>(work.labels.size());
    return true;
}

/// A Factor whose labels all are empty goes without.
bool Put_Label_List(Labelling& work)
{
    constexpr std::int32_t beside_label = 2;
    Column& column = work.column;
    const bool any =
        std::ranges::any_of(work.labels, [](const char* label) { return !Text_Arena::View(label).empty(); });
    if (!any)
        work.labels.clear();
    column.label_width = 0;
    if (!Put_Labels(column, work.labels))
        return false;
    column.factor_kind = Factor_Kind_Of(column);
    if (any)
        column.width = std::max(column.width, column.label_width + beside_label);
    return true;
}

bool Label_Whole_Set(Labelling& work, const std::vector<double>& values)
{
    const std::vector<std::size_t> all = Unused_Labels(work);
    work.column.nlevels = std::max(static_cast<std::int32_t>(all.size()), 1);
    for (const std::size_t entry : all)
        work.Take(entry);
    return Put_Level_Values(work.column, std::span(values).first(all.size()));
}

bool Label_Variate(Labelling& work)
{
    const std::vector<double> values = Shifted_Values(work);
    const bool empty = Has_No_Data(work.column);
    const auto levels = empty ? 0 : static_cast<std::int32_t>(values.size());
    if (!Variate_To_Factor(&work.column, true, levels))
        return false;
    if (empty)
        return Label_Whole_Set(work, values) && Put_Label_List(work);
    Label_Numbers(work, values);
    return Add_Unused(work, &values) && Put_Label_List(work);
}

bool Label_Text(Labelling& work)
{
    if (!Text_To_Factor(&work.column, work.terms.by_case_free, work.terms.trim_front, 0))
        return false;
    Label_Texts(work);
    return Add_Unused(work, nullptr) && Put_Label_List(work);
}

}  // namespace

void Apply_Value_Labels(Column& column, const Label_Set& set, Label_Terms& terms)
{
    if (set.labels.empty())
        return;
    if (terms.crossing != nullptr)
        terms.crossing->Go_To(column.name);
    Labelling work{column, set, terms};
    if (!(column.type == variate_column ? Label_Variate(work) : Label_Text(work)))
        Note_Loss(Loss_Kind::label_dropped, column.name, 0, "more values than a Factor has levels");
}

}  // namespace ingester

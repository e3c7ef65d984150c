#include "model/level_finder.h"

#include "model/level_tables.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>

namespace ingester {

double Level_Finder::Value_Of(std::int32_t level) const
{
    return level > 0 ? values_[static_cast<std::size_t>(level) - 1] : std::nan("");
}

std::string_view Level_Finder::Label_Of(std::int32_t level) const
{
    return level > 0 ? labels_[static_cast<std::size_t>(level) - 1] : std::string_view{};
}

void Level_Finder::Sort_Values()
{
    values_ = Level_Table(*factor_);
    std::int32_t level = 0;
    for (const double value : values_)
        if (++level; std::isfinite(value))
            near_values_.emplace_back(value, level);
    std::ranges::sort(near_values_);
}

std::int32_t Level_Finder::Nearest(double value)
{
    if (values_.empty())
        Sort_Values();
    const auto first_of = [this](double wanted) {
        return std::ranges::lower_bound(near_values_, wanted, {}, &std::pair<double, std::int32_t>::first);
    };
    const auto above = first_of(value);
    const auto below = above == near_values_.begin() ? above : first_of(std::prev(above)->first);
    const auto away = [&](auto place) {
        return place == near_values_.end() ? HUGE_VAL : std::fabs(place->first - value);
    };
    if (!(away(above) < HUGE_VAL) && !(away(below) < HUGE_VAL))
        return 0;
    if (away(above) == away(below))
        return std::min(above->second, below->second);
    return away(above) < away(below) ? above->second : below->second;
}

namespace {

/// The least level of the labels from `first` on that begin as `starts` says.
template <class Place, class Starts> std::int32_t First_Level(Place first, Place end, Starts starts)
{
    std::int32_t least = 0;
    for (; first != end && starts(first->text); ++first)
        least = least == 0 ? first->level : std::min(least, first->level);
    return least;
}

}  // namespace

void Level_Finder::Sort_Labels()
{
    std::int32_t level = 0;
    for (const Level_Node* label = factor_->labels; label != nullptr; label = label->next) {
        labels_.push_back(label->Text());
        exact_.push_back({label->Text(), ++level});
    }
    case_free_ = exact_;
    std::ranges::stable_sort(exact_, {}, &Label::text);
    std::ranges::stable_sort(case_free_, Less_Folded, &Label::text);
}

std::int32_t Level_Finder::Sharing_Most_Of_Its_Start(std::string_view text) const
{
    const auto common = [&](auto place) { return Common_Letters(place->text, text); };
    const auto behind = std::ranges::lower_bound(exact_, text, {}, &Label::text);
    auto best = behind;
    if (behind == exact_.end() || (behind != exact_.begin() && common(std::prev(behind)) > common(behind)))
        --best;
    const std::size_t longest = common(best);
    const bool shared = (best != exact_.begin() && common(std::prev(best)) == longest)
                        || (std::next(best) != exact_.end() && common(std::next(best)) == longest);
    return longest == 0 || shared ? 0 : best->level;
}

std::int32_t Level_Finder::Of_Exact_Label(std::string_view text)
{
    if (labels_.empty())
        Sort_Labels();
    const auto found = std::ranges::lower_bound(exact_, text, {}, &Label::text);
    return found != exact_.end() && found->text == text ? found->level : 0;
}

std::int32_t Level_Finder::Of_Label(std::string_view text)
{
    if (const std::int32_t level = text.empty() ? 0 : Of_Exact_Label(text); level > 0)
        return level;
    if (text.empty() || exact_.empty())
        return 0;
    const auto found = std::ranges::lower_bound(exact_, text, {}, &Label::text);
    const auto alike = std::ranges::lower_bound(case_free_, text, Less_Folded, &Label::text);
    if (alike != case_free_.end() && Equal_Folded(alike->text, text))
        return alike->level;
    const auto begins = [&](std::string_view label) { return label.starts_with(text); };
    if (const std::int32_t level = First_Level(found, exact_.end(), begins); level > 0)
        return level;
    const auto begins_alike = [&](std::string_view label) { return Starts_Folded(label, text); };
    if (const std::int32_t level = First_Level(alike, case_free_.end(), begins_alike); level > 0)
        return level;
    return Sharing_Most_Of_Its_Start(text);
}

}  // namespace ingester

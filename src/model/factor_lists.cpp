#include "model/factor_lists.h"

#include "model/number_format.h"
#include "request/losses.h"
#include "support/number_text.h"

namespace ingester {

namespace {

constexpr std::int32_t Most_Plain_Levels = 65535;

bool Set_Values(Column& factor, std::span<const double> values, std::int32_t count)
{
    std::size_t next = 0;
    return Put_Level_Values(factor, values.empty() ? 0 : count, [&] {
        const std::size_t index = next++;
        return index < values.size() ? values[index] : static_cast<double>(index + 1);
    });
}

bool Set_Labels(Column& factor, const Factor_Lists& lists, std::int32_t count)
{
    char room[Number_Text_Room];
    std::size_t next = 0;
    return Put_Labels(factor, lists.labels.empty() ? 0 : count, [&] {
        const std::size_t index = next++;
        return factor.texts.Store(
            index < lists.labels.size()
                ? First_Letters(lists.labels[index], lists.label_width)
                : Factor_Label_Or_Level(factor, static_cast<std::int32_t>(index) + 1, room));
    });
}

void Note_Cut_Labels(const Column& factor, const Factor_Lists& lists)
{
    for (const std::string_view label : lists.labels)
        if (Has_More_Letters(label, lists.label_width))
            Note_Loss(Loss_Kind::text_cut, factor.name, 0, label);
}

}  // namespace

std::int32_t Factor_Kind_Of(const Column& factor)
{
    return factor.label_count > 0          ? factor_with_labels
           : factor.level_values_count > 0 ? factor_with_levels
                                           : plain_factor;
}

bool Set_Levels(Column& factor, const Factor_Lists& lists)
{
    const auto listed = static_cast<std::int32_t>(std::max(lists.values.size(), lists.labels.size()));
    Free_Cell_Nodes(&factor, label_nodes);
    factor.label_width = 0;
    factor.nlevels = listed > 0 ? listed : std::clamp(lists.plain_levels, 1, Most_Plain_Levels);
    factor.factor_kind = lists.values.empty() ? plain_factor : factor_with_levels;
    if (!Set_Values(factor, lists.values, listed) || !Set_Labels(factor, lists, listed))
        return false;
    factor.factor_kind = Factor_Kind_Of(factor);
    Note_Cut_Labels(factor, lists);
    return true;
}

}  // namespace ingester

// The levels of a Factor, from lists that somebody else has made.
#pragma once

#include "model/sheet.h"
#include "support/letters.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>

namespace ingester {

/// Letters of the longest label.
constexpr std::size_t Long_Label_Width = 250;

/// Replaces a Factor's level values by `count` that `next` hands out in turn; with none, by no list.
/// False for want of memory.
template <class Next> [[nodiscard]] bool Put_Level_Values(Column& factor, std::int32_t count, Next next)
{
    if (count < 1) {
        Free_Cell_Nodes(&factor, level_value_nodes);
        return true;
    }
    if (!Make_Level_Values(factor, count))
        return false;
    for (Level_Node* node = factor.level_values; node != nullptr; node = node->next)
        node->value.number = next();
    return true;
}

/// The same for the labels, which an arena keeps that lives as long as the Factor. `label_width` becomes that
/// of the widest where it is less.
template <class Next> [[nodiscard]] bool Put_Labels(Column& factor, std::int32_t count, Next next)
{
    if (count < 1) {
        Free_Cell_Nodes(&factor, label_nodes);
        return true;
    }
    if (!Make_Labels(factor, count))
        return false;
    std::int32_t widest = std::max(factor.label_width, 0);
    for (Level_Node* node = factor.labels; node != nullptr; node = node->next) {
        node->value.text = next();
        widest = Wider(widest, node->Text());
    }
    factor.label_width = widest;
    return true;
}

[[nodiscard]] inline bool Put_Level_Values(Column& factor, std::span<const double> values)
{
    return Put_Level_Values(factor, static_cast<std::int32_t>(values.size()),
                            [value = values.begin()]() mutable { return *value++; });
}

[[nodiscard]] inline bool Put_Labels(Column& factor, std::span<const char* const> stored)
{
    return Put_Labels(factor, static_cast<std::int32_t>(stored.size()),
                      [label = stored.begin()]() mutable { return *label++; });
}

/// What a Factor prints as: the first of labels, level values and level numbers that it has.
[[nodiscard]] std::int32_t Factor_Kind_Of(const Column& factor);

/// The levels of a Factor as a file tells them; either list may be empty.
struct Factor_Lists {
    std::span<const double> values = {};
    std::span<const std::string_view> labels = {};
    std::int32_t plain_levels = 1;               ///< how many there are where both lists are empty
    std::size_t label_width = Long_Label_Width;  ///< longer labels are cut
};

/// Gives a Factor these levels, in the place of those that it has: `nlevels`, both lists, `factor_kind` and
/// `label_width`. Of two lists the shorter one is filled up, values by the level's number and labels by what
/// the level would print as without. Labels that are cut are entered in the ledger. Memory goes by the lists,
/// whatever `plain_levels` claims. False for want of it.
[[nodiscard]] bool Set_Levels(Column& factor, const Factor_Lists& lists);

}  // namespace ingester

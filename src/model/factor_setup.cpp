#include "model/factor_setup.h"

#include "model/number_format.h"
#include "request/messages.h"
#include "support/number_text.h"

#include <algorithm>
#include <string_view>

namespace ingester {

namespace {

constexpr int Value_Digits = 12;

double Position_Behind(const std::vector<double>& table)
{
    return static_cast<double>(table.size() + 1);
}

std::string_view Print_Position(char* target, std::size_t position)
{
    return {target, Print_Integer(target, static_cast<std::int64_t>(position))};
}

void Setup_Values(Factor_Setup& setup, std::size_t nlevels)
{
    if (setup.values.empty() && setup.column != nullptr)
        for (const Level_Node* node = setup.column->level_values;
             node != nullptr && setup.values.size() < nlevels; node = node->next)
            setup.values.push_back(node->value.number);
    while (setup.values.size() < nlevels)
        setup.values.push_back(Position_Behind(setup.values));
}

void Grow_Labels(Factor_Setup& setup, std::size_t nlevels)
{
    char text[Number_Text_Room];
    while (setup.labels.size() < nlevels)
        setup.labels.emplace_back(Print_Position(text, setup.labels.size() + 1));
    if (setup.labels.front().empty())
        setup.labels.front() = "1";
}

/// Labels from the Column's labels, else from level values, else from positions.
void Make_New_Labels(Factor_Setup& setup, std::size_t nlevels)
{
    char text[Number_Text_Room];
    const Column* const column = setup.column;
    const Level_Node* label = column != nullptr ? column->labels : nullptr;
    const Level_Node* value = column != nullptr && label == nullptr ? column->level_values : nullptr;
    while (setup.labels.size() < nlevels) {
        const std::size_t index = setup.labels.size();
        if (label != nullptr) {
            setup.labels.emplace_back(label->Text());
            label = label->next;
        } else if (value != nullptr) {
            char* const end = Format_Cell_Number(text, *column, value->value.number);
            setup.labels.emplace_back(std::string_view(text, end));
            value = value->next;
        } else if (column == nullptr && index < setup.values.size()) {
            char* const end = Print_General(text, setup.values[index], Value_Digits);
            setup.labels.emplace_back(std::string_view(text, end));
        } else {
            setup.labels.emplace_back(Print_Position(text, index + 1));
        }
    }
}

}  // namespace

bool Setup_Factor_Data(Factor_Setup& setup, bool text_side)
{
    setup.dirty = false;
    if (setup.column == nullptr && setup.nlevels < 1)
        return Fail("Internal Spreadsheet Error: NULL factor data pointer in Setup_Factor_Data.\n");
    const auto nlevels = static_cast<std::size_t>(std::max(setup.nlevels, 0));
    if (!text_side || !setup.values.empty())
        Setup_Values(setup, nlevels);
    if (!setup.labels.empty())
        Grow_Labels(setup, nlevels);
    else if (text_side)
        Make_New_Labels(setup, nlevels);
    if (setup.order.empty())
        return true;
    setup.order.resize(std::max(setup.order.size(), nlevels));
    for (std::size_t i = 0; i < setup.order.size(); ++i)
        if (setup.order[i] == 0)
            setup.order[i] = static_cast<double>(i + 1);
    return true;
}

}  // namespace ingester

#include "model/level_tables.h"

#include <cmath>

namespace ingester {

std::vector<double> Level_Table(const Column& column)
{
    std::vector<double> values;
    for (const Level_Node* node = column.level_values; node != nullptr; node = node->next)
        values.push_back(node->value.number);
    return values;
}

std::vector<const char*> Label_Table(const Column& column)
{
    std::vector<const char*> labels;
    for (const Level_Node* node = column.labels; node != nullptr; node = node->next)
        labels.push_back(node->value.text == nullptr ? Text_Arena::Empty() : node->value.text);
    return labels;
}

bool Is_Level_Number(double number)
{
    constexpr double greatest = 65535;
    return number >= 1.0 && number <= greatest && number == std::floor(number);
}

}  // namespace ingester

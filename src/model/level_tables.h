// A Factor's lists as tables: lists are no place for look-ups cell by cell.
#pragma once

#include "model/sheet.h"

#include <cstddef>
#include <vector>

namespace ingester {

/// The level values of a Factor, by level from 1 at 0.
[[nodiscard]] std::vector<double> Level_Table(const Column& column);

/// The stored texts of its labels.
[[nodiscard]] std::vector<const char*> Label_Table(const Column& column);

/// What stands for a cell's level in `table`; `otherwise` for a level that it doesn't hold.
template <class Value> Value Of_Level(const std::vector<Value>& table, double level, Value otherwise)
{
    return level >= 1.0 && level < static_cast<double>(table.size()) + 1.0
               ? table[static_cast<std::size_t>(level) - 1]
               : otherwise;
}

/// Whether a number can be a level's of a Factor without lists: whole, from 1 to 65535.
[[nodiscard]] bool Is_Level_Number(double number);

}  // namespace ingester

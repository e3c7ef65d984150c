// Columns by name, for many look-ups.
#pragma once

#include "model/sheet.h"

#include <string>
#include <string_view>
#include <unordered_map>

namespace ingester {

/// Finds what `Find_Column` finds, however wide the Sheet is; and each Column once, since one Column takes
/// no more than one other.
class Column_Index {
public:
    explicit Column_Index(const Sheet& sheet);

    /// The Column of that name, which isn't given out again; null for none.
    [[nodiscard]] Column* Take(std::string_view name);

    /// Leaves a Column out of what is given out.
    void Remove(const Column& column);

private:
    std::unordered_map<std::string, Column*> columns_;
};

}  // namespace ingester

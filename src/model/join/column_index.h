// Columns by name, for many look-ups.
#pragma once

#include "model/names.h"

#include <cstddef>
#include <functional>
#include <string_view>
#include <unordered_map>

namespace ingester {

/// Finds what `Find_Column` finds, however wide the Sheet is; and each Column once, since one Column takes
/// no more than one other. Columns keep their names as long as it lives.
class Column_Index {
public:
    explicit Column_Index(const Sheet& sheet);

    /// The Column of that name, which isn't given out again; null for none.
    [[nodiscard]] Column* Take(std::string_view name);

    /// Leaves a Column out of what is given out.
    void Remove(const Column& column);

private:
    struct Parts_Hash {
        std::size_t operator()(const Telling_Parts& parts) const
        {
            const std::hash<std::string_view> hash;
            return hash(parts.stem) + 31 * hash(parts.suffix);
        }
    };

    std::unordered_map<Telling_Parts, Column*, Parts_Hash> columns_;
};

}  // namespace ingester

// The columns that a request keeps, by their names or by their places.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <functional>
#include <string>
#include <string_view>
#include <unordered_set>

namespace ingester {

/// The request's list of columns, made ready for being looked up.
class Column_Subset {
public:
    Column_Subset();

    /// Whether the column of that place (from 1) and name goes on. Without a list, every column does. A
    /// name of the list may be spelled as in the file, or as the host accepts it.
    [[nodiscard]] bool Keeps(std::int32_t ordinal, std::string_view name) const;

private:
    struct Text_Hash {
        using is_transparent = void;
        std::size_t operator()(std::string_view text) const { return std::hash<std::string_view>{}(text); }
    };

    std::unordered_set<long> numbers_;
    std::unordered_set<std::string, Text_Hash, std::equal_to<>> names_;
};

/// Leaves the request's columns in a Sheet. The leading Factors of a Table stay, since its cells belong to
/// them. False when no data column is left.
bool Keep_Column_Subset(Sheet* sheet);

/// Tells the names of the list that the Sheet doesn't have.
void Tell_Missing_Columns(const Sheet& sheet);

}  // namespace ingester

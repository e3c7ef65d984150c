// Keys of a merge, in terms that can be compared.
#pragma once

#include "model/join/cell_transfer.h"
#include "model/join/merge.h"
#include "model/sort.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <span>
#include <vector>

namespace ingester {

/// Where two rows stand to each other.
enum class Key_Order : std::int32_t {
    equal = 0,
    above = 1,  ///< the first one
    below = 2,
    second_ended = 3,  ///< there is no such row of the second Sheet
    first_ended = 4,
};

/// Compares two rows key by key, the first difference decides; numbers within `tolerance` are equal.
/// Keys before `key` are taken to be equal; it becomes the one that differs, or the number of keys.
[[nodiscard]] Key_Order Compare_Key_Rows(std::span<const Sort_Key> a, std::span<const Sort_Key> b,
                                         std::size_t row_a, std::size_t row_b, double tolerance,
                                         bool ignore_case, std::size_t& key);

/// The keys of both Sheets, by row, and the ways in which keys of new rows go from one to the other.
struct Merge_Keys {
    std::vector<Sort_Key> target;
    std::vector<Sort_Key> source;
    std::array<Cell_Transfer, Most_Merge_Keys> transfers;
};

/// Checks the pairs of key columns and makes them comparable. False after a message.
[[nodiscard]] bool Make_Merge_Keys(const Merge_Request& wanted, Merge_Keys& keys);

}  // namespace ingester

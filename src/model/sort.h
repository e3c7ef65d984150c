// Rows in the order of keys.
#pragma once

#include "model/sheet.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace ingester {

/// How a Factor sorts; by its level numbers where it has not what is asked for.
enum class Factor_Mode : std::int32_t { level_number = 0, level_value = 1, label = 2 };

struct Sort_Request {
    Sheet* sheet = nullptr;
    bool ascending = true;
    bool ignore_case = false;
    bool trim_keys = false;               ///< outer blanks of text keys don't count
    std::vector<std::int32_t> key_index;  ///< of the key columns, the main one first
    Factor_Mode factor_mode = Factor_Mode::level_number;
};

/// What the rows of one key are compared by: a number each, or a stored text.
struct Sort_Key {
    std::vector<double> numbers;     ///< none for a text key
    std::vector<const char*> texts;  ///< none for a numeric key
    std::size_t width = Text_Cell_Width;
    bool trimmed = false;

    [[nodiscard]] std::size_t Rows() const { return numbers.empty() ? texts.size() : numbers.size(); }
    [[nodiscard]] std::string_view Text(std::size_t row) const;

    /// How far in front of a walk in sorted order, which jumps about in memory, keys are brought near.
    static constexpr std::size_t ahead = 12;
    void Prefetch(std::size_t soon, std::size_t later) const
    {
        if (texts.empty()) {
            __builtin_prefetch(&numbers[soon]);
            return;
        }
        __builtin_prefetch(texts[soon]);
        __builtin_prefetch(&texts[later]);
    }
};

/// The first `rows` cells of a column as a key. Cells that it hasn't are missing, NaN is so as well.
[[nodiscard]] Sort_Key Make_Sort_Key(const Column& column, std::size_t rows, Factor_Mode mode);

/// The rows from 0, sorted by at most 255 keys of one length; rows with equal keys stay in their order.
/// `parted_by` has, for each place in that order, the first key in which its row differs from the row before,
/// or the number of keys where none does.
[[nodiscard]] std::vector<std::uint32_t> Sorted_Rows(std::span<const Sort_Key> keys, bool ascending,
                                                     bool ignore_case,
                                                     std::vector<std::uint8_t>* parted_by = nullptr);

/// The rows of a Sheet that may be moved: all, but for the last one of a small Table with margins.
[[nodiscard]] std::int32_t Movable_Rows(const Sheet& sheet);

/// Sorts the rows of a Sheet; those with equal keys keep their order in both directions. Nothing to do,
/// and true, without keys and for Scalars. False for a Symmetric Matrix, no rows, or no such column.
bool Sort_Sheet(const Sort_Request& wanted);

}  // namespace ingester

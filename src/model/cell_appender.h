// Columns whose length is known only when their last cell has come.
#pragma once

#include "model/sheet.h"
#include "platform/memory_ahead.h"

#include <cstddef>
#include <cstdint>
#include <vector>

namespace ingester {

/// Puts cells behind each other in a Column that has none yet. The nodes are linked as they are
/// filled, so that each is touched once; nodes that stay unused cost address space only.
class Cell_Appender {
public:
    /// `expected` cells go into the first block, which `ahead` makes ready; more may come.
    Cell_Appender(Column& column, std::int64_t expected, Memory_Ahead* ahead = nullptr)
        : column_(&column), block_size_(expected), ahead_(ahead)
    {}

    /// Puts the next cells into tiles of a block that somebody else owns: `tiles` of `tile_size` nodes, each
    /// of them `stride` nodes behind the one before.
    void Go_On_In_Tiles(Cell_Node* first, std::size_t tiles, std::size_t tile_size, std::size_t stride);

    /// Throws std::bad_alloc, after the message, when there is no room.
    Cell_Node& Append(Cell_Value value)
    {
        if (next_ == block_end_) [[unlikely]]
            Add_Block();
        Cell_Node* const cell = next_++;
        cell->prev = last_;
        cell->next = next_;
        cell->value = value;
        last_ = cell;
        return *cell;
    }

    /// Puts `count` cells without data behind each other: empty texts, or the Sheet's missing value. Throws
    /// as `Append` does.
    void Append_Missing(std::int64_t count = 1);

    /// The cell appended last.
    [[nodiscard]] Cell_Node& Last() { return *last_; }

    /// Has the next node brought near.
    void Prefetch() const { __builtin_prefetch(next_, 1); }

    /// Ends the list behind cell number `length`, which is the last one or the one before it.
    void Finish(std::int32_t length);

private:
    void Go_On_In(Cell_Node* nodes, std::size_t count);
    void Add_Block();

    Column* column_;
    std::int64_t block_size_;
    Memory_Ahead* ahead_;
    std::int64_t appended_ = 0;  ///< nodes in all blocks
    Cell_Node* next_tile_ = nullptr;
    std::size_t tiles_left_ = 0;
    std::size_t tile_size_ = 0;
    std::size_t tile_stride_ = 0;
    Cell_Node* next_ = nullptr;
    Cell_Node* block_end_ = nullptr;
    Cell_Node* last_ = nullptr;
};

/// Appenders for the columns from `first` on, of `expected` cells each. Short columns share one block, in
/// which some rows of all columns lie together: a wide sheet is filled row by row, and would else touch more
/// pages with each row than a processor remembers.
[[nodiscard]] std::vector<Cell_Appender> Make_Appenders(Sheet& sheet, Column* first, std::int64_t expected,
                                                        Memory_Ahead* ahead = nullptr);

}  // namespace ingester

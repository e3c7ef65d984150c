// Columns whose length is known only when their last cell has come.
#pragma once

#include "model/sheet.h"

#include <cstdint>

namespace ingester {

/// Puts cells behind each other in a Column that has none yet. The nodes are linked as they are
/// filled, so that each is touched once; nodes that stay unused cost address space only.
class Cell_Appender {
public:
    /// `expected` cells go into the first block; more may come.
    Cell_Appender(Column& column, std::int64_t expected) : column_(&column), block_size_(expected) {}

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

    /// The cell appended last.
    [[nodiscard]] Cell_Node& Last() { return *last_; }

    /// Ends the list behind cell number `length`, which is the last one or the one before it.
    void Finish(std::int32_t length);

private:
    void Add_Block();

    Column* column_;
    std::int64_t block_size_;
    std::int64_t appended_ = 0;  ///< in the blocks before the last
    Cell_Node* next_ = nullptr;
    Cell_Node* block_end_ = nullptr;
    Cell_Node* last_ = nullptr;
};

}  // namespace ingester

#include "model/cell_appender.h"

#include "interface/request/messages.h"
#include "platform/folders.h"

#include <algorithm>
#include <cstdlib>
#include <new>

namespace ingester {

void Cell_Appender::Add_Block()
{
    constexpr std::int64_t least_size = 64;
    constexpr auto greatest_size = static_cast<std::int64_t>(Cell_Nodes_Per_Block);
    const auto size = static_cast<std::size_t>(std::clamp(block_size_, least_size, greatest_size));
    void* const block = std::malloc(size * sizeof(Cell_Node));
    if (block == nullptr) {
        Report_Message("Ingester out of memory.\n");
        throw std::bad_alloc();
    }
    column_->blocks.emplace_back(block);
    Advise_Large_Pages(block, size * sizeof(Cell_Node));
    next_ = static_cast<Cell_Node*>(block);
    block_end_ = next_ + size;
    if (last_ == nullptr)
        column_->first_cell = next_;
    else
        last_->next = next_;
    appended_ += static_cast<std::int64_t>(size);
    block_size_ = appended_;  // the length doubles, so blocks stay few
}

void Cell_Appender::Finish(std::int32_t length)
{
    if (length < 1 || last_ == nullptr) {
        column_->first_cell = column_->last_cell = nullptr;
        column_->length = 0;
        return;
    }
    const std::int64_t unused = block_end_ - next_;
    if (appended_ - unused > length)
        last_ = last_->prev;
    last_->next = nullptr;
    column_->last_cell = last_;
    column_->length = length;
}

}  // namespace ingester

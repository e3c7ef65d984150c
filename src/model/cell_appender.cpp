#include "model/cell_appender.h"

#include "interface/request/messages.h"
#include "platform/refusals.h"

#include <algorithm>
#include <new>

namespace ingester {

namespace {

constexpr std::int64_t Least_Block = 8;

/// A block of nodes for `blocks` to own. Throws std::bad_alloc after the message.
Cell_Node* New_Block(Block_Table& blocks, std::size_t count)
{
    blocks.emplace_back();  // room for the owner comes first
    blocks.back().reset(Take_Memory(nullptr, count * sizeof(Cell_Node)));
    if (blocks.back() == nullptr) {
        Report_Message("Ingester out of memory.\n");
        throw std::bad_alloc();
    }
    return static_cast<Cell_Node*>(blocks.back().get());
}

}  // namespace

void Cell_Appender::Go_On_In(Cell_Node* nodes, std::size_t count)
{
    next_ = nodes;
    block_end_ = nodes + count;
    if (last_ == nullptr)
        column_->first_cell = nodes;
    else
        last_->next = nodes;
    appended_ += static_cast<std::int64_t>(count);
    block_size_ = appended_;  // the length doubles, so blocks stay few
}

void Cell_Appender::Add_Block()
{
    constexpr auto greatest = static_cast<std::int64_t>(Cell_Nodes_Per_Block);
    const auto count = static_cast<std::size_t>(std::clamp(block_size_, Least_Block, greatest));
    Go_On_In(New_Block(column_->blocks, count), count);
}

std::vector<Cell_Appender> Make_Appenders(Sheet& sheet, Column* first, std::int64_t expected)
{
    constexpr std::int64_t short_column = 20000;
    constexpr std::int32_t many_columns = 64;
    const std::int32_t columns = first == nullptr ? 0 : sheet.column_count + 1 - first->index;
    std::vector<Cell_Appender> appenders;
    const auto count = static_cast<std::size_t>(expected);
    const bool shared = columns >= many_columns && expected < short_column;
    Cell_Node* nodes =
        shared ? New_Block(sheet.shared_blocks, count * static_cast<std::size_t>(columns)) : nullptr;
    for (Column* column = first; column != nullptr; column = column->next) {
        appenders.emplace_back(*column, expected);
        if (shared) {
            appenders.back().Go_On_In(nodes, count);
            nodes += count;
        }
    }
    return appenders;
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

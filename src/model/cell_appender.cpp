#include "model/cell_appender.h"

#include "platform/refusals.h"
#include "request/messages.h"

#include <algorithm>
#include <new>
#include <utility>

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

void Cell_Appender::Go_On_In_Tiles(Cell_Node* first, std::size_t tiles, std::size_t tile_size,
                                   std::size_t stride)
{
    next_tile_ = first;
    tiles_left_ = tiles;
    tile_size_ = tile_size;
    tile_stride_ = stride;
}

void Cell_Appender::Add_Block()
{
    if (tiles_left_ > 0) {
        --tiles_left_;
        Go_On_In(std::exchange(next_tile_, next_tile_ + tile_stride_), tile_size_);
        return;
    }
    constexpr auto greatest = static_cast<std::int64_t>(Cell_Nodes_Per_Block);
    const auto count = static_cast<std::size_t>(std::clamp(block_size_, Least_Block, greatest));
    Cell_Node* const nodes = New_Block(column_->blocks, count);
    if (ahead_ != nullptr && appended_ == 0)
        ahead_->Expect(nodes, count * sizeof(Cell_Node));
    Go_On_In(nodes, count);
}

std::vector<Cell_Appender> Make_Appenders(Sheet& sheet, Column* first, std::int64_t expected,
                                          Memory_Ahead* ahead)
{
    constexpr std::int64_t short_column = 20000;
    constexpr std::size_t many_columns = 64;
    constexpr std::size_t tile_size = 16;
    std::vector<Cell_Appender> appenders;
    for (Column* column = first; column != nullptr; column = column->next)
        appenders.emplace_back(*column, expected, ahead);
    const std::size_t columns = appenders.size();
    if (columns < many_columns || expected >= short_column || expected < 1)
        return appenders;
    const std::size_t tiles = (static_cast<std::size_t>(expected) + tile_size - 1) / tile_size;
    const std::size_t stride = columns * tile_size;
    Cell_Node* tile = New_Block(sheet.shared_blocks, tiles * stride);
    if (ahead != nullptr)
        ahead->Expect(tile, tiles * stride * sizeof(Cell_Node), columns);
    for (Cell_Appender& cells : appenders) {
        cells.Go_On_In_Tiles(tile, tiles, tile_size, stride);
        tile += tile_size;
    }
    return appenders;
}

void Cell_Appender::Append_Missing(std::int64_t count)
{
    Cell_Value blank;
    if (Is_Text_Like(column_->type))
        blank.text = Text_Arena::Empty();
    else
        blank.number = column_->sheet->missing_value;
    for (std::int64_t i = 0; i < count; ++i)
        Append(blank);
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

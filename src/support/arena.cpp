#include "support/arena.h"

#include <algorithm>

namespace ingester {

void Text_Arena::Add_Chunk(std::size_t needed)
{
    const std::size_t size = std::max(needed, next_chunk_);
    chunks_.push_back(std::make_unique_for_overwrite<char[]>(size));
    free_ = chunks_.back().get();
    room_ = size;
    next_chunk_ = std::min(next_chunk_ + next_chunk_ / 2, greatest_chunk);
}

}  // namespace ingester

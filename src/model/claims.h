// What a file says of its own size, held against the bytes that it has.
#pragma once

#include <algorithm>
#include <cstdint>
#include <limits>

namespace ingester {

/// A table of fewer cells than this is never refused; above, most of its cells must be there.
constexpr std::int64_t Always_Allowed_Cells = 40'000'000;

/// What a byte of a plain file may stand for; of one that packs its cells it may be more.
constexpr std::int64_t Cells_Per_Byte = 2;

/// The most rows that a file of `bytes` may claim for its `columns` columns.
[[nodiscard]] constexpr std::int64_t Most_Rows(std::int64_t columns, std::int64_t bytes,
                                               std::int64_t cells_per_byte = Cells_Per_Byte)
{
    constexpr std::int64_t greatest = std::numeric_limits<std::int32_t>::max();
    const std::int64_t by_bytes = bytes > std::numeric_limits<std::int64_t>::max() / cells_per_byte
                                      ? std::numeric_limits<std::int64_t>::max()
                                      : bytes * cells_per_byte;
    return std::min(std::max(Always_Allowed_Cells, by_bytes) / std::max<std::int64_t>(columns, 1), greatest);
}

/// Whether a table that a file of `bytes` claims may be made: nothing below 0, and not so many cells that a
/// few hostile bytes could ask for any memory.
[[nodiscard]] constexpr bool Claim_Is_Acceptable(std::int64_t rows, std::int64_t columns, std::int64_t bytes,
                                                 std::int64_t cells_per_byte = Cells_Per_Byte)
{
    constexpr std::int64_t always_allowed_columns = 1 << 16;
    return rows >= 0 && columns >= 0 && columns <= std::max(always_allowed_columns, bytes)
           && rows <= Most_Rows(columns, bytes, cells_per_byte);
}

}  // namespace ingester

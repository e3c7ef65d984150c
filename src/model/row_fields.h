// What the host's window keeps by the number of a row, when rows change their places.
//
// `new_rows` says, for each row (from 0) that there was, the row that it has become, below 0 for one that is
// gone. Rows beyond are gone as well.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <span>
#include <string>
#include <vector>

namespace ingester {

/// Gives colours the new rows of their cells.
void Move_Cell_Colours(std::vector<Cell_Colour>& colours, std::span<const std::int32_t> new_rows);

/// A bit for each of `rows` rows, from a bit for each row that there was.
[[nodiscard]] std::string Moved_Bits(const std::string& bits, std::span<const std::int32_t> new_rows,
                                     std::int32_t rows);

/// Whether a Sheet has any of them.
[[nodiscard]] bool Has_Row_Fields(const Sheet& sheet);

/// Both for a Sheet that has its new rows already: the colours of its cells and its saved restrictions.
void Move_Row_Fields(Sheet& sheet, std::span<const std::int32_t> new_rows);

}  // namespace ingester

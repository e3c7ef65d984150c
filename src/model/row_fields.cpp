#include "model/row_fields.h"

#include <algorithm>

namespace ingester {

void Move_Cell_Colours(std::vector<Cell_Colour>& colours, std::span<const std::int32_t> new_rows)
{
    std::erase_if(colours, [&](Cell_Colour& colour) {
        const bool known = colour.row >= 1 && colour.row <= std::ssize(new_rows);
        const std::int32_t row = known ? new_rows[static_cast<std::size_t>(colour.row) - 1] : -1;
        colour.row = row + 1;
        return row < 0;
    });
}

std::string Moved_Bits(const std::string& bits, std::span<const std::int32_t> new_rows, std::int32_t rows)
{
    std::string moved(static_cast<std::size_t>(rows) / 8 + 1, '\0');
    const std::size_t known = std::min(new_rows.size(), bits.size() * 8);
    for (std::size_t from = 0; from < known; ++from) {
        if (new_rows[from] < 0 || new_rows[from] >= rows)
            continue;
        const auto to = static_cast<std::size_t>(new_rows[from]);
        if ((static_cast<unsigned char>(bits[from / 8]) >> from % 8 & 1U) != 0)
            moved[to / 8] = static_cast<char>(moved[to / 8] | 1 << to % 8);
    }
    return moved;
}

bool Has_Row_Fields(const Sheet& sheet)
{
    bool any = !sheet.saved_restrictions.empty();
    for (const Column* column = sheet.first_column; column != nullptr && !any; column = column->next)
        any = !column->cell_colours.empty();
    return any;
}

void Move_Row_Fields(Sheet& sheet, std::span<const std::int32_t> new_rows)
{
    for (Saved_Restriction& saved : sheet.saved_restrictions)
        saved.bits = Moved_Bits(saved.bits, new_rows, sheet.row_count);
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        Move_Cell_Colours(column->cell_colours, new_rows);
}

}  // namespace ingester

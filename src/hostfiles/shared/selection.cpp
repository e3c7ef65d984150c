#include "hostfiles/shared/selection.h"

#include "model/names.h"
#include "model/row_fields.h"
#include "request/request.h"

#include <algorithm>
#include <vector>

namespace ingester {

std::string Valid_Name_Of_No_Column(std::string_view name)
{
    std::string valid = Make_Valid_Name(name);
    Remember_Bracket_Text({});
    return valid;
}

bool Is_Column_Selected(const Column_Subset& subset, std::int32_t ordinal, std::string_view name)
{
    return subset.Keeps(ordinal, request.Subset_By_Number ? std::string() : Valid_Name_Of_No_Column(name));
}

bool Select_Symmetric(Sheet& sheet)
{
    if (sheet.type != symmetric_matrix_sheet || (!request.Subset_Columns && !request.Subset_Rows))
        return true;
    const Row_Selection rows{request.Subset_Rows, request.Subset_Row_Flags};
    const Column_Subset columns;
    std::vector<std::int32_t> left_out;
    std::vector<std::int32_t> new_rows;
    for (std::int32_t row = 0; row < sheet.row_count; ++row) {
        const Column* const column = Column_At(&sheet, sheet.leading_columns + row);
        const bool named = column == nullptr || Is_Column_Selected(columns, column->index, column->name);
        const bool kept = named && rows.Keeps(row);
        new_rows.push_back(kept ? row - static_cast<std::int32_t>(left_out.size()) : -1);
        if (!kept)
            left_out.push_back(row);
    }
    if (static_cast<std::int32_t>(left_out.size()) == sheet.row_count)
        return false;
    for (; !left_out.empty(); left_out.pop_back())
        Delete_Row(&sheet, left_out.back(), sheet.leading_columns + left_out.back() <= sheet.column_count);
    Move_Row_Fields(sheet, new_rows);
    return true;
}

}  // namespace ingester

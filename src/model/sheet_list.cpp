#include "model/sheet_list.h"

#include "model/sheet.h"

#include <cstdint>

namespace ingester {

bool Make_Sheet_List(const std::vector<std::string>& names)
{
    const auto count = static_cast<std::int32_t>(names.size());
    Column* const column = New_Data_Column(New_Sheet_With_Rows(count), text_column, "Worksheets", count);
    if (column == nullptr)
        return false;
    const std::string* name = names.data();
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
        Set_Text(*column, *cell, *name++);
    Compute_Column_Width(column);
    return true;
}

}  // namespace ingester

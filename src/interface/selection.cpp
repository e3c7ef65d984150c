#include "interface/selection.h"

#include "interface/request/messages.h"

namespace ingester {

bool Delete_Empty_Rows(Sheet* sheet)
{
    if (sheet == nullptr)
        return false;
    const std::int32_t empty = Find_Empty_Rows(sheet, true);
    if (empty == 0)
        return true;
    if (empty == sheet->row_count)
        Report_Message("Warning: All rows in the input file are empty.\n"
                       "Use KEEPEMTPY=rows to return the empty rows.\n");
    for (std::int32_t index = 0; index < sheet->row_count;) {
        const Row_Node* const row = Row_At(sheet, index);
        if (row->empty == 0 || !Delete_Row(sheet, index, true))
            ++index;
    }
    return true;
}

}  // namespace ingester

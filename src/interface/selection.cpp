#include "interface/selection.h"

#include "interface/format_drivers.h"
#include "model/subset.h"
#include "request/messages.h"
#include "request/request.h"

namespace ingester {

bool Delete_Empty_Rows(Sheet* sheet)
{
    if (sheet == nullptr)
        return false;
    const std::int32_t empty = Find_Empty_Rows(sheet, true);
    if (empty == 0)
        return true;
    if (For_People(People_Rule::sniffed_texts) && empty < sheet->row_count)
        Note_Loss(Loss_Kind::input_unread, {}, 0, "empty rows", empty);
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

Subset_Result Apply_Subset(Sheet* sheet, std::int32_t type)
{
    if (sheet == nullptr)
        return Subset_Result::no_columns;
    const bool host_file = Is_Host_File(type);
    if (request.Subset_Columns && !host_file && !request.Columns_Were_Selected && !Keep_Column_Subset(sheet))
        return Subset_Result::no_columns;
    if (request.Subset_Columns && sheet->column_count < 1)
        return Subset_Result::no_columns;
    Tell_Missing_Columns(*sheet);
    if (request.Subset_Rows && !host_file && !request.Rows_Were_Selected
        && !Keep_Rows(sheet, request.Subset_Row_Flags))
        return Subset_Result::no_rows;
    if (request.Rows_Were_Selected && request.Subset_Rows && sheet->row_count < 1)
        return Subset_Result::no_rows;
    return Subset_Result::kept;
}

bool Keep_Column_Range(Sheet* sheet, std::int32_t first, std::int32_t last)
{
    if (first > last || last < 1)
        return Fail("Error: First column to be kept must be <= Last column.\n");
    if (last > sheet->column_count && last != Every_Column)
        Report_Message_Long("Note: Data contains fewer columns than the specified last column %li.\n", last);
    if (first > sheet->column_count)
        return Fail("Error: Data contains fewer columns than first column to be kept.\n");
    Keep_Columns(sheet, first, last);
    return true;
}

}  // namespace ingester

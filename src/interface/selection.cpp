#include "interface/selection.h"

#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "support/text.h"

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

namespace {

/// Opens a list file, or one of its name in the temporary folder.
bool Open_Var_File(Output_File& file, std::string_view file_name)
{
    return file.Open(file_name)
           || file.Open(Get_Temp_Folder().append(With_Extension(File_Part_Of(file_name), ".VAR")));
}

}  // namespace

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

bool Write_Var_File(const Sheet& sheet, std::string_view file_name)
{
    Output_File file(Output_File::small_buffer);
    if (!Open_Var_File(file, file_name))
        return false;  // silent by design: the list is an extra, the output stands
    const bool named_columns = sheet.type == vector_sheet || sheet.type == scalar_sheet
                               || (sheet.type == table_sheet && sheet.table_ways == 1);
    if (!named_columns) {
        file.Write(Format_Text("1\n%s\n", sheet.structure_name.c_str()));
        return file.Close();
    }
    file.Write(Format_Text("%li\n", static_cast<long>(sheet.column_count)));
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            file.Write(Format_Text("%s\n", column->name.c_str()));
    return file.Close();
}

}  // namespace ingester

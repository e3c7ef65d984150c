// The head of the file, the block of the Sheet's type, and the order of all that follows.
#include "hostfiles/tss/tss_writer.h"

#include "hostfiles/tss/tss.h"
#include "model/names.h"
#include "request/losses.h"
#include "request/messages.h"

#include <algorithm>

namespace ingester {

std::string_view Name_For_File(Fixed_Text<Name_Width>& name)
{
    if (name.empty())
        name = Make_Valid_Name({});
    return name;
}

namespace {

/// The marks of a restriction count as a column. Square and diagonal matrices are refused when they have more
/// columns than the matrix itself and one of labels.
bool Has_Row_Marks(const Sheet& sheet)
{
    const std::int32_t most_with_marks = sheet.type == symmetric_matrix_sheet  ? sheet.row_count
                                         : sheet.type == diagonal_matrix_sheet ? 1
                                                                               : sheet.column_count;
    return sheet.restriction_active != 0 && sheet.column_count <= most_with_marks;
}

void Write_Head(const Sheet& sheet, TSS_Sink& sink)
{
    const Head_Record head = {
        .sheet_type = sheet.type,
        .column_count = sheet.column_count + (Has_Row_Marks(sheet) ? 1 : 0),
        .row_count = sheet.row_count,
        .missing_value = Missing_Value,
        .host_flag_a = sheet.host_flag_a,
        .read_only = sheet.read_only,
        .present_flags = static_cast<std::int32_t>(Present_Flags_Of(sheet)),
    };
    sink.Put(static_cast<std::int32_t>(TSS_Magics[0].word));
    sink.Put(head, Head_Fields);
}

void Write_Table_Block(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(sheet.table_ways);
    sink.Put(std::int32_t{sheet.has_margins});
    if (!Is_Many_Way_Table(sheet))
        return;
    sink.Put(std::int32_t{sheet.has_second_margin});
    sink.Put_Text(Name_For_File(sheet.structure_name));
    sink.Put(Label_State_In_File(sheet));
    sink.Put_Text(Name_For_File(sheet.row_label_name));
}

void Write_Type_Block(Sheet& sheet, TSS_Sink& sink)
{
    if (sheet.type == table_sheet)
        Write_Table_Block(sheet, sink);
    if (sheet.type != matrix_sheet && sheet.type != symmetric_matrix_sheet)
        return;
    sink.Put_Text(Name_For_File(sheet.structure_name));
    sink.Put(Label_State_In_File(sheet));
}

/// False when rows that were put off could not be made.
bool Write_Row_Marks(Sheet& sheet, TSS_Sink& sink)
{
    if (sheet.restriction_active == 0)
        return true;
    if (!Has_Row_Marks(sheet)) {
        Report_Message("Warning: The restriction of the rows is not saved with a matrix that has labels.\n");
        Note_Loss(Loss_Kind::metadata_dropped, {}, 0, "the restriction of the rows");
        return true;
    }
    if (!Need_Rows(&sheet))
        return false;
    sink.Put(Row_Marks_Type);
    sink.Put(sheet.row_count);
    for (const Row_Node* row = sheet.first_row; row != nullptr; row = row->next)
        sink.Put(std::int32_t{row->restricted != 0});
    return true;
}

/// False after a message, when the Sheet can't be written in this format.
bool Check_Writable(Sheet* sheet)
{
    if (sheet == nullptr)
        return Fail("Internal Spreadsheet Error: Null sheet in Save Sheet.\n");
    if (sheet->type == table_sheet && sheet->table_in_columns != 0)
        return Fail("A table in column format cannot be saved in an older TSS format.\n");
    Make_Column_Names_Unique(sheet);
    if (sheet->first_column == nullptr)
        return false;
    if (sheet->column_count == 0)
        return Fail("This spreadsheet contains no data and was not saved as you have selected the 'remove "
                    "empty rows and columns on save' option.\n");
    return true;
}

bool Write_Sheet(Sheet& sheet, Output_File& file)
{
    TSS_Sink sink(file);
    sheet.format_version = Written_Version;
    Write_Head(sheet, sink);
    Write_Type_Block(sheet, sink);
    for (Column* column = sheet.first_column; column != nullptr; column = column->next) {
        if (column->type != row_column)
            Write_TSS_Column(*column, sink);
        if (sink.Failed())
            return false;
    }
    sink.Texts().Go_To({});
    if (!Write_Row_Marks(sheet, sink))
        return false;
    Write_Auxiliary_Records(sheet, sink);
    return !sink.Failed();
}

}  // namespace

bool Write_TSS(Sheet* sheet, Output_File& file)
{
    return Check_Writable(sheet) && Write_Sheet(*sheet, file);
}

bool Write_TSS_File(Sheet* sheet, const char* file_name)
{
    if (sheet == nullptr || file_name == nullptr)
        return Fail("Internal Spreadsheet Error: Null sheet in Save Sheet.\n");
    if (!Check_Writable(sheet))
        return false;
    Output_File file;
    if (!file.Open(file_name))
        return Fail("Tabulon spreadsheet data file not saved.\n");
    return Write_Sheet(*sheet, file) && file.Close();
}

}  // namespace ingester

#include "hostfiles/script/script.h"

#include "hostfiles/script/script_parts.h"
#include "model/column_names.h"
#include "model/names.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <string>
#include <vector>

namespace ingester {

namespace {

constexpr std::size_t Title_Limit = 180;

using Structure_Writer = bool (*)(Sheet& sheet, Script_Buffer& script);

Structure_Writer Writer_Of(const Sheet& sheet)
{
    switch (sheet.type) {
    case vector_sheet:
        return Write_Vector_Script;
    case matrix_sheet:
        return Write_Matrix_Script;
    case symmetric_matrix_sheet:
        return Write_Symmetric_Script;
    case diagonal_matrix_sheet:
        return Write_Diagonal_Script;
    case table_sheet:
        return Write_Table_Script;
    case scalar_sheet:
        return Write_Scalar_Script;
    default:
        return nullptr;
    }
}

/// Whether each Column is a structure of its own, or all are one.
bool Has_Structure_Columns(const Sheet& sheet)
{
    return sheet.type == vector_sheet || sheet.type == diagonal_matrix_sheet || sheet.type == scalar_sheet
           || (sheet.type == table_sheet && sheet.table_ways < 2);
}

/// Whether the script makes a structure of a Column of such a Sheet.
bool Becomes_Structure(const Column& column)
{
    switch (column.sheet->type) {
    case diagonal_matrix_sheet:
        return column.type == diagonal_matrix_column;
    case scalar_sheet:
        return column.type == scalar_column;
    case table_sheet:
        return column.type == table_column || (column.type == factor_column && column.index == 1);
    default:
        return column.type != row_column;
    }
}

/// Whatever the script declares has a name that the host takes.
void Name_Structures(Sheet& sheet)
{
    if (!Has_Structure_Columns(sheet)) {
        sheet.structure_name =
            sheet.structure_name.empty() ? Default_Column_Name(0) : Valid_Host_Name(sheet.structure_name);
        return;
    }
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        column->name = column->name.empty() ? Default_Column_Name(0) : Valid_Host_Name(column->name);
}

/// A comment of the host's stands in double quotes; one in the name would end it.
void Write_Source(const Sheet& sheet, Script_Buffer& script)
{
    if (sheet.source_file.empty())
        return;
    std::string name;
    // A comment for the reader's eye: a letter that the host lacks is no loss of data.
    for (const char c : As_Held_By_Host(sheet.source_file)) {
        if (c == '"')
            name += c;
        name += static_cast<unsigned char>(c) < ' ' ? ' ' : c;
    }
    Write_Data(Format_Text("\"Data taken from File: %s\"\n\n", name.c_str()), script);
}

void Write_Title(Script_Buffer& script)
{
    if (request.Title_Text.empty())
        return;
    Write_Statement("DELETE [Redefine=yes] _stitle_ : TEXT _stitle_ : READ [print=*] _stitle_\n", script);
    Write_Quoted("", request.Title_Text, Title_Limit, "", false, script);
    Write_Data(":\nPRINT [IPrint=*] _stitle_; Just=Left\n", script);
}

/// The names of all structures that hold data.
std::vector<std::string_view> Structure_Names(const Sheet& sheet)
{
    if (!Has_Structure_Columns(sheet))
        return {sheet.structure_name.view()};
    std::vector<std::string_view> names;
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        if (Becomes_Structure(*column))
            names.push_back(column->name);
    return names;
}

void Write_Pointer(const Sheet& sheet, Script_Buffer& script)
{
    if (request.Pointer_Name.empty())
        return;
    const std::string pointer = Valid_Host_Name(request.Pointer_Name);
    const std::vector<std::string_view> names = Structure_Names(sheet);
    if (std::ranges::find(names, pointer) != names.end()) {
        Report_Message_Text("Warning: pointer %s not written, as data have that name.\n", pointer.c_str());
        return;
    }
    Write_Delete(pointer, script);
    Write_Statement(Format_Text("POINTER %s", pointer.c_str()), script);
    Write_Names(
        "; !p(", names, [](std::string_view name) { return name; }, script);
    Write_Statement(")\n\n", script);
}

std::string_view Last_Statement(std::string_view file_name)
{
    const std::string_view marker = request.Return_Delete_Marker;
    if (request.End_With_Break)
        return "ENDBREAK\n\n";
    if (!marker.empty() && file_name.find(marker) != std::string_view::npos)
        return "RETURN [CLOSE=yes;DELETE=yes]\n\n";
    if (request.No_Return)
        return "\n";
    return "RETURN [CLOSE=yes]\n\n";
}

}  // namespace

bool Write_Host_Script(Sheet* sheet, const char* file_name)
{
    const Structure_Writer write = sheet == nullptr ? nullptr : Writer_Of(*sheet);
    Output_File file(Output_File::small_buffer);  // the script has a buffer of its own
    if (write == nullptr)
        return false;  // silent by design: the pipeline tells that the output was not written
    Name_Structures(*sheet);
    if (!file.Open(file_name))
        return false;
    Script_Buffer script(file);
    Write_Source(*sheet, script);
    Write_Title(script);
    const bool written = write(*sheet, script);
    Write_Pointer(*sheet, script);
    Write_Script_Text(Last_Statement(file_name), false, true, script);
    const bool whole = file.Close() && written;
    if (whole && sheet->type == vector_sheet)
        sheet->modified = 0;
    return whole;
}

}  // namespace ingester

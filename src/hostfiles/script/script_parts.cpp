#include "hostfiles/script/script_parts.h"

#include "request/request.h"
#include "support/text.h"

namespace ingester {

void Write_Delete(std::string_view name, Script_Buffer& script)
{
    Write_Statement("DELETE [redefine=yes] ", script);
    Write_Statement(name, script);
    Write_Statement("\n", script);
}

void Write_Read(std::string_view name, Script_Buffer& script)
{
    Write_Statement(request.Quiet_Read ? "\nREAD [print=*] " : "\nREAD ", script);
    Write_Statement(name, script);
    Write_Statement("\n", script);
}

Column* First_Of_Type(const Sheet& sheet, std::int32_t type)
{
    Column* column = sheet.first_column;
    while (column != nullptr && column->type != type)
        column = column->next;
    return column;
}

void Write_Decimals(const Column& column, const Attribute_Words& words, Script_Buffer& script)
{
    if (column.decimals >= 0)
        Write_Statement(std::string(words.decimals).append(std::to_string(column.decimals)), script);
}

void Write_Extra(const Column& column, const Attribute_Words& words, Script_Buffer& script)
{
    if (!column.extra.empty())
        Write_Quoted(words.extra, column.extra, Extra_Width, "", true, script);
}

void Write_Date_Format(const Column& column, const Attribute_Words& words, Script_Buffer& script)
{
    if (column.format == date_format_mark)
        Write_Statement(std::string(words.date).append(std::to_string(column.date_format)), script);
}

void Write_Attributes(const Column& column, const Attribute_Words& words, Script_Buffer& script)
{
    Write_Decimals(column, words, script);
    Write_Extra(column, words, script);
    Write_Date_Format(column, words, script);
}

Script_Number_Form Number_Form_Of(const Column& column)
{
    return {column.sheet->missing_value, column.format == date_format_mark && column.date_form == 0};
}

void Write_Data_Texts(const Cell_Node* first, Script_Buffer& script)
{
    for (const Cell_Node* cell = first; cell != nullptr; cell = cell->next)
        Write_Quoted("", cell->Text(), Text_Cell_Width, " ", false, script);
}

Cell_Position Start_Of(const Column& column)
{
    return {column.first_cell, Number_Form_Of(column)};
}

void Write_Next_Cells(std::span<Cell_Position> positions, Script_Buffer& script)
{
    for (Cell_Position& position : positions) {
        const bool ended = position.cell == nullptr;
        Write_Data_Number(ended ? position.form.missing : position.cell->value.number, position.form, script);
        position.cell = ended ? nullptr : position.cell->next;
    }
}

}  // namespace ingester

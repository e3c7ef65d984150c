// Vectors and Scalars: a structure for each column.
#include "hostfiles/script/script_parts.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

namespace {

constexpr std::size_t Long_Text_Limit = 20000;

/// Levels as they are counted. Digits follow each other without a blank, as the host takes them in
/// ordinal representation.
void Write_Levels(const Column& column, Script_Buffer& script)
{
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const double level = cell->value.number;
        if (!(level >= 1.0 && level < static_cast<double>(column.nlevels) + 1.0)) {
            Write_Data("* ", script);
            continue;
        }
        char* const target = script.Reserve(Number_Text_Room);
        script.Take_Data(Print_Integer(target, static_cast<std::int64_t>(level)));
    }
}

bool Write_Factor(Column& column, Script_Buffer& script)
{
    const std::int32_t length = std::max(column.length, 0);
    Write_Factor_Declaration(column, length, script);
    if (length == 0)
        return true;
    Write_Statement(request.Quiet_Read ? "READ [print=*] " : "READ ", script);
    Write_Statement(column.name, script);
    Write_Statement("; frepresentation=ordinal\n", script);
    Write_Levels(column, script);
    Write_Data_End(script);
    return true;
}

/// Each on a line of its own, whatever its length.
void Write_Long_Texts(const Column& column, Script_Buffer& script)
{
    script.Set_Verbatim(true);
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        Write_Quoted("", cell->Text(), Long_Text_Limit, "\n", false, script);
    script.Set_Verbatim(false);
}

void Write_Units(const Column& column, Script_Buffer& script)
{
    if (column.type == units_text_column || column.type == units_variate_column)
        Write_Statement(Format_Text("UNITS %s\n", column.name.c_str()), script);
}

bool Write_Text(Column& column, Script_Buffer& script)
{
    if (column.length < 1) {
        Write_Statement("TEXT [values=*", script);
        Write_Statement(Format_Text("] %s", column.name.c_str()), script);
        Write_Extra(column, Small_Words, script);
        Write_Statement("\n", script);
        return true;
    }
    Write_Statement("TEXT [nvalues=", script);
    Write_Statement(Format_Text("%li] %s", static_cast<long>(column.length), column.name.c_str()), script);
    Write_Extra(column, Small_Words, script);
    Write_Read(column.name, script);
    if (column.type == long_text_column)
        Write_Long_Texts(column, script);
    else
        Write_Data_Texts(column.first_cell, script);
    Write_Data_End(script);
    Write_Units(column, script);
    return true;
}

bool Write_Variate(Column& column, Script_Buffer& script)
{
    if (column.length < 1) {
        Write_Statement("VARIATE [values=*", script);
        Write_Statement(Format_Text("] %s", column.name.c_str()), script);
        Write_Extra(column, Small_Words, script);
        Write_Date_Format(column, Small_Words, script);
        Write_Statement("\n", script);
        return true;
    }
    Write_Statement("VARIATE [nvalues=", script);
    Write_Statement(Format_Text("%li] %s", static_cast<long>(column.length), column.name.c_str()), script);
    Write_Attributes(column, Small_Words, script);
    Write_Read(column.name, script);
    Write_Data_Numbers(column.first_cell, Number_Form_Of(column), script);
    Write_Data_End(script);
    Write_Units(column, script);
    return true;
}

/// The columns behind the `Row` column, for a loop.
struct Columns_Behind_Row {
    struct Walker {
        const Column* column;
        const Column& operator*() const { return *column; }
        Walker& operator++()
        {
            column = column->next;
            return *this;
        }
        bool operator!=(const Walker& other) const { return column != other.column; }
    };
    const Sheet& sheet;
    [[nodiscard]] Walker begin() const { return {sheet.first_column->next}; }
    [[nodiscard]] static Walker end() { return {nullptr}; }
};

std::string_view Name_Of(const Column& column)
{
    return column.name;
}

}  // namespace

bool Write_Column_Script(Column& column, Script_Buffer& script)
{
    script.Texts().Go_To(column.name);
    switch (column.type) {
    case row_column:
        return true;
    case factor_column:
        return Write_Factor(column, script);
    case text_column:
    case units_text_column:
    case long_text_column:
        return Write_Text(column, script);
    case variate_column:
    case units_variate_column:
        return Write_Variate(column, script);
    default:
        return false;  // silent by design: the pipeline tells that the output was not written
    }
}

bool Write_Vector_Script(Sheet& sheet, Script_Buffer& script)
{
    if (sheet.column_count < 1)
        return false;
    Write_Names("DELETE [redefine=yes] ", Columns_Behind_Row{sheet}, Name_Of, script);
    Write_Statement("\n", script);
    bool written = true;
    for (Column* column = sheet.first_column; column != nullptr && !script.Failed(); column = column->next) {
        written = Write_Column_Script(*column, script) && written;
        Show_Progress("Writing", column->index, sheet.column_count);
    }
    return Write_Restrictions(sheet, script) && written;
}

bool Write_Restrictions(Sheet& sheet, Script_Buffer& script)
{
    const bool restricted = sheet.restriction_active != 0 && sheet.row_count > 0;
    if (restricted && !Need_Rows(&sheet))
        return false;
    if (restricted) {
        Write_Delete("_rest_", script);
        Write_Statement("READ [print=*;setnvalues=y] _rest_\n", script);
        for (const Row_Node* row = sheet.first_row; row != nullptr; row = row->next)
            Write_Data(row->restricted == 1 ? "0 " : "1 ", script);
        Write_Data_End(script);
    }
    // Without a restriction too: it ends one that the host may still have.
    Write_Names("RESTRICT ", Columns_Behind_Row{sheet}, Name_Of, script);
    Write_Statement(restricted ? "; _rest_\n" : "\n", script);
    return true;
}

bool Write_Scalar_Script(Sheet& sheet, Script_Buffer& script)
{
    if (sheet.column_count < 1)
        return false;
    for (const Column& column : Columns_Behind_Row{sheet}) {
        if (column.type != scalar_column)
            continue;
        const double value =
            column.first_cell == nullptr ? sheet.missing_value : column.first_cell->value.number;
        Write_Delete(column.name, script);
        Write_Statement(Format_Text("SCALAR %s; ", column.name.c_str()), script);
        Write_Statement_Number("", value, Number_Form_Of(column), script);
        Write_Attributes(column, Small_Words, script);
        Write_Statement("\n", script);
    }
    return true;
}

}  // namespace ingester

// Tables of one, two and more ways, with the factors that classify them.
#include "hostfiles/script/script_parts.h"
#include "model/names.h"
#include "model/table_factor.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>
#include <string>
#include <vector>

namespace ingester {

namespace {

/// In a Table each Column is a structure or, with more than one way, a level of the last factor.
constexpr Attribute_Words Table_Words = {" ; decimals=", "; extra=", "; drep="};

std::string Make_Up_Factor(const char* name_start, std::int64_t levels, Script_Buffer& script)
{
    std::string name = name_start + std::to_string(++request.Made_Up_Factors);
    Write_Statement("FACTOR [modify=yes;", script);
    Write_Statement(Format_Text("levels=%li] %s\n", static_cast<long>(levels), name.c_str()), script);
    return name;
}

/// What a Table says besides its Columns.
struct Table_Shape {
    bool margins;  ///< are declared and written
    std::int64_t rows;
    std::vector<Column*> columns;  ///< those that are written
    std::int64_t levels;           ///< of the factor across the columns
};

/// Tables of one and two ways are declared without margins, so theirs are left out: the last row
/// and the margin column.
Table_Shape Shape_Of(const Sheet& sheet)
{
    const bool has_margins = sheet.has_margins != 0;
    Table_Shape shape = {has_margins && sheet.table_ways > 2, sheet.row_count, {}, 0};
    if (has_margins && !shape.margins)
        shape.rows = std::max(shape.rows - 1, std::int64_t{0});
    for (Column* column = sheet.first_column; column != nullptr; column = column->next) {
        shape.levels += column->type == table_column ? 1 : 0;
        if (column->type == table_column || (shape.margins && column->type == table_margin_column))
            shape.columns.push_back(column);
    }
    return shape;
}

/// The factor down the rows: the first column, where that is one.
std::string Declare_Row_Factor(const Sheet& sheet, const Table_Shape& shape, Script_Buffer& script)
{
    Column* const first = sheet.first_column->next;
    if (first == nullptr || first->type != factor_column)
        return Make_Up_Factor("_tfc_", shape.rows, script);
    Write_Factor_Declaration(*first, 0, script);
    return Factor_Name(*first);
}

std::vector<std::string> Declare_Leading_Factors(const Sheet& sheet, Script_Buffer& script)
{
    std::vector<std::string> names;
    for (Column* column = sheet.first_column; column != nullptr; column = column->next) {
        if (column->type != factor_column)
            continue;
        Write_Factor_Declaration(*column, 0, script);
        names.push_back(Factor_Name(*column));
    }
    return names;
}

bool Any_Column_Changed(const Table_Shape& shape)
{
    return std::any_of(shape.columns.begin(), shape.columns.end(),
                       [](const Column* column) { return column->modified != 0; });
}

bool Take_Levels(Column& factor, const Table_Shape& shape)
{
    std::vector<const Column*> columns;
    std::ranges::copy_if(shape.columns, std::back_inserter(columns),
                         [](const Column* column) { return column->type == table_column; });
    return Take_Column_Levels(*factor.sheet, columns, factor);
}

/// The factor across the columns. There is a real one where the Sheet names or labels it, or where
/// somebody has set the levels of its columns; otherwise it is made up. False for want of memory.
bool Declare_Column_Factor(Sheet& sheet, const Table_Shape& shape, std::string& name, Script_Buffer& script)
{
    const bool labelled = sheet.label_state > labels_by_position;
    if (!labelled && sheet.row_label_name.empty() && !Any_Column_Changed(shape)) {
        name = Make_Up_Factor("_tf1_", shape.levels, script);
        return true;
    }
    Column factor;
    factor.type = factor_column;
    factor.sheet = &sheet;
    factor.nlevels = static_cast<std::int32_t>(shape.levels);
    Take_Column_Factor_Look(sheet, factor);
    name = sheet.row_label_name.empty() ? "_tf1_" + std::to_string(++request.Made_Up_Factors)
                                        : Make_Valid_Name(sheet.row_label_name);
    factor.name = name;
    if ((labelled || Any_Column_Changed(shape)) && !Take_Levels(factor, shape))
        return false;
    Write_Factor_Declaration(factor, 0, script);
    return true;
}

/// "TABLE [class=a,b;margins=no] name", behind the deletion of an older one; the statement is left open.
void Declare_Table(std::string_view name, const std::vector<std::string>& factors, bool margins,
                   Script_Buffer& script)
{
    Write_Delete(name, script);
    Write_Statement("TABLE [", script);
    Write_Names(
        "class=", factors, [](const std::string& factor) { return std::string_view(factor); }, script);
    Write_Statement(std::string(margins ? ";margins=yes] " : ";margins=no] ").append(name), script);
}

bool Write_One_Way(Sheet& sheet, const Table_Shape& shape, Script_Buffer& script)
{
    const std::vector<std::string> factors = {Declare_Row_Factor(sheet, shape, script)};
    for (const Column* column : shape.columns) {
        Declare_Table(column->name, factors, shape.margins, script);
        Write_Attributes(*column, Table_Words, script);
        Write_Read(column->name, script);
        const Script_Number_Form form = Number_Form_Of(*column);
        std::int64_t row = 0;
        for (const Cell_Node* cell = column->first_cell; cell != nullptr && row < shape.rows; ++row) {
            Write_Data_Number(cell->value.number, form, script);
            cell = cell->next;
        }
        Write_Data_End(script);
    }
    return true;
}

void Write_Range(const char* word, double limit, const Sheet& sheet, Script_Buffer& script)
{
    char text[Number_Text_Room];
    if (Is_Present(sheet, limit) && limit <= Greatest_Number)
        Write_Statement(std::string(word).append(text, Print_General(text, limit, 12)), script);
}

/// Row by row, with a position in each column.
void Write_Body(const Table_Shape& shape, Script_Buffer& script)
{
    std::vector<Cell_Position> positions;
    for (const Column* column : shape.columns)
        positions.push_back(Start_Of(*column));
    for (std::int64_t row = 0; row < shape.rows && !script.Failed(); ++row)
        Write_Next_Cells(positions, script);
    Write_Data_End(script);
}

/// Two ways and more: the Sheet is one structure, with the attributes of its first Table column.
bool Write_Many_Ways(Sheet& sheet, const Table_Shape& shape, Script_Buffer& script)
{
    const bool two_ways = sheet.table_ways == 2;
    std::vector<std::string> factors;
    if (two_ways)
        factors.push_back(Declare_Row_Factor(sheet, shape, script));
    else
        factors = Declare_Leading_Factors(sheet, script);
    std::string last;
    if (!Declare_Column_Factor(sheet, shape, last, script))
        return false;
    factors.push_back(last);
    const Column& first = *shape.columns.front();
    Declare_Table(sheet.structure_name, factors, shape.margins, script);
    if (two_ways) {
        Write_Attributes(first, Table_Words, script);
    } else {
        Write_Decimals(first, Small_Words, script);
        Write_Extra(first, Small_Words, script);
        Write_Range("; min=", first.range_low, sheet, script);
        Write_Range("; max=", first.range_high, sheet, script);
        Write_Date_Format(first, Small_Words, script);
    }
    Write_Read(sheet.structure_name, script);
    Write_Body(shape, script);
    return true;
}

}  // namespace

bool Write_Table_Script(Sheet& sheet, Script_Buffer& script)
{
    const Table_Shape shape = Shape_Of(sheet);
    if (shape.columns.empty())
        return false;
    return sheet.table_ways < 2 ? Write_One_Way(sheet, shape, script) : Write_Many_Ways(sheet, shape, script);
}

}  // namespace ingester

// Matrices of the three shapes, with the labels of their rows and columns.
#include "hostfiles/script/script_parts.h"
#include "model/cell_text.h"
#include "request/losses.h"
#include "request/messages.h"
#include "support/text.h"

#include <algorithm>
#include <span>
#include <vector>

namespace ingester {

namespace {

/// The structures that hold the labels of one side.
struct Label_Names {
    std::string_view numbers;
    std::string_view texts;
};
constexpr Label_Names Row_Labels = {"_rows_", "_trows_"};
constexpr Label_Names Column_Labels = {"_cols_", "_tcols_"};

constexpr std::int32_t numeric_labels = 1;

std::string Text_Specification(std::string_view name)
{
    return std::string("!t(#").append(name).append(")");
}

std::string Number_Specification(std::string_view name)
{
    return std::string("!(#").append(name).append(")");
}

/// "VARIATE [nvalues=2] name", behind the deletion of an older one. The statement is left open.
void Start_Labels(const char* kind, std::int64_t count, std::string_view name, Script_Buffer& script)
{
    Write_Delete(name, script);
    Write_Statement(Format_Text("%s [nvalues=", kind), script);
    Write_Statement(Format_Text("%li] ", static_cast<long>(count)).append(name), script);
}

bool Names_Are_Numbers(const Column* first, double missing)
{
    for (const Column* column = first; column != nullptr; column = column->next)
        if (!(Cell_Number(column->name, missing) > missing))
            return false;
    return true;
}

/// Declares the names of the data columns as labels. What stands for them in the declaration of the
/// matrix: their structure, or just `count` of them. Names that are no numbers stay what they are.
std::string Declare_Column_Names(const Sheet& sheet, const Column* first, std::int64_t count,
                                 const Label_Names& names, Script_Buffer& script)
{
    if (sheet.label_state <= 0)
        return std::to_string(count);
    if (sheet.label_state == numeric_labels && Names_Are_Numbers(first, sheet.missing_value)) {
        const Script_Number_Form form = {sheet.missing_value, false};
        Start_Labels("VARIATE", count, names.numbers, script);
        Write_Read(names.numbers, script);
        for (const Column* column = first; column != nullptr; column = column->next)
            Write_Data_Number(Cell_Number(column->name, form.missing), form, script);
        Write_Data_End(script);
        return Number_Specification(names.numbers);
    }
    Start_Labels("TEXT", count, names.texts, script);
    Write_Read(names.texts, script);
    for (const Column* column = first; column != nullptr; column = column->next)
        Write_Quoted("", column->name, Text_Cell_Width, " ", false, script);
    Write_Data_End(script);
    return Text_Specification(names.texts);
}

/// Declares the labels that a units column holds, and gives what stands for them; empty without one.
std::string Declare_Units(const Sheet& sheet, Script_Buffer& script)
{
    if (const Column* const texts = First_Of_Type(sheet, units_text_column)) {
        Start_Labels("TEXT", texts->length, Row_Labels.texts, script);
        Write_Extra(*texts, Capital_Words, script);
        Write_Read(Row_Labels.texts, script);
        Write_Data_Texts(texts->first_cell, script);
        Write_Data_End(script);
        return Text_Specification(Row_Labels.texts);
    }
    if (const Column* const numbers = First_Of_Type(sheet, units_variate_column)) {
        Start_Labels("VARIATE", numbers->length, Row_Labels.numbers, script);
        Write_Extra(*numbers, Capital_Words, script);
        Write_Date_Format(*numbers, Capital_Words, script);
        Write_Read(Row_Labels.numbers, script);
        Write_Data_Numbers(numbers->first_cell, Number_Form_Of(*numbers), script);
        Write_Data_End(script);
        return Number_Specification(Row_Labels.numbers);
    }
    return {};
}

/// The head of a matrix up to its READ line: `start` with its rows in it, its name and attributes.
void Declare_Matrix(std::string_view start, const Column& first, std::string_view name,
                    const Attribute_Words& words, Script_Buffer& script)
{
    Write_Statement(start, script);
    Write_Statement(std::string("] ").append(name), script);
    Write_Attributes(first, words, script);
    Write_Read(name, script);
}

std::vector<Cell_Position> Start_Columns(const Column* first)
{
    std::vector<Cell_Position> positions;
    for (const Column* column = first; column != nullptr; column = column->next)
        positions.push_back(Start_Of(*column));
    return positions;
}

}  // namespace

bool Write_Matrix_Script(Sheet& sheet, Script_Buffer& script)
{
    const std::int64_t rows = sheet.row_count;
    const std::int64_t columns = std::int64_t{sheet.column_count} - sheet.leading_columns + 1;
    const std::string_view name = sheet.structure_name;
    Write_Delete(name, script);
    if (rows < 1 || columns < 1) {
        Write_Statement(Format_Text("MATRIX %s\n", sheet.structure_name.c_str()), script);
        return true;
    }
    const Column* const first = First_Of_Type(sheet, matrix_column);
    if (first == nullptr)
        return false;
    const std::string column_labels = Declare_Column_Names(sheet, first, columns, Column_Labels, script);
    std::string row_labels = Declare_Units(sheet, script);
    if (row_labels.empty())
        row_labels = std::to_string(rows);
    Declare_Matrix("MATRIX [ROWS=" + row_labels + ";COLUMNS=" + column_labels, *first, name, Capital_Words,
                   script);
    std::vector<Cell_Position> positions = Start_Columns(first);
    for (std::int64_t row = 0; row < rows && !script.Failed(); ++row)
        Write_Next_Cells(positions, script);
    Write_Data_End(script);
    return true;
}

namespace {

/// A spreadsheet that was cut short may lack columns; the matrix needs all of its values.
void Tell_Missing_Columns(const Sheet& sheet, std::size_t columns)
{
    const auto lacking = static_cast<std::int64_t>(sheet.row_count) - static_cast<std::int64_t>(columns);
    if (lacking < 1)
        return;
    Note_Loss(Loss_Kind::input_unread, sheet.structure_name, 0, "columns of a matrix that was cut short",
              lacking);
    Warn("Warning: The matrix %s lacks %li of its columns, whose values were written as missing.\n",
         sheet.structure_name.c_str(), static_cast<long>(lacking));
}

}  // namespace

bool Write_Symmetric_Script(Sheet& sheet, Script_Buffer& script)
{
    const std::int64_t rows = sheet.row_count;
    const std::string_view name = sheet.structure_name;
    Write_Delete(name, script);
    if (rows < 1) {
        Write_Statement(Format_Text("SYMMETRICMATRIX %s\n", sheet.structure_name.c_str()), script);
        return true;
    }
    const Column* const first = First_Of_Type(sheet, symmetric_matrix_column);
    if (first == nullptr)
        return false;
    // Rows and columns have the same labels, so those of the columns stand in where there are no others.
    std::string labels = Declare_Units(sheet, script);
    if (labels.empty())
        labels = Declare_Column_Names(sheet, first, rows, Row_Labels, script);
    Declare_Matrix("SYMMETRICMATRIX [rows=" + labels, *first, name, Small_Words, script);
    std::vector<Cell_Position> positions = Start_Columns(first);
    const std::span<Cell_Position> all = positions;
    const Script_Number_Form form = Number_Form_Of(*first);
    for (std::size_t row = 1; row <= static_cast<std::size_t>(rows) && !script.Failed(); ++row) {
        Write_Next_Cells(all.first(std::min(row, all.size())), script);
        for (std::size_t column = all.size(); column < row; ++column)
            Write_Data_Number(sheet.missing_value, form, script);
    }
    Write_Data_End(script);
    Tell_Missing_Columns(sheet, all.size());
    return true;
}

bool Write_Diagonal_Script(Sheet& sheet, Script_Buffer& script)
{
    const Column* column = First_Of_Type(sheet, diagonal_matrix_column);
    if (column == nullptr)
        return false;
    std::string labels;
    for (; column != nullptr; column = column->next) {
        Write_Delete(column->name, script);
        if (sheet.row_count < 1) {
            Write_Statement(Format_Text("DIAGONALMATRIX %s\n", column->name.c_str()), script);
            continue;
        }
        if (labels.empty())
            labels = Declare_Units(sheet, script);
        if (labels.empty())
            labels = std::to_string(sheet.row_count);
        Declare_Matrix("DIAGONALMATRIX [rows=" + labels, *column, column->name, Small_Words, script);
        Write_Data_Numbers(column->first_cell, Number_Form_Of(*column), script);
        Write_Data_End(script);
    }
    return true;
}

}  // namespace ingester

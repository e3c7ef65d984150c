#include "model/output_forms.h"

#include "model/names.h"
#include "support/number_text.h"

#include <algorithm>
#include <cmath>

namespace ingester {

namespace {

constexpr std::int32_t Most_Decimals = 12;

/// The decimals of a value that say something, of those that "%.12f" prints.
std::int32_t Needed_Decimals(double value)
{
    char text[Number_Text_Room];
    if (value == std::floor(value))
        return 0;
    const char* end = Print_Fixed(text, value, Most_Decimals);
    std::int32_t decimals = Most_Decimals;
    while (decimals > 0 && *--end == '0')
        --decimals;
    return decimals;
}

std::int32_t Needed_Decimals(const Column& column)
{
    const double missing = column.sheet->missing_value;
    const bool factor = column.type == factor_column;
    std::int32_t most = 0;
    for (const Cell_Node* node = factor ? column.level_values : column.first_cell;
         node != nullptr && most < Most_Decimals; node = node->next)
        if (node->value.number > missing)
            most = std::max(most, Needed_Decimals(node->value.number));
    return most;
}

/// Whether the data of a Sheet are all Variates, but for `texts` Text columns at the most.
bool Holds_Variates(const Sheet& sheet, std::int32_t texts)
{
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next) {
        if (column->type == text_column && texts-- > 0)
            continue;
        if (column->type != row_column && column->type != variate_column)
            return false;
    }
    return sheet.column_count > 0;
}

/// Row labels are a leading column.
void Make_Row_Labels(Sheet& sheet, Column& column)
{
    Unlink_Column(&column);
    column.type = units_text_column;
    Insert_Column_At(&sheet, &column, 1);
}

void Turn_Variates_Into(Sheet& sheet, Column_Type type)
{
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type == variate_column)
            column->type = type;
}

bool Has_Automatic_Names(const Sheet& sheet)
{
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type == matrix_column
            && column->name.view() != Default_Column_Name(column->index - sheet.leading_columns + 1)
            && column->name.view() != Default_Column_Name(column->index))
            return false;
    return true;
}

}  // namespace

void Find_Decimals(Sheet* sheet)
{
    for (Column* column = sheet->first_column; column != nullptr; column = column->next) {
        if (column->type == row_column || Is_Text_Like(column->type)
            || column->format != significant_digits_format)
            continue;
        column->decimals = Needed_Decimals(*column);
        column->format = fixed_format;
    }
}

void Vector_To_Matrix(Sheet* sheet, std::string_view name)
{
    Column* const labels = Nth_Column_Of_Type(sheet, text_column, 1);
    if (sheet->type != vector_sheet || sheet->row_count < 1 || !Holds_Variates(*sheet, 1)
        || (labels != nullptr && sheet->column_count == 1))
        return;
    sheet->type = matrix_sheet;
    sheet->structure_name = name;
    if (labels != nullptr)
        Make_Row_Labels(*sheet, *labels);
    Turn_Variates_Into(*sheet, matrix_column);
    sheet->label_state = Has_Automatic_Names(*sheet) ? 0 : 2;
    if (sheet->label_state == 0)
        Number_Matrix_Columns(sheet);
}

void Vector_To_Scalars(Sheet* sheet)
{
    if (sheet->type != vector_sheet || sheet->row_count != 1 || !Holds_Variates(*sheet, 0))
        return;
    sheet->type = scalar_sheet;
    Turn_Variates_Into(*sheet, scalar_column);
}

}  // namespace ingester

#include "model/list.h"
#include "model/sheet.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <string>
#include <utility>

namespace ingester {

namespace {

bool Insertion_Fits(std::int32_t count)
{
    if (count > Greatest_Insertion)
        return Fail("Too many rows to insert.\nAt most 33 million rows can be added at one time.\n");
    return count >= 1;
}

}  // namespace

void Set_Text(Column& column, Cell_Node& cell, std::string_view text)
{
    text = First_Letters(text, column.type == long_text_column ? Long_Text_Width : Text_Cell_Width);
    cell.value.text = column.texts.Store(text);
    column.nlevels = Wider(column.nlevels, text);
}

bool Insert_Cells(Column* column, std::int32_t position, std::int32_t count)
{
    if (column == nullptr || position < 0 || !Insertion_Fits(count))
        return false;
    Cell_Node* const before = position < column->length ? Cell_At(column, position) : nullptr;
    Cell_Node* first;
    Cell_Node* last;
    if (Alloc_Cell_Nodes(column->type, count, first, last, column->blocks) == 0)
        return false;
    if (!Is_Text_Like(column->type))
        for (Cell_Node* cell = first; cell != nullptr; cell = cell->next)
            cell->value.number = column->sheet->missing_value;
    Link_Before(column->first_cell, column->last_cell, before, first, last);
    const std::int32_t old_length = std::max(column->length, 0);
    column->length = old_length + count;
    // The new cells are remembered, so that a sweep of insertions stays linear.
    column->cursor_node = first;
    column->cursor_index = std::min(position, old_length);
    return true;
}

bool Insert_Row_Nodes(Sheet* sheet, std::int32_t position, std::int32_t count)
{
    if (!Need_Rows(sheet) || position < 0 || !Insertion_Fits(count))
        return false;
    Row_Node* const before = position < sheet->row_count ? Row_At(sheet, position) : nullptr;
    Row_Node* first;
    Row_Node* last;
    if (Alloc_Row_Nodes(count, first, last, sheet->row_blocks) == 0)
        return false;
    Link_Before(sheet->first_row, sheet->last_row, before, first, last);
    sheet->cursor_row = first;
    sheet->cursor_row_index = std::min(position, sheet->row_count);
    sheet->row_count += count;
    return true;
}

namespace {

/// Row numbers always run 1..N, so the `Row` column grows at its end, wherever the rows came in.
bool Lengthen_Row_Numbers(Sheet& sheet, std::int32_t count)
{
    Column& numbers = *sheet.first_column;
    const std::int32_t old_length = numbers.length;
    if (!Insert_Cells(&numbers, old_length, count))
        return false;
    double number = sheet.row_count;
    for (std::int32_t i = 0; i < count; ++i, number -= 1.0)
        Cell_At(&numbers, numbers.length - 1 - i)->value.number = number;
    return true;
}

/// On a Symmetric Matrix new rows bring new columns, which start on the diagonal.
bool Insert_Square_Columns(Sheet& sheet, std::int32_t position, std::int32_t count)
{
    for (std::int32_t i = 0; i < count; ++i) {
        Column* const column = New_Column(&sheet, symmetric_matrix_column, std::to_string(position + i + 1));
        if (column == nullptr
            || !Move_Column(&sheet, column->index,
                            std::min(sheet.leading_columns + position + i, sheet.column_count))
            || !Fill_Column(column, symmetric_matrix_column, Cells_For_Rows(*column, sheet.row_count), 0, ""))
            return false;
    }
    if (sheet.label_state == 0)
        Number_Matrix_Columns(&sheet);
    return true;
}

}  // namespace

bool Fill_Short_Columns(Sheet* sheet)
{
    if (sheet == nullptr || sheet->has_short_columns == 0)
        return sheet != nullptr;
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next) {
        std::int32_t lacking = Cells_For_Rows(*column, sheet->row_count) - std::max(column->length, 0);
        for (std::int32_t some; lacking > 0; lacking -= some) {
            some = std::min(lacking, Greatest_Insertion);
            if (!Insert_Cells(column, std::max(column->length, 0), some))
                return false;
        }
    }
    sheet->has_short_columns = 0;
    return true;
}

bool Insert_Rows(Sheet* sheet, std::int32_t position, std::int32_t count, bool keep_square)
{
    if (sheet == nullptr || position < 0 || !Insertion_Fits(count) || !Fill_Short_Columns(sheet))
        return false;
    const bool square = keep_square && sheet->type == symmetric_matrix_sheet;
    if (square && (sheet->read_only != 0 || count > request.Max_Columns - sheet->column_count))
        return false;
    position = std::min(position, sheet->row_count);
    if (!Insert_Row_Nodes(sheet, position, count) || !Lengthen_Row_Numbers(*sheet, count))
        return false;
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next) {
        const std::int32_t first_row = First_Row_Of(*column);
        // A column that begins below the new rows only moves down with its diagonal.
        if (column->type == symmetric_matrix_column && first_row >= position)
            continue;
        if (!Insert_Cells(column, position - first_row, count))
            return false;
    }
    return !square || Insert_Square_Columns(*sheet, position, count);
}

bool Remove_Cell(Column* column, std::int32_t index)
{
    Cell_Node* const cell = Cell_At(column, index);
    if (cell == nullptr)
        return false;
    // The neighbour keeps the remembered position, so that a sweep of removals stays linear.
    column->cursor_node = cell->next != nullptr ? cell->next : cell->prev;
    column->cursor_index = cell->next != nullptr ? index : index - 1;
    Unlink(column->first_cell, column->last_cell, cell);
    --column->length;
    return true;
}

namespace {

void Remove_Row_Node(Sheet& sheet, std::int32_t index)
{
    Row_Node* const row = Row_At(&sheet, index);
    if (row->restricted != 0)
        --sheet.restricted_rows;
    sheet.cursor_row = row->next != nullptr ? row->next : row->prev;
    sheet.cursor_row_index = row->next != nullptr ? index : index - 1;
    Unlink(sheet.first_row, sheet.last_row, row);
    --sheet.row_count;
}

}  // namespace

bool Delete_Row(Sheet* sheet, std::int32_t index, bool keep_square)
{
    if (sheet == nullptr || sheet->type == scalar_sheet || sheet->row_count <= 1 || index < 0
        || index >= sheet->row_count || !Need_Rows(sheet))
        return false;
    if (keep_square && sheet->type == symmetric_matrix_sheet)
        return Delete_Column(Column_At(sheet, sheet->leading_columns + index), true);
    Remove_Row_Node(*sheet, index);
    Remove_Cell(sheet->first_column, sheet->first_column->length - 1);
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next) {
        const std::int32_t first_row = First_Row_Of(*column);
        // A Symmetric Matrix whose column went may have lost the cell with it.
        const bool gone =
            column->type == symmetric_matrix_column && column->length <= sheet->row_count - first_row;
        if (index >= first_row && !gone)
            Remove_Cell(column, index - first_row);
    }
    sheet->current_row = std::min(sheet->current_row, sheet->row_count - 1);
    sheet->top_row = std::min(sheet->top_row, sheet->row_count - 1);
    return true;
}

namespace {

/// Unlinks the cells of rows whose flag is 0, in one sweep.
void Keep_Cells(Column& column, std::span<const std::int32_t> flags)
{
    column.cursor_node = nullptr;
    column.cursor_index = -1;
    std::size_t row = 0;
    for (Cell_Node *cell = column.first_cell, *next; cell != nullptr; cell = next, ++row) {
        next = cell->next;
        if (row < flags.size() && flags[row] != 0)
            continue;
        Unlink(column.first_cell, column.last_cell, cell);
        --column.length;
    }
}

void Keep_Row_Nodes(Sheet& sheet, std::span<const std::int32_t> flags)
{
    sheet.cursor_row = nullptr;
    sheet.cursor_row_index = -1;
    std::size_t index = 0;
    for (Row_Node *row = sheet.first_row, *next; row != nullptr; row = next, ++index) {
        next = row->next;
        if (index < flags.size() && flags[index] != 0)
            continue;
        sheet.restricted_rows -= row->restricted != 0 ? 1 : 0;
        Unlink(sheet.first_row, sheet.last_row, row);
        --sheet.row_count;
    }
}

/// Row numbers run 1..N, so the `Row` column loses cells at its end.
void Shorten_Row_Numbers(Sheet& sheet)
{
    while (sheet.first_column->length > sheet.row_count)
        Remove_Cell(sheet.first_column, sheet.first_column->length - 1);
}

void Delete_Square_Rows(Sheet& sheet, std::span<const std::int32_t> flags)
{
    for (std::int32_t row = sheet.row_count - 1; row >= 0; --row)
        if (static_cast<std::size_t>(row) >= flags.size() || flags[static_cast<std::size_t>(row)] == 0)
            Delete_Row(&sheet, row, true);
}

}  // namespace

bool Keep_Rows(Sheet* sheet, std::span<const std::int32_t> flags)
{
    if (sheet == nullptr || sheet->type == scalar_sheet)
        return false;
    const auto rows = static_cast<std::size_t>(std::max(sheet->row_count, 0));
    const auto listed = flags.first(std::min(rows, flags.size()));
    const auto dropped = static_cast<std::size_t>(std::ranges::count(listed, 0)) + (rows - listed.size());
    if (dropped == rows || !Need_Rows(sheet))
        return false;
    if (dropped == 0)
        return true;
    if (sheet->type == symmetric_matrix_sheet) {
        Delete_Square_Rows(*sheet, listed);
        return true;
    }
    Keep_Row_Nodes(*sheet, listed);
    Shorten_Row_Numbers(*sheet);
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next)
        Keep_Cells(*column, listed);
    sheet->current_row = std::min(sheet->current_row, sheet->row_count - 1);
    sheet->top_row = std::min(sheet->top_row, sheet->row_count - 1);
    return true;
}

bool Cell_Is_Present(const Column& column, const Cell_Node& cell)
{
    if (Is_Text_Like(column.type))
        return !cell.Text().empty();
    return column.type == factor_column ? cell.value.number >= 1.0
                                        : Is_Present(*column.sheet, cell.value.number);
}

namespace {

/// Clears `empty` on the rows where `column` holds data; returns how many it cleared.
std::int32_t Clear_Filled_Rows(const Column& column, Row_Node* row)
{
    std::int32_t cleared = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr && row != nullptr;
         cell = cell->next, row = row->next)
        if (row->empty != 0 && Cell_Is_Present(column, *cell)) {
            row->empty = 0;
            ++cleared;
        }
    return cleared;
}

void Find_Column_Empty(Column& column)
{
    column.all_empty = 1;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        if (Cell_Is_Present(column, *cell)) {
            column.all_empty = 0;
            return;
        }
}

/// Marks rows, and returns how many are empty.
std::int32_t Mark_Empty_Rows(Sheet& sheet)
{
    for (Row_Node* row = sheet.first_row; row != nullptr; row = row->next)
        row->empty = 1;
    std::int32_t empty = sheet.row_count;
    for (Column* column = sheet.first_column->next; column != nullptr && empty > 0; column = column->next) {
        Row_Node* const row =
            First_Row_Of(*column) == 0 ? sheet.first_row : Row_At(&sheet, First_Row_Of(*column));
        empty -= Clear_Filled_Rows(*column, row);
    }
    return empty;
}

/// Some column has a value in every row, so that none can be empty.
bool Has_Full_Column(const Sheet& sheet)
{
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        const Cell_Node* cell = column->first_cell;
        while (cell != nullptr && Cell_Is_Present(*column, *cell))
            cell = cell->next;
        if (cell == nullptr && column->length == sheet.row_count)
            return true;
    }
    return false;
}

/// On a Symmetric Matrix row and column i are two halves of one thing: empty only together.
void Pair_Rows_With_Columns(Sheet& sheet)
{
    Row_Node* row = sheet.first_row;
    for (Column* column = sheet.first_column; column != nullptr && row != nullptr; column = column->next) {
        if (column->type != symmetric_matrix_column)
            continue;
        const bool both = row->empty != 0 && column->all_empty != 0;
        row->empty = both ? 1 : 0;
        column->all_empty = both ? 1 : 0;
        row = row->next;
    }
}

void Mark_All_Empty(Sheet& sheet, bool paired)
{
    Mark_Empty_Rows(sheet);
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        Find_Column_Empty(*column);
    if (paired)
        Pair_Rows_With_Columns(sheet);
}

}  // namespace

std::int32_t Find_Empty_Rows(Sheet* sheet, bool also_columns)
{
    if (sheet == nullptr || (sheet->rows_due && Has_Full_Column(*sheet)) || !Need_Rows(sheet))
        return 0;
    if (!also_columns || sheet->type != symmetric_matrix_sheet)
        return Mark_Empty_Rows(*sheet);
    Mark_All_Empty(*sheet, true);
    std::int32_t empty = 0;
    for (const Row_Node* row = sheet->first_row; row != nullptr; row = row->next)
        empty += row->empty;
    return empty;
}

std::int32_t Find_Empty_Columns(Sheet* sheet, bool also_rows)
{
    if (sheet == nullptr)
        return 0;
    if (also_rows && sheet->type == symmetric_matrix_sheet && Need_Rows(sheet))
        Mark_All_Empty(*sheet, true);
    else
        for (Column* column = sheet->first_column->next; column != nullptr; column = column->next)
            Find_Column_Empty(*column);
    std::int32_t empty = 0;
    for (const Column* column = sheet->first_column->next; column != nullptr; column = column->next)
        empty += column->all_empty;
    return empty;
}

}  // namespace ingester

#include "model/column_rules.h"
#include "model/list.h"
#include "model/names.h"
#include "model/sheet.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <memory>
#include <string>
#include <utility>
#include <vector>

namespace ingester {

namespace {

/// `name['text']` split into the stem and the text.
bool Split_Quoted_Suffix(std::string_view name, std::string_view& stem, std::string_view& text)
{
    const std::size_t open = name.find("['");
    if (open == std::string_view::npos || !name.ends_with("']") || open + 4 > name.size())
        return false;
    stem = name.substr(0, open);
    text = name.substr(open + 2, name.size() - open - 4);
    return true;
}

std::string_view Stem_Of(std::string_view name)
{
    return name.substr(0, Bracket_Start(name));
}

std::int32_t Count_Stem(const Sheet& sheet, std::string_view stem)
{
    std::int32_t count = 0;
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column && Equal_Folded(Stem_Of(column->name), stem))
            ++count;
    return count;
}

/// An element of a pointer with a quoted suffix gets the next number of its stem instead.
std::string Number_Quoted_Suffix(const Sheet& sheet, Column& column, std::string_view name)
{
    std::string_view stem;
    std::string_view text;
    if ((sheet.type != vector_sheet && sheet.type != scalar_sheet) || sheet.settings.bracket_names != 0
        || !Split_Quoted_Suffix(name, stem, text))
        return std::string(name);
    column.extra = text;
    // Earlier Columns have valid names, so the stem is compared as it will be.
    const std::string first = Make_Valid_Name(std::string(stem).append("[1]"));
    const std::string_view valid_stem = Stem_Of(first);
    return std::string(valid_stem)
        .append(Format_Text("[%li]", static_cast<long>(Count_Stem(sheet, valid_stem)) + 1));
}

void Name_Column(const Sheet& sheet, Column& column, std::string_view name)
{
    std::string wanted = Number_Quoted_Suffix(sheet, column, name);
    const bool table_factor = column.type == factor_column && sheet.type == table_sheet;
    if (table_factor
        && (wanted.starts_with("vclass['classification'][") || wanted.starts_with("*['classification'][")))
        wanted = Default_Column_Name(0);
    else if (!Holds_Labels(column.type) && column.type != row_column)
        wanted = Make_Valid_Name(wanted);
    column.name = wanted;
    if (column.type != row_column)
        Use_Bracket_Text(column);
}

void Set_Column_Defaults(const Sheet& sheet, Column& column)
{
    column.date_format = sheet.settings.date_format;
    column.date_form = sheet.settings.date_form;
    column.range_low = column.range_high = sheet.missing_value;
    if (Is_Text_Like(column.type))
        column.format = general_format;
    if (column.type == row_column) {
        column.format = fixed_format;
        column.decimals = 0;
    }
}

void Renumber_Columns(Sheet& sheet)
{
    std::int32_t index = 0;
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        column->index = index++;
    sheet.cursor_column_index = -1;
}

/// Counts a Column in or out of its Sheet.
void Count_Column(Sheet& sheet, const Column& column, std::int32_t by)
{
    if (column.type != row_column)
        sheet.column_count += by;
    if (Is_Leading(sheet, column.type))
        sheet.leading_columns += by;
}

void Place_New_Column(Sheet& sheet, Column& column)
{
    Count_Column(sheet, column, 1);
    if (Is_Units(column.type)) {
        Link_Before(sheet.first_column, sheet.last_column, sheet.first_column->next, &column, &column);
        Renumber_Columns(sheet);
        return;
    }
    column.index = sheet.last_column == nullptr ? 0 : sheet.last_column->index + 1;
    Link_Before(sheet.first_column, sheet.last_column, static_cast<Column*>(nullptr), &column, &column);
}

}  // namespace

Column* New_Column(Sheet* sheet, std::int32_t type, std::string_view name, std::int32_t text_width)
{
    if (sheet == nullptr || (type != row_column && sheet->column_count >= request.Max_Columns))
        return nullptr;
    auto owner = std::make_unique<Column>();
    Column& column = *owner;
    column.type = type;
    column.sheet = sheet;
    column.text_cell_width = text_width;
    Set_Column_Defaults(*sheet, column);
    Name_Column(*sheet, column, name);
    Place_New_Column(*sheet, *owner.release());
    return &column;
}

std::int32_t First_Row_Of(const Column& column)
{
    return column.type == symmetric_matrix_column ? column.index - column.sheet->leading_columns : 0;
}

std::int32_t Cells_For_Rows(const Column& column, std::int32_t rows)
{
    return column.type == symmetric_matrix_column ? std::max(rows - First_Row_Of(column), 0) : rows;
}

Column* New_Data_Column(Sheet* sheet, std::int32_t type, std::string_view name, std::int32_t length)
{
    const bool without_buffers = type == unbuffered_text_column;
    Column* const column = New_Column(sheet, without_buffers ? text_column : type, name);
    if (column == nullptr)
        return nullptr;
    column->length = length;
    column->width = 6;
    if (Is_Text_Like(column->type)) {
        column->decimals = 0;
        column->width = Wider(0, column->name) + 2;
    } else if (column->type == factor_column) {
        column->nlevels = 2;
    }
    if (length < 1)
        return column;
    if (Alloc_Cell_Nodes(type, length, column->first_cell, column->last_cell, column->blocks) == 0) {
        Delete_Column(column, false);
        return nullptr;
    }
    if (!Is_Text_Like(column->type) && sheet->missing_value != Missing_Value)
        for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            cell->value.number = sheet->missing_value;
    return column;
}

Column* Find_Column(const Sheet* sheet, std::string_view name)
{
    if (sheet == nullptr)
        return nullptr;
    const Telling_Parts wanted = Tell_Parts(name);
    for (Column* column = sheet->first_column; column != nullptr; column = column->next)
        if (column->type != row_column && Tell_Parts(column->name) == wanted)
            return column;
    return nullptr;
}

bool Unlink_Column(Column* column)
{
    if (column == nullptr || column->sheet == nullptr || column->type == row_column)
        return false;
    Sheet& sheet = *column->sheet;
    Unlink(sheet.first_column, sheet.last_column, column);
    Count_Column(sheet, *column, -1);
    Renumber_Columns(sheet);
    return true;
}

bool Insert_Column_At(Sheet* sheet, Column* column, std::int32_t index)
{
    if (sheet == nullptr || column == nullptr || index < 1 || index > sheet->column_count + 1)
        return false;
    Column* const before = index > sheet->column_count ? nullptr : Column_At(sheet, index);
    Link_Before(sheet->first_column, sheet->last_column, before, column, column);
    column->sheet = sheet;
    Count_Column(*sheet, *column, 1);
    Renumber_Columns(*sheet);
    return true;
}

bool Move_Column(Sheet* sheet, std::int32_t from, std::int32_t to)
{
    if (sheet == nullptr || sheet->read_only != 0 || from < 1 || to < 1 || to > sheet->column_count)
        return false;
    Column* const column = Column_At(sheet, from);
    return Unlink_Column(column) && Insert_Column_At(sheet, column, to);
}

void Set_Column_Type(Column& column, std::int32_t type)
{
    if (!Is_Units(column.type) && !Is_Units(type)) {
        column.attached_text.clear();  // what it computes is of the old type
        column.attached_mode = 0;
    }
    Sheet& sheet = *column.sheet;
    const std::int32_t index = column.index;
    const bool leading = Is_Leading(sheet, type);
    if (Is_Leading(sheet, column.type) == leading) {
        column.type = type;
        return;
    }
    Unlink_Column(&column);
    column.type = type;
    Insert_Column_At(&sheet, &column, leading ? 1 : std::max(index, sheet.leading_columns));
}

void Number_Matrix_Columns(Sheet* sheet)
{
    if (sheet == nullptr)
        return;
    for (Column* column = sheet->first_column; column != nullptr; column = column->next)
        if (column->type == matrix_column || column->type == symmetric_matrix_column)
            column->name = std::to_string(column->index - sheet->leading_columns + 1);
}

namespace {

/// Ends a Column that is in no list any more.
void Free_Column(Sheet& sheet, Column* column)
{
    if (sheet.has_colour_sources != 0)
        for (Column* other = sheet.first_column; other != nullptr; other = other->next)
            if (other->colour_source == column)
                other->colour_source = nullptr;
    delete column;
}

}  // namespace

void Replace_Column(Column* old, Column* column)
{
    Sheet& sheet = *old->sheet;
    Unlink(column->sheet->first_column, column->sheet->last_column, column);
    Count_Column(*column->sheet, *column, -1);
    column->sheet->cursor_column_index = -1;
    Link_Before(sheet.first_column, sheet.last_column, old, column, column);
    column->sheet = &sheet;
    column->index = old->index;
    Count_Column(sheet, *column, 1);
    Unlink(sheet.first_column, sheet.last_column, old);
    Count_Column(sheet, *old, -1);
    sheet.cursor_column_index = -1;
    Free_Column(sheet, old);
}

void Take_Columns(Sheet* sheet, Column* first)
{
    Sheet& from = *first->sheet;
    for (Column* column = first; column != nullptr;) {
        Column* const next = column->next;
        Unlink(from.first_column, from.last_column, column);
        Count_Column(from, *column, -1);
        Link_Before(sheet->first_column, sheet->last_column, static_cast<Column*>(nullptr), column, column);
        column->sheet = sheet;
        Count_Column(*sheet, *column, 1);
        column = next;
    }
    Renumber_Columns(from);
    Renumber_Columns(*sheet);
}

bool Delete_Column(Column* column, bool keep_square)
{
    if (column == nullptr || column->sheet == nullptr)
        return false;
    Sheet* const sheet = column->sheet;
    const std::int32_t row = First_Row_Of(*column);
    const bool symmetric = column->type == symmetric_matrix_column;
    if (!Unlink_Column(column))
        return false;
    Free_Column(*sheet, column);
    if (symmetric && keep_square)
        Delete_Row(sheet, row, false);
    if (sheet->label_state == 0)
        Number_Matrix_Columns(sheet);
    return true;
}

namespace {

/// Deletes the columns that `unwanted` names, from the last to the first; never the `Row` column. Of a
/// Symmetric Matrix their rows go as well. The others are numbered once: a wide sheet may lose thousands.
template <class Unwanted> void Delete_Columns(Sheet& sheet, Unwanted unwanted)
{
    for (Column* column = sheet.last_column; column != nullptr && column->type != row_column;) {
        Column* const one = std::exchange(column, column->prev);
        if (!unwanted(*one))
            continue;
        if (one->type == symmetric_matrix_column) {
            Delete_Column(one, true);
            continue;
        }
        Unlink(sheet.first_column, sheet.last_column, one);
        Count_Column(sheet, *one, -1);
        Free_Column(sheet, one);
    }
    Renumber_Columns(sheet);
    if (sheet.label_state == 0)
        Number_Matrix_Columns(&sheet);
}

}  // namespace

void Keep_Columns(Sheet* sheet, std::int32_t first, std::int32_t last)
{
    if (sheet != nullptr)
        Delete_Columns(*sheet, [first, last](const Column& column) {
            return column.index < first || column.index > last;
        });
}

void Keep_Columns(Sheet* sheet, const std::vector<bool>& wanted)
{
    if (sheet != nullptr)
        Delete_Columns(*sheet, [&wanted](const Column& column) {
            const auto place = static_cast<std::size_t>(column.index) - 1;
            return place >= wanted.size() || !wanted[place];
        });
}

bool Delete_Empty_Columns(Sheet* sheet)
{
    if (sheet == nullptr)
        return false;
    if (sheet->type == table_sheet && sheet->table_ways >= 2 && sheet->has_table_data == 0)
        return true;
    if (Find_Empty_Columns(sheet, true) == 0)
        return true;
    const auto goes = [](const Column& column) {
        return column.all_empty != 0 && column.protected_column == 0;
    };
    for (const Column* column = sheet->first_column; column != nullptr; column = column->next)
        if (!column->input_name.empty() && goes(*column))  // nobody misses one without a name
            Note_Loss(Loss_Kind::metadata_dropped, column->name, 0, "a column without data");
    Delete_Columns(*sheet, goes);
    return true;
}

void Free_Cell_Nodes(Column* column, std::int32_t kind)
{
    if (column == nullptr)
        return;
    if (kind == level_value_nodes) {
        column->level_blocks.clear();
        column->level_values = nullptr;
        column->level_values_count = 0;
    } else if (kind == label_nodes) {
        column->label_blocks.clear();
        column->labels = nullptr;
        column->label_count = 0;
    } else {
        column->blocks.clear();
        column->first_cell = column->last_cell = column->cursor_node = nullptr;
        column->cursor_index = -1;
        column->length = 0;
        if (column->labels == nullptr)
            column->texts = Text_Arena{};
    }
}

bool Make_Level_Values(Column& column, std::int32_t count)
{
    Free_Cell_Nodes(&column, level_value_nodes);
    Level_Node* last;
    if (Alloc_Cell_Nodes(level_value_nodes, count, column.level_values, last, column.level_blocks) == 0)
        return false;
    column.level_values_count = count;
    return true;
}

bool Make_Labels(Column& column, std::int32_t count)
{
    Free_Cell_Nodes(&column, label_nodes);
    Level_Node* last;
    if (Alloc_Cell_Nodes(label_nodes, count, column.labels, last, column.label_blocks) == 0)
        return false;
    column.label_count = count;
    return true;
}

void Mark_Column_Changed(Column* column, bool clear_saved)
{
    if (column == nullptr)
        return;
    column->modified = 1;
    column->changed_display = 0;
    if (column->sheet == nullptr)
        return;
    column->sheet->modified = 1;
    if (clear_saved)
        column->sheet->saved = 0;
}

}  // namespace ingester

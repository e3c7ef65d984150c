#include "model/transpose.h"

#include "model/cell_appender.h"
#include "model/column_printer.h"
#include "model/factor_lists.h"
#include "model/level_tables.h"
#include "model/names.h"
#include "model/table_factor.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <optional>
#include <span>
#include <vector>

namespace ingester {

namespace {

/// One old data column, which becomes a row.
struct Old_Column {
    const Column* column;
    const Cell_Node* cell;                       ///< the next to be taken
    std::vector<double> levels;                  ///< of a Factor
    std::optional<Column_Printer> printer = {};  ///< where the new cells are texts
};

/// What is transposed into what.
struct Transposition {
    Sheet* from;
    Sheet* to = nullptr;
    Column* first_data;
    const Column* name_column = nullptr;  ///< gives the new columns their names
    std::vector<Old_Column> data = {};    ///< the new rows
    std::int32_t cell_type = variate_column;
    bool has_margin = false;
};

bool Can_Be_Transposed(const Sheet& sheet)
{
    if (sheet.type == symmetric_matrix_sheet || sheet.type == diagonal_matrix_sheet)
        return Fail("You do not need to transpose a symmetric or diagonal matrix.\n");
    if (sheet.type == table_sheet && sheet.table_ways > 2)
        return Fail("You cannot transpose a table with more than three classifying factors.\n");
    if (sheet.row_count > request.Max_Columns)
        return Fail("Cannot transpose a spreadsheet with more than %li rows\nThis sheet has %li rows.\n",
                    static_cast<long>(request.Max_Columns), static_cast<long>(sheet.row_count));
    return true;
}

std::int32_t New_Sheet_Type(const Sheet& sheet)
{
    return sheet.type == scalar_sheet ? vector_sheet : sheet.type;
}

/// The labels of a Vector's rows are those of its units, or those of its first Text column.
const Column* Find_Name_Column(Sheet& sheet)
{
    Column* const units = Column_At(&sheet, sheet.leading_columns - 1);
    if (sheet.type == matrix_sheet || sheet.type == table_sheet)
        return units;
    if (!request.Transpose_Names)
        return nullptr;
    const Column* const text = Nth_Column_Of_Type(&sheet, text_column, 1);
    return text != nullptr || units == nullptr || units->type == row_column ? text : units;
}

std::int32_t New_Cell_Type(const Transposition& work)
{
    switch (work.to->type) {
    case matrix_sheet:
        return matrix_column;
    case table_sheet:
        return table_column;
    default:
        break;
    }
    std::int32_t type = variate_column;
    for (const Old_Column& old : work.data) {
        if (old.column->type == long_text_column)
            return long_text_column;
        if (Is_Text_Like(old.column->type))
            type = text_column;
    }
    return type;
}

void Gather_Data(Transposition& work)
{
    for (const Column* column = work.first_data; column != nullptr; column = column->next)
        if (column != work.name_column)
            work.data.push_back(
                {column, column->first_cell,
                 column->type == factor_column ? Level_Table(*column) : std::vector<double>{}});
}

bool Make_New_Sheet(Transposition& work)
{
    const Sheet& from = *work.from;
    work.to = New_Sheet_With_Rows(static_cast<std::int32_t>(work.data.size()));
    if (work.to == nullptr)
        return false;
    Sheet& to = *work.to;
    to.type = New_Sheet_Type(from);
    to.missing_value = from.missing_value;
    to.structure_name = from.structure_name;
    to.sheet_name = from.sheet_name;
    to.source_file = from.source_file;
    to.table_ways = from.table_ways;
    Stamp_Title(&to, &from, "Transposed");
    return true;
}

// --- Labels of the new rows ----------------------------------------------------------------------

std::string Label_Column_Name(const Transposition& work)
{
    const Column* const old_units = Nth_Column_Of_Type(work.from, units_text_column, 1);
    if (old_units != nullptr)
        return std::string(old_units->name);
    const Column* const names = work.name_column;
    return names != nullptr && names->type == text_column ? std::string(names->name) : std::string();
}

double Label_Number(std::string_view name, double missing)
{
    double number;
    return Whole_Number_Text(Trim_Copy(name), number) ? number : missing;
}

/// The names of the old columns stand in front of the new rows.
bool Add_Label_Column(Transposition& work)
{
    const Sheet& from = *work.from;
    const bool texts = from.type != matrix_sheet || from.label_state == labels_by_text;
    Column* const labels =
        New_Data_Column(work.to, texts ? units_text_column : units_variate_column, Label_Column_Name(work),
                        static_cast<std::int32_t>(work.data.size()));
    if (labels == nullptr)
        return false;
    std::int32_t widest = 0;
    const Old_Column* old = work.data.data();
    for (Cell_Node* cell = labels->first_cell; cell != nullptr; cell = cell->next, ++old) {
        const std::string_view name = old->column->name;
        widest = Wider(widest, name);
        if (texts)
            Set_Text(*labels, *cell, name);
        else
            cell->value.number = Label_Number(name, from.missing_value);
    }
    labels->width = widest;
    return true;
}

/// The margin is no level of its own, but a row behind those of the levels.
std::int32_t New_Level_Count(const Transposition& work)
{
    return static_cast<std::int32_t>(work.data.size()) - (work.has_margin ? 1 : 0);
}

bool Label_Levels(const Transposition& work, Column& factor)
{
    std::vector<const Column*> columns;
    for (const Old_Column& old : std::span(work.data).first(static_cast<std::size_t>(factor.nlevels)))
        columns.push_back(old.column);
    return Take_Column_Levels(*work.from, columns, factor);
}

/// The factor across the old columns goes down the new rows.
bool Add_Row_Factor(Transposition& work)
{
    const Sheet& from = *work.from;
    Column* const factor = New_Data_Column(work.to, factor_column, from.row_label_name,
                                           static_cast<std::int32_t>(work.data.size()));
    if (factor == nullptr)
        return false;
    Take_Column_Factor_Look(from, *factor);
    factor->nlevels = New_Level_Count(work);
    if (factor->nlevels > 0 && from.label_state > labels_by_position && !Label_Levels(work, *factor))
        return false;
    std::int32_t level = 0;
    for (Cell_Node* cell = factor->first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = ++level;  // up to that of a margin
    Compute_Column_Width(factor);
    return true;
}

/// The old rows' factor goes across the new columns.
void Describe_Column_Factor(Transposition& work)
{
    Sheet& to = *work.to;
    const Column* const factor = work.name_column;
    if (work.has_margin) {
        to.has_margins = 1;
        to.margin_label = work.from->margin_label;
        to.margin_level = to.first_column->next->nlevels + 1;
    }
    if (factor == nullptr || factor->type != factor_column)
        return;
    Keep_As_Column_Factor(to, *factor);
    to.label_state = (factor->level_values != nullptr ? labels_by_level : labels_by_position)
                     + (factor->labels != nullptr ? labels_by_text : labels_by_position);
    to.labelled_columns = factor->factor_kind == factor_with_labels ? 1 : 0;
}

bool Add_Row_Labels(Transposition& work)
{
    if (work.to->type == table_sheet) {
        if (!Add_Row_Factor(work))
            return false;
        Describe_Column_Factor(work);
        return true;
    }
    if (work.to->type == matrix_sheet && work.from->label_state == labels_by_text_and_level)
        return true;
    return Add_Label_Column(work);
}

// --- Columns and cells -----------------------------------------------------------------------------

/// The columns of a Matrix whose rows had no labels stay named by number.
void Describe_Matrix_Columns(const Transposition& work)
{
    if (work.to->type != matrix_sheet)
        return;
    const std::int32_t type = work.name_column == nullptr ? row_column : work.name_column->type;
    work.to->label_state = type == row_column   ? labels_by_position
                           : Is_Text_Like(type) ? labels_by_text
                                                : labels_by_level;
}

/// What the labels of the rows make of themselves as names. Numbers that label a Matrix or a Table stay
/// numbers.
std::string Name_Of_Row(const Transposition& work, const std::optional<Column_Printer>& names,
                        const Cell_Node* cell)
{
    char text[Number_Text_Room];
    if (cell == nullptr)
        return {};
    const std::string_view label = names->Print(*cell, text);
    const bool number = work.to->type != vector_sheet && !Is_Text_Like(work.name_column->type)
                        && work.name_column->factor_kind != factor_with_labels;
    return number ? std::string(label) : Make_Valid_Name(label);
}

/// The old first Factor's level that a column of a Table stands for.
void Set_Table_Level(const Transposition& work, const std::vector<double>& values,
                     const std::vector<const char*>& labels, const Cell_Node& level, Column& column)
{
    const double number = level.value.number;
    column.table_margin_value = Of_Level(values, number, number);
    const char* const label = Of_Level<const char*>(labels, number, nullptr);
    column.table_label = label == nullptr ? column.name.view() : Text_Arena::View(label);
    if (work.has_margin && level.next == nullptr)
        column.table_label = work.to->margin_label;
}

/// A column of labels takes no place of a column of data.
class Room_For_Labels {
public:
    Room_For_Labels() { ++request.Max_Columns; }
    Room_For_Labels(const Room_For_Labels&) = delete;
    Room_For_Labels& operator=(const Room_For_Labels&) = delete;
    ~Room_For_Labels() { --request.Max_Columns; }
};

bool Add_New_Columns(Transposition& work)
{
    const std::int32_t rows = work.from->row_count;
    const bool table = work.to->type == table_sheet;
    const Room_For_Labels room;
    const bool classified = table && work.name_column->type == factor_column;
    const std::vector<double> values = classified ? Level_Table(*work.name_column) : std::vector<double>{};
    const std::vector<const char*> labels =
        classified ? Label_Table(*work.name_column) : std::vector<const char*>{};
    std::optional<Column_Printer> names;
    if (work.name_column != nullptr)
        names.emplace(*work.name_column);
    const Cell_Node* name = work.name_column == nullptr ? nullptr : work.name_column->first_cell;
    for (std::int32_t row = 0; row < rows; ++row) {
        const bool margin = work.has_margin && row == rows - 1;
        Column* const column =
            New_Column(work.to, margin ? table_margin_column : work.cell_type,
                       margin ? work.to->margin_label.view() : Name_Of_Row(work, names, name));
        if (column == nullptr)
            return false;
        column->width = 6;
        if (Is_Text_Like(column->type))
            column->decimals = 0;
        if (classified && name != nullptr)
            Set_Table_Level(work, values, labels, *name, *column);
        name = name == nullptr ? nullptr : name->next;
    }
    return true;
}

double Number_Of(const Old_Column& old)
{
    const double number = old.cell->value.number;
    return old.levels.empty() ? number : Of_Level(old.levels, number, number);
}

/// The next cell of an old column, as a cell of a new one.
Cell_Value Take_Cell(Old_Column& old, Column& column, double missing, std::span<char> room)
{
    const bool text = Is_Text_Like(column.type);
    Cell_Value value;
    if (old.cell == nullptr) {
        if (text)
            value.text = Text_Arena::Empty();
        else
            value.number = missing;
        return value;
    }
    if (text) {
        const std::string_view printed = old.printer->Print(*old.cell, room.data());
        value.text = column.texts.Store(printed);
        column.nlevels = Wider(column.nlevels, printed);
    } else {
        value.number = Is_Text_Like(old.column->type) ? missing : Number_Of(old);
    }
    old.cell = old.cell->next;
    return value;
}

/// A few old columns at a time, so that what is read and what is written both stay near.
void Move_Cells(Transposition& work)
{
    constexpr std::size_t columns_at_a_time = 64;
    char room[Number_Text_Room];
    const auto rows = static_cast<std::int32_t>(work.data.size());
    if (rows == 0)
        return;
    Column* const first = Column_At(work.to, work.to->leading_columns);
    if (Is_Text_Like(work.cell_type))
        for (Old_Column& old : work.data)
            old.printer.emplace(*old.column);
    std::vector<Cell_Appender> appenders = Make_Appenders(*work.to, first, rows);
    for (std::size_t begin = 0; begin < work.data.size(); begin += columns_at_a_time) {
        const auto part =
            std::span(work.data).subspan(begin, std::min(columns_at_a_time, work.data.size() - begin));
        Column* column = first;
        for (Cell_Appender& appender : appenders) {
            for (Old_Column& old : part)
                appender.Append(Take_Cell(old, *column, work.to->missing_value, room));
            column = column->next;
        }
    }
    for (Cell_Appender& appender : appenders)
        appender.Finish(rows);
}

void Measure_Text_Columns(Sheet& sheet)
{
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type == text_column || column->type == long_text_column)
            Compute_Column_Width(column);
}

}  // namespace

bool Transpose_Sheet(Sheet* sheet)
{
    if (sheet == nullptr || !Can_Be_Transposed(*sheet))
        return false;
    Transposition work{.from = sheet, .first_data = Column_At(sheet, sheet->leading_columns)};
    if (work.first_data == nullptr)
        return Fail("Internal Spreadsheet Error: Invalid column pointer in Transpose.\n");
    work.name_column = Find_Name_Column(*sheet);
    if (work.name_column != nullptr && work.name_column->type == row_column && !Need_Rows(sheet))
        return false;
    Gather_Data(work);
    work.has_margin = sheet->type == table_sheet && sheet->table_ways == 2 && sheet->has_margins != 0;
    Sheet* const earlier = Current_Sheet;
    if (!Make_New_Sheet(work))
        return false;
    work.cell_type = New_Cell_Type(work);
    if (!Add_Row_Labels(work) || !Add_New_Columns(work)) {
        Current_Sheet = earlier;
        return false;
    }
    Describe_Matrix_Columns(work);
    Move_Cells(work);
    Measure_Text_Columns(*work.to);
    return true;
}

}  // namespace ingester

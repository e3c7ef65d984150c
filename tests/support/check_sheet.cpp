#include "support/check_sheet.h"

#include "hostfiles/shared/host_sheet.h"
#include "model/factors.h"
#include "support/letters.h"

#include <cmath>

namespace ingester {

namespace {

/// The margin of a Table is one level more, and genotypes keep their level whatever labels there are.
double Greatest_Level(const Column& column)
{
    const Sheet& sheet = *column.sheet;
    const double levels = column.nlevels + (sheet.type == table_sheet && sheet.has_margins != 0 ? 1.0 : 0.0);
    return column.factor_recoded != 0 ? std::max<double>(levels, Greatest_Genotype_Level) : levels;
}

class Checker {
public:
    std::string Check(const Sheet& sheet);

private:
    /// What is wrong at a place of the part that is being looked at.
    void Expect(bool right, std::string_view what, std::int64_t at)
    {
        if (!right && faults_.size() < 1000)  // enough for a reader
            faults_ += where_ + ": " + std::string(what) + " " + std::to_string(at) + "\n";
    }

    /// Walks a list of `count` nodes and checks its links, its length and its remembered position. The last
    /// node.
    template <class Node> const Node* Check_List(const Node* first, std::int64_t count,
                                                 const Node* cursor = nullptr, std::int64_t cursor_index = -1)
    {
        const Node* before = nullptr;
        const Node* node = first;
        std::int64_t index = 0;
        for (; node != nullptr && index < count; before = node, node = node->next, ++index) {
            Expect(node->prev == before, "no link back from node", index);
            Expect(index != cursor_index || node == cursor, "another remembered node at", index);
        }
        Expect(node == nullptr, "more nodes than", count);
        Expect(index == count, "nodes in all:", index);
        Expect(cursor_index >= -1 && cursor_index < count, "remembered is the far position", cursor_index);
        return before;
    }

    void Check_Cell(const Column& column, const Cell_Node& cell, std::int64_t index);
    void Check_Column(const Sheet& sheet, const Column& column, std::int64_t index);

    std::string faults_;
    std::string where_ = "columns";
};

void Checker::Check_Cell(const Column& column, const Cell_Node& cell, std::int64_t index)
{
    // Unbuffered columns are stored as Text, so a null text is lawful in every kind of text.
    if (Is_Text_Like(column.type) && cell.value.text != nullptr) {
        const std::size_t width = column.type == long_text_column ? Long_Text_Width : Text_Cell_Width;
        Expect(!Has_More_Letters(cell.Text(), width), "too long a text in cell", index);
        Expect(cell.value.text[cell.Text().size()] == '\0', "an open text in cell", index);
    } else if (column.type == factor_column && !(cell.value.number < 1.0)) {
        const double level = cell.value.number;
        Expect(level <= Greatest_Level(column) && level == std::floor(level), "no such level in cell", index);
    }
}

void Checker::Check_Column(const Sheet& sheet, const Column& column, std::int64_t index)
{
    where_ = "column " + std::to_string(index) + " (" + std::string(column.name.view()) + ")";
    Expect(column.index == index, "stands for position", column.index);
    Expect((column.type == row_column) == (index == 0), "the Row column is at the head, only there", index);
    Expect(column.sheet == &sheet, "belongs to another Sheet", index);
    Expect(column.type != unbuffered_text_column, "has a type that is asked for, never stored", index);
    Expect(column.type == row_column || !column.name.empty(), "has no name", index);
    // A Symmetric Matrix column begins at the diagonal; all others have a cell for every row, but that
    // columns of the host's files may end earlier in a Vector.
    std::int64_t rows = column.type == row_column && sheet.rows_due ? 0 : sheet.row_count;
    if (column.type == symmetric_matrix_column)
        rows += sheet.leading_columns - column.index;
    const bool may_be_short = sheet.type == vector_sheet && sheet.has_short_columns != 0;
    Expect(column.length == rows || (column.length <= 0 && rows <= 0)
               || (may_be_short && column.length < rows),
           "has the length", column.length);
    const Cell_Node* const last =
        Check_List(column.first_cell, std::max(column.length, 0), column.cursor_node, column.cursor_index);
    Expect(column.last_cell == last, "another last node than", column.length);
    Check_List(column.level_values, column.level_values_count);
    Check_List(column.labels, column.label_count);
    std::int64_t at = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr && faults_.empty(); cell = cell->next)
        Check_Cell(column, *cell, at++);
    for (const Level_Node* label = column.labels; label != nullptr && faults_.empty(); label = label->next)
        Expect(label->value.text != nullptr && !Has_More_Letters(label->Text(), Long_Label_Width),
               "a label that is no text", 0);
    const bool factor = column.type == factor_column;
    Expect(!factor || column.factor_kind != factor_with_levels || column.level_values_count >= column.nlevels,
           "level values are only", column.level_values_count);
    Expect(!factor || column.factor_kind != factor_with_labels || column.label_count >= column.nlevels,
           "labels are only", column.label_count);
}

std::string Checker::Check(const Sheet& sheet)
{
    const Column* const last_column = Check_List(sheet.first_column, std::int64_t{sheet.column_count} + 1,
                                                 sheet.cursor_column, sheet.cursor_column_index);
    Expect(sheet.last_column == last_column, "another last node than", sheet.column_count);
    where_ = "rows";
    const Row_Node* const last_row = Check_List(sheet.first_row, sheet.rows_due ? 0 : sheet.row_count,
                                                sheet.cursor_row, sheet.cursor_row_index);
    Expect(sheet.last_row == last_row, "another last node than", sheet.row_count);
    std::int32_t index = 0;
    std::int32_t leading = 0;
    for (const Column* column = sheet.first_column; column != nullptr && faults_.empty();
         column = column->next) {
        leading += column->type <= row_column && leading == index ? 1 : 0;
        Check_Column(sheet, *column, index++);
        Expect(column->type > row_column || leading == index, "data stands before leading column", index - 1);
    }
    where_ = "head";
    Expect(!faults_.empty() || sheet.type != vector_sheet || sheet.leading_columns == leading,
           "leading columns in all:", leading);
    return faults_;
}

}  // namespace

std::string Check_Sheet(const Sheet& sheet)
{
    return Checker().Check(sheet);
}

}  // namespace ingester

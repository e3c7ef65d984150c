#include "support/check_sheet.h"

#include <algorithm>
#include <cmath>
#include <cstdint>
#include <string_view>

namespace ingester {

namespace {

/// Collects faults, but no more of them than a reader of the report wants to see.
class Fault_List {
public:
    void Add(const std::string& where, const std::string& what)
    {
        if (count_++ < greatest_count)
            text_.append(where).append(": ").append(what).append("\n");
    }
    [[nodiscard]] bool Full() const { return count_ >= greatest_count; }
    [[nodiscard]] const std::string& Text() const { return text_; }

private:
    static constexpr int greatest_count = 8;
    std::string text_;
    int count_ = 0;
};

/// Walks a list of nodes, shows each to `visit(node, index)` and checks its links, its length and
/// its remembered position.
template <class Node, class Visit>
void Check_List(const std::string& where, const Node* first, const Node* last, std::int64_t expected,
                const Node* cursor, std::int64_t cursor_index, Fault_List& faults, Visit visit)
{
    const Node* before = nullptr;
    std::int64_t index = 0;
    for (const Node* node = first; node != nullptr; node = node->next, ++index) {
        if (index >= expected) {
            faults.Add(where, "more than the stated " + std::to_string(expected) + " nodes");
            return;
        }
        if (node->prev != before)
            faults.Add(where, "node " + std::to_string(index) + " does not point back to the one before");
        if (index == cursor_index && node != cursor)
            faults.Add(where, "the remembered node is not the one at " + std::to_string(index));
        visit(*node, index);
        if (faults.Full())
            return;
        before = node;
    }
    if (index != expected)
        faults.Add(where, std::to_string(index) + " nodes, stated are " + std::to_string(expected));
    if (last != before)
        faults.Add(where, "the last node is not the end of the list");
    if (cursor_index < -1 || cursor_index >= expected)
        faults.Add(where, "remembered position " + std::to_string(cursor_index) + " is outside");
    if (cursor_index >= 0 && cursor == nullptr)
        faults.Add(where, "a remembered position without a node");
}

const Cell_Node* Last_Of(const Cell_Node* node, std::int64_t count)
{
    while (node != nullptr && node->next != nullptr && --count > 0)
        node = node->next;
    return node;
}

std::string Where_Is(const Column& column)
{
    return "column " + std::to_string(column.index) + " (" + std::string(column.name.view()) + ")";
}

/// A Symmetric Matrix column begins at the diagonal; all others have a cell for every row.
std::int64_t Expected_Length(const Sheet& sheet, const Column& column)
{
    const std::int64_t rows = column.type == row_column && sheet.rows_due ? 0 : sheet.row_count;
    return column.type == symmetric_matrix_column ? rows + sheet.leading_columns - column.index : rows;
}

void Check_Text(const std::string& where, const Column& column, const Cell_Node& cell, std::int64_t index,
                Fault_List& faults)
{
    // Unbuffered columns are stored as Text, so a null text is lawful in every kind of text.
    if (cell.value.text == nullptr)
        return;
    const std::size_t width = column.type == long_text_column ? Long_Text_Width : Text_Cell_Width;
    if (cell.Text().size() > width)
        faults.Add(where, "the text of cell " + std::to_string(index) + " has "
                              + std::to_string(cell.Text().size()) + " characters");
    if (cell.value.text[cell.Text().size()] != '\0')
        faults.Add(where, "the text of cell " + std::to_string(index) + " is not closed");
}

void Check_Level(const std::string& where, const Column& column, const Cell_Node& cell, std::int64_t index,
                 Fault_List& faults)
{
    const double level = cell.value.number;
    if (level < 1.0)
        return;
    if (!(level <= column.nlevels) || level != std::floor(level))
        faults.Add(where, "cell " + std::to_string(index) + " holds level " + std::to_string(level) + " of "
                              + std::to_string(column.nlevels));
}

void Check_Factor_Lists(const std::string& where, const Column& column, Fault_List& faults)
{
    Check_List(where + " level values", column.level_values,
               Last_Of(column.level_values, column.level_values_count), column.level_values_count,
               static_cast<const Level_Node*>(nullptr), -1, faults, [](const Level_Node&, std::int64_t) {});
    Check_List(where + " labels", column.labels, Last_Of(column.labels, column.label_count),
               column.label_count, static_cast<const Level_Node*>(nullptr), -1, faults,
               [&](const Level_Node& label, std::int64_t index) {
                   if (label.value.text == nullptr || label.Text().size() > Text_Cell_Width)
                       faults.Add(where, "label " + std::to_string(index + 1) + " is null or too long");
               });
    if (column.factor_kind == factor_with_levels && column.level_values_count < column.nlevels)
        faults.Add(where, "fewer level values than levels");
    if (column.factor_kind == factor_with_labels && column.label_count < column.nlevels)
        faults.Add(where, "fewer labels than levels");
}

void Check_Column(const Sheet& sheet, const Column& column, Fault_List& faults)
{
    const std::string where = Where_Is(column);
    if (column.sheet != &sheet)
        faults.Add(where, "belongs to another Sheet");
    if (column.type == unbuffered_text_column)
        faults.Add(where, "has a type that is asked for, never stored");
    if (column.type != row_column && column.name.empty())
        faults.Add(where, "has no name");
    const std::int64_t expected = Expected_Length(sheet, column);
    if (column.length != expected && (column.length > 0 || expected > 0))
        faults.Add(where, "length " + std::to_string(column.length) + " where the Sheet's rows ask for "
                              + std::to_string(expected));
    Check_List(where, column.first_cell, column.last_cell, std::max(column.length, 0), column.cursor_node,
               column.cursor_index, faults, [&](const Cell_Node& cell, std::int64_t index) {
                   if (Is_Text_Like(column.type))
                       Check_Text(where, column, cell, index, faults);
                   else if (column.type == factor_column)
                       Check_Level(where, column, cell, index, faults);
               });
    if (column.type == factor_column)
        Check_Factor_Lists(where, column, faults);
}

}  // namespace

std::string Check_Sheet(const Sheet& sheet)
{
    Fault_List faults;
    if (sheet.row_count < 0 || sheet.column_count < 0)
        faults.Add("sheet", "a negative count of rows or columns");
    Check_List("columns", sheet.first_column, sheet.last_column, std::int64_t{sheet.column_count} + 1,
               sheet.cursor_column, sheet.cursor_column_index, faults,
               [&](const Column& column, std::int64_t index) {
                   if (column.index != index)
                       faults.Add(Where_Is(column), "stands at position " + std::to_string(index));
                   if ((column.type == row_column) != (index == 0))
                       faults.Add(Where_Is(column), "the Row column is at the head, and only there");
                   Check_Column(sheet, column, faults);
               });
    Check_List("rows", sheet.first_row, sheet.last_row, sheet.rows_due ? 0 : sheet.row_count,
               sheet.cursor_row, sheet.cursor_row_index, faults, [](const Row_Node&, std::int64_t) {});
    return faults.Text();
}

}  // namespace ingester

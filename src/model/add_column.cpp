// Columns as they are asked for: of a type that suits the Sheet, with levels, labels and a first value.
#include "model/column_rules.h"
#include "model/factor_lists.h"
#include "model/sheet.h"
#include "request/messages.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace ingester {

namespace {

const Level_Node* Find_Label(const Column& column, std::string_view text, bool ignore_case, double& level)
{
    level = 1.0;
    for (const Level_Node* node = column.labels; node != nullptr; node = node->next, level += 1.0)
        if (ignore_case ? Equal_Folded(node->Text(), text) : node->Text() == text)
            return node;
    return nullptr;
}

/// The number that starts `text`, or `missing` for "*", nothing, or one out of range.
double Fill_Number(std::string_view text, double missing)
{
    text = Trim_Copy(text);
    const Parsed_Number parsed = Parse_Number(text.data(), text.data() + text.size());
    return parsed.status == Number_Status::good ? parsed.value : missing;
}

/// The level that `text` selects: by label, by nearest level value, or by rounding.
double Fill_Level(const Column& column, std::string_view text)
{
    const double missing = column.sheet->missing_value;
    double level;
    if (column.nlevels < 1)
        return missing;
    if (column.factor_kind == factor_with_labels)
        return Find_Label(column, text, false, level) != nullptr
                       || Find_Label(column, text, true, level) != nullptr
                   ? level
                   : missing;
    const double value = Fill_Number(text, missing);
    if (!(value > missing))
        return missing;
    if (column.factor_kind == factor_with_levels)
        return Nearest_Level(column, value);
    return std::clamp(std::floor(value + 0.5), 1.0, static_cast<double>(column.nlevels));
}

}  // namespace

bool Fill_Column(Column* column, std::int32_t type, std::int32_t length, std::int32_t nlevels,
                 std::string_view text)
{
    if (column == nullptr || column->first_cell != nullptr)
        return false;
    if (type == scalar_column && length != 1)
        return Fail("Internal Spreadsheet Error: Requested Scalar type with length <> 1.\n");
    column->type = type;
    column->length = length;
    if (type == factor_column)
        column->nlevels = nlevels;
    if (length < 1)
        return true;
    if (Alloc_Cell_Nodes(type, length, column->first_cell, column->last_cell, column->blocks) == 0) {
        column->length = 0;
        return false;
    }
    if (Is_Text_Like(type)) {
        for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            Set_Text(*column, *cell, text);
        return true;
    }
    const double value =
        type == factor_column ? Fill_Level(*column, text) : Fill_Number(text, column->sheet->missing_value);
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = value;
    return true;
}

namespace {

/// The type that a Column asked for as `wanted` gets in this Sheet; false when it may not be added.
bool Overrule_Type(const Sheet& sheet, std::int32_t wanted, std::int32_t position, std::int32_t& type)
{
    type = wanted;
    switch (sheet.type) {
    case vector_sheet:
        return Is_Units(wanted) || wanted == factor_column || wanted == text_column
               || wanted == variate_column || wanted == long_text_column;
    case matrix_sheet:
        type = Is_Units(wanted) ? wanted : matrix_column;
        return true;
    case symmetric_matrix_sheet:
        type = Is_Units(wanted) ? wanted : symmetric_matrix_column;
        return true;
    case diagonal_matrix_sheet:
        type = Is_Units(wanted) ? wanted : diagonal_matrix_column;
        return true;
    case table_sheet:
        type = wanted == factor_column && position == 1 ? factor_column : table_column;
        return true;
    case scalar_sheet:
        return wanted == scalar_column;
    default:
        return false;
    }
}

std::int32_t Level_Value_Width(double value)
{
    constexpr std::int32_t exponent_width = 12;
    const double size = std::fabs(value);
    if (size <= 1e-10 || size >= 1e10)
        return exponent_width;
    return static_cast<std::int32_t>(std::max(std::trunc(std::log10(size)), 0.0)) + 1;
}

/// The next node of a list, null behind its end.
const Level_Node* Step_Over(const Level_Node*& node)
{
    return node == nullptr ? nullptr : std::exchange(node, node->next);
}

bool Copy_Level_Values(Column& column, const Column_Request& wanted)
{
    const Level_Node* from = wanted.level_values;
    return Put_Level_Values(column, from == nullptr ? 0 : wanted.level_values_count, [&] {
        const Level_Node* const node = Step_Over(from);
        if (node == nullptr)
            return Missing_Value;
        column.width = std::max(column.width, Level_Value_Width(node->value.number));
        return node->value.number;
    });
}

bool Copy_Labels(Column& column, const Column_Request& wanted)
{
    const Level_Node* from = wanted.labels;
    return Put_Labels(column, from == nullptr ? 0 : wanted.label_count, [&] {
        const Level_Node* const node = Step_Over(from);
        return node == nullptr ? Text_Arena::Empty() : column.texts.Store(node->Text());
    });
}

bool Copy_Levels(Column& column, const Column_Request& wanted)
{
    column.nlevels = wanted.nlevels;
    if (!Copy_Level_Values(column, wanted) || !Copy_Labels(column, wanted))
        return false;
    column.width = std::max(column.width, column.label_width);
    column.factor_kind = Factor_Kind_Of(column);
    return true;
}

/// The index that a Column added at `position` gets: data stays behind the leading columns.
std::int32_t Target_Index(const Sheet& sheet, const Column& column, std::int32_t position, bool insert_after)
{
    const bool leading = Is_Leading(sheet, column.type);
    const std::int32_t first = leading ? 1 : sheet.leading_columns;
    const std::int32_t last = leading ? sheet.leading_columns - 1 : sheet.column_count;
    if (position >= last)
        return last;
    return std::max(insert_after ? position + 1 : position, first);
}

}  // namespace

Column* Add_Column(Sheet* sheet, const Column_Request& wanted, std::int32_t position, bool insert_after)
{
    if (sheet == nullptr || sheet->read_only != 0)
        return nullptr;
    std::int32_t type;
    if (!Overrule_Type(*sheet, wanted.type, position, type)) {
        Report_Message("You cannot add a column of that type to this spreadsheet.\n");
        return nullptr;
    }
    Column* const column = New_Column(sheet, type, wanted.name);
    if (column == nullptr)
        return nullptr;
    const std::int32_t index = Target_Index(*sheet, *column, position, insert_after);
    if (!Is_Units(type) && column->index != index)
        Move_Column(sheet, column->index, index);
    column->decimals = wanted.decimals;
    column->width = 6;
    const bool square = type == symmetric_matrix_column;
    if (square && !Insert_Rows(sheet, First_Row_Of(*column), 1, false)) {
        Delete_Column(column, false);
        return nullptr;
    }
    if ((type == factor_column && !Copy_Levels(*column, wanted))
        || !Fill_Column(column, type, Cells_For_Rows(*column, sheet->row_count), wanted.nlevels,
                        wanted.fill)) {
        Delete_Column(column, square);
        return nullptr;
    }
    if (sheet->label_state == 0 && Holds_Labels(type))
        Number_Matrix_Columns(sheet);
    return column;
}

}  // namespace ingester

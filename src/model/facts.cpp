// What a Sheet and its Columns say of themselves: type names, widths, statistics.
#include "model/level_tables.h"
#include "model/number_format.h"
#include "model/sheet.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <vector>

namespace ingester {

namespace {

struct Type_Name {
    std::int32_t type;
    std::string_view name;
};

constexpr Type_Name Sheet_Type_Names[] = {
    {vector_sheet, "Vector"},
    {matrix_sheet, "Matrix"},
    {symmetric_matrix_sheet, "Symmetric Matrix"},
    {diagonal_matrix_sheet, "Diagonal Matrix"},
    {scalar_sheet, "Scalar"},
};

constexpr Type_Name Column_Type_Names[] = {
    {units_variate_column, "Units Variate"},
    {units_text_column, "Units Text"},
    {scalar_column, "Scalar"},
    {factor_column, "Factor"},
    {text_column, "Text"},
    {variate_column, "Variate"},
    {matrix_column, "Matrix"},
    {diagonal_matrix_column, "Diagonal Matrix"},
    {symmetric_matrix_column, "Symmetric Matrix"},
    {table_column, "Table"},
    {table_margin_column, "Table Margin"},
    {long_text_column, "Text"},
};

template <std::size_t Count>
std::string_view Look_Up_Type(const Type_Name (&names)[Count], std::int32_t type, std::string_view otherwise)
{
    for (const Type_Name& entry : names)
        if (entry.type == type)
            return entry.name;
    return otherwise;
}

}  // namespace

std::string Sheet_Type_Name(const Sheet& sheet)
{
    if (sheet.type == table_sheet)
        return Format_Text("%li-way Table", static_cast<long>(sheet.table_ways));
    return std::string(Look_Up_Type(Sheet_Type_Names, sheet.type, "Unknown"));
}

std::string_view Column_Type_Name(const Column& column)
{
    return Look_Up_Type(Column_Type_Names, column.type, "Unknown");
}

std::int32_t Count_Columns_Of_Type(const Sheet* sheet, std::int32_t type, bool only_selected)
{
    std::int32_t count = 0;
    const Column* column = sheet == nullptr ? nullptr : sheet->first_column;
    for (; column != nullptr; column = column->next)
        count += column->type != row_column && (type == Any_Column_Type || column->type == type)
                         && (!only_selected || column->range_selected != 0)
                     ? 1
                     : 0;
    return count;
}

Column* Nth_Column_Of_Type(const Sheet* sheet, std::int32_t type, std::int32_t n)
{
    Column* column = sheet == nullptr ? nullptr : sheet->first_column;
    for (; column != nullptr; column = column->next)
        if (column->type != row_column && (type == Any_Column_Type || column->type == type) && --n == 0)
            return column;
    return nullptr;
}

bool Doubles_Equal(double a, double b)
{
    constexpr double tolerance = 1e-12;
    if (a == b)
        return true;
    if (a == 0.0 || b == 0.0)
        return false;
    return std::fabs(a - b) < tolerance * std::max(std::fabs(a), std::fabs(b));
}

double Factor_Level_Value(const Column& column, std::int32_t level)
{
    const Level_Node* node = column.level_values;
    for (std::int32_t i = 1; i < level && node != nullptr; ++i)
        node = node->next;
    return node == nullptr || column.level_values_count < level ? level : node->value.number;
}

std::int32_t Nearest_Level(const Column& column, double value)
{
    std::int32_t nearest = 0;
    std::int32_t level = 0;
    double distance = HUGE_VAL;
    for (const Level_Node* node = column.level_values; node != nullptr; node = node->next) {
        ++level;
        const double away = std::fabs(node->value.number - value);
        if (away < distance) {
            distance = away;
            nearest = level;
        }
    }
    return nearest;
}

namespace {

std::int32_t Widest_Text(const Cell_Node* node)
{
    std::int32_t widest = 0;
    for (; node != nullptr; node = node->next)
        widest = Wider(widest, node->Text());
    return widest;
}

std::int32_t Widest_Number(const Column& column, const Cell_Node* node)
{
    char text[Number_Text_Room];
    std::ptrdiff_t widest = 0;
    for (; node != nullptr; node = node->next)
        widest = std::max(widest, Format_Cell_Number(text, column, node->value.number) - text);
    return static_cast<std::int32_t>(widest);
}

std::int32_t Measure_Factor(Column& column)
{
    char text[Number_Text_Room];
    switch (column.factor_kind) {
    case factor_with_labels:
        return column.label_width = Widest_Text(column.labels);
    case factor_with_levels:
        return Widest_Number(column, column.level_values);
    default:
        return static_cast<std::int32_t>(Print_Integer(text, column.nlevels) - text);
    }
}

}  // namespace

std::int32_t Compute_Text_Width(Column* column)
{
    if (column == nullptr)
        return 0;
    if (Is_Text_Like(column->type))
        return column->nlevels = Widest_Text(column->first_cell);
    if (column->type != factor_column)
        return Widest_Number(*column, column->first_cell);
    if (column->factor_kind == plain_factor)
        return Measure_Factor(*column) + 1;
    std::int32_t widest = Measure_Factor(*column);
    if (column->sheet->has_margins != 0)
        widest = Wider(widest, column->sheet->margin_label);
    return column->label_width = widest;
}

void Compute_Column_Width(Column* column)
{
    constexpr std::int32_t least_text_width = 2;
    constexpr std::int32_t most_name_width = 11;
    if (column == nullptr)
        return;
    std::int32_t widest;
    if (Is_Text_Like(column->type))
        widest = column->nlevels = std::max(Widest_Text(column->first_cell), least_text_width);
    else if (column->type == factor_column)
        widest = Measure_Factor(*column);
    else
        widest = Widest_Number(*column, column->first_cell);
    const auto name_width = std::min(Wider(0, column->name), most_name_width);
    column->width = std::max(widest, name_width) + 1;
}

bool Column_Statistics(const Column* column, Column_Summary& summary)
{
    if (column == nullptr || column->sheet == nullptr || Is_Text_Like(column->type))
        return false;
    const double missing = column->sheet->missing_value;
    const bool factor = column->type == factor_column;
    const std::vector<double> levels = factor ? Level_Table(*column) : std::vector<double>{};
    summary = {Greatest_Number, Missing_Value, missing, 0};
    double sum = 0.0;
    std::int64_t present = 0;
    for (const Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next) {
        double value = cell->value.number;
        if (factor ? !(value > 0.0) : !(value > missing)) {
            ++summary.missing;
            continue;
        }
        value = Of_Level(levels, value, value);
        summary.min = std::min(summary.min, value);
        summary.max = std::max(summary.max, value);
        sum += value;
        ++present;
    }
    if (present > 1)
        summary.mean = sum / static_cast<double>(present);
    if (summary.min == Greatest_Number)
        summary.min = missing;
    return true;
}

namespace {

struct Distinct_Count {
    std::int64_t present = 0;
    std::int64_t distinct = 0;
    bool too_many = false;
};

/// Gathers the values that `value_of` gives for present cells, up to the limit of distinct ones.
template <class Value, class Value_Of, class Equal>
Distinct_Count Count_Distinct(const Column& column, Value_Of value_of, Equal equal)
{
    const auto limit = static_cast<std::size_t>(std::max(column.sheet->settings.max_factor_levels, 0));
    Distinct_Count count;
    std::vector<Value> seen;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        if (!Cell_Is_Present(column, *cell))
            continue;
        ++count.present;
        const Value value = value_of(*cell);
        if (std::any_of(seen.begin(), seen.end(), [&](const Value& other) { return equal(other, value); }))
            continue;
        seen.push_back(value);
        if (seen.size() > limit) {
            count.too_many = true;
            break;
        }
    }
    count.distinct = static_cast<std::int64_t>(seen.size());
    return count;
}

}  // namespace

bool Should_Be_Factor(const Column* column)
{
    constexpr std::int32_t least_length = 6;
    if (column == nullptr || column->type == factor_column)
        return false;
    const Distinct_Count count =
        Is_Text_Like(column->type)
            ? Count_Distinct<std::string_view>(
                *column, [](const Cell_Node& cell) { return cell.Text(); }, std::equal_to<>{})
            : Count_Distinct<double>(
                *column, [](const Cell_Node& cell) { return cell.value.number; }, Doubles_Equal);
    if (count.too_many || count.present < 2)
        return false;
    if (3 * count.distinct <= 2 * count.present)
        return true;
    if (2 * count.distinct > column->length || count.distinct < 2)
        return false;
    return column->length >= least_length;
}

namespace {

/// Changes all numbers of a column that a missing value may stand in.
template <class Change> void Change_Numbers(Column& column, Change change)
{
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        change(cell->value.number);
    for (Level_Node* level = column.level_values; level != nullptr; level = level->next)
        change(level->value.number);
    change(column.range_low);
    change(column.range_high);
    if (column.sheet != nullptr && column.sheet->type == table_sheet)
        change(column.table_margin_value);
}

}  // namespace

void Change_Missing_Value(Column* column, double new_value, double old_value)
{
    if (column == nullptr || Is_Text_Like(column->type))
        return;
    Change_Numbers(*column, [&](double& value) {
        if (Doubles_Equal(value, old_value))
            value = new_value;
    });
}

void Use_Usual_Missing_Value(Sheet& sheet)
{
    const double marker = sheet.missing_value;
    if (marker == Missing_Value)
        return;
    sheet.missing_value = Missing_Value;
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (!Is_Text_Like(column->type))
            Change_Numbers(*column, [&](double& value) {
                if (!(value > marker))
                    value = Missing_Value;
            });
}

}  // namespace ingester

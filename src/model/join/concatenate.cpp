#include "model/join/concatenate.h"

#include "model/column_rules.h"
#include "model/join/refusals.h"
#include "model/names.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <string>
#include <unordered_map>
#include <unordered_set>

namespace ingester {

namespace {

bool Fit_Together(const Sheet* target, const Sheet* source)
{
    if (target == nullptr || source == nullptr || target == source)
        return Fail(Nothing_To_Join);
    if (target->read_only != 0)
        return Fail(Output_Is_Read_Only);
    const bool keeps_type =
        source->type == vector_sheet || source->type == scalar_sheet || source->type == matrix_sheet;
    if (keeps_type && source->type != target->type)
        return Fail("The table in the output is of another kind.\n");
    return target->row_count == source->row_count
           || Fail("The table in the output has another number of rows than the new data.\n");
}

bool Replaces(const Column& column)
{
    return (column.type >= scalar_column && column.type <= matrix_column) || column.type == long_text_column;
}

void Fit_Missing_Values(Sheet& source, double missing)
{
    for (Column* column = source.first_column->next; column != nullptr; column = column->next)
        if (source.missing_value != missing)
            Change_Missing_Value(column, missing, source.missing_value);
}

void Replace_Equal_Names(Sheet& target, Sheet& source)
{
    std::unordered_map<std::string, Column*> by_name;
    for (Column* column = target.first_column; column != nullptr; column = column->next)
        if (Replaces(*column))
            by_name.try_emplace(Folded(column->name), column);
    for (Column* column = source.first_column; column != nullptr;) {
        Column* const next = column->next;
        const auto found = Replaces(*column) ? by_name.find(Folded(column->name)) : by_name.end();
        if (found != by_name.end()) {
            Replace_Column(found->second, column);
            by_name.erase(found);
        }
        column = next;
    }
}

/// Labels of the source's units are data like others where they stand beside those of the target.
void Turn_Units_Into_Data(Sheet& source)
{
    if (source.type != vector_sheet || !For_People(People_Rule::kept_levels))
        return;
    for (Column* column = source.first_column; column != nullptr;) {
        Column* const next = column->next;
        if (Is_Units(column->type))
            Set_Column_Type(*column, column->type == units_text_column ? text_column : variate_column);
        column = next;
    }
}

/// The first column that goes behind those of the target. Factors of a Table classify it, and belong to
/// nothing else.
Column* First_To_Move(const Sheet& source)
{
    if (source.type != vector_sheet && source.type != scalar_sheet)
        return nullptr;
    Column* column = source.first_column;
    while (column != nullptr && !Replaces(*column))
        column = column->next;
    return column;
}

/// How many columns of the source go behind those of the target, since they find none of their name to
/// replace.
std::int32_t Columns_To_Move(const Sheet& target, const Sheet& source, bool replace_equal_names)
{
    if (First_To_Move(source) == nullptr)
        return 0;
    if (!replace_equal_names)
        return source.column_count;
    std::unordered_set<std::string> names;
    for (const Column* column = target.first_column; column != nullptr; column = column->next)
        if (Replaces(*column))
            names.insert(Folded(column->name));
    std::int32_t count = 0;
    for (const Column* column = source.first_column->next; column != nullptr; column = column->next)
        count += Replaces(*column) && names.erase(Folded(column->name)) > 0 ? 0 : 1;
    return count;
}

}  // namespace

bool Concatenate_Sheets(Sheet* target, Sheet* source, bool replace_equal_names)
{
    if (!Fit_Together(target, source))
        return false;
    Turn_Units_Into_Data(*source);
    const bool replaces =
        replace_equal_names && (source->type == vector_sheet || source->type == matrix_sheet);
    if (Columns_To_Move(*target, *source, replace_equal_names) > request.Max_Columns - target->column_count)
        return Fail("There would be too many columns.\n");
    if (First_To_Move(*source) == nullptr && !replaces)
        return Fail("The new data have no column that could stand beside those of the output.\n");
    Fit_Missing_Values(*source, target->missing_value);
    if (replace_equal_names)
        Replace_Equal_Names(*target, *source);
    if (Column* const first = First_To_Move(*source); first != nullptr)
        Take_Columns(target, first);
    target->has_colour_sources |= source->has_colour_sources;
    Make_Column_Names_Unique(target);
    return true;
}

}  // namespace ingester

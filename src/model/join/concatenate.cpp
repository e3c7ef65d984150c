#include "model/join/concatenate.h"

#include "model/names.h"
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
    if (target == nullptr || source == nullptr || target == source || target->read_only != 0
        || target->row_count != source->row_count)
        return false;
    const bool same_type =
        source->type == vector_sheet || source->type == scalar_sheet || source->type == matrix_sheet;
    return !same_type || source->type == target->type;
}

bool Replaces(const Column& column)
{
    return column.type >= scalar_column && column.type <= matrix_column;
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

/// The first column that goes behind those of the target. Factors of a Table classify it, and belong to
/// nothing else.
Column* First_To_Move(const Sheet& source)
{
    if (source.type != vector_sheet && source.type != scalar_sheet)
        return nullptr;
    Column* column = source.first_column;
    while (column != nullptr && !Replaces(*column) && column->type != long_text_column)
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
    if (!Fit_Together(target, source)
        || Columns_To_Move(*target, *source, replace_equal_names)
               > request.Max_Columns - target->column_count)
        return false;
    if (First_To_Move(*source) == nullptr
        && (!replace_equal_names || (source->type != vector_sheet && source->type != matrix_sheet)))
        return false;
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

#include "model/dropped_metadata.h"

#include "request/losses.h"
#include "request/request.h"
#include "support/letters.h"

#include <algorithm>

namespace ingester {

void Note_Dropped_Metadata(const Sheet& sheet)
{
    // A description that begins with a blank is a name that became another one, which the ledger knows.
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        if (!column->extra.empty() && !column->extra.view().starts_with(' '))
            Note_Loss(Loss_Kind::metadata_dropped, column->name, 0, column->extra);
    Note_Dropped_Level_Values(sheet);
}

void Note_Dropped_Level_Values(const Sheet& sheet)
{
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        if (column->factor_kind == factor_with_labels && column->level_values != nullptr)
            Note_Loss(Loss_Kind::metadata_dropped, column->name, 0, "level values behind the labels");
    const bool titled_here = request.Add_Mode != Add_Modes::none || request.Transpose;
    if (sheet.title_line_count > 0 && !titled_here)
        Note_Loss(Loss_Kind::metadata_dropped, {}, 0, sheet.title_lines.c_str(), sheet.title_line_count);
}

namespace {

bool Are_Sorted(const Column& factor)
{
    const bool labelled = factor.factor_kind == factor_with_labels;
    const Level_Node* level = labelled ? factor.labels : factor.level_values;
    for (; level != nullptr && level->next != nullptr; level = level->next)
        if (labelled ? Less_Folded(level->next->Text(), level->Text())
                     : level->next->value.number < level->value.number)
            return false;
    return true;
}

/// Whether each level is met for the first time behind those in front of it.
bool Stand_As_Found(const Column& factor)
{
    double met = 0;
    for (const Cell_Node* cell = factor.first_cell; cell != nullptr; cell = cell->next) {
        if (cell->value.number > met + 1)
            return false;
        met = std::max(met, cell->value.number);
    }
    return met >= factor.nlevels;
}

}  // namespace

void Note_Dropped_Orders(const Sheet& sheet)
{
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        if (column->type == factor_column && column->factor_kind != plain_factor && !Are_Sorted(*column)
            && !Stand_As_Found(*column))
            Note_Loss(Loss_Kind::metadata_dropped, column->name, 0, "the order of its levels");
}

}  // namespace ingester

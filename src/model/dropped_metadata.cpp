#include "model/dropped_metadata.h"

#include "request/losses.h"
#include "request/request.h"

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

}  // namespace ingester

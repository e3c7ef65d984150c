#include "model/subset.h"

#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/names.h"
#include "support/text.h"

#include <vector>

namespace ingester {

Column_Subset::Column_Subset()
{
    if (!request.Subset_Columns)
        return;
    for (const std::string& entry : request.Subset_Names) {
        if (request.Subset_By_Number) {
            numbers_.insert(Leading_Integer(entry));
            continue;
        }
        names_.insert(entry);
        names_.insert(Name_In_Lists(entry));
    }
}

bool Column_Subset::Keeps(std::int32_t ordinal, std::string_view name) const
{
    if (!request.Subset_Columns)
        return true;
    return request.Subset_By_Number ? numbers_.contains(ordinal) : names_.contains(name);
}

bool Keep_Column_Subset(Sheet* sheet)
{
    if (sheet == nullptr)
        return false;
    const Column_Subset subset;
    const bool has_factors = sheet->type == table_sheet;
    std::vector<bool> wanted;
    bool found = false;
    for (const Column* column = sheet->first_column->next; column != nullptr; column = column->next) {
        const bool kept = subset.Keeps(column->index, column->name);
        wanted.push_back(kept || (has_factors && column->index < sheet->leading_columns));
        found = found || kept;
    }
    if (found)
        Keep_Columns(sheet, wanted);
    return found;
}

void Tell_Missing_Columns(const Sheet& sheet)
{
    constexpr int most = 10;
    if (!request.Subset_Columns || request.Subset_By_Number)
        return;
    std::unordered_set<std::string_view> names;
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        names.insert(column->name.view());
    int told = 0;
    for (const std::string& entry : request.Subset_Names)
        if (!names.contains(entry) && !names.contains(Name_In_Lists(entry)) && ++told <= most)
            Report_Message_Text("Warning: column %.60s was not found in the input.\n", entry.c_str());
}

}  // namespace ingester

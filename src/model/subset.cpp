#include "model/subset.h"

#include "model/names.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <unordered_map>
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

std::vector<Column*> Find_Listed(const Sheet& sheet, std::span<const std::string> names)
{
    std::unordered_map<std::string_view, Column*> here;
    std::unordered_map<std::string_view, Column*> in_input;
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        here.emplace(column->name.view(), column);
        if (!column->input_name.empty())
            in_input.emplace(column->input_name, column);
    }
    std::vector<Column*> columns;
    columns.reserve(names.size());
    const auto find = [&columns](const auto& map, std::string_view name) {
        const auto found = map.find(name);
        columns.back() = found == map.end() ? nullptr : found->second;
        return columns.back() != nullptr;
    };
    for (const std::string& name : names) {
        columns.push_back(nullptr);
        if (!name.empty() && !find(here, name) && !find(in_input, name))
            find(here, Name_In_Lists(name));
    }
    return columns;
}

List_Pairing Pairing_Of_List(std::int64_t count, std::int64_t columns)
{
    if (count <= columns || !request.Subset_Columns)
        return List_Pairing::by_order;
    return request.Subset_By_Number ? List_Pairing::by_input_place : List_Pairing::unknown;
}

void Missing_Names::Tell(const std::string& name)
{
    constexpr int most = 10;
    if (++told_ <= most)
        Report_Message_Text(warning_, name.c_str());
}

bool Keep_Column_Subset(Sheet* sheet)
{
    if (sheet == nullptr)
        return false;
    const Column_Subset subset;
    const bool has_factors = sheet->type == table_sheet;
    std::vector<bool> wanted;
    bool found = false;
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next) {
        column->input_place = column->index;
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
    if (!request.Subset_Columns || request.Subset_By_Number)
        return;
    Missing_Names missing("Warning: column %.60s was not found in the input.\n");
    const std::vector<Column*> columns = Find_Listed(sheet, request.Subset_Names);
    for (std::size_t i = 0; i < columns.size(); ++i)
        if (columns[i] == nullptr)
            missing.Tell(request.Subset_Names[i]);
}

}  // namespace ingester

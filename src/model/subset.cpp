#include "model/subset.h"

#include "model/names.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
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

namespace {

/// The names of the list stand for one column each.
std::unordered_set<const Column*> Columns_Of_List(const Sheet& sheet)
{
    std::unordered_set<const Column*> listed;
    if (!request.Subset_By_Number)
        for (const Column* const column : Find_Listed(sheet, request.Subset_Names))
            listed.insert(column);
    return listed;
}

}  // namespace

std::vector<bool> Wanted_Columns(Sheet& sheet)
{
    std::vector<bool> wanted(static_cast<std::size_t>(sheet.column_count), true);
    if (!request.Subset_Columns)
        return wanted;
    const Column_Subset numbers;
    const std::unordered_set<const Column*> listed = Columns_Of_List(sheet);
    std::size_t place = 0;
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        column->input_place = column->index;
        wanted[place++] =
            request.Subset_By_Number ? numbers.Keeps(column->index, {}) : listed.contains(column);
    }
    return wanted;
}

void Keep_Wanted_Columns(Sheet& sheet, const std::vector<bool>& wanted)
{
    if (std::ranges::find(wanted, false) != wanted.end())
        Keep_Columns(&sheet, wanted);
    request.Columns_Were_Selected = true;
}

std::vector<Column*> Narrow_Columns(Sheet& sheet)
{
    const std::vector<bool> wanted = Wanted_Columns(sheet);
    std::vector<Column*> columns;
    columns.reserve(wanted.size());
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        columns.push_back(wanted[columns.size()] ? column : nullptr);
    Keep_Wanted_Columns(sheet, wanted);
    return columns;
}

std::int32_t Row_Selection::Count(std::int32_t rows) const
{
    if (!active)
        return rows;
    const auto listed = std::min(static_cast<std::size_t>(rows), flags.size());
    return static_cast<std::int32_t>(listed
                                     - static_cast<std::size_t>(std::ranges::count(flags.first(listed), 0)));
}

std::vector<std::int32_t> Row_Selection::New_Rows(std::int32_t rows) const
{
    const auto listed = flags.first(std::min(static_cast<std::size_t>(rows), flags.size()));
    std::vector<std::int32_t> places;
    places.reserve(listed.size());
    std::int32_t next = 0;
    for (const std::int32_t flag : listed)
        places.push_back(flag != 0 ? next++ : -1);
    return places;
}

Row_Selection Narrow_Rows()
{
    request.Rows_Were_Selected = true;
    return {request.Subset_Rows, request.Subset_Row_Flags};
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

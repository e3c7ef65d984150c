// The types that a list beside the input asks for.
#include "model/subset.h"
#include "request/request.h"
#include "spreadsheet/text/text_format.h"

#include <algorithm>

namespace ingester {

namespace {

bool Lists_By_Order()
{
    return !request.Column_Wanted_Types.empty() && request.Column_Wanted_Names.empty();
}

/// Columns without data go before the list is applied.
bool Will_Be_There(const Column_Scan& scan)
{
    return scan.has_data || request.Keep_Empty_Columns;
}

void Take_By_Name(const Sheet& sheet, std::vector<std::int32_t>& types)
{
    const std::vector<Column*> columns = Find_Listed(sheet, request.Column_Wanted_Names);
    for (std::size_t i = 0; i < columns.size(); ++i)
        if (columns[i] != nullptr)
            types[static_cast<std::size_t>(columns[i]->index) - 1] = request.Column_Wanted_Types[i];
}

void Take_By_Order(const Text_Shape& shape, const std::vector<bool>& kept, std::vector<std::int32_t>& types)
{
    const auto stays = [&](std::size_t i) { return kept[i] && Will_Be_There(shape.types[i]); };
    std::int64_t columns = 0;
    for (std::size_t i = 0; i < types.size(); ++i)
        columns += stays(i) ? 1 : 0;
    const List_Pairing pairing = Pairing_Of_List(request.Column_Wanted_Count, columns);
    if (pairing == List_Pairing::unknown)
        return;
    std::size_t place = 0;
    for (std::size_t i = 0; i < types.size(); ++i) {
        if (!stays(i))
            continue;
        const std::size_t line = pairing == List_Pairing::by_order ? place++ : i;
        if (line < request.Column_Wanted_Types.size())
            types[i] = request.Column_Wanted_Types[line];
    }
}

}  // namespace

bool Wanted_Types_Need_All_Lines(const Text_Shape& shape)
{
    const std::vector<std::int32_t>& types = request.Column_Wanted_Types;
    return Lists_By_Order() && !shape.whole && std::ranges::count(types, text_column) > 0
           && (types.size() > shape.types.size() || !std::ranges::all_of(shape.types, Will_Be_There));
}

std::vector<std::int32_t> Wanted_Types(const Sheet& sheet, const Text_Shape& shape,
                                       const std::vector<bool>& kept)
{
    std::vector<std::int32_t> types(shape.types.size());
    if (Lists_By_Order())
        Take_By_Order(shape, kept, types);
    else
        Take_By_Name(sheet, types);
    return types;
}

}  // namespace ingester

#include "model/join/column_index.h"

namespace ingester {

Column_Index::Column_Index(const Sheet& sheet)
{
    columns_.reserve(static_cast<std::size_t>(sheet.column_count));
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            columns_.try_emplace(Tell_Parts(column->name), column);
}

Column* Column_Index::Take(std::string_view name)
{
    const auto found = columns_.find(Tell_Parts(name));
    if (found == columns_.end())
        return nullptr;
    Column* const column = found->second;
    columns_.erase(found);
    return column;
}

void Column_Index::Remove(const Column& column)
{
    const auto found = columns_.find(Tell_Parts(column.name));
    if (found != columns_.end() && found->second == &column)
        columns_.erase(found);
}

}  // namespace ingester

#include "model/join/column_index.h"

#include "model/names.h"

namespace ingester {

namespace {

std::string Key_Of(std::string_view name)
{
    const Telling_Parts parts = Tell_Parts(name);
    return std::string(parts.stem).append(1, '\0').append(parts.suffix);
}

}  // namespace

Column_Index::Column_Index(const Sheet& sheet)
{
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            columns_.try_emplace(Key_Of(column->name), column);
}

Column* Column_Index::Take(std::string_view name)
{
    const auto found = columns_.find(Key_Of(name));
    if (found == columns_.end())
        return nullptr;
    Column* const column = found->second;
    columns_.erase(found);
    return column;
}

void Column_Index::Remove(const Column& column)
{
    const auto found = columns_.find(Key_Of(column.name));
    if (found != columns_.end() && found->second == &column)
        columns_.erase(found);
}

}  // namespace ingester

#include "interface/subset_lists.h"

#include "interface/list_lines.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/text_codes.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

constexpr std::size_t List_Line_Width = 1000;
constexpr std::size_t Count_Line_Width = 100;

/// The count that a list begins with; the lines that are really there decide in the end.
long Read_List_Count(Input_File& file)
{
    std::string line;
    if (!file.Read_Line(line, Count_Line_Width))
        return 0;
    Cut_Mark(line);
    return Leading_Integer(line);
}

/// A list that was read to its end has done its service.
bool Finish_List(Input_File& file)
{
    if (!file.Close())
        return Fail_To_Read(file.Name());
    Delete_File(file.Name());
    return true;
}

}  // namespace

bool Read_Column_Subset(std::string_view name)
{
    Input_File file;
    if (!file.Open(name))
        return Fail_To_Read(file.Name());
    const long count = std::min<long>(Read_List_Count(file), Book_Max_Columns);
    std::string line;
    const bool has_kind = file.Read_Line(line, Count_Line_Width);
    request.Subset_By_Number = !(has_kind && !line.empty() && To_Upper(line.front()) == 'V');
    request.Subset_Names.clear();
    for (long i = 0; i < count && file.Read_Line(line, List_Line_Width); ++i)
        if (const std::string_view entry = Trim_Copy(line); !entry.empty())  // which no column is known by
            request.Subset_Names.emplace_back(entry);
    Take_Lines_Into_Letters(request.Subset_Names);
    request.Subset_Name_Count = static_cast<std::int32_t>(request.Subset_Names.size());
    return Finish_List(file);
}

bool Read_Row_Subset(std::string_view name)
{
    Input_File file;
    if (!file.Open(name))
        return Fail_To_Read(file.Name());
    const long count = Read_List_Count(file);
    std::string line;
    request.Subset_Row_Flags.clear();
    for (long i = 0; i < count && file.Read_Line(line, List_Line_Width); ++i)
        request.Subset_Row_Flags.push_back(Leading_Integer(line) != 0 ? 1 : 0);
    request.Subset_Row_Count = static_cast<std::int32_t>(request.Subset_Row_Flags.size());
    return Finish_List(file);
}

}  // namespace ingester

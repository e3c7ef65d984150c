#include "reader.h"
#include "request/request.h"

namespace ingester {

/// Two characters: the sheet that is asked for, and what is left out of it.
std::string_view Prepare_Input(std::span<const std::byte>& bytes)
{
    constexpr std::string_view sheets[] = {"", "2", "Table", "s"};
    const auto head = Take_Head(bytes, 2);
    if (head.empty())
        return "fuzz.tbk";
    request.Worksheet_Name = sheets[Choice(head[0], std::size(sheets))];
    const std::size_t choice = Choice(head[1], 16);
    request.Replace_Book_Data = (choice & 1U) != 0;
    request.Subset_Columns = (choice & 2U) != 0;
    request.Subset_Names = {"x", "f", "v", "c"};
    request.Subset_Rows = (choice & 4U) != 0;
    request.Subset_Row_Flags = {0, 1, 1, 0, 1};
    request.List_Sheets_Only = choice == 8;
    return "fuzz.tbk";
}

}  // namespace ingester

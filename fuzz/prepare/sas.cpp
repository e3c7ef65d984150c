#include "reader.h"
#include "request/request.h"

namespace ingester {

/// Two characters: which member, or the list of them; then what is left out.
std::string_view Prepare_Input(std::span<const std::byte>& bytes)
{
    constexpr std::string_view members[] = {"", "2", "SEC", "none"};
    const auto head = Take_Head(bytes, 2);
    if (head.empty())
        return "fuzz.xpt";
    request.Worksheet_Name = members[Choice(head[0], 4)];
    request.List_Sheets_Only = Choice(head[0], 16) == 15;
    request.Subset_Columns = request.Subset_Rows = Choice(head[1], 4) == 1;
    request.Subset_By_Number = true;
    request.Subset_Names = {"1", "3"};
    request.Subset_Row_Flags = {0, 1, 1};
    return "fuzz.xpt";
}

}  // namespace ingester

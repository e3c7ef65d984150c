#include "reader.h"
#include "request/request.h"

namespace ingester {

/// Two characters: labels that no case has, values that users declared missing, blanks; then what is left
/// out.
std::string_view Prepare_Input(std::span<const std::byte>& bytes)
{
    const auto head = Take_Head(bytes, 2);
    if (head.empty())
        return "fuzz.sav";
    const std::size_t choice = Choice(head[0], 8);
    request.Add_Unused_Labels = (choice & 1U) != 0;
    Get_Settings().ignore_value_case = (choice & 2U) != 0 ? 1 : 0;
    Get_Settings().trim_cells = (choice & 4U) != 0 ? 0 : 1;
    request.Subset_Columns = request.Subset_Rows = Choice(head[1], 4) == 1;
    request.Subset_By_Number = true;
    request.Subset_Names = {"1", "3"};
    request.Subset_Row_Flags = {0, 1, 1};
    return "fuzz.sav";
}

}  // namespace ingester

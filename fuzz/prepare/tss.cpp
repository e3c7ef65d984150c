#include "hostfiles/tss/tss.h"
#include "reader.h"
#include "request/request.h"

namespace ingester {

/// Two characters: what is left out (columns by name, by number, rows), and names with brackets; then the
/// order of a file read before, for those that don't tell theirs.
std::string_view Prepare_Input(std::span<const std::byte>& bytes)
{
    constexpr std::string_view magics[] = {"\x51\x50\x3E\x03", "\x03\x3E\x50\x51"};
    const auto head = Take_Head(bytes, 2);
    if (head.empty())
        return "fuzz.tss";
    const std::size_t choice = Choice(head[0], 8);
    request.Subset_Columns = (choice & 1U) != 0;
    request.Subset_By_Number = (choice & 2U) != 0;
    request.Subset_Names = request.Subset_By_Number ? std::vector<std::string>{"1", "3"}
                                                    : std::vector<std::string>{"x", "f", "2"};
    request.Subset_Rows = (choice & 4U) != 0;
    request.Subset_Row_Flags = {0, 1, 1, 0, 1};
    Get_Settings().bracket_names = Choice(head[1], 4) < 2;
    Input_File before(std::as_bytes(std::span(magics[Choice(head[1], 2)])), "before.tss");
    static_cast<void>(Read_TSS(before));
    return "fuzz.tss";
}

}  // namespace ingester

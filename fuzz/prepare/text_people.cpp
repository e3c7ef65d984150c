#include "reader.h"
#include "request/request.h"

namespace ingester {

/// Five characters, digits and a line end in the seeds. In order: the file's name, separators and quote that
/// are told, lines of names and lines in front, the table, and words for missing values.
std::string_view Prepare_Input(std::span<const std::byte>& bytes)
{
    constexpr std::string_view names[] = {"fuzz.csv", "fuzz.tab", "fuzz"};
    constexpr std::string_view separators[] = {"", ";", " ", "\t"};
    constexpr char quotes[] = {'"', '\'', '\0'};

    const auto head = Take_Head(bytes, 5);
    request.people.set();
    Use_Utf8_Text(true);
    if (head.empty())
        return names[0];
    request.Told_Separators = separators[Choice(head[1], std::size(separators))];
    if (const std::size_t quote = Choice(head[1], 16) / std::size(separators); quote > 0)
        request.Told_Quote = quotes[quote - 1];
    request.Told_Names_Lines = static_cast<std::int32_t>(Choice(head[2], 4)) - 1;
    request.Told_Skipped_Lines = static_cast<std::int64_t>(Choice(head[2], 16) / 4) - 1;
    request.Told_Table = static_cast<std::int32_t>(Choice(head[3], 4));
    request.Told_Decimal = Choice(head[3], 8) > 3 ? ',' : '\0';
    if (Choice(head[4], 4) == 1)
        request.Missing_Words = {"x", "-9"};
    return names[Choice(head[0], std::size(names))];
}

}  // namespace ingester

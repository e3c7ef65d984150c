#include "model/sheet.h"
#include "reader.h"
#include "request/request.h"

namespace ingester {

namespace {

/// What lists ask of a text, a bit each: columns by name or by number, their types by name or by place, and
/// room for a few columns only.
void Prepare_Selection(std::size_t choice)
{
    request.Subset_Columns = (choice & 1U) != 0;
    request.Subset_By_Number = (choice & 2U) != 0;
    request.Subset_Names = request.Subset_By_Number ? std::vector<std::string>{"1", "3"}
                                                    : std::vector<std::string>{"b", "x", "t"};
    if ((choice & 4U) != 0)
        request.Column_Wanted_Types = {text_column, 0, factor_column, variate_column};
    if ((choice & 6U) == 4U)
        request.Column_Wanted_Names = {"x", "a", "b", "t"};
    if ((choice & 8U) != 0)
        request.Max_Columns = 2;
}

}  // namespace

/// Eight characters, digits and a line end in the seeds. In order: the file's name, names or none, lines a
/// record, separators, missing text, lines of the file, texts where reading begins and ends (with lines to
/// skip), and what lists ask for.
std::string_view Prepare_Input(std::span<const std::byte>& bytes)
{
    constexpr std::string_view names[] = {"fuzz.csv", "fuzz.tab", "fuzz"};
    constexpr std::string_view separators[] = {"", ";", "| ", ",:", "\t'"};
    constexpr std::string_view missing_texts[] = {"*", "", "NA", "-9", "a rather long text"};
    constexpr std::string_view ranges[] = {"", "2:3", "2", "5:2", "1:2147483648", ":::"};
    constexpr std::string_view marks[] = {"", "a", "\"", "1"};

    const auto head = Take_Head(bytes, 8);
    if (head.empty())
        return names[0];
    const std::size_t names_mode = Choice(head[1], 3);
    request.Names_Given = names_mode == 1;
    request.No_Names = names_mode == 2;
    request.Lines_Per_Record = static_cast<std::int32_t>(Choice(head[2], 3)) + 1;
    request.Custom_Separators = separators[Choice(head[3], std::size(separators))];
    request.Missing_Input_Text = missing_texts[Choice(head[4], std::size(missing_texts))];
    request.Cell_Range = ranges[Choice(head[5], std::size(ranges))];
    const std::size_t mark = Choice(head[6], 2 * std::size(marks));
    request.Start_Text = mark < std::size(marks) ? marks[mark] : std::string_view{};
    request.End_Text = marks[mark % std::size(marks)];
    request.Fixed_Lines = static_cast<std::int32_t>(mark);
    request.settings.trim_cells = Choice(head[6], 16) < 2 * std::size(marks) ? 1 : 0;
    Prepare_Selection(Choice(head[7], 16) ^ Choice(std::byte{'\n'}, 16));  // a line end asks for nothing
    return names[Choice(head[0], std::size(names))];
}

}  // namespace ingester

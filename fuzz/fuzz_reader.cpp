// The target of one reader: the build names its header, its entry and what prepares its options.
#include FUZZ_HEADER

#include "hostfiles/tss/tss.h"
#include "interface/process_request.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/check_sheet.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>

namespace ingester {

namespace {

std::filesystem::path scratch_folder;

/// The choice that one character of the head makes among `count`; '0' is the first.
std::size_t Choice(std::byte character, std::size_t count)
{
    return (std::to_integer<std::size_t>(character) & 15U) % count;
}

/// Takes all bytes as the file's.
[[maybe_unused]] std::string_view Prepare_Nothing(std::span<const std::byte>& /*bytes*/)
{
    return {};
}

/// What lists ask of a text, a bit each: columns by name or by number, their types by name or by place, and
/// room for a few columns only.
[[maybe_unused]] void Prepare_Selection(std::size_t choice)
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

/// Options of delimited text, cut off the bytes: eight characters, digits and a line end in the seeds. In
/// order: the file's name, names or none, lines a record, separators, missing text, lines of the file,
/// texts where reading begins and ends (with lines to skip), and what lists ask for. Gives the name.
[[maybe_unused]] std::string_view Prepare_Text(std::span<const std::byte>& bytes)
{
    constexpr std::string_view names[] = {"fuzz.csv", "fuzz.tab", "fuzz"};
    constexpr std::string_view separators[] = {"", ";", "| ", ",:", "\t'"};
    constexpr std::string_view missing_texts[] = {"*", "", "NA", "-9", "a rather long text"};
    constexpr std::string_view ranges[] = {"", "2:3", "2", "5:2", "1:2147483648", ":::"};
    constexpr std::string_view marks[] = {"", "a", "\"", "1"};
    constexpr std::size_t head_size = 8;

    if (bytes.size() < head_size)
        return names[0];
    const auto head = bytes.first<head_size>();
    bytes = bytes.subspan(head_size);
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

/// Two characters in front of a book: the sheet that is asked for, and what is left out of it.
[[maybe_unused]] std::string_view Prepare_TBK(std::span<const std::byte>& bytes)
{
    constexpr std::size_t head_size = 2;
    constexpr std::string_view sheets[] = {"", "2", "Table", "s"};
    if (bytes.size() < head_size)
        return "fuzz.tbk";
    const auto head = bytes.first<head_size>();
    bytes = bytes.subspan(head_size);
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

/// Two characters in front of a spreadsheet: what is left out of it (columns by name, by number, rows), and
/// names with brackets; then the order of a file read before, for those that don't tell theirs.
[[maybe_unused]] std::string_view Prepare_TSS(std::span<const std::byte>& bytes)
{
    constexpr std::size_t head_size = 2;
    constexpr std::string_view magics[] = {"\x51\x50\x3E\x03", "\x03\x3E\x50\x51"};
    if (bytes.size() < head_size)
        return "fuzz.tss";
    const auto head = bytes.first<head_size>();
    bytes = bytes.subspan(head_size);
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

}  // namespace

}  // namespace ingester

extern "C" int LLVMFuzzerInitialize(int* /*count*/, char*** /*arguments*/)
{
    using namespace ingester;
    std::string folder = std::filesystem::temp_directory_path() / "fuzz_XXXXXX";
    if (mkdtemp(folder.data()) == nullptr || setenv("TMPDIR", folder.c_str(), 1) != 0)
        return 1;
    scratch_folder = folder;
    return std::atexit([] { std::filesystem::remove_all(scratch_folder); });
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace ingester;
    auto bytes = std::as_bytes(std::span(data, size));
    Start_Request();
    const std::string_view name = FUZZ_PREPARE(bytes);
    Input_File file(bytes, name);
    static_cast<void>(FUZZ_ENTRY(file));  // refusing is as good as reading
    Close_Message_File();
    const std::string faults = Current_Sheet == nullptr ? "" : Check_Sheet(*Current_Sheet);
    if (!faults.empty()) {
        std::fputs(faults.c_str(), stderr);
        std::abort();
    }
    Free_Sheets();
    return 0;
}

#include "fuzz_readers.h"

#include "interface/process_request.h"
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/sheet.h"
#include "support/check_sheet.h"

#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <iterator>
#include <string>
#include <system_error>

namespace ingester {

namespace {

std::filesystem::path scratch_folder;

/// Inputs between two cleanings of the scratch folder.
constexpr std::uint64_t inputs_per_cleaning = 1000;

void Empty_Scratch_Folder()
{
    std::error_code ignored;
    for (const auto& entry : std::filesystem::directory_iterator(scratch_folder, ignored))
        std::filesystem::remove_all(entry.path(), ignored);
}

void Remove_Scratch_Folder()
{
    std::error_code ignored;
    std::filesystem::remove_all(scratch_folder, ignored);
}

/// The choice that one character of the head makes among `count`; '0' is the first.
std::size_t Choice(std::byte character, std::size_t count)
{
    return (std::to_integer<std::size_t>(character) & 15U) % count;
}

}  // namespace

std::string_view Prepare_Nothing(std::span<const std::byte>& /*bytes*/)
{
    return {};
}

std::string_view Prepare_Text(std::span<const std::byte>& bytes)
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
    return names[Choice(head[0], std::size(names))];
}

void Start_Fuzzing()
{
    std::string folder = (std::filesystem::temp_directory_path() / "fuzz_XXXXXX").string();
    if (mkdtemp(folder.data()) == nullptr || setenv("TMPDIR", folder.c_str(), 1) != 0) {
        std::perror(folder.c_str());
        std::exit(1);
    }
    scratch_folder = folder;
    std::atexit(Remove_Scratch_Folder);
}

void Fuzz_Reader(Fuzz_Entry entry, Fuzz_Prepare prepare, std::span<const std::byte> bytes)
{
    static std::uint64_t inputs = 0;
    Start_Request();
    const std::string_view name = prepare(bytes);
    Input_File file(bytes, name);
    static_cast<void>(entry(file));  // refusing is as good as reading
    Close_Message_File();
    if (Current_Sheet != nullptr) {
        const std::string faults = Check_Sheet(*Current_Sheet);
        if (!faults.empty()) {
            std::fputs(faults.c_str(), stderr);
            std::abort();
        }
    }
    Free_Sheets();
    if (++inputs % inputs_per_cleaning == 0)
        Empty_Scratch_Folder();
}

}  // namespace ingester

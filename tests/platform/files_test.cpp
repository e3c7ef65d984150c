// Files and folders as the floors above rely on them.
#include "platform/files.h"

#include "platform/folders.h"
#include "support/request_fixture.h"

#include <sys/stat.h>

namespace ingester {
namespace {

using Files_Test = Request_Test;

std::vector<std::string> Lines_Of(Input_File& file, std::size_t limit)
{
    std::vector<std::string> lines;
    for (std::string line; file.Read_Line(line, limit);)
        lines.push_back(line);
    return lines;
}

TEST_F(Files_Test, Lines_End_With_Feed_Return_Or_Both)
{
    using Lines = std::vector<std::string>;
    const struct {
        std::string text;
        std::size_t limit;
        Lines lines;
    } cases[] = {
        {"", 9, {}},
        {"\n", 9, {""}},
        {"a\nb\r\nc\rd", 9, {"a", "b", "c", "d"}},
        {"\r\n\r\r\n\n", 9, {"", "", "", ""}},
        {"abc\nabcd\n", 3, {"abc", "abc", "d"}},
        {"abc\r\nabcdef\r", 3, {"abc", "abc", "def"}},
        {std::string("a\0b\n", 4), 9, {std::string("a\0b", 3)}},
    };
    const std::string name = Get_Temp_Folder() + "lines";
    const std::string ahead(65535, 'x');  // so that the line ends stand across two buffers
    for (const auto& one : cases) {
        Input_File memory(std::as_bytes(std::span(one.text)));
        EXPECT_EQ(Lines_Of(memory, one.limit), one.lines) << one.text;
        EXPECT_TRUE(memory.Close());
        char byte;
        EXPECT_EQ(memory.Read(&byte, 1), 0U);
        std::ofstream(Native_Path(name), std::ios::binary) << ahead << one.text;
        Input_File file;
        ASSERT_TRUE(file.Open(name) && file.Seek(static_cast<std::int64_t>(ahead.size()) - 1));
        char last;
        EXPECT_TRUE(file.Read_Exactly(&last, 1));
        EXPECT_EQ(Lines_Of(file, one.limit), one.lines) << one.text;
        EXPECT_EQ(file.Position(), file.Size());
    }
}

TEST_F(Files_Test, Output_Is_Whole_Or_Says_So)
{
    const std::string name = Get_Temp_Folder() + "out";
    const std::string block(3000, 'b');
    Output_File file(Output_File::small_buffer);
    ASSERT_TRUE(file.Open(name));
    for (const std::size_t size : {3000U, 1096U, 1U, 3000U, 0U})
        file.Write(std::string_view(block).substr(0, size));
    file.Write(std::string(10000, 'c'));
    ASSERT_TRUE(file.Close());
    std::ifstream written(Native_Path(name), std::ios::binary);
    EXPECT_EQ(std::string(std::istreambuf_iterator<char>(written), {}),
              std::string(7097, 'b') + std::string(10000, 'c'));
    EXPECT_FALSE(file.Open(Get_Temp_Folder() + "no\\out"));
    file.Write("lost");
    EXPECT_FALSE(file.Close());
    ASSERT_TRUE(file.Open("\\dev\\full"));
    file.Write("lost");
    EXPECT_FALSE(file.Close()) << "no room is noticed at the end at the latest";
}

TEST_F(Files_Test, Scratch_Files_Are_Private_And_Follow_No_Link)
{
    const std::string name = Get_Temp_Folder() + "scratch";
    const std::string victim = Native_Path(Get_Temp_Folder() + "victim");
    std::ofstream(victim) << "untouched";
    std::filesystem::create_symlink(victim, Native_Path(name));
    {
        const Scratch_File scratch(name);
        Output_File file;
        ASSERT_TRUE(file.Open_Scratch(name));
        file.Write("mine");
        ASSERT_TRUE(file.Close());
        struct stat facts {};
        ASSERT_EQ(::lstat(Native_Path(name).c_str(), &facts), 0);
        EXPECT_EQ(facts.st_mode, static_cast<::mode_t>(S_IFREG | 0600));
    }
    EXPECT_FALSE(File_Exists(name));
    EXPECT_EQ(std::filesystem::file_size(victim), 9U);
}

TEST_F(Files_Test, Extensions_Are_Those_Of_The_File_Not_Of_Its_Folders)
{
    const char* const cases[][3] = {
        // a name, its folder, the name with another extension
        {"", "", ".x"},
        {"a.b.csv", "", "a.b.x"},
        {"d.e\\a", "d.e\\", "d.e\\a.x"},
        {"\\d/a.csv", "\\d/", "\\d/a.x"},
        {"d\\", "d\\", "d\\.x"},
    };
    for (const auto& [name, folder, changed] : cases) {
        EXPECT_EQ(Folder_Of(name), folder) << name;
        EXPECT_EQ(With_Extension(name, ".x"), changed) << name;
    }
    const std::string endless(5000, 'x');
    EXPECT_FALSE(File_Exists(endless) || Same_File(endless, endless));
    EXPECT_TRUE(Delete_File(endless)) << "what isn't there counts as deleted";
}

}  // namespace
}  // namespace ingester

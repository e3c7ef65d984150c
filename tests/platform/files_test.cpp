// Files and folders as the floors above rely on them.
#include "platform/files.h"

#include "support/request_fixture.h"

#include <csignal>
#include <numeric>

#include <sys/resource.h>
#include <sys/stat.h>

namespace ingester {
namespace {

using Files_Test = Request_Test;

Texts Lines_Of(Input_File& file, std::size_t limit)
{
    Texts lines;
    for (std::string line; file.Read_Line(line, limit);)
        lines.push_back(line);
    return lines;
}

TEST_F(Files_Test, Lines_End_With_Feed_Return_Or_Both)
{
    const std::string nul("a\0b", 3);
    const std::tuple<std::string, std::size_t, Texts> cases[] = {
        {"", 9, {}},
        {"a\nb\r\nc\rd", 9, {"a", "b", "c", "d"}},
        {"\r\n\r\r\n\n", 9, {"", "", "", ""}},
        {"abc\nabcd\n", 3, {"abc", "abc", "d"}},
        {"abc\r\nabcdef\r", 3, {"abc", "abc", "def"}},
        {nul + "\n", 9, {nul}},
    };
    const std::string ahead(65535, 'x');  // so that the line ends stand across two buffers
    for (const auto& [text, limit, lines] : cases) {
        Input_File memory(std::as_bytes(std::span(text)));
        EXPECT_EQ(Lines_Of(memory, limit), lines) << text;
        char byte;
        EXPECT_TRUE(memory.Close() && memory.Read(&byte, 1) == 0U);
        Put("lines", ahead + text);
        Input_File file;
        ASSERT_TRUE(file.Open(Request_Name("lines")) && file.Seek(65534) && file.Read_Exactly(&byte, 1));
        EXPECT_EQ(Lines_Of(file, limit), lines) << text;
        EXPECT_EQ(file.Position(), file.Size());
    }
}

TEST_F(Files_Test, Lines_Are_Cut_And_Their_Rest_Is_Dropped)
{
    const std::string text = "abcd\r\nab\r" + std::string(70000, 'x') + "\nabc";
    Put("lines", text);
    Input_File memory(std::as_bytes(std::span(text)));
    Input_File opened;
    ASSERT_TRUE(opened.Open(Request_Name("lines")));
    for (Input_File* const file : {&memory, &opened}) {
        Texts lines;
        for (std::string line; file->Read_Cut_Line(line, 3);)
            lines.push_back(line);
        EXPECT_EQ(lines, (Texts{"abc", "ab", "xxx", "abc"}));
        EXPECT_EQ(file->Position(), std::ssize(text));
    }
}

TEST_F(Files_Test, Output_Is_Whole_Or_Says_So)
{
    const std::string block(3000, 'b');
    Output_File file(Output_File::small_buffer);
    ASSERT_TRUE(file.Open(Request_Name("out")));
    for (const std::size_t size : {3000U, 1096U, 1U, 3000U, 0U})
        file.Write(std::string_view(block).substr(0, size));
    file.Write(std::string(10000, 'c'));
    ASSERT_TRUE(file.Close());
    EXPECT_EQ(Get("out"), std::string(7097, 'b') + std::string(10000, 'c'));
    EXPECT_FALSE(file.Open(Request_Name("no\\out")));
    file.Write("lost");
    EXPECT_FALSE(file.Close());
    ASSERT_TRUE(file.Open("\\dev\\full"));
    file.Write("lost");
    EXPECT_FALSE(file.Close()) << "no room is noticed at the end at the latest";
}

// A file that grows large is written by two threads: its bytes, their order, what is put into the place of
// others, what is copied from elsewhere, and a refusal long after the start.
TEST_F(Files_Test, Large_Files_Are_Written_As_Told)
{
    constexpr std::size_t words = std::size_t{3} << 20;
    constexpr std::size_t changed[] = {0, 5, words / 2, words - 40'000, words - 1};
    std::vector<std::uint32_t> numbers(words);
    std::iota(numbers.begin(), numbers.end(), 0U);
    const auto write = [&](Output_File& file) {
        for (std::size_t at = 0, size; at < words; at += size) {
            size = std::min<std::size_t>(words - at, 1 + at % 30'000);
            file.Write(&numbers[at], size * sizeof numbers[0]);
        }
        const std::uint32_t mark = 4'000'000'000U;
        for (const std::size_t at : changed)
            file.Write_At(static_cast<std::int64_t>(at * sizeof mark), &mark, sizeof mark);
    };
    Output_File file;
    ASSERT_TRUE(file.Open(Request_Name("large")));
    write(file);
    Put("tail", "the end");
    Input_File tail;
    ASSERT_TRUE(tail.Open(Request_Name("tail")) && file.Copy_From(tail, 7) && file.Close());
    for (const std::size_t at : changed)
        numbers[at] = 4'000'000'000U;
    const std::string_view bytes(reinterpret_cast<const char*>(numbers.data()), words * sizeof numbers[0]);
    EXPECT_TRUE(Get("large") == std::string(bytes) + "the end");

    ::rlimit before;
    ASSERT_EQ(::getrlimit(RLIMIT_FSIZE, &before), 0);
    const ::rlimit narrow{std::size_t{9} << 20, before.rlim_max};
    const auto handler = std::signal(SIGXFSZ, SIG_IGN);
    ASSERT_EQ(::setrlimit(RLIMIT_FSIZE, &narrow), 0);
    Output_File refused;
    const bool opened = refused.Open(Request_Name("refused"));
    write(refused);
    EXPECT_TRUE(opened && !refused.Close());
    EXPECT_EQ(::setrlimit(RLIMIT_FSIZE, &before), 0);
    std::signal(SIGXFSZ, handler);
}

TEST_F(Files_Test, Scratch_Files_Are_Private_And_Follow_No_Link)
{
    Put("victim", "untouched");
    std::filesystem::create_symlink(Path("victim"), Path("scratch"));
    {
        const Scratch_File scratch(Request_Name("scratch"));
        Output_File file;
        ASSERT_TRUE(file.Open_Scratch(scratch.Name()));
        file.Write("mine");
        ASSERT_TRUE(file.Close());
        struct stat facts {};
        ASSERT_EQ(::lstat(Path("scratch").c_str(), &facts), 0);
        EXPECT_EQ(facts.st_mode, static_cast<::mode_t>(S_IFREG | 0600));
    }
    EXPECT_EQ(Files() + " " + Get("victim"), "victim untouched");
}

TEST_F(Files_Test, Copies_Are_Whole_Or_Not_There)
{
    Put("from", "four");
    EXPECT_TRUE(Copy_File(Path("from"), Path("to"), 4));
    EXPECT_EQ(Get("to"), "four");
    EXPECT_FALSE(Copy_File(Path("from"), Path("to"), 3));
    EXPECT_EQ(Files(), "from");
}

TEST_F(Files_Test, Extensions_Are_Those_Of_The_File_Not_Of_Its_Folders)
{
    for (const std::string folder : {"", "d.e\\", "\\d/"})
        for (const std::string name : {"", "a", "a.b"}) {
            EXPECT_EQ(Folder_Of(folder + name + ".csv"), folder);
            EXPECT_EQ(With_Extension(folder + name + ".csv", ".x"), folder + name + ".x");
            EXPECT_TRUE(name == "a.b" || With_Extension(folder + name, ".x") == folder + name + ".x");
        }
    const std::string endless(5000, 'x');
    EXPECT_FALSE(File_Exists(endless) || Same_File(endless, endless));
    EXPECT_TRUE(Delete_File(endless)) << "what isn't there counts as deleted";
}

}  // namespace
}  // namespace ingester

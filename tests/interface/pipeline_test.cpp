// Whole requests through the export: what is written, what is refused, what stays untouched.
#include "host_fixture.h"

#include <csignal>
#include <functional>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>

namespace ingester {
namespace {

using Pipeline_Test = Host_Test;

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n";
const std::string Crops_Tab = "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\t*\r\n";

int Descriptors()
{
    int count = 0;
    for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd"))
        count += entry.exists() ? 1 : 0;
    return count;
}

/// Runs `act` in a process of its own; its exit status.
int In_A_Child(const std::function<int()>& act)
{
    const ::pid_t child = ::fork();
    if (child == 0)
        ::_exit(act());
    int how = 0;
    ::waitpid(child, &how, 0);
    return WIFEXITED(how) ? WEXITSTATUS(how) : -1;
}

TEST_F(Pipeline_Test, Converts)
{
    const struct {
        std::string input;
        const char* in;
        const char* out;
        const char* written;
        std::string text;
        const char* said;
        int status = 0;
    } cases[] = {
        {Crops, "c.csv", "o.tab", "o.tab", Crops_Tab, ""},
        {Crops, "c.csv", "O.TAB/mv=NA/n", "O.TAB", "1\toats\t2.5\r\n2\trye\tNA\r\n", ""},
        {Crops, "c.csv", "o.csv", "o.csv",
         "plot,kind,yield\r\n    1,\"oats\" ,   2.5\r\n    2,\"rye\"  ,     *\r\n", ""},
        {Crops, "c.csv", "o.xyz/z", "o.xyz", " plot kind yield\r\n    1 oats   2.5\r\n    2 rye      *\r\n",
         ""},
        {"a,b\n1,x\n", "c.csv/n", "o.tab", "o.tab", "C1\tC2\r\na\tb\r\n1\tx\r\n", ""},
        {"a,b\n1,\n,\n3,\n", "c.csv", "o.tab", "o.tab", "a\r\n1\r\n3\r\n", ""},
        {"a,b\n1,\n,\n3,\n", "c.csv/k", "o.tab/e", "o.tab", "a\tb\r\n1\t*\r\n*\t*\r\n3\t*\r\n", ""},
        {"a,b\n,\n,\n", "c.csv/k", "o.tab", "o.tab", "a\tb\r\n*\t*\r\n",
         "Warning: All rows in the input file are empty.\nUse KEEPEMTPY=rows to return the empty rows.\n:\n"},
        {std::string("a,b\n1,x\0y\n", 10), "c.csv", "o.tab", "o.tab", "a\tb\r\n1\tx y\r\n",
         "Warning: 1 NUL characters in the text were read as blanks.\n:\n"},
        {"a,b\n1,'x, y\n2,z\n", "c.csv", "o.tab", "o.tab", "a\tb\r\n1\t\"'x, y\"\r\n2\tz\r\n", ""},
        {"a,b,c\n1\n2,3\n", "c.csv", "o.txt/rewrite=3", "o.txt", "a,b,c\n1,2,3\n", "", 7},
        {"a\n", "c.csv", "o.txt/rewrite=", "o.txt", "", "", 7},
    };
    for (const auto& one : cases) {
        SCOPED_TRACE(std::string(one.in) + " " + one.out);
        Put("c.csv", one.input);
        const Host_Answer answer = Convert(one.in, one.out);
        EXPECT_EQ(answer.status, one.status);
        EXPECT_EQ(answer.messages, one.said);
        EXPECT_EQ(Get(one.written), one.text);
        std::filesystem::remove(Path(one.written));
        EXPECT_EQ(Files(), "c.csv");
    }
}

TEST_F(Pipeline_Test, Refuses_With_Words_And_A_Status_And_Changes_Nothing)
{
    Put("c.csv", Crops);
    Put("o.tab", "old");
    Put("empty.csv", "");
    Put("void.csv", "a,b\n,\n,\n");
    Put("names.csv", "a,b\n");
    Put("binary.csv", "a,b\n1,\x01\n");
    Put("accents.csv", "a,\xE9\n1,2\n");
    Put("short.csv", "a,b,c");
    Put("o.$$$", Crops);
    std::filesystem::create_directory(Path("folder.csv"));
    std::filesystem::create_hard_link(Path("c.csv"), Path("hard.tab"));
    std::filesystem::create_symlink(Path("c.csv"), Path("soft.tab"));
    const std::string folder = Request_Name("");
    const std::string unreadable = "Trial files not supported.\n";
    const std::string same = "Input and output files are the same.\n";
    const struct {
        const char* in;
        const char* out;
        int status;
        std::string said;
    } cases[] = {
        {"none.csv", "o.tab", 2, "Input file could not be opened.\n" + unreadable},
        {"folder.csv", "o.tab", 2, "Input file could not be opened.\n" + unreadable},
        {"c.csv\\c.csv", "o.tab", 2, "Input file could not be opened.\n" + unreadable},
        {"empty.csv", "o.tab", 2, "Input file is empty.\n" + unreadable},
        {"binary.csv", "o.tab", 3, "Files type unknown.\n"},
        {"accents.csv", "o.tab", 3, "Files type unknown.\n"},
        {"short.csv", "o.tab", 3, "Files type unknown.\n"},
        {"void.csv", "o.tab", 4, "All columns in the input file are empty.\n"},
        {"names.csv", "o.tab", 5, "No data could be imported.\n"},
        {"c.csv", "C.CSV", 6, same},
        {"c.csv", "folder.csv\\..\\c.csv/n", 6, same},
        {"c.csv", "hard.tab", 6, same},
        {"c.csv", "soft.tab", 6, same},
        {"c.csv", "c.csv/rewrite=2", 6, same},
        {"o.$$$", "o.tab", 6, same},
        {"c.csv", "no\\o.tab", 6, "Output directory " + folder + "no\\ does not exist.\n"},
        {"c.csv", "c.csv\\o.tab", 6, "Output directory " + folder + "c.csv\\ does not exist.\n"},
        {"c.csv", "folder.csv", 6, "Output file not written.\n"},
        {"c.csv", "o.DBF", 6, "Files with the extension .dbf can't be written in this version.\n"},
        {"c.csv", "o.tab/r", 5, "SHEETNAME must be provided with METHOD=replace.\n"},
        {"c.csv/tr", "o.tab", 5, "Transposing is not available in this version.\n"},
        {"c.csv", "o.tab/@,k", 5, "Adding to an existing output is not available in this version.\n"},
    };
    const std::string files = Files();
    for (const auto& one : cases) {
        SCOPED_TRACE(std::string(one.in) + " " + one.out);
        const Host_Answer answer = Convert(one.in, one.out);
        EXPECT_EQ(answer.status, one.status);
        EXPECT_EQ(answer.messages, one.said + ":\n");
        EXPECT_EQ(Files(), files);
        EXPECT_EQ(Get("o.tab") + Get("o.$$$") + Get("c.csv"), "old" + Crops + Crops);
    }
    const struct {
        std::vector<std::string> records;
        int status;
        std::string said;
    } bare[] = {
        {{"", "o.tab"}, 3, "Input file name is NULL or empty.\nFiles type unknown.\n"},
        {{folder + "c.csv", ""}, 6, "Files with the extension .tbk can't be written in this version.\n"},
        {{"https:\\\\h\\c.csv", ""}, 19, "Could not download input URL:\nhttps:\\\\h\\c.csv\n"},
        {{"Clipboard.csv", "o.tab"}, 9, "Using the clipboard is not available in this version.\n"},
        {{folder + "c.csv", "clipboard.tab"}, 9, "Using the clipboard is not available in this version.\n"},
        {{folder + "c.csv", "clipboard.xls"}, 6, "Clipboard format not supported.\n"},
        {{folder + "c.csv", "o.tab", "", "", folder + "empty.csv/s"},
         5,
         "Keeping a subset is not available in this version.\n"},
    };
    for (const auto& one : bare) {
        const Host_Answer answer = Call(one.records);
        EXPECT_EQ(answer.status, one.status) << one.said;
        EXPECT_EQ(answer.messages, one.said + ":\n");
    }
}

TEST_F(Pipeline_Test, A_File_Without_Permission_Cannot_Be_Opened)
{
    if (::geteuid() == 0)
        GTEST_SKIP() << "the superuser may read every file";
    Put("c.csv", Crops);
    std::filesystem::permissions(Path("c.csv"), std::filesystem::perms::none);
    EXPECT_EQ(Convert("c.csv", "o.tab").status, 2);
}

TEST_F(Pipeline_Test, An_Old_Output_Is_Replaced_Whole)
{
    Put("c.csv", Crops);
    Put("victim", "untouched");
    for (const char* const options : {"", "/av"}) {
        Put("o.tab", "old");
        std::filesystem::create_symlink("victim", Path("o.$$$"));
        EXPECT_EQ(Convert("c.csv", std::string("o.tab") + options).status, 0);
        EXPECT_EQ(Get("o.tab"), Crops_Tab);
        EXPECT_FALSE(std::filesystem::is_symlink(Path("o.tab")));
        EXPECT_EQ(Get("victim"), "untouched");
        std::filesystem::remove(Path("o.$$$"));
        EXPECT_EQ(Files(), "c.csv o.tab victim");
    }
    ASSERT_EQ(::mkfifo(Path("pipe.tab").c_str(), 0600), 0);
    const int pipe = ::open(Path("pipe.tab").c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC);
    EXPECT_EQ(Convert("c.csv", "pipe.tab").status, 0);
    char bytes[100];
    EXPECT_EQ(::read(pipe, bytes, sizeof bytes), static_cast<::ssize_t>(Crops_Tab.size()));
    EXPECT_TRUE(std::filesystem::is_fifo(Path("pipe.tab"))) << "a file took the place of a pipe";
    ::close(pipe);
}

TEST_F(Pipeline_Test, A_Full_Disk_Leaves_The_Old_Output_And_Nothing_Else)
{
    std::string large = "plot,yield\n";
    for (int i = 0; i < 30000; ++i)
        large += "1,2.5\n";
    Put("large.csv", large);
    Put("old.tab", "old");
    Put("old.txt", "old");
    const auto status = [](const char* output) {
        return In_A_Child([output] {
            const ::rlimit limit{65536, 65536};
            std::signal(SIGXFSZ, SIG_IGN);
            ::setrlimit(RLIMIT_FSIZE, &limit);
            const Host_Answer answer = Convert("large.csv", output);
            return answer.messages == "Output file not written.\n:\n" ? answer.status : 100;
        });
    };
    EXPECT_EQ(status("old.tab"), 6);
    EXPECT_EQ(status("new.tab"), 6);
    EXPECT_EQ(status("old.txt/rewrite=4"), 7);
    EXPECT_EQ(Get("old.tab") + Get("old.txt"), "oldold");
    EXPECT_EQ(Files(), "large.csv old.tab old.txt");
}

TEST_F(Pipeline_Test, Lack_Of_Memory_Is_A_Fault_Like_Any_Other)
{
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "the sanitizer's own memory exceeds every limit";
#else
    std::string large = "a,b\n";
    for (int i = 0; i < 2000000; ++i)
        large += "1,2\n";
    Put("large.csv", large);
    Put("old.tab", "old");
    const int status = In_A_Child([] {
        long pages = 0;
        std::ifstream("/proc/self/statm") >> pages;
        const auto room = static_cast<::rlim_t>(pages * ::sysconf(_SC_PAGESIZE)) + (::rlim_t{40} << 20);
        const ::rlimit limit{room, room};
        ::setrlimit(RLIMIT_AS, &limit);
        const Host_Answer answer = Convert("large.csv", "old.tab");
        return answer.messages.starts_with("Ingester out of memory.\n") ? answer.status : 100;
    });
    EXPECT_EQ(status, 4);
    EXPECT_EQ(Get("old.tab"), "old");
    EXPECT_EQ(Files(), "large.csv old.tab");
#endif
}

TEST_F(Pipeline_Test, Calls_Follow_Each_Other_Without_Leftovers)
{
    Put("c.csv", Crops);
    int descriptors = 0;
    for (int round = 0; round < 20; ++round) {
        EXPECT_EQ(Convert("c.csv/n/x=1/c=2:3/z=;/o=V", "o.tab/mv=NA/n/d").status, 5);
        EXPECT_EQ(Call({"none.csv", "o.tab", "sheet", "2:3", "none/s"}).status, 2);
        EXPECT_EQ(Call_With_Bytes(Pass_Bytes(2, {"c.csv"})).status, 1);
        std::filesystem::remove(Path(Stem() + ".inp"));
        const Host_Answer answer = Convert("c.csv", "o.tab");
        EXPECT_EQ(answer.status, 0);
        EXPECT_EQ(answer.messages, "");
        EXPECT_EQ(Get("o.tab"), Crops_Tab);
        if (round == 0)
            descriptors = Descriptors();
    }
    EXPECT_EQ(Descriptors(), descriptors);
    EXPECT_EQ(Files(), "c.csv o.tab");
}

TEST_F(Pipeline_Test, Hostile_Texts_End_In_Good_Time)
{
    {
        std::ofstream file(Path("line.csv"), std::ios::binary);
        const std::string part = "12345678,";
        std::string block;
        while (block.size() < (1U << 20))
            block += part;
        for (std::size_t written = 0; written < 300000000; written += block.size())
            file << block;
    }
    Host_Answer answer = Convert("line.csv", "o.tab");
    EXPECT_EQ(answer.status, 5);
    EXPECT_EQ(answer.messages,
              "Error: Line 1 has more than 262140 characters.\nNo data could be imported.\n:\n");
    std::string wide = "1";
    for (int i = 1; i < 100000; ++i)
        wide += ",1";
    Put("line.csv", wide + "\n" + wide + "\n");
    answer = Convert("line.csv", "o.tab/n");
    EXPECT_EQ(answer.status, 0);
    EXPECT_TRUE(answer.messages.starts_with("Maximum number of columns (50000) exceeded.\n"));
    Put("line.csv", "a\n" + std::string(200000, ',') + "\n");
    EXPECT_EQ(Convert("line.csv", "p.tab").status, 4);
    std::string blank = "a,b\n1,2\n";
    for (int i = 0; i < 300000; ++i)
        blank += ",\n";
    Put("line.csv", blank);
    EXPECT_EQ(Convert("line.csv", "q.tab").status, 0);
    EXPECT_EQ(Get("q.tab"), "a\tb\r\n1\t2\r\n");
}

}  // namespace
}  // namespace ingester

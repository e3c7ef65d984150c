// Whole requests through the export: what is written, what is refused, what stays untouched.
#include "host_fixture.h"

#include <csignal>

#include <fcntl.h>
#include <malloc.h>
#include <sys/resource.h>
#include <sys/stat.h>
#include <sys/wait.h>

namespace ingester {
namespace {

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n";
const std::string Crops_Tab = "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\t*\r\n";

/// `part` so many times.
std::string Repeated(std::string_view part, std::size_t count)
{
    std::string text;
    while (count-- > 0)
        text += part;
    return text;
}

class Pipeline_Test : public Host_Test {
protected:
    /// The status of a request in a process of its own that has no more than `most` of a resource; 100 when
    /// its messages begin otherwise.
    [[nodiscard]] int Status_Within(decltype(RLIMIT_AS) resource, ::rlim_t most, const std::string& output,
                                    std::string_view said) const
    {
        const ::pid_t child = ::fork();
        if (child == 0) {
            const ::rlimit limit{most, most};
            std::signal(SIGXFSZ, SIG_IGN);
            ::setrlimit(resource, &limit);
            const Host_Answer answer = Convert("large.csv", output);
            ::_exit(answer.second.starts_with(said) ? answer.first : 100);
        }
        int how = 0;
        ::waitpid(child, &how, 0);
        return WIFEXITED(how) ? WEXITSTATUS(how) : -1;
    }
};

TEST_F(Pipeline_Test, Converts)
{
    const std::string sparse = "a,b\n1,\n,\n3,\n";
    const std::string nul("a,b\n1,x\0y\n", 10);
    const std::string nul_words = "Warning: 1 NUL characters in the text were read as blanks.\n:\n";
    const std::string empty_words = "Warning: All rows in the input file are empty.\n"
                                    "Use KEEPEMTPY=rows to return the empty rows.\n:\n";
    const std::string few_words = "Note: Data contains fewer columns than the specified last column 9.\n:\n";
    const struct {
        std::string input, in, out, written, text, said = {};
        int status = 0;
    } cases[] = {
        {Crops, "c.csv", "o.tab", "o.tab", Crops_Tab},
        {Crops, "c.csv", "O.TAB/mv=NA/n", "O.TAB", "1\toats\t2.5\r\n2\trye\tNA\r\n"},
        {Crops, "c.csv", "o.csv/n", "o.csv", "    1,\"oats\" ,   2.5\r\n    2,\"rye\"  ,     *\r\n"},
        {Crops, "c.csv", "o.xyz/z/n", "o.xyz", "    1 oats   2.5\r\n    2 rye      *\r\n"},
        {Crops, "c.csv/w/v/tr/c=2:3/db", "o.tab/a/e", "o.tab", "Worksheets\r\nSheet1\r\n"},
        {Crops, "c.csv/tr", "o.tab", "o.tab", "kind\toats\trye\r\nplot\t1\t2\r\nyield\t2.5\t*\r\n"},
        {Crops, "c.csv/tr=N", "o.tab", "o.tab",
         "C1\tC2\tC3\r\nplot\t1\t2\r\nkind\toats\trye\r\nyield\t2.5\t*\r\n"},
        {Crops, "c.csv/c=2", "o.tab", "o.tab", "kind\tyield\r\noats\t2.5\r\nrye\t*\r\n"},
        {Crops, "c.csv/c=2:2", "o.tab", "o.tab", "kind\r\noats\r\nrye\r\n"},
        {Crops, "c.csv/c=3:9", "o.tab/e", "o.tab", "yield\r\n2.5\r\n*\r\n", few_words},
        {"a,b\n1.25,2\n3,1e9\n", "c.csv", "o.tab/f/d", "o.tab", "a\tb\r\n1.25\t2\r\n3.00\t1000000000\r\n"},
        {sparse, "c.csv", "o.tab", "o.tab", "a\r\n1\r\n3\r\n"},
        {sparse, "c.csv/k", "o.tab/e", "o.tab", "a\tb\r\n1\t*\r\n*\t*\r\n3\t*\r\n"},
        {"a,b\n,\n,\n", "c.csv/k", "o.tab", "o.tab", "a\tb\r\n*\t*\r\n", empty_words},
        {"a,b\n1,*\n2,3\n", "c.csv", "o.csv/h/mv=','", "o.csv", "a,b\r\n1,\",\"\r\n2,3\r\n"},
        {nul, "c.csv", "o.tab", "o.tab", "a\tb\r\n1\tx y\r\n", nul_words},
        {"a,b,c\n1\n2,3\n", "c.csv", "o.txt/rewrite=3", "o.txt", "a,b,c\n1,2,3\n", "", 7},
        {"m!,d!\nMar,10\nJan,30\n", "c.csv", "o.csv/n", "o.csv", " \"Mar\", 10\r\n \"Jan\", 30\r\n"},
        {"a\n", "c.csv", "o.txt/rewrite=", "o.txt", "", "", 7},
    };
    for (const auto& one : cases) {
        Put("c.csv", one.input);
        EXPECT_EQ(Convert(one.in, one.out), (Host_Answer{one.status, one.said}));
        EXPECT_EQ(Get(one.written), one.text) << one.out;
        std::filesystem::remove(Path(one.written));
        EXPECT_EQ(Files(), "c.csv");
    }
}

TEST_F(Pipeline_Test, Refuses_With_Words_And_A_Status_And_Changes_Nothing)
{
    const Texts files = {"c.csv",       Crops,
                         "o.tab",       "old",
                         "o.$$$",       Crops,
                         "empty.csv",   "",
                         "void.csv",    "a,b\n,\n,\n",
                         "names.csv",   "a,b\n",
                         "binary.csv",  "a,b\n1,\x01\n",
                         "accents.csv", "a,\xE9\n1,2\n",
                         "short.csv",   "a,b,c",
                         "zip.zip",     "PK\3\4",
                         "c.loc",       Crops,
                         "c.mrg",       "2\n",
                         "tall.csv",    "a\n" + Repeated("1\n", 50001)};
    for (std::size_t i = 0; i < files.size(); i += 2)
        Put(files[i], files[i + 1]);
    std::filesystem::create_directory(Path("folder.csv"));
    std::filesystem::create_hard_link(Path("c.csv"), Path("hard.tab"));
    std::filesystem::create_symlink(Path("c.csv"), Path("soft.tab"));
    const std::string f = Request_Name("");
    const std::string unopened = "Input file could not be opened.\nTrial files not supported.\n";
    const std::string unknown = "Files type unknown.\n";
    const std::string same = "Input and output files are the same.\n";
    const std::string missing = " is not available in this version.\n";
    const std::string removed = "Could not remove columns.\n";
    const std::tuple<Texts, int, std::string> cases[] = {
        {{f + "none.csv", f + "o.tab"}, 2, unopened},
        {{f + "folder.csv", f + "o.tab"}, 2, unopened},
        {{f + "c.csv\\c.csv", f + "o.tab"}, 2, unopened},
        {{f + "empty.csv", f + "o.tab"}, 2, "Input file is empty.\nTrial files not supported.\n"},
        {{"", "o.tab"}, 3, "Input file name is NULL or empty.\n" + unknown},
        {{f + "binary.csv", f + "o.tab"}, 3, unknown},
        {{f + "accents.csv", f + "o.tab"}, 3, unknown},
        {{f + "short.csv", f + "o.tab"}, 3, unknown},
        {{f + "void.csv", f + "o.tab"}, 4, "All columns in the input file are empty.\n"},
        {{f + "names.csv", f + "o.tab"}, 5, "No data could be imported.\n"},
        {{f + "c.csv", f + "C.CSV"}, 6, same},
        {{f + "c.csv", f + "folder.csv\\..\\c.csv/n"}, 6, same},
        {{f + "c.csv", f + "hard.tab"}, 6, same},
        {{f + "c.csv", f + "soft.tab"}, 6, same},
        {{f + "c.csv", f + "c.csv/rewrite=2"}, 6, same},
        {{f + "o.$$$", f + "o.tab"}, 6, same},
        {{f + "c.csv", f + "no\\o.tab"}, 6, "Output directory " + f + "no\\ does not exist.\n"},
        {{f + "c.csv", f + "c.csv\\o.tab"}, 6, "Output directory " + f + "c.csv\\ does not exist.\n"},
        {{f + "c.csv", f + "folder.csv"}, 6, "Output file not written.\n"},
        {{f + "c.csv", f + "o.DBF"}, 6, "Writing dBase table" + missing},
        {{f + "c.csv", f + "o.xlsx"}, 6, "Writing Excel 2007 workbook" + missing},
        {{f + "c.csv", f + "o.tab/r"}, 5, "SHEETNAME must be provided with METHOD=replace.\n"},
        {{f + "zip.zip", f + "o.tab"}, 11, "Zip files unsupported.\n"},
        {{f + "c.csv/map", f + "o.tab"}, 16, "Incorrect options for QTL file.\n"},
        {{f + "c.loc", f + "o.tab"}, 16, "Incorrect options for QTL file.\n"},
        {{f + "c.loc/rqtl", f + "o.tab"}, 5, "Reading genotype files" + missing},
        {{f + "c.csv/map=ftp:x", f + "o.tab"}, 19, "Could not download map file URL:\nftp:x\n"},
        {{f + "c.csv", f + "o.tab/%=2"}, 17, "Merge columns not found in files.\n"},
        {{f + "c.csv/c=3:2", f + "o.tab"},
         5,
         "Error: First column to be kept must be <= Last column.\n" + removed},
        {{f + "c.csv/c=4", f + "o.tab"},
         5,
         "Error: Data contains fewer columns than first column to be kept.\n" + removed},
        {{f + "tall.csv/tr", f + "o.tab"},
         5,
         "Cannot transpose a spreadsheet with more than 50000 rows\nThis sheet has 50001 rows.\n"
         "Unable to transpose input file.\n"},
        {{f + "c.csv", f + "o.tab/a=k"}, 5, "Adding to an existing output" + missing},
        {{"https:\\\\h\\c.csv", ""}, 19, "Could not download input URL:\nhttps:\\\\h\\c.csv\n"},
        {{"Clipboard.csv", "o.tab"}, 9, "Read Error: Cannot open clipboard for read.\n"},
        {{f + "c.csv", "clipboard.tab"},
         9,
         "Copy Error: Cannot open clipboard for write.\nCould not put data on the clipboard.\n"},
        {{f + "c.csv", "clipboard.xls"}, 6, "Clipboard format not supported.\n"},
    };
    const std::string before = Files();
    ::unsetenv("DISPLAY");
    ::unsetenv("WAYLAND_DISPLAY");
    for (const auto& [records, status, said] : cases) {
        EXPECT_EQ(Call(records), (Host_Answer{status, said + ":\n"})) << testing::PrintToString(records);
        EXPECT_EQ(Files(), before) << testing::PrintToString(records);
        for (std::size_t i = 0; i < files.size(); i += 2)
            EXPECT_EQ(Get(files[i]), files[i + 1]);
    }
}

TEST_F(Pipeline_Test, A_List_Of_The_Columns_Is_Written_Beside_The_Output)
{
    Put("c.csv", Crops);
    std::filesystem::create_directory(Path("o.$V$"));
    EXPECT_EQ(Convert("c.csv", "o.tab/p").first, 0);
    EXPECT_EQ(Get("o.VAR"), "3\nplot\nkind\nyield\n") << "the list may go to the temporary folder";
    std::filesystem::remove(Path("o.$V$"));
    EXPECT_EQ(Convert("c.csv", "o.tab/p").first, 0);
    EXPECT_EQ(Get("o.$V$"), "3\nplot\nkind\nyield\n");
}

TEST_F(Pipeline_Test, An_Old_Output_Is_Replaced_Whole)
{
    Put("c.csv", Crops);
    Put("victim", "untouched");
    for (const char* const options : {"", "/av"}) {
        Put("o.tab", "old");
        std::filesystem::create_symlink("victim", Path("o.$$$"));
        EXPECT_EQ(Convert("c.csv", std::string("o.tab") + options).first, 0);
        EXPECT_FALSE(std::filesystem::is_symlink(Path("o.tab")));
        EXPECT_EQ(Get("victim") + Get("o.tab"), "untouched" + Crops_Tab);
        std::filesystem::remove(Path("o.$$$"));
        EXPECT_EQ(Files(), "c.csv o.tab victim");
    }
    ASSERT_EQ(::mkfifo(Path("pipe.tab").c_str(), 0600), 0);
    const int pipe = ::open(Path("pipe.tab").c_str(), O_RDWR | O_NONBLOCK | O_CLOEXEC);
    EXPECT_EQ(Convert("c.csv", "pipe.tab").first, 0);
    char bytes[100];
    EXPECT_EQ(::read(pipe, bytes, sizeof bytes), static_cast<::ssize_t>(Crops_Tab.size()));
    EXPECT_TRUE(std::filesystem::is_fifo(Path("pipe.tab"))) << "a file took the place of a pipe";
    ::close(pipe);
}

TEST_F(Pipeline_Test, An_Output_Of_Options_Alone_Has_The_Usual_Name)
{
    const std::filesystem::path folder = std::filesystem::current_path();
    Put("c.csv", Crops);
    std::filesystem::current_path(Path(""));
    EXPECT_EQ(Call({"c.csv", "/q"}), (Host_Answer{0, ""}));
    EXPECT_EQ(Files(), "Ingester.TBK c.csv");
    std::filesystem::current_path(folder);
}

TEST_F(Pipeline_Test, A_Pipe_Is_Read_Whole)
{
    ASSERT_EQ(::mkfifo(Path("in.csv").c_str(), 0600), 0);
    const ::pid_t writer = ::fork();
    if (writer == 0) {
        const int end = ::open(Path("in.csv").c_str(), O_WRONLY | O_CLOEXEC);
        ::_exit(::write(end, Crops.data(), Crops.size()) > 0 ? 0 : 1);
    }
    EXPECT_EQ(Convert("in.csv", "o.tab"), (Host_Answer{0, ""}));
    EXPECT_EQ(Get("o.tab"), Crops_Tab);
    EXPECT_EQ(Files(), "in.csv o.tab");
    ::waitpid(writer, nullptr, 0);
}

TEST_F(Pipeline_Test, A_Full_Disk_Leaves_The_Old_Output_And_Nothing_Else)
{
    Put("large.csv", "plot,yield\n" + Repeated("1,2.5\n", 30000));
    Put("old.tab", "old");
    Put("old.txt", "old");
    for (const auto& [output, status] : {std::pair("old.tab", 6), {"new.tab", 6}, {"old.txt/rewrite=4", 7}})
        EXPECT_EQ(Status_Within(RLIMIT_FSIZE, 65536, output, "Output file not written.\n:\n"), status)
            << output;
    EXPECT_EQ(Get("old.tab") + Get("old.txt"), "oldold");
    EXPECT_EQ(Files(), "large.csv old.tab old.txt");
}

TEST_F(Pipeline_Test, Lack_Of_Memory_Is_A_Fault_Like_Any_Other)
{
#ifdef __SANITIZE_ADDRESS__
    GTEST_SKIP() << "the sanitizer's own memory exceeds every limit";
#else
    Put("large.csv", "a,b\n" + Repeated("1,2\n", 2000000));
    Put("old.tab", "old");
    ::malloc_trim(0);  // what tests before this one left behind is no room
    long pages = 0;
    std::ifstream("/proc/self/statm") >> pages;
    const auto room = static_cast<::rlim_t>(pages * ::sysconf(_SC_PAGESIZE)) + (::rlim_t{40} << 20);
    EXPECT_EQ(Status_Within(RLIMIT_AS, room, "old.tab", "Ingester out of memory.\n"), 4);
    EXPECT_EQ(Get("old.tab"), "old");
    EXPECT_EQ(Files(), "large.csv old.tab");
#endif
}

TEST_F(Pipeline_Test, Hostile_Texts_End_In_Good_Time)
{
    Put("c.csv", Repeated("12345678,", 33333334));
    EXPECT_EQ(Convert("c.csv", "o.tab"), (Host_Answer{5, "Error: Line 1 has more than 262140 characters.\n"
                                                         "No data could be imported.\n:\n"}));
    const std::string wide = Repeated("1,", 99999) + "1\n";
    Put("c.csv", wide + wide);
    const Host_Answer answer = Convert("c.csv", "o.tab/n");
    EXPECT_EQ(answer.first, 0);
    EXPECT_TRUE(answer.second.starts_with("Maximum number of columns (50000) exceeded.\n"));
    Put("c.csv", "a\n" + std::string(200000, ',') + "\n");
    EXPECT_EQ(Convert("c.csv", "p.tab").first, 4);
    Put("c.csv", "a,b\n1,2\n" + Repeated(",\n", 300000));
    EXPECT_EQ(Convert("c.csv", "q.tab").first, 0);
    EXPECT_EQ(Get("q.tab"), "a\tb\r\n1\t2\r\n");
}

}  // namespace
}  // namespace ingester

// The built command, run as users run it: in a folder of its own, with a temporary folder of its own.
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>
#include <thread>
#include <vector>

#include <fcntl.h>
#include <sys/resource.h>
#include <sys/wait.h>
#include <unistd.h>

namespace ingester {
namespace {

namespace fs = std::filesystem;

constexpr int Wrong_Command_Line = 100;  // such statuses begin here

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n3,barley,4\n";
const std::string Crops_Tab = "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\t*\r\n3\tbarley\t4\r\n";

struct Ran {
    int status = -1;  ///< of the exit; -1 when a signal ended it
    int signal_number = 0;
    std::string out;
    std::string err;
};

/// How a run differs from the usual one.
struct Setting {
    std::string input = {};     ///< on standard input
    bool close_output = false;  ///< run without a standard output
    ::rlim_t greatest_file = RLIM_INFINITY;
    const char* temp_folder = "../temp";
};

class Command_Test : public testing::Test {
protected:
    void SetUp() override
    {
        std::string pattern = (fs::temp_directory_path() / "command-test-XXXXXX").string();
        ASSERT_NE(::mkdtemp(pattern.data()), nullptr);
        root_ = pattern;
        fs::create_directories(Work());
        fs::create_directories(root_ / "temp");
        Put("crops.csv", Crops);
    }

    void TearDown() override
    {
        EXPECT_TRUE(fs::is_empty(root_ / "temp")) << "scratch files were left behind";
        fs::remove_all(root_);
    }

    [[nodiscard]] fs::path Work() const { return root_ / "work"; }
    [[nodiscard]] fs::path Temp() const { return root_ / "temp"; }

    void Put(const std::string& name, const std::string& text) const
    {
        fs::create_directories((Work() / name).parent_path());
        std::ofstream(Work() / name, std::ios::binary) << text;
    }

    [[nodiscard]] std::string Get(const fs::path& name) const
    {
        std::ifstream file(Work() / name, std::ios::binary);
        return file ? std::string(std::istreambuf_iterator<char>(file), {}) : "(no file)";
    }

    /// Every file below the work folder, in order.
    [[nodiscard]] std::vector<std::string> Files() const
    {
        std::vector<std::string> names;
        for (const auto& entry : fs::recursive_directory_iterator(Work()))
            if (!entry.is_directory())
                names.push_back(fs::relative(entry.path(), Work()).string());
        std::ranges::sort(names);
        return names;
    }

    /// Starts the command with standard input from `input`, a descriptor, which it closes.
    [[nodiscard]] ::pid_t Start(const std::vector<std::string>& arguments, int input,
                                const Setting& setting) const
    {
        std::vector<std::string> words = {INGESTER_COMMAND};
        words.insert(words.end(), arguments.begin(), arguments.end());
        std::vector<char*> pointers;
        for (std::string& word : words)
            pointers.push_back(word.data());
        pointers.push_back(nullptr);
        const std::string out = (root_ / "out").string();
        const std::string err = (root_ / "err").string();
        const std::string work = Work().string();
        const ::pid_t child = ::fork();
        if (child == 0) {
            const ::rlimit limit{setting.greatest_file, setting.greatest_file};
            ::dup2(input, STDIN_FILENO);
            ::dup2(::open(out.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600), STDOUT_FILENO);
            ::dup2(::open(err.c_str(), O_WRONLY | O_CREAT | O_TRUNC, 0600), STDERR_FILENO);
            if (setting.close_output)
                ::close(STDOUT_FILENO);
            if (::chdir(work.c_str()) == 0 && ::setenv("TMPDIR", setting.temp_folder, 1) == 0
                && ::setrlimit(RLIMIT_FSIZE, &limit) == 0)
                ::execv(pointers[0], pointers.data());
            ::_exit(127);
        }
        ::close(input);
        return child;
    }

    [[nodiscard]] Ran Await(::pid_t child) const
    {
        int how = 0;
        ::waitpid(child, &how, 0);
        Ran ran;
        ran.status = WIFEXITED(how) ? WEXITSTATUS(how) : -1;
        ran.signal_number = WIFSIGNALED(how) ? WTERMSIG(how) : 0;
        ran.out = Get(root_ / "out");
        ran.err = Get(root_ / "err");
        return ran;
    }

    [[nodiscard]] Ran Run(const std::vector<std::string>& arguments, const Setting& setting = {}) const
    {
        const fs::path input = root_ / "in";
        std::ofstream(input, std::ios::binary) << setting.input;
        return Await(Start(arguments, ::open(input.c_str(), O_RDONLY | O_CLOEXEC), setting));
    }

private:
    fs::path root_;
};

TEST_F(Command_Test, Converts)
{
    Put("my data/crops 1.csv", Crops);
    Put("old.tab", "old\r\n");
    Put("few.csv", "x,y\n1,oats\n");
    const struct {
        const char* what;
        std::vector<std::string> arguments;
        const char* output;
        std::string text;
    } cases[] = {
        {"comma text to tab text", {"crops.csv", "out.tab"}, "out.tab", Crops_Tab},
        {"folders with blanks", {"my data/crops 1.csv", "my data/out 1.tab"}, "my data/out 1.tab", Crops_Tab},
        {"a folder named like an option", {"crops.csv", "../work/n.tab"}, "n.tab", Crops_Tab},
        {"from standard input", {"-", "in.tab"}, "in.tab", Crops_Tab},
        {"input options",
         {"few.csv", "few.tab", "--in-options", "/b/n"},
         "few.tab",
         "C1\tC2\r\nx\ty\r\n1\toats\r\n"},
        {"output options",
         {"--out-options=/mv=NA", "crops.csv", "na.tab"},
         "na.tab",
         "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\tNA\r\n3\tbarley\t4\r\n"},
        {"a range without a sheet",
         {"--range", "1:2", "crops.csv", "r.tab"},
         "r.tab",
         "plot\tkind\tyield\r\n1\toats\t2.5\r\n"},
        {"an older output, by force", {"--force", "crops.csv", "old.tab"}, "old.tab", Crops_Tab},
    };
    for (const auto& one : cases) {
        const Ran ran = Run(one.arguments, {.input = Crops});
        EXPECT_EQ(ran.status, 0) << one.what << ": " << ran.err;
        EXPECT_EQ(Get(one.output), one.text) << one.what;
        EXPECT_EQ(ran.out + ran.err, "") << one.what;
    }
}

TEST_F(Command_Test, Standard_Output_Gets_What_A_Comma_File_Gets)
{
    ASSERT_EQ(Run({"crops.csv", "same.csv"}).status, 0);
    for (const char* input : {"crops.csv", "-"}) {
        const Ran ran = Run({input, "-"}, {.input = Crops});
        EXPECT_EQ(ran.status, 0) << ran.err;
        EXPECT_EQ(ran.out, Get("same.csv"));
        EXPECT_EQ(ran.err, "");
    }
    const Ran closed = Run({"crops.csv", "-"}, {.close_output = true});
    EXPECT_EQ(closed.status, 6);
    EXPECT_NE(closed.err.find("standard output"), std::string::npos) << closed.err;
}

TEST_F(Command_Test, Refuses_With_A_Reason_And_Touches_Nothing)
{
    Put("old.tab", "old\r\n");
    Put("folder/keep", "");
    const std::vector<std::string> files = Files();
    const struct {
        std::vector<std::string> arguments;
        int status;
        const char* said;
    } cases[] = {
        {{"crops.csv", "old.tab"}, 6, "ingester: old.tab: the file exists already"},
        {{"crops.csv", "./old.tab", "--out-options", "/av"}, 6, "--force"},
        {{"crops.csv", "folder", "--force"}, 6, "ingester: folder: this is a folder"},
        {{"crops.csv", "/dev/null", "--force"}, 6, "ingester: /dev/null: this is a device"},
        {{"a\\b.csv", "out.tab"}, Wrong_Command_Line, "ingester: a\\b.csv: "},
        {{"crops.csv", "%TEMP%/out.tab"}, Wrong_Command_Line, "%TEMP%"},
        {{"crops.csv", std::string(1117, 'x') + ".tab"}, Wrong_Command_Line, "1120"},
        {{"crops.csv", "out.tab", "--in-options=/s=" + std::string(1110, 'x')},
         Wrong_Command_Line,
         "crops.csv"},
        {{"crops.csv", "out.tab", "--sheet", std::string(281, 's')}, Wrong_Command_Line, "--sheet"},
        {{"crops.csv", "out.tab", "--range", std::string(281, '1')}, Wrong_Command_Line, "--range"},
        {{"crops.csv", ""}, Wrong_Command_Line, "OUTPUT"},
        {{"crops.csv"}, Wrong_Command_Line, "OUTPUT"},
        {{"crops.csv", "out.tab", "--in-options", "n"}, Wrong_Command_Line, "begin with '/'"},
        {{"crops.csv", "out.tab", "more"}, Wrong_Command_Line, "more"},
    };
    for (const auto& one : cases) {
        const Ran ran = Run(one.arguments);
        EXPECT_EQ(std::min(ran.status, Wrong_Command_Line), one.status) << one.arguments.back();
        EXPECT_NE(ran.err.find(one.said), std::string::npos) << ran.err;
        EXPECT_EQ(ran.out, "");
        EXPECT_EQ(Files(), files);
    }
    EXPECT_EQ(Get("old.tab"), "old\r\n");
}

TEST_F(Command_Test, Tells_What_Failed_In_Native_Names_And_Leaves_No_Output)
{
    Put("empty.csv", "");
    Put("sub/odd.bin", std::string("\1\2\3\4 no text\n", 13));
    Put("old.tab", "old\r\n");
    const std::vector<std::string> files = Files();
    const struct {
        std::vector<std::string> arguments;
        int status;
        const char* said;
    } cases[] = {
        {{"no/crops.csv", "out.tab"}, 2, "no/crops.csv"},
        {{"sub", "out.tab"}, 2, "sub"},
        {{"empty.csv", "out.tab"}, 2, "empty.csv"},
        {{"-", "out.tab"}, 2, "standard input"},
        {{"sub/odd.bin", "out.tab"}, 3, "sub/odd.bin"},
        {{"crops.csv", "none/deep/out.tab"}, 6, "none/deep"},
        {{"no/crops.csv", "old.tab", "--force"}, 2, "no/crops.csv"},
    };
    for (const auto& one : cases) {
        const Ran ran = Run(one.arguments);
        EXPECT_EQ(ran.status, one.status) << one.said << ": " << ran.err;
        EXPECT_NE(ran.err.find(one.said), std::string::npos) << ran.err;
        EXPECT_EQ(ran.err.find('\\'), std::string::npos) << ran.err;
        EXPECT_EQ(ran.err.find("\n:"), std::string::npos) << ran.err;
        EXPECT_EQ(Files(), files) << one.said;
    }
    EXPECT_EQ(Get("old.tab"), "old\r\n");
    const Ran homeless = Run({"crops.csv", "out.tab"}, {.temp_folder = "/nonexistent"});
    EXPECT_EQ(homeless.status, 1);
    EXPECT_NE(homeless.err.find("/nonexistent"), std::string::npos) << homeless.err;
}

TEST_F(Command_Test, An_Output_Beyond_The_Room_For_It_Is_Absent_And_An_Older_One_Stays)
{
    std::string large = "plot,yield\n";
    for (int i = 0; i < 30000; ++i)
        large += "1,2.5\n";
    Put("large.csv", large);
    Put("old.tab", "old\r\n");
    const std::vector<std::string> files = Files();
    for (const char* output : {"new.tab", "old.tab"}) {
        const Ran ran = Run({"--force", "large.csv", output}, {.greatest_file = 65536});
        EXPECT_EQ(ran.status, 6) << output;
        EXPECT_NE(ran.err, "") << output;
        EXPECT_EQ(Files(), files) << output;
    }
    EXPECT_EQ(Get("old.tab"), "old\r\n");
}

TEST_F(Command_Test, A_Signal_Takes_The_Temporary_Folder_Along)
{
    for (const int signal_number : {SIGINT, SIGTERM, SIGABRT}) {
        int ends[2];
        ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
        const ::pid_t child = Start({"-", "out.tab"}, ends[0], {});
        const auto waiting = [this] {
            for (const auto& entry : fs::recursive_directory_iterator(Temp()))
                if (entry.is_regular_file())
                    return true;
            return false;
        };
        for (int i = 0; i < 1000 && !waiting(); ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        EXPECT_TRUE(waiting()) << "standard input goes through a scratch file";
        ::kill(child, signal_number);
        EXPECT_EQ(Await(child).signal_number, signal_number);
        ::close(ends[1]);
        EXPECT_TRUE(fs::is_empty(Temp()));
        EXPECT_EQ(Get("out.tab"), "(no file)");
    }
}

TEST_F(Command_Test, Help_And_Version_Go_To_Standard_Output)
{
    const Ran help = Run({"--help"});
    EXPECT_EQ(help.status, 0);
    EXPECT_NE(help.out.find("Examples:"), std::string::npos);
    EXPECT_EQ(help.err, "");
    const Ran version = Run({"--version"});
    EXPECT_EQ(version.status, 0);
    EXPECT_TRUE(version.out.starts_with("ingester ")) << version.out;
}

}  // namespace
}  // namespace ingester

// The built command, run as users run it: in a folder of its own, with a temporary folder of its own.
#include "support/folder_fixture.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <sstream>
#include <thread>

#include <fcntl.h>
#include <sys/mman.h>
#include <sys/wait.h>
#include <unistd.h>

namespace ingester {
namespace {

constexpr int Wrong_Command_Line = 100;  // such statuses begin here

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n3,barley,4\n";
const std::string Crops_Tab = "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\t*\r\n3\tbarley\t4\r\n";

struct Ran {
    int status = -1;  ///< of the exit; that of the signal that ended it, below 0
    std::string out, err;
};

/// How a run differs from the usual one.
struct Setting {
    std::string input = Crops;
    bool close_output = false;  ///< run without a standard output
    const char* temp_folder = "temp";
};

class Command_Test : public Folder_Test {
protected:
    void SetUp() override
    {
        Folder_Test::SetUp();
        for (const char* const folder : {"temp", "folder", "my data"})
            std::filesystem::create_directory(Path(folder));
        Put("crops.csv", Crops);
        Put("my data/crops 1.csv", Crops);
        Put("old.tab", "old\r\n1\r\n");
    }
    void TearDown() override
    {
        EXPECT_TRUE(std::filesystem::is_empty(Path("temp"))) << "scratch files were left behind";
        Folder_Test::TearDown();
        ::close(out_);
        ::close(err_);
    }

    /// Starts the command with standard input from `input`, a descriptor, which it closes.
    [[nodiscard]] ::pid_t Start(const Texts& arguments, int input, const Setting& setting = {}) const
    {
        std::vector<const char*> words = {INGESTER_COMMAND};
        for (const std::string& argument : arguments)
            words.push_back(argument.c_str());
        words.push_back(nullptr);
        const ::pid_t child = ::fork();
        if (child != 0) {
            ::close(input);
            return child;
        }
        ::dup2(input, STDIN_FILENO);
        ::dup2(out_, STDOUT_FILENO);
        ::dup2(err_, STDERR_FILENO);
        if (setting.close_output)
            ::close(STDOUT_FILENO);
        if (::chdir(Path("").c_str()) == 0 && ::setenv("TMPDIR", setting.temp_folder, 1) == 0)
            ::execv(words[0], const_cast<char* const*>(words.data()));
        ::_exit(127);
    }

    [[nodiscard]] Ran Await(::pid_t child) const
    {
        int how = 0;
        ::waitpid(child, &how, 0);
        return {WIFEXITED(how) ? WEXITSTATUS(how) : -WTERMSIG(how), Take(out_), Take(err_)};
    }

    [[nodiscard]] Ran Run(const Texts& arguments, const Setting& setting = {}) const
    {
        const int input = ::memfd_create("in", MFD_CLOEXEC);
        EXPECT_EQ(::pwrite(input, setting.input.data(), setting.input.size(), 0), std::ssize(setting.input));
        return Await(Start(arguments, input, setting));
    }

private:
    /// What was written to `file`, which gets empty.
    static std::string Take(int file)
    {
        std::string text(10000, ' ');
        text.resize(static_cast<std::size_t>(::pread(file, text.data(), text.size(), 0)));
        EXPECT_TRUE(::ftruncate(file, 0) == 0 && ::lseek(file, 0, SEEK_SET) == 0);
        return text;
    }

    int out_ = ::memfd_create("out", MFD_CLOEXEC);
    int err_ = ::memfd_create("err", MFD_CLOEXEC);
};

TEST_F(Command_Test, Converts)
{
    const std::string tail = Crops_Tab.substr(Crops_Tab.find("2\trye"));
    const std::string head = "plot\tkind\tyield\r\n1\toats\t2.5\r\n";
    Put("few.csv", "x,y\n1,oats\n");
    Put("rows.txt", "# the good ones\n1\n\n 3 - 9\r\n");
    const std::tuple<Texts, const char*, std::string> cases[] = {
        {{"crops.csv", "out.tab"}, "out.tab", Crops_Tab},
        {{"my data/crops 1.csv", "my data/out 1.tab"}, "my data/out 1.tab", Crops_Tab},
        {{"-", "in.tab"}, "in.tab", Crops_Tab},
        {{"few.csv", "few.tab", "--in-options", "/b/n"}, "few.tab", "C1\tC2\r\nx\ty\r\n1\toats\r\n"},
        {{"--out-options=/mv=NA", "crops.csv", "na.tab"}, "na.tab", head + "2\trye\tNA\r\n3\tbarley\t4\r\n"},
        {{"--range", "1:2", "crops.csv", "r.tab"}, "r.tab", head},
        {{"few.csv", "q.csv", "--no-names", "--no-quotes", "--out-options=/mv='-"},
         "q.csv",
         "C1,C2\r\nx,y\r\n1,oats\r\n"},
        {{"crops.csv", "c.tab", "--columns", "2:2", "--no-header"}, "c.tab", "oats\r\nrye\r\nbarley\r\n"},
        {{"few.csv", "y.tab", "--no-names", "--write-missing=it is"},
         "y.tab",
         "C1\tC2\r\nx\ty\r\n1\toats\r\n"},
        {{"crops.csv", "m.tab", "--missing", "oats"}, "m.tab", "plot\tkind\tyield\r\n1\t\t2.5\r\n" + tail},
        {{"--force", "crops.csv", "old.tab"}, "old.tab", Crops_Tab},
        {{"crops.csv", "k.tab", "--keep", "yield,plot", "--rename", "plot=Block", "--type=plot=factor"},
         "k.tab",
         "Block!\tyield\r\n1\t2.5\r\n2\t*\r\n3\t4\r\n"},
        {{"crops.csv", "n.tab", "--keep=3,1-1", "--rows", "rows.txt"},
         "n.tab",
         "plot\tyield\r\n1\t2.5\r\n3\t4\r\n"},
        {{"crops.csv", "d.tab", "--drop", "kind, yield", "--type", "plot=date", "--rows", "rows.txt"},
         "d.tab",
         "plot:D\r\n01/03/1600\r\n03/03/1600\r\n"},
        {{"-", "s.tab", "--rename", "plot=kind,kind=plot", "--drop=yield", "--type", "plot=text"},
         "s.tab",
         "kind\tplot\r\n1\toats\r\n2\trye\r\n3\tbarley\r\n"},
    };
    for (const auto& [arguments, output, text] : cases) {
        const Ran ran = Run(arguments);
        EXPECT_EQ(ran.status, 0) << output;
        EXPECT_EQ(Get(output), text) << output;
        EXPECT_EQ(ran.out + ran.err, "") << output;
    }
}

TEST_F(Command_Test, Joins_Lines_Of_A_Comma_File)
{
    EXPECT_EQ(Run({"crops.csv", "lines.csv", "--out-options=/rewrite=6"}).status, 7) << "it has no rows";
    EXPECT_EQ(Get("lines.csv"), "plot,kind,yield,1,oats,2.5\n2,rye,*,3,barley,4\n");
}

TEST_F(Command_Test, Leaves_A_List_Of_Columns_To_Fill_In)
{
    const Ran first = Run({"crops.csv", "out.tab", "--column-list"});
    EXPECT_EQ(Get("crops.VAR"), "3\nplot\nkind\nyield\n") << first.err;
    EXPECT_NE(first.err.find("crops.VAR: lists the names"), std::string::npos) << first.err;
    Put("crops.VAR", "3\n\nplant\n*\n");
    EXPECT_EQ(Run({"crops.csv", "out.tab", "--column-list", "--force"}).err, "");
    EXPECT_EQ(Get("out.tab"), "plot\tplant\r\n1\toats\r\n2\trye\r\n3\tbarley\r\n");
}

TEST_F(Command_Test, Adds_Sheets_To_A_Book_And_Lists_Them)
{
    for (const char* const option :
         {"--add-sheet=Crops", "--add-sheet=Crops", "--add-sheet=Crops", "--replace-sheet=Crops_1"})
        EXPECT_EQ(Run({"crops.csv", "all.tbk", option}).err, "");
    EXPECT_EQ(Run({"sheets", "all.tbk"}).out, "Crops\nCrops_1\nCrops_2\n");
    EXPECT_EQ(Run({"sheets", "crops.csv"}).out, "Sheet1\n");
    for (const char* const sheet : {"Crops", "crops_1", "3"}) {
        EXPECT_EQ(Run({"--sheet", sheet, "all.tbk", "back.tab", "-f"}).status, 0);
        EXPECT_EQ(Get("back.tab"), Crops_Tab) << sheet;
    }
    const std::string book = Get("all.tbk");
    const Ran ran = Run({"crops.csv", "all.tbk", "--replace-sheet", "None"});
    EXPECT_TRUE(ran.err.starts_with("Sheet None not found in Tabulon file all.tbk.\nCould add data"));
    EXPECT_EQ(ran.status, 8);
    EXPECT_EQ(Get("all.tbk"), book);
}

TEST_F(Command_Test, Standard_Output_Gets_What_A_Comma_File_Gets)
{
    ASSERT_EQ(Run({"crops.csv", "same.csv"}).status, 0);
    for (const char* input : {"crops.csv", "-"}) {
        const Ran ran = Run({input, "-"});
        EXPECT_EQ(ran.status, 0);
        EXPECT_EQ(ran.out, Get("same.csv"));
        EXPECT_EQ(ran.err, "");
    }
    const Ran closed = Run({"crops.csv", "-"}, {.close_output = true});
    EXPECT_EQ(closed.status, 6);
    EXPECT_NE(closed.err.find("standard output"), std::string::npos) << closed.err;
    const Ran help = Run({"--help"});
    EXPECT_EQ(help.status, 0);
    EXPECT_NE(help.out.find("Examples:"), std::string::npos);
    EXPECT_TRUE(Run({"--version"}).out.starts_with("ingester "));
}

/// The commands of a section of the README, as words.
std::vector<Texts> Readme_Commands(const std::string& heading)
{
    std::ifstream file(INGESTER_README);
    std::string line;
    while (std::getline(file, line) && line != heading) {
    }
    std::vector<Texts> commands;
    while (std::getline(file, line) && !(line == "```" && !commands.empty())) {
        std::istringstream words(line.substr(0, line.find(" #")));
        Texts command;
        for (std::string word; words >> word;)
            command.push_back(word);
        if (!command.empty() && command[0] == "ingester")
            commands.emplace_back(command.begin() + 1, command.end());
    }
    return commands;
}

TEST_F(Command_Test, Joins_Files_As_The_Readme_Says)
{
    const std::string head = "\nSummary of Columns output to: plots.csv\nSheet of type: Vector\n\n";
    const std::string expected[] = {
        "plot,kind\r\n1,oats\r\n2,rye\r\n7,bean\r\n",
        "plot,kind,month!\r\n1,oats,Original\r\n2,rye,Original\r\n7,bean,june\r\n",
        "plot,kind,kind1,height\r\n1,oats,a,5\r\n2,rye,b,6\r\n",
        "plot,kind,height\r\n1,a,5\r\n2,b,6\r\n",
        "plot,kind,name,yield\r\n1,oats,,*\r\n2,rye,rye,9\r\n3,,fern,8\r\n",
        "plot,kind,yield\r\n1,oats,*\r\n2,rye,9\r\n",
        "C1,C2\r\na,1\r\nb,2\r\n",
        head
            + "   1: plot - Variate\n      Mean: 1.5, Min: 1, Max: 2, NMV: 0\n"
              "   2: kind - Text  Maximum width: 4\n     Decimals: 0\n\n",
    };
    const std::vector<Texts> commands = Readme_Commands("### Joining files");
    ASSERT_EQ(commands.size(), std::size(expected));
    for (std::size_t i = 0; i < commands.size(); ++i) {
        for (const char* const name : {"all.csv", "plots.csv"})
            Put(name, "plot,kind\n1,oats\n2,rye\n");
        Put("june.csv", "kind,plot\nbean,7\n");
        Put("heights.csv", "kind,height\na,5\nb,6\n");
        Put("yields.csv", "plot,name,yield\n3,fern,8\n2,rye,9\n");
        Put("yields.mrg", "not ours");
        Put("wide.csv", "a,b\n1,2\n");
        Texts arguments = commands[i];
        const bool summary = arguments[0] == "summary";
        const std::string output = arguments[1];
        if (!summary)
            arguments.push_back("--no-quotes");
        const Ran ran = Run(arguments);
        EXPECT_EQ(ran.status, 0) << output << ran.err;
        EXPECT_EQ(ran.err, "");
        EXPECT_EQ(summary ? ran.out : Get(output), expected[i]) << testing::PrintToString(arguments);
        EXPECT_EQ(Get("yields.mrg"), "not ours");
    }
    EXPECT_EQ(Run({"-", "plots.csv", "--merge", "plot", "--no-quotes"}, {.input = "plot,x\n2,3\n"}).status,
              0);
    EXPECT_EQ(Get("plots.csv"), "plot,kind,x\r\n1,oats,*\r\n2,rye,3\r\n");
}

TEST_F(Command_Test, Tells_What_It_Would_Send_And_What_It_Can)
{
    const Ran dry =
        Run({"--dry-run", "my data/crops 1.csv", "new.gen", "--missing", "N'A", "--names=4", "--append=a,b",
             "--start", "it is", "--map", "in/a.map", "--quiet-read", "--range", "2:3"});
    EXPECT_EQ(dry.status, 0);
    EXPECT_EQ(dry.out, "Infile: my data\\crops 1.csv/map='in\\a.map'/x=\"N'A\"/y=4/s='it is'\n"
                       "Outfile: new.gen/q/@,a,b\nWorksheet: \nCell range: 2:3\n");
    const Ran formats = Run({"formats"});
    EXPECT_NE(formats.out.find("comma text                           -      yes     .csv\n"),
              std::string::npos);
    EXPECT_NE(Run({"formats", "--all"}).out.find("\nShapefile "), std::string::npos);
    EXPECT_NE(Run({"formats", "--json"}).out.find("\"extensions\": [\".htm\", \".html\"]"),
              std::string::npos);
}

TEST_F(Command_Test, The_Examples_Of_The_Read_Me_Work)
{
    std::ifstream read_me(INGESTER_DOCS "/../README.md");
    int examples = 0;
    for (std::string line; std::getline(read_me, line);) {
        if (line.find("ingester crops.csv ") == std::string::npos && !line.starts_with("ingester raw.csv "))
            continue;
        ++examples;
        std::filesystem::remove_all(Path("try"));
        std::filesystem::create_directory(Path("try"));
        for (const char* const file : {"raw.csv", "out.tab"})
            Put(std::string("try/") + file, "1,2,3\n4,5,6\n");
        std::filesystem::copy(INGESTER_DOCS "/../examples/crops.csv", Path("try"));
        Put("try/plots.txt", "1-2\n");
        if (line.find("--force") == std::string::npos)
            std::filesystem::remove(Path("try/out.tab"));
        const std::string command = std::filesystem::path(INGESTER_COMMAND).parent_path().string();
        const std::string words = "cd '" + Path("try") + "' && PATH='" + command + "':$PATH && TMPDIR=. && ("
                                  + line + "\n) >shown 2>&1";
        EXPECT_EQ(std::system(words.c_str()), 0) << line << "\n" << Get("try/shown");
        EXPECT_EQ(Get("try/shown").find("was not found"), std::string::npos) << line;
    }
    EXPECT_GT(examples, 8);
}

TEST_F(Command_Test, Fails_With_A_Reason_In_Native_Names_And_Touches_Nothing)
{
    Put("my data/crops 1.var", "*\n");
    Put("folder/odd.bin", std::string("\1\2\3\4 no text\n", 13));
    const std::string files = Files();
    const std::string many(1110, 'x');
    const std::tuple<int, const char*, Texts> cases[] = {
        {6, "ingester: old.tab: the file exists already", {"crops.csv", "old.tab"}},
        {6, "--force", {"crops.csv", "./old.tab", "--out-options", "/av"}},
        {6, "ingester: folder: this is a folder", {"crops.csv", "folder", "--force"}},
        {6, "ingester: /dev/null: this is a device", {"crops.csv", "/dev/null", "--force"}},
        {Wrong_Command_Line, "ingester: a\\b.csv: ", {"a\\b.csv", "out.tab"}},
        {Wrong_Command_Line, "%TEMP%", {"crops.csv", "%TEMP%/out.tab"}},
        {Wrong_Command_Line, "1120", {"crops.csv", many + "1234567.tab"}},
        {Wrong_Command_Line, "crops.csv", {"crops.csv", "out.tab", "--in-options=/s=" + many}},
        {Wrong_Command_Line, "--sheet", {"crops.csv", "out.tab", "--sheet", many.substr(0, 281)}},
        {Wrong_Command_Line, "--range", {"crops.csv", "out.tab", "--range", many.substr(0, 281)}},
        {Wrong_Command_Line, "OUTPUT", {"crops.csv"}},
        {Wrong_Command_Line, "begin with '/'", {"crops.csv", "out.tab", "--in-options", "n"}},
        {Wrong_Command_Line, "more", {"crops.csv", "out.tab", "more"}},
        {Wrong_Command_Line,
         "--start: this value can't hold '/b'",
         {"crops.csv", "out.tab", "--start", "a/b"}},
        {Wrong_Command_Line, "drops blanks", {"crops.csv", "old.tab "}},
        {Wrong_Command_Line, "not of the form", {"crops.csv", "out.tab", "--skip-lines", "x"}},
        {Wrong_Command_Line, "per cent signs", {"crops.csv", "out.tab", "--write-missing", "%TMP%"}},
        {Wrong_Command_Line,
         "/n is given twice",
         {"crops.csv", "out.tab", "--in-options", "/n", "--no-names"}},
        {Wrong_Command_Line, "both kinds of quotes", {"crops.csv", "out.tab", "--missing", "'\""}},
        {Wrong_Command_Line, "can't hold a '/'", {"crops.csv", "out.tab", "--columns", "1/2"}},
        {Wrong_Command_Line, "not of the form", {"crops.csv", "out.tab", "--columns", "B:C"}},
        {Wrong_Command_Line, "not of the form", {"crops.csv", "out.tab", "--columns", "2"}},
        {Wrong_Command_Line, "clipboard.csv", {"crops.csv", "Clipboard"}},
        {Wrong_Command_Line, "--keep", {"crops.csv", "old.tab", "--append", "--columns", "2:3"}},
        {Wrong_Command_Line, "ingester summary", {"crops.csv", "-", "--print-summary"}},
        {Wrong_Command_Line, "--update-sheet", {"crops.csv", "old.tab", "--append", "--add-sheet", "New"}},
        {Wrong_Command_Line,
         "--update-sheet",
         {"crops.csv", "old.tab", "--concatenate", "--sheet-name", "Other"}},
        {Wrong_Command_Line,
         "--separators: the value is empty",
         {"crops.csv", "out.tab", "--separators", ""}},
        {Wrong_Command_Line, "is not of the form OLD=NEW", {"crops.csv", "out.tab", "--rename", "a"}},
        {Wrong_Command_Line, "can't be the name", {"crops.csv", "out.tab", "--rename", "kind=*"}},
        {Wrong_Command_Line, "can't be the name", {"crops.csv", "out.tab", "--rename", "kind=a:D"}},
        {Wrong_Command_Line, "factor, text", {"crops.csv", "out.tab", "--type", "kind=whole"}},
        {Wrong_Command_Line, "line 1 of crops.csv", {"crops.csv", "out.tab", "--rows", "crops.csv"}},
        {Wrong_Command_Line, "none can't be opened", {"crops.csv", "out.tab", "--rows", "none"}},
        {Wrong_Command_Line, "beside the input", {"my data/crops 1.csv", "out.tab", "--drop", "kind"}},
        {13, "no columns or rows", {"crops.csv", "out.tab", "--keep", "none"}},
        {6, "no such file", {"crops.csv", "new.tab", "--append"}},
        {6, "no such file", {"crops.csv", "-", "--concatenate"}},
        {17, "Merge key plot in WITH", {"crops.csv", "old.tab", "--merge", "plot"}},
        {2, "no/crops.csv", {"no/crops.csv", "old.tab", "--merge", "plot"}},
        {Wrong_Command_Line, "two names", {"crops.csv", "old.tab", "--merge", "a="}},
        {Wrong_Command_Line,
         "four keys",
         {"crops.csv", "old.tab", "--merge=a", "--merge=b", "--merge=c", "--merge=d", "--merge=e"}},
        {Wrong_Command_Line, "/% is given twice", {"crops.csv", "old.tab", "--merge=a", "--out-options=/%"}},
        {2, "no/crops.csv", {"no/crops.csv", "out.tab"}},
        {2, "no/crops.csv", {"no/crops.csv", "old.tab", "--force"}},
        {3, "folder/odd.bin", {"folder/odd.bin", "out.tab"}},
        {6, "none/deep", {"crops.csv", "none/deep/out.tab"}},
    };
    for (const auto& [status, said, arguments] : cases) {
        const Ran ran = Run(arguments);
        EXPECT_EQ(std::min(ran.status, Wrong_Command_Line), status) << arguments.back();
        EXPECT_NE(ran.err.find(said), std::string::npos) << ran.err;
        EXPECT_TRUE(status == Wrong_Command_Line || ran.err.find('\\') == std::string::npos) << ran.err;
        EXPECT_EQ(ran.err.find("\n:"), std::string::npos) << ran.err;
        EXPECT_EQ(ran.out, "");
        EXPECT_EQ(Files(), files) << arguments.back();
        EXPECT_EQ(Get("old.tab"), "old\r\n1\r\n");
    }
    const Ran silent = Run({"-", "out.tab"}, {.input = ""});
    EXPECT_EQ(silent.status, 2);
    EXPECT_NE(silent.err.find("standard input"), std::string::npos) << silent.err;
    const Ran homeless = Run({"crops.csv", "out.tab"}, {.temp_folder = "/nonexistent"});
    EXPECT_EQ(homeless.status, 1);
    EXPECT_NE(homeless.err.find("/nonexistent"), std::string::npos) << homeless.err;
}

TEST_F(Command_Test, A_Signal_Takes_The_Temporary_Folder_Along)
{
    const std::string files = Files();
    const auto is_waiting = [this] {  // standard input goes through a scratch file
        const std::filesystem::recursive_directory_iterator all(Path("temp"));
        return std::any_of(begin(all), end(all), [](const auto& entry) { return entry.is_regular_file(); });
    };
    for (const int signal_number : {SIGINT, SIGTERM, SIGABRT}) {
        int ends[2];
        ASSERT_EQ(::pipe2(ends, O_CLOEXEC), 0);
        const ::pid_t child = Start({"-", "out.tab"}, ends[0]);
        for (int i = 0; i < 1000 && !is_waiting(); ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        EXPECT_TRUE(is_waiting());
        ::kill(child, signal_number);
        EXPECT_EQ(Await(child).status, -signal_number);
        ::close(ends[1]);
        EXPECT_EQ(Files(), files);
    }
}

}  // namespace
}  // namespace ingester

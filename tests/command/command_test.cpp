// The built command, run as users run it: in a folder of its own, with a temporary folder of its own.
#include "support/folder_fixture.h"

#include <algorithm>
#include <chrono>
#include <csignal>
#include <cstdio>
#include <cstdlib>
#include <thread>

#include <sys/wait.h>

namespace ingester {
namespace {

constexpr int wrong = 100;  // such statuses begin here

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n3,barley,4\n";
const std::string Crops_Tab = "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\t*\r\n3\tbarley\t4\r\n";

struct Ran {
    int status = -1;
    std::string out, err;
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
    }

    /// A shell's line that runs the command on these words in its place.
    [[nodiscard]] std::string Shell_Line(const std::string& words, const std::string& temp_folder) const
    {
        return "cd '" + Path("") + "' && TMPDIR=" + temp_folder + " exec '" INGESTER_COMMAND "' " + words;
    }

    /// With `input` on standard input.
    [[nodiscard]] Ran Run(const std::string& words, const std::string& input = Crops,
                          const std::string& temp_folder = "temp") const
    {
        Put("in", input);
        const int how = std::system(Shell_Line("<in >out 2>err " + words, temp_folder).c_str());
        const Ran ran{WIFEXITED(how) ? WEXITSTATUS(how) : -1, Get("out"), Get("err")};
        for (const char* const stream : {"in", "out", "err"})
            std::filesystem::remove(Path(stream));
        return ran;
    }
};

TEST_F(Command_Test, Converts)
{
    const std::string all = On_One_Line(Crops_Tab);
    Put("few.csv", "x,y\n1,oats\n");
    Put("latin.csv", "plot,h\xF6"
                     "he\n1,2\n");
    Put("rows.txt", "# the good ones\n1\n\n 3 - 9\r\n");
    const std::tuple<const char*, const char*, std::string> cases[] = {
        {"crops.csv out.tab", "out.tab", all},
        {"'my data/crops 1.csv' 'my data/out 1.tab'", "my data/out 1.tab", all},
        {"- in.tab", "in.tab", all},
        {"few.csv few.tab --in-options /b/n", "few.tab", "C1\tC2|x\ty|1\toats|"},
        {"--out-options=/mv=NA --range 1:3 crops.csv na.tab", "na.tab",
         "plot\tkind\tyield|1\toats\t2.5|2\trye\tNA|"},
        {"few.csv q.csv --no-names --no-quotes \"--out-options=/mv='-'\"", "q.csv", "C1,C2|x,y|1,oats|"},
        {"crops.csv c.tab --columns 2:2 --no-header", "c.tab", "oats|rye|barley|"},
        {"few.csv y.tab --no-names '--write-missing=it is'", "y.tab", "C1\tC2|x\ty|1\toats|"},
        {"latin.csv l.tab --host-text --keep h\u00F6he --rename h\u00F6he=H", "l.tab", "H|2|"},
        {"few.csv m.tab --missing oats --host-losses", "m.tab", "x|1|"},
        {"--force crops.csv old.tab", "old.tab", all},
        {"crops.csv k.tab --keep yield,plot --rename plot=Block --type=plot=factor", "k.tab",
         "Block!\tyield|1\t2.5|2\t*|3\t4|"},
        {"crops.csv n.tab --keep=3,1-1 --rows rows.txt", "n.tab", "plot\tyield|1\t2.5|3\t4|"},
        {"crops.csv d.tab --drop 'kind, yield' --type plot=date --rows rows.txt", "d.tab",
         "plot:D|01/03/1600|03/03/1600|"},
        {"- s.tab --rename plot=kind,kind=plot --drop=yield --type plot=text", "s.tab",
         "kind\tplot|1\toats|2\trye|3\tbarley|"},
    };
    for (const auto& [line, output, text] : cases) {
        const Ran ran = Run(line);
        EXPECT_EQ(ran.status, 0) << line;
        EXPECT_EQ(On_One_Line(Get(output)), text) << line;
        EXPECT_EQ(ran.out + ran.err, "") << line;
    }
    EXPECT_EQ(Run("crops.csv lines.csv --out-options=/rewrite=6").status, 7) << "it has no rows";
    EXPECT_EQ(Get("lines.csv"), "plot,kind,yield,1,oats,2.5\n2,rye,*,3,barley,4\n");
}

TEST_F(Command_Test, Leaves_A_List_Of_Columns_To_Fill_In)
{
    const Ran first = Run("crops.csv out.tab --column-list");
    EXPECT_EQ(Get("crops.VAR"), "3\nplot\nkind\nyield\n") << first.err;
    EXPECT_NE(first.err.find("crops.VAR: lists the names"), std::string::npos) << first.err;
    Put("crops.VAR", "3\n\nplant\n*\n");
    EXPECT_EQ(Run("crops.csv out.tab --column-list --force").err, "");
    EXPECT_EQ(Get("out.tab"), "plot\tplant\r\n1\toats\r\n2\trye\r\n3\tbarley\r\n");
}

TEST_F(Command_Test, Adds_Sheets_To_A_Book_And_Lists_Them)
{
    for (const char* const option :
         {"--add-sheet=Crops", "--add-sheet=Crops", "--add-sheet=Crops", "--replace-sheet=Crops_1"})
        EXPECT_EQ(Run(std::string("crops.csv all.tbk ") + option).err, "");
    EXPECT_EQ(Run("sheets all.tbk").out, "Crops\nCrops_1\nCrops_2\n");
    EXPECT_EQ(Run("sheets crops.csv").out, "Sheet1\n");
    for (const std::string sheet : {"Crops", "crops_1", "3"}) {
        EXPECT_EQ(Run("--sheet " + sheet + " all.tbk back.tab -f").status, 0);
        EXPECT_EQ(Get("back.tab"), Crops_Tab) << sheet;
    }
    const std::string book = Get("all.tbk");
    const Ran ran = Run("crops.csv all.tbk --replace-sheet None");
    EXPECT_TRUE(ran.err.starts_with("Sheet None not found in Tabulon file all.tbk.\nCould add data"));
    EXPECT_EQ(ran.status, 8);
    EXPECT_EQ(Get("all.tbk"), book);
}

TEST_F(Command_Test, Standard_Output_Gets_What_A_Comma_File_Gets)
{
    ASSERT_EQ(Run("crops.csv same.csv").status, 0);
    for (const char* const line : {"crops.csv -", "- -"}) {
        const Ran ran = Run(line);
        EXPECT_EQ(ran.status, 0);
        EXPECT_EQ(ran.out, Get("same.csv"));
        EXPECT_EQ(ran.err, "");
    }
    const Ran closed = Run("crops.csv - >&-");
    EXPECT_EQ(closed.status, 6);
    EXPECT_NE(closed.err.find("standard output"), std::string::npos) << closed.err;
}

TEST_F(Command_Test, Joins_Files)
{
    const std::pair<std::string, std::string> cases[] = {
        {"june.csv all.csv --append", "plot,kind|1,oats|2,rye|7,bean|"},
        {"june.csv all.csv --append=month,june",
         "plot,kind,month!|1,oats,Original|2,rye,Original|7,bean,june|"},
        {"heights.csv all.csv --concatenate", "plot,kind,kind1,height|1,oats,a,5|2,rye,b,6|"},
        {"heights.csv all.csv --concatenate=U", "plot,kind,height|1,a,5|2,b,6|"},
        {"yields.csv all.csv --merge plot", "plot,kind,name,yield|1,oats,,*|2,rye,rye,9|3,,fern,8|"},
        {"yields.csv all.csv --merge plot --merge kind=name --merge-rows none",
         "plot,kind,yield|1,oats,*|2,rye,9|"},
        {"twice.csv all.csv --merge plot --merge-rows none", "plot,kind,x|1,oats,*|2,rye,8|"},
        {"- all.csv --merge plot", "plot,kind,x|1,oats,*|2,rye,3|"},
    };
    Put("june.csv", "kind,plot\nbean,7\n");
    Put("heights.csv", "kind,height\na,5\nb,6\n");
    Put("yields.csv", "plot,name,yield\n3,fern,8\n2,rye,9\n");
    Put("yields.mrg", "not ours");
    Put("twice.csv", "plot,x\n2,8\n2,9\n3,7\n");
    for (const auto& [line, joined] : cases) {
        Put("all.csv", "plot,kind\n1,oats\n2,rye\n");
        const Ran ran = Run(line + " --no-quotes", "plot,x\n2,3\n");
        EXPECT_EQ(ran.status, 0) << line;
        const bool renamed = joined.find("kind1") != std::string::npos;
        EXPECT_EQ(ran.out + ran.err, renamed ? "Lost in kind: names changed (kind1).\n" : "") << line;
        EXPECT_EQ(On_One_Line(Get("all.csv")), joined) << line;
        EXPECT_EQ(Get("yields.mrg"), "not ours");
    }
}

TEST_F(Command_Test, Tells_What_It_Would_Send_And_What_It_Can)
{
    const std::pair<const char*, const char*> cases[] = {
        {"--dry-run 'my data/crops 1.csv' new.gen --missing \"N'A\" --names=4 --append=a,b --start 'it is' "
         "--map in/a.map --quiet-read --range 2:3",
         "Infile: my data\\crops 1.csv/+people/+header=4/+missing=\"N'A\"/map='in\\a.map'/s='it is'\n"
         "Outfile: new.gen/q/@,a,b\nWorksheet: \nCell range: 2:3\n"},
        {"formats", "comma text                           -      yes     .csv\n"},
        {"formats --all", "\nShapefile "},
        {"formats --json", "\"extensions\": [\".htm\", \".html\"]"},
        {"summary crops.csv", "   1: plot - Variate\n      Mean: 2, Min: 1, Max: 3, NMV: 0\n"},
        {"--help", "Examples:"},
        {"--version", "ingester "},
    };
    for (const auto& [line, told] : cases) {
        const Ran ran = Run(line);
        EXPECT_EQ(ran.status, 0) << line;
        EXPECT_NE(ran.out.find(told), std::string::npos) << ran.out;
    }
}

TEST_F(Command_Test, The_Examples_Of_The_Read_Me_Work)
{
    const std::string command = std::filesystem::path(INGESTER_COMMAND).parent_path().string();
    const std::string begin = "cd '" + Path("try") + "' && PATH='" + command + "':$PATH && TMPDIR=. && ";
    std::ifstream read_me(INGESTER_PROJECT "/README.md");
    int examples = 0;
    for (std::string line; std::getline(read_me, line);) {
        const bool runs = line.starts_with("ingester ") || line.find("| ingester ") != std::string::npos;
        if (!runs || line.find(".csv") == std::string::npos || line.find("https:") != std::string::npos)
            continue;
        ++examples;
        std::filesystem::remove_all(Path("try"));
        std::filesystem::create_directory(Path("try"));
        for (const std::string name : {"crops", "raw", "june", "all", "heights", "yields", "plots", "wide"})
            Put("try/" + name + ".csv",
                "plot,kind,name,protein,yield\n1,oats,x,5,2\n2,rye,y,7,3\n3,,z,8,4\n");
        Put("try/plots.txt", "1-2\n");
        if (line.find("--force") != std::string::npos)
            Put("try/out.tab", "old");
        EXPECT_EQ(std::system((begin + "gzip -k crops.csv && (" + line + "\n) >shown 2>&1").c_str()), 0)
            << line << "\n"
            << Get("try/shown");
        EXPECT_EQ(Get("try/shown").find("was not found"), std::string::npos) << line;
    }
    EXPECT_GT(examples, 20);
}

TEST_F(Command_Test, The_Document_Of_Formats_Is_Made_From_Their_Table)
{
    const std::string made = Path("formats.md");
    const std::string make =
        "'" INGESTER_PROJECT "/tools/make_docs.sh' '" INGESTER_COMMAND "' >'" + made + "'";
    ASSERT_EQ(std::system(make.c_str()), 0);
    EXPECT_EQ(std::system(("diff -u '" INGESTER_PROJECT "/docs/formats.md' '" + made + "'").c_str()), 0)
        << "make docs brings docs/formats.md up to date";
}

TEST_F(Command_Test, Fails_With_A_Reason_In_Native_Names_And_Touches_Nothing)
{
    Put("my data/crops 1.var", "*\n");
    Put("back.txt", "1-2\n2-1\n");
    Put("folder/odd.bin", std::string("\1\2\3\4 no text\n", 13));
    const std::string files = Files();
    const std::string many(1110, 'x');
    const std::tuple<int, const char*, std::string> cases[] = {
        {6, "ingester: old.tab: the file exists already", "crops.csv old.tab"},
        {6, "--force", "crops.csv ./old.tab --out-options /av"},
        {6, "ingester: folder: this is a folder", "crops.csv folder --force"},
        {6, "ingester: /dev/null: this is a device", "crops.csv /dev/null --force"},
        {wrong, "ingester: a\\b.csv: ", "'a\\b.csv' out.tab"},
        {wrong, "%TEMP%", "crops.csv %TEMP%/out.tab"},
        {wrong, "1120", "crops.csv " + many + "1234567.tab"},
        {wrong, "crops.csv", "crops.csv out.tab --in-options=/s=" + many},
        {wrong, "--sheet", "crops.csv out.tab --sheet " + many.substr(0, 281)},
        {wrong, "--range", "crops.csv out.tab --range " + many.substr(0, 281)},
        {wrong, "OUTPUT", "crops.csv"},
        {wrong, "begin with '/'", "crops.csv out.tab --in-options n"},
        {wrong, "more", "crops.csv out.tab more"},
        {wrong, "--start: this value can't hold '/b'", "crops.csv out.tab --start a/b"},
        {wrong, "drops blanks", "crops.csv 'old.tab '"},
        {wrong, "not of the form", "crops.csv out.tab --skip-lines x"},
        {wrong, "per cent signs", "crops.csv out.tab --write-missing %TMP%"},
        {wrong, "/n is given twice", "crops.csv out.tab --in-options /n --no-names"},
        {wrong, "both kinds of quotes", "crops.csv out.tab --missing \"'\\\"\""},
        {wrong, "can't hold a '/'", "crops.csv out.tab --columns 1/2"},
        {wrong, "not of the form", "crops.csv out.tab --columns B:C"},
        {wrong, "clipboard.csv", "crops.csv Clipboard"},
        {wrong, "--keep", "crops.csv old.tab --append --columns 2:3"},
        {wrong, "--keep: 'a", "crops.csv out.tab --keep a\1"},
        {wrong, "more columns than", "crops.csv out.tab --keep 1-9,1-10000000"},
        {wrong, "ingester summary", "crops.csv - --print-summary"},
        {wrong, "--update-sheet", "crops.csv old.tab --append --add-sheet New"},
        {wrong, "--update-sheet", "crops.csv old.tab --concatenate --sheet-name Other"},
        {wrong, "--separators: the value is empty", "crops.csv out.tab --separators ''"},
        {wrong, "is not of the form OLD=NEW", "crops.csv out.tab --rename a"},
        {wrong, "can't be the name", "crops.csv out.tab --rename kind=*"},
        {wrong, "can't be the name", "crops.csv out.tab --rename kind=a:D"},
        {wrong, "factor, text", "crops.csv out.tab --type kind=whole"},
        {wrong, "line 1 of crops.csv", "crops.csv out.tab --rows crops.csv"},
        {wrong, "line 2 of back.txt", "crops.csv out.tab --rows back.txt"},
        {wrong, "none can't be opened", "crops.csv out.tab --rows none"},
        {wrong, "beside the input", "'my data/crops 1.csv' out.tab --drop kind"},
        {13, "no columns or rows", "crops.csv out.tab --keep none"},
        {6, "no such file", "crops.csv new.tab --append"},
        {6, "no such file", "crops.csv - --concatenate"},
        {17, "Merge key plot in WITH", "crops.csv old.tab --merge plot"},
        {2, "no/crops.csv", "no/crops.csv old.tab --merge plot"},
        {wrong, "two names", "crops.csv old.tab --merge a="},
        {wrong, "four keys", "crops.csv old.tab --merge=a --merge=b --merge=c --merge=d --merge=e"},
        {wrong, "/% is given twice", "crops.csv old.tab --merge=a --out-options=/%"},
        {2, "no/crops.csv", "no/crops.csv out.tab"},
        {2, "no/crops.csv", "no/crops.csv old.tab --force"},
        {3, "folder/odd.bin", "folder/odd.bin out.tab"},
        {6, "none/deep", "crops.csv none/deep/out.tab"},
    };
    for (const auto& [status, said, line] : cases) {
        const Ran ran = Run(line);
        EXPECT_EQ(std::min(ran.status, wrong), status) << line;
        EXPECT_NE(ran.err.find(said), std::string::npos) << ran.err;
        EXPECT_TRUE(status == wrong || ran.err.find('\\') == std::string::npos) << ran.err;
        EXPECT_EQ(ran.err.find("\n:"), std::string::npos) << ran.err;
        EXPECT_EQ(ran.out, "");
        EXPECT_EQ(Files(), files) << line;
        EXPECT_EQ(Get("old.tab"), "old\r\n1\r\n");
    }
    const Ran silent = Run("- out.tab", "");
    EXPECT_EQ(silent.status, 2);
    EXPECT_NE(silent.err.find("standard input"), std::string::npos) << silent.err;
    const Ran homeless = Run("crops.csv out.tab", "", "/nonexistent");
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
        std::FILE* const input =
            ::popen(("echo $$ >" + Path("pid") + "; " + Shell_Line("- out.tab", "temp")).c_str(), "w");
        for (int i = 0; i < 1000 && !is_waiting(); ++i)
            std::this_thread::sleep_for(std::chrono::milliseconds(10));
        EXPECT_TRUE(is_waiting());
        const ::pid_t process = std::stoi(Get("pid"));
        ::siginfo_t end;
        ::kill(process, signal_number);
        ::waitid(P_PID, static_cast<::id_t>(process), &end, WEXITED | WNOWAIT);  // before its input ends
        const int how = ::pclose(input);
        EXPECT_EQ(WIFSIGNALED(how) ? WTERMSIG(how) : 0, signal_number);
        std::filesystem::remove(Path("pid"));
        EXPECT_EQ(Files(), files);
    }
}

}  // namespace
}  // namespace ingester

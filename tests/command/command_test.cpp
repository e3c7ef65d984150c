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

constexpr int wrong = 64;  // of a command line

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n3,barley,4\n";
const std::string Crops_Tab = "plot\tkind\tyield\n1\toats\t2.5\n2\trye\t\n3\tbarley\t4\n";

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
         "Block\tyield|1\t2.5|2\t|3\t4|"},
        {"crops.csv h.tab --host-output --keep yield,plot --rename plot=Block --type=plot=factor", "h.tab",
         "Block!\tyield|1\t2.5|2\t*|3\t4|"},
        {"crops.csv marks.tab --marks --write-missing '' --type=plot=factor,yield=date", "marks.tab",
         "plot!\tkind\tyield:D|1\toats\t1600-03-02 12:00:00|2\trye\t|3\tbarley\t1600-03-04 00:00:00|"},
        {"crops.csv n.tab --keep=3,1-1 --rows rows.txt", "n.tab", "plot\tyield|1\t2.5|3\t4|"},
        {"crops.csv d.tab --drop 'kind, yield' --type plot=date --rows rows.txt", "d.tab",
         "plot|1600-03-01|1600-03-03|"},
        {"- s.tab --rename plot=kind,kind=plot --drop=yield --type plot=text", "s.tab",
         "kind\tplot|\"1\"\toats|\"2\"\trye|\"3\"\tbarley|"},
    };
    for (const auto& [line, output, text] : cases) {
        const Ran ran = Run(line);
        EXPECT_EQ(ran.status, 0) << line;
        EXPECT_EQ(On_One_Line(Get(output)), text) << line;
        EXPECT_EQ(ran.out + ran.err, "") << line;
    }
    const Ran rewritten = Run("crops.csv lines.csv --out-options=/rewrite=6");
    EXPECT_EQ(rewritten.status, 0);
    EXPECT_EQ(rewritten.err, "ingester: lines.csv: lines were joined until they held 6 fields\n");
    EXPECT_EQ(Run("absent.csv none.csv --out-options=/rewrite=6").status, 2);
    EXPECT_EQ(Get("lines.csv"), "plot,kind,yield,1,oats,2.5\n2,rye,*,3,barley,4\n");
}

TEST_F(Command_Test, Leaves_A_List_Of_Columns_To_Fill_In)
{
    const Ran first = Run("crops.csv out.tab --column-list");
    EXPECT_EQ(Get("crops.VAR"), "3\nplot\nkind\nyield\n") << first.err;
    EXPECT_NE(first.err.find("crops.VAR: lists the names"), std::string::npos) << first.err;
    Put("crops.VAR", "3\n\nplant\n*\n");
    EXPECT_EQ(Run("crops.csv out.tab --column-list --force").err, "");
    EXPECT_EQ(Get("out.tab"), "plot\tplant\n1\toats\n2\trye\n3\tbarley\n");
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
         "plot,kind,month|1,oats,Original|2,rye,Original|7,bean,june|"},
        {"heights.csv all.csv --concatenate", "plot,kind,kind1,height|1,oats,a,5|2,rye,b,6|"},
        {"heights.csv all.csv --concatenate=U", "plot,kind,height|1,a,5|2,b,6|"},
        {"yields.csv all.csv --merge plot", "plot,kind,name,yield|1,oats,,|2,rye,rye,9|3,,fern,8|"},
        {"yields.csv all.csv --merge plot --merge kind=name --merge-rows none",
         "plot,kind,yield|1,oats,|2,rye,9|"},
        {"twice.csv all.csv --merge plot --merge-rows none", "plot,kind,x|1,oats,|2,rye,8|"},
        {"- all.csv --merge plot", "plot,kind,x|1,oats,|2,rye,3|"},
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

TEST_F(Command_Test, Packs_What_Ends_In_Gz)
{
    for (const std::string form : {"csv", "tab", "tsv", "tss", "tbk", "gen"}) {
        ASSERT_EQ(Run("crops.csv plain." + form).err, "");
        ASSERT_EQ(Run("crops.csv packed." + form + ".gz").err, "");
        ASSERT_EQ(std::system(("gzip -dc " + Path("packed." + form + ".gz") + " >" + Path("plain")).c_str()),
                  0);
        EXPECT_EQ(Get("plain").size(), Get("plain." + form).size()) << form;
        if (form != "tss" && form != "tbk") {  // which hold the time of their making
            EXPECT_EQ(Get("plain"), Get("plain." + form));
        }
        if (form == "gen")
            continue;
        const std::string joined = form == "tbk" ? " --append --update-sheet Sheet1" : " --append";
        EXPECT_EQ(Run("crops.csv packed." + form + ".gz" + joined).status, 0) << form;
        EXPECT_EQ(Run("packed." + form + ".gz - --no-header").out,
                  "1,oats,2.5\n2,rye,\n3,barley,4\n1,oats,2.5\n2,rye,\n3,barley,4\n")
            << form;
    }
    const std::string files = Files();
    const std::string old = Get("packed.csv.gz");
    EXPECT_EQ(Run("crops.csv packed.csv.gz").status, 6);
    EXPECT_EQ(Run("crops.csv packed.csv.gz --force --type kind=number --strict").status, 6);
    EXPECT_EQ(Run("crops.csv packed.csv.gz --concatenate=x").status, wrong);
    EXPECT_EQ(Get("packed.csv.gz"), old);
    EXPECT_EQ(Files(), files);
}

TEST_F(Command_Test, Joins_Keep_The_Manner_Of_A_Text)
{
    const std::tuple<std::string, const char*, std::string> cases[] = {
        {"a,f!\r\n*,x\r\n", "", "a,f!\r\n*,x\r\n2,y\r\n"},
        {"a,f\n*,x\n", "", "a,f\n*,x\n2,y\n"},
        {"\xEF\xBB\xBF"
         "a,f\n1,x\n",
         "",
         "\xEF\xBB\xBF"
         "a,f\n1,x\n2,y\n"},
        {"a,f\n1,\xF6\n", "is one in UTF-8 now", "a,f\n1,\xC3\xB6\n2,y\n"},
        {{"\xFF\xFE"
          "a\0,\0f\0\n\0"
          "1\0,\0x\0\n\0",
          18},
         "",
         {"\xFF\xFE"
          "a\0,\0f\0\n\0"
          "1\0,\0x\0\n\0"
          "2\0,\0y\0\n\0",
          26}},
    };
    for (const auto& [before, told, after] : cases) {
        Put("all.csv", before);
        const Ran ran = Run("- all.csv --append", "a,f\n2,y\n");
        EXPECT_NE(ran.err.find(told), std::string::npos) << ran.err;
        EXPECT_EQ(Get("all.csv"), after) << before;
    }
    Put("all.csv", "a,f\n1,\xF6\n");
    EXPECT_EQ(Run("- all.csv --append --write-encoding latin1", "a,f\n2,y\n").err, "");
    EXPECT_EQ(Get("all.csv"), "a,f\n1,\xF6\n2,y\n");
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

TEST_F(Command_Test, Shows_What_A_File_Holds)
{
    const std::string wide = "\xE6\xA2\x85";  // of two places on a terminal
    Put("t.csv", "n,f!,d:D,t:T,name\n0.1,b,1/2/2024,10:30,x\n*,a,2/2/2024,*,a " + wide + "\n1e300,*,*,*,\n");
    for (const char* const sheet : {"One", "Two"})
        ASSERT_EQ(Run(std::string("t.csv t.tbk --add-sheet ") + sheet).status, 0);
    const std::string columns = "rows: 3\ncolumns: 5\n\n"
                                "#  NAME  TYPE    MISSING  VALUES\n"
                                "1  n     number        1  0.1 to 1e+300\n"
                                "2  f     factor        1  2 levels: a, b\n"
                                "3  d     date          1  2024-02-01 to 2024-02-02\n"
                                "4  t     time          2  10:30:00\n"
                                "5  name  text          1  up to 3 letters\n";
    const std::string json =
        "{\"file\":\"standard input\",\"format\":\"delimited or other plain text\",\"packed\":"
        "false,\"rows\":3,\"columns\":[{\"name\":\"n\",\"type\":\"number\",\"missing\":1,"
        "\"min\":0.1,\"max\":1e+300},{\"name\":\"f\",\"type\":\"factor\",\"missing\":1,"
        "\"levels\":[{\"label\":\"a\",\"count\":1},{\"label\":\"b\",\"count\":1}]}]}";
    const std::string names = "n\tf\td\tt\tname\n";
    const std::pair<const char*, std::string> cases[] = {
        {"info t.csv", "t.csv: delimited or other plain text\n" + columns},
        {"info t.tbk", "t.tbk: Tabulon Book\nsheets: One, Two\nthis sheet: Two\n" + columns},
        {"head t.csv -n 1", names + "0.1\tb\t2024-02-01\t10:30:00\tx\n"},
        {"head t.tbk --sheet Two --keep n,name --lines 2", "n\tname\n0.1\tx\n\ta ?\n"},
        {"head t.csv -n 2 --keep name", "name\nx\na " + wide + "\n"},
        {"head - --range 1:2 -n 9", names + "0.1\tb\t2024-02-01\t10:30:00\tx\n"},
        {"head t.csv -n 0", names},
    };
    const std::string files = Files();
    for (const auto& [line, shown] : cases) {
        const Ran ran = Run(line, Get("t.csv"));
        EXPECT_EQ(ran.status, 0) << line;
        const std::size_t facts = ran.out.find("encoding: ");  // what the reader found stands in front
        EXPECT_EQ(facts == ran.out.npos ? ran.out : shown, shown) << line;
        EXPECT_EQ(ran.err, "");
    }
    std::string told = Run("info - --json --keep n,f", Get("t.csv")).out;
    std::erase_if(told, [](char c) { return c == '\n'; });
    for (std::size_t at = 0; (at = told.find("  ")) != told.npos;)
        told.erase(at, 1);
    for (const char* const blank : {"{ ", "[ ", " }", " ]", ", \"", ": ", "}, {"})
        for (std::size_t at; (at = told.find(blank)) != told.npos;) {
            const std::string_view sign = blank;
            told.erase(at + (sign.starts_with(' ') ? 0 : sign.find(' ')), 1);
        }
    EXPECT_EQ(told.substr(told.find("\"rows\"")), json.substr(json.find("\"rows\""))) << told;
    EXPECT_EQ(Files(), files) << "nothing is written";
}

TEST_F(Command_Test, A_Terminal_Gets_As_Much_As_It_Has_Places_For)
{
    if (std::system("command -v script >/dev/null") != 0)
        GTEST_SKIP() << "script is not installed";
    const std::string wide = "\xE6\xA2\x85";
    Put("t.csv", "fruit,colour,weight,remark\n" + wide + wide
                     + ",red,1.5,x\nfig,a very deep violet,22,y\nplum,blue,3,z\n");
    const std::string inner = "stty cols 33; " INGESTER_COMMAND " head t.csv -n 2";
    ASSERT_EQ(std::system(("cd '" + Path("") + "' && TMPDIR=temp script -qc '" + inner
                           + "' /dev/null >out </dev/null")
                              .c_str()),
              0);
    std::string shown = Get("out");
    std::erase(shown, '\r');
    EXPECT_EQ(shown, "fruit  colour              weight\n" + wide + wide
                         + "   red                    1.5\nfig    a very deep violet      22\n"
                           "1 more row, 1 more column: remark\n");
}

/// What two other programs make of a text, without options: types, and cells between bars.
struct Peer {
    const char* there;  ///< the shell's line that succeeds where it is installed
    const char* script;
    const char* run;
    const char* told;
};

constexpr Peer Peers[] = {
    {"Rscript -e 'library(data.table)'",
     "for (d in list(read.csv('c.csv', encoding = 'UTF-8'), data.table::fread('c.csv', data.table = FALSE))) "
     "{\n"
     "  cat(sapply(d, function(x) class(x)[[1]]), '\\n')\n"
     "  cat(d$name, format(as.Date(d$day)), sprintf('%.17g', d$x), d$n, sep = '|')\n"
     "  cat('\\n')\n}\n",
     "Rscript script",
     "character character character integer numeric integer \n"
     "Zo\xC3\xAB|a,b|say "
     "\"hi\"|2024-03-12|2024-03-13|NA|0.30000000000000004|NA|1.0000000000000001e+300|1|2|3\n"
     "character IDate character integer numeric integer \n"
     "Zo\xC3\xAB|a,b|say "
     "\"\"hi\"\"|2024-03-12|2024-03-13|NA|0.30000000000000004|NA|1.0000000000000001e+300|1|2|3\n"},
    {"/usr/bin/python3 -c 'import pandas'",
     "import pandas\n"
     "d = pandas.read_csv('c.csv', float_precision='round_trip', parse_dates=['day'])\n"
     "print(*d.dtypes)\n"
     "print(*d.name, *d.day.dt.date, *d.x, *d.n, sep='|')\n",
     "/usr/bin/python3 script",
     "object datetime64[ns] object int64 float64 int64\n"
     "Zo\xC3\xAB|a,b|say \"hi\"|2024-03-12|2024-03-13|NaT|0.30000000000000004|nan|1e+300|1|2|3\n"},
};

TEST_F(Command_Test, Other_Programs_Read_Its_Comma_Text)
{
    Put("hard.csv", "name,day:D,when:T,code$,x,n\nZo\xC3\xAB,12/03/2024,10:30,007,0.30000000000000004,1\n"
                    "\"a,b\",13/03/2024,11:30:15,12,*,2\n\"say \"\"hi\"\"\",*,*,13,1e300,3\n");
    ASSERT_EQ(Run("hard.csv c.csv").err, "");
    EXPECT_EQ(Get("c.csv"),
              "name,day,when,code,x,n\nZo\xC3\xAB,2024-03-12,10:30:00,\"007\",0.30000000000000004,1\n"
              "\"a,b\",2024-03-13,11:30:15,\"12\",,2\n\"say \"\"hi\"\"\",,,\"13\",1e300,3\n");
    int there = 0;
    for (const Peer& peer : Peers) {
        if (std::system((std::string(peer.there) + " >/dev/null 2>&1").c_str()) != 0)
            continue;
        ++there;
        Put("script", peer.script);
        const std::string line = "cd '" + Path("") + "' && LC_ALL=C.UTF-8 " + peer.run + " >told";
        EXPECT_EQ(std::system(line.c_str()), 0);
        EXPECT_EQ(Get("told"), peer.told) << peer.run;
    }
    if (there == 0)
        GTEST_SKIP() << "no peer is installed";
}

TEST_F(Command_Test, Documents_Every_Option)
{
    const std::string man = Run("--make-man").out;
    const std::string bash = Run("--make-bash").out;
    const std::string zsh = Run("--make-zsh").out;
    for (const std::string task : {"", "info ", "head ", "summary ", "sheets "}) {
        const std::string help = Run(task + "--help").out;
        int options = 0;
        for (std::size_t at = help.find("  --"); at != help.npos; at = help.find("  --", at + 1), ++options) {
            const std::size_t start = help.find('-', at);
            const std::string name = help.substr(start, help.find_first_of(" ,\n", start) - start);
            std::string page_name;
            for (const char c : name)
                page_name += c == '-' ? std::string("\\-") : std::string(1, c);
            EXPECT_NE(man.find("\\fB" + page_name + "\\fR"), man.npos) << name;
            EXPECT_NE(bash.find(" " + name + " "), bash.npos) << name;
            EXPECT_NE(zsh.find("'*" + name + "["), zsh.npos) << name;
        }
        EXPECT_GT(options, 20) << task;
    }
    Put("completion",
        bash + "COMP_WORDS=(ingester info x --js) COMP_CWORD=3\n_ingester\necho ${COMPREPLY[@]}\n");
    ASSERT_EQ(std::system(("bash '" + Path("completion") + "' >'" + Path("out") + "'").c_str()), 0);
    EXPECT_EQ(Get("out"), "--json\n");
}

TEST_F(Command_Test, The_Examples_Of_The_Read_Me_Work)
{
    const std::string command = std::filesystem::path(INGESTER_COMMAND).parent_path().string();
    const std::string begin = "cd '" + Path("try") + "' && PATH='" + command + "':$PATH && TMPDIR=. && ";
    std::ifstream read_me(INGESTER_PROJECT "/README.md");
    int examples = 0;
    for (std::string line; std::getline(read_me, line);) {
        const bool runs = line.starts_with("ingester ") || line.find("| ingester ") != std::string::npos;
        if (!runs || line.find("https:") != std::string::npos)
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
        std::filesystem::copy(INGESTER_PROJECT "/examples/survey.sav", Path("try/survey.sav"));
        const std::string made =
            "gzip -k crops.csv && ingester crops.csv all.tbk && ingester crops.csv study.xpt && ";
        const std::string had =
            line.find(" all.tbk ") != line.npos && line.find("--add") != line.npos ? "rm all.tbk; " : "";
        EXPECT_EQ(std::system((begin + made + had + "(" + line + "\n) >shown 2>&1").c_str()), 0)
            << line << "\n"
            << Get("try/shown");
        EXPECT_EQ(Get("try/shown").find("was not found"), std::string::npos) << line;
    }
    EXPECT_GT(examples, 26);
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
        {wrong, "info FILE", ""},
        {wrong, "there is no option --mising; did you mean --missing?", "crops.csv out.tab --mising NA"},
        {wrong, "there is no option --separater; did you mean --separator?",
         "crops.csv out.tab --separater=x"},
        {wrong, "there is no option --zzzzzzz\n", "crops.csv out.tab --zzzzzzz"},
        {wrong, "--separator: this value is not of the form", "crops.csv out.tab --separator foo"},
        {wrong, "--decimal: this value is not of the form", "crops.csv out.tab --decimal x"},
        {wrong, "--table: this value is not of the form", "crops.csv out.tab --table 0"},
        {wrong, "give a number of rows, as 20", "head crops.csv -n 1.5"},
        {wrong, "did you mean --json?", "info crops.csv --jsn"},
        {wrong, "did you mean --markdown?", "formats --markdwn"},
        {wrong, "did you mean ingester summary?", "sumary crops.csv"},
        {wrong, "FILE", "head"},
        {wrong, "--lines", "head crops.csv -n -2"},
        {wrong, "no option --force", "info crops.csv --force"},
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
        EXPECT_EQ(ran.status, status) << line;
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

// What requests get beside the host's rules: which rules are asked for, losses told or refused, names as they
// stand, options in vain, further endings and types.
#include "interface/people_options.h"

#include "interface/format_drivers.h"
#include "interface/host_fixture.h"

namespace ingester {
namespace {

class People_Options : public Host_Test {};

TEST_F(People_Options, Are_Cut_From_Both_Strings)
{
    std::string infile = R"(a\b.csv/+names/n/+encoding=latin1/+report='c d\e.json')";
    std::string outfile = R"( x.tab/+strict/u )";
    Take_People_Options(infile, outfile);
    EXPECT_EQ(infile, R"(a\b.csv/n)");
    EXPECT_EQ(outfile, "x.tab/u");
    EXPECT_TRUE(For_People(People_Rule::free_names) && request.Strict);
    EXPECT_FALSE(For_People(People_Rule::utf8_text));
    EXPECT_EQ(request.Input_Encoding, "latin1");
    EXPECT_EQ(request.Loss_Report_Name, R"(c d\e.json)");

    std::string plain = " a.csv /n";
    Take_People_Options(plain, plain);
    EXPECT_EQ(plain, " a.csv /n") << "of a host's strings nothing is touched";

    for (const People_Rule_Option& option : People_Rule_Options()) {
        std::bitset<People_Rule_Count> all_but_one;
        all_but_one.set().reset(static_cast<std::size_t>(option.rule));
        request.people.reset();
        std::string asked = "a" + Spell_People_Rules(all_but_one);
        Take_People_Options(asked, outfile);
        EXPECT_EQ(request.people, all_but_one) << option.key;
        EXPECT_EQ(asked, "a");
    }
}

TEST_F(People_Options, Tell_Losses_Only_Where_They_Are_Asked_To)
{
    const std::string text = "a,d:D,n\n1,5/6/2020,1\n2,soon,2\n3,later,3\n\n4,5/6/2020,4\n";
    const std::string told = "Lost in d: texts that are no numbers or dates, 2 times (first: row 2: soon).\n";
    const std::string unread = "Lost: parts of the input not read (lines behind an empty line of it).\n";
    Put("a.csv", text);
    const Host_Answer host = Convert("a.csv", "host.tab");
    EXPECT_EQ(host.first, 0);
    EXPECT_EQ(host.second.find("Lost"), std::string::npos);
    const Host_Answer people = Convert("a.csv/+losses", "people.tab");
    EXPECT_NE(people.second.find(unread + told), std::string::npos) << people.second;
    EXPECT_EQ(Get("people.tab"), Get("host.tab"));

    EXPECT_EQ(Convert("a.csv/+report='" + Request_Name("r.json") + "'", "host.tab").first, 0);
    const std::string entry =
        "    {\n      \"kind\": \"text_not_number\",\n      \"column\": \"d\",\n"
        "      \"first_row\": 2,\n      \"count\": 2,\n      \"example\": \"soon\"\n    }";
    EXPECT_NE(Get("r.json").find(entry), std::string::npos) << Get("r.json");
    EXPECT_EQ(Convert("a.csv/+report='" + Request_Name("none\\r.json") + "'", "host.tab").first, 6);
}

TEST_F(People_Options, A_Strict_Request_Leaves_The_Old_Output)
{
    Put("bad.csv", "n#,t\n1,x\ny,z\n");
    Put("late.csv", "x:D\n1/1/2020\nsoon\n2/1/2020\n3/1/2020\n");
    Put("old.tab", "old");
    ASSERT_EQ(Convert("bad.csv", "book.tbk").first, 0);
    const std::string book = Get("book.tbk");
    const std::string before = Files();
    for (const char* const input : {"bad.csv", "late.csv"})
        for (const char* const output :
             {"new.tab", "old.tab", "new.tbk", "book.tbk/a=two", "clipboard.csv"}) {
            const Host_Answer answer = Convert(std::string(input) + "/+strict", output);
            EXPECT_EQ(answer.first, 6) << input << output;
            EXPECT_NE(answer.second.find("The output was left as it was"), std::string::npos) << output;
            EXPECT_EQ(Files(), before) << input << output;
            EXPECT_EQ(Get("old.tab") + Get("book.tbk"), "old" + book) << output;
        }
    // What the writer alone can't hold, written in place, and a report that can't be written.
    Put("good.csv", "a,t\n1,x\n");
    ASSERT_EQ(Convert("good.csv/#", "told.tss").first, 0);
    Put("label.csv", "a['one'],t\n1,x\n");
    ASSERT_EQ(Convert("label.csv", "told.tss").first, 0);
    EXPECT_EQ(Convert("told.tss/+strict", "old.tab/av").first, 6);
    EXPECT_EQ(Convert("good.csv/+report=none\\r.json", "old.tab").first, 6);
    for (const char* const report : {"good.csv", "old.tab"})
        EXPECT_EQ(Convert("good.csv/+report='" + Request_Name(report) + "'", "old.tab").first, 6) << report;
    EXPECT_EQ(Get("old.tab") + Get("good.csv"), "olda,t\n1,x\n");
    EXPECT_EQ(Convert("good.csv/+strict", "old.tab").first, 0);
}

TEST_F(People_Options, Names_Stand_Until_The_Output_Cannot_Hold_Them)
{
    Put("a.csv", "Plot no,Yield (t/ha),x\n1,2,x\n");
    const std::pair<const char*, const char*> cases[] = {
        {"a.csv/+names", "Plot no\tYield (t/ha)\tx|1\t2\tx|"},
        {"a.csv", "Plot_no\tYield_t_ha\tx|1\t2\tx|"},
    };
    for (const auto& [input, table] : cases) {
        EXPECT_EQ(Convert(input, "a.tab").first, 0);
        EXPECT_EQ(On_One_Line(Get("a.tab")), table);
    }
    Put("marks.csv", "Start:Date,sown:D,how much?!!,:T,\"\"\n1,5/6/2020,x,10:30,7\n");
    EXPECT_EQ(Convert("marks.csv/+names", "a.tab/u").first, 0);
    EXPECT_EQ(On_One_Line(Get("a.tab")),
              "Start:Date\tsown\thow much?!\t:T\tC1|1\t05/06/2020\tx\t10:30:00\t7|")
        << "marks are such at the end of a name only";

    const Host_Answer answer = Convert("a.csv/+names/+losses", "a.gen");
    EXPECT_NE(answer.second.find("Lost in Plot no: names changed (Plot_no).\n"), std::string::npos)
        << answer.second;
    const std::string script = Get("a.gen");
    EXPECT_NE(script.find("Yield_t_ha"), std::string::npos) << script;
    EXPECT_NE(script.find("Yield (t/ha)"), std::string::npos) << "the description tells the old name";

    Put("more.csv", "Plot no,Yield (t/ha)\n7,8\n");  // by name, in an output whose names are valid
    ASSERT_EQ(Convert("a.csv/+names", "all.tss").first, 0);
    ASSERT_EQ(Convert("more.csv/+names", "all.tss/@").first, 0);
    ASSERT_EQ(Convert("all.tss", "all.tab").first, 0);
    EXPECT_EQ(On_One_Line(Get("all.tab")), "Plot_no\tYield_t_ha\tx|1\t2\tx|7\t8\t|");
}

TEST_F(People_Options, Keys_Of_Joins_Go_By_The_Names_That_Columns_Get)
{
    Put("a.csv", "my key,x\na,1\nb,2\n");
    Put("b.csv", "my key,y\nb,5\na,6\n");
    Put("b.mrg", "1\nmy key\n");
    ASSERT_EQ(Convert("a.csv/+people", "all.tss").first, 0);
    ASSERT_EQ(Convert("b.csv/+people", "all.tss/%=1").first, 0);
    ASSERT_EQ(Convert("all.tss/+people", "all.tab").first, 0);
    EXPECT_EQ(On_One_Line(Get("all.tab")), "my_key\tx\ty|a\t1\t6|b\t2\t5|");
    const std::string question = "How satisfied are you with the service overall";
    Put("long.csv", question + "?," + question + "!,b\n1,2,3\n");
    EXPECT_EQ(Convert("long.csv/+people", "long.tab/u").first, 0);
    EXPECT_TRUE(Get("long.tab").starts_with(question + "?\t" + question + "\tb")) << Get("long.tab");
}

TEST_F(People_Options, Marks_Of_A_List_Act_Under_Free_Names)
{
    Put("a.csv", "k,v\n1,5\n2,6\n");
    Put("a.VAR", "2\nthe k!\nv$\n");
    EXPECT_EQ(Convert("a.csv/+names/v", "a.tab").first, 0);
    EXPECT_EQ(On_One_Line(Get("a.tab")), "the k!\tv|1\t5|2\t6|");
}

TEST_F(People_Options, Tell_Of_Options_Given_In_Vain)
{
    Put("a.csv", "k,v\n1,5\n");
    ASSERT_EQ(Convert("a.csv", "a.tss").first, 0);
    EXPECT_EQ(Convert("a.tss/+vain/n/tr/s=NA", "b.tss").second,
              "Warning: --no-names means nothing to this input, Tabulon Spreadsheet, and had no effect.\n"
              "Warning: --start means nothing to this input, Tabulon Spreadsheet, and had no effect.\n:\n");
    EXPECT_EQ(Convert("a.csv/+vain/n/x=NA", "b.tss").second, "");
    EXPECT_EQ(
        Call({Request_Name("a.csv/+vain"), Request_Name("b.tss"), "Two"}).second,
        "Warning: --sheet means nothing to this input, delimited or other plain text, and had no effect.\n"
        ":\n");
    EXPECT_EQ(Convert("a.tss/n/s=NA", "b.tss").second, "") << "hosts give what they like";
}

TEST_F(People_Options, Know_Further_Endings_And_Types)
{
    Put("a.csv", "k,v\n1,5\n");
    EXPECT_EQ(Convert("a.csv", "a.sav").first, 0) << "fixed-width text for hosts";
    EXPECT_EQ(
        Convert("a.csv/+endings", "b.sav").second,
        "Writing SPSS system file is not available in this version; SAS transport (.xpt) is, which most "
        "programs read.\n:\n");
    Put("accents", "\xC3\xA9t\xC3\xA9,n\nx,1\n");
    Put("short", "a");
    for (const char* const name : {"accents", "short"}) {
        EXPECT_EQ(Convert(name, "a.tab").first, 3) << name;
        EXPECT_NE(Convert(std::string(name) + "/+types", "a.tab").first, 3) << name;
    }
    Put("binary", std::string("\x01\x02\x03 data\n", 9));
    EXPECT_EQ(Convert("binary/+types", "a.tab").first, 3);
}

TEST_F(People_Options, Declare_The_Code_Of_The_Input)
{
    Put("a.csv", "t,n\nB\x84r,1\n");
    EXPECT_EQ(Convert("a.csv/+people/+encoding=850", "a.tab").first, 0);
    EXPECT_EQ(On_One_Line(Get("a.tab")), "t\tn|B\xC3\xA4r\t1|");
    EXPECT_EQ(Convert("a.csv/+types/+encoding=cp437", "a.tab").first, 0);
    EXPECT_EQ(On_One_Line(Get("a.tab")), "t\tn|B\xE4r\t1|") << "a host's text is Windows-1252";
    const Host_Answer unknown = Convert("a.csv/+encoding=latin17", "a.tab");
    EXPECT_EQ(unknown.first, 5);
    EXPECT_TRUE(unknown.second.starts_with("Error: The encoding latin17 is not known. The nearest ones: "))
        << unknown.second;
}

TEST_F(People_Options, Name_The_Secondary_File_Beside_A_List)
{
    Put("a.csv", "k,v\n1,5\n");
    Put("columns", "1\nVariables\nv\n");
    const std::string second = Request_Name("second.dat");
    EXPECT_EQ(Call({Request_Name("a.csv/+secondary='" + second + "'"), Request_Name("a.tab"), "", "",
                    Request_Name("columns/s")})
                  .first,
              0);
    EXPECT_EQ(On_One_Line(Get("a.tab")), "v|5|");
    EXPECT_EQ(request.Secondary_File, second);
}

}  // namespace
}  // namespace ingester

// Texts as people write them: how they are cut, what their fields mean, how their numbers are spelled.
#include "spreadsheet/dialect/text_dialect.h"

#include "model/spellings.h"
#include "spreadsheet/text/text.h"
#include "support/number_text.h"
#include "support/reader_fixture.h"

#include <cmath>

namespace ingester {
namespace {

class Dialect_Test : public Reader_Test {
protected:
    static Sheet* Read(std::string_view text, const char* name, const Change& change = {})
    {
        return Read_Bytes(Read_CSV, text, name, [&] {
            request.people.set();
            Use_Utf8_Text(true);
            if (change)
                change();
        });
    }
};

TEST_F(Dialect_Test, Tables_Are_Cut_As_They_Were_Meant)
{
    const struct {
        const char *told, *text, *sheet;
        Change change = {};
    } cases[] = {
        {"blanks", "a b c\n1  2 3\n4 \t5 6 \n", "a V1|4; b V2|5; c V3|6"},
        {"names that begin with digits", "2 rows,3 m\n1,x\n", "%2_rows V1; %3_m Tx"},
        {"years", ",2019,2020,2021\nFrance,1.5,2,3\nItaly,4,5,6\n", ""},
        {"years with a gap", "c,2020,2021,2023\nDE,1,2,3\nFR,4,5,6\n",
         "c TDE|FR; %2020 V1|4; %2021 V2|5; %2023 V3|6"},
        {"a name in quotes", "c,\"2020\"\nDE,1.5\nFR,2.5\n", "c TDE|FR; %2020 V1.5|2.5"},
        {"that alone", "\"2020\"\n1\n2\n", "%2020 V1|2"},
        {"quotes around some data", "\"1\",2\n3,4\n", "C1 V1|3; C2 V2|4"},
        {"dates over numbers", "s,2020-01-01,2020-02-01\na,1,2\nb,3,4\n",
         "s Ta|b; %2020_01_01 V1|3; %2020_02_01 V2|4"},
        {"a line that tells the separator", "sep=;\na;b\n1;2,5\n", "a V1; b V2.5"},
        {"the same in quotes", "\"sep=|\"\r\na|b\r\n1|2,5\r\n", "a V1; b V2.5"},
        {"a title with a comma", "Sales report, 2024\n\nid,qty\n1,2\n2,3\n4,5\n", "id V1|2|4; qty V2|3|5"},
        {"two lines of title", "Report: sales, 2024\nCreated: today\nid,qty\n1,2\n2,3\n",
         "id V1|2; qty V2|3"},
        {"a name and a gap are no title", "id, n\n\n1,2\n2,3\n", "id V1|2; n V2|3"},
        {"numbers only", "1,2\n3,4\n", "C1 V1|3; C2 V2|4"},
        {"words only, one twice", "m,yes\nf,no\nm,no\n", "C1 Tm|f|m; C2 Tyes|no|no"},
        {"names in a comment", "# made today\n# a,b\n1,2\n3,4\n", "a V1|3; b V2|4"},
        {"rows with names", "a,b\nx,1,2\ny,3,4\n", "C1 Tx|y; a V1|3; b V2|4"},
        {"a quote that stays open", "a,b\n\"x,1\n\"y,2\nz,3\n", "a T\"x|\"y|z; b V1|2|3"},
        {"a quote inside a text", "a,b\n\"x\"y\",1\n\"x\"y,\"2\"\n", "a Tx\"y|\"x\"y; b V1|2"},
        {"the first of two tables", "a,b\n1,2\n3,4\n\nx,y,z\n1,2,3\n4,5,6\n", "a V1|3; b V2|4"},
        {"the second", "a,b\n1,2\n3,4\n\nx,y,z\n1,2,3\n4,5,6\n", "x V1|4; y V2|5; z V3|6",
         [] { request.Told_Table = 2; }},
        {"empty lines between all rows", "a,b\n\n1,2\n\n3,4\n", "a V1|3; b V2|4"},
        {"pairs in front", "Author,Ada\nPlace,Kiel\n\na,b,c\n1,2,3\n4,5,6\n7,8,9\n",
         "a V1|4|7; b V2|5|8; c V3|6|9"},
        {"lines to skip", "1,2\n3,4\na,b\n5,6\n", "a V5; b V6", [] { request.Told_Skipped_Lines = 2; }},
        {"told all", "a;'b;c'\n1,5;'2'\n", "a V1.5; b_c T2",
         [] {
             request.Told_Separators = ";";
             request.Told_Quote = '\'';
             request.Told_Decimal = ',';
             request.Told_Names_Lines = 1;
         }},
        {"no quotes", "a,b\n\"x,y\"\n", "a T\"x; b Ty\"", [] { request.Told_Quote = '\0'; }},
    };
    for (const auto& tried : cases) {
        Sheet* const sheet = Read(tried.text, "x.txt", tried.change);
        if (*tried.sheet != '\0')
            EXPECT_EQ(Render(sheet), tried.sheet) << tried.told;
        else
            EXPECT_EQ(sheet->row_count, 2) << tried.told;
    }
    ASSERT_NE(Found_Dialect(), nullptr);
    EXPECT_EQ(Found_Dialect()->separator, ',');
    EXPECT_EQ(Read("a,b,c\n", "x.csv")->row_count, 0) << "names alone";
    EXPECT_EQ(Read("", "x.csv"), nullptr);
}

std::string Times(int times, std::string_view head, std::string_view line)
{
    std::string text(head);
    for (int i = 0; i < times; ++i)
        text += line;
    return text;
}

TEST_F(Dialect_Test, Blanks_Yield_To_Plainer_Signs)
{
    const char* const towns = "n V1|2; city TNew York|Los Angeles";
    for (const char* const name : {"x.csv", "x.tsv", "x.tab", "x.txt"}) {
        EXPECT_EQ(Render(Read("n\tcity\n1\tNew York\n2\tLos Angeles\n", name)), towns) << name;
        EXPECT_EQ(Render(Read("n,city\n1,New York\n2,Los Angeles\n", name)), towns) << name;
        for (const std::string& text :
             {Times(30, "id,desc\n", "0,5 mm long bolt\n"), Times(30, "address,n\n", "12 Old Main St,7\n"),
              Times(30, "address;n\n", "12 Old Main St;7\n")}) {
            const Sheet* const sheet = Read(text, name);
            EXPECT_TRUE(sheet->column_count == 2 && sheet->row_count == 30) << name << "\n" << text;
        }
    }
    EXPECT_EQ(Render(Read("\"Smith, John\" 5\n\"Doe, Jane\" 6\n", "x.txt")),
              "C1 TSmith, John|Doe, Jane; C2 V5|6");
}

TEST_F(Dialect_Test, Signs_In_A_Single_Column_Are_Letters)
{
    const struct {
        std::string_view text, sheet;
    } cases[] = {
        {"name\na;b\nx\nfoo\n", "name Ta;b|x|foo"},
        {"name\nx y\nfoo\na;b\nbar\n", "name Tx y|foo|a;b|bar"},
        {"comment\nHello, world\nfine\nok then\n", "comment THello, world|fine|ok then"},
        {"comment\nHello, world\nBye, now\nok then\n", "comment THello, world|Bye, now|ok then"},
        {"x\n1,5\n2,5\n3,75\n", "x V1.5|2.5|3.75"},
        {"size\n5 mm\n7 mm\n9 mm\n8 mm\n12 mm\n", "size T5 mm|7 mm|9 mm|8 mm|12 mm"},
        {"n\n\"a\nb, c\"\nNew York\n", "n Ta%b, c|New York"},
        {"Report\nby me\n2024\n\na,b\n1,2\n", "a V1; b V2"},
    };
    for (const auto& [text, sheet] : cases)
        for (const char* const name : {"x.csv", "x.txt"}) {
            std::string read = Render(Read(text, name));
            std::ranges::replace(read, '\n', '%');
            EXPECT_EQ(read, sheet) << name;
        }
    const Sheet* const bolts = Read(Times(30, "desc\n", "bolt no. 3, grey\n"), "x.csv");
    EXPECT_TRUE(bolts->column_count == 1 && bolts->row_count == 30);
}

TEST_F(Dialect_Test, Short_Lines_Keep_What_They_Have)
{
    const struct {
        const char *text, *sheet;
        std::size_t losses = 0;
        Change change = {};
    } cases[] = {
        {"name;note\nA;x\nSmith, John\nB;y\n", "name TA|Smith, John|B; note Tx||y"},
        {"name\tval\nNew York\t1\nLos Angeles\nX\t2\n", "name TNew York|Los Angeles|X; val V1|*|2"},
        {"a,b,c\nx,y,z\none two three\nk,l,m\n", "a Tx|one two three|k; b Ty||l; c Tz||m"},
        {"a,b,c\nx,y,z\nk;l;m\n", "a Tx|k; b Ty|l; c Tz|m", 1},
        {"a,b,c\nx,y,z\nk;l\n", "a Tx|k;l; b Ty|; c Tz|"},
        {"a,b,c\nx,y,z\nk;l;m\n", "a Tx|k;l;m; b Ty|; c Tz|", 0, [] { request.Told_Separators = ","; }},
    };
    for (const auto& tried : cases) {
        EXPECT_EQ(Render(Read(tried.text, "x.csv", tried.change)), tried.sheet);
        EXPECT_EQ(request.losses.Entries().size(), tried.losses) << tried.text;
    }
}

TEST_F(Dialect_Test, Fields_Mean_What_People_Mean)
{
    const std::string zeros(350, '0');
    const std::string many_zeros =
        "a\n0." + zeros + "1\n-0.0" + zeros + "1e9\n1" + zeros + ".5e-20\n1e-99999999999999999999\n";
    const struct {
        const char *told, *text, *sheet;
        Change change = {};
    } cases[] = {
        {"words for missing", "a,b\n1,x\nNA,NA\nN/A,\nNaN,-\nNULL,.\n-,z\n",
         "a V1|*|*|*|*|*; b Tx|NA||-|.|z"},
        {"told ones", "a,b\n-9,x\n1,none\n", "a V*|1; b Tx|",
         [] {
             request.Missing_Words = {"-9", "none"};
         }},
        {"digits that name", "a,b,c\n007,12345678901234567890,0.5\n8,1,-0\n",
         "a T007|8; b T12345678901234567890|1; c V0.5|-0"},
        {"beyond doubles", "a\n1e400\n1e-400\n-1e400\n", "a V9.99999e+307|0|*"},
        {"no star behind a number", "a,b\n5*,1\n", "a T5*; b V1"},
        {"many zeros", many_zeros.c_str(), "a V0|0|9.99999e+307|0"},
        {"groups", "a;b\n1.234.567,5;1\n2,5;2\n", "a V1234567.5|2.5; b V1|2"},
        {"groups that decimal commas tell", "a;b\n1,5;1.234\n2,5;2.345\n", "a V1.5|2.5; b V1234|2345"},
        {"points alone are decimal", "a;b\n1;1.234\n2;2.345\n", "a V1|2; b V1.234|2.345"},
        {"digits in quotes", "a,b\n\"1\",2\n\"3\",4\n", "a T1|3; b V2|4"},
        {"dates in quotes", "a,b,c\n1,\"2024-01-01\",\"\"\n2,\"\",\"10:00\"\n",
         "a V1|2; b T2024-01-01|; c T|10:00"},
        {"all in quotes", "\"a\",\"b\"\n\"1\",\"2\"\n", "a V1; b V2"},
        {"a date among none", "a\n2024-01-01\nsoon\n", "a T2024-01-01|soon"},
        {"no such day", "a\n2023-02-29\n", "a T2023-02-29"},
        {"times", "a,b\n12:00,x\n06:00:00,y\n", "a V0.5|0.25; b Tx|y"},
    };
    for (const auto& tried : cases)
        EXPECT_EQ(Render(Read(tried.text, "x.csv", tried.change)), tried.sheet) << tried.told;
}

TEST_F(Dialect_Test, Numbers_Keep_Their_Spelling)
{
    const char* const columns[] = {"5.00|6.50",
                                   "5.0|5.25|1e-05",
                                   "+5|.5|5.|1e3|1E+3",
                                   "5.00|5.5|3|-0",
                                   "0.1|0.10000000000000001|0.30000000000000004",
                                   "1e17|100000000000000000|12345678901234568"};
    for (const std::string_view column : columns) {
        std::string text = "a\n" + std::string(column) + "\n";
        std::ranges::replace(text, '|', '\n');
        const Sheet* const sheet = Read(text, "x.csv");
        ASSERT_NE(sheet, nullptr);
        const Column& read = *sheet->first_column->next;
        std::string printed;
        char room[Number_Text_Room];
        for (const Cell_Node* cell = read.first_cell; cell != nullptr; cell = cell->next)
            printed.append(printed.empty() ? "" : "|").append(room, Print_As_Spelled(room, read, *cell));
        EXPECT_EQ(printed, column);
        read.first_cell->value.number = 7.5;
        EXPECT_EQ(std::string_view(room, Print_As_Spelled(room, read, *read.first_cell)).substr(0, 3), "7.5");
    }
}

/// Quoted texts of many lines reach over the ends of the parts that are looked at, and begin in front of
/// them.
TEST_F(Dialect_Test, Quotes_Hold_However_Long_Their_Texts_Are)
{
    const auto table = [](int rows, int lines) {
        std::string text = "id,abstract,n\n";
        for (int row = 1; row <= rows; ++row) {
            text += std::to_string(row) + ",\"";
            for (int line = 0; line < lines; ++line)
                text += std::string(static_cast<std::size_t>(line * 7 % 40), 'l')
                            .append(static_cast<std::size_t>(line % 3), ' ')
                        + "and, so on\n";
            text += "end\"," + std::to_string(row * 2) + "\n";
        }
        return text;
    };
    for (const auto& [rows, lines] : {std::pair(100, 60), std::pair(40, 400), std::pair(3, 5000)}) {
        Sheet* const sheet = Read(table(rows, lines), "x.csv");
        ASSERT_NE(sheet, nullptr);
        EXPECT_EQ(sheet->row_count, rows);
        EXPECT_EQ(sheet->column_count, 3);
        EXPECT_EQ(Column_At(sheet, 3)->name, "n");
        EXPECT_EQ(Column_At(sheet, 3)->type, variate_column);
    }
    EXPECT_EQ(Read("a,b\n1,\"" + std::string(300000, 'x') + "\n\"\n2,y\n", "x.csv"), nullptr);
    EXPECT_EQ(Messages(), "Error: Line 2 has more than 262140 characters.\n:\n");
    EXPECT_EQ(Render(Read("a,b\n1,\"x\n2,y\n", "x.csv")), "a V1|2; b T\"x|y");
    EXPECT_EQ(Messages(), "Warning: 1 quotes that nothing closes were read as letters.\n:\n");
}

TEST_F(Dialect_Test, Comments_Are_Told_From_Rows)
{
    const Change named = [] { request.Told_Names_Lines = 1; };
    const struct {
        const char *told, *text, *sheet;
        std::int64_t passed_over;
        Change change = {};
    } cases[] = {
        {"one column", "tag\n#a\nb\n#c\n", "tag T#a|b|#c", 0},
        {"one column below a comment", "# by hand\ntag\n#a\nb\n", "tag T#a|b", 1},
        {"fewer fields", "id,v\nw,1\n# remark\nx,2\n", "id Tw|x; v V1|2", 1},
        {"all fields", "id,v\n#1,1\nx,2\n#3,3\n", "id T#1|x|#3; v V1|2|3", 0},
        {"a sign for a name", "%,name,score\n1,ann,2\n2,bob,3\n", "% V1|2; name Tann|bob; score V2|3", 0,
         named},
        {"a sign over no names", "#,,y\n1,2,3\n4,5,6\n", "% V1|4; C2 V2|5; y V3|6", 0, named},
        {"a sign alone", "%\n1\n2\n", "% V1|2", 0},
        {"a number behind it", "#1,2\n3,4\n", "C1 T#1|3; C2 V2|4", 0},
        {"names behind it", "#id,who\nx,ann\ny,bob\n", "id Tx|y; who Tann|bob", 0},
        {"between blanks", "x y\n# remark by me\n1 2\n# again\n3 4\n", "x V1|3; y V2|4", 2},
        {"a title behind it", "#made by x, today\nid,v\n1,2\n3,4\n", "id V1|3; v V2|4", 1},
    };
    for (const auto& tried : cases) {
        EXPECT_EQ(Render(Read(tried.text, "x.csv", tried.change)), tried.sheet) << tried.told;
        std::int64_t told = 0;
        for (const Loss& loss : request.losses.Entries())
            told += loss.kind == Loss_Kind::input_unread ? loss.count : 0;
        EXPECT_EQ(told, tried.passed_over) << tried.told;
    }
    std::string text = "# made by x\nid,v\n";
    for (int row = 1; row <= 30000; ++row)
        text += (row == 20000 ? "#" : "") + std::to_string(row) + ",5\n" + (row == 20001 ? "# remark\n" : "");
    for (const std::string_view large : {std::string_view(text), std::string_view(text).substr(12)}) {
        EXPECT_EQ(Read(large, "x.csv")->row_count, 30000);
        ASSERT_EQ(request.losses.Entries().size(), 1U);
        EXPECT_EQ(request.losses.Entries()[0].count, large.size() == text.size() ? 2 : 1);
    }
}

TEST_F(Dialect_Test, Thousandths_Of_A_Second_Are_Held)
{
    const std::tuple<const char*, double, std::size_t> cases[] = {
        {"00:00:10.5", 10.5, 0},      {"00:00:10.123000", 10.123, 0}, {"00:00:10.123456", 10.123, 1},
        {"00:00:59.9999", 59.999, 1}, {"00:01:00.000", 60, 0},
    };
    for (const auto& [time, seconds, lost] : cases)
        for (const std::string day : {"", "2024-03-02 "}) {
            Sheet* const sheet = Read("a\n" + day + time + "\n", "x.csv");
            const double value = Column_At(sheet, 1)->first_cell->value.number;
            EXPECT_NEAR((value - std::floor(value)) * 86400, seconds, 1e-5) << time;
            ASSERT_EQ(request.losses.Entries().size(), lost) << time;
            for (const Loss& loss : request.losses.Entries())
                EXPECT_EQ(loss.kind, Loss_Kind::date_part_dropped);
        }
    static_cast<void>(Read("a\n10:00:00.123456\nsoon\n", "x.csv"));
    EXPECT_TRUE(request.losses.Entries().empty()) << "as a text it is kept whole";
}

TEST_F(Dialect_Test, Lines_That_Tell_No_Separator_Are_Text)
{
    for (const std::string_view text : {"sep=", "\"sep=", "\"sep=;", "sep=\n", "\"sep=\"", "sep=;;\na"})
        EXPECT_EQ(Separator_Line(text), 0) << text;
}

}  // namespace
}  // namespace ingester

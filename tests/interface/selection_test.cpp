// Columns and rows by list: the lists that a host sends, and the one that stands beside an input.
#include "interface/selection.h"

#include "host_fixture.h"
#include "interface/format_drivers.h"
#include "interface/var_file.h"
#include "model/cell_text.h"
#include "support/check_sheet.h"

#include <random>

namespace ingester {
namespace {

const std::string Four = "a,b,b,d!\n1,x,2.5,p\n2,y,*,q\n3,z,4,p\n";

class Selection_Test : public Host_Test {
protected:
    void SetUp() override
    {
        Host_Test::SetUp();
        Put("f.csv", Four);
    }

    /// The answer to a request that keeps columns and rows, and what came out, lines ended by "|".
    [[nodiscard]] std::string Keep(const std::string& columns, const std::string& rows,
                                   const std::string& input = "f.csv") const
    {
        Texts records = {Request_Name(input), Request_Name("o.tab") + "/e", "", ""};
        if (!columns.empty()) {
            Put("columns", columns);
            records.push_back(Request_Name("columns") + (rows.empty() ? "/s" : "/s/r"));
        }
        if (!rows.empty()) {
            Put("rows", rows);
            records.push_back(Request_Name("rows") + (columns.empty() ? "/r" : ""));
        }
        const auto [status, said] = Call(records);
        EXPECT_FALSE(std::filesystem::exists(Path("columns")) || std::filesystem::exists(Path("rows")))
            << "the lists are the request's to delete";
        return Told(status, said);
    }

    [[nodiscard]] std::string Told(int status, const std::string& said) const
    {
        const std::string text =
            On_One_Line((status == 0 ? Get("o.tab") : std::to_string(status) + " ") + said);
        std::filesystem::remove(Path("o.tab"));
        return text.ends_with(":|") ? text.substr(0, text.size() - 2) : text;
    }

    /// What a list beside the input makes of it.
    [[nodiscard]] std::string Change(const std::string& list) const
    {
        Put("f.VAR", list);
        const auto [status, said] = Convert("f.csv/v", "o.tab/d");
        return Told(status, said);
    }
};

TEST_F(Selection_Test, Keeps_Columns_And_Rows_Of_Lists)
{
    const std::string none = "No columns selected from input file (i.e. no matches to specified names).|";
    const std::string no_rows = "No rows selected from input file (i.e. no matches to specified rows).|";
    const std::tuple<std::string, std::string, std::string> cases[] = {
        {"2\nV\nd\na\n", "", "a\td!|1\tp|2\tq|3\tp|"},
        {"9\nv\n b_1 \n", "", "b_1|2.5|*|4|"},  // as told apart, and the count is more than the lines
        {"2\nV\nb\nnone\n", "", "b|x|y|z|Warning: column none was not found in the input.|"},
        {"1\nV\na\nb\n", "", "a|1|2|3|"},  // the count is less
        {"3\nN\n4\n1\n9\n", "", "a\td!|1\tp|2\tq|3\tp|"},
        {"2147483647\nV\n\n \na\n\n", "", "a|1|2|3|"},  // blank lines stand for no column
        {"1\nN\n4294967297\n", "", "13 " + none},
        {std::string("1\nV\n\1\xFF\0\n", 9), "", "13 " + none},
        {"99999999999999999999\r\nV\r\nd", "", "d!|p|q|p|"},
        {std::string(100, ' ') + "2\nV\na\nb\n", "", "13 " + none},  // the count's line is cut at 100
        {"", "3\n1\n0\n1\n", "a\tb\tb_1\td!|1\tx\t2.5\tp|3\tz\t4\tp|"},
        {"", "9\n0\n-1\n", "a\tb\td!|2\ty\tq|"},  // rows behind the list are dropped
        {"", "3\n0\n0\n0\n", "13 " + no_rows},
        {"1\nV\nb\n", "3\n0\n1\n1\n", "b|y|z|"},
    };
    for (const auto& [columns, rows, told] : cases)
        EXPECT_EQ(Keep(columns, rows), told) << columns << " " << rows;
}

TEST_F(Selection_Test, Reading_A_Part_Is_Reading_All_And_Leaving_Out)
{
    std::mt19937 random(5);
    const auto any = [&random](unsigned below) { return static_cast<unsigned>(random()) % below; };
    for (int round = 0; round < 300; ++round) {
        const unsigned columns = 1 + any(6);
        std::string text;
        for (unsigned i = 0; i < columns; ++i)
            text.append(i > 0 ? "," : "")
                .append(1, "abc"[any(3)])
                .append(Texts{"", "", "", "!", ":D"}[any(5)]);
        for (unsigned row = 0; row < 1 + any(6); ++row)
            for (unsigned i = 0; i < 1 + any(columns + 2); ++i)
                text.append(i > 0 ? "," : "\n").append(any(5) == 0 ? "t" : std::to_string(any(30)));
        Put("f.csv", text + "\n");
        Texts chosen;
        std::string list = "9\nN\n";
        for (unsigned i = 1; i <= columns + 2; ++i)
            if (any(2) == 0)
                list += chosen.emplace_back(std::to_string(i)) + "\n";
        const std::string part = Keep(list, "", "f.csv/k");
        // The way of formats whose readers leave nothing out.
        Start_Request("t");
        if (!Read_Data_File(Request_Name("f.csv"), 25, "f.csv") || Current_Sheet == nullptr)
            continue;  // a line of numbers for names
        request.Subset_Columns = request.Subset_By_Number = true;
        request.Subset_Names = chosen;
        request.Columns_Were_Selected = false;
        std::string whole = "13 ";
        if (Apply_Subset(Current_Sheet, request.Content_Code) == Subset_Result::kept) {
            EXPECT_EQ(Check_Sheet(*Current_Sheet), "");
            ASSERT_TRUE(Output_Driver_Of("o.tab").write(Current_Sheet, Request_Name("o.tab").c_str()));
            whole = Told(0, "");
        }
        EXPECT_TRUE(part.starts_with(whole)) << text << list << part;
    }
}

TEST_F(Selection_Test, A_List_Is_Read_As_Far_As_Tables_Have_Columns)
{
    for (const std::string start : {"2147483647\n", "@names\n"}) {
        std::string list = start;
        for (int line = 0; line < 60000; ++line)
            list += "no" + std::to_string(line) + "=b!\n";
        const std::string told = Change(list);
        EXPECT_EQ(told.find("column no9 ") != std::string::npos, start == "@names\n");
        EXPECT_EQ(told.find("column no10 "), std::string::npos) << "the first ten tell enough";
        EXPECT_TRUE(Read_Var_File(Request_Name("f.VAR")));
        EXPECT_GE(std::ssize(request.Column_Wanted_Types), Default_Max_Columns);
        EXPECT_LE(std::ssize(request.Column_Wanted_Types), Default_Max_Columns + 1);
    }
}

TEST_F(Selection_Test, A_List_Beside_The_Input_Changes_Its_Columns)
{
    const std::string many = "Too many column names provided.|";
    const std::pair<std::string, std::string> cases[] = {
        {"4\nn 1\n\n*\nlast\n", "n_1\tb\tlast!|1\tx\tp|2\ty\tq|3\tz\tp|"},
        {"names\n*\n*\n*\n", "names|1|2|3|"},
        {"2\na!\nb!\nc\n", "a!\tb!\tb_1\td!|1\tx\t2.5\tp|2\ty\t*\tq|3\tz\t4\tp|"},
        {"4\n*\n*\nw:E\n*\n", "w|2.500000e+00|4.000000e+00|"},
        {"9\n*\n*\nv:2\n*\n", "v|2.50|4.00|" + many},
        {"@names\nb_1=*\n a = b \nb=a$\nx=y\nd\n", "b\ta\td!|1\tx\tp|2\ty\tq|3\tz\tp|Warning: column x was "
                                                   "not found, or holds no data, and was not changed.|"},
        {"@names\na=$\nd=*\nb=*\nb_1=*\n", "a|1|2|3|"},
        {"*\n*\n*\n*\n", "4 All columns in the input file are empty.|"},
        {std::string("\0\1\n\xFF\n", 5), "a\t%\tb_1\td!|1\tx\t2.5\tp|2\ty\t*\tq|3\tz\t4\tp|"},
    };
    for (const auto& [list, told] : cases)
        EXPECT_EQ(Change(list), told) << list;
}

// Columns without data go, columns are selected, and names are cleaned and told apart: a line of a list is
// for the same column in the reader and behind it, and what it wants as text is there to the letter.
TEST_F(Selection_Test, Lines_Of_Lists_Stay_With_Their_Columns)
{
    const std::string gap = "a,b,c,d\n01,,02,03\n01,*,02,04\n";
    const std::string many = "Too many column names provided.|"
                             "If subsetting columns, just provide names for remaining columns.|"
                             "Attempting to rename correct columns.|";
    std::string long_gap = "a,b,c\n";
    for (int i = 0; i < 300; ++i)
        long_gap += i < 299 ? "1,,01\n" : "1,2,01\n";
    const auto keep = [](const char* names) { return std::string("9\nN\n").append(names); };
    const struct {
        std::string text, columns, list, starts;
    } cases[] = {
        {gap, "", "3\nx\ny\nz$\n", "x\ty\tz|1\t2\t03|1\t2\t04|"},
        {gap, keep("1\n2\n3\n"), "4\np\nq\nr$\ns\n", "p\tr|1\t02|1\t02|" + many},
        {gap, keep("4\n1\n"), "2\nx$\ny\n", "x\ty|01\t3|01\t4|"},
        {gap, "9\nV\nd\na\n", "2\nx\ny$\n", "x\ty|1\t03|1\t04|"},
        {gap, "9\nV\nd\na\n", "3\nx\ny\nz\n", "a\td|1\t3|1\t4|" + many + "Could not locate"},
        {long_gap, "", "3\nx$\ny$\nz\n", "x\ty\tz|1\t\t1|"},
        {"a,b,b\n1,02,08\n3,4,09\n", "", "@names\nb_1=$\n", "a\tb\tb_1|1\t2\t08|3\t4\t09|"},
        {"p,t\n\"1,234\",5 kg\nabc,6\n", "", "@names\np=#\nt=w#\n", "p\tw|1.234\t5|*\t6|"},
        {"Temp [C],n [m],d:D\n1,2,3\n", "9\nV\nTemp [C]\nd:D\n", "@names\nTemp [C]=T\nd:D=when:2\n",
         "T\twhen|1\t3|"},
        {"Temp [C],n [m]\n1,2\n", "9\nV\nn [m]\n", "", "n_[2]|2|"},
    };
    for (const auto& [text, columns, list, starts] : cases) {
        Put("f.csv", text);
        std::filesystem::remove(Path("f.VAR"));
        if (!list.empty())
            Put("f.VAR", list);
        const std::string told = Keep(columns, "", list.empty() ? "f.csv" : "f.csv/v");
        EXPECT_EQ(told.substr(0, starts.size()), starts) << text.substr(0, 60) << columns << list;
    }
}

}  // namespace
}  // namespace ingester

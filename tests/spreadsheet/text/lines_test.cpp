#include "spreadsheet/text/text.h"
#include "support/cell_lists.h"
#include "support/check_sheet.h"

#include <span>

namespace ingester {
namespace {

using Text_Lines = Request_Test;

TEST_F(Text_Lines, One_Line_Becomes_A_Column)
{
    const std::string long_line(262141, 'x');
    const std::tuple<std::int32_t, std::string_view, std::string, std::string, std::string> cases[] = {
        {1, "", "a\tb\n x \t2\t\t*\r\nc\n", "C1 Tx|2||", ""},
        {2, ",;", "\r\rx,y;z," + std::string(95, 'y'), "C1 Tx|y;z|90 characters", ""},
        {1, "", long_line + "\n\n", "C1 T", ""},
        {1, "", "a\n" + long_line, "", "Error: Line 2 has more than 262140 characters.\n:\n"},
        {1, "", "a\n", "", "Could not read data file x.txt.\n:\n"},
    };
    for (const auto& [skipped, separators, text, sheet, message] : cases) {
        Start_Request("t");
        request.Fixed_Lines = skipped;
        request.Custom_Separators = separators;
        Input_File file(std::as_bytes(std::span(text)), "x.txt");
        const bool read = Read_Text_Lines(file);
        EXPECT_EQ(read ? Render(Current_Sheet) + Check_Sheet(*Current_Sheet) : "", sheet);
        EXPECT_EQ(Messages(), message);
    }
    const std::string none = Request_Name("none");
    EXPECT_FALSE(Read_Text_Lines(none.c_str()));
    EXPECT_EQ(Messages(), "Data file " + none + " not found.\nCould not read data file " + none + ".\n:\n");
}

TEST_F(Text_Lines, Lines_Are_Joined_To_Records)
{
    const std::string wide(70000, '1');
    const std::tuple<std::int32_t, std::string, std::string> cases[] = {
        {4, "1,2,\n3,4\r\n5,6,\n7,8", "1,2,3,4\n5,6,7,8\n"},
        {3, "1\n2\n3\n4\n5\n", "1,2,3\n4,5\n"},
        {6, "1,2,3\n\n4,5,6\n", "1,2,3,4,5,6\n"},
        {2, "1,2,3,4\n5\n6\n", "1,2,3,4\n5,6\n"},
        {2, wide + "\n" + wide + "\n", wide + "," + wide + "\n"},
        {3, "", ""},
    };
    const std::string input = Request_Name("in.csv");
    const std::string output = Request_Name("out.csv");
    const std::string none = Request_Name("none\\x.csv");
    for (const auto& [fields, from, to] : cases) {
        Put("in.csv", from);
        EXPECT_TRUE(Reflow_Lines_By_Fields(input.c_str(), output.c_str(), fields));
        EXPECT_EQ(Get("out.csv"), to) << from.substr(0, 80);
    }
    Put("in.csv", "1,2\n");
    EXPECT_FALSE(Reflow_Lines_By_Fields(none.c_str(), output.c_str(), 2));
    for (const std::string& refused : {none, input, std::string("/dev/full")})
        EXPECT_FALSE(Reflow_Lines_By_Fields(input.c_str(), refused.c_str(), 2));
    EXPECT_EQ(Get("in.csv"), "1,2\n");
    EXPECT_EQ(Messages(), "CSV data file " + none + " not found.\nCSV data file " + none
                              + " could not be opened.\nInput and output files are the same.\n:\n");
}

}  // namespace
}  // namespace ingester

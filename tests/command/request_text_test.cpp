#include "command/request_text.h"

#include <gtest/gtest.h>

namespace ingester {
namespace {

TEST(Request_Text, Tells_Options_That_Add_From_Those_That_Look_Like_Them)
{
    for (const char* const adding :
         {"/a", "/h/a=Yields", "/r='New'", "/@,plot", "/&U", "/^file", "/%=2UN", "/av/a", "/mv=/a"})
        EXPECT_TRUE(Options_Add_To_Output(adding)) << adding;
    for (const char* const other : {"", "/av", "/rewrite=3", "/mv='/a'", "/mv='/a", "/x=\"by/row\"", "/jr/n"})
        EXPECT_FALSE(Options_Add_To_Output(other)) << other;
}

TEST(Request_Text, Names_That_A_Request_Would_Read_Otherwise_Are_Refused)
{
    for (const char* const good : {"my data/crops 1.csv", "50%_off_20%.csv", "./%HOME%/crops.csv",
                                   "https://example.org/%20/%DATA%.csv"})
        EXPECT_EQ(Fault_Of_Name(good), "") << good;
    EXPECT_NE(Fault_Of_Name("a\\b.csv").find("backslash"), std::string::npos);
    EXPECT_NE(Fault_Of_Name("x/%temp%/crops.csv").find("per cent"), std::string::npos);
    EXPECT_NE(Fault_Of_Name("%HOME%/crops.csv").find("per cent"), std::string::npos);
}

TEST(Request_Text, Messages_Name_Files_As_The_User_Does_And_Keep_All_Else)
{
    const std::string f(120, 'f');
    const Sent_Name in{"in/crops.csv", "in\\crops.csv"};
    const Sent_Name out{"out/new/x.tab", "out\\new\\x.tab"};
    const Sent_Name deep{"d/" + f + "/x.csv", "d\\" + f + "\\x.csv"};
    const Sent_Name stream{"standard output", "\\tmp\\private\\x.csv"};  // a stand-in is known as a whole
    const std::tuple<Sent_Name, Sent_Name, std::string, std::string> cases[] = {
        {in, out, "CSV data file in\\crops.csv not found.\n", "CSV data file in/crops.csv not found.\n"},
        {in, out, "directory out\\new\\ does not exist.\n", "directory out/new/ does not exist.\n"},
        {in, out, "directory out\\new does not exist.\n", "directory out/new does not exist.\n"},
        {in, out, "no in\\crops.VAR or 'out\\new\\x.$$$'\n", "no in/crops.VAR or 'out/new/x.$$$'\n"},
        {in, out, "in\\crops2 plain\\crops.csv, in\\other", "in\\crops2 plain\\crops.csv, in\\other"},
        {in, out, "in\\crops.csv", "in/crops.csv"},
        {deep, stream, "d\\" + f.substr(0, 98) + " was cut.\n", "d/" + f.substr(0, 98) + " was cut.\n"},
        {deep, stream, "\\tmp\\private\\x.csv: full\n", "standard output: full\n"},
        {deep, stream, "\\tmp\\private\\ stays\n", "\\tmp\\private\\ stays\n"},
    };
    for (const auto& [input, output, message, told] : cases)
        EXPECT_EQ(With_Native_Names(message, input, output), told);
}

}  // namespace
}  // namespace ingester

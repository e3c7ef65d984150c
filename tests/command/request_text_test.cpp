#include "command/request_text.h"

#include <gtest/gtest.h>

namespace ingester {
namespace {

TEST(Request_Text, Tells_Options_That_Add_From_Those_That_Look_Like_Them)
{
    const struct {
        const char* options;
        bool adds;
    } cases[] = {
        {"", false},       {"/a", true},       {"/h/a=Yields", true},    {"/r='New'", true},
        {"/@,plot", true}, {"/&U", true},      {"/^file", true},         {"/%=2UN", true},
        {"/av", false},    {"/av/a", true},    {"/rewrite=3", false},    {"/mv='/a'", false},
        {"/mv=/a", true},  {"/mv='/a", false}, {"/x=\"by/row\"", false}, {"/jr/n", false},
    };
    for (const auto& one : cases)
        EXPECT_EQ(Options_Add_To_Output(one.options), one.adds) << one.options;
}

TEST(Request_Text, Names_That_A_Request_Would_Read_Otherwise_Are_Refused)
{
    const struct {
        const char* name;
        const char* fault;
    } cases[] = {
        {"my data/crops 1.csv", ""},
        {"50%_off_20%.csv", ""},
        {"https://example.org/%20/%DATA%.csv", ""},
        {"a\\b.csv", "backslash"},
        {"x/%temp%/crops.csv", "%TEMP%"},
        {"%HOME%/crops.csv", "environment"},
        {"./%HOME%/crops.csv", ""},
    };
    for (const auto& one : cases) {
        const std::string fault = Fault_Of_Name(one.name);
        EXPECT_EQ(fault.empty(), *one.fault == '\0') << one.name << ": " << fault;
        EXPECT_NE(fault.find(one.fault), std::string::npos) << one.name << ": " << fault;
    }
}

TEST(Request_Text, Messages_Name_Files_As_The_User_Does_And_Keep_All_Else)
{
    const Sent_Name input{"in/crops.csv", "in\\crops.csv"};
    const Sent_Name output{"out/new/x.tab", "out\\new\\x.tab"};
    const struct {
        const char* message;
        const char* told;
    } cases[] = {
        {"CSV data file in\\crops.csv not found.\n", "CSV data file in/crops.csv not found.\n"},
        {"Output directory out\\new\\ does not exist.\n", "Output directory out/new/ does not exist.\n"},
        {"Output directory out\\new does not exist.\n", "Output directory out/new does not exist.\n"},
        {"Could not read in\\crops.VAR or 'out\\new\\x.$$$'\n",
         "Could not read in/crops.VAR or 'out/new/x.$$$'\n"},
        {"Text in\\crops2 of plain\\crops.csv, in\\other\n",
         "Text in\\crops2 of plain\\crops.csv, in\\other\n"},
        {"in\\crops.csv", "in/crops.csv"},
    };
    for (const auto& one : cases)
        EXPECT_EQ(With_Native_Names(one.message, input, output), one.told);
}

TEST(Request_Text, A_Name_That_A_Message_Cut_Is_Known_And_A_Stand_In_Is_Replaced_As_A_Whole)
{
    const std::string folder(120, 'f');
    const Sent_Name input{folder + "/crops.csv", folder + "\\crops.csv"};
    const Sent_Name deep{"d/" + folder + "/x.csv", "d\\" + folder + "\\x.csv"};
    const Sent_Name stream{"standard output", "\\tmp\\private\\x.csv"};
    EXPECT_EQ(With_Native_Names("file d\\" + folder.substr(0, 98) + " not found.\n", deep, stream),
              "file d/" + folder.substr(0, 98) + " not found.\n");
    EXPECT_EQ(With_Native_Names("\\tmp\\private\\x.csv: full\n", input, stream), "standard output: full\n");
    EXPECT_EQ(With_Native_Names("\\tmp\\private\\ stays\n", input, stream), "\\tmp\\private\\ stays\n");
}

}  // namespace
}  // namespace ingester

// The option language: what each option takes out of a string, and what it sets.
#include "interface/slash_options.h"

#include "support/request_fixture.h"

#include <random>

namespace ingester {
namespace {

using R = Request_Globals;

/// A string, what the options leave of it, and what is false for a fresh request and true behind them.
using Case = std::tuple<std::string, std::string, bool (*)(const R&)>;

constexpr std::array codes = {-1.5, Star_Code, 3.0};
const std::string long_name(300, 'w');

class Slash_Options_Test : public Request_Test {
protected:
    static void Check(std::span<const Slash_Option> options, std::span<const Case> cases)
    {
        for (const auto& [given, rest, is_set] : cases) {
            Start_Request("t");
            EXPECT_FALSE(is_set(request)) << given << ": set before";
            std::string text = given;
            Cut_Options(options, text);
            EXPECT_TRUE(is_set(request)) << given;
            EXPECT_EQ(text, rest) << given;
        }
    }
};

// Plain flags stand here where no other test converts a table with them.
TEST_F(Slash_Options_Test, Input)
{
    const Case genotype[] = {
        {"a.loc/rqtl", "a.loc", [](const R& r) { return r.Qtl_Request && !r.Add_Unused_Labels; }},
        {"a.loc/n/map", "a.loc/n", [](const R& r) { return r.Qtl_Map_File == "a.map" && !r.No_Names; }},
        {"a.loc/map='b/c.map'", "a.loc", [](const R& r) { return r.Qtl_Map_File == "b/c.map"; }},
    };
    Check(Genotype_Options(), genotype);
    const Case cases[] = {
        {"a/x=NA/n", "a", [](const R& r) { return r.Missing_Input_Text == "NA" && r.No_Names; }},
        {"a/x=\"/b", "a", [](const R& r) { return r.Missing_Input_Text == "/b" && r.settings.trim_cells; }},
        {"a/g=19", "a", [](const R& r) { return r.Return_Delete_Marker == "T19D"; }},
        {"a/lt=12b", "ab", [](const R& r) { return r.Fixed_Lines == 12 && !r.Log_Book; }},
        {"a/lt=12345678901", "a1", [](const R& r) { return r.Fixed_Lines == 1234567890; }},
        {"a/b", "a", [](const R& r) { return !r.settings.trim_cells; }},
        {"a/csv=2/n", "a", [](const R& r) { return r.Lines_Per_Record == 2 && r.First_Column == 0; }},
        {"a/c3", "a", [](const R& r) { return r.First_Column == 3 && r.Last_Column == 2147483647; }},
        {"a/c99999999999:", "a", [](const R& r) { return r.First_Column == 2147483647; }},
        {"a/m=-1.5,*,3,4", "a", [](const R& r) { return r.Instat_Missing_Codes == codes; }},
        {"a/d=$3", "a", [](const R& r) { return r.Title_Row_Absolute && r.Title_Row == 3; }},
        {"a/d2013.csv", "a2013.csv", [](const R& r) { return r.Use_Title_Row && r.Title_Row == 0; }},
        {"a/h=12345678 9/n", "a", [](const R& r) { return r.settings.header_prefix == "12345678"; }},
        {"a/h/n", "a", [](const R& r) { return r.No_Names && r.settings.header_prefix == "%"; }},
        {"a/o=V", "a", [](const R& r) { return r.settings.column_prefix == "V" && r.settings.prefix_given; }},
        {"a/o/k", "a", [](const R& r) { return r.Keep_Empty_Columns && !r.settings.prefix_given; }},
        {"a/#", "a", [](const R& r) { return !r.settings.bracket_names; }},
        {"a/y=4", "a", [](const R& r) { return r.Names_Given && r.Names_Row == 4; }},
        {"a/tr=N", "a", [](const R& r) { return r.Transpose && !r.Transpose_Names; }},
        {"a/t=94", "a4", [](const R& r) { return r.Text_Number_Mode == 4 && !r.Transpose; }},
        {"a/u", "a", [](const R& r) { return !r.settings.auto_factors; }},
        {"a/s=`x 'y` /e\"z", "a", [](const R& r) { return r.Start_Text == "x 'y" && r.End_Text == "z"; }},
        {"a/p= x y", "a", [](const R& r) { return r.Pointer_Name == "x y"; }},
        {"a/n/n", "a/n", [](const R& r) { return r.No_Names; }},
    };
    Check(Input_Options(), cases);
    EXPECT_EQ(Messages(), "");
    std::string faulty = "a/csv=0/n";
    Cut_Options(Input_Options(), faulty);
    EXPECT_EQ(request.Lines_Per_Record, 1);
    EXPECT_EQ(Messages(), "CSV number of lines per record (0) is invalid.\n:\n");
}

TEST_F(Slash_Options_Test, Output)
{
    using enum Add_Modes;
    const Case cases[] = {
        {"a/mv='/m'", "a", [](const R& r) { return r.Missing_Text == "/m" && !r.Output_Matrix; }},
        {"a/mv=\"x\"/n", "a", [](const R& r) { return r.Missing_Text == "\"x\""; }},
        {"a/av", "a", [](const R& r) { return !r.Write_Via_Temp && !r.Add_To_Output; }},
        {"a/*", "a", [](const R& r) { return r.No_Return; }},
        {"a/a=S1/x=S2", "a", [](const R& r) { return r.Add_To_Output && r.Output_Sheet_Name == "S1"; }},
        {"a/a/x=S2", "a", [](const R& r) { return r.Add_To_Output && r.Output_Sheet_Name == "S2"; }},
        {"b/a'" + long_name + "'", "b",
         [](const R& r) { return r.Output_Sheet_Name == long_name.substr(0, 280); }},
        {"a/x=S b", "a b", [](const R& r) { return !r.Add_To_Output && r.Output_Sheet_Name == "S"; }},
        {"a/b", "a", [](const R& r) { return r.End_With_Break; }},
        {"a/h", "a", [](const R& r) { return r.Packed_Csv_Output && r.Allow_HTML; }},
        {"a/m=M 1/n", "a", [](const R& r) { return r.Output_Matrix && r.Output_Matrix_Name == "M 1"; }},
        {"a/o", "a", [](const R& r) { return r.Replace_Book_Data; }},
        {"a/q", "a", [](const R& r) { return r.Quiet_Read; }},
        {"a/t", "a", [](const R& r) { return r.R_Text_Output; }},
        {"a/v=-9", "a", [](const R& r) { return r.Script_Version == 1; }},
        {"a/!='S 1'", "a", [](const R& r) { return r.Merge_Sheet_Name == "S 1"; }},
        {"a/@=N,'k,1' b", "a b", [](const R& r) { return !r.Keep_Sorted && r.Merge_Key == "k,1"; }},
        {"a/@,k,w b", "a b", [](const R& r) { return r.Merge_Key == "k" && r.Merge_With == "w"; }},
        {"a/%=3N", "a", [](const R& r) { return r.Merge_Key_Count == 3 && r.Merge_Fill == 0; }},
        {"a/%=UN", "a", [](const R& r) { return r.Add_Mode == merge && r.Unique_Rows && r.Merge_Fill == 1; }},
    };
    Check(Output_Options(), cases);
    EXPECT_EQ(Messages(), "");
}

/// Strings of option keys in any number and order, with unclosed quotes and values of every length: what is
/// left is no longer than what was given, and no value exceeds its width.
TEST_F(Slash_Options_Test, Hostile_Strings_End_In_A_Defined_Request)
{
    constexpr std::string_view filling[] = {"=", "'", "\"", "`", "/", " ",        ",",
                                            "9", "N", "U",  ":", "$", "wwwwwwwww"};
    std::minstd_rand random;
    for (int round = 0; round < 3000; ++round) {
        Start_Request("t");
        for (const auto options : {Genotype_Options(), Input_Options(), Output_Options()}) {
            std::string text;
            while (text.size() < 1120 && random() % 100 != 0)
                text.append(random() % 2 == 0 ? options[random() % options.size()].key
                                              : filling[random() % std::size(filling)]);
            const std::size_t given = text.size();
            Cut_Options(options, text);
            ASSERT_LE(text.size(), given);
        }
        ASSERT_GE(request.Lines_Per_Record, 1);
        ASSERT_LE(request.Text_Number_Mode, 4);
        ASSERT_LE(request.Merge_Key_Count, 9);
        ASSERT_LE(request.Instat_Missing_Code_Count, 3);
    }
    std::string slashes(1120, '/');
    Cut_Options(Input_Options(), slashes);
    EXPECT_EQ(slashes.size(), 1120U);
}

}  // namespace
}  // namespace ingester

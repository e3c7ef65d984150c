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
const std::string long_text(300, 'w');

bool Is_Wide(std::string_view text, std::size_t width)
{
    return text == std::string(width, 'w');
}

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

TEST_F(Slash_Options_Test, Genotype)
{
    const Case cases[] = {
        {"a.loc/rqtl", "a.loc", [](const R& r) { return r.Qtl_Request && !r.Reverse_Labels; }},
        {"a.loc/n/map", "a.loc/n", [](const R& r) { return r.Qtl_Map_File == "a.map" && !r.No_Names; }},
        {"a.loc/map='b/c.map'", "a.loc", [](const R& r) { return r.Qtl_Map_File == "b/c.map"; }},
    };
    Check(Genotype_Options(), cases);
}

TEST_F(Slash_Options_Test, Input)
{
    const Case cases[] = {
        {"a/x=NA/n", "a", [](const R& r) { return r.Missing_Input_Text == "NA" && r.No_Names; }},
        {"a/x=\"/b", "a", [](const R& r) { return r.Missing_Input_Text == "/b" && r.settings.trim_cells; }},
        {"a/x=" + long_text, "a", [](const R& r) { return Is_Wide(r.Missing_Input_Text, 80); }},
        {"a/g=19", "a", [](const R& r) { return r.Return_Delete_Marker == "T19D"; }},
        {"a/lt=12b", "ab", [](const R& r) { return r.Fixed_Lines == 12 && !r.Log_Book; }},
        {"a/lt=12345678901", "a1", [](const R& r) { return r.Fixed_Lines == 1234567890; }},
        {"a/a", "a", [](const R& r) { return !r.Keep_Probe_Statistics; }},
        {"a/b", "a", [](const R& r) { return !r.settings.trim_cells; }},
        {"a/csv=2/n", "a", [](const R& r) { return r.Lines_Per_Record == 2 && r.First_Column == 0; }},
        {"a/c=2:4", "a", [](const R& r) { return r.First_Column == 2 && r.Last_Column == 4; }},
        {"a/c:4", "a", [](const R& r) { return r.First_Column == 0 && r.Last_Column == 4; }},
        {"a/c3", "a", [](const R& r) { return r.First_Column == 3 && r.Last_Column == 2147483647; }},
        {"a/c99999999999:", "a", [](const R& r) { return r.First_Column == 2147483647; }},
        {"a/db", "a", [](const R& r) { return r.Print_Summary && !r.Use_Title_Row; }},
        {"a/m=-1.5,*,3,4", "a", [](const R& r) { return r.Instat_Missing_Codes == codes; }},
        {"a/d", "a", [](const R& r) { return r.Use_Title_Row && r.Title_Row == 0; }},
        {"a/d=$3", "a", [](const R& r) { return r.Title_Row_Absolute && r.Title_Row == 3; }},
        {"a/d2013.csv", "a2013.csv", [](const R& r) { return r.Use_Title_Row && r.Title_Row == 0; }},
        {"a/f", "a", [](const R& r) { return r.Keep_Long_Labels; }},
        {"a/h=12345678 9/n", "a", [](const R& r) { return r.settings.header_prefix == "12345678"; }},
        {"a/h/n", "a", [](const R& r) { return r.No_Names && r.settings.header_prefix == "%"; }},
        {"a/o=V", "a", [](const R& r) { return r.settings.column_prefix == "V" && r.settings.prefix_given; }},
        {"a/o/k", "a", [](const R& r) { return r.Keep_Empty_Columns && !r.settings.prefix_given; }},
        {"a/l=7", "a", [](const R& r) { return r.Log_Book && r.Log_Book_Range == 7; }},
        {"a/#", "a", [](const R& r) { return !r.settings.bracket_names; }},
        {"a/y=4", "a", [](const R& r) { return r.Names_Given && r.Names_Row == 4; }},
        {"a/tr", "a", [](const R& r) { return r.Transpose && r.Transpose_Names; }},
        {"a/tr=N", "a", [](const R& r) { return r.Transpose && !r.Transpose_Names; }},
        {"a/t=94", "a4", [](const R& r) { return r.Text_Number_Mode == 4 && !r.Transpose; }},
        {"a/i", "a", [](const R& r) { return r.settings.ignore_value_case != 0; }},
        {"a/r", "a", [](const R& r) { return r.Reverse_Labels; }},
        {"a/u", "a", [](const R& r) { return !r.settings.auto_factors; }},
        {"a/v", "a", [](const R& r) { return r.Use_Var_File; }},
        {"a/w", "a", [](const R& r) { return r.List_Sheets_Only; }},
        {"a/s=`x 'y` /e\"z", "a", [](const R& r) { return r.Start_Text == "x 'y" && r.End_Text == "z"; }},
        {"a/z=';|'", "a", [](const R& r) { return r.Custom_Separators == ";|"; }},
        {"a/z=" + long_text, "a", [](const R& r) { return Is_Wide(r.Custom_Separators, 20); }},
        {"a/p= x y", "a", [](const R& r) { return r.Pointer_Name == "x y"; }},
        {"a/n/n", "a/n", [](const R& r) { return r.No_Names; }},
    };
    Check(Input_Options(), cases);
    EXPECT_EQ(Messages(), "");
    const Case faulty[] = {
        {"a/csv=0/n", "a", [](const R& r) { return r.No_Names && r.Lines_Per_Record == 1; }}};
    Check(Input_Options(), faulty);
    EXPECT_EQ(Messages(), "CSV number of lines per record (0) is invalid.\n:\n");
}

TEST_F(Slash_Options_Test, Output)
{
    using enum Add_Modes;
    const Case cases[] = {
        {"a/mv='/m'", "a", [](const R& r) { return r.Missing_Text == "/m" && !r.Output_Matrix; }},
        {"a/mv=\"x\"/n", "a", [](const R& r) { return r.Missing_Text == "\"x\""; }},
        {"a/mv=" + long_text, "a", [](const R& r) { return Is_Wide(r.Missing_Text, 90); }},
        {"a/av", "a", [](const R& r) { return !r.Write_Via_Temp && !r.Add_To_Output; }},
        {"a/*", "a", [](const R& r) { return r.No_Return; }},
        {"a/a=S1/x=S2", "a", [](const R& r) { return r.Add_To_Output && r.Output_Sheet_Name == "S1"; }},
        {"a/a/x=S2", "a", [](const R& r) { return r.Add_To_Output && r.Output_Sheet_Name == "S2"; }},
        {"b/a'" + long_text + "'", "b", [](const R& r) { return Is_Wide(r.Output_Sheet_Name, 280); }},
        {"a/x=S b", "a b", [](const R& r) { return !r.Add_To_Output && r.Output_Sheet_Name == "S"; }},
        {"a/b", "a", [](const R& r) { return r.End_With_Break; }},
        {"a/c", "a", [](const R& r) { return !r.Keep_As_Columns; }},
        {"a/d", "a", [](const R& r) { return r.Use_Formats; }},
        {"a/e", "a", [](const R& r) { return !r.settings.delete_empty_rows; }},
        {"a/f", "a", [](const R& r) { return r.Fixed_Number_Text; }},
        {"a/g", "a", [](const R& r) { return r.Table_Grid; }},
        {"a/h", "a", [](const R& r) { return r.Packed_Csv_Output && r.Allow_HTML; }},
        {"a/i", "a", [](const R& r) { return r.Excel_Dates_As_Text; }},
        {"a/jr", "a", [](const R& r) { return r.Table_Justify == 1; }},
        {"a/jc/jl", "a", [](const R& r) { return r.Table_Justify == 2; }},
        {"a/l=12", "a", [](const R& r) { return r.Log_Book_Output && r.Log_Book_Lines == 12; }},
        {"a/m=M 1/n", "a", [](const R& r) { return r.Output_Matrix && r.Output_Matrix_Name == "M 1"; }},
        {"a/n", "a", [](const R& r) { return r.Omit_Header && !r.settings.csv_title; }},
        {"a/o", "a", [](const R& r) { return r.Replace_Book_Data; }},
        {"a/p", "a", [](const R& r) { return r.Write_Var_List; }},
        {"a/q", "a", [](const R& r) { return r.Quiet_Read; }},
        {"a/r=S", "a", [](const R& r) { return r.Replace_Sheet_Asked && r.Output_Sheet_Name == "S"; }},
        {"a/s/-", "a", [](const R& r) { return !r.settings.csv_quote_text; }},
        {"a/t", "a", [](const R& r) { return r.R_Text_Output; }},
        {"a/u", "a", [](const R& r) { return r.No_Name_Marks; }},
        {"a/v=-9", "a", [](const R& r) { return r.Script_Version == 1; }},
        {"a/w", "a", [](const R& r) { return r.Table_Look; }},
        {"a/z", "a", [](const R& r) { return !r.Omit_Header && !r.settings.csv_title; }},
        {"a/./7", "a", [](const R& r) { return r.R_Dot_Names && r.Excel_97; }},
        {"a/!='S 1'", "a", [](const R& r) { return r.Merge_Sheet_Name == "S 1"; }},
        {"a/@=N,'k,1' b", "a b", [](const R& r) { return !r.Keep_Sorted && r.Merge_Key == "k,1"; }},
        {"a/@,k,w b", "a b", [](const R& r) { return r.Merge_Key == "k" && r.Merge_With == "w"; }},
        {"a/@,k", "a", [](const R& r) { return r.Add_Mode == append && r.Keep_Sorted; }},
        {"a/&U", "a", [](const R& r) { return r.Add_Mode == concatenate && r.Unique_Rows; }},
        {"a/^k", "a", [](const R& r) { return r.Add_Mode == concatenate && r.Source_Key_Given; }},
        {"a/%=3N", "a", [](const R& r) { return r.Merge_Key_Count == 3 && r.Merge_Fill == 0; }},
        {"a/%=UN", "a", [](const R& r) { return r.Add_Mode == merge && r.Unique_Rows && r.Merge_Fill == 1; }},
        {"a/%", "a", [](const R& r) { return r.Add_Mode == merge && r.Merge_Fill == 2; }},
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

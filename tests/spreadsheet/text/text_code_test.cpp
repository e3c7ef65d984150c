// Texts in codes of all kinds, in requests whose own text is UTF-8.
#include "spreadsheet/text/text.h"

#include "hostfiles/tss/tss.h"
#include "model/factors.h"
#include "model/names.h"
#include "support/cell_lists.h"
#include "support/check_sheet.h"

#include <span>

namespace ingester {
namespace {

using namespace std::string_literals;

class Text_Code_Of_Files : public Request_Test {
protected:
    static std::string Read(std::string_view text, std::string_view encoding = {}, const char* name = "X.CSV")
    {
        Start_Request("t");
        Use_Utf8_Text(true);
        request.Input_Encoding = encoding;
        Input_File file(std::as_bytes(std::span(text)), name);
        if (!Read_CSV(file))
            return "";
        EXPECT_EQ(Check_Sheet(*Current_Sheet), "");
        return Render(Current_Sheet);
    }
    static std::int64_t Losses()
    {
        std::int64_t count = 0;
        for (const Loss& loss : request.losses.Entries())
            count += loss.kind == Loss_Kind::letter_replaced ? loss.count : 0;
        return count;
    }
};

TEST_F(Text_Code_Of_Files, Is_Told_Declared_Or_Found)
{
    struct Case {
        const char* told;
        std::string text;
        const char* encoding;
        const char* sheet;
        std::int64_t losses = 0;
    };
    const Case cases[] = {
        {"UTF-8", "gr\u00F6\u00DFe,n\n\u65E5\u672C,1\n", "", "gr\u00F6\u00DFe T\u65E5\u672C; n V1"},
        {"with a mark",
         "\xEF\xBB\xBF"
         "a\n\u00E9\n",
         "", "a T\u00E9"},
        {"Windows-1252", "a,b\n\x80\xE9,\xC3\xA9\n", "", "a T\u20AC\u00E9; b T\u00C3\u00A9"},
        {"UTF-16 with a mark",
         "\xFF\xFE"
         "a\0\n\0\xE9\0\n\0"s,
         "", "a T\u00E9"},
        {"UTF-16 without, of odd length", "a\0\n\0\xE9\0\n\0x"s, "utf16", "a T\u00E9|?", 1},
        {"a page of DOS", "a\n\x82\n", "cp850", "a T\u00E9"},
        {"two bytes a letter", "a\n\x93\xFA\n", "shift-jis", "a T\u65E5"},
        {"malformed, though declared", "a\n\u00E9\xE9\n\xFF\n", "utf-8", "a T\u00E9?|?", 2},
        {"malformed, though marked",
         "\xEF\xBB\xBF"
         "a\n\u00E9\xE9\n",
         "", "a T\u00E9?", 1},
        {"nothing but a mark", "\xEF\xBB\xBF", "", ""},
    };
    for (const Case& tried : cases) {
        EXPECT_EQ(Read(tried.text, tried.encoding), tried.sheet) << tried.told;
        EXPECT_EQ(Losses(), tried.losses) << tried.told;
        EXPECT_EQ(Messages(), "") << tried.told;
    }
}

/// Letters lie across the windows that are looked at, and what was read before the text turned out to be of
/// another code leaves nothing behind.
TEST_F(Text_Code_Of_Files, Is_Seen_However_Late_It_Shows)
{
    std::string utf8 = ",x\n";
    std::string bytes = ",x\n";
    std::string expected = "C1 T";
    for (int row = 0; row < 4000; ++row) {
        const std::string plain(static_cast<std::size_t>(row % 7), 'p');
        utf8 += plain + "\u20AC\u00E9,1\n";
        bytes += (row < 3000 ? plain + "q,1\n" : plain + "\x80\xE9,1\n");
    }
    EXPECT_EQ(Letter_Count(Read(utf8)), Letter_Count(Read(utf8, "utf8")));
    EXPECT_EQ(Column_At(Current_Sheet, 1)->name, "C1");
    EXPECT_EQ(Cell_At(Column_At(Current_Sheet, 1), 3999)->Text(), "pp\u20AC\u00E9");
    EXPECT_EQ(Losses(), 0);
    static_cast<void>(Read(bytes));
    EXPECT_EQ(Column_At(Current_Sheet, 1)->name, "C1");
    EXPECT_EQ(Current_Sheet->row_count, 4000);
    EXPECT_EQ(Cell_At(Column_At(Current_Sheet, 1), 3999)->Text(), "pp\u20AC\u00E9");
    EXPECT_EQ(Cell_At(Column_At(Current_Sheet, 1), 8)->Text(), "pq");
    EXPECT_EQ(Losses(), 0);
    // As the last letters of a row's marks change, so do the places in windows.
    for (std::size_t shift = 0; shift < 9; ++shift)
        EXPECT_NE(Read("a" + std::string(shift, 'x') + utf8), "") << shift;
}

TEST_F(Text_Code_Of_Files, Letters_Count_Not_Bytes)
{
    std::string ninety;
    for (int i = 0; i < 90; ++i)
        ninety += "\u65E5";
    Read("a\n" + ninety + "\n");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->type, text_column);
    EXPECT_EQ(Cell_At(Column_At(Current_Sheet, 1), 0)->Text(), ninety);
    EXPECT_EQ(Column_At(Current_Sheet, 1)->nlevels, 90);
    Read("a\n" + ninety + "x\n");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->type, long_text_column);
    Read(ninety + "\n1\n");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->name, ninety.substr(0, 60 * 3));
}

TEST_F(Text_Code_Of_Files, Text_Is_Written_As_It_Stands_In_Columns_Of_Letters)
{
    Read("n\u00E4me,x\n\u00E9\u00E9\u00E9\u00E9\u00E9,1\n\u65E5,22\n");
    Get_Settings().csv_title = 0;
    ASSERT_TRUE(Write_Text_File(Current_Sheet, Request_Name("out.txt").c_str(), false));
    EXPECT_EQ(Get("out.txt"), "  n\u00E4me  x\r\n \u00E9\u00E9\u00E9\u00E9\u00E9  1\r\n \u65E5     22\r\n");
    const std::string written = Get("out.txt");
    Input_File file(std::as_bytes(std::span(written)), "out.txt");
    EXPECT_TRUE(Fields_Stand_In_Columns(file));
}

TEST_F(Text_Code_Of_Files, The_Hosts_Files_Stay_Windows_1252)
{
    Read("t!,u\n\u00E9\u20AC,x\n\u00C9,\u65E5\u672C\n\u00E9\u20AC,\u0160\n");
    const std::string sheet = "t F2|1|2; u Tx|\u65E5\u672C|\u0160";
    Current_Sheet->sheet_name = "Bl\u00E4tter";
    Column_At(Current_Sheet, 2)->extra = "\u00FC";
    ASSERT_TRUE(Write_TSS_File(Current_Sheet, Path("a.tss").c_str()));
    EXPECT_EQ(Losses(), 2);
    EXPECT_EQ(request.losses.Entries().back().column, "u");
    EXPECT_EQ(request.losses.Entries().back().first_row, 2);
    const std::string bytes = Get("a.tss");
    EXPECT_NE(bytes.find("\xE9\x80"), std::string::npos);
    EXPECT_NE(bytes.find("Bl\xE4tter"), std::string::npos);
    for (const bool utf8 : {true, false}) {
        Start_Request("t");
        Use_Utf8_Text(utf8);
        Input_File file(std::as_bytes(std::span(bytes)), "a.tss");
        ASSERT_TRUE(Read_TSS(file));
        EXPECT_EQ(Check_Sheet(*Current_Sheet), "");
        EXPECT_EQ(Column_At(Current_Sheet, 1)->labels->Text(), utf8 ? "\u00C9" : "\xC9");
        EXPECT_EQ(Column_At(Current_Sheet, 2)->extra, utf8 ? "\u00FC" : "\xFC");
        EXPECT_EQ(Cell_At(Column_At(Current_Sheet, 2), 2)->Text(), utf8 ? "\u0160" : "\x8A");
        EXPECT_EQ(Cell_At(Column_At(Current_Sheet, 2), 1)->Text(), "??");
        EXPECT_EQ(Current_Sheet->sheet_name, utf8 ? "Bl\u00E4tter" : "Bl\xE4tter");
        ASSERT_TRUE(Write_TSS_File(Current_Sheet, Path("b.tss").c_str()));
        EXPECT_EQ(Get("b.tss"), bytes);
    }
}

TEST_F(Text_Code_Of_Files, Names_Hold_The_Letters_Of_Every_Script)
{
    Use_Utf8_Text(true);
    const std::pair<std::string, std::string> cases[] = {
        {"\u00C9t\u00E9 2", "\u00C9t\u00E9_2"},
        {"\u0938\u094D\u0924", "\u0938\u094D\u0924"},  // a mark belongs to its letter
        {"\u65E5\u672C \u20AC", "\u65E5\u672C"},
        {"\u0663x", "%\u0663x"},
        {"a\u2265b", "ageb"},
        {"\u00E9['\u00FC']", "\u00E9[1]"},
        {"\u00E9\xC3", "\u00E9"},
    };
    for (const auto& [given, expected] : cases)
        EXPECT_EQ(Make_Valid_Name(given), expected) << given;
    std::string longest;
    for (int i = 0; i < 70; ++i)
        longest += "\u0416";
    EXPECT_EQ(Letter_Count(Make_Valid_Name(longest)), 60U);
    EXPECT_EQ(Make_Valid_Name(longest + "[7]"), longest.substr(0, 57 * 2) + "[7]");
    EXPECT_EQ(Tell_Parts(longest).stem, longest.substr(0, 32 * 2));
    Get_Settings().column_prefix = "\u0416\u0416\u0416\u0416\u0416\u0416\u0416";
    EXPECT_EQ(Default_Column_Name(3), "\u0416\u0416\u0416\u0416\u0416\u0416"
                                      "3");
}

TEST_F(Text_Code_Of_Files, Labels_Are_Found_And_Joined_Whatever_Their_Case)
{
    Read("t\n\u00C9t\u00E9\n\u00E9T\u00C9\nSTRASSE\nstra\u00DFe\n");
    Column* const column = Column_At(Current_Sheet, 1);
    ASSERT_TRUE(Text_To_Factor(column, true, true, 0));
    EXPECT_EQ(column->nlevels, 2);
    Cell_Node cell = *column->first_cell;
    Set_Cell_From_Text(*column, cell, "\u00C9T\u00C9");
    EXPECT_EQ(cell.value.number, column->first_cell->value.number);
    Set_Cell_From_Text(*column, cell, "stras");
    EXPECT_EQ(cell.value.number, column->last_cell->value.number);
}

}  // namespace
}  // namespace ingester

#include "model/date_format.h"
#include "model/told_sheets.h"
#include "spreadsheet/text/text.h"
#include "support/text.h"

#include <random>

namespace ingester {
namespace {

/// A Sheet with every kind of column.
Sheet* Mixed_Sheet()
{
    Sheet* const sheet = Sheet_Of("number V1|-0.1|*; t Tsay \"hi\"||a,b\tc; size F2|*|1; dose F1|2|*; "
                                  "plain F2|1|*; day V3|4|5");
    Put_Levels(*Column_At(sheet, 3), {1, 2}, {"b\"g", "s"});
    Put_Levels(*Column_At(sheet, 4), {0.5, 1234567.25});
    sheet->last_column->format = date_format_mark;
    return sheet;
}

void Packed()
{
    request.CSV_Output = request.Packed_Csv_Output = true;
}

class Text_Writer : public Request_Test {
protected:
    [[nodiscard]] std::string Written(Sheet* sheet, bool tab_mode = false, const char* name = "out.txt") const
    {
        EXPECT_TRUE(Write_Text_File(sheet, Request_Name(name).c_str(), tab_mode));
        return Get(name);
    }
};

TEST_F(Text_Writer, Lays_Out_Every_Kind_Of_Column)
{
    const auto bare = [] {
        Packed();
        Get_Settings().csv_quote_text = 0;
        request.No_Name_Marks = true;
        request.Missing_Text.assign("NA");
    };
    const std::tuple<const char*, bool, void (*)(), const char*> cases[] = {
        {"packed commas", false, Packed,
         "number,t,size!,dose!,plain!,day:D\r\n1,\"say \"\"hi\"\"\",\"s\",0.5,2,03/01/00\r\n"
         "-0.1,, ,1234567.25,1,04/01/00\r\n*,\"a,b\tc\",\"b\"\"g\",*,*,05/01/00\r\n"},
        {"no quotes, no marks, another missing text", false, bare,
         "number,t,size,dose,plain,day\r\n1,say \"hi\",s,0.5,2,03/01/00\r\n"
         "-0.1,, ,1234567.25,1,04/01/00\r\nNA,\"a,b\tc\",b\"g,NA,NA,05/01/00\r\n"},
        {"padded commas", false, [] { request.CSV_Output = true; },
         "number,t,size!,dose!,plain!,day:D\r\n"
         "      1,\"say \"\"hi\"\"\" ,    \"s\",        0.5,      2, 03/01/00\r\n"
         "   -0.1,             ,       , 1234567.25,      1, 04/01/00\r\n"
         "      *,\"a,b\tc\"      , \"b\"\"g\",          *,      *, 05/01/00\r\n"},
        {"tabs, without names", true, [] { request.Omit_Header = true; },
         "1\tsay \"hi\"\ts\t0.5\t2\t03/01/00\r\n-0.1\t\t "
         "\t1234567.25\t1\t04/01/00\r\n*\t\"a,b\tc\"\tb\"g\t*\t*\t05/01/00\r\n"},
        {"fixed width", false, [] { Get_Settings().csv_title = 0; },
         " number        t size!      dose! plain!    day:D\r\n"
         "      1 say \"hi\"     s        0.5      2 03/01/00\r\n"
         "   -0.1                1234567.25      1 04/01/00\r\n"
         "      * a,b\tc      b\"g          *      * 05/01/00\r\n"},
    };
    for (const auto& [told, tab_mode, change, text] : cases) {
        Start_Request("t");
        change();
        EXPECT_EQ(Written(Mixed_Sheet(), tab_mode), text) << told;
    }
    EXPECT_EQ(Written(Sheet_Of("t Ta\nb"), true), "t\r\n\"a\nb\"\r\n");
}

void Plain()
{
    Packed();
    request.people.set(static_cast<std::size_t>(People_Rule::plain_texts));
    Use_Utf8_Text(true);
    request.Names_Kept_As_They_Stand = true;
}

TEST_F(Text_Writer, Writes_For_Other_Programs)
{
    const auto marked = [] {
        Plain();
        request.Write_Marks = request.Write_Crlf = true;
    };
    const auto bare = [] {
        Plain();
        Get_Settings().csv_quote_text = 0;
        request.Missing_Text = "NA";
        request.Missing_Text_Given = true;
    };
    const std::tuple<const char*, void (*)(), const char*, const char*> cases[] = {
        {"every kind", Plain, "",
         "number,t,size,dose,plain,day\n1,\"say \"\"hi\"\"\",s,0.5,2,1900-01-03\n"
         "-0.1,,,1234567.25,1,1900-01-04\n,\"a,b\tc\",\"b\"\"g\",,,1900-01-05\n"},
        {"with marks", marked, "",
         "number,t,size!,dose!,plain!,day:D\r\n1,\"say \"\"hi\"\"\",s,0.5,2,1900-01-03\r\n"
         "-0.1,,*,1234567.25,1,1900-01-04\r\n*,\"a,b\tc\",\"b\"\"g\",*,*,1900-01-05\r\n"},
        {"no quotes but where fields would fall apart", bare, "t T12|NA; u Ta,b|-; n V1|*",
         "t,u,n\n12,\"a,b\",1\nNA,-,NA\n"},
        {"texts that look like data", Plain,
         "t T007|1e5|; u TNA|x|nan; d T2024-01-05|10:30|1 234; w Tit's|'s|-5",
         "t,u,d,w\n\"007\",\"NA\",\"2024-01-05\",it's\n\"1e5\",x,\"10:30\",\"'s\"\n"
         "\"\",\"nan\",\"1 234\",-5\n"},
        {"comments and names", Plain, "#a T#x|%y; 2b T#x|; n T a|b ",
         "\"#a\",\"2b\",n\n\"#x\",#x,\" a\"\n\"%y\",,\"b \"\n"},
        {"one column", Plain, "n V1|*|2", "n\n1\n\"\"\n2\n"},
        {"one column with signs", Plain, "n Tx;y|x", "n\n\"x;y\"\nx\n"},
        {"all digits", Plain, "n V0.1|1e23|123456789012345678|0.30000000000000004|-5e-324",
         "n\n0.1\n1e+23\n1.2345678901234568e+17\n0.30000000000000004\n-5e-324\n"},
    };
    for (const auto& [told, change, sheet, text] : cases) {
        Start_Request("t");
        change();
        EXPECT_EQ(Written(*sheet == '\0' ? Mixed_Sheet() : Sheet_Of(sheet)), text) << told;
    }
    Start_Request("t");
    Plain();
    Sheet* const mixed = Mixed_Sheet();
    Put_Levels(*Column_At(mixed, 3), {}, {"s", "b"});
    for (const double first : {1.0, 2.0}) {
        Cell_At(Column_At(mixed, 3), 0)->value.number = first;
        Cell_At(Column_At(mixed, 3), 2)->value.number = 3 - first;
        static_cast<void>(Written(mixed));
        EXPECT_EQ(request.losses.Entries().size(), first - 1) << "levels may stand as they are met";
    }
    Sheet* const wide = Sheet_Of("t T" + std::string(90, 'x'));
    for (int i = 0; i < 1000; ++i)
        Add_Cells(wide, text_column, "u", {std::string(90, 'y')});
    EXPECT_EQ(std::ranges::count(Written(wide), '\n'), 2) << "no line is broken";
    Sheet* const empty = New_Sheet();
    New_Column(empty, variate_column, "v");
    EXPECT_EQ(Written(empty), "v\n");
}

TEST_F(Text_Writer, Writes_Dates_So_That_Nothing_Is_Lost)
{
    const std::tuple<std::int32_t, std::int16_t, std::vector<double>, const char*> cases[] = {
        {month_day_year_format, 0, {45363, -1, 2958465}, "d:D|2024-03-12|1899-12-30|9999-12-31|"},
        {packed_day_name_year_format, 1, {154875, 1}, "d:D|2024-03-12|1600-03-01|"},
        {day_month_year_format, 0, {45363, 45363.5}, "d:D|2024-03-12 00:00:00|2024-03-12 12:00:00|"},
        {date_time_format,
         0,
         {45363.25, 45363 + 0.001 / 86400},
         "d:D|2024-03-12 06:00:00|2024-03-12 00:00:00.001|"},
        {time_format, 0, {0.5, 36000.25 / 86400}, "d:T|12:00:00|10:00:00.250|"},
        {time_format, 0, {0.5, 45363}, "d:D|1899-12-31 12:00:00|2024-03-12 00:00:00|"},
        {total_hours_format, 0, {1.5}, "d:T|36:00:00|"},
        {seconds_format, 0, {1.5}, "d:D|129600|"},
        {day_month_year_format, 0, {1e9, -2e5, 1}, "d:D|*|*|1900-01-01|"},
    };
    for (const auto& [format, form, numbers, text] : cases) {
        Start_Request("t");
        Plain();
        request.Write_Marks = true;
        Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(numbers.size()));
        Column* const column = New_Data_Column(sheet, variate_column, "d", sheet->row_count);
        std::int32_t row = 0;
        for (const double number : numbers)
            Cell_At(column, row++)->value.number = number;
        column->format = date_format_mark;
        column->date_format = format;
        column->date_form = form;
        EXPECT_EQ(On_One_Line(Written(sheet)), text) << format;
        EXPECT_EQ(request.losses.Entries().size(),
                  std::string_view(text).find("|*") == std::string::npos ? 0 : 1);
    }
}

TEST_F(Text_Writer, Knows_The_Codes_Of_Files)
{
    const std::tuple<const char*, bool, std::string, std::string> cases[] = {
        {"", true, "\xEF\xBB\xBFt,u\n\xC3\xB6,\xCE\xB1\n", ""},
        {"latin1", false, "t,u\n\xF6,?\n", "u 1 \xCE\xB1"},
        {"UTF-16", false, {"\xFF\xFEt\0,\0u\0\n\0\xF6\0,\0\xB1\x03\n\0", 18}, ""},
    };
    for (const auto& [code, mark, bytes, lost] : cases) {
        Start_Request("t");
        Plain();
        request.Output_Encoding = code;
        request.Write_Code_Mark = mark;
        EXPECT_EQ(Written(Sheet_Of("t T\xC3\xB6; u T\xCE\xB1")), bytes) << code;
        std::string told;
        for (const Loss& loss : request.losses.Entries())
            told += loss.column + " " + std::to_string(loss.first_row) + " " + loss.example;
        EXPECT_EQ(told, lost);
    }
    request.Output_Encoding = "latin1";
    request.Write_Code_Mark = true;
    EXPECT_FALSE(Write_Text_File(Sheet_Of("t Tx"), Request_Name("none.csv").c_str(), false));
}

TEST_F(Text_Writer, Justifies_Fixed_Width_Below_A_Title)
{
    request.Missing_Text.assign("missing");
    request.Source_Base_Name.assign("trial");
    Sheet* const sheet = Sheet_Of("n V1.5|-20; text Tab|; f F1|2; g F1|*");
    Put_Levels(*Column_At(sheet, 3), {}, {"x", "yyy"});
    Column_At(sheet, 1)->justify = Column_At(sheet, 3)->justify = left_side;
    Column_At(sheet, 2)->justify = right_side;
    const std::pair<const char*, std::string> cases[] = {
        {"out.txt", "out.txt"}, {"out.$$$", "out"}, {"Clipboard.$$$", "trial"}, {"$Clip$.txt", "trial"}};
    for (const auto& [file, title] : cases) {
        std::string text = Written(sheet, false, file);
        std::replace_if(text.begin(), text.begin() + static_cast<long>(text.find('\n')), Is_Digit, '9');
        EXPECT_EQ(text, "\"" + title
                            + " (Created by Ingester: 99:99:99 99/99/99)\"\r\n n   text f!       g!\r\n"
                              " 1.5   ab x         1\r\n -20      yyy missing\r\n");
    }
}

TEST_F(Text_Writer, Prints_Numbers_By_Formats_When_Asked)
{
    Packed();
    request.Omit_Header = true;
    Sheet* const sheet = New_Sheet_With_Rows(1);
    const std::pair<std::int32_t, std::int32_t> formats[] = {
        {fixed_format, 2}, {exponent_format, 3}, {significant_digits_format, 9}, {general_format, 2}};
    for (const auto& [format, decimals] : formats) {
        Column* const column = Add_Cells(sheet, variate_column, "n", {"1234567.891"});
        column->format = format;
        column->decimals = decimals;
    }
    Put_Levels(*Add_Cells(sheet, factor_column, "f", {"2"}), {0, 1234567.891});
    EXPECT_EQ(Written(sheet), "1234567.891,1234567.891,1234567.891,1234567.891,1234567.891\r\n");
    request.Use_Formats = true;
    EXPECT_EQ(Written(sheet), "1234567.89,1.235e+06,1234567.89,1.23457e+06,1.23457e+06\r\n");
}

TEST_F(Text_Writer, Knows_Matrices_And_Margins)
{
    Packed();
    Sheet* const matrix = Sheet_Of("1 Y1|2|3; 2 Y4|5; 3 Y6", symmetric_matrix_sheet);
    EXPECT_EQ(Written(matrix), "1,2,3\r\n1,,\r\n2,4,\r\n3,5,6\r\n");
    request.CSV_Output = false;
    Get_Settings().csv_title = 0;
    Sheet* const table = Sheet_Of("f F1|2", table_sheet);
    table->has_margins = 1;
    Put_Levels(*table->last_column, {}, {"x"});
    EXPECT_EQ(Written(table), "     f!\r\n      x\r\n Margin\r\n");
}

TEST_F(Text_Writer, Breaks_Lines_That_Are_Too_Long)
{
    Packed();
    request.Omit_Header = true;
    Get_Settings().csv_quote_text = 0;
    const std::pair<std::size_t, const char*> cases[] = {{5529, "xx,yyyy"}, {5530, "xx,\r\nyy"}};
    for (const auto& [last, found] : cases) {  // 6 * 10001 + 5529 are 65535 characters
        Sheet* const sheet = New_Sheet_With_Rows(1);
        for (int i = 0; i < 6; ++i)
            Add_Cells(sheet, long_text_column, "t", {std::string(10000, 'x')});
        Add_Cells(sheet, long_text_column, "t", {std::string(last, 'y')});
        EXPECT_EQ(Written(sheet).substr(60003, 7), found);
    }
    EXPECT_EQ(Messages(), "Warning: 1 lines were too long and have been broken.\n:\n");
}

TEST_F(Text_Writer, Fails_Where_Nothing_Can_Be_Written)
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    const std::string name = Request_Name("x");
    EXPECT_FALSE(Write_Text_File(nullptr, name.c_str(), false)
                 || Write_Text_File(sheet, name.c_str(), false));
    EXPECT_EQ(Files(), "");
    Add_Cells(sheet, variate_column, "n", {"1"});
    EXPECT_FALSE(Write_Text_File(sheet, (name + "\\x").c_str(), false)
                 || Write_Text_File(sheet, "/dev/full", false));
}

TEST_F(Text_Writer, What_Is_Written_Reads_Back_Equal)
{
    constexpr std::string_view letters = ",\"' \t;ab1.-*";
    std::mt19937 random(11);
    for (int round = 0; round < 3000; ++round) {
        Start_Request("t");
        request.CSV_Output = true;
        request.Packed_Csv_Output = random() % 2 == 0;
        Get_Settings().csv_quote_text = static_cast<std::int16_t>(random() % 2);
        const std::size_t rows = 1 + random() % 4;
        Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(rows));
        for (std::size_t columns = 1 + random() % 3, i = 0; i < columns; ++i) {
            Texts numbers(rows);
            Texts texts(rows);
            texts[0] = "text ";
            for (std::size_t row = 0; row < rows; ++row) {
                numbers[row] = random() % 5 == 0 ? "*" : Format_Text("-%lu.%lu", random(), random());
                for (std::size_t length = random() % 9; length > 0; --length)
                    texts[row] += letters[random() % letters.size()];
                texts[row] = Trim_Copy(texts[row]);
            }
            Add_Cells(sheet, variate_column, "n" + std::to_string(i), numbers);
            Add_Cells(sheet, text_column, "t" + std::to_string(i), texts);
        }
        const std::string expected = Render(sheet);
        const bool tab_mode = random() % 2 == 0;
        const char* const name = tab_mode ? "x.tab" : "x.csv";
        const std::string written = Written(sheet, tab_mode, name);
        ASSERT_TRUE(Read_CSV_File(Request_Name(name).c_str()));
        ASSERT_EQ(Render(Current_Sheet), expected) << written;
    }
}

}  // namespace
}  // namespace ingester

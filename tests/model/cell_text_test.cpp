// Texts that become cells, one by one and in columns.
#include "model/text_columns.h"
#include "model/text_number.h"
#include "support/cell_lists.h"

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

using Cell_Text = Request_Test;

/// What the cell of `column` holds after each text was put in.
std::vector<double> After(Column* column, const Texts& texts)
{
    std::vector<double> numbers;
    for (const std::string& text : texts) {
        EXPECT_TRUE(Set_Cell_From_Text(column, 0, text));
        numbers.push_back(column->first_cell->value.number);
    }
    return numbers;
}

TEST_F(Cell_Text, Finds_Labels_By_Each_Test_In_Turn)
{
    Column* const column = New_Data_Column(New_Sheet_With_Rows(1), factor_column, "f", 1);
    Put_Levels(*column, {1, 2, 3, 4, 5, 6, 7, 8},
               {"northern", "North", "NORTH", "south-west", "South", "Sorghum", "wheat", "where"});
    EXPECT_EQ(After(column, {"NORTH", "nORTH", "nor", "N", "SOUTH-", "southern", "Sorrel", "w"}),
              (std::vector<double>{3, 2, 1, 2, 4, 4, 6, 7}));
    EXPECT_EQ(After(column, {"whey", "xylem", "", "*"}), std::vector(4, gone));
}

TEST_F(Cell_Text, Numbers_And_Levels)
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    sheet->missing_value = -9;
    Column* const number = New_Data_Column(sheet, variate_column, "x", 1);
    Column* const factor = New_Data_Column(sheet, factor_column, "f", 1);
    Put_Levels(*factor, {10, 20});
    const Texts good = {"12.5", " +16e0 ", "15", "1e308", "-8"};
    EXPECT_EQ(After(number, good), (std::vector<double>{12.5, 16, 15, Greatest_Number, -8}));
    EXPECT_EQ(After(factor, good), (std::vector<double>{1, 2, 1, 1, 1}));
    const Texts bad = {"1e309", "1e-400", "", "*", "*7", "12kg", "nan", "."};
    EXPECT_EQ(After(number, bad), std::vector<double>(bad.size(), -9));
    EXPECT_EQ(After(factor, bad), std::vector<double>(bad.size(), -9));
    EXPECT_FALSE(Set_Cell_From_Text(number, 1, "1") || Set_Cell_From_Text(nullptr, 0, "1"));
}

TEST_F(Cell_Text, Missing_Texts_And_Widths)
{
    const std::tuple<const char*, std::string, std::string> cases[] = {

        {"*", " * ", ""},  {"*", "*a", "*a"},   {"n/a", " N/A", ""},
        {"n/a", "*", "*"}, {"n/a", " \t ", ""}, {"", " * ", " * "},
        {"", " ", " "},    {"*", " a ", " a "}, {"*", std::string(20000, 'x'), std::string(20000, 'x')}};
    for (const std::int32_t type : {text_column, long_text_column}) {
        const std::size_t width = type == text_column ? 90 : 10000;
        Column* const column = New_Data_Column(New_Sheet_With_Rows(1), type, "t", 1);
        for (const auto& [missing, given, kept] : cases) {
            request.Missing_Input_Text = missing;
            (void)After(column, {given});
            EXPECT_EQ(column->first_cell->Text(), kept.substr(0, width)) << given;
        }
        EXPECT_EQ(column->nlevels, width);
    }
    request.Missing_Input_Text = "";
    EXPECT_TRUE(Is_Missing_Text({}) && !Is_Missing_Text(""));
}

using Text_Columns = Request_Test;

TEST_F(Text_Columns, Labels_Become_Numbers_By_Mode)
{
    // A text, then what the modes 0 to 4 make of it.
    const std::pair<std::string_view, std::vector<double>> cases[] = {
        {" 12.5 ", {12.5, 12.5, 12.5, 12.5, 12.5}},
        {"12 kg", {gone, 12, 12, 12, 12}},
        {"12kg", {gone, gone, gone, 12, 12}},
        {"1O", {gone, 10, 10, 10, 10}},
        {"IO", {gone, gone, 10, 10, 10}},
        {"z1", {gone, 21, gone, 21, 21}},
        {"$5", {gone, 5, 5, 5, 5}},
        {"1,5", {gone, 1.5, 1.5, 1.5, 1.5}},
        {"1,234.5", {gone, 1, 1, 1, 1234.5}},
        {"1:30", {gone, 1.3, gone, 1.3, 1.3}},
        {"1.2.3", {gone, gone, gone, gone, 1.23}},
        {"e5", {gone, gone, gone, gone, 5}},
        {"x-1y2d-+3", {gone, gone, gone, gone, -0.012}},
        {"1e308", {9.99999e307, 9.99999e307, 9.99999e307, 9.99999e307, 9.99999e307}},
        {"1e999", {gone, gone, gone, gone, gone}},
        {"-9e307", {gone, gone, gone, gone, gone}},
        {"x", {gone, gone, gone, gone, gone}},
        {"", {gone, gone, gone, gone, gone}},
    };
    for (const auto& [text, numbers] : cases)
        for (request.Text_Number_Mode = 0; request.Text_Number_Mode < 5; ++request.Text_Number_Mode) {
            const double number = numbers[static_cast<std::size_t>(request.Text_Number_Mode)];
            bool changed;
            EXPECT_EQ(Text_To_Number(text, gone, changed), number) << text << request.Text_Number_Mode;
            EXPECT_EQ(changed, text != " 12.5 ") << text << request.Text_Number_Mode;
        }
}

TEST_F(Text_Columns, Changed_Labels_Are_Told)
{
    Sheet* const sheet = New_Sheet_With_Rows(5);
    Column* const column = Add_Cells(sheet, long_text_column, "x", {"1.5", "l2", "", "none", "*"});
    ASSERT_TRUE(Text_Column_To_Number(column));
    Column* const other = Add_Cells(sheet, text_column, "y", {"7", "8 9", "", "", ""});
    ASSERT_TRUE(Text_Column_To_Number(other) && !Text_Column_To_Number(other));
    EXPECT_EQ(Render(sheet), "x V1.5|12|*|*|*; y V7|8|*|*|*");
    EXPECT_TRUE(column->format == significant_digits_format && column->decimals == -1) << "no digit goes";
    EXPECT_EQ(Messages(), "Text to Number Conversion Warnings\n \n"
                          "Column x Row    2: l2 read as 12\n"
                          "Column x Row    4: none read as *\n"
                          "Column y Row    2: 8 9 read as 8\n:\n");
}

}  // namespace
}  // namespace ingester

#include "model/text_columns.h"
#include "model/text_number.h"
#include "support/cell_lists.h"

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

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

#include "model/cell_text.h"

#include "interface/request/request.h"
#include "support/cell_lists.h"
#include "support/request_fixture.h"

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

using Cell_Text = Request_Test;

/// What the cell of `column` holds after `text` was put in.
double After(Column* column, std::string_view text)
{
    EXPECT_TRUE(Set_Cell_From_Text(column, 0, text));
    return column->first_cell->value.number;
}

TEST_F(Cell_Text, Finds_Labels_By_Each_Test_In_Turn)
{
    Column* const column = New_Data_Column(New_Sheet_With_Rows(1), factor_column, "f", 1);
    ASSERT_TRUE(
        Put_Levels(*column, {1, 2, 3, 4, 5, 6, 7, 8},
                   {"northern", "North", "NORTH", "south-west", "South", "Sorghum", "wheat", "where"}));
    const struct {
        const char* text;
        double level;
    } cases[] = {{"NORTH", 3},    {"nORTH", 2},  {"nor", 1},     {"N", 2},        {"SOUTH-", 4}, {"w", 7},
                 {"southern", 4}, {"Sorrel", 6}, {"whey", gone}, {"xylem", gone}, {"", gone},    {"*", gone}};
    for (const auto& c : cases)
        EXPECT_EQ(After(column, c.text), c.level) << c.text;
}

TEST_F(Cell_Text, Numbers_And_Levels)
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    sheet->missing_value = -9;
    Column* const number = New_Data_Column(sheet, variate_column, "x", 1);
    Column* const factor = New_Data_Column(sheet, factor_column, "f", 1);
    ASSERT_TRUE(Put_Levels(*factor, {10, 20}));
    constexpr double none = -9;
    const struct {
        const char* text;
        double number, level;
    } cases[] = {
        {"12.5", 12.5, 1},     {" +16e0 ", 16, 2},     {"15", 15, 1},        {"1e308", Greatest_Number, 1},
        {"1e309", none, none}, {"1e-400", none, none}, {"", none, none},     {"*", none, none},
        {"*7", none, none},    {"12kg", none, none},   {"0x10", none, none}, {"nan", none, none},
        {"-8", -8, 1},         {".", none, none}};
    for (const auto& c : cases) {
        EXPECT_EQ(After(number, c.text), c.number) << c.text;
        EXPECT_EQ(After(factor, c.text), c.level) << c.text;
    }
    EXPECT_FALSE(Set_Cell_From_Text(number, 1, "1") || Set_Cell_From_Text(nullptr, 0, "1"));
}

TEST_F(Cell_Text, Missing_Texts_And_Widths)
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    Column* const text = New_Data_Column(sheet, text_column, "t", 1);
    Column* const long_text = New_Data_Column(sheet, long_text_column, "l", 1);
    const struct {
        const char* missing;
        std::string given, kept;
    } cases[] = {
        {"*", " * ", ""},  {"*", "*a", "*a"},   {"n/a", " N/A", ""},
        {"n/a", "*", "*"}, {"n/a", " \t ", ""}, {"", " * ", " * "},
        {"", " ", " "},    {"*", " a ", " a "}, {"*", std::string(20000, 'x'), std::string(20000, 'x')}};
    for (const auto& c : cases) {
        request.Missing_Input_Text = c.missing;
        for (Column* const column : {text, long_text}) {
            const std::size_t width = column == text ? 90 : 10000;
            After(column, c.given);
            EXPECT_EQ(column->first_cell->Text(), c.kept.substr(0, width)) << c.given;
        }
    }
    EXPECT_EQ(text->nlevels, 90);
    EXPECT_EQ(long_text->nlevels, 10000);
    request.Missing_Input_Text = "";
    EXPECT_TRUE(Is_Missing_Text({}));
    EXPECT_FALSE(Is_Missing_Text(""));
}

}  // namespace
}  // namespace ingester

#include "support/cell_lists.h"
#include "support/check_sheet.h"
#include "support/text.h"

namespace ingester {
namespace {

using Columns = Request_Test;

std::string Of(std::size_t count)
{
    return std::string(count, 'x');
}

TEST_F(Columns, Are_Named_And_Placed_By_Type)
{
    // Given names become names with index, leading columns and format.
    const std::tuple<std::int32_t, std::int32_t, const char*, const char*> cases[] = {
        {1, 4, "1 a", "%1_a 2 1 1"},
        {1, 4, "", "C1 2 1 1"},
        {1, 33, "t", "t 2 1 4"},
        {1, 2, "f", "f 2 1 1"},
        {1, -3, "u v", "u_v 1 2 4"},
        {1, -4, "u", "u 1 2 1"},
        {3, 7, "1 a", "1 a 2 1 1"},
        {4, 6, "1 a", "%1_a 2 1 1"},
        {5, 22, "1 a", "1 a 2 1 1"},
        {5, 2, "f g", "f_g 2 2 1"},
        {5, 2, "vclass['classification'][1]", "C1 2 2 1"}};
    for (const auto& [sheet_type, type, given, made] : cases) {
        Start_Request("t");
        Sheet* const sheet = New_Sheet();
        sheet->type = sheet_type;
        New_Column(sheet, variate_column, "first");
        const Column* const column = New_Column(sheet, type, given);
        EXPECT_EQ(std::string(column->name)
                      + Format_Text(" %i %i %i", column->index, sheet->leading_columns, column->format),
                  made);
        EXPECT_EQ(Check_Sheet(*sheet), "");
    }
}

TEST_F(Columns, Quoted_Suffixes_Are_Numbered_By_Stem)
{
    Get_Settings().bracket_names = 0;
    Sheet* const sheet = New_Sheet();
    const char* const cases[][3] = {{"p['low']", "p[1]", "low"},   {"q['low']", "q[1]", "low"},
                                    {"P['high']", "P[2]", "high"}, {"a b['x']", "a_b[1]", "x"},
                                    {"Row['r']", "Row[1]", "r"},   {"p['']", "p[3]", ""},
                                    {"p['x'", "p['x']", ""}};
    for (const auto& [given, name, extra] : cases) {
        const Column* const column = New_Column(sheet, variate_column, given);
        EXPECT_TRUE(column->name == name && column->extra == extra) << given;
    }
    sheet->type = matrix_sheet;
    EXPECT_EQ(New_Column(sheet, variate_column, "p['low']")->name, "p['low']");
}

TEST_F(Columns, Start_With_Blank_Cells)
{
    Sheet* const sheet = New_Sheet_With_Rows(2);
    sheet->missing_value = -5;
    const Column* const number = New_Data_Column(sheet, table_column, "n", 2);
    const Column* const bare = New_Data_Column(sheet, unbuffered_text_column, "bare", 2);
    Column* const none = New_Data_Column(sheet, variate_column, "none", -4);
    EXPECT_EQ(number->last_cell->value.number + number->range_low + number->range_high, -15);
    EXPECT_TRUE(bare->type == text_column && bare->last_cell->value.text == nullptr);
    EXPECT_TRUE(none->length == -4 && Cell_At(none, 0) == nullptr && Insert_Cells(none, 7, 2));
    EXPECT_EQ(Check_Sheet(*sheet), "");
    request.Max_Columns = 3;
    EXPECT_EQ(New_Column(sheet, variate_column, "fourth"), nullptr);
}

TEST_F(Columns, Are_Filled_From_A_Text)
{
    constexpr double gone = Missing_Value;
    const std::tuple<std::int32_t, std::int32_t, const char*, double> cases[] = {
        {4, 0, " 2.5x", 2.5}, {4, 0, "*", gone}, {4, 0, "", gone}, {4, 0, "1e999", gone},
        {4, 0, "x", gone},    {8, 0, "-3", -3},  {2, 0, "1.5", 2}, {2, 0, "-7", 1},
        {2, 0, "99", 3},      {2, 0, "", gone},  {2, 1, "19", 2},  {2, 1, "-100", 1},
        {2, 1, "b", gone},    {2, 2, "a", 2},    {2, 2, "B", 3},   {2, 2, "*", gone}};
    Sheet* const sheet = New_Sheet_With_Rows(2);
    for (const auto& [type, kind, text, value] : cases) {
        Column* const column = New_Column(sheet, type, "x");
        Put_Levels(*column, {10, 20, 30}, {"A", "a", "b"});
        column->factor_kind = kind;
        EXPECT_TRUE(Fill_Column(column, type, 2, 3, text) && !Fill_Column(column, type, 2, 3, text));
        EXPECT_EQ(column->last_cell->value.number, value) << type << ' ' << kind << ' ' << text;
    }
    Column* const text = New_Column(sheet, text_column, "text");
    Column* const factor = New_Column(sheet, factor_column, "no_levels");
    EXPECT_TRUE(Fill_Column(text, 3, 2, 0, Of(200)) && Fill_Column(factor, 2, 2, 0, "1"));
    EXPECT_EQ(text->last_cell->Text(), Of(90));
    EXPECT_EQ(factor->last_cell->value.number, gone);
    EXPECT_EQ(Check_Sheet(*sheet), "");
    EXPECT_FALSE(Fill_Column(New_Column(sheet, scalar_column, "s"), scalar_column, 2, 0, "1"));
    EXPECT_EQ(Messages(), "Internal Spreadsheet Error: Requested Scalar type with length <> 1.\n:\n");
}

TEST_F(Columns, Are_Added_By_The_Type_Of_The_Sheet)
{
    const std::string refusal = "You cannot add a column of that type to this spreadsheet.\n:\n";
    const std::int32_t wanted[] = {-3, 2, 2, 3, 4, 1, 8};  // the first Factor at position 1, all else at 2
    const char* const made[] = {"-3n 2n 2n 3n 4n no no ", "-3n 51 51 51 51 51 51 ", "-3n 71 71 71 71 71 71 ",
                                "-3n 6n 6n 6n 6n 6n 6n ", "8n 2n 8n 8n 8n 8n 8n ",  "no no no no no 1n no "};
    for (std::int32_t sheet_type = 1; sheet_type <= 6; ++sheet_type) {
        std::string types;  // with names
        for (std::int32_t i = 0; i < 7; ++i) {
            Sheet* const sheet = New_Sheet_With_Rows(1);
            sheet->type = sheet_type;
            const Column* const column =
                Add_Column(sheet, {.type = wanted[i], .name = "n", .fill = {}}, i == 1 ? 1 : 2, false);
            types += column == nullptr ? "no " : Format_Text("%i%s ", column->type, column->name.c_str());
            EXPECT_EQ(Messages(), column == nullptr ? refusal : "");
            EXPECT_TRUE(types.ends_with("71 ") ? sheet->row_count == 2 : Check_Sheet(*sheet).empty());
        }
        EXPECT_EQ(types, made[sheet_type - 1]);
    }
}

TEST_F(Columns, Bring_Their_Levels)
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    const std::pair<double, std::int32_t> cases[] = {
        {-12345, 6}, {1234567, 7}, {1e10, 12}, {0, 12}, {0.001, 6}};
    for (const auto& [value, width] : cases) {
        Column source;
        Put_Levels(source, {value, 1}, {"low", "high"});
        Column_Request asked{.type = factor_column, .name = {}, .nlevels = 2, .fill = {}};
        asked.level_values_count = asked.label_count = 2;
        asked.level_values = source.level_values;
        const Column* const values = Add_Column(sheet, asked, 9, false);
        EXPECT_EQ(values->width, width) << value;
        asked.labels = source.labels;
        asked.fill = "HIGH";
        const Column* const labels = Add_Column(sheet, asked, 9, false);
        EXPECT_TRUE(labels->factor_kind == 2 && labels->label_width == 4);
        EXPECT_EQ(labels->first_cell->value.number, 2.0);
    }
    EXPECT_EQ(Check_Sheet(*sheet), "");
}

TEST_F(Columns, Are_Found_By_What_Tells_Names_Apart)
{
    Sheet* const sheet = New_Sheet();
    for (const std::string& name :
         Texts{"a", Of(32) + "yz", Of(40) + "[1]", Of(31) + "[1]", Of(31) + "[2]", "Row"})
        New_Column(sheet, variate_column, name);
    const std::pair<std::string, std::int32_t> cases[] = {
        {" a\t", 1}, {"A", 0}, {Of(32), 2}, {Of(33) + "[1]", 3}, {Of(31) + "[1]", 4},
        {"Row", 6},  {"x", 0}, {Of(50), 2}, {Of(33) + "[2]", 0}, {Of(31) + "[2]", 5}};
    for (const auto& [name, index] : cases) {
        const Column* const found = Find_Column(sheet, name);
        EXPECT_EQ(found == nullptr ? 0 : found->index, index) << name;
    }
}

}  // namespace
}  // namespace ingester

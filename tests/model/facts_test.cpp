#include "model/number_format.h"
#include "support/cell_lists.h"

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

using Facts = Request_Test;

/// A column in a Sheet of its own.
Column* Of(std::int32_t type, const Texts& cells)
{
    return Add_Cells(New_Sheet_With_Rows(static_cast<std::int32_t>(cells.size())), type, "x", cells);
}

/// Numbers printed by one format, each behind its decimals.
Texts Printed(std::int32_t format, const std::vector<std::pair<std::int32_t, double>>& numbers)
{
    Texts texts;
    char text[Number_Text_Room];
    for (const auto& [decimals, number] : numbers)
        texts.emplace_back(text, Format_Number(text, number, format, decimals, gone));
    return texts;
}

TEST_F(Facts, Numbers_Print_By_Format)
{
    EXPECT_EQ(Printed(1, {{3, 1234.5}, {5, 1234.56}, {4, 1234.56}, {3, 0.0012345}, {2, 0.00123456789}}),
              (Texts{"1234.5", "1234.6", "1234.56", "0.00123", "0.0012"}));
    EXPECT_EQ(Printed(1, {{2, 0.000123456789}, {-1, 1234567}, {20, 0.1}, {15, 1e13}, {9, 0}, {2, -1e308}}),
              (Texts{"0.000123457", "1.23457e+06", "0.10000000000000000555", "1e+13", "0", "*"}));
    EXPECT_EQ(Printed(2, {{2, 1234.5}, {0, 1234.5}}), (Texts{"1.23e+03", "1.234500e+03"}));
    EXPECT_EQ(Printed(3, {{0, 2.5}, {-1, 2.5}, {2, 2.346}, {99, 1}, {2, gone}}),
              (Texts{"2", "2.500000", "2.35", "1." + std::string(40, '0'), "*"}));
    EXPECT_EQ(Printed(4, {{2, 1234567}, {0, -1e306}}), (Texts{"1.23457e+06", "-1e+306"}));
}

TEST_F(Facts, Widths)
{
    const auto width = [](Column* column, const char* name = "x") {
        column->name = name;
        Compute_Column_Width(column);
        return column->width;
    };
    EXPECT_EQ(width(Of(variate_column, {"1", "*", "-12.5"})), 6);
    EXPECT_EQ(width(Of(variate_column, {"*"})) + width(Of(text_column, {"", "a"})), 2 + 3);
    EXPECT_EQ(width(Of(variate_column, {"1"}), "a_name_of_20_letters"), 12);
    Column* const factor = Of(factor_column, {"1", "2"});
    factor->nlevels = 10000;
    EXPECT_EQ(width(factor), 6);
    Put_Levels(*factor, {1, 2.25});
    EXPECT_EQ(width(factor), 5);
    Put_Levels(*factor, {1, 2.25}, {"ten", "seventy"});
    EXPECT_TRUE(width(factor) == 8 && factor->label_width == 7);
}

TEST_F(Facts, Statistics)
{
    // Cells, levels, then the least, the greatest, the mean and the missing ones.
    const std::tuple<Texts, std::vector<double>, std::vector<double>> cases[] = {
        {{"3", "*", "-1", "4"}, {}, {-1, 4, 2, 1}},
        {{"3", "*"}, {}, {3, 3, gone, 1}},
        {{"*", "*"}, {}, {gone, gone, gone, 2}},
        {{"1", "2", "0", "2", "*"}, {1, 2}, {1, 2, 5.0 / 3, 2}},
        {{"1", "2", "-1", "2", "*"}, {-10, 30}, {-10, 30, 50.0 / 3, 2}}};
    for (const auto& [cells, levels, summary] : cases) {
        Column* const column = Of(levels.empty() ? variate_column : factor_column, cells);
        if (!levels.empty())
            Put_Levels(*column, levels);
        Column_Summary got{};
        ASSERT_TRUE(Column_Statistics(column, got));
        EXPECT_EQ((std::vector<double>{got.min, got.max, got.mean, 1.0 * got.missing}), summary);
    }
}

TEST_F(Facts, Values_That_Repeat_Suggest_A_Factor)
{
    const Texts factors[] = {{"1", "1"},
                             {"1", "2", "1"},
                             {"1", "2", "3", "4", "4", "*", "*", "*"},
                             {"1", "1.0000000000001", "2", "1.999999999999"}};
    for (const Texts& cells : factors)
        EXPECT_TRUE(Should_Be_Factor(Of(variate_column, cells))) << cells[1];
    const Texts others[] = {{"1", "*"},
                            {"0", "1e-300"},
                            {"1", "2", "3", "1"},
                            {"1", "2", "*", "*", "*"},
                            {"1", "1.00000000001", "2", "1.99999999999"}};
    for (const Texts& cells : others)
        EXPECT_FALSE(Should_Be_Factor(Of(variate_column, cells))) << cells[1];
    Texts fifty;
    for (int i = 0; i < 150; ++i)
        fifty.push_back(std::to_string(i % 50));
    EXPECT_TRUE(Should_Be_Factor(Of(variate_column, fifty)));
    fifty.emplace_back("50");
    EXPECT_FALSE(Should_Be_Factor(Of(variate_column, fifty)));
    EXPECT_TRUE(Should_Be_Factor(Of(text_column, {"a", "b", "", "a", "b", "b"})));
    EXPECT_FALSE(Should_Be_Factor(Of(text_column, {"a", "A", "a "})));
    EXPECT_FALSE(Should_Be_Factor(Of(factor_column, {"1", "1", "1"})));
}

TEST_F(Facts, Missing_Values_Change_Wherever_They_Stand)
{
    Column* const column = Of(factor_column, {"*", "-1.00000000000001e307", "2", "-9"});
    Put_Levels(*column, {gone, 5});
    column->table_margin_value = gone;
    Change_Missing_Value(column, -9, gone);
    EXPECT_EQ(Numbers_Of(*column), (std::vector<double>{-9, -9, 2, -9}));
    EXPECT_EQ(column->level_values->value.number + column->range_low + column->range_high, -27);
    EXPECT_EQ(column->table_margin_value, gone);
    column->sheet->type = table_sheet;
    Change_Missing_Value(column, -9, gone);
    EXPECT_EQ(column->table_margin_value, -9);
}

}  // namespace
}  // namespace ingester

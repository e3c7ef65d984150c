#include "model/number_format.h"
#include "support/cell_lists.h"
#include "support/number_text.h"
#include "support/request_fixture.h"

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

class Facts : public Request_Test {
protected:
    /// Columns of these cells in Sheets of their own.
    static Column& Of_Numbers(std::int32_t type, const std::vector<double>& numbers)
    {
        const auto rows = static_cast<std::int32_t>(numbers.size());
        Column* const column = New_Data_Column(New_Sheet_With_Rows(rows), type, "x", rows);
        Put_Numbers(column->first_cell, numbers);
        return *column;
    }
    static Column& Of_Texts(const std::vector<std::string>& texts)
    {
        Column& column = Of_Numbers(text_column, std::vector<double>(texts.size()));
        Put_Texts(column, column.first_cell, texts);
        return column;
    }
};

TEST_F(Facts, Numbers_Print_By_Format)
{
    const struct {
        std::int32_t format, decimals;
        double value;
        const char* printed;
    } cases[] = {{1, 3, 1234.5, "1234.5"},
                 {1, 5, 1234.56, "1234.6"},
                 {1, 4, 1234.56, "1234.56"},
                 {1, 3, 0.0012345, "0.00123"},
                 {1, 2, 0.00123456789, "0.0012"},
                 {1, 2, 0.000123456789, "0.000123457"},
                 {1, -1, 1234567, "1.23457e+06"},
                 {1, 20, 0.1, "0.10000000000000000555"},
                 {1, 15, 1e13, "1e+13"},
                 {1, 9, 0, "0"},
                 {2, 2, 1234.5, "1.23e+03"},
                 {2, 0, 1234.5, "1.234500e+03"},
                 {3, 0, 2.5, "2"},
                 {3, -1, 2.5, "2.500000"},
                 {3, 2, 2.346, "2.35"},
                 {3, 99, 1, "1.0000000000000000000000000000000000000000"},
                 {4, 2, 1234567, "1.23457e+06"},
                 {4, 0, -1e306, "-1e+306"},
                 {3, 2, gone, "*"},
                 {1, 2, -1e308, "*"}};
    char text[Number_Text_Room];
    for (const auto& c : cases)
        EXPECT_EQ(std::string(text, Format_Number(text, c.value, c.format, c.decimals, gone)), c.printed)
            << c.format << ' ' << c.decimals << ' ' << c.value;
}

TEST_F(Facts, Widths)
{
    const auto width = [](Column& column, const char* name = "x") {
        column.name = name;
        Compute_Column_Width(&column);
        return column.width;
    };
    EXPECT_EQ(width(Of_Numbers(variate_column, {1, gone, -12.5})), 6);
    EXPECT_EQ(width(Of_Numbers(variate_column, {gone})), 2);
    EXPECT_EQ(width(Of_Numbers(variate_column, {1}), "a_name_of_20_letters"), 12);
    Column& texts = Of_Texts({"", "a"});
    EXPECT_EQ(width(texts) * 10 + texts.nlevels, 32);
    Column& factor = Of_Numbers(factor_column, {1, 2});
    factor.nlevels = 1000;
    EXPECT_EQ(width(factor), 5);
    ASSERT_TRUE(Put_Levels(factor, {1, 2.25}));
    EXPECT_EQ(width(factor), 5);
    ASSERT_TRUE(Put_Levels(factor, {1, 2.25}, {"ten", "seventy"}));
    EXPECT_EQ(width(factor) * 10 + factor.label_width, 87);
}

TEST_F(Facts, Statistics)
{
    const struct {
        std::vector<double> cells, levels;
        double min, max, mean;
        std::int32_t missing;
    } cases[] = {{{3, gone, -1, 4}, {}, -1, 4, 2, 1},
                 {{3, gone}, {}, 3, 3, gone, 1},
                 {{gone, gone}, {}, gone, gone, gone, 2},
                 {{1, 2, 0, 2, gone}, {1, 2}, 1, 2, 5.0 / 3, 2},
                 {{1, 2, -1, 2, gone}, {-10, 30}, -10, 30, 50.0 / 3, 2}};
    for (const auto& c : cases) {
        Column& column = Of_Numbers(c.levels.empty() ? variate_column : factor_column, c.cells);
        ASSERT_TRUE(Put_Levels(column, c.levels) || c.levels.empty());
        Column_Summary got{};
        ASSERT_TRUE(Column_Statistics(&column, got));
        EXPECT_EQ((std::vector{got.min, got.max, got.mean}), (std::vector{c.min, c.max, c.mean}));
        EXPECT_EQ(got.missing, c.missing);
    }
}

TEST_F(Facts, Values_That_Repeat_Suggest_A_Factor)
{
    std::vector<double> fifty;
    for (int i = 0; i < 150; ++i)
        fifty.push_back(i % 50);
    const std::pair<std::vector<double>, bool> cases[] = {{{1, 1}, true},
                                                          {{1, gone}, false},
                                                          {{0, 1e-300}, false},
                                                          {{1, 2, 1}, true},
                                                          {{1, 2, 3, 1}, false},
                                                          {{1, 2, 3, 4, 4, gone, gone, gone}, true},
                                                          {{1, 2, gone, gone, gone}, false},
                                                          {{1, 1 + 1e-13, 2, 2 - 1e-12}, true},
                                                          {{1, 1 + 1e-11, 2, 2 - 1e-11}, false}};
    for (const auto& [cells, expected] : cases)
        EXPECT_EQ(Should_Be_Factor(&Of_Numbers(variate_column, cells)), expected)
            << testing::PrintToString(cells);
    EXPECT_TRUE(Should_Be_Factor(&Of_Numbers(variate_column, fifty)));
    fifty.push_back(50);
    EXPECT_FALSE(Should_Be_Factor(&Of_Numbers(variate_column, fifty)));
    EXPECT_TRUE(Should_Be_Factor(&Of_Texts({"a", "b", "", "a", "b", "b"})));
    EXPECT_FALSE(Should_Be_Factor(&Of_Texts({"a", "A", "a "})));
    EXPECT_FALSE(Should_Be_Factor(&Of_Numbers(factor_column, {1, 1, 1})));
}

TEST_F(Facts, Missing_Values_Change_Wherever_They_Stand)
{
    Column& column = Of_Numbers(factor_column, {gone, gone * (1 + 1e-14), 2, -9});
    ASSERT_TRUE(Put_Levels(column, {gone, 5}));
    column.table_margin_value = gone;
    Change_Missing_Value(&column, -9, gone);
    EXPECT_EQ(Numbers_Of(column), (std::vector<double>{-9, -9, 2, -9}));
    EXPECT_EQ(column.level_values->value.number + column.range_low + column.range_high, -27);
    EXPECT_EQ(column.table_margin_value, gone);
    column.sheet->type = table_sheet;
    Change_Missing_Value(&column, -9, gone);
    EXPECT_EQ(column.table_margin_value, -9);
}

}  // namespace
}  // namespace ingester

#include "model/number_format.h"
#include "support/cell_lists.h"

#include <cmath>

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

using Facts = Request_Test;

TEST_F(Facts, Numbers_Print_As_The_C_Library_Does)
{
    char text[Number_Text_Room];
    const std::vector<double> numbers = {0.0,  -0.5,   1234.56, 0.0012345, 1e-12,  9.99e-13, 5e-324,
                                         1e12, 1.1e12, -1e13,   99999.5,   -1e306, gone};
    for (std::size_t i = 0; i < 50 * numbers.size(); ++i) {
        const double number = numbers[i / 50];
        const std::int32_t wanted = static_cast<std::int32_t>(i % 50) - 1;
        const int decimals = std::min(wanted, 40);
        const double size = std::fabs(number);
        const bool counted =
            size >= 1e-12 && size <= 1e12 && std::fabs(std::trunc(std::log10(size)) + 1) < decimals;
        const std::string expected[] = {
            counted ? Format_Text("%.*g", decimals, number) : Format_Text("%g", number),
            decimals < 1 ? Format_Text("%e", number) : Format_Text("%.*e", decimals, number),
            decimals < 0 ? Format_Text("%f", number) : Format_Text("%.*f", decimals, number),
            Format_Text("%g", number)};
        for (std::int32_t format = 1; format <= 4; ++format)
            ASSERT_EQ(std::string_view(text, Format_Number(text, number, format, wanted, gone)),
                      number > gone ? expected[format - 1] : "*")
                << number << " by " << format << " with " << wanted;
    }
}

TEST_F(Facts, Widths)
{
    const auto width = [](Column* column, const char* name = "x") {
        column->name = name;
        Compute_Column_Width(column);
        return column->width;
    };
    EXPECT_EQ(width(Lone_Column(variate_column, {"1", "*", "-12.5"})), 6);
    EXPECT_EQ(width(Lone_Column(variate_column, {"*"})) + width(Lone_Column(text_column, {"", "a"})), 2 + 3);
    EXPECT_EQ(width(Lone_Column(variate_column, {"1"}), "a_name_of_20_letters"), 12);
    Column* const factor = Lone_Column(factor_column, {"1", "2"});
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
        Column* const column = Lone_Column(levels.empty() ? variate_column : factor_column, cells);
        if (!levels.empty())
            Put_Levels(*column, levels);
        Column_Summary got{};
        ASSERT_TRUE(Column_Statistics(column, got));
        EXPECT_EQ((std::vector<double>{got.min, got.max, got.mean, 1.0 * got.missing}), summary);
    }
}

TEST_F(Facts, Values_That_Repeat_Suggest_A_Factor)
{
    Texts fifty;
    for (int i = 0; i < 150; ++i)
        fifty.push_back(std::to_string(i % 50));
    Texts more = fifty;
    more.emplace_back("50");
    const std::tuple<std::int32_t, std::vector<Texts>, bool> cases[] = {
        {variate_column, {{"1", "1"}, {"1", "2", "1"}, {"1", "2", "3", "4", "4", "*", "*", "*"}}, true},
        {variate_column, {{"1", "1.0000000000001", "2", "1.999999999999"}, fifty}, true},
        {variate_column,
         {{"1", "*"}, {"0", "1e-300"}, {"1", "2", "3", "1"}, {"1", "2", "*", "*", "*"}},
         false},
        {variate_column, {{"1", "1.00000000001", "2", "1.99999999999"}, more}, false},
        {text_column, {{"a", "b", "", "a", "b", "b"}}, true},
        {text_column, {{"a", "A", "a "}}, false},
        {factor_column, {{"1", "1", "1"}}, false}};
    for (const auto& [type, columns, result] : cases)
        for (const Texts& cells : columns)
            EXPECT_EQ(Should_Be_Factor(Lone_Column(type, cells)), result) << cells[1] << " " << cells.size();
}

TEST_F(Facts, Missing_Values_Change_Wherever_They_Stand)
{
    Column* const column = Lone_Column(factor_column, {"*", "-1.00000000000001e307", "2", "-9"});
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

#include "model/level_finder.h"

#include "support/cell_lists.h"

#include <gtest/gtest.h>

#include <random>

namespace ingester {
namespace {

class Level_Finder_Test : public Request_Test {};

std::string Random_Label(std::minstd_rand& random)
{
    std::string label;
    for (std::size_t left = random() % 5; left > 0; --left)
        label += "aAbB\xE9"[random() % 5];
    return label;
}

TEST_F(Level_Finder_Test, Finds_What_A_Search_Through_All_Levels_Finds)
{
    constexpr std::size_t most_levels = 6;
    std::minstd_rand random(5);
    for (int i = 0; i < 20000; ++i) {
        Sheet* const sheet = New_Sheet_With_Rows(1);
        Column* const factor = New_Data_Column(sheet, factor_column, "f", 1);
        Texts labels(1 + random() % most_levels);
        std::vector<double> values;
        for (std::string& label : labels) {
            label = Random_Label(random);
            values.push_back(random() % 9 == 0 ? HUGE_VAL : static_cast<double>(random() % 8) / 2);
        }
        Put_Levels(*factor, values, labels);
        Level_Finder finder;
        finder.Look_In(*factor);
        for (int text = 0; text < 4; ++text) {
            const std::string wanted = Random_Label(random);
            Set_Cell_From_Text(factor, 0, wanted);
            const std::int32_t level = finder.Of_Label(wanted);
            EXPECT_EQ(level > 0 ? level : sheet->missing_value, factor->first_cell->value.number) << wanted;
            const double number = static_cast<double>(random() % 20) / 4 - 0.5;
            EXPECT_EQ(finder.Nearest(number), Nearest_Level(*factor, number)) << number;
        }
        Free_Sheets();
    }
}

}  // namespace
}  // namespace ingester

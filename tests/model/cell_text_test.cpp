#include "model/cell_text.h"

#include "interface/process_request.h"
#include "interface/request/request.h"

#include <gtest/gtest.h>

#include <span>

namespace ingester {
namespace {

struct Case {
    const char* text;
    double value;
};

void Expect_Values(Column* column, std::span<const Case> cases)
{
    for (const auto& [text, value] : cases) {
        ASSERT_TRUE(Set_Cell_From_Text(column, 0, text));
        EXPECT_EQ(column->first_cell->value.number, value) << "'" << text << "'";
    }
}

TEST(Cell_Text, Finds_Levels_And_Numbers)
{
    Start_Request();
    Sheet* const sheet = New_Sheet_With_Rows(1);
    Column* const factor = New_Data_Column(sheet, factor_column, "f", 1);
    const char* const labels[] = {"North", "north", "Northern", "South one", "South two", "NA"};
    factor->nlevels = 6;
    Make_Labels(*factor, 6);
    Level_Node* node = factor->labels;
    for (const char* const label : labels) {
        node->value.text = factor->texts.Store(label);
        node = node->next;
    }
    Make_Level_Values(*factor, 2);
    factor->level_values->value.number = 10;
    factor->level_values->next->value.number = 20;
    const Case by_label[] = {{"north", 2},
                             {"NORTH", 1},
                             {"Northe", 3},
                             {"NORTHE", 3},
                             {"South", 4},
                             {"South twig", 5},
                             {"South three", 5},
                             {"South 3", Missing_Value},
                             {"west", Missing_Value},
                             {"", Missing_Value},
                             {"NA", 6}};
    const Case by_level[] = {{"12", 1}, {" 16 ", 2}, {"-1e9", 1}, {"x", Missing_Value}, {"*", Missing_Value}};
    const Case numbers[] = {{" 2.5 ", 2.5},        {"1e308", Greatest_Number}, {"1e999", Missing_Value},
                            {"*2", Missing_Value}, {"2 3", Missing_Value},     {" na ", Missing_Value},
                            {"", Missing_Value}};
    request.Missing_Input_Text.assign("NA");
    factor->factor_kind = factor_with_labels;
    Expect_Values(factor, by_label);
    factor->factor_kind = factor_with_levels;
    Expect_Values(factor, by_level);
    Expect_Values(New_Data_Column(sheet, variate_column, "v", 1), numbers);
}

TEST(Cell_Text, Knows_Missing_Texts)
{
    Start_Request();
    EXPECT_TRUE(Is_Missing_Text("*") && Is_Missing_Text(" * ") && Is_Missing_Text(" ")
                && Is_Missing_Text(""));
    EXPECT_FALSE(Is_Missing_Text("**") || Is_Missing_Text("NA"));
    request.Missing_Input_Text.assign("NA");
    EXPECT_TRUE(Is_Missing_Text("na"));
    EXPECT_FALSE(Is_Missing_Text("*"));
    request.Missing_Input_Text.clear();
    EXPECT_FALSE(Is_Missing_Text("") || Is_Missing_Text("*"));
    EXPECT_TRUE(Is_Missing_Text({}));
}

}  // namespace
}  // namespace ingester

// Joins that must lose no level, key, label or day.
#include "model/calendar.h"
#include "model/factors.h"
#include "model/join/append.h"
#include "model/join/concatenate.h"
#include "model/join/join_sheets.h"

#include <chrono>

namespace ingester {
namespace {

using Join_Losses = Request_Test;

/// What two Sheets of one column f become, in words: the levels, and the cells.
std::string Joined_Factor(Sheet* target, Sheet* source, bool merge)
{
    Merge_Request wanted = By_First_Column(target, source);
    wanted.update_columns = true;
    EXPECT_TRUE(merge ? Merge_Sheets(wanted) : Append_Sheet(target, {.source = source}));
    EXPECT_EQ(Check_Sheet(*target), "");
    const Column& factor = *Find_Column(target, "f");
    std::string told = factor.type == factor_column ? Levels_Of(factor) : "";
    for (const std::string& cell : Plain_Cells(factor))
        told += "|" + cell;
    return told;
}

TEST_F(Join_Losses, People_Lose_No_Level_And_No_Number)
{
    const struct {
        const char* cells;
        std::vector<double> values;
        Texts labels;
        const char* source;
        std::vector<double> source_values;
        Texts source_labels;
        const char* host;
        const char* people;
    } cases[] = {
        {"f F1|2", {}, {}, "f F1|2", {3, 4}, {}, "#2|1|2|1|2", "#4|1|2|3|4"},
        {"f F1|2", {1, 2}, {}, "f V3|8", {}, {}, "1,2|1|2|2|2", "1,2,3,8|1|2|3|8"},
        {"f F1|2", {}, {}, "f V1.5|70000", {}, {}, "#2|1|2||", "1,2,1.5,70000|1|2|1.5|70000"},
        {"f F1|2", {}, {"A", "B"}, "f V2|1", {}, {}, "A,B|A|B||", "A,B|A|B|B|A"},
        {"f F1|2", {}, {"A", "B"}, "f V2|3", {}, {}, "A,B|A|B||", "A,B,3|A|B|B|3"},
        {"f F1|2", {}, {}, "f F1|2|3", {}, {"ctl", "01", "1"}, "#3|1|2|1|2|3", "1,2,ctl,01|1|2|ctl|01|1"},
        {"f F1|2", {}, {"01", "1"}, "f V1", {}, {}, "01,1|01|1|1", "01,1|01|1|1"},
        {"f F1|2", {}, {"A", "7"}, "f V7|9", {}, {}, "A,7|A|7|7|", "A,7,9|A|7|7|9"},
        {"f F1|2", {}, {"1.50", "2"}, "f V1.5", {}, {}, "1.50,2|1.50|2|1.50", "1.50,2|1.50|2|1.50"},
        {"f F1|2", {10, 20}, {}, "f F1|2", {}, {"20", "ctl"}, "10,20|10|20|10|20", "10,20,ctl|10|20|20|ctl"},
        {"f F1|2", {}, {}, "f F2|1", {}, {"A", "B"}, "#2|1|2|2|1", "A,B|A|B|B|A"},
        {"f F1|2",
         {10, 20},
         {},
         "f F1|2",
         {20, 30},
         {"x", "y"},
         "10,20,30|10|20|20|30",
         "10=10,x=20,y=30|10|x|x|y"},
        {"f V1|2", {}, {}, "f F1|2", {}, {"3", "A"}, "|1|2|3|", "|1|2|3|A"},
    };
    for (const auto& one : cases)
        for (const bool people : {false, true}) {
            Start_Request("t");
            request.people.set(static_cast<std::size_t>(People_Rule::kept_levels), people);
            Sheet* const target = Sheet_Of(one.cells);
            Sheet* const source = Sheet_Of(one.source);
            if (!one.values.empty() || !one.labels.empty())
                Put_Levels(*target->last_column, one.values, one.labels);
            if (!one.source_values.empty() || !one.source_labels.empty())
                Put_Levels(*source->last_column, one.source_values, one.source_labels);
            EXPECT_EQ(Joined_Factor(target, source, false), people ? one.people : one.host) << one.source;
        }
}

/// A Factor of two dates, as day counts or as serials, and shown by a code of its own.
Sheet* Dated_Factor(std::int16_t date_form, std::int32_t format, const std::vector<double>& days, bool factor)
{
    Sheet* const sheet = Sheet_Of(factor ? "f F1|2" : "f V0|0");
    Column& column = *sheet->last_column;
    Look_Like_Dates(column, date_form);
    column.date_format = format;
    std::vector<double> values = days;
    for (double& value : values)
        value -= date_form == 0 ? Serial_Offset : 0.0;
    if (factor)
        Put_Levels(column, values);
    else
        for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
            cell->value.number = values[cell->prev == nullptr ? 0 : 1];
    return sheet;
}

TEST_F(Join_Losses, Dates_Of_Both_Forms_Are_One_Day_In_Factors_As_Well)
{
    for (const bool target_factor : {false, true})
        for (const bool source_factor : {false, true})
            for (const std::int16_t form : {std::int16_t{0}, std::int16_t{1}})
                for (const bool merge : {false, true}) {
                    Start_Request("t");
                    request.people.set(static_cast<std::size_t>(People_Rule::kept_levels));
                    Sheet* const target = Dated_Factor(form, 2, {153388, 153389}, target_factor);
                    Sheet* const source = Dated_Factor(static_cast<std::int16_t>(1 - form), 27,
                                                       {153389, 153393}, source_factor);
                    EXPECT_EQ(merge ? Merge_Sheets(By_First_Column(target, source))
                                    : Append_Sheet(target, {.source = source}),
                              true);
                    const Texts expected =
                        merge ? Texts{"15/02/2020", "16/02/2020", "20/02/2020"}
                              : Texts{"15/02/2020", "16/02/2020", "16/02/2020", "20/02/2020"};
                    EXPECT_EQ(Plain_Cells(*Column_At(target, 1)), expected)
                        << target_factor << source_factor << form << merge;
                }
    // A host compares them so where numbers meet levels.
    Sheet* const target = Dated_Factor(1, 2, {153388, 153389}, true);
    ASSERT_TRUE(Merge_Sheets(By_First_Column(target, Dated_Factor(0, 2, {153389, 153393}, false))));
    EXPECT_EQ(Plain_Cells(*Column_At(target, 1)), (Texts{"15/02/2020", "16/02/2020", "20/02/2020"}));
}

TEST_F(Join_Losses, Keys_Never_Become_Empty)
{
    const std::string types = "Columns k and k data types do not match.\n:\n";
    const std::string no_labels = "Factor k does not have labels to match with text column k.\n:\n";
    const struct {
        const char* target;
        Texts labels;
        const char* source;
        Texts source_labels;
        std::string host, people;  ///< the message, or else the keys and what stands beside them
    } cases[] = {
        {"k F1|2; y V1|2", {"A", "70001"}, "k V70001|70002; w V7|8", {}, types, "k A|70001|70002; w *|7|8"},
        {"k F1|2; y V1|2", {"A", "70001"}, "k V70001; w V7", {}, "k A|70001; w *|7", "k A|70001; w *|7"},
        {"k F1|2; y V1|2", {"0.3", "x"}, "k V0.3; w V7", {}, "k 0.3|x; w 7|*", "k 0.3|x; w 7|*"},
        {"k F1|2; y V1|2", {"A", "B"}, "k V2|1; w V7|8", {}, "k A|B; w 8|7", "k A|B; w 8|7"},
        {"k F1|2; y V1|2", {}, "k V2|1.5; w V7|8", {}, types, "k 1|2|1.5; w *|7|8"},
        {"k V5|6; y V1|2", {}, "k F1|2; w V7|8", {"6", "A"}, types, types},
        {"k F1|2; y V1|2", {}, "k TA|2; w V7|8", {}, no_labels, "k 1|2|A; w *|8|7"},
        {"k V5|6; y V1|2", {}, "k F1|2; w V7|8", {"6", "9"}, "k 5|6|9; w *|7|8", "k 5|6|9; w *|7|8"},
        {"k V1|6; y V1|2", {}, "k F1|2; w V7|8", {"x", "A"}, "k 1|6|2; w 7|*|8", "k 1|6|2; w 7|*|8"},
    };
    for (const auto& one : cases)
        for (const bool people : {false, true}) {
            Start_Request("t");
            request.people.set(static_cast<std::size_t>(People_Rule::kept_levels), people);
            Sheet* const target = Sheet_Of(one.target);
            Sheet* const source = Sheet_Of(one.source);
            if (!one.labels.empty())
                Put_Levels(*Column_At(target, 1), {}, one.labels);
            if (!one.source_labels.empty())
                Put_Levels(*Column_At(source, 1), {}, one.source_labels);
            const bool merged = Merge_Sheets(By_First_Column(target, source));
            std::string told = merged ? "k" : Messages();
            for (const std::string& key : merged ? Plain_Cells(*Column_At(target, 1)) : Texts{})
                told += (told == "k" ? " " : "|") + key;
            for (const Cell_Node* cell = merged ? target->last_column->first_cell : nullptr; cell != nullptr;
                 cell = cell->next)
                told += (cell->prev == nullptr ? "; w " : "|") + Render(*target->last_column, *cell);
            EXPECT_EQ(told, people ? one.people : one.host) << one.source;
        }
}

TEST_F(Join_Losses, The_Margin_Of_A_Table_Stays_Its_Last_Row)
{
    for (const bool marked : {false, true}) {
        Start_Request("t");
        Sheet* const target = Sheet_Of("f F1|2|3; b B10|20|30", table_sheet);
        Put_Levels(*Column_At(target, 1), {}, {"x", "y"});
        target->table_ways = target->has_margins = 1;
        target->margin_level = 3;
        Sheet* const source = Sheet_Of("f F1|2|3; b B7|8|15", table_sheet);
        Put_Levels(*Column_At(source, 1), {}, {"z", "x"});
        source->table_ways = source->has_margins = 1;
        Append_Request wanted{.source = source};
        if (marked)
            wanted.source_column_name = "f";
        wanted.new_label = marked ? "n" : "";
        ASSERT_TRUE(Append_Sheet(target, wanted));
        const Column& factor = *Column_At(target, 1);
        EXPECT_EQ(Levels_Of(factor), marked ? "x,y,n,z" : "x,y,z");
        EXPECT_EQ(Render(target), marked ? "f F1|2|4|1|5; b T10|20|7|8|30" : "f F1|2|3|1|4; b T10|20|7|8|30");
        EXPECT_EQ(target->margin_level, factor.nlevels + 1);
    }
}

// Looking each level up in a list took seconds for as many.
TEST_F(Join_Losses, Sources_Are_Told_For_Many_Levels_At_Once)
{
    Sheet* const target = New_Sheet_With_Rows(80000);
    Column* const factor = New_Data_Column(target, variate_column, "id", 80000);
    double value = 0.5;
    for (Cell_Node* cell = factor->first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = value++;
    ASSERT_TRUE(Variate_To_Factor(factor, true, 0));
    const auto start = std::chrono::steady_clock::now();
    ASSERT_TRUE(
        Append_Sheet(target, {.source = Sheet_Of("x V1"), .source_column_name = "id", .new_label = "n"}));
    EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(1));
    EXPECT_EQ(factor->last_cell->value.number, 80001);
    EXPECT_EQ(factor->label_count, 80001);
}

TEST_F(Join_Losses, A_Number_Between_Two_Levels_Is_The_First)
{
    for (const char* const told : {"k V1|2; f V1.5|1", "k V1|2; f T1.5|1"}) {
        Start_Request("t");
        Sheet* const target = Sheet_Of("k V1|2; f F1|1");
        Put_Levels(*target->last_column, {2, 1});
        Merge_Request wanted = By_First_Column(target, Sheet_Of(told));
        wanted.update_columns = true;
        ASSERT_TRUE(Merge_Sheets(wanted));
        EXPECT_EQ(Render(target), "k V1|2; f F1|2");
        EXPECT_NE(Messages().find("some values of f have no equal in f"), std::string::npos) << told;
    }
}

TEST_F(Join_Losses, The_Source_Column_Is_Found_Under_The_Name_That_It_Was_Given)
{
    Sheet* const target = Sheet_Of("x V1");
    Append_Request wanted{.source_column_name = "my src", .new_label = "a"};
    for (const char* const label : {"a", "b"}) {
        wanted.source = Sheet_Of("x V2");
        wanted.new_label = label;
        ASSERT_TRUE(Append_Sheet(target, wanted));
        target->last_column->name = "my_src";  // as a file gives it back
    }
    EXPECT_EQ(Render(target), "x V1|2|2; my_src F1|2|3");
    request.people.set(static_cast<std::size_t>(People_Rule::kept_levels));
    ASSERT_TRUE(Factor_To_Text(target->last_column));  // as a text of other programs has it
    wanted.source = Sheet_Of("x V2");
    wanted.new_label = "c";
    ASSERT_TRUE(Append_Sheet(target, wanted));
    EXPECT_EQ(Plain_Cells(*target->last_column), (Texts{"Original", "a", "b", "c"}));
}

TEST_F(Join_Losses, Units_Of_New_Data_Stand_Beside_Others_For_People)
{
    for (const bool people : {false, true}) {
        Start_Request("t");
        request.people.set(static_cast<std::size_t>(People_Rule::kept_levels), people);
        Sheet* const target = Sheet_Of("u Up|q; a V1|2");
        EXPECT_TRUE(Concatenate_Sheets(target, Sheet_Of("v Ur|s; b V3|4; n N5|6"), false));
        EXPECT_EQ(Check_Sheet(*target), "");
        std::string names;
        for (const std::string& name : Names_Of(target))
            names += name + " ";
        EXPECT_EQ(names, people ? "Row u a v n b " : "Row u a b ");
    }
}

}  // namespace
}  // namespace ingester

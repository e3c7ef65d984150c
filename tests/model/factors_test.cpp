#include "model/factors.h"

#include "model/convert_column.h"
#include "model/factor_order.h"
#include "model/factor_setup.h"
#include "model/told_sheets.h"

#include <cmath>
#include <map>

namespace ingester {
namespace {

using Factors = Request_Test;

/// A column in a Sheet of its own, which sorts levels unless told otherwise.
Column* Of(std::int32_t type, const Texts& cells, bool sorted = true)
{
    Column* const column = Lone_Column(type, cells);
    column->sheet->settings.auto_factors = sorted ? 1 : 0;
    return column;
}

/// Cells and levels, as "F2|1|* a,b"; faults of the Sheet stand first.
std::string Told(const Column* column)
{
    const std::string text = Check_Sheet(*column->sheet) + Render(column->sheet, false);
    return column->type == factor_column ? text + " " + Levels_Of(*column) : text;
}

TEST_F(Factors, Of_Texts)
{
    const std::string long_a = std::string(250, 'a');
    const std::tuple<Texts, bool, bool, std::string> cases[] = {
        // cells, sorted, case-free, as they are told
        {{"b", "a", "", "b"}, true, false, "F2|1|*|2 a,b"},
        {{"b", "a", "", "b"}, false, false, "F1|2|*|1 b,a"},
        {{"b", "_", "B", "\xE9", "a"}, true, false, "F4|2|1|5|3 B,_,a,b,\xE9"},
        {{"b", "_", "B", "\xE9", "A"}, true, true, "F3|1|3|4|2 _,A,b,\xE9"},
        {{"site 10", "site 1", "site", "SITE 1"}, true, true, "F3|2|1|2 site,site 1,site 10"},
        {{"b", "abcdefgh2", "abcdefgh1"}, true, false, "F3|2|1 abcdefgh1,abcdefgh2,b"},
        {{"Jan", "Mar", "Feb"}, true, false, "F1|3|2 Jan,Feb,Mar"},
        {{"july", "May", "Sept", "JUNE"}, true, false, "F3|1|4|2 May,JUNE,july,Sept"},
        {{"July", "Jun", "May"}, true, false, "F3|2|1 May,Jun,July"},
        {{"N", "S", "E", "W", "nnw"}, true, false, "F1|3|2|4|5 N,E,S,W,nnw"},
        {{"Summer", "Winter"}, true, false, "F2|1 Winter,Summer"},
        {{"Wed", "mon", "Monday", "Sunny"}, true, false, "F4|3|2|1 Sunny,Monday,mon,Wed"},
        {{"North", "East"}, true, false, "F2|1 East,North"},
        {{"", " "}, true, false, "F*|* #7"},
        {{long_a + "x", long_a + "y"}, true, false, "F1|1 " + long_a},
    };
    for (const auto& [cells, sorted, by_case_free, told] : cases) {
        Column* const column = Of(long_text_column, cells, sorted);
        ASSERT_TRUE(Text_To_Factor(column, by_case_free, true, 7));
        EXPECT_EQ(Told(column), told);
    }
    Column* const plain = Of(text_column, {"", ""});
    EXPECT_TRUE(Text_To_Factor(plain, false, true, 0) && plain->nlevels == 1 && plain->format == 1);
    Column* const labelled = Of(text_column, {" b", "b"});
    ASSERT_TRUE(Text_To_Factor(labelled, false, false, 0));
    EXPECT_EQ(Told(labelled), "F1|2  b,b");
    EXPECT_TRUE(labelled->format == 4 && labelled->label_width == 2 && labelled->text_cell_width == 91);
    EXPECT_FALSE(Text_To_Factor(labelled, false, true, 0) || Text_To_Factor(nullptr, false, true, 0));
}

TEST_F(Factors, Of_Numbers)
{
    const std::tuple<Texts, bool, bool, const char*> cases[] = {
        // cells, levels are made, sorted, as they are told
        {{"3", "1", "2", "*", "3"}, true, true, "F3|1|2|*|3 #3"},
        {{"3", "1", "2"}, true, false, "F1|2|3 3,1,2"},
        {{"1", "2", "1"}, true, false, "F1|2|1 #2"},
        {{"20", "10", "*"}, true, true, "F2|1|* 10,20"},
        {{"0", "-0", "1e300", "-1"}, true, true, "F2|2|3|1 -1,0,1e+300"},
        {{"*", "*"}, true, true, "F*|* #7"},
        {{"3", "1.5", "-4", "*", "65536"}, false, true, "F3|2|1|*|* #3"},
        {{"65535"}, false, true, "F65535 #65535"},
    };
    for (const auto& [cells, make_levels, sorted, told] : cases) {
        Column* const column = Of(variate_column, cells, sorted);
        ASSERT_TRUE(Variate_To_Factor(column, make_levels, 7));
        EXPECT_EQ(Told(column), told);
    }
    Column* const date = Of(variate_column, {"5"});
    date->format = date_format_mark;
    EXPECT_TRUE(Variate_To_Factor(date, true, 0) && date->format == date_format_mark);
    Column* const missing = Of(variate_column, {"*", "65535.5"});
    EXPECT_FALSE(Variate_To_Factor(missing, false, 0) || Variate_To_Factor(date, true, 0));
    EXPECT_EQ(Told(missing), "V*|65535.5");
    EXPECT_NE(Messages().find("Spreadsheet Error: Cannot convert variate x to factor\n"
                              "No factor levels - all units missing.\n"),
              std::string::npos);
}

TEST_F(Factors, Many_Levels_And_Too_Many)
{
    Texts cells;
    std::map<std::string, double> levels;  // the plain way to sorted levels
    for (int i = 0; i < 40000; ++i)
        levels[cells.emplace_back("common start " + std::to_string(std::int64_t{i} * i * i % 20011))];
    double level = 0;
    for (auto& [text, number] : levels)
        number = ++level;
    Column* const column = Of(text_column, cells);
    ASSERT_TRUE(Text_To_Factor(column, false, true, 0) && Check_Sheet(*column->sheet).empty());
    const Cell_Node* cell = column->first_cell;
    for (const std::string& text : cells) {
        ASSERT_EQ(cell->value.number, levels[text]) << text;
        cell = cell->next;
    }
    Texts fifty;  // of one hundred
    for (int i = 0; i < 100; ++i)
        fifty.push_back(std::to_string(i / 2));
    Texts late(fifty.begin(), fifty.begin() + 72);  // the first half of these holds 18 values
    for (std::size_t i = 0; i < 72; ++i)
        late.push_back(std::to_string(100 + i));
    const Texts early(late.rbegin(), late.rend());
    const std::string labels = "Cannot convert this text to a factor: too many distinct labels.\n:\n";
    const std::string values = "Cannot convert this variate to a factor: too many distinct values.\n:\n";
    const std::string many = "Cannot convert this Variate to a Factor: too many distinct values.\n:\n";
    const std::tuple<std::int32_t, Texts, std::size_t, std::string> cases[] = {
        {text_column, fifty, 49, labels},    {variate_column, fifty, 36, values},
        {variate_column, fifty, 49, values}, {variate_column, fifty, 50, ""},
        {variate_column, late, 60, values},  {variate_column, early, 80, many},
        {variate_column, early, 37, many}};
    for (const auto& [type, numbers, most, told] : cases) {
        Column* const tried = Of(type, numbers);
        const std::string before = Told(tried);
        EXPECT_EQ(type == text_column ? Text_To_Factor(tried, false, true, 0, 8 * most)
                                      : Variate_To_Factor(tried, true, 0, 8 * most),
                  told.empty());
        EXPECT_EQ(Messages(), told);
        EXPECT_EQ(Told(tried) == before, !told.empty());
    }
}

/// A Factor of three levels, with values and labels.
Column* Three_Levels(const Texts& labels = {"ten", "twenty", "thirty"})
{
    Column* const column = Of(factor_column, {"1", "2", "3", "0", "*"});
    Put_Levels(*column, {10, 20, 30}, labels);
    column->format = labels.empty() ? 1 : 4;
    return column;
}

TEST_F(Factors, Levels_Move_With_Values_Labels_And_Cells)
{
    Column* const column = Three_Levels();
    const std::vector<std::int32_t> refused[] = {{1, 2}, {1, 2, 2}, {0, 1, 2}, {1, 2, 4}, {1, 2, 3, 4}};
    for (const auto& positions : refused)
        EXPECT_FALSE(Reorder_Factor_Levels(column, positions));
    const std::vector<std::int32_t> turned = {3, 1, 2};
    column->protected_column = 1;
    EXPECT_FALSE(Reorder_Factor_Levels(column, turned));
    column->protected_column = 0;
    EXPECT_EQ(Told(column), "F1|2|3|0|* ten=10,twenty=20,thirty=30");
    EXPECT_TRUE(Reorder_Factor_Levels(column, turned));
    EXPECT_EQ(Told(column), "F2|3|1|0|* thirty=30,ten=10,twenty=20");
    EXPECT_FALSE(Has_Natural_Order(column, compass_order) || Apply_Natural_Order(column, 9));
}

TEST_F(Factors, Every_Pair_Of_Types)
{
    const auto text = [] { return Of(text_column, {"1", "", "b"}); };
    const auto number = [] { return Of(variate_column, {"2.5", "*", "7"}); };
    const auto units_text = [] { return Of(units_text_column, {"b", "", "a"}); };
    const auto units_number = [] { return Of(units_variate_column, {"2.5", "*", "7"}); };
    const auto labels = [] { return Three_Levels(); };
    const auto levels = [] { return Three_Levels({}); };
    const auto long_labels = [] { return Three_Levels({std::string(91, 'x'), "y", "z"}); };
    const std::tuple<Column* (*)(), std::int32_t, const char*> cases[] = {
        {text, factor_column, "F1|*|2; V*|*|* 1,b"},
        {text, units_text_column, "U1||b; V*|*|*"},
        {text, long_text_column, nullptr},
        {number, text_column, "T2.5||7; V*|*|*"},
        {number, factor_column, "F1|*|2; V*|*|* 2.5,7"},
        {number, units_variate_column, "U2.5|*|7; V*|*|*"},
        {units_number, variate_column, "V2.5|*|7; V*|*|*"},
        {units_number, text_column, "T2.5||7; V*|*|*"},
        {units_number, factor_column, "F1|*|2; V*|*|* 2.5,7"},
        {units_text, text_column, "Tb||a; V*|*|*"},
        {units_text, factor_column, "F2|*|1; V*|*|* a,b"},
        {units_text, variate_column, "V*|*|*; V*|*|*"},
        {units_text, units_variate_column, nullptr},
        {labels, text_column, "Tten|twenty|thirty||; V*|*|*|*|*"},
        {labels, variate_column, "V10|20|30|*|*; V*|*|*|*|*"},
        {labels, units_text_column, "Uten|twenty|thirty||; V*|*|*|*|*"},
        {labels, units_variate_column, "U1|2|3|*|*; V*|*|*|*|*"},
        {levels, text_column, "T10|20|30||; V*|*|*|*|*"},
        {long_labels, text_column, "L91 characters|y|z||; V*|*|*|*|*"},
        {long_labels, units_text_column, nullptr}};
    for (const auto& [make, to, told] : cases) {
        Column* const column = make();
        New_Data_Column(column->sheet, variate_column, "y", column->length);
        const std::string before = Told(column);
        const std::int32_t from = column->type;
        column->sheet->read_only = 1;
        EXPECT_FALSE(Convert_Column(column, from, to, false, true));
        column->sheet->read_only = 0;
        EXPECT_TRUE(Convert_Column(column, from, from, false, true) && column->modified == 0);
        EXPECT_EQ(Convert_Column(column, from, to, false, true), told != nullptr) << before;
        EXPECT_EQ(Told(column), told != nullptr ? told : before);
    }
    Column* const endless = number();
    endless->last_cell->value.number = HUGE_VAL;
    EXPECT_TRUE(Variate_To_Text(endless) && endless->last_cell->Text() == "inf");
    Column* const first = units_text();
    Column* const second = New_Data_Column(first->sheet, variate_column, "y", 3);
    EXPECT_FALSE(Convert_Column(second, variate_column, units_variate_column, false, true));
}

TEST_F(Factors, Setup_Of_Level_Data)
{
    const std::tuple<Factor_Setup, Texts, std::vector<double>, std::vector<double>> cases[] = {
        // What there is, then labels, values and order as they become
        {{.nlevels = 2, .values = {2.5}, .order = {2}, .dirty = true}, {"2.5", "2"}, {2.5, 2}, {2, 2}},
        {{.nlevels = 3, .labels = {{}}, .order = {0, 5, 0}}, {"1", "2", "3"}, {1, 2, 3}, {1, 5, 3}},
        {{.column = Three_Levels({}), .nlevels = 4}, {"10", "20", "30", "4"}, {10, 20, 30, 4}, {}},
        {{.column = Three_Levels(), .nlevels = 4}, {"ten", "twenty", "thirty", "4"}, {10, 20, 30, 4}, {}}};
    for (auto [setup, labels, values, order] : cases) {
        const bool no_values = setup.values.empty();
        EXPECT_TRUE(Setup_Factor_Data(setup, true) && !setup.dirty && setup.values.empty() == no_values);
        EXPECT_EQ(Texts(setup.labels.begin(), setup.labels.end()), labels);
        EXPECT_TRUE(Setup_Factor_Data(setup, false) && setup.values == values && setup.order == order);
    }
    Factor_Setup none;
    EXPECT_FALSE(Setup_Factor_Data(none, true));
}

}  // namespace
}  // namespace ingester

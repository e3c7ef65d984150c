// Columns as readers of other programs' files make them, and as writers take them apart.
#include "model/calendar.h"
#include "model/cell_appender.h"
#include "model/claims.h"
#include "model/column_names.h"
#include "model/column_printer.h"
#include "model/factor_lists.h"
#include "model/foreign_dates.h"
#include "model/subset.h"
#include "model/told_sheets.h"

#include <cmath>
#include <limits>

namespace ingester {
namespace {

using Foreign_Columns = Request_Test;

constexpr double gone = Missing_Value;

/// Each level of a Factor, as "value=label" or what there is of it.
std::string Told_Levels(const Column& factor)
{
    char room[Number_Text_Room];
    std::string told;
    const Level_Node* value = factor.level_values;
    const Level_Node* label = factor.labels;
    for (std::int32_t level = 0; level < factor.nlevels; ++level) {
        told.append(level > 0 ? "|" : "");
        if (value != nullptr)
            told.append(room, Print_General(room, value->value.number, 6)).append("=");
        told.append(label != nullptr ? std::string(label->Text()) : "");
        value = value == nullptr ? nullptr : value->next;
        label = label == nullptr ? nullptr : label->next;
    }
    return told;
}

TEST_F(Foreign_Columns, Levels_Come_From_The_Lists_That_There_Are)
{
    const std::string wide(300, 'w');
    struct Case {
        std::vector<double> values;
        std::vector<std::string_view> labels;
        std::int32_t plain_levels;
        std::int32_t kind;
        std::int32_t nlevels;
        std::int32_t label_width;
        std::string told;
    };
    const Case cases[] = {
        {{}, {}, 3, plain_factor, 3, 0, "||"},
        {{}, {}, 0, plain_factor, 1, 0, ""},
        {{5, 7.5}, {}, 9, factor_with_levels, 2, 0, "5=|7.5="},
        {{}, {"a", "", "ccc"}, 9, factor_with_labels, 3, 3, "a||ccc"},
        {{5, 7}, {"a", "b"}, 9, factor_with_labels, 2, 1, "5=a|7=b"},
        {{5, 7.25}, {"a"}, 9, factor_with_labels, 2, 4, "5=a|7.25=7.25"},
        {{5}, {"a", "b"}, 9, factor_with_labels, 2, 1, "5=a|2=b"},
        {{}, {wide}, 9, factor_with_labels, 1, 250, wide.substr(0, 250)},
    };
    Column* const factor = New_Data_Column(New_Sheet_With_Rows(1), factor_column, "f", 1);
    for (const Case& c : cases) {  // each in the place of the one before
        ASSERT_TRUE(
            Set_Levels(*factor, {.values = c.values, .labels = c.labels, .plain_levels = c.plain_levels}));
        EXPECT_EQ(std::tuple(factor->factor_kind, factor->nlevels, factor->label_width),
                  std::tuple(c.kind, c.nlevels, c.label_width))
            << c.told;
        if (c.kind != plain_factor) {
            EXPECT_EQ(Told_Levels(*factor), c.told);
        }
        EXPECT_EQ(Check_Sheet(*factor->sheet), "") << c.told;
    }
    ASSERT_TRUE(Set_Levels(*factor, {.plain_levels = std::numeric_limits<std::int32_t>::max()}));
    EXPECT_EQ(factor->nlevels, 65535) << "nobody may ask for more by a number alone";
    ASSERT_EQ(request.losses.Entries().size(), 1U);
    EXPECT_EQ(request.losses.Entries().front().kind, Loss_Kind::text_cut);
}

TEST_F(Foreign_Columns, Days_Of_Other_Programs_Become_Dates)
{
    constexpr double inf = std::numeric_limits<double>::infinity();
    const double day_1960 = Date_To_Number(1, 1, 1960, 1);
    struct Case {
        Foreign_Dates dates;
        std::vector<double> numbers;
        std::vector<std::string> shown;
        int lost;
    };
    const Case cases[] = {
        {{.display = day_name_year_format, .shift = day_1960},
         {0, -1, 21915, gone},
         {"01-Jan-1960", "31-Dec-1959", "01-Jan-2020", "*"},
         0},
        {{.display = full_date_time_format, .divisor = 86400, .shift = day_1960},
         {0, 86399, -1},
         {"1960-01-01 00:00:00", "1960-01-01 23:59:59", "1959-12-31 23:59:59"},
         0},
        {{.display = time_format, .scale = 1.0 / 24}, {0, 13.5}, {" 0:00:00", "13:30:00"}, 0},
        {{.display = dashed_year_month_day_format, .shift = 21916, .date_form = 0},
         {0, -21916, -21917, 1e300},
         {"1960-01-01", "1899-12-31", "*", "*"},
         2},
        {{.display = year_month_day_format, .shift = day_1960},
         {inf, -inf, std::nan(""), -131429, 2936549},
         {"*", "*", "*", "*", "9999/12/31"},
         2},
    };
    for (const Case& c : cases) {
        Start_Request("t");
        Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(c.numbers.size()));
        Column* const column = New_Data_Column(sheet, variate_column, "d", sheet->row_count);
        for (std::size_t row = 0; row < c.numbers.size(); ++row)
            Cell_At(column, static_cast<std::int32_t>(row))->value.number = c.numbers[row];
        Make_Dates(*column, c.dates);
        std::vector<std::string> shown;
        char room[Number_Text_Room];
        for (const Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            shown.emplace_back(Format_Cell(*column, *cell, room));
        EXPECT_EQ(shown, c.shown);
        EXPECT_EQ(column->date_form, c.dates.date_form);
        const std::vector<Loss>& losses = request.losses.Entries();
        EXPECT_EQ(losses.empty() ? 0 : losses.front().count, c.lost);
    }
}

TEST_F(Foreign_Columns, Texts_And_Blanks_Go_In_As_They_Are)
{
    Sheet* const sheet = New_Sheet();
    sheet->missing_value = -9;
    std::string told;
    for (const std::int32_t type : {variate_column, factor_column, text_column, long_text_column}) {
        Column* const column = New_Data_Column(sheet, type, "c", 0);
        Cell_Appender cells(*column, 1);
        cells.Append_Missing(20);
        cells.Append_Missing();
        cells.Finish(21);
        const Cell_Node& last = *column->last_cell;
        if (Is_Text_Like(type)) {
            EXPECT_EQ(last.Text(), "");
        } else {
            EXPECT_EQ(last.value.number, -9);
        }
    }
    Column* const text = sheet->last_column->prev;
    for (const std::size_t size : {90U, 91U, 10001U}) {
        Set_Wide_Text(*text, *text->last_cell, std::string(size, 'x'), 7);
        EXPECT_EQ(text->last_cell->Text().size(), std::min<std::size_t>(size, 10000));
        EXPECT_EQ(text->type, size > 90 ? long_text_column : text_column);
    }
    ASSERT_EQ(request.losses.Entries().size(), 1U);
    EXPECT_EQ(request.losses.Entries().front().first_row, 7);
}

TEST_F(Foreign_Columns, Claims_Of_Size_Are_Held_Against_Bytes)
{
    constexpr std::int64_t most = std::numeric_limits<std::int64_t>::max();
    EXPECT_TRUE(Claim_Is_Acceptable(40'000'000, 1, 10));
    EXPECT_FALSE(Claim_Is_Acceptable(40'000'001, 1, 10));
    EXPECT_TRUE(Claim_Is_Acceptable(1000, 100'000, 50'000'000));
    EXPECT_FALSE(Claim_Is_Acceptable(1001, 100'000, 50'000'000));
    EXPECT_TRUE(Claim_Is_Acceptable(1001, 100'000, 50'000'000, 8));
    EXPECT_TRUE(Claim_Is_Acceptable(0, 0, 0));
    EXPECT_FALSE(Claim_Is_Acceptable(-1, 1, 10) || Claim_Is_Acceptable(1, -1, 10));
    EXPECT_FALSE(Claim_Is_Acceptable(2, most, 10) || Claim_Is_Acceptable(most, 2, most));
}

/// A Sheet of columns a, b, c without cells.
Sheet* Three_Columns()
{
    Sheet* const sheet = New_Sheet();
    for (const char* const name : {"a", "b", "c"})
        Name_From_Input(*New_Data_Column(sheet, variate_column, "x", 0), std::string(name) + " ?", name);
    return sheet;
}

TEST_F(Foreign_Columns, Columns_Are_Narrowed_By_Place_Or_Either_Name)
{
    const std::tuple<bool, bool, Texts, std::string> cases[] = {
        {false, false, {"b"}, "a1- b2- c3-"},  // a list that isn't asked for
        {true, true, {"3", "1"}, "a1+ . c2+"}, {true, false, {"c", "A", "nothing"}, ". . c1+"},
        {true, false, {"b ?"}, ". b1+ ."},     {true, true, {"9"}, ". . ."},
    };
    for (const auto& [asked, by_number, list, expected] : cases) {
        Start_Request("t");
        request.Subset_Columns = asked;
        request.Subset_By_Number = by_number;
        request.Subset_Names = list;
        Sheet* const sheet = Three_Columns();
        std::string told;
        std::int32_t place = 0;
        for (const Column* const column : Narrow_Columns(*sheet)) {
            ++place;
            told.append(told.empty() ? "" : " ");
            if (column == nullptr) {
                told += '.';
                continue;
            }
            told.append(column->name.view()).append(std::to_string(column->index));
            told += column->input_place == place ? '+' : '-';
        }
        EXPECT_EQ(told, expected);
        EXPECT_TRUE(request.Columns_Were_Selected);
        EXPECT_EQ(Check_Sheet(*sheet), "");
    }
}

TEST_F(Foreign_Columns, Rows_Are_Narrowed)
{
    const auto told = [] {
        std::string rows;
        const Row_Selection wanted = Narrow_Rows();
        for (std::int64_t row = 0; row < 5; ++row)
            rows += wanted.Keeps(row) ? 'x' : '.';
        return rows + std::to_string(wanted.Count(5));
    };
    request.Subset_Row_Flags = {1, 0, 2, 0};
    EXPECT_EQ(told(), "xxxxx5");
    request.Subset_Rows = true;
    EXPECT_EQ(told(), "x.x..2");
    EXPECT_TRUE(request.Rows_Were_Selected);
}

TEST_F(Foreign_Columns, Cells_Print_By_The_Rules)
{
    Sheet* const sheet = New_Sheet_With_Rows(4);
    Column* const number = Add_Cells(sheet, variate_column, "n", {"2.5", "*", "1234567.25", "3"});
    Column* const said = Add_Cells(sheet, variate_column, "s", {"2.5", "*", "1234567.25", "3"});
    said->format = fixed_format;
    said->decimals = 1;
    Column* const date = Add_Cells(sheet, variate_column, "d", {"1", "*", "59", "61"});
    static_cast<void>(Date_Maker(*date, {.display = dashed_year_month_day_format, .date_form = 0}));
    Column* const plain = New_Data_Column(sheet, factor_column, "p", 4);
    Column* const valued = New_Data_Column(sheet, factor_column, "v", 4);
    Column* const labelled = New_Data_Column(sheet, factor_column, "l", 4);
    const double values[] = {0.5, 1234567.25};
    const std::string_view labels[] = {"one", "two"};
    ASSERT_TRUE(Set_Levels(*plain, {.plain_levels = 2}) && Set_Levels(*valued, {.values = values})
                && Set_Levels(*labelled, {.labels = labels}));
    for (Column* const factor : {plain, valued, labelled})
        for (const std::int32_t row : {0, 2, 3})  // the last stands for a margin
            Cell_At(factor, row)->value.number = row == 0 ? 1 : row;
    const auto printed = [](const Column& column, const Printing_Rules& rules) {
        const Column_Printer printer(column, rules);
        char room[Number_Text_Room];
        std::string text;
        for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
            text.append(cell->prev == nullptr ? "" : "|").append(printer.Print(*cell, room, {"-", "?"}));
        return text;
    };
    const Printing_Rules general{.numbers = Number_Print::general, .level_values = Number_Print::general};
    const Printing_Rules by_format{.numbers = Number_Print::by_format};
    Printing_Rules margins = general;
    margins.margins = true;
    EXPECT_EQ(printed(*number, {}), "2.5|-|1234567.25|3");
    EXPECT_EQ(printed(*number, by_format), "2.5|-|1.23457e+06|3");
    EXPECT_EQ(printed(*said, general), "2.5|-|1234567.25|3");
    EXPECT_EQ(printed(*said, {}), "2.5|-|1234567.2|3.0");
    EXPECT_EQ(printed(*date, general), "1900-01-01|-|1900-02-28|1900-03-01");
    EXPECT_EQ(printed(*plain, general), "1|-|2|-");
    EXPECT_EQ(printed(*valued, general), "0.5|-|1234567.25|-");
    EXPECT_EQ(printed(*valued, {}), "0.5|-|1234567.25|-");
    EXPECT_EQ(printed(*labelled, general), "one|?|two|?");
    EXPECT_EQ(printed(*labelled, margins), "one|?|two|?") << "no Table";
    sheet->type = table_sheet;
    sheet->has_margins = 1;
    EXPECT_EQ(printed(*labelled, margins), "one|?|two|Margin");
    EXPECT_EQ(printed(*plain, margins), "1|-|2|Margin");
    EXPECT_EQ(printed(*plain, general), "1|-|2|-");
}

}  // namespace
}  // namespace ingester

#include "model/sort.h"

#include "support/cell_lists.h"
#include "support/check_sheet.h"
#include "support/text.h"

#include <algorithm>
#include <limits>
#include <numeric>
#include <random>

namespace ingester {
namespace {

using Sort = Request_Test;

const std::string Long(200, 'x');

/// Columns: number, text, Long Text, Factor with labels and values out of order, plain Factor.
Sheet* Random_Sheet(std::minstd_rand& random, std::int32_t rows)
{
    const std::tuple<std::int32_t, const char*, Texts> columns[] = {
        {variate_column, "n", {"3", "-0", "0", "1e300", "-5", "*", "2.5", "7"}},
        {text_column, "t", {"", "a", "B", "b", " a", "abcdefgh", "abcdefghi", "\xE9", "ABCDEFGHI"}},
        {long_text_column, "l", {Long, Long + "y", Long + "x", "z", ""}},
        {factor_column, "f", {"*", "1", "2", "3"}},
        {factor_column, "p", {"*", "1", "2", "3"}}};
    Sheet* const sheet = New_Sheet_With_Rows(rows);
    for (const auto& [type, name, choices] : columns) {
        Texts cells(static_cast<std::size_t>(rows));
        for (std::string& cell : cells)
            cell = choices[random() % choices.size()];
        Add_Cells(sheet, type, name, cells)->nlevels = 3;
    }
    Put_Levels(*Find_Column(sheet, "f"), {30, 20, 10}, {"m", "Z", "a"});
    for (Cell_Node* cell = Column_At(sheet, 1)->first_cell; cell != nullptr; cell = cell->next)
        if (cell->value.number == 7)
            cell->value.number = std::numeric_limits<double>::quiet_NaN();
    return sheet;
}

using Plain_Key = std::pair<double, std::string>;

/// What a cell is compared by: a number, or a text beside 0.
Plain_Key Key_Of(const Sort_Request& wanted, const Column& column, const Cell_Node& cell)
{
    const bool listed = column.name == "f";
    double number = Is_Text_Like(column.type) ? 0 : cell.value.number;
    std::string text(Is_Text_Like(column.type) ? cell.Text() : "");
    if (listed && number > 0 && wanted.factor_mode == Factor_Mode::level_value)
        number = 40 - 10 * number;
    if (listed && wanted.factor_mode == Factor_Mode::label) {
        text = number > 0 ? Texts{"m", "Z", "a"}[static_cast<std::size_t>(number) - 1] : "";
        number = 0;
    }
    if (wanted.trim_keys)
        text = Trim_Copy(text);
    if (wanted.ignore_case)
        std::ranges::transform(text, text.begin(), To_Lower);
    return {std::isnan(number) ? Missing_Value : number, text};
}

std::vector<std::size_t> Plain_Order(const Sort_Request& wanted)
{
    const auto rows = static_cast<std::size_t>(wanted.sheet->row_count);
    std::vector<std::vector<Plain_Key>> keys(rows);
    for (const std::int32_t index : wanted.key_index) {
        const Column& column = *Column_At(wanted.sheet, index);
        const Cell_Node* cell = column.first_cell;
        for (std::size_t row = 0; row < rows; ++row, cell = cell->next)
            keys[row].push_back(Key_Of(wanted, column, *cell));
    }
    std::vector<std::size_t> order(rows);
    std::iota(order.begin(), order.end(), 0U);
    std::ranges::stable_sort(order, [&](std::size_t a, std::size_t b) {
        return wanted.ascending ? keys[a] < keys[b] : keys[b] < keys[a];
    });
    return order;
}

TEST_F(Sort, Agrees_With_A_Plain_Stable_Sort)
{
    std::minstd_rand random;
    for (int round = 0; round < 600; ++round) {
        Start_Request("t");
        const std::int32_t rows = round < 590 ? 1 + static_cast<std::int32_t>(random() % 12) : 3000;
        Sort_Request wanted{.sheet = Random_Sheet(random, rows),
                            .ascending = random() % 2 == 0,
                            .ignore_case = random() % 2 == 0,
                            .trim_keys = random() % 2 == 0,
                            .key_index = {},
                            .factor_mode = static_cast<Factor_Mode>(random() % 3)};
        for (auto count = 1 + random() % 3; count > 0; --count)
            wanted.key_index.push_back(static_cast<std::int32_t>(random() % 6));
        Texts numbers;
        for (std::int32_t row = 0; row < rows; ++row)
            numbers.push_back(std::to_string(row));
        Column* const place = Add_Cells(wanted.sheet, variate_column, "place", numbers);
        Row_At(wanted.sheet, rows - 1)->restricted = 1;
        place->cell_colours.push_back({rows, 0, 0});
        const std::vector<std::size_t> order = Plain_Order(wanted);
        ASSERT_TRUE(Sort_Sheet(wanted));
        const std::vector<double> sorted = Numbers_Of(*place);
        ASSERT_TRUE(std::equal(sorted.begin(), sorted.end(), order.begin(), order.end(),
                               [](double a, std::size_t b) { return a == static_cast<double>(b); }))
            << "round " << round;
        for (std::int32_t row = 0; row < rows; ++row)
            ASSERT_EQ(Row_At(wanted.sheet, row)->restricted,
                      sorted[static_cast<std::size_t>(row)] == rows - 1);
        ASSERT_EQ(sorted[static_cast<std::size_t>(place->cell_colours.front().row) - 1], rows - 1);
        ASSERT_EQ(Check_Sheet(*wanted.sheet), "");
    }
}

TEST_F(Sort, Keeps_Margins_Last_And_Refuses_What_Has_No_Rows_To_Move)
{
    const std::tuple<std::int32_t, std::int32_t, std::int32_t, bool, const char*> cases[] = {
        // Sheet type, ways, column type, result, the cells 3 1 2 0 behind it
        {table_sheet, 2, table_column, true, "a T1|2|3|0"},
        {table_sheet, 3, table_column, true, "a T0|1|2|3"},
        {symmetric_matrix_sheet, 0, variate_column, false, "a V3|1|2|0"},
        {scalar_sheet, 0, variate_column, true, "a V3|1|2|0"},
    };
    for (const auto& [type, ways, column_type, result, cells] : cases) {
        Start_Request("t");
        Sheet* const sheet = New_Sheet_With_Rows(4);
        sheet->type = type;
        sheet->table_ways = ways;
        sheet->has_margins = 1;
        Add_Cells(sheet, column_type, "a", {"3", "1", "2", "0"});
        EXPECT_EQ(Sort_Sheet({.sheet = sheet, .key_index = {1}}), result);
        EXPECT_EQ(Render(sheet), cells);
    }
    Sheet* const empty = New_Sheet();
    EXPECT_TRUE(Sort_Sheet({.sheet = empty, .key_index = {}}));
    EXPECT_FALSE(Sort_Sheet({.sheet = empty, .key_index = {0}}));
    EXPECT_FALSE(Sort_Sheet({.sheet = New_Sheet_With_Rows(1), .key_index = {1}}));
}

}  // namespace
}  // namespace ingester

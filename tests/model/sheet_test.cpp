// Rows, cells and columns come and go: Sheets against plain tables that go through the same.
#include "model/told_sheets.h"
#include "support/text.h"

#include <algorithm>
#include <random>

namespace ingester {
namespace {

class Sheet_Lists : public Request_Test {
protected:
    /// A number below `end`.
    std::int32_t Below(std::size_t end) { return static_cast<std::int32_t>(random_() % end); }

    std::mt19937 random_{5};
};

TEST_F(Sheet_Lists, Sweeps_Cost_The_Same_For_Each_Cell)
{
    constexpr std::int32_t rows = 1'000'000;
    constexpr std::int32_t middle = rows / 2;
    Sheet* const sheet = New_Sheet_With_Rows(rows);
    Column* const numbers = sheet->first_column;
    Column* const column = New_Data_Column(sheet, variate_column, "x", rows);
    for (std::int32_t i = 0; i < rows; ++i)
        ASSERT_EQ(Cell_At(numbers, i)->value.number, i + 1);
    for (std::int32_t i = rows; i-- > 0;)
        ASSERT_EQ(Cell_At(numbers, i)->value.number, i + 1);
    for (std::int32_t i = 0, at = middle; i < rows; ++i, at = middle + Below(40))
        ASSERT_EQ(Cell_At(numbers, at)->value.number, at + 1);
    for (std::int32_t at = middle; at < middle + 100'000; at += 2) {
        ASSERT_TRUE(Insert_Rows(sheet, at, 1, false));
        Cell_At(column, at)->value.number = 1.0;
    }
    for (std::int32_t at = middle; at < middle + 50'000; ++at)
        ASSERT_TRUE(Cell_At(column, at)->value.number == 1.0 && Delete_Row(sheet, at, false));
    EXPECT_EQ(sheet->row_count, rows);
    EXPECT_EQ(Check_Sheet(*sheet), "");
}

TEST_F(Sheet_Lists, Rows_As_In_A_Plain_Table)
{
    // A row that was written to has a number, the same as text, and is restricted.
    std::vector<double> plain(3, Missing_Value);
    Sheet* const sheet = New_Sheet_With_Rows(3);
    Column* const numbers = New_Data_Column(sheet, variate_column, "number", 3);
    Column* const texts = New_Data_Column(sheet, text_column, "text", 3);
    for (int round = 0; round < 3000; ++round) {
        const std::int32_t at = Below(plain.size());
        const int what = Below(plain.size() > 60 ? 3 : 5);
        if (what == 0) {
            const std::int32_t count = 1 + Below(3);
            ASSERT_TRUE(Insert_Rows(sheet, plain.size() % 2 == 0 ? at : at + 1, count, round % 2 == 0));
            plain.insert(plain.begin() + at + plain.size() % 2, static_cast<std::size_t>(count),
                         Missing_Value);
        } else if (what < 3 && plain.size() > 1) {
            sheet->current_row = sheet->top_row = at;
            ASSERT_TRUE(Delete_Row(sheet, at, round % 2 == 0));
            plain.erase(plain.begin() + at);
            ASSERT_EQ(sheet->current_row + sheet->top_row, 2 * std::min(at, sheet->row_count - 1));
        } else {
            plain[static_cast<std::size_t>(at)] = Cell_At(numbers, at)->value.number = round;
            Set_Text(*texts, *Cell_At(texts, at), std::to_string(round));
            sheet->restricted_rows += std::exchange(Row_At(sheet, at)->restricted, 1) == 0;
        }
        ASSERT_EQ(Check_Sheet(*sheet), "");
        ASSERT_EQ(Numbers_Of(*numbers), plain) << "round " << round;
        for (std::int32_t row = 0; row < sheet->row_count; ++row) {
            const double number = plain[static_cast<std::size_t>(row)];
            const bool written = number != Missing_Value;
            ASSERT_EQ(Cell_At(texts, row)->Text(), written ? Format_Text("%.0f", number) : "");
            ASSERT_EQ(Row_At(sheet, row)->restricted, written);
            ASSERT_EQ(Cell_At(sheet->first_column, row)->value.number, row + 1);
        }
        ASSERT_EQ(sheet->restricted_rows,
                  std::ssize(plain) - std::count(plain.begin(), plain.end(), Missing_Value));
    }
}

bool Is_Units(const std::string& name)
{
    return name.starts_with('u');
}

TEST_F(Sheet_Lists, Columns_As_In_A_Plain_List)
{
    Texts plain = {"Row"};
    Sheet* const sheet = New_Sheet_With_Rows(1);
    for (int round = 0; round < 3000; ++round) {
        const std::int32_t leading = sheet->leading_columns;
        const auto columns = static_cast<std::int32_t>(plain.size());
        const std::int32_t at = Below(plain.size());
        const int what = Below(columns > 30 ? 2 : 4);
        if (what == 0) {
            ASSERT_EQ(Delete_Column(Column_At(sheet, at), true), at > 0);
            if (at > 0)
                plain.erase(plain.begin() + at);
        } else if (what == 1 && at >= leading) {
            const std::int32_t to = leading + Below(static_cast<std::size_t>(columns - leading));
            ASSERT_TRUE(Move_Column(sheet, at, to));
            const std::string moved = plain[static_cast<std::size_t>(at)];
            plain.erase(plain.begin() + at);
            plain.insert(plain.begin() + to, moved);
        } else {
            const bool units = Below(8) == 0;
            const std::string name = (units ? "u" : "c") + std::to_string(round);
            const std::int32_t position = at + Below(4) - 1;
            const std::int32_t type = units ? units_text_column : text_column;
            const std::int32_t behind = (round + 1) % 2;
            ASSERT_NE(Add_Column(sheet, {.type = type, .name = name, .fill = {}}, position, behind == 1),
                      nullptr);
            plain.insert(plain.begin() + (units ? 1 : std::clamp(position + behind, leading, columns)), name);
        }
        ASSERT_EQ(Check_Sheet(*sheet), "");
        ASSERT_EQ(Names_Of(sheet), plain) << "round " << round;
        ASSERT_EQ(sheet->leading_columns, 1 + std::count_if(plain.begin(), plain.end(), Is_Units));
    }
}

TEST_F(Sheet_Lists, A_Symmetric_Matrix_Stays_Square)
{
    using Triangle = std::vector<std::vector<double>>;  // row by row, up to the diagonal
    Triangle plain;
    Sheet* const sheet = New_Sheet();
    sheet->type = symmetric_matrix_sheet;
    const auto insert = [&](std::int32_t at, double value) {
        for (auto row = plain.begin() + at; row != plain.end(); ++row)
            row->insert(row->begin() + at, value);
        plain.emplace(plain.begin() + at, at + 1, Missing_Value)->back() = value;
    };
    for (int round = 0; round < 2000; ++round) {
        const std::int32_t at = Below(plain.size() + 1);
        const int what = Below(plain.size() > 12 ? 2 : 4);
        if (what < 2 && at > 0 && plain.size() > 1) {
            ASSERT_TRUE(what == 0 ? Delete_Row(sheet, at - 1, true)
                                  : Delete_Column(Column_At(sheet, sheet->leading_columns + at - 1), true));
            plain.erase(plain.begin() + at - 1);
            for (auto row = plain.begin() + at - 1; row != plain.end(); ++row)
                row->erase(row->begin() + at - 1);
        } else if (what == 2) {
            ASSERT_TRUE(Insert_Rows(sheet, at, 2, true));
            insert(at, Missing_Value);
            insert(at, Missing_Value);
        } else {
            const std::string fill = std::to_string(round);
            ASSERT_NE(Add_Column(sheet, {.name = {}, .fill = fill}, sheet->leading_columns + at, false),
                      nullptr);
            insert(at, round);
            if (round % 40 == 0)
                New_Data_Column(sheet, units_variate_column, "u", sheet->row_count);
        }
        ASSERT_EQ(Check_Sheet(*sheet), "");
        Triangle held(plain.size());
        std::size_t number = 0;
        for (const Column* column = Column_At(sheet, sheet->leading_columns); column != nullptr;
             column = column->next) {
            std::size_t row = number;
            for (const double value : Numbers_Of(*column))
                held[row++].push_back(value);
            ASSERT_EQ(column->name, std::to_string(++number));
        }
        ASSERT_EQ(held, plain) << "round " << round;
    }
}

TEST_F(Sheet_Lists, Row_Deletion_And_Insertion_Have_Limits)
{
    Sheet* const sheet = Sheet_Of("1 Y*|*; 2 Y*", symmetric_matrix_sheet);
    constexpr std::int32_t many = Greatest_Insertion + 1;
    EXPECT_FALSE(Insert_Rows(sheet, 0, many, true) || Insert_Cells(sheet->first_column, 0, many));
    const std::string words = "Too many rows to insert.\nAt most 33 million rows can be added at one time.\n";
    EXPECT_EQ(Messages(), words + words + ":\n");
    request.Max_Columns = 3;
    EXPECT_FALSE(Insert_Rows(sheet, 1, 2, true));
    sheet->read_only = 1;
    EXPECT_FALSE(Insert_Rows(sheet, 1, 1, true) || Move_Column(sheet, 1, 2) || Delete_Row(sheet, 2, false)
                 || Insert_Rows(sheet, -1, 1, false) || Delete_Column(sheet->first_column, false));
    EXPECT_EQ(Add_Column(sheet, {}, 1, false), nullptr);
    EXPECT_EQ(Check_Sheet(*sheet), "");
    sheet->type = scalar_sheet;
    EXPECT_FALSE(Delete_Row(sheet, 0, false) || Setup_Rows(New_Sheet()));
    EXPECT_EQ(Check_Sheet(*New_Sheet_With_Rows(-1)), "");
    sheet->row_count = 5;  // a reader may learn late how many rows there are
    EXPECT_TRUE(Setup_Rows(sheet) && Row_At(sheet, 4) != nullptr && sheet->first_column->length == 5);
}

TEST_F(Sheet_Lists, What_Is_Empty)
{
    Sheet* const sheet = Sheet_Of("1 Y*|*|-1e306|*; 2 Y7|*|*; 3 Y*|*; 4 Y*", symmetric_matrix_sheet);
    EXPECT_TRUE(Find_Empty_Rows(sheet, false) == 2 && Find_Empty_Rows(sheet, true) == 1);        // 0 and 3
    EXPECT_TRUE(Find_Empty_Columns(sheet, false) == 2 && Find_Empty_Columns(sheet, true) == 1);  // 2 and 3
    EXPECT_TRUE(Delete_Empty_Columns(sheet) && sheet->row_count == 3 && sheet->column_count == 3);
    EXPECT_EQ(Check_Sheet(*sheet), "");

    Sheet* const table = Sheet_Of("f F*|0.5; t L|; kept V*|*");
    Column* const factor = Column_At(table, 1);
    table->last_column->protected_column = 1;
    EXPECT_EQ(Find_Empty_Columns(table, true), 3);
    factor->last_cell->value.number = 1.0;
    EXPECT_EQ(Find_Empty_Rows(table, true), 1);
    EXPECT_NE(table->first_row->empty, table->last_row->empty);
    table->type = table_sheet;
    table->table_ways = 2;
    EXPECT_TRUE(Delete_Empty_Columns(table) && table->column_count == 3);
    table->has_table_data = 1;
    EXPECT_TRUE(Delete_Empty_Columns(table) && table->column_count == 2);
    EXPECT_EQ(table->last_column->name, "kept");
    EXPECT_EQ(Check_Sheet(*table), "");
}

TEST_F(Sheet_Lists, Rows_That_Were_Put_Off_Come_When_They_Are_Needed)
{
    const std::tuple<const char*, bool (*)(Sheet*), std::int32_t> cases[] = {
        {"nobody", [](Sheet*) { return true; }, 3},
        {"a row", [](Sheet* s) { return Row_At(s, 2) != nullptr; }, 3},
        {"a row number", [](Sheet* s) { return Cell_At(s->first_column, 2)->value.number == 3.0; }, 3},
        {"an insertion", [](Sheet* s) { return Insert_Rows(s, 1, 2, false); }, 5},
        {"an insertion behind the end", [](Sheet* s) { return Insert_Rows(s, 9, 1, false); }, 4},
        {"a deletion", [](Sheet* s) { return Delete_Row(s, 0, false); }, 2},
        {"a search", [](Sheet* s) { return Find_Empty_Rows(s, true) == 2; }, 3},
    };
    for (const auto& [name, need, rows] : cases) {
        Sheet* const sheet = New_Sheet();
        Expect_Rows(sheet, 3);
        New_Data_Column(sheet, variate_column, "x", 3)->last_cell->value.number = 1;
        EXPECT_TRUE(need(sheet) && sheet->row_count == rows) << name;
        EXPECT_EQ(Check_Sheet(*sheet), "") << name;
    }
}

}  // namespace
}  // namespace ingester

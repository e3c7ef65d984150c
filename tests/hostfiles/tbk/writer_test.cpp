#include "hostfiles/tbk/book_fixture.h"

namespace ingester {
namespace {

using Book_Writer = Book_Test;

/// The bytes were put together by hand, so this holds reader and writer against the layout.
TEST_F(Book_Writer, Writes_What_Was_Read_To_The_Byte)
{
    for (const Whole_Book& whole : Whole_Books()) {
        EXPECT_EQ(Faults_Of_Book(whole.bytes), "");
        EXPECT_EQ(Outcome(whole.bytes), whole.cells);
        ASSERT_NE(Current_Sheet, nullptr);
        EXPECT_TRUE(Written(Current_Sheet) == whole.bytes) << whole.cells;
    }
    const Book_Bytes b;
    Sheet* const sheet = Plain_Sheet("Page", {"1.5", "*"});
    sheet->source_file = "C:\\in.csv";
    sheet->population_set = 1;
    sheet->population_code = 9;
    const std::string front = b.Record(12, "\t") + b.Record(13, b.Long("C:\\in.csv"));
    const std::string date = b.Reals({0});
    EXPECT_EQ(
        Written(sheet),
        b.Book({b.Sheet_With_Table(36 + front.size(), "Page", 1, 2,
                                   {b.Column(4, 2, "x", b.Numbers({1.5, -1e307}) + b.Record(117, date))},
                                   b.Record(29, date), b.Record(25, b.Words({1, 1})))},
               front));
    EXPECT_EQ(sheet->format_version, 5);
}

TEST_F(Book_Writer, Packs_Cells_Of_Factors_As_Their_Levels_Allow)
{
    const struct {
        std::int32_t levels;
        int cells;
        std::int64_t length;
    } cases[] = {{3, 5, 11},   {4, 5, 12},     {15, 4, 11},        {16, 5, 14},       {255, 3, 12},
                 {256, 3, 15}, {65535, 2, 13}, {65536, 2, 17},     {3, 4, 10},        {3, 0, 10},
                 {15, 0, 10},  {300, 0, 9},    {1, 100000, 25009}, {5, 100001, 50010}};
    for (const auto& [levels, cells, length] : cases) {
        SCOPED_TRACE(std::to_string(levels) + " levels, " + std::to_string(cells));
        Sheet* const sheet = New_Sheet_With_Rows(cells);
        Column* const factor = New_Data_Column(sheet, factor_column, "f", cells);
        factor->nlevels = levels;
        for (Cell_Node* cell = factor->first_cell; cell != nullptr; cell = cell->next)
            cell->value.number = cell == factor->first_cell ? sheet->missing_value
                                 : cell->next == nullptr    ? levels
                                                            : 1;
        const std::string before = Render(sheet);
        const std::string bytes = Written(sheet);
        EXPECT_EQ(Faults_Of_Book(bytes), "");
        EXPECT_NE(bytes.find(Book_Bytes{}.Record_Head(96, length)), std::string::npos);
        EXPECT_EQ(Outcome(bytes), before);
    }
}

TEST_F(Book_Writer, Names_What_Has_No_Name_And_Refuses_What_Is_None)
{
    Sheet* const sheet = Plain_Sheet("");
    sheet->first_column->next->name.clear();
    Column* const factor = Add_Cells(sheet, factor_column, "f", {"2", "*", "1"});
    factor->first_cell->value.number = 9;
    factor->first_cell->next->value.number = 0.5;
    Put_Levels(*factor, {1, 2}, {"", "b"});
    EXPECT_EQ(Outcome(Written(sheet)), "C1 V1|2|*; f F2|*|1");
    EXPECT_EQ(Current_Sheet->sheet_name, "Sheet1");
    EXPECT_EQ(Current_Sheet->last_column->labels->Text(), "<1>");
    request.Output_Sheet_Name = "Asked";
    Sheet* const twice[] = {sheet, Plain_Sheet("asked"), Plain_Sheet("B")};
    EXPECT_EQ(Faults_Of_Book(Written(twice)), "");
    EXPECT_EQ(Pages("w.tbk"), (Texts{"Asked", "asked_1", "B"}));
    EXPECT_FALSE(Write_TBK_File(nullptr, Request_Name("n.tbk").c_str()));
    EXPECT_FALSE(Write_TBK_File(sheet, Request_Name("none\\n.tbk").c_str()));
    EXPECT_EQ(Messages(),
              "Internal Spreadsheet Error: Null BOOK in Save book.\nTabulon Book file not saved.\n:\n");
}

}  // namespace
}  // namespace ingester

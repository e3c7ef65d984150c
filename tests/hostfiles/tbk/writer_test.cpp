#include "hostfiles/tbk/book_sheets.h"

namespace ingester {
namespace {

using Book_Writer = Book_Test;

TEST_F(Book_Writer, Writes_These_Bytes)
{
    const Book_Bytes b;
    Sheet* const sheet = Plain_Sheet("Page", {"1.5", "*"});
    sheet->source_file = "C:\\in.csv";
    sheet->population_set = 1;
    sheet->population_code = 9;
    Add_Factor(sheet, "f", 4, {"4", "*"})->decimals = 2;
    const std::string dates = b.Record(117, b.Reals({0}));
    const std::string column = b.Record(64, std::string("\4\2\0\0\0\1x\1\6\0\1\0\0\0", 14))
                               + b.Record(81, b.Word(2) + b.Reals({1.5, -1e307})) + dates + b.Record(65);
    const std::string factor = b.Record(64, std::string("\2\2\0\0\0\1f\1\6\0\1\0\0\0", 14))
                               + b.Record(66, "\2") + b.Record(96, b.Words({2, 4}) + std::string("\0\4", 2))
                               + dates + b.Record(65);
    const std::string front = b.Record(12, "\t") + b.Record(13, b.Long("C:\\in.csv"));
    const std::size_t at = 12 + 14 + front.size() + 10;
    const std::size_t columns_at = at + 32 + 14 + 14;
    std::string group = b.Record(16, std::string("\1\2\0\0\0\2\0\0\0", 9) + "\x33\x74\xAC\x3C\x1F\x7B\xAC\xFF"
                                         + std::string("\0\0\0\0\4Page", 9))
                        + b.Record(18, b.Words({static_cast<std::int64_t>(columns_at),
                                                static_cast<std::int64_t>(columns_at + column.size())}))
                        + b.Record(29, b.Reals({0})) + column + factor + b.Record(25, b.Words({1, 1}))
                        + b.Record(17);
    EXPECT_EQ(Written(sheet), b.Book({group}, front));
    EXPECT_EQ(sheet->format_version, 5);
}

TEST_F(Book_Writer, Writes_Each_Record_When_There_Is_Something_To_Say)
{
    const struct {
        const char* what;
        Sheet* sheet;
        const char* group;
    } cases[] = {
        {"a Vector", Full_Vector(),
         "16 18 29 36 64 82 117 65 64 113 112 122 123 66 81 116 114 115 117 120 121 65 "
         "64 118 122 96 97 98 99 100 101 117 65 64 96 117 65 64 82 117 65 64 83 117 65 "
         "23 24 35 39 25 26 26 33 34 34 37 17"},
        {"a Table by level", Full_Table(1),
         "16 18 29 20 21 22 19 64 96 117 65 64 119 81 117 65 64 119 81 117 65 64 81 117 65 25 17"},
        {"a Table by position", Full_Table(0),
         "16 18 29 20 21 22 19 64 96 117 65 64 81 117 65 64 81 117 65 64 81 117 65 25 17"},
        {"a Table by label and level", Full_Table(3),
         "16 18 29 20 21 22 19 64 96 117 65 64 119 81 117 65 64 119 81 117 65 64 81 117 65 25 17"},
        {"a Matrix", Full_Matrix(2), "16 18 29 19 64 82 117 65 64 81 117 65 64 81 117 65 64 81 117 65 25 17"},
        {"a Symmetric Matrix", Full_Matrix(3),
         "16 18 29 19 64 82 117 65 64 81 117 65 64 81 117 65 64 81 117 65 25 17"},
        {"a Diagonal Matrix", Full_Matrix(4), "16 18 29 64 82 117 65 64 81 117 65 25 17"},
        {"Scalars", Full_Scalar(), "16 18 29 64 81 117 65 25 17"},
    };
    for (const auto& [what, sheet, group] : cases) {
        SCOPED_TRACE(what);
        const std::string before = Render(sheet);
        const std::string bytes = Written(sheet);
        const Walked_Book walked = Walk_Book(bytes);
        EXPECT_EQ(walked.faults, "");
        EXPECT_EQ(walked.types, std::string("1 3 ") + group + " 2");
        Sheet* const again = Read(bytes);
        ASSERT_NE(again, nullptr) << Messages();
        EXPECT_EQ(Render(again), before);
        EXPECT_EQ(Written(again), bytes) << "something was lost on the way";
    }
    EXPECT_EQ(Messages(), "");
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
        Texts codes(static_cast<std::size_t>(cells), "1");
        if (cells > 1)
            codes.back() = std::to_string(levels), codes.front() = "*";
        Add_Factor(sheet, "f", levels, codes);
        const std::string before = Render(sheet);
        const std::string bytes = Written(sheet);
        EXPECT_EQ(Walk_Book(bytes).faults, "");
        EXPECT_NE(bytes.find(Book_Bytes{}.Record_Head(96, length)), std::string::npos);
        Sheet* const again = Read(bytes);
        ASSERT_NE(again, nullptr);
        EXPECT_EQ(Render(again), before);
    }
}

TEST_F(Book_Writer, Names_What_Has_No_Name_And_Refuses_What_Is_None)
{
    Sheet* const sheet = Plain_Sheet("");
    sheet->first_column->next->name.clear();
    Column* const factor = Add_Factor(sheet, "f", 2, {"9", "0.5", "1.5"});
    Put_Levels(*factor, {1, 2}, {"", "b"});
    EXPECT_TRUE(Has_Text(Written(sheet), {"\6Sheet1", "\2C1", "<1>"}));
    request.Output_Sheet_Name = "Asked";
    Sheet* const twice[] = {sheet, Plain_Sheet("asked"), Plain_Sheet("B")};
    const std::string bytes = Written(twice);
    EXPECT_EQ(Walk_Book(bytes).faults, "");
    EXPECT_EQ(Pages("w.tbk"), (Texts{"Asked", "asked_1", "B"}));
    EXPECT_FALSE(Write_TBK_File(nullptr, Request_Name("n.tbk").c_str()));
    EXPECT_FALSE(Write_TBK_File(sheet, Request_Name("none\\n.tbk").c_str()));
    EXPECT_EQ(Messages(),
              "Internal Spreadsheet Error: Null BOOK in Save book.\nTabulon Book file not saved.\n:\n");
}

}  // namespace
}  // namespace ingester

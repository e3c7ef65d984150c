#include "model/transpose.h"

#include "model/column_summary.h"
#include "model/told_sheets.h"
#include "support/text.h"

namespace ingester {
namespace {

using Transpose = Request_Test;

TEST_F(Transpose, Turns_Rows_Into_Columns)
{
    const std::string named = "a V1|2; id Tx y|z; b V3|*";
    const std::string wide = "n Tx; l L" + std::string(95, 'w');
    const std::tuple<std::int32_t, std::int32_t, std::string, bool, const char*> cases[] = {
        // Type of the Sheet, its label state, what it is, whether it gives names, and what it becomes
        {vector_sheet, 0, "a V1|2; b V3|*", true, "C1 Ua|b; C2 V1|3; C3 V2|*"},
        {vector_sheet, 0, named, true, "id Ua|b; x_y V1|3; z V2|*"},
        {vector_sheet, 0, named, false, "C1 Ua|id|b; C2 T1|x y|3; C3 T2|z|*"},
        {vector_sheet, 0, "s Tp|q; t Tu|; b V1234567.25|*", true, "s Ut|b; p Tu|1234567.25; q T|*"},
        {vector_sheet, 0, "u Ux|y; a V1|2", true, "u Ua; x V1; y V2"},
        {vector_sheet, 0, "u Ux|y; a V1|2", false, "u Ua; C1 V1; C2 V2"},
        {vector_sheet, 0, wide, true, "n Ul; x L95 characters"},
        {scalar_sheet, 0, "a S1; b S2; c S3", true, "C1 Ua|b|c; C2 V1|2|3"},
        {matrix_sheet, 0, "1 M1|2; 2 M3|4", true, "C1 U1|2; 1 M1|3; 2 M2|4"},
        {matrix_sheet, 1, "r N10|20; 5 M1|2; * M3|4", true, "C1 U5|*; 10 M1|3; 20 M2|4"},
        {matrix_sheet, 2, "r Up|q; x M1|2; y M3|4", true, "r Ux|y; p M1|3; q M2|4"},
        {matrix_sheet, 3, "x M1|2; y M3|4", true, "1 M1|3; 2 M2|4"},
    };
    for (const auto& [type, label_state, given, names, expected] : cases) {
        Start_Request("t");
        request.Transpose_Names = names;
        Sheet* const sheet = Sheet_Of(given, type);
        sheet->label_state = label_state;
        Add_Sheet_Comment(sheet, "old title");
        ASSERT_TRUE(Transpose_Sheet(sheet)) << expected;
        EXPECT_EQ(Render(Current_Sheet), expected);
        EXPECT_EQ(Check_Sheet(*Current_Sheet), "") << expected;
        EXPECT_TRUE(Current_Sheet->title_lines.starts_with("Transposed on: "));
        EXPECT_TRUE(Current_Sheet->title_lines.ends_with(std::string_view("\0old title\0", 11)));
        EXPECT_EQ(Current_Sheet->title_line_count, 2);
        const std::string once = Render(Current_Sheet, false);
        const bool names_again = Nth_Column_Of_Type(Current_Sheet, text_column, 1) != nullptr;
        if (names && !names_again && label_state != 3) {
            ASSERT_TRUE(Transpose_Sheet(Current_Sheet) && Transpose_Sheet(Current_Sheet));
            EXPECT_EQ(Render(Current_Sheet, false), once) << "transposed three times";
        }
    }
}

TEST_F(Transpose, A_Table_Changes_Its_Factors)
{
    Sheet* const sheet = Sheet_Of("site F1|2|3; A B1|2|3; B B4|5|9", table_sheet);
    Add_Cells(sheet, table_margin_column, "All", {"5", "7", "12"});
    sheet->label_state = 3;
    sheet->table_ways = 2;
    sheet->has_margins = 1;
    sheet->margin_label = "All";
    sheet->row_label_name = "kind";
    Put_Levels(*Column_At(sheet, 1), {10, 20}, {"north", "south"});
    Column_At(sheet, 2)->table_margin_value = 7;
    Column_At(sheet, 3)->table_margin_value = 8;
    sheet->column_factor_format = date_format_mark;
    sheet->column_factor_date = -2;
    sheet->column_factor_decimals = 3;
    ASSERT_TRUE(Transpose_Sheet(sheet));
    const Sheet& once = *Current_Sheet;
    EXPECT_EQ(Render(&once), "kind F1|2|3; north T1|4|5; south T2|5|7; All T3|9|12");
    EXPECT_EQ(once.last_column->type, table_margin_column);
    EXPECT_EQ(Levels_Of(*once.first_column->next), "A=7,B=8");
    EXPECT_EQ(once.first_column->next->next->table_margin_value, 10);
    EXPECT_TRUE(once.row_label_name == "site" && once.label_state == 3 && once.has_margins != 0);
    const Column& kinds = *once.first_column->next;
    EXPECT_EQ((std::vector{kinds.format, kinds.date_format, 1 * kinds.date_form, kinds.decimals}),
              (std::vector{5, 2, 1, 3}));
    EXPECT_EQ(once.column_factor_format, significant_digits_format) << "that of the sites";
    EXPECT_EQ(Check_Sheet(once), "");
    ASSERT_TRUE(Transpose_Sheet(Current_Sheet));
    EXPECT_EQ(Render(Current_Sheet), Render(sheet));
    EXPECT_EQ(Current_Sheet->column_factor_date, -2);
    EXPECT_EQ(Current_Sheet->column_factor_decimals, 3);
}

TEST_F(Transpose, Refuses_With_Words)
{
    const std::string square = "You do not need to transpose a symmetric or diagonal matrix.\n";
    const std::tuple<std::int32_t, std::int32_t, std::string> cases[] = {
        {symmetric_matrix_sheet, 2, square},
        {diagonal_matrix_sheet, 2, square},
        {table_sheet, 2, "You cannot transpose a table with more than three classifying factors.\n"},
        {vector_sheet, 2, ""},
        {vector_sheet, 3, "Cannot transpose a spreadsheet with more than 2 rows\nThis sheet has 3 rows.\n"},
    };
    for (const auto& [type, rows, words] : cases) {
        Start_Request("t");
        Sheet* const sheet = New_Sheet_With_Rows(rows);
        New_Data_Column(sheet, variate_column, "a", rows);
        sheet->type = type;
        sheet->table_ways = 3;
        request.Max_Columns = 2;  // beside the labels
        EXPECT_EQ(Transpose_Sheet(sheet), words.empty());
        EXPECT_EQ(Messages(), words.empty() ? "" : words + ":\n");
    }
    Sheet* const bare = New_Sheet_With_Rows(1);
    EXPECT_FALSE(Transpose_Sheet(bare));
    EXPECT_EQ(Messages(), "Internal Spreadsheet Error: Invalid column pointer in Transpose.\n:\n");
    EXPECT_EQ(Current_Sheet, bare);
}

TEST_F(Transpose, The_Summary_Tells_Each_Column)
{
    Sheet* const sheet =
        Sheet_Of("yield V2.5|*|4|1; none V*|*|*|*; name Toats||rye|; kind F1|2|*|2; "
                 "values F1|1|1|1; labels F1|1|1|1; plain F1|1|1|3");  // the last counts nowhere
    Add_Sheet_Comment(sheet, "Trial 7\nof 2021");
    Column* const number = Column_At(sheet, 1);
    number->extra = "t/ha";
    number->decimals = 2;
    number->protected_column = 1;
    number->attached_text = "a+b";
    Column_At(sheet, 3)->decimals = -1;
    Put_Levels(*Column_At(sheet, 4), {10, 20.5}, {"a", "b"});
    Put_Levels(*Column_At(sheet, 5), {7, 8});
    Put_Levels(*Column_At(sheet, 6), {}, {"x", "y"});
    Column* const plain = Column_At(sheet, 7);
    plain->range_selected = 1;
    testing::internal::CaptureStdout();
    EXPECT_TRUE(Print_Column_Summary(sheet, "o.tab"));
    EXPECT_EQ(testing::internal::GetCapturedStdout(),
              "\nSummary of Columns output to: o.tab\nSheet of type: Vector\n\n"
              "Sheet Title:\nTrial 7\nof 2021\n"
              "   1: yield - Variate\n      Mean: 2.5, Min: 1, Max: 4, NMV: 1\n"
              "     Extra: 't/ha' Decimals: 2 Protected\n      Calculation: a+b\n"
              "   2: none - Variate, an empty column\n"
              "   3: name - Text  Maximum width: 4\n"
              "   4: kind - Factor, 2 Levels, NMV: 1\n"
              "         1: a, 10 (x 1)\n         2: b, 20.5 (x 2)\n"
              "   5: values - Factor, 2 Levels, NMV: 0\n         1: 7 (x 4)\n         2: 8 (x 0)\n"
              "   6: labels - Factor, 2 Levels, NMV: 0\n         1: x (x 4)\n         2: y (x 0)\n"
              "   7: plain - Factor, 2 Levels, NMV: 0\n         1: (x 3)\n         2: (x 0)\n\n");
    EXPECT_EQ(Count_Columns_Of_Type(sheet, factor_column, false), 4);
    EXPECT_EQ(Count_Columns_Of_Type(sheet, Any_Column_Type, true), 1);
    EXPECT_EQ(Nth_Column_Of_Type(sheet, factor_column, 2), Column_At(sheet, 5));
    EXPECT_EQ(Nth_Column_Of_Type(sheet, factor_column, 5), nullptr);
    plain->nlevels = 2000000000;
    EXPECT_LT(Column_Summary_Text(*sheet, "o").size(), 40000000U) << "levels that a damaged file claims";
}

}  // namespace
}  // namespace ingester

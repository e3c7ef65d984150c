// A checker that says nothing is worth nothing: each broken Sheet must be found out.
#include "support/check_sheet.h"

#include "interface/process_request.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>

namespace ingester {
namespace {

constexpr std::int32_t row_count = 3;

/// A number, a text and a factor of two levels, with three rows.
Sheet* Make_Whole_Sheet()
{
    Start_Request();
    Sheet* const sheet = New_Sheet_With_Rows(row_count);
    New_Data_Column(sheet, variate_column, "number", row_count);
    New_Data_Column(sheet, text_column, "text", row_count);
    Column* const factor = New_Data_Column(sheet, factor_column, "factor", row_count);
    factor->first_cell->value.number = 2.0;
    return sheet;
}

TEST(Check_Sheet, Finds_Each_Fault_And_No_Other)
{
    struct Case {
        const char* told;
        std::function<void(Sheet&)> spoil;
    };
    const Case cases[] = {
        {"", [](Sheet&) {}},
        {"columns: 4 nodes", [](Sheet& sheet) { ++sheet.column_count; }},
        {"columns: more than", [](Sheet& sheet) { --sheet.column_count; }},
        {"rows: 3 nodes", [](Sheet& sheet) { sheet.row_count = 4; }},
        {"rows: the last node", [](Sheet& sheet) { sheet.last_row = sheet.first_row; }},
        {"point back", [](Sheet& sheet) { sheet.first_row->next->prev = nullptr; }},
        {"rows: more than", [](Sheet& sheet) { sheet.last_row->next = sheet.first_row; }},
        {"stands at position 2", [](Sheet& sheet) { Column_At(&sheet, 2)->index = 7; }},
        {"another Sheet", [](Sheet& sheet) { Column_At(&sheet, 1)->sheet = nullptr; }},
        {"no name", [](Sheet& sheet) { Column_At(&sheet, 1)->name.clear(); }},
        {"length 2", [](Sheet& sheet) { Column_At(&sheet, 1)->length = 2; }},
        {"3 nodes", [](Sheet& sheet) { Column_At(&sheet, 1)->length = 4; }},
        {"Row column", [](Sheet& sheet) { Column_At(&sheet, 1)->type = row_column; }},
        {"remembered position",
         [](Sheet& sheet) {
             Column_At(&sheet, 1)->cursor_index = 3;
             Column_At(&sheet, 1)->cursor_node = Column_At(&sheet, 1)->last_cell;
         }},
        {"remembered node",
         [](Sheet& sheet) {
             Column_At(&sheet, 1)->cursor_index = 1;
             Column_At(&sheet, 1)->cursor_node = Column_At(&sheet, 1)->last_cell;
         }},
        {"91 characters",
         [](Sheet& sheet) {
             Column& column = *Column_At(&sheet, 2);
             column.last_cell->value.text = column.texts.Store(std::string(91, 'x'));
         }},
        {"level 3", [](Sheet& sheet) { Column_At(&sheet, 3)->last_cell->value.number = 3.0; }},
        {"level 1.5", [](Sheet& sheet) { Column_At(&sheet, 3)->last_cell->value.number = 1.5; }},
        {"fewer labels", [](Sheet& sheet) { Column_At(&sheet, 3)->factor_kind = factor_with_labels; }},
        {"1 nodes",
         [](Sheet& sheet) {
             Make_Level_Values(*Column_At(&sheet, 3), 1);
             Column_At(&sheet, 3)->level_values_count = 2;
         }},
    };
    for (const Case& tried : cases) {
        SCOPED_TRACE(tried.told);
        Sheet* const sheet = Make_Whole_Sheet();
        ASSERT_EQ(Check_Sheet(*sheet), "");
        tried.spoil(*sheet);
        const std::string report = Check_Sheet(*sheet);
        EXPECT_NE(report.find(tried.told), std::string::npos) << report;
        EXPECT_EQ(report.empty(), *tried.told == '\0') << report;
    }
}

TEST(Check_Sheet, Symmetric_Matrix_Columns_Begin_At_The_Diagonal)
{
    Start_Request();
    Sheet* const sheet = New_Sheet_With_Rows(row_count);
    sheet->type = symmetric_matrix_sheet;
    for (std::int32_t i = 0; i < row_count; ++i)
        New_Data_Column(sheet, symmetric_matrix_column, std::to_string(i + 1), row_count - i);
    EXPECT_EQ(Check_Sheet(*sheet), "");
    New_Data_Column(sheet, symmetric_matrix_column, "4", row_count);
    EXPECT_NE(Check_Sheet(*sheet).find("length 3"), std::string::npos);
}

}  // namespace
}  // namespace ingester

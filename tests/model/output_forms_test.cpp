// Sheets that change their form for an output.
#include "model/output_forms.h"

#include "model/told_sheets.h"

namespace ingester {
namespace {

using Output_Forms_Test = Request_Test;

/// The form of a Sheet: its type, label state, and the types and names of its columns.
std::string Form(const Sheet& sheet)
{
    std::string form = std::to_string(sheet.type) + "/" + std::to_string(sheet.label_state);
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        form += " " + std::to_string(column->type) + column->name.c_str();
    EXPECT_EQ(Check_Sheet(sheet), "");
    return form;
}

TEST_F(Output_Forms_Test, Numbers_Become_A_Matrix_Or_Scalars_And_All_Else_Stays)
{
    Sheet* const no_rows = New_Sheet();
    New_Column(no_rows, variate_column, "v");
    const std::tuple<Sheet*, std::string, std::string> cases[] = {
        {Sheet_Of("a V1|2; b V3|4"), "2/2 5a 5b", "1/0 4a 4b"},
        {Sheet_Of("C1 V1|2; C2 V3|4"), "2/0 51 52", "1/0 4C1 4C2"},
        {Sheet_Of("a V1|2; t T|; b V3|4"), "2/2 -3t 5a 5b", "1/0 4a 3t 4b"},
        {Sheet_Of("C1 T; C2 V1"), "2/0 -3C1 51", "1/0 3C1 4C2"},
        {Sheet_Of("t T; u T; a V1"), "1/0 3t 3u 4a", "1/0 3t 3u 4a"},
        {Sheet_Of("a V1; f F1"), "1/0 4a 2f", "1/0 4a 2f"},
        {Sheet_Of("t T"), "1/0 3t", "1/0 3t"},
        {Sheet_Of("a V1; b V2"), "2/2 5a 5b", "6/0 1a 1b"},
        {no_rows, "1/0 4v", "1/0 4v"},
    };
    for (const auto& [sheet, matrix, scalars] : cases) {
        Vector_To_Scalars(sheet);
        EXPECT_EQ(Form(*sheet), scalars);
        const bool scalar = sheet->type == scalar_sheet;
        if (scalar) {
            sheet->type = vector_sheet;
            for (Column* column = sheet->first_column->next; column != nullptr; column = column->next)
                column->type = variate_column;
        }
        Vector_To_Matrix(sheet, "M");
        EXPECT_EQ(Form(*sheet), matrix);
        EXPECT_EQ(sheet->structure_name == "M", sheet->type == matrix_sheet);
    }
}

TEST_F(Output_Forms_Test, Decimals_Are_Those_That_Say_Something)
{
    const std::tuple<double, double, std::int32_t> cases[] = {
        {1.0, 2.0, 0},     {1.5, 2.25, 2},          {0.1, 0.2, 1},   {1.0 / 3.0, 1.0, 12},
        {1e-13, 1.0, 0},   {Missing_Value, 2.5, 1}, {1e300, 0.5, 1}, {Missing_Value, Missing_Value, 0},
        {-0.125, 1e12, 3},
    };
    for (const auto& [first, last, decimals] : cases) {
        Sheet* const sheet = Sheet_Of("a V1|2; t T|; b V1|2");
        Column* const column = sheet->first_column->next;
        column->first_cell->value.number = first;
        column->last_cell->value.number = last;
        sheet->last_column->format = exponent_format;
        Find_Decimals(sheet);
        EXPECT_EQ(column->decimals, decimals) << first << " " << last;
        EXPECT_EQ(column->format, fixed_format);
        EXPECT_EQ(sheet->last_column->format, exponent_format) << "a format of its own stays";
    }
    Sheet* const sheet = Sheet_Of("f F1|2");
    Put_Levels(*sheet->last_column, {12.5, 0});
    Find_Decimals(sheet);
    EXPECT_EQ(sheet->last_column->decimals, 1) << "a Factor shows its level values";
}

TEST_F(Output_Forms_Test, A_Range_Of_Columns_Keeps_The_Sheet_In_Order)
{
    Sheet* const vector = Sheet_Of("v1 V1; v2 T; v3 V1; v4 V1");
    Keep_Columns(vector, 2, 3);
    EXPECT_EQ(Form(*vector), "1/0 3v2 4v3");
    Keep_Columns(vector, 0, 9);
    EXPECT_EQ(Form(*vector), "1/0 3v2 4v3");
    Sheet* const matrix = Sheet_Of("C1 V1|2; C2 V1|2; C3 V1|2");
    Vector_To_Matrix(matrix, "M");
    Keep_Columns(matrix, 2, 3);
    EXPECT_EQ(Form(*matrix), "2/0 51 52");
}

}  // namespace
}  // namespace ingester

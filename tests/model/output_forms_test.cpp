// Sheets that change their form for an output.
#include "model/output_forms.h"

#include "support/check_sheet.h"
#include "support/request_fixture.h"

namespace ingester {
namespace {

class Output_Forms_Test : public Request_Test {
protected:
    /// A Vector of columns of the types, named in order, with cells 1, 2, ... or missing.
    static Sheet* Make(std::initializer_list<Column_Type> types, std::int32_t rows, const char* prefix = "v")
    {
        Sheet* const sheet = rows > 0 ? New_Sheet_With_Rows(rows) : New_Sheet();
        int number = 0;
        for (const Column_Type type : types) {
            Column* const column = New_Data_Column(sheet, type, prefix + std::to_string(++number), rows);
            double value = 0;
            for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
                if (!Is_Text_Like(type))
                    cell->value.number = ++value;
        }
        return sheet;
    }

    /// The form of a Sheet: its type, label state, and the types and names of its columns.
    static std::string Form(const Sheet& sheet)
    {
        std::string form = std::to_string(sheet.type) + "/" + std::to_string(sheet.label_state);
        for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
            form += " " + std::to_string(column->type) + column->name.c_str();
        EXPECT_EQ(Check_Sheet(sheet), "");
        return form;
    }
};

TEST_F(Output_Forms_Test, Numbers_Become_A_Matrix_Or_Scalars_And_All_Else_Stays)
{
    const std::tuple<Sheet*, std::string, std::string> cases[] = {
        {Make({variate_column, variate_column}, 2), "2/2 5v1 5v2", "1/0 4v1 4v2"},
        {Make({variate_column, variate_column}, 2, "C"), "2/0 51 52", "1/0 4C1 4C2"},
        {Make({variate_column, text_column, variate_column}, 2), "2/2 -3v2 5v1 5v3", "1/0 4v1 3v2 4v3"},
        {Make({text_column, variate_column}, 1, "C"), "2/0 -3C1 51", "1/0 3C1 4C2"},
        {Make({text_column, text_column, variate_column}, 1), "1/0 3v1 3v2 4v3", "1/0 3v1 3v2 4v3"},
        {Make({variate_column, factor_column}, 1), "1/0 4v1 2v2", "1/0 4v1 2v2"},
        {Make({text_column}, 1), "1/0 3v1", "1/0 3v1"},
        {Make({variate_column, variate_column}, 1), "2/2 5v1 5v2", "6/0 1v1 1v2"},
        {Make({variate_column}, 0), "1/0 4v1", "1/0 4v1"},
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
        Sheet* const sheet = Make({variate_column, text_column, variate_column}, 2);
        Column* const column = sheet->first_column->next;
        column->first_cell->value.number = first;
        column->last_cell->value.number = last;
        sheet->last_column->format = exponent_format;
        Find_Decimals(sheet);
        EXPECT_EQ(column->decimals, decimals) << first << " " << last;
        EXPECT_EQ(column->format, fixed_format);
        EXPECT_EQ(sheet->last_column->format, exponent_format) << "a format of its own stays";
    }
    Sheet* const sheet = Make({factor_column}, 2);
    Make_Level_Values(*sheet->last_column, 2);
    sheet->last_column->level_values->value.number = 12.5;
    Find_Decimals(sheet);
    EXPECT_EQ(sheet->last_column->decimals, 1) << "a Factor shows its level values";
}

TEST_F(Output_Forms_Test, A_Range_Of_Columns_Keeps_The_Sheet_In_Order)
{
    Sheet* const vector = Make({variate_column, text_column, variate_column, variate_column}, 2);
    Keep_Columns(vector, 2, 3);
    EXPECT_EQ(Form(*vector), "1/0 3v2 4v3");
    Keep_Columns(vector, 0, 9);
    EXPECT_EQ(Form(*vector), "1/0 3v2 4v3");
    Sheet* const matrix = Make({variate_column, variate_column, variate_column}, 2, "C");
    Vector_To_Matrix(matrix, "M");
    Keep_Columns(matrix, 2, 3);
    EXPECT_EQ(Form(*matrix), "2/0 51 52");
}

}  // namespace
}  // namespace ingester

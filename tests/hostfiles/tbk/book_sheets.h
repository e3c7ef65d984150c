// Sheets of every type that hold all that a book keeps, and what one finds of them in a book.
#pragma once

#include "hostfiles/tbk/book_bytes.h"
#include "hostfiles/tbk/book_parser.h"
#include "hostfiles/tbk/tbk.h"
#include "support/cell_lists.h"
#include "support/check_sheet.h"

#include <algorithm>
#include <span>

namespace ingester {

inline Sheet* Plain_Sheet(const std::string& name, const Texts& cells = {"1", "2", "*"})
{
    Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(cells.size()));
    sheet->sheet_name = name;
    Add_Cells(sheet, variate_column, "x", cells);
    return sheet;
}

/// A Factor with `levels` levels and no lists.
inline Column* Add_Factor(Sheet* sheet, const std::string& name, std::int32_t levels, const Texts& cells)
{
    Column* const column =
        New_Data_Column(sheet, factor_column, name, static_cast<std::int32_t>(cells.size()));
    column->nlevels = levels;
    column->factor_kind = plain_factor;
    auto text = cells.begin();
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next, ++text)
        cell->value.number = *text == "*" ? sheet->missing_value : std::stod(*text);
    return column;
}

inline void Decorate(Column& column)
{
    column.extra = "a description";
    column.creation_date = 154000.5;
    column.cond_active = 1;
    column.cond_op = {1, 6, 8};
    column.cond_value = {1.5, 2.0, -3.0};
    column.cond_colour = {0xFF, 0x1234, 0xFFFFFF};
    column.gradient_scale = 2;
    column.gradient_reversed = 1;
    column.gradient_high = 9.5;
    column.text_colour = 0x010203;
    column.cell_colours = {{1, 2, 3}, {2, 8, 9}, {3, 0, 0xFFFFFF}};
    column.iprint = 2;
    column.hidden = 1;
    column.width = 12;
}

inline void Decorate(Sheet& sheet)
{
    sheet.creation_date = 153999.25;
    sheet.host_flag_a = sheet.host_flag_c = 1;
    Add_Sheet_Comment(&sheet, "first line\nsecond line");
    sheet.analysis_setup = std::string("setup\0", 6);
    sheet.analysis_setup_count = 1;
    sheet.analysis_commands = std::string("one\0two\0", 8);
    sheet.analysis_command_count = 2;
    sheet.analysis_dummy = "dummy";
    sheet.current_column = 2;
    sheet.current_row = 1;
    sheet.pointers = {{"list", 0, {"a", "b"}}, {"all", 4, {}}};
    sheet.cond_mode = sheet.cond_on_background = 1;
    sheet.split_set = 1;
    sheet.split_column = 2;
    sheet.saved_restrictions = {{"kept", std::string("\5\0", 2)}};
    sheet.iprint = 1;
    sheet.restriction_active = 1;
    Row_At(&sheet, 1)->restricted = 1;
    sheet.restricted_rows = 1;
}

/// A Vector Sheet of eight rows with a column of each type.
inline Sheet* Full_Vector()
{
    Sheet* const sheet = New_Sheet_With_Rows(8);
    sheet->sheet_name = "Full";
    const Texts numbers = {"1", "-2.5", "*", "1e300", "4", "5", "6", "7"};
    Column* const variate = Add_Cells(sheet, variate_column, "v", numbers);
    variate->attached_text = "v=a+b";
    variate->attached_mode = 2;
    variate->decimals = 3;
    variate->range_low = 0;
    Decorate(*variate);
    Column* const factor = Add_Factor(sheet, "f", 3, {"1", "2", "3", "*", "1", "1", "2", "3"});
    Put_Levels(*factor, {1.5, 2.5, 9}, {"low", "middle", "high"});
    factor->factor_colours = {1, 2, 3};
    factor->reference_level = 2;
    factor->factor_recoded = 1;
    factor->column_option = 7;
    factor->colour_source = variate->colour_source = factor;
    Add_Factor(sheet, "many", 300, {"300", "1", "2", "*", "256", "255", "4", "5"});
    Add_Cells(sheet, text_column, "t", {"a", "", "c", std::string(90, 'x'), "e", "f", "g", "h"});
    Add_Cells(sheet, long_text_column, "l", {"a", std::string(10000, 'y'), "", "", "", "", "", "z"});
    Add_Cells(sheet, units_text_column, "u", {"r1", "r2", "r3", "r4", "r5", "r6", "r7", "r8"});
    Decorate(*sheet);
    return sheet;
}

inline Sheet* Full_Table(std::int32_t label_state)
{
    Sheet* const sheet = New_Sheet_With_Rows(3);
    sheet->type = table_sheet;
    sheet->sheet_name = "Table";
    sheet->table_ways = 2;
    sheet->has_margins = sheet->has_second_margin = 1;
    sheet->structure_name = "tab";
    sheet->row_label_name = "across";
    sheet->column_factor_date = -9;
    sheet->column_factor_format = 5;
    sheet->column_factor_decimals = -1;
    sheet->label_state = label_state;
    sheet->margin_label = "All";
    Add_Factor(sheet, "down", 3, {"1", "3", "4"});
    for (const char* const name : {"10", "20.5"}) {
        Column* const column = Add_Cells(sheet, table_column, name, {"1", "2", "*"});
        column->table_margin_value = label_state == 0 ? column->index - 1 : std::stod(name);
        if (label_state >= 2)
            column->table_label = name;
    }
    Add_Cells(sheet, table_margin_column, "Margin", {"1", "2", "3"});
    return sheet;
}

inline Sheet* Full_Matrix(std::int32_t type)
{
    constexpr std::int32_t columns[] = {0, 0, matrix_column, symmetric_matrix_column, diagonal_matrix_column};
    Sheet* const sheet = New_Sheet_With_Rows(3);
    sheet->type = type;
    sheet->sheet_name = "Matrix";
    sheet->structure_name = "m";
    sheet->label_state = type == diagonal_matrix_sheet ? 0 : 2;
    Add_Cells(sheet, units_text_column, "u", {"p", "q", "r"});
    Add_Cells(sheet, columns[type], "m", {"1", "2", "3"});
    for (const char* const name : {"b", "c"}) {
        if (type == diagonal_matrix_sheet)
            break;
        const Texts cells = {"4", "5", "6"};
        const bool whole = type == matrix_sheet;
        Add_Cells(sheet, columns[type], name, Texts(cells.begin(), cells.end() - (whole ? 0 : *name - 'a')));
    }
    return sheet;
}

inline Sheet* Full_Scalar()
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    sheet->type = scalar_sheet;
    Add_Cells(sheet, scalar_column, "pi", {"3.14159265358979"});
    return sheet;
}

/// Whether all of `parts` stand in `bytes`.
inline bool Has_Text(const std::string& bytes, const Texts& parts)
{
    return std::ranges::all_of(
        parts, [&](const std::string& part) { return bytes.find(part) != std::string::npos; });
}

class Book_Test : public Request_Test {
protected:
    /// The book of these bytes, read; null when that fails.
    [[nodiscard]] static Sheet* Read(const std::string& bytes)
    {
        Input_File file(std::as_bytes(std::span(bytes)), "b.tbk");
        const bool good = Read_TBK(file);
        EXPECT_EQ(good, Current_Sheet != nullptr);
        EXPECT_EQ(Current_Sheet == nullptr ? "" : Check_Sheet(*Current_Sheet), "");
        return Current_Sheet;
    }
    [[nodiscard]] std::string Written(std::span<Sheet* const> sheets) const
    {
        EXPECT_TRUE(Write_TBK_File(sheets, Request_Name("w.tbk").c_str()));
        return Get("w.tbk");
    }
    [[nodiscard]] std::string Written(Sheet* sheet) const
    {
        return Written(std::span<Sheet* const>(&sheet, 1));
    }

    [[nodiscard]] Texts Pages(const std::string& name) const
    {
        return Read_Page_Names(Request_Name(name).c_str()).value_or(Texts{"no list"});
    }
    [[nodiscard]] bool Add(const std::string& name, Sheet* sheet) const
    {
        return Add_Sheets_To_TBK(Request_Name(name).c_str(), std::span<Sheet* const>(&sheet, 1));
    }
    [[nodiscard]] bool Replace(const std::string& name, Sheet* sheet, const std::string& page) const
    {
        return Replace_Sheet_In_TBK(Request_Name(name).c_str(), sheet, page);
    }
};

}  // namespace ingester

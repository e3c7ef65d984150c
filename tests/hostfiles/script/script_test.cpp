#include "hostfiles/script/script.h"

#include "hostfiles/script/script_parser.h"
#include "hostfiles/script/script_text.h"
#include "support/cell_lists.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <numeric>
#include <random>

namespace ingester {
namespace {

class Script : public Request_Test {
protected:
    [[nodiscard]] std::string Written(Sheet* sheet) const
    {
        EXPECT_TRUE(Write_Host_Script(sheet, Request_Name("out.gen").c_str()));
        return Get("out.gen");
    }
    /// What the host hears, but for the last statement: "|" for ends of lines, "-name" for a deletion.
    [[nodiscard]] std::string Heard(Sheet* sheet) const
    {
        std::string heard = Heard_Of(Written(sheet));
        const auto replace = [&](std::string_view text, std::string_view shown) {
            for (std::size_t at = 0; (at = heard.find(text, at)) != heard.npos; at += shown.size())
                heard.replace(at, text.size(), shown);
        };
        replace("\n", "|");
        replace("RETURN [CLOSE=yes]||", "");
        replace("DELETE [redefine=yes] ", "-");
        // How many made-up names there were before doesn't matter.
        for (std::size_t at = 0; (at = heard.find("_tf", at)) != heard.npos; at += 5)
            heard.replace(at + 5, heard.find_first_not_of("0123456789", at + 5) - at - 5, "#");
        return heard;
    }
};

Sheet* Sheet_Of(std::int32_t type, std::int32_t rows, const char* name = "")
{
    Sheet* const sheet = New_Sheet_With_Rows(rows);
    sheet->type = type;
    sheet->structure_name = name;
    return sheet;
}

Column* Describe(Column* column, std::int32_t decimals, const char* extra, std::int32_t date_format = 0)
{
    column->decimals = decimals;
    column->extra = extra;
    column->format = date_format > 0 ? date_format_mark : column->format;
    column->date_format = date_format;
    return column;
}

TEST_F(Script, Numbers_Are_Those_The_Host_Reads)
{
    const double greatest = std::nextafter(9.99999e307, HUGE_VAL);
    const std::tuple<double, double, bool, const char*> cases[] = {
        {1e9, Missing_Value, false, "1000000000"},
        {-1000000000.5, Missing_Value, false, "-1.000000000500e+09"},
        {0.1 + 0.2, Missing_Value, false, "0.3"},
        {-1e-300, Missing_Value, false, "-1e-300"},
        {9.99999e307, Missing_Value, false, "9.999990000000e+307"},
        {greatest, Missing_Value, false, "9.99999E+307"},
        {HUGE_VAL, Missing_Value, true, "9.99999E+307"},
        {-HUGE_VAL, Missing_Value, false, "*"},
        {std::nan(""), Missing_Value, true, "*"},
        {-1e306, Missing_Value, false, "-1.000000000000e+306"},
        {59, Missing_Value, true, "109572"},
        {60.5, Missing_Value, true, "109572.5"},
        {-1, Missing_Value, true, "*"},
        {99, 99, true, "*"},
    };
    for (const auto& [value, missing, date, expected] : cases) {
        char text[Number_Text_Room];
        const std::string_view printed(
            text, static_cast<std::size_t>(Format_Script_Number(text, value, missing, date) - text));
        EXPECT_EQ(printed, expected);
    }
}

/// One of each kind, spelled out.
TEST_F(Script, A_Vector_To_The_Letter)
{
    Sheet* const sheet = Sheet_Of(vector_sheet, 3);
    sheet->source_file = "C:\\in\"put.csv";
    Describe(Add_Cells(sheet, variate_column, "v", {"1", "*", "2.50"}), 2, "it's \"so\"");
    Describe(Add_Cells(sheet, variate_column, "day", {"1", "60", "*"}), -1, "", 4);
    Describe(Add_Cells(sheet, variate_column, "host", {"1", "2", "3"}), -1, "", 10)->date_form = 1;
    Describe(Add_Cells(sheet, text_column, "t", {"a", "", "b'c"}), 0, "x");
    Describe(Add_Cells(sheet, long_text_column, "l", {"a\\b", "", "c"}), 0, "");
    Column* const factor = Add_Cells(sheet, factor_column, "f", {"2", "*", "1"});
    Put_Levels(*factor, {10, 20}, {"low", "it's"});
    Describe(factor, 0, "dose", 2);
    Add_Cells(sheet, factor_column, "p", {"1", "1", "2"});
    Add_Cells(sheet, units_text_column, "id", {"a", "b", "c"});
    sheet->restriction_active = sheet->modified = 1;
    Row_At(sheet, 1)->restricted = 1;
    request.Title_Text = "The `title'";
    request.Pointer_Name = "all";
    EXPECT_EQ(Written(sheet), R"("Data taken from File: C:\in""put.csv"

DELETE [Redefine=yes] _stitle_ : TEXT _stitle_ : READ [print=*] _stitle_
'The ``title''':
PRINT [IPrint=*] _stitle_; Just=Left
DELETE [redefine=yes] id,v,day,host,t,l,f,p
TEXT [nvalues=3] id
READ id
'a' 'b' 'c' :
UNITS id
VARIATE [nvalues=3] v; decimals=2; extra='it''s ""so""'
READ v
1 * 2.5 :
VARIATE [nvalues=3] day; drep=4
READ day
109514 109572 * :
VARIATE [nvalues=3] host; drep=10
READ host
1 2 3 :
TEXT [nvalues=3] t; extra='x'
READ t
'a' '' 'b''c' :
TEXT [nvalues=3] l
READ l
'a\\b'
''
'c'
:
FACTOR [modify=yes;nvalues=3;levels=!(109523,109533);labels=!t('low','it''s')\
] f; decimals=0; extra='dose'; drep=2
READ f; frepresentation=ordinal
2* 1:
FACTOR [modify=yes;nvalues=3;levels=2] p
READ p; frepresentation=ordinal
112:
DELETE [redefine=yes] _rest_
READ [print=*;setnvalues=y] _rest_
1 0 1 :
RESTRICT id,v,day,host,t,l,f,p; _rest_
DELETE [redefine=yes] all
POINTER all; !p(id,v,day,host,t,l,f,p)

RETURN [CLOSE=yes]

)");
    EXPECT_EQ(sheet->modified, 0);
}

TEST_F(Script, The_Request_Chooses_Endings_And_Quiet_Reading)
{
    const std::pair<void (*)(), const char*> cases[] = {
        {[] { request.Quiet_Read = request.No_Return = true; }, "\nREAD [print=*] v\n* :\nRESTRICT v\n\n"},
        {[] { request.No_Return = true, request.Return_Delete_Marker = "out"; },
         "\nREAD v\n* :\nRESTRICT v\nRETURN [CLOSE=yes;DELETE=yes]\n\n"},
        {[] { request.Return_Delete_Marker = "other"; }, "\nRESTRICT v\nRETURN [CLOSE=yes]\n\n"},
        {[] { request.End_With_Break = true; }, "\nRESTRICT v\nENDBREAK\n\n"},
    };
    for (const auto& [ask, ending] : cases) {
        Start_Request("t");
        ask();
        Sheet* const sheet = Sheet_Of(vector_sheet, 1);
        Add_Cells(sheet, variate_column, "v", {"*"});
        EXPECT_TRUE(Written(sheet).ends_with(ending)) << ending;
    }
}

/// A Table with the levels of its columns in `levels`.
Sheet* Table_Of(std::int32_t ways, const Texts& factors, const std::vector<double>& levels)
{
    Sheet* const sheet = Sheet_Of(table_sheet, 4, ways > 1 ? "tab" : "");
    sheet->table_ways = ways;
    for (const std::string& name : factors) {
        Column* const factor = Add_Cells(sheet, factor_column, name, {"1", "2", "3", "4"});
        Put_Levels(*factor, {2, 4, 6, 8});
        Free_Cell_Nodes(factor, label_nodes);
    }
    int value = 0;
    for (const double level : levels) {
        Texts cells;
        for (int row = 0; row < 4; ++row)
            cells.push_back(std::to_string(++value));
        Add_Cells(sheet, table_column, Format_Text("c%i", value / 4), cells)->table_margin_value = level;
    }
    Describe(Column_At(sheet, static_cast<std::int32_t>(factors.size()) + 1), 1, "yield");
    return sheet;
}

Sheet* Matrix_Of(std::int32_t type, std::int32_t label_state, const Texts& names)
{
    const auto rows = static_cast<std::int32_t>(type == symmetric_matrix_sheet ? names.size() : 2);
    Sheet* const sheet = Sheet_Of(type, rows, "m");
    sheet->label_state = label_state;
    for (std::size_t i = 0; i < names.size(); ++i)
        Add_Cells(sheet, type == matrix_sheet ? matrix_column : symmetric_matrix_column, names[i],
                  type == matrix_sheet || i == 1 ? Texts{"1", "*"}
                  : i == 0                       ? Texts{"4", "5", "6"}
                                                 : Texts{"9"});
    Describe(sheet->last_column, 3, "");
    Describe(sheet->first_column->next, 2, "all", 3);
    return sheet;
}

TEST_F(Script, Every_Structure_Comes_Back)
{
    const auto with_units = [](Sheet* sheet, std::int32_t type, const Texts& units) {
        Describe(Add_Cells(sheet, type, "u", units), 0, "rows", type == units_text_column ? 0 : 1);
        return sheet;
    };
    const auto labelled = [](Sheet* sheet, std::int32_t state, const char* name) {
        sheet->label_state = state;
        sheet->row_label_name = name;
        sheet->column_label_name = "across";
        return sheet;
    };
    const auto with_margin = [](Sheet* sheet) {
        sheet->has_margins = 1;
        Add_Cells(sheet, table_margin_column, "Margin", {"7", "8", "9", "0"});
        return sheet;
    };
    const auto diagonal = [](std::int32_t rows) {
        Sheet* const sheet = Sheet_Of(diagonal_matrix_sheet, rows);
        Describe(New_Data_Column(sheet, diagonal_matrix_column, "d", rows), 1, "diag");
        return sheet;
    };
    const auto scalars = [] {
        Sheet* const sheet = Sheet_Of(scalar_sheet, 1);
        Describe(Add_Cells(sheet, scalar_column, "s", {"2"}), 1, "one", 4);
        Add_Cells(sheet, scalar_column, "", {"*"})->name = "";
        return sheet;
    };
    const auto empty_columns = [&] {
        Sheet* const sheet = Sheet_Of(vector_sheet, 0);
        Describe(New_Data_Column(sheet, variate_column, "v", 0), 3, "x", 2);
        Describe(New_Data_Column(sheet, text_column, "t", 0), 0, "y");
        New_Data_Column(sheet, factor_column, "f", 0);
        New_Data_Column(sheet, units_text_column, "u", 0);
        return sheet;
    };
    // What several of them have.
    const std::string matrix = " m; DECIMALS=2; EXTRA='all'; DREP=3|READ m|109514 1 * * :|";
    const std::string symmetric = " m; decimals=2; extra='all'; drep=3|READ m|109517 109518 1 109519 * 9 :|";
    const std::string four = "FACTOR [modify=yes;levels=!(2,4,6,8)] ";
    const std::string body = " tab ; decimals=1; extra='yield'|READ tab|1 5 2 6 3 7";
    const std::pair<Sheet*, std::string> cases[] = {
        {empty_columns(),
         "-u,v,t,f|TEXT [values=*] u|VARIATE [values=*] v; extra='x'; drep=2|TEXT [values=*] t; "
         "extra='y'|FACTOR [modify=yes;nvalues=*;levels=2] f|RESTRICT u,v,t,f|"},
        {scalars(), "-s|SCALAR s; 109515; decimals=1; extra='one'; drep=4|-C2|SCALAR C2; *|"},
        {Matrix_Of(matrix_sheet, 0, {"1", "2"}), "-m|MATRIX [ROWS=2;COLUMNS=2]" + matrix},
        {with_units(Matrix_Of(matrix_sheet, 1, {"5", "7.5"}), units_variate_column, {"1", "2"}),
         "-m|-_cols_|VARIATE [nvalues=2] _cols_|READ _cols_|5 7.5 :|-_rows_|VARIATE [nvalues=2] _rows_; "
         "EXTRA='rows'; DREP=1|READ _rows_|109514 109515 :|MATRIX [ROWS=!(#_rows_);COLUMNS=!(#_cols_)]"
             + matrix},
        {with_units(Matrix_Of(matrix_sheet, 2, {"a'", "b"}), units_text_column, {"x", "y"}),
         "-m|-_tcols_|TEXT [nvalues=2] _tcols_|READ _tcols_|'a'' 'b' :|-_trows_|TEXT [nvalues=2] _trows_; "
         "EXTRA='rows'|READ _trows_|'x' 'y' :|MATRIX [ROWS=!t(#_trows_);COLUMNS=!t(#_tcols_)]"
             + matrix},
        {Matrix_Of(matrix_sheet, 1, {"5", "b"}),
         "-m|-_tcols_|TEXT [nvalues=2] _tcols_|READ _tcols_|'5' 'b' :|MATRIX [ROWS=2;COLUMNS=!t(#_tcols_)]"
             + matrix},
        {Sheet_Of(matrix_sheet, 0, "no"), "-no|MATRIX no|"},
        {Matrix_Of(symmetric_matrix_sheet, 0, {"1", "2", "3"}), "-m|SYMMETRICMATRIX [rows=3]" + symmetric},
        {Matrix_Of(symmetric_matrix_sheet, 2, {"a", "b", "c"}),
         "-m|-_trows_|TEXT [nvalues=3] _trows_|READ _trows_|'a' 'b' 'c' :|SYMMETRICMATRIX [rows=!t(#_trows_)]"
             + symmetric},
        {Sheet_Of(symmetric_matrix_sheet, 0, "no"), "-no|SYMMETRICMATRIX no|"},
        {with_units(diagonal(2), units_text_column, {"x", "y"}),
         "-d|-_trows_|TEXT [nvalues=2] _trows_; EXTRA='rows'|READ _trows_|'x' 'y' :|DIAGONALMATRIX "
         "[rows=!t(#_trows_)] d; decimals=1; extra='diag'|READ d|* * :|"},
        {diagonal(0), "-d|DIAGONALMATRIX d|"},
        {Table_Of(1, {"row"}, {0, 0}),
         four
             + "row|-c1|TABLE [class=row;margins=no] c1 ; decimals=1; extra='yield'|READ c1|1 2 3 4 "
               ":|-c2|TABLE [class=row;margins=no] c2|READ c2|5 6 7 8 :|"},
        {with_margin(Table_Of(1, {}, {0})),
         "FACTOR [modify=yes;levels=3] _tfc_#|-c1|TABLE [class=_tfc_#;margins=no] c1 ; decimals=1; "
         "extra='yield'|READ c1|1 2 3 :|"},
        {Table_Of(2, {}, {0, 0}), "FACTOR [modify=yes;levels=4] _tfc_#|FACTOR [modify=yes;levels=2] "
                                  "_tf1_#|-tab|TABLE [class=_tfc_#,_tf1_#;margins=no]"
                                      + body + " 4 8 :|"},
        {with_margin(labelled(Table_Of(2, {"row"}, {3, 1.5}), 1, "col")),
         four
             + "row|FACTOR [modify=yes;levels=!(3,1.5)] col; extra='across'|-tab|TABLE "
               "[class=row,col;margins=no]"
             + body + " :|"},
        {labelled(Table_Of(2, {"row"}, {3, 3}), 1, ""),
         four
             + "row|FACTOR [modify=yes;levels=2;labels=!t('c1','c2')] _tf1_#; extra='across'|-tab|TABLE "
               "[class=row,_tf1_#;margins=no]"
             + body + " 4 8 :|"},
        {with_margin(labelled(Table_Of(3, {"a", "b"}, {5, 6}), 3, "c")),
         four + "a|" + four
             + "b|FACTOR [modify=yes;levels=!(5,6);labels=!t('c1','c2')] c; extra='across'|-tab|TABLE "
               "[class=a,b,c;margins=yes] tab; decimals=1; extra='yield'|READ tab|1 5 7 2 6 8 3 7 9 4 8 0 "
               ":|"},
    };
    for (const auto& [sheet, expected] : cases)
        EXPECT_EQ(Heard(sheet), expected);
    Sheet* const dated = labelled(Table_Of(2, {"row"}, {45000, 45001}), 1, "col");
    dated->column_factor_format = date_format_mark;
    dated->column_factor_date = 2;
    dated->column_factor_decimals = -1;
    EXPECT_NE(Heard(dated).find("levels=!(154512,154513)] col; extra='across'; drep=2|"), std::string::npos);
    Sheet* const cut = Matrix_Of(symmetric_matrix_sheet, 0, {"1", "2", "3"});
    while (cut->column_count > 2)
        Delete_Column(cut->last_column, false);
    EXPECT_NE(Heard(cut).find("READ m|109517 109518 1 109519 * * :|"), std::string::npos) << Heard(cut);
    EXPECT_NE(Messages().find("The matrix m lacks 1 of its columns"), std::string::npos);
    request.Pointer_Name = "p";
    EXPECT_TRUE(Heard(Table_Of(1, {"row"}, {0})).ends_with(":|-p|POINTER p; !p(row,c1)||"));
}

TEST_F(Script, Factors_Of_Many_Levels_Are_Declared_In_The_Long_Form)
{
    const auto factor_of = [](int levels, bool values, bool labels) {
        Sheet* const sheet = Sheet_Of(vector_sheet, 1);
        Column* const factor = Add_Cells(sheet, factor_column, "f", {"7"});
        std::vector<double> values_of(static_cast<std::size_t>(levels));
        std::iota(values_of.begin(), values_of.end(), 1);
        Put_Levels(*factor, values_of, Texts(values_of.size()));
        if (!values)
            Free_Cell_Nodes(factor, level_value_nodes);
        if (!labels)
            Free_Cell_Nodes(factor, label_nodes);
        return sheet;
    };
    const std::string data = " f|READ f; frepresentation=ordinal|7:|RESTRICT f|";
    std::string numbers, nulls;
    for (int level = 1; level <= 22; ++level) {
        numbers += std::to_string(level) + " ";
        nulls += "'<Null>' ";
    }
    EXPECT_EQ(Heard(factor_of(22, true, true)),
              "-f|-_levels_|VARIATE [nvalues=22] _levels_|READ _levels_|" + numbers
                  + ":|-_labels_|TEXT [nvalues=22] _labels_|READ _labels_|" + nulls
                  + ":|FACTOR [modify=yes;nvalues=1;levels=!(#_levels_);labels=!t(#_labels_)]" + data);
    EXPECT_EQ(Heard(factor_of(5000, false, false)), "-f|FACTOR [modify=yes;nvalues=1;levels=5000]" + data);
    for (const auto& [values, labels, most] :
         {std::tuple(true, true, 21), {true, false, 42}, {false, true, 42}})
        for (const int levels : {most, most + 1}) {
            const std::string heard = Heard(factor_of(levels, values, labels));
            EXPECT_EQ(heard.find("levels=!(#_levels_)") != heard.npos, values && levels > most);
            EXPECT_EQ(heard.find("labels=!t(#_labels_)") != heard.npos, labels && levels > most);
        }
}

TEST_F(Script, Lines_Break_Where_The_Host_Reads_On)
{
    Sheet* const sheet = Sheet_Of(vector_sheet, 12);
    const std::string sixty(59, 'n');
    for (const char* last : {"a", "b", "c"})
        Add_Cells(sheet, variate_column, sixty + last, Texts(12, "123456.5"));
    const std::string script = Written(sheet);
    EXPECT_TRUE(script.starts_with("DELETE [redefine=yes] \\\n" + sixty + "a\\\n," + sixty + "b\\\n," + sixty
                                   + "c\nVARIATE [nvalues=\\\n12] " + sixty + "a\nREAD " + sixty + "a\n"));
    const std::string eight = "123456.5 123456.5 123456.5 123456.5 123456.5 123456.5 123456.5 123456.5 ";
    EXPECT_NE(script.find("\n" + eight + "\n123456.5 123456.5 123456.5 123456.5 :\n"), script.npos);
    EXPECT_EQ(Heard(sheet).find("FAULT"), script.npos);
}

TEST_F(Script, Hostile_Texts_Come_Back_Whole)
{
    std::mt19937 random(5);
    const auto hostile = [&](std::size_t most) {
        std::string text(1 + random() % most, ' ');
        for (char& c : text)
            c = "it's \"a\\b`\x01\n\xE9 :"[random() % 15];
        return "x" + text;
    };
    /// As it must come back.
    const auto received = [](std::string_view text, std::size_t limit) {
        std::string kept(text.substr(0, limit));
        std::ranges::replace_if(
            kept, [](char c) { return c == '\n' || c == '\x01'; }, ' ');
        return "'" + kept + "'";
    };
    for (int round = 0; round < 300; ++round) {
        Start_Request("t");
        Sheet* const sheet = Sheet_Of(vector_sheet, 1 + round % 20);
        sheet->source_file = hostile(280);
        request.Title_Text = hostile(280);
        Texts expected = {"_stitle_|" + received(request.Title_Text, 180) + ":|"};
        for (const std::int32_t type : {text_column, long_text_column}) {
            Column* const column =
                New_Data_Column(sheet, type, std::string(random() % 60, 'n') + "c", sheet->row_count);
            column->extra = hostile(80);
            expected.push_back(std::string(column->name) + "; extra=" + received(column->extra, 80) + "|READ "
                               + std::string(column->name) + "|");
            for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next) {
                const std::string text = hostile(type == text_column ? 89 : 9999);
                cell->value.text = column->texts.Store(text);
                expected.back() += received(text, 10000) + (type == text_column ? " " : "");
            }
            expected.back() += ":|";
        }
        Column* const factor = New_Data_Column(sheet, factor_column, "f", sheet->row_count);
        Texts labels(43 + random() % 60);
        for (std::string& label : labels)
            label = hostile(250);
        Put_Levels(*factor, std::vector<double>(labels.size()), labels);
        Free_Cell_Nodes(factor, level_value_nodes);
        expected.emplace_back("_labels_|");
        for (const std::string& label : labels)
            expected.back() += received(label, 90) + " ";
        const std::string heard = Heard(sheet);
        for (const std::string& part : expected)
            ASSERT_NE(heard.find(part), heard.npos) << part << "\n" << Get("out.gen");
        ASSERT_EQ(heard.find("FAULT"), heard.npos) << heard;
    }
}

TEST_F(Script, Fails_Where_Nothing_Can_Be_Declared_Or_Written)
{
    const std::string name = Request_Name("x.gen");
    for (Sheet* const sheet : {static_cast<Sheet*>(nullptr), Sheet_Of(0, 1), Sheet_Of(7, 1)})
        EXPECT_FALSE(Write_Host_Script(sheet, name.c_str()));
    EXPECT_EQ(Files(), "");
    for (const std::int32_t type : {vector_sheet, diagonal_matrix_sheet, table_sheet, scalar_sheet})
        EXPECT_FALSE(Write_Host_Script(Sheet_Of(type, 1), name.c_str())) << type;
    Sheet* const sheet = Sheet_Of(vector_sheet, 1);
    Column* const column = Add_Cells(sheet, variate_column, "v", {"1"});
    EXPECT_FALSE(Write_Host_Script(sheet, "/dev/full") || Write_Host_Script(sheet, (name + "\\x").c_str()));
    column->type = table_column;
    EXPECT_FALSE(Write_Host_Script(sheet, name.c_str()));
}

}  // namespace
}  // namespace ingester

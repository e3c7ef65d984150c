// Columns of spreadsheet files: their fields, levels, labels and cells, and what a selection leaves of them.
#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tss/tss_fixture.h"
#include "support/text.h"

namespace ingester {

namespace {

using TSS_Columns = TSS_Test;

constexpr double M = Missing_Value;
constexpr std::uint32_t Always_Written = 1U << 4 | 1U << 14;
const Maker Make;

TEST_F(TSS_Columns, Have_Fields_That_Come_Back)
{
    const Items items =
        Of(54415441, 1, 2, 1, M, 1, 1, static_cast<std::int32_t>(Always_Written), 0, 0,
           Make.Numbers(4, "x", {1.0}, {"what it is", 5, 80, 3, 71, 259, "y + 1\2"}),
           Make.Texts(3, "t", {"a"}, 1, {.width = 2, .justify = 1, .flags = 512}), 1, 1, 0.0, 2, 0.0, 0.0);
    ASSERT_NE(Read(items), nullptr);
    const Column& x = Col(1);
    EXPECT_EQ(Text_Of(Current_Sheet->host_flag_a, Current_Sheet->read_only, x.extra.view(), x.format, x.width,
                      x.justify, x.date_form, x.date_format, x.protected_column, x.attached_text, x.decimals,
                      x.nlevels, Col(2).nlevels),
              "1 1 what it is 5 80 3 1 7 259 y + 1\2 2 0 1");
    EXPECT_EQ(Hex(Written(Current_Sheet)), Hex(Encode(items)));
    Column& text = *Column_At(Current_Sheet, 2);
    text.protected_column = 3, text.column_option = 3;
    text.extra_flag = text.date_form = 1;
    text.attached_text = "z", text.attached_mode = 2, text.width = 200, text.justify = -1;
    text.date_format = 9;
    ASSERT_NE(Read(Written(Current_Sheet)), nullptr);
    const Column& t = Col(2);
    EXPECT_EQ(Text_Of(t.protected_column, t.attached_text, t.width, t.justify, t.date_form, t.date_format),
              "773 z\2 80 0 1 9");
}

TEST_F(TSS_Columns, Are_Shown_As_Their_Fields_And_Cells_Ask)
{
    const struct {
        Shown shown;
        std::int32_t decimals;
        const char* settled;  ///< format, width, decimals, date code and form; empty: the columns end
    } cases[] = {
        {{.format = 0}, 2, "3 8 2 1 0"},
        {{.format = 1}, 9, "3 8 9 1 0"},
        {{.format = 1}, 10, "1 8 10 1 0"},
        {{.format = 4}, -9, "3 8 -1 1 0"},
        {{.format = 2}, 99, "2 8 20 1 0"},
        {{.format = -1}, 20, "1 8 20 1 0"},
        {{.format = 6}, 2, ""},
        {{.justify = 4}, 2, ""},
        {{.justify = -1}, 2, ""},
        {{.width = 1}, 2, "3 2 2 1 0"},
        {{.width = 91}, 2, "3 90 2 1 0"},
        {{.width = 0}, 2, "3 6 2 1 0"},
        {{.width = 0}, 0, "3 3 0 1 0"},
        {{.width = 0}, -1, "3 7 -1 1 0"},
        {{.date_word = 40}, 2, "3 8 2 40 0"},
        {{.date_word = 41}, 2, "3 8 2 1 0"},
        {{.date_word = 64 + 3}, 2, "3 8 2 3 1"},
        {{.format = 5, .date_word = 0}, 2, "5 8 2 1 1"},
        {{.date_word = -1}, 2, "3 8 2 1 0"},
    };
    for (const auto& [shown, decimals, settled] : cases) {
        const bool read =
            Read(Of(Make.Head(1, 1, 1), Make.Column(4, 1, "x", shown), decimals, 1.5)) != nullptr;
        EXPECT_EQ(!read ? ""
                        : Text_Of(Col(1).format, Col(1).width, Col(1).decimals, Col(1).date_format,
                                  Col(1).date_form),
                  settled);
    }
    const Maker old{0};
    const std::pair<Items, std::int32_t> widths[] = {
        {old.Numbers(4, "x", {1234.0}), 3 + 3 + 3},
        {old.Numbers(4, "x", {0.001}), 3 + 3 + 3},
        {old.Numbers(4, "x", {1e13}), 15 + 3},
        {old.Numbers(4, "x", {M}), 15 + 3},
        {old.Numbers(4, "long_name_here", {1.0}), 16},
        {old.Texts(3, "t", {"abcdef"}, 6), 6},
        {old.Factor("f", 1, {}, {"labels"}, 2, {1.0}), 6},
        {old.Factor("f", 1, {2.0}, {}, 1, {1.0}), 3 + 2},
        {old.Factor("f", 1, {}, {}, 0, {1.0}), 3},
    };
    for (const auto& [column, width] : widths) {
        ASSERT_NE(Read(Of(old.Head(1, 1, 1), column)), nullptr);
        EXPECT_EQ(Col(1).width, width);
    }
}

/// The labels of a Table's columns: their states, and the record of the factor across.
TEST_F(TSS_Columns, Label_Tables)
{
    const auto read = [](std::int32_t ways, std::int32_t state, const Items& column,
                         const Items& across = {}) {
        Items items = Of(Make.Head(5, ways, 1, across.empty() ? 0 : 1U << 19 | 1U << 14), ways, 0, 1, "T",
                         state, "vclass['classification'][1]");
        for (std::int32_t way = 1; way < ways; ++way)
            items.Add(Make.Factor("f" + std::to_string(way), 1, {}, {"a"}, 2, {1.0}));
        if (Read(Of(items, column, across)) == nullptr)
            return std::string();
        const Column& last = *Current_Sheet->last_column;
        return Text_Of(last.name.view(), last.table_label.view(), last.table_margin_value,
                       Current_Sheet->labelled_columns, Current_Sheet->has_second_margin,
                       Current_Sheet->row_label_name.view());
    };
    const Items plain = Make.Numbers(8, "2.5", {1.0});
    EXPECT_EQ(read(2, 0, plain), "2.5 2.5 1 0 1 C1");
    EXPECT_EQ(read(2, 1, plain), "2.5 2.5 2.5 0 1 C1");
    EXPECT_EQ(read(2, 2, plain), "2.5 2.5 1 1 1 C1");
    EXPECT_EQ(read(2, 3, Of(Make.Column(8, 1, "2.5"), 7.25, 0, 1.0)), "2.5 2.5 7.25 1 1 C1");
    EXPECT_EQ(read(2, 1, Make.Numbers(8, "abc", {1.0})), "abc abc -1e+307 0 1 C1");
    EXPECT_EQ(read(3, 0, plain), "2.5  0 0 1 C1");
    const std::tuple<std::int32_t, std::int32_t, std::int32_t, const char*> cases[] = {
        {1, 3, 2, "what runs across 1 3 2 36526"},
        {9, 64 + 1, 99, "what runs across 5 -1 18 02/03/1700"},
        {0, 0, -5, "what runs across 1 0 -1 36526"},
        {1, 41, 0, "what runs across 1 1 0 36526"},
    };
    for (const auto& [format, word, decimals, shown] : cases) {
        read(2, 1, Make.Numbers(8, "36526", {1.0}), Of(0.0, 0, "what runs across", format, word, decimals));
        const Sheet& s = *Current_Sheet;
        EXPECT_EQ(Text_Of(s.column_label_name.view(), s.column_factor_format, s.column_factor_date,
                          s.column_factor_decimals, s.last_column->name.view()),
                  shown);
        EXPECT_EQ(Messages(), word == 41 ? "Unknown Date format in table factor.\n:\n" : "");
    }
}

/// Which types and lengths may stand where. All but the last column of each are lawful.
TEST_F(TSS_Columns, End_With_The_First_That_Does_Not_Fit)
{
    const std::vector<double> two = {1.0, 2.0};
    const Items x = Make.Numbers(4, "x", two), f = Make.Factor("f", 2, {}, {}, 0, two);
    const auto vector = [&](const Items& last) { return Of(Make.Head(1, 2, 2), x, last); };
    const auto numbers = [&](std::int32_t type) { return vector(Make.Numbers(type, "s", two)); };
    const auto factor = [&](std::int32_t kind, const std::vector<double>& values,
                            const std::vector<double>& cells) {
        return vector(Make.Factor("s", 2, values, {}, kind, cells));
    };
    const auto matrix = [&](const Items& last) {
        return Of(Make.Head(2, 2, 2), "m", 0, Make.Numbers(5, "1", two), last);
    };
    const auto table = [&](std::int32_t ways, const Items& last) {
        return Of(Make.Head(5, 2, 2), ways, 0, 0, "t", 0, "g", f, last);
    };
    const Items body = Make.Numbers(8, "1", two);
    const auto text = [&](std::int32_t type, std::int32_t width) {
        return vector(Make.Texts(type, "s", {"a", ""}, width));
    };
    const auto check = [](std::int32_t columns, const std::vector<Items>& files) {
        for (const Items& items : files) {
            ASSERT_NE(Read(items), nullptr);
            EXPECT_EQ(Current_Sheet->column_count, columns) << &items - files.data();
            EXPECT_EQ(Current_Sheet->restriction_active, 0);
        }
    };
    check(2, {vector(x), numbers(22), vector(Make.Numbers(4, "s", {})), text(33, 1)});
    check(2, {matrix(Make.Numbers(5, "2", two)), table(2, body), table(3, f)});
    check(1, {numbers(1), numbers(5), numbers(9), text(3, -1), vector(Of(21, 2, 0, 0))});
    check(1, {vector(Make.Numbers(4, "s", {1.0, 2.0, 3.0})), vector(Make.Numbers(4, "", two))});
    check(1, {factor(1, {1.0}, two), factor(3, {}, two), factor(0, {}, {1.0, 2.5})});
    check(1, {factor(0, {}, {1.0, 3.0}), factor(0, {}, {M, 0.0})});
    check(1, {matrix(Make.Numbers(-4, "2", two)), matrix(Make.Numbers(5, "2", {1.0}))});
    check(1, {matrix(Of(21, 2, 1, 0)), table(2, Make.Numbers(22, "1", two))});
    check(1, {table(2, f), table(3, body), table(4, body)});
}

TEST_F(TSS_Columns, Have_Levels_And_Numbers_As_The_File_Tells)
{
    const struct {
        std::int32_t version;
        std::vector<double> values;
        Texts labels;
        std::int32_t wished, kind;
    } cases[] = {
        {3, {}, {}, 2, 0},       {3, {1.0}, {}, 2, 1}, {3, {}, {"a"}, 1, 0}, {3, {1.0}, {"a"}, 0, 0},
        {1, {1.0}, {"a"}, 0, 2}, {0, {1.0}, {}, 0, 1}, {1, {}, {}, 2, 0},
    };
    for (const auto& [version, values, labels, wished, kind] : cases) {
        const Maker make{version};
        ASSERT_NE(Read(Of(make.Head(1, 1, 1), make.Factor("f", 1, values, labels, wished, {1.0}))), nullptr);
        EXPECT_EQ(Text_Of(Col(1).factor_kind, Col(1).format == 4), Text_Of(kind, kind == 2));
    }
    // A label that is too long is cut; an empty one gets its number when it is written.
    ASSERT_NE(Read(Of(Make.Head(1, 1, 1), Make.Factor("f", 2, {}, {std::string(95, 'l'), ""}, 2, {2.0}))),
              nullptr);
    EXPECT_EQ(Col(1).label_width, 95);
    ASSERT_NE(Read(Written(Current_Sheet)), nullptr);
    EXPECT_EQ(Col(1).labels->Text(), std::string(90, 'l'));
    EXPECT_EQ(Col(1).labels->next->Text(), "<2>");
    // Numbers near the marker are missing.
    const double rounded = std::bit_cast<double>(std::bit_cast<std::uint64_t>(M) + 0xFF - 0x33);
    const std::vector<double> cells = {rounded, -1.7e308, M, -9.9e36, -9999.0, -1e36};
    const std::pair<double, std::vector<double>> markers[] = {{-9999.0, {M, M, M, M, M, M}},
                                                              {M, {M, M, M, -9.9e36, -9999.0, -1e36}}};
    for (const auto& [missing, kept] : markers) {
        ASSERT_NE(Read(Of(Make.Head(1, 1, 6, 0, missing), Make.Numbers(4, "x", cells))), nullptr);
        EXPECT_EQ(Current_Sheet->missing_value, M) << "whatever the file's marker is";
        EXPECT_EQ(Numbers_Of(Col(1)), kept);
    }
    ASSERT_NE(Read(Written(Current_Sheet)), nullptr);
    EXPECT_EQ(Numbers_Of(Col(1)), (std::vector{M, M, M, -9.9e36, -9999.0, -1e36}));
}

TEST_F(TSS_Columns, May_Mark_Rows)
{
    const Items x = Make.Numbers(4, "x", {1.0, 2.0, 3.0});
    for (const std::int32_t mark : {1, 2}) {
        ASSERT_NE(Read(Of(Make.Head(1, 2, 3), x, 21, 3, mark, 0, mark)), nullptr);
        EXPECT_EQ(Current_Sheet->restriction_active, mark % 2);
        EXPECT_EQ(Current_Sheet->restricted_rows, mark == 1 ? 2 : 0);
    }
    // Where the marks would make more columns than a file may have, they are left out.
    const Items labels = Make.Texts(-3, "labels", {"p", "q"}, 1);
    for (const Items& items : {Of(Make.Head(3, 3, 2), "S", 1, labels, Make.Numbers(7, "a", {1.0, 2.0}),
                                  Make.Numbers(7, "b", {3.0})),
                               Of(Make.Head(4, 2, 2), labels, Make.Numbers(6, "d", {1.0, 2.0}))}) {
        ASSERT_NE(Read(items), nullptr);
        const std::string cells = Render(Current_Sheet);
        Row_At(Current_Sheet, 0)->restricted = Current_Sheet->restricted_rows = 1;
        Current_Sheet->restriction_active = 1;
        const std::string written = Written(Current_Sheet);
        EXPECT_NE(Messages().find("The restriction of the rows is not saved"), std::string::npos);
        ASSERT_NE(Read(written), nullptr);
        EXPECT_EQ(Render(Current_Sheet), cells);
    }
}

TEST_F(TSS_Columns, And_Rows_Are_Left_Out)
{
    const Items vector = With_Records({{16, Of(1, "r", 3, Raw{"\6"})},
                                       {21, Of(2, 2, 2, 1, 5, 6, 3, 7, 8, 4, 3, 1, 5, 6, 2, 3, 4, 3, 3, 4)}});
    const Items x = Make.Numbers(4, "x", {1.0, 2.0, 3.0});
    const Items symmetric =
        Of(Make.Head(3, 3, 3, 1U << 16 | 1U << 14 | 1U << 21), "S", 1, Make.Numbers(7, "a", {1.0, 2.0, 3.0}),
           Make.Numbers(7, "b", {4.0, 5.0}), Make.Numbers(7, "c", {6.0}), 0.0, 0, 1, "r", 3, Raw{"\4"}, 1, 1,
           2, 1, 5, 6, 3, 7, 8);
    const struct {
        Items items;
        Texts names;  ///< or numbers of columns
        std::vector<std::int32_t> rows;
        std::string cells;      ///< empty: nothing was left
        const char* also = "";  ///< restricted rows, those of the saved restriction, and coloured cells
    } cases[] = {
        {vector, {"y", "t"}, {}, "t Tone||three; y V7|8|9"},
        {vector, {"2", "1"}, {}, "f F1|*|3; x V1.5|*|-2"},
        {vector, {"z"}, {}, ""},
        {vector, {}, {0, 1, 1}, "f F*|3; x V*|-2; t T|three; y V8|9", "0 03 2:7 | 0 3"},
        {vector, {}, {1}, "f F1; x V1.5; t Tone; y V7"},
        {vector, {}, {0, 0, 0, 1}, ""},
        {Of(Make.Head(1, 2, 3), x, 21, 3, 1, 0, 1), {}, {0, 1, 1}, "x V2|3", "1"},
        {Of(Make.Head(1, 1, 2), x), {}, {0, 1, 1}, "x V2"},  // a column may be longer than the Sheet then
        {symmetric, {}, {1, 0, 1}, "a S1|3; c S6", "0 02 1:5 2:7 | 0 0"},
    };
    for (const auto& [items, names, rows, cells, also] : cases) {
        const Sheet* const sheet = Read(items, [&names = names, &rows = rows] {
            request.Subset_Columns = !names.empty();
            request.Subset_By_Number = names == Texts{"2", "1"};
            request.Subset_Names = names;
            request.Subset_Rows = !rows.empty();
            request.Subset_Row_Flags = rows;
        });
        EXPECT_EQ(sheet == nullptr ? "" : Render(sheet), cells);
        if (*also == '\0')
            continue;
        std::string found = std::to_string(sheet->restricted_rows);
        for (const Saved_Restriction& saved : sheet->saved_restrictions) {
            found += " " + Hex(saved.bits);
            for (const Cell_Colour& colour : Col(sheet->type == vector_sheet ? 2 : 1).cell_colours)
                found += Format_Text(" %i:%i", colour.row, colour.text_colour);
            found +=
                " | " + Text_Of(sheet->last_column->cell_colours.size(), sheet->last_column->text_colour);
        }
        EXPECT_EQ(found, also);
    }
}

TEST_F(TSS_Columns, Named_As_Members_Get_Numbers)
{
    const struct {
        Texts names;
        const char* restored;
        const char* message = "";
    } cases[] = {
        {{"a['x']['p']", "a['X']['q']", "a['y'][1]", "a[1][5]"}, "a[2][1] a[2][2] a[3][1] a[1][5]"},
        {{"a[2]", "b['k']", "c"}, "a[2] b[1] c"},
        {{"a[7]", "b[3]"}, "a[7] b[3]"},
        {{"q['1'][1][1][1][1][1][1][1]"},
         "q[1][1][1][1][1][1][1]",
         "Too many nested pointers (must no more than than 6 deep).\n:\n"},
    };
    for (const auto& [names, restored, message] : cases) {
        Sheet* const sheet = New_Sheet_With_Rows(1);
        sheet->settings.bracket_names = 0;
        for (const std::string& name : names)
            New_Data_Column(sheet, variate_column, "x", 1)->name = name;
        Restore_Pointer_Names(sheet);
        std::string found;
        for (const std::string& name : Names_Of(sheet))
            found.append(found.empty() ? "" : " ").append(name);
        EXPECT_EQ(found.substr(found.find(' ') + 1), restored);
        EXPECT_EQ(Messages(), message);
    }
}

TEST_F(TSS_Columns, Of_Genotypes_Are_Recoded)
{
    const struct {
        Texts labels;
        std::vector<double> cells;
        const char* recoded;  ///< labels, and the cells' levels
    } cases[] = {
        {{"A", "b", "-"}, {1.0, 2.0, 3.0}, "a b - 1|2|6"},
        {{"-", "a"}, {1.0, 2.0, M}, "a h - 6|1|*"},
        {{"b", "h"}, {1.0, 2.0, 2.0}, "b h - 2|3|3"},
        {{"b", "u"}, {1.0, 2.0, 2.0}, "a h u 2|6|6"},
        {{"h", "b", "a"}, {1.0, 2.0, 3.0}, "a b h c d - 3|2|1"},
        {{"d", "a"}, {1.0, 2.0, 2.0}, "a b h c d - 5|1|1"},
        {{"a", "x"}, {1.0, 2.0, 2.0}, "a x 1|2|2"},
        {{"a", "b", "-", "u"}, {4.0, 2.0, 3.0}, "a b - 4|2|6"},
    };
    for (const auto& [labels, cells, recoded] : cases) {
        ASSERT_NE(
            Read(Of(Make.Head(1, 1, 3, 1U << 25), Make.Factor("f", Count(labels), {}, labels, 2, cells))),
            nullptr);
        const Column& f = Col(1);
        std::string found;
        for (const Level_Node* label = f.labels; label != nullptr; label = label->next)
            found.append(label->Text()).append(" ");
        EXPECT_EQ(found + Render(Current_Sheet, false).substr(1), recoded);
        EXPECT_EQ(f.factor_recoded != 0, f.colour_source == &f);
        EXPECT_TRUE(f.factor_recoded == 0
                    || (f.factor_colours.front() == 0xFF9595 && f.factor_colours.back() == 0xE7E7E7));
    }
}

}  // namespace

}  // namespace ingester

// What spreadsheet files keep beside the cells: heads, column fields and the records behind the columns.
#include "hostfiles/tss/tss_fixture.h"
#include "model/calendar.h"

#include <chrono>

namespace ingester {

namespace {

using TSS_Records = TSS_Test;

constexpr double M = Missing_Value;
using S = const Sheet&;

const Column& Col(S sheet, std::int32_t index)
{
    return *Column_At(const_cast<Sheet*>(&sheet), index);
}

std::string Hex(const std::string& bytes)
{
    std::string text;
    for (const char c : bytes)
        text += "0123456789ABCDEF"[(c >> 4) & 15], text += "0123456789ABCDEF"[c & 15];
    return text;
}

/// A record behind the columns f (Factor of 3), x, t (Text) and y of three rows.
struct Record_Case {
    const char* what;
    int bit;
    Items items;
    std::string (*show)(S sheet);
    const char* shown;
    bool comes_back = true;
};

const Record_Case Record_Cases[] = {
    {"print block", 0,
     Of(0, 1, 1, 0, 0, 0, 0, "title", std::string(90, 't'), "", "", "", "", Raw{std::string(24, '\1')}, 1, "treat", "d",
        "e", std::string(10, 'n'), "", std::string(200, 'e'), 0, 0, 1.0, "f", 0, 0, 1.0, "x", 0, 0, 1.0, "", 5, 6, 1.0,
        "y"),
     [](S s) { return Text_Of(Col(s, 1).date_form, Col(s, 4).date_form, s.current_column); }, "1 1 1", false},
    {"a print block with longer texts than fields", 0,
     Of(0, 1, 1, 0, 0, 0, 0, 95, Raw{std::string(90, 't')}, 0, 2000, Raw{std::string(1024, 't')}, 0, 0, 0,
        Raw{std::string(24, '\1')}, 1, "", 81, Raw{std::string(80, 'd')}, 201, Raw{std::string(200, 'd')}, "", "", "", 0, 0,
        1.0, "", 0, 0, 1.0, "", 0, 0, 1.0, "", 0, 0, 1.0, ""),
     [](S s) { return Text_Of(Col(s, 4).date_form); }, "1", false},
    {"bookmarks", 1, Of(2, Raw{std::string(16, 'b')}, 0, Raw{std::string(16, 'b')}, 7, "place"),
     [](S s) { return Text_Of(s.current_column); }, "1", false},
    {"analysis", 2, Of(8, 2, "one", "two", "-d", 3, 1, "go"),
     [](S s) { return Text_Of(Hex(s.analysis_setup), s.analysis_setup_count, s.analysis_dummy.view(), s.analysis_dummy_plain, Hex(s.analysis_commands), s.analysis_command_count); },
     "6F6E650074776F00 2 d 0 676F00 1"},
    {"a plain dummy alone", 2, Of(0, "plain", 2, 1, "x"),
     [](S s) { return Text_Of(s.analysis_dummy.view(), s.analysis_dummy_plain); }, "plain 1"},
    {"no dummy", 2, Of(2, 1, "x", "", 0), [](S s) { return Text_Of(s.analysis_dummy_plain); }, "0"},
    {"title", 3, Of(6, 2, "ab", "cd"),
     [](S s) { return Text_Of(Hex(s.title_lines), s.title_line_count, s.title_bytes); },
     "616200636400 2 6"},
    {"an empty title line takes no room", 3, Of(5, 3, "", "a", "bc"),
     [](S s) { return Text_Of(Hex(s.title_lines), s.title_line_count); }, "6100626300 3", false},
    {"an empty title line where there is room", 3, Of(5, 3, "a", "", "b"),
     [](S s) { return Text_Of(Hex(s.title_lines), s.title_line_count); }, "6100620000 3", false},
    {"a title of less than its size", 3, Of(10000000, 1, "a"),
     [](S s) { return Text_Of(s.title_lines.size(), s.title_line_count, s.title_bytes); }, "2 1 2", false},
    {"a cleared title", 3, Of(0), [](S s) { return Text_Of(s.title_cleared, s.title_bytes); }, "0 0", false},
    {"current cell", 4, Of(2, 3), [](S s) { return Text_Of(s.current_column, s.current_row); }, "2 2"},
    {"a current cell beyond", 4, Of(9, 9), [](S s) { return Text_Of(s.current_column, s.current_row); },
     "4 2", false},
    {"a current cell before", 4, Of(-1, 0), [](S s) { return Text_Of(s.current_column, s.current_row); },
     "1 0", false},
    {"pointers", 5, Of(2, 0, "p", 2, "x", "t", 4, "q"),
     [](S s) {
         const auto& p = s.pointers;
         return Text_Of(p.size(), p[0].name, p[0].kind, p[0].members[0], p[0].members[1], p[1].name, p[1].kind);
     },
     "2 p 0 x t q 4"},
    {"four integers", 6, Of(9, 9, 9, 9), [](S s) { return Text_Of(s.current_column); }, "1", false},
    {"flag b", 7, {}, [](S s) { return Text_Of(s.host_flag_b, s.host_flag_c); }, "1 0"},
    {"flag c", 13, {}, [](S s) { return Text_Of(s.host_flag_b, s.host_flag_c); }, "0 1"},
    {"conditions", 9, Of(5, 1, 2, 1, 1.5, 255, 6, M, 256, 8, -3.0, 257),
     [](S s) {
         const Column& x = Col(s, 2);
         return Text_Of(s.cond_mode, x.cond_active, x.cond_op[0], x.cond_value[0], x.cond_colour[0], x.cond_op[1],
                        x.cond_value[1] == M, x.cond_colour[1], x.cond_op[2], x.cond_value[2], x.cond_colour[2]);
     },
     "5 1 1 1.5 255 6 1 256 8 -3 257"},
    {"a mode without conditions", 9, Of(5, 0),
     [](S s) { return Text_Of(s.cond_mode, Col(s, 2).cond_active); }, "5 0", false},
    {"range limits", 10, Of(2, 2, -1.0, 1.0, 4, M, 5.0),
     [](S s) { return Text_Of(Col(s, 2).range_low, Col(s, 2).range_high, Col(s, 4).range_low == M, Col(s, 4).range_high); },
     "-1 1 1 5"},
    {"DDE link", 11, Of("Excel", "book", "ab12:c3", "more", 1, 2, 3, 4, 99),
     [](S s) { return Text_Of(s.dde_topic, s.dde_source, s.dde_item, s.dde_extra, s.dde_flags[0], s.dde_flags[3], s.current_column); },
     "Excel book R12C28:R3C3 more 1 4 1", false},
    {"another DDE link", 11, Of("Other", "", "ab12:c3", "", 0, 0, 0, 0, 0),
     [](S s) { return Text_Of(s.dde_item); }, "ab12:c3", false},
    {"gradients", 12, Of(1, 4, 2, 1, -1.5, 2.5, 0.25),
     [](S s) {
         const Column& y = Col(s, 4);
         return Text_Of(y.gradient_scale, y.gradient_reversed, y.gradient_low, y.gradient_high, y.gradient_strength);
     },
     "2 1 -1.5 2.5 0.25"},
    {"creation dates", 14, Of(10.5, 4, 1.0, 2.0, 0.0, 4.0),
     [](S s) { return Text_Of(s.creation_date, Col(s, 1).creation_date, Col(s, 2).creation_date, Col(s, 3).creation_date, Col(s, 4).creation_date); },
     "10.5 1 2 0 4"},
    {"creation dates of more columns, some before time", 14, Of(-1.0, 6, 1.0, M, -2.0, 4.0, 5.0, 6.0),
     [](S s) { return Text_Of(s.creation_date, Col(s, 2).creation_date, Col(s, 4).creation_date); },
     "0 0 4", false},
    {"split column", 15, Of(3), [](S s) { return Text_Of(s.split_set, s.split_column); }, "1 3"},
    {"a split at the leading columns", 15, Of(1),
     [](S s) { return Text_Of(s.split_set, s.split_column); }, "0 0", false},
    {"a split beyond", 15, Of(5), [](S s) { return Text_Of(s.split_set); }, "0", false},
    {"saved restrictions", 16, Of(2, "first", 3, Raw{"\5"}, "", 3, Raw{"\2"}),
     [](S s) {
         const auto& r = s.saved_restrictions;
         return Text_Of(r.size(), r[0].name, Hex(r[0].bits), Hex(r[1].bits));
     },
     "2 first 05 02"},
    {"page name", 18, Of("Page"), [](S s) { return Text_Of(s.sheet_name.view()); }, "Page"},
    {"a long page name", 18, Of(std::string(40, 'p')), [](S s) { return Text_Of(s.sheet_name.size()); },
     "32", false},
    {"the page name that all have", 18, Of("Sheet1"), [](S s) { return Text_Of(s.sheet_name.view()); },
     "Sheet1", false},
    {"reference levels", 20, Of(1, 1, 2), [](S s) { return Text_Of(Col(s, 1).reference_level); }, "2"},
    {"a reference level beyond", 20, Of(1, 1, 9), [](S s) { return Text_Of(Col(s, 1).reference_level); },
     "3", false},
    {"cell colours", 21, Of(2, 2, 2, 1, 255, 256, 3, 257, 258, 4, 1, 2, 3, 4),
     [](S s) {
         const auto& x = Col(s, 2).cell_colours;
         return Text_Of(x.size(), x[0].row, x[0].text_colour, x[0].back_colour, x[1].row,
                        Col(s, 4).cell_colours[0].back_colour);
     },
     "2 1 255 256 3 4"},
    {"black cells, and a column without any", 21, Of(2, 9, 0, 2, 1, 1, 7, 0),
     [](S s) { return Text_Of(Col(s, 2).cell_colours[0].back_colour); }, "65793", false},
    {"cells all alike", 21, Of(1, 2, 3, 1, 5, 6, 2, 5, 6, 3, 5, 6),
     [](S s) { return Text_Of(Col(s, 2).cell_colours.size(), Col(s, 2).text_colour, Col(s, 2).back_colour); },
     "0 5 6", false},
    {"IPRINT", 22, Of(1, 2, 2, 1, 4, 2),
     [](S s) { return Text_Of(s.iprint, Col(s, 2).iprint, Col(s, 4).iprint); }, "1 1 2"},
    {"IPRINT beyond", 22, Of(9, 2, 2, -5, 4, 7),
     [](S s) { return Text_Of(s.iprint, Col(s, 2).iprint, Col(s, 4).iprint); }, "2 0 2", false},
    {"hidden columns", 23, Of(2, 2, 3),
     [](S s) { return Text_Of(Col(s, 1).hidden, Col(s, 2).hidden, Col(s, 3).hidden); }, "0 1 1"},
    {"factor colours", 24, Of(3, 1, 0, 3, 10, 11, 12, 2, 1, 3, 0),
     [](S s) {
         const Column& f = Col(s, 1);
         return Text_Of(f.factor_colours.size(), f.factor_colours[2], Col(s, 2).colour_source == &f,
                        Col(s, 3).colour_source == nullptr);
     },
     "3 12 1 1", false},
    {"more colours than levels", 24, Of(1, 1, 0, 4, 1, 2, 3, 4),
     [](S s) { return Text_Of(Col(s, 1).factor_colours.size()); }, "0", false},
    {"colours of the last column by the strict test", 24, Of(1, 4, 1),
     [](S s) { return Text_Of(Col(s, 4).colour_source == nullptr); }, "1", false},
    {"cond_on_background", 26, {}, [](S s) { return Text_Of(s.cond_on_background); }, "1"},
    {"trial seasons", 27, Of(1, "spring", 1.0, 2, 7, 8, 1.0, 2.0),
     [](S s) { return Text_Of(s.current_column); }, "1", false},
    {"column colours", 28, Of(2, 2, 255, 0, 3, 0, 128),
     [](S s) { return Text_Of(Col(s, 2).text_colour, Col(s, 3).back_colour); }, "255 128"},
};

TEST_F(TSS_Records, Are_Read_And_Written)
{
    for (const Record_Case& c : Record_Cases) {
        SCOPED_TRACE(c.what);
        for (const std::endian order : {std::endian::big, std::endian::little}) {
            ASSERT_NE(Read(Encode(With_Records({{c.bit, c.items}}), order)), nullptr);
            EXPECT_EQ(c.show(*Current_Sheet), c.shown);
            EXPECT_EQ(Messages(), "");
        }
        EXPECT_EQ(Written(Current_Sheet) == Encode(With_Records({{c.bit, c.items}})), c.comes_back);
        ASSERT_NE(Read(Get("written.tss")), nullptr);
        EXPECT_TRUE(!c.comes_back || c.show(*Current_Sheet) == c.shown);
    }
}

/// Each record stands where it is looked for, whatever others there are.
TEST_F(TSS_Records, Stand_In_Their_Order)
{
    std::map<int, Items> all;
    for (const Record_Case& c : Record_Cases)
        if (c.comes_back)
            all.try_emplace(c.bit, c.items);
    all.insert_or_assign(24, Of(2, 1, 0, 3, 10, 11, 12, 2, 1));
    const std::string bytes = Encode(With_Records(all));
    ASSERT_NE(Read(bytes), nullptr);
    EXPECT_EQ(Messages(), "");
    EXPECT_EQ(Hex(Written(Current_Sheet)), Hex(bytes));
}

TEST_F(TSS_Records, Head_And_Column_Fields_Come_Back)
{
    Items items = Of(54415441, 1, 2, 1, M, 1, 1, static_cast<std::int32_t>(Always_Written), 0, 0);
    items << Maker().Numbers(4, "x", {1.0}, {"what it is", 5, 80, 3, 64 + 7, 1 + 2 + 256, "y + 1\2"})
          << Maker().Texts(3, "t", {"a"}, 1, {.width = 2, .justify = 1, .flags = 512}) << Always_Behind(2);
    ASSERT_NE(Read(items), nullptr);
    const Sheet& s = *Current_Sheet;
    const Column& x = Col(s, 1);
    EXPECT_EQ(Text_Of(s.host_flag_a, s.read_only), "1 1");
    EXPECT_EQ(Text_Of(x.extra.view(), x.format, x.width, x.justify, x.date_form, x.date_format,
                      x.protected_column, x.attached_text, x.attached_mode, x.decimals),
              "what it is 5 80 3 1 7 259 y + 1\2 0 2");
    EXPECT_EQ(Text_Of(x.nlevels, Col(s, 2).nlevels), "0 1");
    EXPECT_EQ(Hex(Written(Current_Sheet)), Hex(Encode(items)));
    Column& text = *Column_At(Current_Sheet, 2);
    Current_Sheet->read_only = Current_Sheet->host_flag_a = 0;
    text.protected_column = 3, text.column_option = 3, text.extra_flag = 1;
    text.attached_text = "z", text.attached_mode = 2, text.width = 200, text.justify = -1,
    text.date_format = 9;
    text.date_form = 1;
    ASSERT_NE(Read(Written(Current_Sheet)), nullptr);
    const Column& t = Col(*Current_Sheet, 2);
    EXPECT_EQ(Text_Of(t.protected_column, t.attached_text, t.width, t.justify, t.date_form, t.date_format),
              "773 z\2 80 0 1 9");
}

/// The display fields of a column as they are read.
TEST_F(TSS_Records, Display_Fields_Are_Settled)
{
    const struct {
        std::int32_t type;
        Shown shown;
        std::int32_t decimals;
        const char* settled;  ///< format, width, decimals, date code and form; empty: the columns end
    } cases[] = {
        {4, {.format = 0}, 2, "3 8 2 1 0"},
        {4, {.format = 1}, 9, "3 8 9 1 0"},
        {4, {.format = 1}, 10, "1 8 10 1 0"},
        {4, {.format = 4}, -9, "3 8 -1 1 0"},
        {4, {.format = 2}, 99, "2 8 20 1 0"},
        {4, {.format = -1}, 20, "1 8 20 1 0"},
        {4, {.format = 6}, 2, ""},
        {4, {.justify = 4}, 2, ""},
        {4, {.justify = -1}, 2, ""},
        {4, {.width = 1}, 2, "3 2 2 1 0"},
        {4, {.width = 91}, 2, "3 90 2 1 0"},
        {4, {.width = 0}, 2, "3 6 2 1 0"},
        {4, {.width = 0}, 0, "3 3 0 1 0"},
        {4, {.width = 0}, -1, "3 7 -1 1 0"},
        {4, {.date_word = 40}, 2, "3 8 2 40 0"},
        {4, {.date_word = 41}, 2, "3 8 2 1 0"},
        {4, {.date_word = 64 + 3}, 2, "3 8 2 3 1"},
        {4, {.format = 5, .date_word = 0}, 2, "5 8 2 1 1"},
        {4, {.date_word = -1}, 2, "3 8 2 1 0"},
    };
    for (const auto& c : cases) {
        Items items = Maker().Head(1, 1, 1);
        items << Maker().Column(c.type, 1, "x", c.shown) << c.decimals << 1.5;
        const Sheet* const sheet = Read(items);
        ASSERT_EQ(sheet != nullptr, *c.settled != '\0');
        if (sheet != nullptr) {
            const Column& x = Col(*sheet, 1);
            EXPECT_EQ(Text_Of(x.format, x.width, x.decimals, x.date_format, x.date_form), c.settled);
        }
    }
}

TEST_F(TSS_Records, Widths_Come_From_The_Cells)
{
    const Maker old{0};
    const struct {
        Items column;
        std::int32_t width;
    } cases[] = {
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
    for (const auto& c : cases) {
        ASSERT_NE(Read(Of(old.Head(1, 1, 1), c.column)), nullptr);
        EXPECT_EQ(Col(*Current_Sheet, 1).width, c.width);
    }
}

/// The labels of a Table's columns: their states, and the record of the factor across.
TEST_F(TSS_Records, Tables_Are_Labelled)
{
    const auto table = [](std::int32_t ways, std::int32_t state, const Items& column, std::uint32_t flags,
                          const Items& record) {
        Items items = Maker().Head(5, ways, 1, flags);
        items << ways << 0 << 1 << "T" << state << "vclass['classification'][1]";
        for (std::int32_t way = 1; way < ways; ++way)
            items << Maker().Factor("f" + std::to_string(way), 1, {}, {"a"}, 2, {1.0});
        return items << column << record;
    };
    const auto read = [&](const Items& items) {
        if (Read(items) == nullptr)
            return std::string();
        const Sheet& s = *Current_Sheet;
        const Column& last = *s.last_column;
        return Text_Of(last.name.view(), last.table_label.view(), last.table_margin_value, s.labelled_columns,
                       s.has_second_margin, s.row_label_name.view());
    };
    Items levelled = Maker().Column(8, 1, "2.5");
    levelled << 7.25 << 0 << 1.0;
    const Items plain = Maker().Numbers(8, "2.5", {1.0});
    EXPECT_EQ(read(table(2, 0, plain, 0, {})), "2.5 2.5 1 0 1 C1");
    EXPECT_EQ(read(table(2, 1, plain, 0, {})), "2.5 2.5 2.5 0 1 C1");
    EXPECT_EQ(read(table(2, 2, plain, 0, {})), "2.5 2.5 1 1 1 C1");
    EXPECT_EQ(read(table(2, 3, levelled, 0, {})), "2.5 2.5 7.25 1 1 C1");
    EXPECT_EQ(read(table(2, 1, Maker().Numbers(8, "abc", {1.0}), 0, {})), "abc abc -1e+307 0 1 C1");
    EXPECT_EQ(read(table(3, 0, plain, 0, {})), "2.5  0 0 1 C1");

    const auto across = [&](std::int32_t format, std::int32_t word, std::int32_t decimals) {
        read(table(2, 1, Maker().Numbers(8, "36526", {1.0}), 1U << 19 | 1U << 14,
                   Of(0.0, 0, "what runs across", format, word, decimals)));
        const Sheet& s = *Current_Sheet;
        return Text_Of(s.column_label_name.view(), s.column_factor_format, s.column_factor_date,
                       s.column_factor_decimals, s.last_column->name.view());
    };
    EXPECT_EQ(across(1, 3, 2), "what runs across 1 3 2 36526");
    EXPECT_EQ(across(9, 64 + 1, 99), "what runs across 5 -1 18 02/03/1700");
    EXPECT_EQ(across(0, 0, -5), "what runs across 1 0 -1 36526");
    EXPECT_EQ(Messages(), "");
    across(1, 41, 0);
    EXPECT_EQ(Current_Sheet->column_factor_date, 1);
    EXPECT_NE(Messages().find("Unknown Date format in table factor.\n"), std::string::npos);
}

/// Which types and lengths may stand where. All but the last column of each are lawful.
TEST_F(TSS_Records, Columns_That_Do_Not_Fit_End_The_Columns)
{
    const Maker make;
    const Items x = make.Numbers(4, "x", {1.0, 2.0});
    const Items f = make.Factor("f", 2, {}, {}, 0, {1.0, 2.0});
    const auto vector = [&](const Items& last) { return Of(make.Head(1, 2, 2), x, last); };
    const auto matrix = [&](const Items& last) {
        return Of(make.Head(2, 2, 2), "m", 0, make.Numbers(5, "1", {1.0, 2.0}), last);
    };
    const auto table = [&](std::int32_t ways, const Items& last) {
        return Of(make.Head(5, 2, 2), ways, 0, 0, "t", 0, "g", f, last);
    };
    const struct {
        Items items;
        std::int32_t columns;
    } cases[] = {
        {vector(x), 2},
        {vector(make.Numbers(1, "s", {1.0, 2.0})), 1},
        {vector(make.Numbers(5, "s", {1.0, 2.0})), 1},
        {vector(make.Numbers(22, "s", {1.0, 2.0})), 2},
        {vector(make.Numbers(9, "s", {1.0, 2.0})), 1},
        {vector(make.Numbers(4, "s", {1.0, 2.0, 3.0})), 1},
        {vector(make.Numbers(4, "s", {})), 2},
        {vector(make.Numbers(4, "", {1.0, 2.0})), 1},
        {vector(make.Texts(33, "s", {"a", ""}, 1)), 2},
        {vector(make.Texts(3, "s", {"a", ""}, -1)), 1},
        {vector(make.Factor("s", 2, {1.0}, {}, 1, {1.0, 2.0})), 1},
        {vector(make.Factor("s", 2, {}, {}, 3, {1.0, 2.0})), 1},
        {vector(make.Factor("s", 2, {}, {}, 0, {1.0, 2.5})), 1},
        {vector(make.Factor("s", 2, {}, {}, 0, {1.0, 3.0})), 1},
        {vector(make.Factor("s", 2, {}, {}, 0, {M, 0.0})), 1},
        {vector(Of(21, 2, 0, 0)), 1},
        {matrix(make.Numbers(5, "2", {1.0, 2.0})), 2},
        {matrix(make.Numbers(-4, "2", {1.0, 2.0})), 1},
        {matrix(make.Numbers(5, "2", {1.0})), 1},
        {matrix(Of(21, 2, 1, 0)), 1},
        {table(2, make.Numbers(8, "1", {1.0, 2.0})), 2},
        {table(2, f), 1},
        {table(3, f), 2},
        {table(3, make.Numbers(8, "1", {1.0, 2.0})), 1},
        {table(4, make.Numbers(8, "1", {1.0, 2.0})), 1},
        {table(2, make.Numbers(22, "1", {1.0, 2.0})), 1},
    };
    for (const auto& c : cases) {
        ASSERT_NE(Read(c.items), nullptr);
        EXPECT_EQ(Current_Sheet->column_count, c.columns) << &c - cases;
        EXPECT_EQ(Current_Sheet->restriction_active, 0);
    }
}

TEST_F(TSS_Records, Levels_Follow_The_Lists)
{
    const struct {
        std::int32_t version;
        std::vector<double> values;
        Texts labels;
        std::int32_t wished;
        std::int32_t kind;
    } cases[] = {
        {3, {}, {}, 2, 0},       {3, {1.0}, {}, 2, 1}, {3, {}, {"a"}, 1, 0}, {3, {1.0}, {"a"}, 0, 0},
        {1, {1.0}, {"a"}, 0, 2}, {0, {1.0}, {}, 0, 1}, {1, {}, {}, 2, 0},
    };
    for (const auto& c : cases) {
        const Maker make{c.version};
        ASSERT_NE(Read(Of(make.Head(1, 1, 1), make.Factor("f", 1, c.values, c.labels, c.wished, {1.0}))),
                  nullptr);
        const Column& f = Col(*Current_Sheet, 1);
        EXPECT_EQ(Text_Of(f.factor_kind, f.format == 4), Text_Of(c.kind, c.kind == 2)) << &c - cases;
    }
    // A label that is too long is cut; an empty one gets its number when it is written.
    const Maker make;
    ASSERT_NE(Read(Of(make.Head(1, 1, 1), make.Factor("f", 2, {}, {std::string(95, 'l'), ""}, 2, {2.0}))),
              nullptr);
    EXPECT_EQ(Col(*Current_Sheet, 1).label_width, 95);
    ASSERT_NE(Read(Written(Current_Sheet)), nullptr);
    EXPECT_EQ(Col(*Current_Sheet, 1).labels->Text(), std::string(90, 'l'));
    EXPECT_EQ(Col(*Current_Sheet, 1).labels->next->Text(), "<2>");
}

TEST_F(TSS_Records, Numbers_Near_The_Marker_Are_Missing)
{
    const double rounded = std::bit_cast<double>(std::bit_cast<std::uint64_t>(M) + 0xFF - 0x33);
    const double cells[] = {rounded, -1.7e308, M, -9.9e36, -9999.0, -1e36};
    Items items = Maker().Head(1, 1, 6, 0, -9999.0);
    items << Maker().Numbers(4, "x", {cells, cells + 6});
    ASSERT_NE(Read(items), nullptr);
    EXPECT_EQ(Current_Sheet->missing_value, -9999.0);
    EXPECT_EQ(Numbers_Of(Col(*Current_Sheet, 1)),
              (std::vector{-9999.0, -9999.0, -9999.0, -9999.0, -9999.0, -1e36}));
    items = Maker().Head(1, 1, 6);
    ASSERT_NE(Read(items << Maker().Numbers(4, "x", {cells, cells + 6})), nullptr);
    EXPECT_EQ(Numbers_Of(Col(*Current_Sheet, 1)), (std::vector{M, M, M, -9.9e36, -9999.0, -1e36}));
    ASSERT_NE(Read(Written(Current_Sheet)), nullptr);
    EXPECT_EQ(Numbers_Of(Col(*Current_Sheet, 1)), (std::vector{M, M, M, -9.9e36, -9999.0, -1e36}));
}

TEST_F(TSS_Records, Row_Marks_Restrict)
{
    const Maker make;
    ASSERT_NE(Read(Of(make.Head(1, 2, 3), make.Numbers(4, "x", {1.0, 2.0, 3.0}), 21, 3, 1, 0, 1)), nullptr);
    EXPECT_EQ(Text_Of(Current_Sheet->restriction_active, Current_Sheet->restricted_rows,
                      Row_At(Current_Sheet, 0)->restricted, Row_At(Current_Sheet, 1)->restricted),
              "1 2 1 0");
    ASSERT_NE(Read(Of(make.Head(1, 2, 1), make.Numbers(4, "x", {1.0}), 21, 1, 2)), nullptr);
    EXPECT_EQ(Text_Of(Current_Sheet->restriction_active, Current_Sheet->restricted_rows), "0 0");
}

/// Where the marks would make more columns than a file may have, they are left out.
TEST_F(TSS_Records, Row_Marks_Do_Not_Spoil_A_Matrix)
{
    const Items labels = Maker().Texts(-3, "labels", {"p", "q"}, 1);
    Items square = Of(Maker().Head(3, 3, 2), "S", 1, labels, Maker().Numbers(7, "a", {1.0, 2.0}));
    square << Maker().Numbers(7, "b", {3.0});
    const Items diagonal = Of(Maker().Head(4, 2, 2), labels, Maker().Numbers(6, "d", {1.0, 2.0}));
    for (const Items& items : {square, diagonal}) {
        ASSERT_NE(Read(items), nullptr);
        const std::string cells = Render(Current_Sheet);
        Row_At(Current_Sheet, 0)->restricted = Current_Sheet->restricted_rows = 1;
        Current_Sheet->restriction_active = 1;
        const std::string written = Written(Current_Sheet);
        EXPECT_NE(Messages().find("The restriction of the rows is not saved"), std::string::npos);
        ASSERT_NE(Read(written), nullptr);
        EXPECT_EQ(Render(Current_Sheet), cells);
        EXPECT_EQ(Messages(), "");
    }
}

/// Without the record of dates, everything is as old as the file.
TEST_F(TSS_Records, Files_Without_Dates_Have_Their_Own)
{
    ASSERT_EQ(::setenv("TZ", "UTC", 1), 0);
    Put("old.tss", Encode(Of(Maker().Head(1, 1, 1), Maker().Numbers(4, "x", {1.0}))));
    using namespace std::chrono;
    std::filesystem::last_write_time(Path("old.tss"),
                                     file_clock::from_sys(sys_days{2000y / 1 / 1} + 18h + milliseconds(0)));
    ASSERT_TRUE(Read_TSS_File(Path("old.tss").c_str()));
    EXPECT_EQ(Current_Sheet->creation_date, Col(*Current_Sheet, 1).creation_date);
    EXPECT_DOUBLE_EQ(Current_Sheet->creation_date, Date_To_Number(1, 1, 2000, 1) + 0.75);
}

TEST_F(TSS_Records, Selections_Leave_Out_Columns_And_Rows)
{
    const Items items = With_Records({{16, Of(1, "r", 3, Raw{"\6"})},
                                      {21, Of(2, 2, 2, 1, 5, 6, 3, 7, 8, 4, 3, 1, 5, 6, 2, 3, 4, 3, 3, 4)}});
    const struct {
        void (*prepare)();
        const char* cells;  ///< null: nothing was left
    } cases[] = {
        {[] {
             request.Subset_Columns = true, request.Subset_Names = {"y", "t"};
         },
         "t Tone||three; y V7|8|9"},
        {[] {
             request.Subset_Columns = request.Subset_By_Number = true, request.Subset_Names = {"2", "1"};
         },
         "f F1|*|3; x V1.5|*|-2"},
        {[] { request.Subset_Columns = true, request.Subset_Names = {"z"}; }, nullptr},
        {[] {
             request.Subset_Rows = true, request.Subset_Row_Flags = {0, 1, 1};
         },
         "f F*|3; x V*|-2; t T|three; y V8|9"},
        {[] { request.Subset_Rows = true, request.Subset_Row_Flags = {1}; }, "f F1; x V1.5; t Tone; y V7"},
        {[] {
             request.Subset_Rows = true, request.Subset_Row_Flags = {0, 0, 0, 1};
         },
         nullptr},
    };
    for (const auto& c : cases) {
        const Sheet* const sheet = Read(items, c.prepare);
        ASSERT_EQ(sheet != nullptr, c.cells != nullptr);
        EXPECT_TRUE(sheet == nullptr || Render(sheet) == c.cells) << Render(sheet);
    }
    const auto rows = [] { request.Subset_Rows = true, request.Subset_Row_Flags = {0, 1, 1}; };
    ASSERT_NE(Read(items, rows), nullptr);
    EXPECT_EQ(Hex(Current_Sheet->saved_restrictions[0].bits), "03");
    const Column& x = Col(*Current_Sheet, 2);
    EXPECT_EQ(Text_Of(x.cell_colours.size(), x.cell_colours[0].row, x.cell_colours[0].text_colour), "1 2 7");
    EXPECT_EQ(Text_Of(Col(*Current_Sheet, 4).cell_colours.size(), Col(*Current_Sheet, 4).text_colour), "0 3")
        << "what is left is all alike";
    ASSERT_NE(Read(Of(Maker().Head(1, 2, 3), Maker().Numbers(4, "x", {1.0, 2.0, 3.0}), 21, 3, 1, 0, 1), rows),
              nullptr);
    EXPECT_EQ(Current_Sheet->restricted_rows, 1);
    // A column may be longer than the Sheet then.
    ASSERT_NE(Read(Of(Maker().Head(1, 1, 2), Maker().Numbers(4, "x", {1.0, 2.0, 3.0})), rows), nullptr);
    EXPECT_EQ(Render(Current_Sheet), "x V2");
    Items symmetric = Of(Maker().Head(3, 3, 3, 1U << 16 | 1U << 14 | 1U << 21), "S", 1);
    symmetric << Maker().Numbers(7, "a", {1.0, 2.0, 3.0}) << Maker().Numbers(7, "b", {4.0, 5.0})
              << Maker().Numbers(7, "c", {6.0})
              << Of(0.0, 0, 1, "r", 3, Raw{"\4"}, 1, 1, 2, 1, 5, 6, 3, 7, 8);
    ASSERT_NE(Read(symmetric,
                   [] {
                       request.Subset_Rows = true, request.Subset_Row_Flags = {1, 0, 1};
                   }),
              nullptr);
    EXPECT_EQ(Render(Current_Sheet), "a S1|3; c S6");
    EXPECT_EQ(Text_Of(Hex(Current_Sheet->saved_restrictions[0].bits),
                      Col(*Current_Sheet, 1).cell_colours.size(), Col(*Current_Sheet, 1).cell_colours[1].row),
              "02 2 2");
}

}  // namespace

}  // namespace ingester

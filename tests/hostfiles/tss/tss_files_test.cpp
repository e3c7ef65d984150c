// Whole spreadsheet files: every version and order, every record behind the columns, what the writer makes of
// them, and broken ones.
#include "hostfiles/tss/tss_fixture.h"
#include "model/calendar.h"

#include <chrono>
#include <limits>

namespace ingester {

namespace {

using TSS_Files = TSS_Test;

constexpr double M = Missing_Value;

/// The bytes were put together by hand, so this holds the writer against the layout as well.
TEST_F(TSS_Files, Every_Version_And_Order_Reads_The_Same_And_Is_Written_In_The_Newest)
{
    for (const std::int32_t version : {3, 2, 1, 0})
        for (const std::endian order : {std::endian::big, std::endian::little})
            for (const Small_File& small : Small_Files(version)) {
                SCOPED_TRACE(small.what + ", version " + std::to_string(version));
                if (version == 0)  // has the order of the file in front of it
                    Read(Encode(Maker{1}.Head(1, 1, 1), order));
                ASSERT_NE(Read(Encode(small.items, order)), nullptr);
                EXPECT_EQ(Render(Current_Sheet), small.cells);
                EXPECT_EQ(Current_Sheet->format_version, version);
                const std::string written = Written(Current_Sheet);
                EXPECT_EQ(written == Encode(small.items), small.comes_back);
                EXPECT_EQ(Messages(), "");
                ASSERT_NE(Read(written), nullptr);
                EXPECT_EQ(Render(Current_Sheet), small.cells);
                EXPECT_EQ(Current_Sheet->format_version, 3);
            }
}

const Items Print_Block = Of(
    0, 1, 1, 0, 0, 0, 0, 95, Raw{std::string(90, 't')}, "title", 2000, Raw{std::string(1024, 't')}, 0, 0, "",
    Raw{std::string(24, '\1')}, 1, "treat", 81, Raw{std::string(80, 'd')}, 201, Raw{std::string(200, 'd')},
    std::string(10, 'n'), "", "", 0, 0, 1.0, "f", 0, 0, 1.0, "x", 0, 0, 1.0, "", 5, 6, 1.0, "y");

/// Records behind the columns f (Factor of 3), x, t (Text) and y of three rows that are written as they were.
const Records Kept_Records = {
    {2, Of(8, 2, "one", "two", "-d", 3, 1, "go")},
    {3, Of(6, 2, "ab", "cd")},
    {4, Of(2, 3)},
    {5, Of(2, 0, "p", 2, "x", "t", 4, "q")},
    {7, {}},
    {9, Of(5, 1, 2, 1, 1.5, 255, 6, M, 256, 8, -3.0, 257)},
    {10, Of(2, 2, -1.0, 1.0, 4, M, 5.0)},
    {12, Of(1, 4, 2, 1, -1.5, 2.5, 0.25)},
    {13, {}},
    {14, Of(10.5, 4, 1.0, 2.0, 0.0, 4.0)},
    {15, Of(3)},
    {16, Of(2, "first", 3, Raw{"\5"}, "", 3, Raw{"\2"})},
    {18, Of("Page")},
    {20, Of(1, 1, 2)},
    {21, Of(2, 2, 2, 1, 255, 256, 3, 257, 258, 4, 1, 2, 3, 4)},
    {22, Of(1, 2, 2, 1, 4, 2)},
    {23, Of(2, 2, 3)},
    {24, Of(2, 1, 0, 3, 10, 11, 12, 2, 1)},
    {26, {}},
    {28, Of(2, 2, 255, 0, 3, 0, 128)},
};

/// Others, and what they are written as.
const std::pair<Records, Records> Changed_Records[] = {
    {{{1, Of(2, Raw{std::string(16, 'b')}, 0, Raw{std::string(16, 'b')}, 7, "place")}}, {}},
    {{{2, Of(0, "plain", 2, 1, "x")}}, {{2, Of(0, "plain", 2, 1, "x")}}},
    {{{2, Of(2, 1, "x", "", 0)}}, {{2, Of(2, 1, "x", "", 0)}}},
    // An empty title line takes no room where it stands, and comes to the end where there is some.
    {{{3, Of(5, 3, "", "a", "bc")}}, {{3, Of(5, 3, "a", "bc", "")}}},
    {{{3, Of(5, 3, "a", "", "b")}}, {{3, Of(5, 3, "a", "b", "")}}},
    {{{3, Of(10000000, 1, "a")}}, {{3, Of(2, 1, "a")}}},
    {{{3, Of(0)}}, {}},
    {{{4, Of(9, 9)}}, {{4, Of(4, 3)}}},
    {{{4, Of(-1, 0)}}, {}},
    {{{6, Of(9, 9, 9, 9)}}, {}},
    {{{9, Of(5, 0)}}, {}},
    {{{14, Of(-1.0, 6, 1.0, M, -2.0, 4.0, 5.0, 6.0)}}, {{14, Of(0.0, 4, 1.0, 0.0, 0.0, 4.0)}}},
    {{{15, Of(1)}}, {}},
    {{{15, Of(5)}}, {}},
    {{{18, Of(std::string(40, 'p'))}}, {{18, Of(std::string(32, 'p'))}}},
    {{{18, Of("Sheet1")}}, {}},
    {{{20, Of(1, 1, 9)}}, {{20, Of(1, 1, 3)}}},
    // Black cells, and a column without any; cells all alike.
    {{{21, Of(2, 9, 0, 2, 1, 1, 7, 0)}}, {{21, Of(1, 2, 1, 1, 7, 65793)}}},
    {{{21, Of(1, 2, 3, 1, 5, 6, 2, 5, 6, 3, 5, 6)}}, {{28, Of(1, 2, 5, 6)}}},
    {{{22, Of(9, 2, 2, -5, 4, 7)}}, {{22, Of(2, 1, 4, 2)}}},
    {{{24, Of(2, 1, 0, 3, 10, 11, 12, 3, 0)}}, {{24, Of(1, 1, 0, 3, 10, 11, 12)}}},
    // More colours than levels; the last column is none by the strict test.
    {{{24, Of(1, 1, 0, 4, 1, 2, 3, 4)}}, {}},
    {{{24, Of(1, 4, 1)}}, {}},
    {{{27, Of(1, "spring", 1.0, 2, 7, 8, 1.0, 2.0)}}, {}},
};

TEST_F(TSS_Files, Records_Are_Read_And_Written)
{
    for (const auto& [in, out] : Changed_Records)
        for (const std::endian order : {std::endian::big, std::endian::little}) {
            ASSERT_NE(Read(Encode(With_Records(in), order)), nullptr);
            EXPECT_EQ(Hex(Written(Current_Sheet)), Hex(Encode(With_Records(out))));
            EXPECT_EQ(Messages(), "");
        }
    ASSERT_NE(Read(With_Records({{0, Print_Block}})), nullptr);
    EXPECT_EQ(Hex(Written(Current_Sheet)), Hex(Encode(With_Records({}, 65)))) << "dates have the other form";
    for (const auto& [item, kept] : {std::pair("EXCEL", "R12C28:R3C3"), std::pair("Other", "ab12:c3")}) {
        ASSERT_NE(Read(With_Records({{11, Of(item, "book", "ab12:c3", "more", 1, 2, 3, 4, 99)}})), nullptr);
        const Sheet& s = *Current_Sheet;
        EXPECT_EQ(Text_Of(s.dde_topic, s.dde_source, s.dde_item, s.dde_extra, s.dde_flags[0], s.dde_flags[3]),
                  Text_Of(item, "book", kept, "more", 1, 4));
    }
    const std::string all = Encode(With_Records(Kept_Records));
    ASSERT_NE(Read(Encode(With_Records(Kept_Records), std::endian::big)), nullptr);
    EXPECT_EQ(Hex(Written(Current_Sheet)), Hex(all)) << "each stands where it is looked for";
    ASSERT_NE(Read(all), nullptr);
    EXPECT_EQ(Messages(), "");
    const Sheet& s = *Current_Sheet;
    const Column &f = Col(1), &x = Col(2), &t = Col(3), &y = Col(4);
    EXPECT_EQ(Text_Of(Hex(s.analysis_setup), s.analysis_setup_count, s.analysis_dummy.view(),
                      s.analysis_dummy_plain, Hex(s.title_lines), s.title_bytes, s.current_column,
                      s.current_row),
              "6F6E650074776F00 2 d 0 616200636400 6 2 2");
    EXPECT_EQ(Text_Of(s.pointers[0].name, s.pointers[0].members[1], s.pointers[1].kind, s.host_flag_b,
                      s.host_flag_c, s.creation_date, x.creation_date, s.split_column, s.cond_on_background),
              "p t 4 1 1 10.5 2 3 1");
    EXPECT_EQ(Text_Of(s.cond_mode, x.cond_op[0], x.cond_value[0], x.cond_colour[0], x.cond_value[1] == M,
                      x.cond_colour[2], x.range_low, y.range_high, y.gradient_scale, y.gradient_reversed,
                      y.gradient_low, y.gradient_high, y.gradient_strength),
              "5 1 1.5 255 1 257 -1 5 2 1 -1.5 2.5 0.25");
    EXPECT_EQ(Text_Of(s.saved_restrictions[0].name, Hex(s.saved_restrictions[1].bits), s.sheet_name.view(),
                      f.reference_level, x.cell_colours[1].row, x.cell_colours[1].text_colour,
                      y.cell_colours[0].back_colour, s.iprint, y.iprint, f.hidden, t.hidden,
                      f.factor_colours[2], x.colour_source == &f, x.text_colour, t.back_colour),
              "first 02 Page 2 3 257 4 1 2 0 1 12 1 255 128");
}

/// All kinds of files that there are, and those with all records.
std::vector<Items> All_Kinds()
{
    std::vector<Items> kinds;
    for (const std::int32_t version : {0, 1, 2, 3})
        for (const Small_File& small : Small_Files(version))
            kinds.push_back(small.items);
    Records all = Kept_Records;
    all[6] = Of(0, 0, 0, 0);
    all[11] = Of("EXCEL", "s", "a1:b2", "", 1, 0, 0, 0, 0);
    all[25] = Items();
    all[27] = Of(1, "s", 0.0, 1, 7, 0.0, 0.0);
    kinds.push_back(With_Records(all));
    kinds.push_back(With_Records({{0, Print_Block}, {1, Of(1, Raw{std::string(16, 'x')}, 1, "mark")}}));
    return kinds;
}

TEST_F(TSS_Files, Cut_Anywhere_They_Give_What_Stood_In_Front)
{
    for (const Items& items : All_Kinds()) {
        const std::string bytes = Encode(items);
        for (std::size_t length = 0; length < bytes.size(); ++length)
            EXPECT_TRUE(Read(bytes.substr(0, length)) == nullptr || Current_Sheet->column_count > 0);
    }
}

/// Any number of a file may be a lie: what is read has to be sound, and to be written again.
TEST_F(TSS_Files, Every_Number_May_Lie)
{
    using Integers = std::numeric_limits<std::int32_t>;
    using Doubles = std::numeric_limits<double>;
    for (Items items : All_Kinds()) {
        const auto tell = [&]<class Number>(Number& number, std::initializer_list<Number> lies) {
            const Number right = number;
            for (const Number lie : lies) {
                number = lie;
                if (Read(items) != nullptr && Current_Sheet->table_in_columns == 0)
                    Read(Written(Current_Sheet));
            }
            number = right;
        };
        for (auto& item : items)
            if (auto* const integer = std::get_if<std::int32_t>(&item); integer != nullptr)
                tell(*integer,
                     {-1, 0, 1, 5, 33, *integer + 1, *integer - 1, 65536, Integers::max(), Integers::min()});
            else if (auto* const real = std::get_if<double>(&item); real != nullptr)
                tell(*real, {-1e308, -1e37, 0.5, 1e308, Doubles::infinity(), Doubles::quiet_NaN()});
    }
}

/// Without the record of dates, everything is as old as the file.
TEST_F(TSS_Files, Without_Dates_Have_Their_Own)
{
    ASSERT_EQ(::setenv("TZ", "UTC", 1), 0);
    Put("old.tss", Encode(Of(Maker().Head(1, 1, 1), Maker().Numbers(4, "x", {1.0}))));
    using namespace std::chrono;
    std::filesystem::last_write_time(Path("old.tss"),
                                     file_clock::from_sys(sys_days{2000y / 1 / 1} + 18h + milliseconds(0)));
    ASSERT_TRUE(Read_TSS_File(Path("old.tss").c_str()));
    EXPECT_EQ(Current_Sheet->creation_date, Col(1).creation_date);
    EXPECT_DOUBLE_EQ(Current_Sheet->creation_date, Date_To_Number(1, 1, 2000, 1) + 0.75);
}

}  // namespace

}  // namespace ingester

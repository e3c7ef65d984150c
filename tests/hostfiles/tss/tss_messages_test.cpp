// What broken spreadsheet files are told of, and what is left of them; and what can't be written.
#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tss/dde_item.h"
#include "hostfiles/tss/tss_fixture.h"

namespace ingester {

namespace {

using TSS_Messages = TSS_Test;

constexpr double M = Missing_Value;
constexpr std::int32_t Too_Large = 10000001;
constexpr const char* Ends_Early = "Error: Could not read all of file ";
const Maker Make;

/// A file, what is reported of it, and how many columns are left of it: 0 for no Sheet.
struct Message_Case {
    Items items;
    const char* message;
    std::int32_t columns = 0;
};

const Items One_Column = Make.Numbers(4, "x", {1.0});

const Message_Case Message_Cases[] = {
    {Make.Head(7, 1, 1),
     "Spreadsheet Read Error: Unknown sheet type.\nCheck this is a Tabulon spreadsheet.\n"},
    {Make.Head(0, 1, 1),
     "Spreadsheet Read Error: Unknown sheet type.\nCheck this is a Tabulon spreadsheet.\n"},
    {Make.Head(1, 0, 1), ""},
    {Of(54415441, 1, 1, 1), Ends_Early},
    {Of(Make.Head(2, 1, 1), 2, Raw{"m"}), "Spreadsheet Read Error: Matrix name length should positive.\n"},
    {Make.Head(1, 1, 1), Ends_Early},
    {Of(Make.Head(1, 2, 1), Make.Column(4, 1, "x")), Ends_Early},
    {Of(54415441, 1, 1, 1, M, 0, 0, 0, 0, 9), Ends_Early},
    {Make.Head(1, 1, -1), "Spreadsheet Read Error: Number of rows should be positive.\n"},
    {Make.Head(3, 4, 2), "Spreadsheet Read Error: Symmetric Matrix is not symmetric.\n"},
    {Make.Head(3, 1, 2), "Spreadsheet Read Error: Symmetric Matrix is not symmetric.\n"},
    {Of(Make.Head(1, 50002, 1), One_Column),
     "Warning too many columns to read in.\nWarning Columns above 50000 NOT transfered.\n", 1},
    {Of(Make.Head(2, 1, 1), 0), "Spreadsheet Read Error: Matrix name length should positive.\n"},
    {Of(Make.Head(3, 1, 1), -1), "Spreadsheet Read Error: Matrix name length should positive.\n"},
    {Make.Head(2, 1, 1), "Spreadsheet Read Error: Matrix name length should positive.\n"},
    {Of(Make.Head(2, 1, 1), std::string(61, 'm'), 0, Make.Numbers(5, "1", {1.0})),
     "Spreadsheet Read Error: Matrix name too INT4 .\n", 1},
    {Of(Make.Head(2, 1, 1), "m", 3),
     "Spreadsheet Read Error: Unknown column label attributes for matrix spreadsheet.\n"},
    {Of(Make.Head(3, 1, 1), "m", -1),
     "Spreadsheet Read Error: Unknown column label attributes for matrix spreadsheet.\n"},
    {Make.Head(4, 3, 1), "Spreadsheet Read Error: Diagonal matrix has too many columns.\n"},
    {Of(Make.Head(5, 1, 1), 0), "Spreadsheet Read Error: Table dimension should positive.\n"},
    {Of(Make.Head(5, 1, 1), 10),
     "Spreadsheet Read Error: Tables with more than 9 classifying factors not yet supported.\n"},
    {Of(Make.Head(5, 1, 1), 1, -1), "Spreadsheet Read Error: Table margin 1 flag invalid.\n"},
    {Of(Make.Head(5, 1, 1), 2), "Spreadsheet Read Error: Table margin 1 flag invalid.\n"},
    {Of(Make.Head(5, 1, 1), 2, 0, -1), "Spreadsheet Read Error: Table margin 2 flag invalid.\n"},
    {Of(Make.Head(5, 1, 1), 2, 0, 0, 0), "Spreadsheet Read Error: Table name length should positive.\n"},
    {Of(Make.Head(5, 1, 1), 2, 0, 0, "t", 0, -1),
     "Spreadsheet Read Error: Table factor name length should positive.\n"},
    {Of(Make.Head(5, 1, 1), 2, 0, 0, "t", 4),
     "Spreadsheet Read Error: Table's classifying factor format is invalid.\n"},
    {Of(Make.Head(5, 1, 1), 2, 0, 0, "t", -1),
     "Spreadsheet Read Error: Table's classifying factor format is invalid.\n"},
    {Of(Make.Head(5, 1, 1), 2, 0, 0, std::string(61, 't'), 0, std::string(61, 'f'),
        Make.Numbers(8, "1", {1.0})),
     "Spreadsheet Warning: Table name too INT4 .\nSpreadsheet Read Error: Table factor name too INT4 .\n", 1},
    {Make.Head(6, 1, 2), "Spreadsheet Read Error: Scalar types should only have one row.\n"},
    {Of(54415441, 1, 1, 1, M, 0, 0, 0, 0, std::string(257, 'p'), One_Column),
     "Pointer to Variate columns was truncated in reading TSS file.\n", 1},
    {Of(54415441, 1, 1, 1, M, 0, 0, 0, 0, -1, One_Column), ""},
    {Of(Make.Head(1, 1, 2), Make.Texts(3, "t", {std::string(10001, 'a'), std::string(10002, 'b')}, 10002)),
     "Warning: Text in t has been truncated to 10000 characters.\n", 1},
    {Of(Make.Head(1, 2, 1), One_Column, Make.Column(3, 1, "t", {.format = 4}), 91, -1),
     "Error: Negative text length.\n", 1},
    {Of(Make.Head(1, 2, 1), One_Column, Make.Column(3, 1, "t", {.format = 4}), 91, 9),
     "Error: Negative text length.\n", 1},
};

/// Faults of the records behind four columns, by the bit of the head.
const struct {
    int bit;
    Items items;
    const char* message;
    std::int32_t columns = 4;
} Record_Messages[] = {
    {0, Of(0, 0), "", 0},
    {0, Of(0, 1, 1, 0, 0, 0, 0, "", "", "", "", "", "", Raw{std::string(24, 'x')}, 26), "", 0},
    {0, Of(0, 1, 1, 0, 0, 0, 0, "", "", "", "", "", "", Raw{std::string(24, 'x')}, 1, 11),
     "Trial column type's name is too long.\n", 0},
    {1, Of(-1), "TSS file has corrupt bookmarks.\n"},
    {1, Of(1, 1.0, 1.0, 1, -1), "TSS file has corrupt bookmarks.\n"},
    {2, Of(-1), "Invalid analysis setup length in TSS File.\n"},
    {2, Of(Too_Large), "Invalid analysis setup length in TSS File.\n"},
    {2, Of(2, 2, "x", "y"), "Analysis setup commands longer than specified length in TSS File.\n"},
    {2, Of(2, 1, -1), "Corrupt Analysis command in TSS file.\n"},
    {2, Of(2, 1, "abc"), "Corrupt Analysis command in TSS file.\n"},
    {2, Of(0, std::string(61, 'd'), -1),
     "Analysis dummy name truncated in reading TSS File.\nInvalid analysis command length in TSS File.\n"},
    {2, Of(0, "", Too_Large), "Invalid analysis command length in TSS File.\n"},
    {2, Of(0, "", 2, 2, "x", "y"), "Analysis commands longer than specified length in TSS File.\n"},
    {2, Of(0, "", 2, 1, -1), "Corrupt Analysis command in TSS file\n"},
    {2, Of(0, "", 2, 1, "abc"), "Corrupt Analysis command in TSS file\n"},
    {3, Of(Too_Large), "Invalid title length in TSS file.\n"},
    {3, Of(2, 2, "x", "y"), "Title lines longer than specified length in TSS file.\n"},
    {3, Of(2, 1, -1), "Corrupt Description in TSS file.\n"},
    {3, Of(2, 1, "abc"), "Corrupt Description in TSS file.\n"},
    {5, Of(-1), "Bad pointer object in TSS file.\n"},
    {5, Of(1, 8), "Bad pointer object in TSS file.\n"},
    {5, Of(1, -1), "Bad pointer object in TSS file.\n"},
    {5, Of(1, 7, -1), "Bad pointer object in TSS file.\n"},
    {5, Of(1, 0, "p", -1), "Bad pointer object in TSS file.\n"},
    {5, Of(1, 0, "p", 1, -1), "Bad pointer object in TSS file.\n"},
    {9, Of(0, -1), "Spreadsheet Read Error: Conditional formatting object contains bad data.\n"},
    {9, Of(0, 5), "Spreadsheet Read Error: Conditional formatting object contains bad data.\n"},
    {9, Of(0, 1, 0), "Spreadsheet Read Error: Conditional formatting object contains bad data.\n"},
    {9, Of(0, 1, 5), "Spreadsheet Read Error: Conditional formatting object contains bad data.\n"},
    {10, Of(1, 5, 0.0, 0.0),
     "Spreadsheet Read Error: Minimum/Maximum restriction object contains bad data.\n"},
    {11, Of("", "", Too_Large), "Corrupt DDE Link in TSS file\n"},
    {12, Of(-1), "Spreadsheet Read Error: Conditional background formatting object contains bad data.\n"},
    {12, Of(1, 0, 1, 0, 0.0, 0.0, 0.0),
     "Spreadsheet Read Error: Conditional background formatting object contains bad data.\n"},
    {14, Of(0.0, 64001), "Spreadsheet creation date information is corrupt.\n"},
    {14, Of(0.0, -1), "Spreadsheet creation date information is corrupt.\n"},
    {16, Of(-1), "Invalid saved restriction count in TSS File.\nTSS file has corrupt cell colours.\n"},
    {16, Of(1, 91),
     "Invalid Saved Restriction Name length in TSS File.\nTSS file has corrupt cell colours.\n"},
    {16, Of(1, "r", 4),
     "Invalid Saved Restriction row count in TSS File.\nTSS file has corrupt cell colours.\n"},
    {18, Of(-1), "Spreadsheet Read Error: Invalid Sheet pagename.\n", 0},
    {18, Of(), "Spreadsheet Read Error: Invalid Sheet pagename.\n", 0},
    {19, Of(-1), "Spreadsheet Read Error: Invalid Table Column Factor description.\n", 0},
    {19, Of("d", 1, 2), Ends_Early, 0},
    {20, Of(1, 1, -1), "", 0},
    {20, Of(1, 1), "", 0},
    {21, Of(1, 9, 1, 1, 2, 3), "TSS file has corrupt cell colours.\n"},
    {21, Of(1, 2, -1), "TSS file has corrupt cell colours.\n"},
    {22, Of(0, 1, 9, 1), "TSS file has corrupt IPRINT settings.\n"},
    {23, Of(1, 0), "TSS file has corrupt hidden columns.\n"},
    {24, Of(1, 1, 0, -1), "TSS file has corrupt factor colours.\n"},
    {27, Of(1, 41), "Trial file has corrupt seasons.\n"},
    {27, Of(1, 0), "Trial file has corrupt seasons.\n"},
    {27, Of(1, "s", 1.0, 2, 7), ""},
};

std::vector<Message_Case> All_Cases()
{
    std::vector<Message_Case> cases(std::begin(Message_Cases), std::end(Message_Cases));
    for (const auto& c : Record_Messages)
        cases.push_back({With_Records({{c.bit, c.items}}), c.message, c.columns});
    return cases;
}

TEST_F(TSS_Messages, Come_From_The_Reader_And_Through_The_Export)
{
    for (const Message_Case& c : All_Cases()) {
        SCOPED_TRACE(c.message);
        const Sheet* const sheet = Read(c.items);
        EXPECT_EQ(sheet == nullptr ? 0 : sheet->column_count, c.columns);
        const std::string told = Messages();
        EXPECT_EQ(told.substr(0, std::string(c.message).size()), c.message);
        EXPECT_EQ(told.empty(), *c.message == '\0') << told;
        Put("x.tss", Encode(c.items));
        const Host_Answer answer = Convert("x.tss", "y.tss");
        EXPECT_EQ(answer.first == 0, c.columns > 0);
        EXPECT_NE(answer.second.find(c.message), std::string::npos);
        Start_Request("t");
    }
}

TEST_F(TSS_Messages, Files_Are_Named_And_Told_From_Others)
{
    Put("x.tss", Encode(With_Records({{26, {}}, {28, Of(1, 9, 1, 1)}})));
    ASSERT_TRUE(Read_TSS_File(Path("x.tss").c_str()));
    EXPECT_EQ(Current_Sheet->cond_on_background, 0);
    EXPECT_EQ(Messages().find("TSS file " + Path("x.tss") + " has corrupt column colours.\n"), 0U);
    EXPECT_EQ(Read(Of(7, 7, 7, 7, 7)), nullptr);
    EXPECT_EQ(Messages().find("Spreadsheet Read Error: This file is not a Tabulon spreadsheet.\n"), 0U);
    EXPECT_FALSE(Read_TSS_File("/nowhere/file.tss"));
    EXPECT_EQ(Messages().find("Tabulon Spreadsheet data file /nowhere/file.tss not found.\n"), 0U);
}

TEST_F(TSS_Messages, What_Can_Not_Be_Written)
{
    const auto message = [&](Sheet* sheet, const std::string& name) {
        EXPECT_FALSE(Write_TSS_File(sheet, name.c_str()));
        return Messages();
    };
    EXPECT_EQ(message(nullptr, Path("n.tss")).find("Internal Spreadsheet Error: Null sheet in Save Sheet.\n"),
              0U);
    EXPECT_EQ(
        message(New_Sheet_With_Rows(1), Path("n.tss"))
            .find(
                "This spreadsheet contains no data and was not saved as you have selected the 'remove empty "
                "rows and columns on save' option.\n"),
        0U);
    ASSERT_NE(Read(Of(Make.Head(1, 1, 1), One_Column)), nullptr);
    EXPECT_EQ(message(Current_Sheet, "/nowhere/n.tss").find("Tabulon spreadsheet data file not saved.\n"),
              0U);
    EXPECT_EQ(message(Current_Sheet, "/dev/full"), "");
    ASSERT_NE(Read(Of(Make.Head(5, 2, 1, 1U << 29), 2, 0, 0, Make.Factor("f", 1, {}, {}, 0, {1.0}),
                      Make.Numbers(8, "1", {1.0}))),
              nullptr);
    EXPECT_EQ(message(Current_Sheet, Path("n.tss"))
                  .find("A table in column format cannot be saved in an older TSS format.\n"),
              0U);
    EXPECT_EQ(Get("n.tss"), "");
}

TEST_F(TSS_Messages, Pointer_Names_Get_Numbers)
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
         "Too many nested pointers (must no more than than 6 deep).\n"},
    };
    for (const auto& c : cases) {
        Sheet* const sheet = New_Sheet_With_Rows(1);
        sheet->settings.bracket_names = 0;
        for (const std::string& name : c.names)
            New_Data_Column(sheet, variate_column, "x", 1)->name = name;
        Restore_Pointer_Names(sheet);
        std::string names;
        for (const Column* column = sheet->first_column->next; column != nullptr; column = column->next)
            names.append(names.empty() ? "" : " ").append(column->name.view());
        EXPECT_EQ(names, c.restored);
        EXPECT_EQ(Messages().find(c.message), 0U);
    }
}

TEST_F(TSS_Messages, Genotypes_Are_Recoded)
{
    const struct {
        Texts labels;
        std::vector<double> cells;
        const char* recoded;  ///< labels, and the cells' levels
    } cases[] = {
        {{"A", "b", "-"}, {1.0, 2.0, 3.0}, "a b - 1 2 6"},
        {{"-", "a"}, {1.0, 2.0, M}, "a h - 6 1 *"},
        {{"b", "h"}, {1.0, 2.0, 2.0}, "b h - 2 3 3"},
        {{"b", "u"}, {1.0, 2.0, 2.0}, "a h u 2 6 6"},
        {{"h", "b", "a"}, {1.0, 2.0, 3.0}, "a b h c d - 3 2 1"},
        {{"d", "a"}, {1.0, 2.0, 2.0}, "a b h c d - 5 1 1"},
        {{"a", "x"}, {1.0, 2.0, 2.0}, "a x 1 2 2"},
        {{"a", "b", "-", "u"}, {4.0, 2.0, 3.0}, "a b - 4 2 6"},
    };
    for (const auto& c : cases) {
        Items items = Make.Head(1, 1, 3, 1U << 25);
        items << Make.Factor("f", static_cast<std::int32_t>(c.labels.size()), {}, c.labels, 2, c.cells);
        ASSERT_NE(Read(items), nullptr);
        const Column& f = *Current_Sheet->last_column;
        std::string found;
        for (const Level_Node* label = f.labels; label != nullptr; label = label->next)
            found.append(label->Text()).append(" ");
        for (const Cell_Node* cell = f.first_cell; cell != nullptr; cell = cell->next)
            found.append(cell == f.first_cell ? "" : " ").append(Render(f, *cell));
        EXPECT_EQ(found, c.recoded);
        EXPECT_EQ(f.factor_recoded != 0, f.colour_source == &f);
        EXPECT_TRUE(f.factor_recoded == 0
                    || (f.factor_colours.front() == 0xFF9595 && f.factor_colours.back() == 0xE7E7E7));
    }
}

TEST(DDE_Items, Are_Rewritten)
{
    const struct {
        const char* item;
        const char* rewritten;
    } cases[] = {
        {"a1", "R1C1"},
        {"z10:aa12", "R10C26:R12C27"},
        {"r2c3:r4c5", "R2C3:R4C5"},
        {"R7", "R7C18"},
        {"name", "NAME"},
        {"a1:x", "R1C1"},
        {"", ""},
        {":b2", "R0C0:R2C2"},
        {"a99999999999999999999:b1", "R9223372036854775807C1:R1C2"},
    };
    for (const auto& c : cases)
        EXPECT_EQ(R1C1_Item(c.item), c.rewritten);
}

}  // namespace

}  // namespace ingester

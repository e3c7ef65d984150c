// What broken spreadsheet files are told of, and what is left of them; and what can't be written.
#include "hostfiles/tss/dde_item.h"
#include "hostfiles/tss/tss_fixture.h"
#include "support/text.h"

namespace ingester {

namespace {

using TSS_Messages = TSS_Test;

constexpr double M = Missing_Value;
constexpr std::int32_t Too_Large = 10000001;
const Maker Make;
const std::string Error = "Spreadsheet Read Error: ";
const Items Matrix = Make.Head(2, 1, 1), Table = Make.Head(5, 1, 1);
const Items Text_Behind = Of(Make.Head(1, 2, 1), Make.Numbers(4, "x", {1.0}), Make.Column(3, 1, "t"), 91);
const Items One_Column = Make.Numbers(4, "x", {1.0});

/// What is reported of files, and how many columns are left of them.
struct Message_Case {
    std::string message;
    std::vector<Items> files;
    std::int32_t columns = 0;  ///< 0 for no Sheet
};

const Message_Case Message_Cases[] = {
    {"", {Make.Head(1, 0, 1), Of(54415441, 1, 1, 1, M, 0, 0, 0, 0, -1, One_Column)}},
    {"Error: Could not read all of file ",
     {Of(54415441, 1, 1, 1), Make.Head(1, 1, 1), Of(Make.Head(1, 2, 1), Make.Column(4, 1, "x")),
      Of(54415441, 1, 1, 1, M, 0, 0, 0, 0, 9)}},
    {Error + "Unknown sheet type.\nCheck this is a Tabulon spreadsheet.\n",
     {Make.Head(7, 1, 1), Make.Head(0, 1, 1)}},
    {Error + "Number of rows should be positive.\n", {Make.Head(1, 1, -1)}},
    {Error + "Symmetric Matrix is not symmetric.\n", {Make.Head(3, 4, 2), Make.Head(3, 1, 2)}},
    {Error + "Matrix name length should positive.\n",
     {Of(Matrix, 2, Raw{"m"}), Of(Matrix, 0), Of(Make.Head(3, 1, 1), -1), Matrix}},
    {Error + "Matrix name too INT4 .\n",
     {Of(Matrix, std::string(61, 'm'), 0, Make.Numbers(5, "1", {1.0}))},
     1},
    {Error + "Unknown column label attributes for matrix spreadsheet.\n",
     {Of(Matrix, "m", 3), Of(Make.Head(3, 1, 1), "m", -1)}},
    {Error + "Diagonal matrix has too many columns.\n", {Make.Head(4, 3, 1)}},
    {Error + "Table dimension should positive.\n", {Of(Table, 0)}},
    {Error + "Tables with more than 9 classifying factors not yet supported.\n", {Of(Table, 10)}},
    {Error + "Table margin 1 flag invalid.\n", {Of(Table, 1, -1), Of(Table, 2)}},
    {Error + "Table margin 2 flag invalid.\n", {Of(Table, 2, 0, -1)}},
    {Error + "Table name length should positive.\n", {Of(Table, 2, 0, 0, 0)}},
    {Error + "Table factor name length should positive.\n", {Of(Table, 2, 0, 0, "t", 0, -1)}},
    {Error + "Table's classifying factor format is invalid.\n",
     {Of(Table, 2, 0, 0, "t", 4), Of(Table, 2, 0, 0, "t", -1)}},
    {"Spreadsheet Warning: Table name too INT4 .\nSpreadsheet Read Error: Table factor name too INT4 .\n",
     {Of(Table, 2, 0, 0, std::string(61, 't'), 0, std::string(61, 'f'), Make.Numbers(8, "1", {1.0}))},
     1},
    {Error + "Scalar types should only have one row.\n", {Make.Head(6, 1, 2)}},
    {"Warning too many columns to read in.\nWarning Columns above 50000 NOT transfered.\n",
     {Of(Make.Head(1, 50002, 1), One_Column)},
     1},
    {"Pointer to Variate columns was truncated in reading TSS file.\n",
     {Of(54415441, 1, 1, 1, M, 0, 0, 0, 0, std::string(257, 'p'), One_Column)},
     1},
    {"Warning: Text in t has been truncated to 10000 characters.\n",
     {Of(Make.Head(1, 1, 2), Make.Texts(3, "t", {std::string(10001, 'a'), std::string(10002, 'b')}, 10002))},
     1},
    {"Error: Negative text length.\n", {Of(Text_Behind, -1), Of(Text_Behind, 9)}, 1},
};

const Items Print_Block = Of(0, 1, 1, 0, 0, 0, 0, "", "", "", "", "", "", Raw{std::string(24, 'x')});

/// Faults of the records behind four columns, by the bit of the head.
const struct {
    int bit;
    std::string message;
    std::vector<Items> records;
    std::int32_t columns = 4;
} Record_Messages[] = {
    {0, "", {Of(0, 0), Of(Print_Block, 26)}, 0},
    {0, "Trial column type's name is too long.\n", {Of(Print_Block, 1, 11)}, 0},
    {1, "TSS file has corrupt bookmarks.\n", {Of(-1), Of(1, 1.0, 1.0, 1, -1)}},
    {2, "Invalid analysis setup length in TSS File.\n", {Of(-1), Of(Too_Large)}},
    {2, "Analysis setup commands longer than specified length in TSS File.\n", {Of(2, 2, "x", "y")}},
    {2, "Corrupt Analysis command in TSS file.\n", {Of(2, 1, -1), Of(2, 1, "abc")}},
    {2,
     "Analysis dummy name truncated in reading TSS File.\nInvalid analysis command length in TSS File.\n",
     {Of(0, std::string(61, 'd'), -1)}},
    {2, "Invalid analysis command length in TSS File.\n", {Of(0, "", Too_Large)}},
    {2, "Analysis commands longer than specified length in TSS File.\n", {Of(0, "", 2, 2, "x", "y")}},
    {2, "Corrupt Analysis command in TSS file\n", {Of(0, "", 2, 1, -1), Of(0, "", 2, 1, "abc")}},
    {3, "Invalid title length in TSS file.\n", {Of(Too_Large)}},
    {3, "Title lines longer than specified length in TSS file.\n", {Of(2, 2, "x", "y")}},
    {3, "Corrupt Description in TSS file.\n", {Of(2, 1, -1), Of(2, 1, "abc")}},
    {5,
     "Bad pointer object in TSS file.\n",
     {Of(-1), Of(1, 8), Of(1, -1), Of(1, 7, -1), Of(1, 0, "p", -1), Of(1, 0, "p", 1, -1)}},
    {9,
     Error + "Conditional formatting object contains bad data.\n",
     {Of(0, -1), Of(0, 5), Of(0, 1, 0), Of(0, 1, 5)}},
    {10, Error + "Minimum/Maximum restriction object contains bad data.\n", {Of(1, 5, 0.0, 0.0)}},
    {11, "Corrupt DDE Link in TSS file\n", {Of("", "", Too_Large)}},
    {12,
     Error + "Conditional background formatting object contains bad data.\n",
     {Of(-1), Of(1, 0, 1, 0, 0.0, 0.0, 0.0)}},
    {14, "Spreadsheet creation date information is corrupt.\n", {Of(0.0, 64001), Of(0.0, -1)}},
    {16, "Invalid saved restriction count in TSS File.\nTSS file has corrupt cell colours.\n", {Of(-1)}},
    {16,
     "Invalid Saved Restriction Name length in TSS File.\nTSS file has corrupt cell colours.\n",
     {Of(1, 91)}},
    {16,
     "Invalid Saved Restriction row count in TSS File.\nTSS file has corrupt cell colours.\n",
     {Of(1, "r", 4)}},
    {18, Error + "Invalid Sheet pagename.\n", {Of(-1), Of()}, 0},
    {19, Error + "Invalid Table Column Factor description.\n", {Of(-1)}, 0},
    {19, "Error: Could not read all of file ", {Of("d", 1, 2)}, 0},
    {20, "", {Of(1, 1, -1), Of(1, 1)}, 0},
    {21, "TSS file has corrupt cell colours.\n", {Of(1, 9, 1, 1, 2, 3), Of(1, 2, -1)}},
    {22, "TSS file has corrupt IPRINT settings.\n", {Of(0, 1, 9, 1)}},
    {23, "TSS file has corrupt hidden columns.\n", {Of(1, 0)}},
    {24, "TSS file has corrupt factor colours.\n", {Of(1, 1, 0, -1)}},
    {27, "Trial file has corrupt seasons.\n", {Of(1, 41), Of(1, 0)}},
    {27, "", {Of(1, "s", 1.0, 2, 7)}},
};

TEST_F(TSS_Messages, Come_From_The_Reader_And_Through_The_Export)
{
    std::vector<Message_Case> cases(std::begin(Message_Cases), std::end(Message_Cases));
    for (const auto& [bit, message, records, columns] : Record_Messages)
        for (const Items& record : records)
            cases.push_back({message, {With_Records({{bit, record}})}, columns});
    for (const auto& [message, files, columns] : cases)
        for (const Items& items : files) {
            SCOPED_TRACE(message);
            const Sheet* const sheet = Read(items);
            EXPECT_EQ(sheet == nullptr ? 0 : sheet->column_count, columns);
            const std::string told = Messages();
            EXPECT_TRUE(told.starts_with(message) && told.empty() == message.empty()) << told;
            Put("x.tss", Encode(items));
            const Host_Answer answer = Convert("x.tss", "y.tss");
            EXPECT_EQ(answer.first == 0, columns > 0);
            EXPECT_NE(answer.second.find(message), std::string::npos);
            Start_Request("t");
        }
    Put("x.tss", Encode(With_Records({{26, {}}, {28, Of(1, 9, 1, 1)}})));
    ASSERT_TRUE(Read_TSS_File(Path("x.tss").c_str()));
    EXPECT_EQ(Current_Sheet->cond_on_background, 0);
    EXPECT_EQ(Messages(), "TSS file " + Path("x.tss") + " has corrupt column colours.\n:\n");
    EXPECT_EQ(Read(Of(7, 7, 7, 7, 7)), nullptr);
    EXPECT_EQ(Messages(), "Spreadsheet Read Error: This file is not a Tabulon spreadsheet.\n:\n");
    EXPECT_FALSE(Read_TSS_File("/nowhere/file.tss"));
    EXPECT_EQ(Messages(), "Tabulon Spreadsheet data file /nowhere/file.tss not found.\n:\n");
}

TEST_F(TSS_Messages, What_Can_Not_Be_Written)
{
    Sheet* const whole = New_Sheet_With_Rows(1);
    Add_Cells(whole, variate_column, "x", {"1"});
    Sheet* const in_columns = New_Sheet_With_Rows(1);
    in_columns->type = table_sheet;
    in_columns->table_in_columns = 1;
    const struct {
        Sheet* sheet;
        std::string name, message;
    } cases[] = {
        {nullptr, Path("n.tss"), "Internal Spreadsheet Error: Null sheet in Save Sheet.\n:\n"},
        {New_Sheet_With_Rows(1), Path("n.tss"),
         "This spreadsheet contains no data and was not saved as you have selected the 'remove empty rows "
         "and columns on save' option.\n:\n"},
        {whole, "/nowhere/n.tss", "Tabulon spreadsheet data file not saved.\n:\n"},
        {whole, "/dev/full", ""},
        {in_columns, Path("n.tss"), "A table in column format cannot be saved in an older TSS format.\n:\n"},
    };
    for (const auto& [sheet, name, message] : cases) {
        EXPECT_FALSE(Write_TSS_File(sheet, name.c_str()));
        EXPECT_EQ(Messages(), message);
    }
    EXPECT_EQ(Get("n.tss"), "");
}

TEST(DDE_Items, Are_Rewritten)
{
    const std::pair<const char*, const char*> cases[] = {
        {"a1", "R1C1"},
        {"z10:aa12", "R10C26:R12C27"},
        {"r2c3:r4c5", "R2C3:R4C5"},
        {"R7", "R7C18"},
        {"name", "NAME"},
        {"a1:x", "R1C1"},
        {"", ""},
        {"abc1", "ABC1"},
        {":b2", "R0C0:R2C2"},
        {"a99999999999999999999:b1", "R9223372036854775807C1:R1C2"}};
    for (const auto& [item, rewritten] : cases)
        EXPECT_EQ(R1C1_Item(item), rewritten);
}

}  // namespace

}  // namespace ingester

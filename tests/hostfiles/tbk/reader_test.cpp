#include "hostfiles/tbk/book_fixture.h"
#include "support/text.h"

#include <random>

namespace ingester {
namespace {

const Book_Bytes b;

class Book_Reader : public Book_Test {};

/// A book of one sheet with one column of one row, with these records.
std::string One_Cell(int sheet, int column, const std::string& records, const std::string& in_front = {})
{
    return b.Book({b.Sheet("S", sheet, 1, 1, in_front + b.Column(column, 1, "c", records))});
}

/// A Factor's record of one cell and one level, and what stands behind it.
std::string One_Level(const std::string& records)
{
    return One_Cell(1, 2, b.Record(96, b.Words({1, 1}) + "\0\1"s) + records);
}

TEST_F(Book_Reader, Tells_Why_A_Record_Is_Bad)
{
    const std::string table = b.Record(20, "\2\0\0"s);
    const std::string no_units = "Illegal column type found in Matrix sheet";
    const std::string matrix = b.Column(5, 1, "a", "");
    const auto two_rows = [](int type, int record, const std::string& payload) {
        return b.Vector(1, 2, b.Column(type, 2, "c", b.Record(record, payload)));
    };
    const std::pair<std::string, std::string> cases[] = {
        {b.Book({b.Sheet("S", 7, 0, 1, "")}), "Invalid sheet type in reading Tabulon book"},
        {One_Cell(1, 0, ""), "Invalid Column Type in Reading Tabulon Book"},
        {One_Cell(1, -2, ""), "Invalid Column Type in Reading Tabulon Book"},
        {One_Cell(1, 9, ""), "Invalid Column Type in Reading Tabulon Book"},
        {One_Cell(1, 21, ""), "Invalid Column Type in Reading Tabulon Book"},
        {One_Cell(1, 5, ""), "Illegal column type found in Vector sheet"},
        {One_Cell(2, 4, ""), no_units},
        {b.Book({b.Sheet("S", 2, 3, 1, matrix + matrix + b.Column(-4, 1, "c", ""))}), no_units},
        {One_Cell(3, 5, ""), "Illegal column type found in Symmetric Matrix sheet"},
        {One_Cell(4, 7, ""), "Illegal column type found in Diagonal Matrix sheet"},
        {One_Cell(5, 4, "", table), "Illegal column type found in Table sheet"},
        {One_Cell(6, 4, ""), "Non-Scalar column found in Scalar sheet"},
        {b.Vector(1, 2, b.Variate(3, "x")), "Invalid number of rows in column"},
        {b.Vector(1, 2, b.Record(34, "\1r" + b.Word(3) + "\1")), "Restriction does not match sheet length"},
        {two_rows(3, 82, b.Word(1) + "\1\1a"), "Text items do not match specified number of rows"},
        {two_rows(33, 83, b.Words({1, 1}) + b.Long("a")), "Text items do not match specified number of rows"},
        {One_Cell(1, 33, b.Record(83, b.Words({1, 1, -1}))), "Text length is negative"},
        {two_rows(2, 96, b.Words({1, 2}) + "\0\1"s), "Factor length does not match specified column length"},
        {two_rows(2, 96, b.Words({2, 0}) + "\0\1"s), "Number of Factor levels are not positive"},
        {One_Level(b.Record(97, b.Word(2) + "\1" + b.Reals({1, 2}))),
         "Factor levels do not match specified number of ordinals"},
        {One_Level(b.Record(98, b.Word(2) + "\1\1a\1b")),
         "Factor labels do not match specified number of ordinals"},
        {One_Level(b.Record(120, b.Words({0}))), "Invalid number of coloured cells in column"},
        {One_Level(b.Record(120, b.Words({2, 1, 0, 0, 2, 0, 0}))),
         "Invalid number of coloured cells in column"},
    };
    for (const auto& [bytes, fault] : cases) {
        const std::string told = Outcome(bytes);
        EXPECT_TRUE(told.starts_with("-") && told.ends_with("\nFault: " + fault + ".\n:\n")) << fault << told;
    }
    const std::string sheet = b.Sheet("S", 1, 1, 1, b.Variate(1, "x"));
    const std::string start = b.Record(1, b.Words({1, 0}));
    const std::string out_of_place[] = {
        b.Head() + b.Record(2),
        b.Head() + b.Record(3),
        b.Head() + sheet,
        b.Head() + start + start,
        b.Head() + start + b.Record(129),
        b.Head() + start + b.Record(128) + b.Record(128),
        b.Head() + start + b.Record(8, std::string(20, '\0')),
        b.Vector(1, 1, b.Record(64, "\4" + b.Word(1) + "\1x" + std::string(7, '\1'))),
        One_Cell(1, 4, b.Numbers({1}) + b.Numbers({1})),
        One_Cell(1, 4, b.Record(99, b.Word(1))),
        One_Cell(1, 3, b.Record(66, "\1")),
        One_Cell(1, 3, b.Record(112, "\1" + b.Long("a"))),
        b.Vector(1, 1, b.Record(22, "\1a") + b.Variate(1, "x")),
        b.Vector(1, 1, sheet),
        b.Vector(1, 1, b.Record(2)),
        // What is out of its range.
        b.Vector(1, 1, b.Record(37, "\3")),
        b.Vector(1, 1, b.Record(26, "\10\1a")),
        b.Vector(1, 1, b.Record(19, "\1a\3")),
        One_Cell(1, 4, b.Record(66, "\23")),
        One_Cell(1, 4, b.Record(121, "\3")),
        One_Cell(1, 4, b.Record(112, "\3" + b.Long("a"))),
        One_Cell(1, 2, b.Record(96, b.Words({1, 1}) + "\3\1")),
    };
    for (const std::string& bytes : out_of_place)
        EXPECT_TRUE(Outcome(bytes).starts_with("-Corrupt record found")) << &bytes - out_of_place;
}

TEST_F(Book_Reader, Tells_What_Is_Wrong_In_Full)
{
    const std::string book = b.Vector(1, 2, b.Variate(2, "x"));
    const std::string corrupt = "-Corrupt record found in Tabulon Book:\nb.tbk at Offset ";
    const std::string incomplete = "-End of File found too soon in b.tbk\nTabulon Book file is incomplete\n"
                                   "Last read record at Offset ";
    const std::string not_loaded = "-Tabulon Book b.tbk couldn't be completely loaded:\n";
    const auto soft = [](const char* fault) {
        return Format_Text("Text limits were exceeded in b.tbk:\nFault: %s.\n:\n", fault);
    };
    const auto text = [](const std::string& cell, int widest) {
        return b.Column(3, 1, "t", b.Record(82, b.Word(1) + b.Byte(widest) + b.Short(cell)));
    };
    const auto long_text = [](const std::string& cell, int widest) {
        return One_Cell(1, 33, b.Record(83, b.Words({1, widest}) + b.Long(cell)));
    };
    const std::pair<std::string, std::string> cases[] = {
        {"TBK", "-b.tbk is not a valid Tabulon Book.\n:\n"},
        {std::string(book).replace(8, 2, "\2\0"s), "-b.tbk is not a valid Tabulon Book.\n:\n"},
        {b.Head() + b.Record(0), corrupt + "C\nat Record Number 1, Type 0, Length 0\n:\n"},
        {b.Head() + b.Record(0x8001), corrupt + "C\nat Record Number 1, Type -32767, Length 0\n:\n"},
        {b.Head() + b.Record_Head(4, -8), corrupt + "C\nat Record Number 1, Type 4, Length -8\n:\n"},
        {b.Book({b.Sheet("", 7, 0, 0, "")}),
         corrupt
             + "24\nat Record Number 3, Type 16, Length 22\nFault: Invalid sheet type in reading Tabulon "
               "book.\n:\n"},
        {b.Head(), incomplete + "0, Record Number 0, Type 0, Length 0.\n:\n"},
        {book.substr(0, book.size() - 7), incomplete + "6F, Record Number 6, Type 65, Length 0.\n:\n"},
        {b.Vector(1, 2000000000, b.Column(4, 2000000000, "x", "")),
         not_loaded + "Could not create column in Reading Tabulon Book\n:\n"},
        {b.Vector(1, 2, b.Record(124, "\1a") + b.Variate(2, "x") + b.Record(200)),
         "x V1|2Unknown Record type 124 ignored in Tabulon Book:\n b.tbk.\n(record number 4, length 2, at "
         "offset 65)\nThis is probably due to reading a TBK file\nproduced by a newer version of Tabulon.\n"
         ":\n"},
        {b.Vector(1, 1, text(std::string(91, 'x'), 91)), "t T90 characters" + soft("Text column truncated")},
        {b.Vector(2, 1, text("xx", 1) + text(std::string(91, 'x'), 91)),
         "t Txx; t_1 T90 characters" + soft("Text column length exceeds specified maximum")},
        {long_text(std::string(10001, 'x'), 10001),
         "c L10000 characters" + soft("Text column truncated at 10000 characters")},
        {long_text("xx", 1), "c Lxx" + soft("Text column length exceeds specified maximum for column")},
        {One_Level(b.Record(98, b.Word(1) + "\1" + b.Short(std::string(251, 'y')))),
         "c F1" + soft("Factor labels truncated")},
        {One_Cell(1, 4, b.Record(113, b.Short(std::string(81, 'e')))),
         "c V*" + soft("Column extra truncated")},
        {One_Cell(1, 4, "", b.Record(36, "\1\1\1")),
         "c V*" + soft("Hidden column array does not match number of columns in sheet")},
    };
    for (const auto& [bytes, told] : cases)
        EXPECT_EQ(Outcome(bytes), told);
    const std::string empty = b.Book({});
    Input_File file(std::as_bytes(std::span(empty)));
    EXPECT_TRUE(Read_TBK(file) && Current_Sheet == nullptr) << "a book without sheets";
    request.Max_Columns = 1;
    EXPECT_EQ(Outcome(b.Vector(2, 1, b.Variate(1, "x") + b.Variate(1, "y"))),
              not_loaded
                  + "Maximum number of columns (1) exceeded.\nIncrease the column limit in Tools | "
                    "Spreadsheet Options\n:\n");
    EXPECT_FALSE(Read_TBK_File("none.tbk"));
    EXPECT_EQ(Messages(), "Tabulon Book file none.tbk not found.\n:\n");
}

TEST_F(Book_Reader, Reads_Records_That_Are_No_Longer_Written)
{
    const std::string old = b.Record(4, std::string(8, 'x')) + b.Record(5, std::string(8, 'x'))
                            + b.Record(6, std::string(4, 'x')) + b.Record(7) + b.Record(10) + b.Record(11)
                            + b.Record(12, "\3");
    const std::string factor = b.Record(8, "\3old\0\2\7kind of\4toldxx"s + b.Words({2, 2, 2}) + "\1\3"
                                               + b.Reals({1, 2}) + "\5\1a\1b");
    const std::string sheet =
        b.Record(9) + b.Record(38)
        + b.Record(28, b.Long("t") + b.Long("s") + b.Long("i") + b.Long("e") + "\1\2\3\4\5")
        + b.Column(4, 3, "x", b.Numbers({2, 3, 1.5}) + factor)
        + b.Column(3, 3, "t", b.Record(82, b.Word(3) + "\1\1a\1b\1c"));
    const auto comment = [](int row, int column, const std::string& text) {
        return b.Record(130, b.Words({0, row, column, 0, 0, 1}) + b.Long(text));
    };
    const std::string comments = b.Record(128) + b.Record(130, std::string(24, '\0'))
                                 + comment(2, 2, "*Missing") + comment(1, 1, "*M") + comment(3, 2, "no")
                                 + comment(9, 9, "*M") + comment(9, 1, "*M") + comment(1, 2, "*M")
                                 + b.Record(129);
    const std::string book = b.Book({b.Sheet("S", 1, 2, 3, sheet + b.Record(12, "\7"))}, old, comments);
    EXPECT_EQ(Outcome(book), "kind_of F2|*|*; t Ta|b|c");
    EXPECT_EQ(Current_Sheet->population_code, 7);
    EXPECT_EQ(Current_Sheet->dde_extra + Current_Sheet->dde_topic, "et");
    EXPECT_EQ(Current_Sheet->dde_flags[3], 4);
    EXPECT_EQ(Current_Sheet->first_column->next->extra, "told");
    request.Replace_Book_Data = true;
    EXPECT_EQ(Outcome(book), "kind_of F*|*|*; t T||c");
    request.Subset_Rows = true;
    request.Subset_Row_Flags = {1, 0, 1};
    EXPECT_EQ(Outcome(book), "kind_of F*|*; t T|c") << "rows are those of the book";
}

TEST_F(Book_Reader, Settles_What_A_Record_Leaves_Open)
{
    const struct {
        std::string display;  ///< format, width, justify, date, form, protection, flag
        std::int32_t format, width, justify, date;
    } displays[] = {{"\3\120\2\50\0\0\0"s, 3, 80, 2, 40},
                    {"\6\121\4\51\0\0\0"s, 1, 80, 0, 9},
                    {"\5\1\3\1\0\0\0"s, 5, 2, 3, 1},
                    {"\2\0\0\0\0\0\0"s, 2, 13, 0, 0}};
    for (const auto& [display, format, width, justify, date] : displays) {
        ASSERT_NE(Read(b.Vector(1, 1, b.Column(4, 1, "x", b.Numbers({1}), display))), nullptr);
        const Column& column = *Current_Sheet->last_column;
        EXPECT_EQ((std::array{column.format, column.width, column.justify, column.date_format}),
                  (std::array{format, width, justify, date}));
    }
    const auto factor = [](int levels, const std::string& codes) {
        return b.Vector(1, 3, b.Column(2, 3, "f", b.Record(96, b.Words({3, levels}) + "\0"s + codes)));
    };
    const auto table = [](const char* name) {
        return b.Book({b.Sheet("S", 5, 1, 1,
                               b.Record(20, "\2\0\0"s) + b.Record(19, "\1t\1")
                                   + b.Column(8, 1, name, b.Numbers({-1e306})))});
    };
    const auto full = [](const char* name, double x, double y) {
        return b.Column(7, 2, name, b.Numbers({x, y}));
    };
    const std::pair<std::string, std::string> cases[] = {
        // A smaller packing than the levels need is no more than they allow; a larger one is read.
        {factor(3, "\x39"), "f F1|2|3"},
        {factor(3, "\x21\3"), "f F1|2|3"},
        {factor(3, "\1\0\4"s), "f F1|*|*"},
        {factor(200, "\1\0\xC8"s), "f F1|*|200"},
        // Levels by name; a full Symmetric Matrix; numbers that stay as they stand.
        {table("7.5"), "7.5 T-1e+306"},
        {table("x"), "x T-1e+306"},
        {b.Book({b.Sheet("S", 3, 2, 2, full("", 1, 2) + full("", 3, 4))}), "1 S1|2; 2 S4"},
    };
    for (const auto& [bytes, cells] : cases) {
        EXPECT_EQ(Outcome(bytes), cells);
        EXPECT_TRUE(cells[0] != '7' || Current_Sheet->last_column->table_margin_value == 7.5);
        EXPECT_TRUE(cells[0] != 'x' || Current_Sheet->last_column->table_margin_value == 1);
    }
    EXPECT_TRUE(Outcome(factor(200, "\1\0"s)).starts_with("-Corrupt"));
    const Book_Bytes big{std::endian::big};
    EXPECT_EQ(Outcome(big.Vector(
                  1, 2, big.Column(2, 2, "f", big.Record(96, big.Words({2, 300}) + "\0\1\54\1\55"s)))),
              "f F300|*");
    EXPECT_EQ(
        Outcome(big.Vector(
            1, 2,
            big.Column(2, 2, "f", big.Record(96, big.Words({2, 70000}) + "\0"s + big.Words({70000, -1}))))),
        "f F70000|*");
}

TEST_F(Book_Reader, Chooses_The_Sheet_That_Was_Asked_For)
{
    Texts sheets;
    for (const char* const name : {"Sheet1", "Sheet2", "data", "Data 2", "3"})
        sheets.push_back(b.Sheet(name, 1, 1, 1, b.Variate(1, name)));
    const std::string book = b.Book(sheets);
    const struct {
        const char *asked, *found;
        bool exact = true;
    } cases[] = {{"", "3"},
                 {"2", "Sheet2"},
                 {"3", "data"},
                 {"DATA", "data"},
                 {"data 2", "Data 2"},
                 {"sheet", "Sheet1", false},
                 {"6", ""},
                 {"Sheet22", "Sheet2", false},
                 {"3x", "3", false},
                 {"0", ""},
                 {"other", ""}};
    for (const auto& [asked, found, exact] : cases) {
        request.Worksheet_Name = asked;
        request.Used_Sheet_Name.clear();
        const Sheet* const sheet = Read(book);
        EXPECT_EQ(sheet == nullptr ? "" : sheet->sheet_name.view(), found) << asked;
        EXPECT_EQ(request.Used_Sheet_Name, found) << asked;
        EXPECT_EQ(Messages(),
                  !exact ? Format_Text("Warning: inexact match on sheet name: '%s' selected for '%s'.\n:\n",
                                       found, asked)
                  : *found == '\0'
                      ? Format_Text("Specifed sheet name %s not found in Tabulon TBK file.\n:\n", asked)
                      : "");
    }
    request.Worksheet_Name = "1";
    EXPECT_EQ(Outcome(b.Head() + b.Record(1, b.Words({0, 0})) + b.Record(2)),
              "-Specifed sheet name 1 not found in Tabulon TBK file.\n:\n");
    request.List_Sheets_Only = true;
    EXPECT_EQ(Outcome(book), "Worksheets TSheet1|Sheet2|data|Data 2|3");
    EXPECT_EQ(Outcome("no book"), "-Unable to get Pagenames from Tabulon Book file b.tbk.\n:\n");
}

TEST_F(Book_Reader, Leaves_Out_Columns_And_Rows)
{
    const std::string bytes = Full_Vector(b).bytes;
    request.Subset_Columns = true;
    request.Subset_Names = {"T", "v", "t"};
    request.Subset_Rows = true;
    request.Subset_Row_Flags = {1, 0, 1, 1, 0, 0, 0, 0, 0, 1};
    EXPECT_EQ(Outcome(bytes), "v V1|*|1e+300; t Ta|c|90 characters");
    EXPECT_EQ(Current_Sheet->saved_restrictions[0].bits, "\3");
    const Column& variate = *Column_At(Current_Sheet, 1);
    ASSERT_EQ(variate.cell_colours.size(), 2U);
    EXPECT_EQ(variate.cell_colours[0].row, 1);
    EXPECT_EQ(variate.cell_colours[1].row, 2);
    EXPECT_EQ(variate.cell_colours[1].back_colour, 0xFFFFFF);
    EXPECT_EQ(variate.colour_source, nullptr) << "the Factor is gone";
    request.Subset_Names = {"none"};
    EXPECT_EQ(Outcome(bytes), "-") << "the pipeline tells";
    request.Subset_Columns = false;
    request.Subset_Row_Flags = {0, 0};
    EXPECT_EQ(Outcome(bytes), "-");
    request.Subset_Row_Flags = {1, 0, 1};
    EXPECT_EQ(Outcome(Full_Matrix(b, 3).bytes), "u Up|r; a S1|3; c S6");
}

TEST_F(Book_Reader, Reads_One_Sheet_Of_Many_And_No_More)
{
    constexpr int rows = 2000;
    Texts sheets;
    for (int i = 0; i < 500; ++i)
        sheets.push_back(b.Sheet("page " + std::to_string(i), 1, 1, rows, b.Variate(rows, "x")));
    Put("many.tbk", b.Book(sheets));
    const auto bytes_read = [&] {
        std::ifstream file("/proc/self/io");
        long count = 0;
        file.ignore(7) >> count;  // "rchar: "
        return count;
    };
    for (const auto& [asked, most] : {std::pair("page 250", 500L * 300), std::pair("251", 2000L)}) {
        request.Worksheet_Name = asked;
        const long before = bytes_read();
        ASSERT_TRUE(Read_TBK_File(Request_Name("many.tbk").c_str()));
        const long sheet = 8 * rows + 2 * (64 << 10);  // and what is read ahead at its ends
        EXPECT_LT(bytes_read() - before, most + sheet);
        EXPECT_EQ(Current_Sheet->sheet_name, "page 250");
        EXPECT_EQ(Current_Sheet->row_count, rows);
    }
}

TEST_F(Book_Reader, Refuses_Every_Record_Of_A_Wrong_Length_Or_Place)
{
    for (const Whole_Book& whole : {Full_Vector(b), Full_Table(b, 3)}) {
        for (std::size_t at = 12, end; at < whole.bytes.size(); at = end) {
            const int type = Number_At<std::uint16_t>(whole.bytes.data() + at);
            const auto length = Number_At<std::int32_t>(whole.bytes.data() + at + 2);
            end = at + 6 + static_cast<std::size_t>(length);
            if (type >= 17) {
                const std::string record = whole.bytes.substr(at, end - at);
                EXPECT_EQ(Read(b.Head() + b.Record(1, b.Words({1, 0})) + record), nullptr) << type;
                EXPECT_TRUE(type < 66 || Read(b.Vector(1, 1, record)) == nullptr) << type;
            }
            if (type == 17 || type == 65)
                continue;  // what they hold is not read
            std::string other = whole.bytes;
            other.insert(end, "\1");
            Put_Number<std::int32_t>(other.data() + at + 2, length + 1);
            const bool may_have_one_more = type == 23 || type == 36 /* a soft fault */
                                           || (type == 96 && Full_Table(b, 3).bytes == whole.bytes);
            EXPECT_EQ(Read(other) != nullptr, may_have_one_more) << type;
            if (length == 0)
                continue;
            other.erase(end - 1, 2);
            Put_Number<std::int32_t>(other.data() + at + 2, length - 1);
            EXPECT_EQ(Read(other) != nullptr, type == 36 || type == 21) << type;
        }
    }
}

TEST_F(Book_Reader, Survives_Books_That_End_Anywhere_Or_Lie)
{
    Sheet* const both[] = {Plain_Sheet("A"), Read(Full_Table(b, 3).bytes)};
    const std::string bytes = Written(both);
    for (std::size_t size = 0; size < bytes.size(); ++size)
        EXPECT_EQ(Read(bytes.substr(0, size)), nullptr) << size;
    EXPECT_NE(Messages(), "");
    std::mt19937 random(1);
    for (const char* const asked : {"", "Table", "2"})
        for (std::size_t at = 12; at < bytes.size(); ++at)
            for (const int lie : {0, 1, 0x7F, 0x80, 0xFF}) {
                std::string other = bytes;
                other[at] = static_cast<char>(lie);
                if (lie == 1)
                    other[random() % other.size()] = static_cast<char>(random());
                request.Worksheet_Name = asked;
                Read(other);  // which checks what it makes
            }
}

}  // namespace
}  // namespace ingester

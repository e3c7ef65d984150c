#include "hostfiles/tbk/book_sheets.h"
#include "support/text.h"

#include <functional>
#include <random>

namespace ingester {
namespace {

const Book_Bytes Little;

class Book_Reader : public Book_Test {
protected:
    /// What was read of a book, without the column of rows; or "-" and what was told.
    [[nodiscard]] std::string Outcome(const std::string& bytes) const
    {
        const Sheet* const sheet = Read(bytes);
        return (sheet == nullptr ? "-" : Render(sheet)) + Messages();
    }
};

/// Offset, end and type of each record behind the head.
struct Found_Record {
    std::size_t at, end;
    int type;
};
std::vector<Found_Record> Records_Of(const std::string& bytes)
{
    std::vector<Found_Record> records;
    for (std::size_t at = 12; at < bytes.size(); at = records.back().end)
        records.push_back({at, at + 6 + Number_At<std::uint32_t>(bytes.data() + at + 2),
                           Number_At<std::uint16_t>(bytes.data() + at)});
    return records;
}

std::string Labels(const Book_Bytes& b, int levels, const std::string& label)
{
    std::string body = b.Word(levels) + b.Byte(9);
    for (int i = 0; i < levels; ++i)
        body += b.Short(label);
    return b.Record(98, body);
}

TEST_F(Book_Reader, Tells_Why_A_Record_Is_Bad)
{
    const Book_Bytes& b = Little;
    const auto factor = [&](const std::string& records) {
        return b.Vector(
            1, 2, b.Column(2, 2, "f", b.Record(96, b.Words({2, 2}) + std::string("\0\1", 2)) + records));
    };
    const auto typed = [&](int sheet, int column) {
        return b.Book({b.Sheet("S", sheet, 1, 1,
                               (sheet == 5 ? b.Record(20, std::string("\2\0\0", 3)) : "")
                                   + b.Column(column, 1, "c", ""))});
    };
    const std::string none;
    const struct {
        std::string bytes;
        const char* fault;
    } cases[] = {
        {b.Book({b.Sheet("S", 7, 0, 1, none)}), "Invalid sheet type in reading Tabulon book"},
        {typed(1, 0), "Invalid Column Type in Reading Tabulon Book"},
        {typed(1, -2), "Invalid Column Type in Reading Tabulon Book"},
        {typed(1, 9), "Invalid Column Type in Reading Tabulon Book"},
        {typed(1, 21), "Invalid Column Type in Reading Tabulon Book"},
        {typed(1, 5), "Illegal column type found in Vector sheet"},
        {typed(2, 4), "Illegal column type found in Matrix sheet"},
        {b.Book(
             {b.Sheet("S", 2, 3, 1,
                      b.Column(5, 1, "a", none) + b.Column(5, 1, "b", none) + b.Column(-4, 1, "c", none))}),
         "Illegal column type found in Matrix sheet"},
        {typed(3, 5), "Illegal column type found in Symmetric Matrix sheet"},
        {typed(4, 7), "Illegal column type found in Diagonal Matrix sheet"},
        {typed(5, 4), "Illegal column type found in Table sheet"},
        {typed(6, 4), "Non-Scalar column found in Scalar sheet"},
        {b.Vector(1, 2, b.Variate(3, "x")), "Invalid number of rows in column"},
        {b.Vector(1, 2, b.Record(34, b.Short("r") + b.Word(3) + "\1")),
         "Restriction does not match sheet length"},
        {b.Vector(1, 2, b.Column(3, 2, "t", b.Record(82, b.Word(1) + "\1\1a"))),
         "Text items do not match specified number of rows"},
        {b.Vector(1, 2, b.Column(33, 2, "t", b.Record(83, b.Words({1, 1}) + b.Long("a")))),
         "Text items do not match specified number of rows"},
        {b.Vector(1, 1, b.Column(33, 1, "t", b.Record(83, b.Words({1, 1, -1})))), "Text length is negative"},
        {b.Vector(1, 2, b.Column(2, 2, "f", b.Record(96, b.Words({1, 2}) + std::string("\0\1", 2)))),
         "Factor length does not match specified column length"},
        {b.Vector(1, 2, b.Column(2, 2, "f", b.Record(96, b.Words({2, 0}) + std::string("\0\1", 2)))),
         "Number of Factor levels are not positive"},
        {factor(b.Record(97, b.Word(1) + "\1" + b.Reals({1}))),
         "Factor levels do not match specified number of ordinals"},
        {factor(Labels(b, 3, "a")), "Factor labels do not match specified number of ordinals"},
        {factor(b.Record(120, b.Words({0}))), "Invalid number of coloured cells in column"},
        {factor(b.Record(120, b.Words({3, 1, 0, 0, 2, 0, 0, 3, 0, 0}))),
         "Invalid number of coloured cells in column"},
    };
    for (const auto& [bytes, fault] : cases) {
        EXPECT_EQ(Read(bytes), nullptr) << fault;
        EXPECT_TRUE(Messages().ends_with(std::string("\nFault: ") + fault + ".\n:\n")) << fault;
    }
}

TEST_F(Book_Reader, Tells_What_Is_Wrong_In_Full)
{
    const Book_Bytes& b = Little;
    const std::string book = b.Vector(1, 2, b.Variate(2, "x"));
    const std::string other_mark = std::string(book).replace(8, 2, "\2\0", 2);
    const std::string corrupt = "-Corrupt record found in Tabulon Book:\nb.tbk at Offset ";
    const std::string incomplete = "-End of File found too soon in b.tbk\nTabulon Book file is incomplete\n"
                                   "Last read record at Offset ";
    const std::string not_loaded = "-Tabulon Book b.tbk couldn't be completely loaded:\n";
    const struct {
        const char* what;
        std::string bytes, told;
    } cases[] = {
        {"no book", "TBK", "-b.tbk is not a valid Tabulon Book.\n:\n"},
        {"order mark", other_mark, "-b.tbk is not a valid Tabulon Book.\n:\n"},
        {"type 0", b.Head() + b.Record(0), corrupt + "C\nat Record Number 1, Type 0, Length 0\n:\n"},
        {"a negative type", b.Head() + b.Record(0x8001),
         corrupt + "C\nat Record Number 1, Type -32767, Length 0\n:\n"},
        {"a negative length", b.Head() + b.Record_Head(4, -8),
         corrupt + "C\nat Record Number 1, Type 4, Length -8\n:\n"},
        {"with a fault", b.Book({b.Sheet("", 7, 0, 0, "")}),
         corrupt
             + "24\nat Record Number 3, Type 16, Length 22\nFault: Invalid sheet type in reading Tabulon "
               "book.\n:\n"},
        {"nothing", b.Head(), incomplete + "0, Record Number 0, Type 0, Length 0.\n:\n"},
        {"half of a record", book.substr(0, book.size() - 7),
         incomplete + "6F, Record Number 6, Type 65, Length 0.\n:\n"},
        {"rows for nothing", b.Vector(1, 2000000000, b.Column(4, 2000000000, "x", "")),
         not_loaded + "Could not create column in Reading Tabulon Book\n:\n"},
        {"unknown records", b.Vector(1, 2, b.Record(124, "\1a") + b.Variate(2, "x") + b.Record(200)),
         "x V1|2Unknown Record type 124 ignored in Tabulon Book:\n b.tbk.\n(record number 4, length 2, at "
         "offset 65)\n"
         "This is probably due to reading a TBK file\nproduced by a newer version of Tabulon.\n:\n"},
        {"a book without sheets", b.Book({}), "-"},
    };
    for (const auto& [what, bytes, told] : cases) {
        if (bytes == b.Book({})) {
            Input_File file(std::as_bytes(std::span(bytes)));
            EXPECT_TRUE(Read_TBK(file) && Current_Sheet == nullptr) << what;
            continue;
        }
        EXPECT_EQ(Outcome(bytes), told) << what;
    }
    request.Max_Columns = 1;
    EXPECT_EQ(
        Outcome(b.Vector(2, 1, b.Variate(1, "x") + b.Variate(1, "y"))),
        not_loaded
            + "Maximum number of columns (1) exceeded.\nIncrease the column limit in Tools | Spreadsheet "
              "Options\n:\n");
    EXPECT_FALSE(Read_TBK_File("none.tbk"));
    EXPECT_EQ(Messages(), "Tabulon Book file none.tbk not found.\n:\n");
}

TEST_F(Book_Reader, Reports_Soft_Faults_Once_And_Keeps_What_Fits)
{
    const Book_Bytes& b = Little;
    const auto text = [&](int length, int widest) {
        return b.Column(3, 1, "t",
                        b.Record(82, b.Word(1) + b.Byte(widest) + b.Short(std::string(length, 'x'))));
    };
    const auto long_text = [&](int length, int widest) {
        return b.Column(33, 1, "t", b.Record(83, b.Words({1, widest}) + b.Long(std::string(length, 'x'))));
    };
    const struct {
        std::string body, kept;
        const char* fault;
    } cases[] = {
        {text(91, 91), "t T90 characters", "Text column truncated"},
        {text(5, 4), "t Txxxxx", "Text column length exceeds specified maximum"},
        {long_text(10001, 10001), "t L10000 characters", "Text column truncated at 10000 characters"},
        {long_text(3, 2), "t Lxxx", "Text column length exceeds specified maximum for column"},
        {text(5, 4) + text(91, 91), "t Txxxxx; t_1 T90 characters",
         "Text column length exceeds specified maximum"},
        {b.Column(2, 1, "f",
                  b.Record(96, b.Words({1, 1}) + std::string("\2\1", 2))
                      + Labels(b, 1, std::string(251, 'y'))),
         "f F1", "Factor labels truncated"},
        {b.Column(4, 1, "x", b.Record(113, b.Short(std::string(81, 'e')))), "x V*", "Column extra truncated"},
        {b.Record(36, "\1\1\1") + b.Variate(1, "x"), "x V1",
         "Hidden column array does not match number of columns in sheet"},
    };
    for (const auto& [body, kept, fault] : cases)
        EXPECT_EQ(Outcome(b.Vector(1, 1, body)),
                  kept + "Text limits were exceeded in b.tbk:\nFault: " + fault + ".\n:\n");
}

TEST_F(Book_Reader, Reads_Records_That_Are_No_Longer_Written)
{
    const Book_Bytes& b = Little;
    const std::string old = b.Record(4, std::string(8, 'x')) + b.Record(5, std::string(8, 'x'))
                            + b.Record(6, std::string(4, 'x')) + b.Record(7) + b.Record(10) + b.Record(11)
                            + b.Record(12, "\3");
    const std::string factor =
        b.Record(8, b.Short("old") + std::string("\0\2", 2) + b.Short("kind of") + b.Short("told") + "xx"
                        + b.Words({2, 2, 2}) + "\1\3" + b.Reals({1, 2}) + "\5" + b.Short("a") + b.Short("b"));
    const std::string sheet =
        b.Record(9) + b.Record(38)
        + b.Record(28, b.Long("t") + b.Long("s") + b.Long("i") + b.Long("e") + std::string("\1\2\3\4\5"))
        + b.Column(4, 3, "x", b.Record(81, b.Word(3) + b.Reals({2, 3, 1.5})) + factor)
        + b.Column(3, 3, "t", b.Record(82, b.Word(3) + "\1\1a\1b\1c"));
    const auto comment = [&](int row, int column, const std::string& text) {
        return b.Record(130, b.Words({0, row, column}) + std::string(8, 'x') + b.Words({1}) + b.Long(text));
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
    const Book_Bytes& b = Little;
    const auto facts = [&](std::string display) {  // format, width, justify, date, form, protection, flag
        display.resize(7);
        return b.Vector(1, 1,
                        b.Record(64, b.Byte(4) + b.Word(1) + b.Short("x") + display)
                            + b.Record(81, b.Word(1) + b.Reals({1})) + b.Record(65));
    };
    const struct {
        const char* display;
        std::int32_t format, width, justify, date;
    } cases[] = {{"\3\120\2\50", 3, 80, 2, 40},
                 {"\6\121\4\51", 1, 80, 0, 9},
                 {"\5\1\3\1", 5, 2, 3, 1},
                 {"\2", 2, 13, 0, 0}};
    for (const auto& [display, format, width, justify, date] : cases) {
        const Sheet* const sheet = Read(facts(display));
        ASSERT_NE(sheet, nullptr);
        const Column& column = *sheet->first_column->next;
        EXPECT_EQ((std::array{column.format, column.width, column.justify, column.date_format}),
                  (std::array{format, width, justify, date}));
    }
    // A smaller packing than the levels need is no more than they allow; a larger one is read.
    const auto factor = [&](int levels, const std::string& codes) {
        return b.Vector(
            1, 3, b.Column(2, 3, "f", b.Record(96, b.Words({3, levels}) + std::string("\0", 1) + codes)));
    };
    EXPECT_EQ(Outcome(factor(3, std::string("\x39", 1))), "f F1|2|3");
    EXPECT_EQ(Outcome(factor(3, std::string("\x21\3", 2))), "f F1|2|3");
    EXPECT_EQ(Outcome(factor(3, std::string("\1\0\4", 3))), "f F1|*|*");
    EXPECT_EQ(Outcome(factor(200, std::string("\1\0\xC8", 3))), "f F1|*|200");
    EXPECT_TRUE(Outcome(factor(200, std::string("\1\0", 2))).starts_with("-Corrupt"));
    // Levels by name; a full Symmetric Matrix; numbers that stay as they stand.
    const std::string shape = b.Record(20, std::string("\2\0\0", 3)) + b.Record(19, b.Short("t") + "\1");
    const auto body = [&](const std::string& name) {
        return b.Column(8, 1, name, b.Record(81, b.Word(1) + b.Reals({-1e306})));
    };
    ASSERT_EQ(Outcome(b.Book({b.Sheet("S", 5, 3, 1, shape + body("7.5") + body("x"))})),
              "7.5 T-1e+306; x T-1e+306");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->table_margin_value, 7.5);
    EXPECT_EQ(Column_At(Current_Sheet, 2)->table_margin_value, 2);
    const auto full = [&](const char* name, double x, double y) {
        return b.Column(7, 2, name, b.Record(81, b.Word(2) + b.Reals({x, y})));
    };
    EXPECT_EQ(Outcome(b.Book({b.Sheet("S", 3, 2, 2, full("", 1, 2) + full("", 3, 4))})), "1 S1|2; 2 S4");
}

TEST_F(Book_Reader, Chooses_The_Sheet_That_Was_Asked_For)
{
    const Book_Bytes& b = Little;
    std::vector<std::string> sheets;
    for (const char* const name : {"Sheet1", "Sheet2", "data", "Data 2", "3"})
        sheets.push_back(b.Sheet(name, 1, 1, 1, b.Variate(1, name)));
    const std::string book = b.Book(sheets);
    const std::string warning = "Warning: inexact match on sheet name: '";
    const struct {
        const char* asked;
        const char* found;
        std::string told;
    } cases[] = {
        {"", "3", ""},
        {"2", "Sheet2", ""},
        {"3", "data", ""},
        {"DATA", "data", ""},
        {"data 2", "Data 2", ""},
        {"sheet", "Sheet1", warning + "Sheet1' selected for 'sheet'.\n:\n"},
        {"Sheet22", "Sheet2", warning + "Sheet2' selected for 'Sheet22'.\n:\n"},
        {"3x", "3", warning + "3' selected for '3x'.\n:\n"},
        {"6", "", "Specifed sheet name 6 not found in Tabulon TBK file.\n:\n"},
        {"0", "", "Specifed sheet name 0 not found in Tabulon TBK file.\n:\n"},
        {"other", "", "Specifed sheet name other not found in Tabulon TBK file.\n:\n"},
    };
    for (const auto& [asked, found, told] : cases) {
        request.Worksheet_Name = asked;
        request.Used_Sheet_Name.clear();
        const Sheet* const sheet = Read(book);
        EXPECT_EQ(sheet == nullptr ? "" : sheet->sheet_name.view(), found) << asked;
        EXPECT_EQ(request.Used_Sheet_Name, found) << asked;
        EXPECT_EQ(Messages(), told) << asked;
    }
    request.Worksheet_Name = "1";
    EXPECT_EQ(Read(b.Head() + b.Record(1, b.Words({0, 0})) + b.Record(2)), nullptr);
    EXPECT_EQ(Messages(), "Specifed sheet name 1 not found in Tabulon TBK file.\n:\n");
    request.List_Sheets_Only = true;
    EXPECT_EQ(Outcome(book), "Worksheets TSheet1|Sheet2|data|Data 2|3");
    EXPECT_EQ(Outcome("no book"), "-Unable to get Pagenames from Tabulon Book file b.tbk.\n:\n");
}

TEST_F(Book_Reader, Leaves_Out_Columns_And_Rows)
{
    const std::string bytes = Written(Full_Vector());
    request.Subset_Columns = true;
    request.Subset_Names = {"T", "v", "t"};
    request.Subset_Rows = true;
    request.Subset_Row_Flags = {1, 0, 1, 1, 0, 0, 0, 0, 1};
    EXPECT_EQ(Outcome(bytes), "v V1|*|1e+300; t Ta|c|90 characters");
    EXPECT_EQ(Current_Sheet->saved_restrictions[0].bits, std::string("\3"));
    const std::vector<Cell_Colour>& colours = Column_At(Current_Sheet, 1)->cell_colours;
    ASSERT_EQ(colours.size(), 2U);
    EXPECT_EQ(colours[0].row, 1);
    EXPECT_EQ(colours[1].row, 2);
    EXPECT_EQ(colours[1].back_colour, 0xFFFFFF);
    EXPECT_EQ(Column_At(Current_Sheet, 1)->colour_source, nullptr) << "the Factor is gone";
    request.Subset_Names = {"none"};
    EXPECT_EQ(Outcome(bytes), "-") << "the pipeline tells";
    request.Subset_Columns = false;
    request.Subset_Row_Flags = {0, 0};
    EXPECT_EQ(Outcome(bytes), "-");
    request.Subset_Row_Flags = {1, 0, 1};
    EXPECT_EQ(Outcome(Written(Full_Matrix(3))), "u Up|r; m S1|3; c S4");
}

TEST_F(Book_Reader, Reads_One_Sheet_Of_Many_And_No_More)
{
    const Book_Bytes& b = Little;
    constexpr int rows = 2000;
    std::vector<std::string> sheets;
    for (int i = 0; i < 500; ++i)
        sheets.push_back(b.Sheet("page " + std::to_string(i), 1, 1, rows, b.Variate(rows, "x")));
    Put("many.tbk", b.Book(sheets));
    const auto bytes_read = [&] {
        const std::string counts = [] {
            std::ifstream file("/proc/self/io");
            return std::string(std::istreambuf_iterator<char>(file), {});
        }();
        return std::stol(counts.substr(counts.find("rchar: ") + 7));
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

// --- Hostile books -----------------------------------------------------------------------------------

TEST_F(Book_Reader, Refuses_Every_Record_Of_A_Wrong_Length)
{
    const std::string loose = " 13 17 65 ";  // not read
    for (Sheet* const sheet : {Full_Vector(), Full_Table(3)}) {
        sheet->source_file = "in.csv";
        const std::string bytes = Written(sheet);
        for (const Found_Record& record : Records_Of(bytes)) {
            const auto length = static_cast<std::int32_t>(record.end - record.at - 6);
            if (loose.find(Format_Text(" %i ", record.type)) != std::string::npos)
                continue;
            std::string longer = bytes;
            longer.insert(record.end, "\1");
            Put_Number<std::int32_t>(longer.data() + record.at + 2, length + 1);
            const bool may_have_one_more = record.type == 23 || record.type == 36 /* a soft fault */
                                           || (record.type == 96 && sheet->type == table_sheet);
            EXPECT_EQ(Read(longer) != nullptr, may_have_one_more) << record.type;
            if (length == 0)
                continue;
            std::string shorter = bytes;
            shorter.erase(record.end - 1, 1);
            Put_Number<std::int32_t>(shorter.data() + record.at + 2, length - 1);
            const bool may_lack_one = record.type == 36 || record.type == 21;
            EXPECT_EQ(Read(shorter) != nullptr, may_lack_one) << record.type;
        }
    }
}

TEST_F(Book_Reader, Refuses_Records_Out_Of_Their_Place)
{
    const Book_Bytes& b = Little;
    const std::string sheet = b.Sheet("S", 1, 1, 1, b.Variate(1, "x"));
    const std::string cells = b.Record(81, b.Word(1) + b.Reals({1}));
    const std::string start = b.Record(1, b.Words({1, 0}));
    const std::string bodies[] = {
        b.Record(2),
        b.Record(3),
        sheet,
        start + start,
        start + b.Record(17),
        start + b.Record(65),
        start + cells,
        start + b.Record(25, b.Words({1, 1})),
        start + b.Record(129),
        start + b.Record(128) + b.Record(128),
        start + b.Record(8, std::string(20, '\0')),
        b.Vector(1, 1, b.Record(64, b.Byte(4) + b.Word(1) + b.Short("x") + std::string(7, '\1'))).substr(12),
        b.Vector(1, 1, b.Column(4, 1, "x", cells + cells)).substr(12),
        b.Vector(1, 1, b.Column(4, 1, "x", b.Record(99, b.Word(1)))).substr(12),
        b.Vector(1, 1, b.Column(3, 1, "x", b.Record(66, "\1"))).substr(12),
        b.Vector(1, 1, b.Column(3, 1, "x", b.Record(112, b.Byte(1) + b.Long("a")))).substr(12),
        b.Vector(1, 1, b.Record(22, "\1a") + b.Variate(1, "x")).substr(12),
        b.Vector(1, 1, sheet).substr(12),
        b.Vector(1, 1, b.Record(2)).substr(12),
        b.Vector(1, 1, b.Record(37, "\3")).substr(12),
        b.Vector(1, 1, b.Record(26, "\10\1a")).substr(12),
        b.Vector(1, 1, b.Record(19, "\1a\3")).substr(12),
        b.Vector(1, 1, b.Column(4, 1, "x", b.Record(66, "\23"))).substr(12),
        b.Vector(1, 1, b.Column(4, 1, "x", b.Record(121, "\3"))).substr(12),
        b.Vector(1, 1, b.Column(4, 1, "x", b.Record(112, "\3" + b.Long("a")))).substr(12),
        b.Vector(1, 1, b.Column(2, 1, "f", b.Record(96, b.Words({1, 1}) + "\3\1"))).substr(12),
    };
    for (const std::string& body : bodies)
        EXPECT_TRUE(Outcome(b.Head() + body).starts_with("-Corrupt record found"))
            << Records_Of(b.Head() + body).size();
}

TEST_F(Book_Reader, Survives_Books_That_End_Anywhere_Or_Lie)
{
    Sheet* const both[] = {Plain_Sheet("A"), Full_Table(3)};
    std::string bytes = Written(both);
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
                static_cast<void>(Read(other));  // which checks what it makes
            }
}

TEST_F(Book_Reader, Reads_The_Other_Byte_Order)
{
    const auto book = [](const Book_Bytes& b) {
        const std::string wide(300, 'w');
        return b.Vector(
            4, 3,
            b.Variate(3, "x")
                + b.Column(33, 3, "l",
                           b.Record(83, b.Words({3, 300}) + b.Long("a") + b.Long(wide) + b.Long("")))
                + b.Column(2, 3, "f",
                           b.Record(96, b.Words({3, 300}) + std::string("\0", 1)
                                            + b.Number(std::uint16_t{300}) + b.Number(std::uint16_t{0})
                                            + b.Number(std::uint16_t{301})))
                + b.Column(
                    2, 3, "g",
                    b.Record(96, b.Words({3, 70000}) + std::string("\0", 1) + b.Words({70000, 1, -1}))));
    };
    const std::string expected = "x V1|2|3; l La|300 characters|; f F300|*|*; g F70000|1|*";
    for (const std::endian order : {std::endian::little, std::endian::big}) {
        const std::string bytes = book(Book_Bytes{order});
        EXPECT_EQ(Walk_Book(bytes).faults, "");
        EXPECT_EQ(Outcome(bytes), expected);
    }
}

}  // namespace
}  // namespace ingester

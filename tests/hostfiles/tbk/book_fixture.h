// Reads, writes and changes books, each in a request of its own; and books that hold all that one can.
#pragma once

#include "hostfiles/tbk/book_bytes.h"
#include "hostfiles/tbk/book_parser.h"
#include "hostfiles/tbk/tbk.h"
#include "support/cell_lists.h"
#include "support/check_sheet.h"

#include <span>

namespace ingester {

using namespace std::string_literals;

inline Sheet* Plain_Sheet(const std::string& name, const Texts& cells = {"1", "2", "*"})
{
    Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(cells.size()));
    sheet->sheet_name = name;
    Add_Cells(sheet, variate_column, "x", cells);
    return sheet;
}

/// A book of one sheet to the byte, as it is written, and what is read of it.
struct Whole_Book {
    std::string bytes, cells;
};

/// A Vector Sheet with all records that there are; three of them are left out of sheets that come later.
inline Whole_Book Full_Vector(const Book_Bytes& b, bool in_new_book = true)
{
    constexpr double m = -1e307;
    const std::string date = b.Record(117, b.Reals({154000.5}));
    const std::string late =
        b.Record(120, b.Words({3, 1, 2, 3, 2, 8, 9, 3, 0, 0xFFFFFF})) + b.Record(121, "\2");
    const std::string units = b.Word(9) + "\2\2r1\2r2\2r3\2r4\2r5\2r6\2r7\2r8\2r9";
    const std::string texts = "\132\1a\0\1c\132"s + std::string(90, 'x') + "\1e\1f\1g\1h\1i";
    const std::string long_texts =
        b.Long("a") + b.Long(std::string(10000, 'y')) + b.Words({0, 0, 0, 0, 0, 0}) + b.Long("z");
    const Texts columns = {
        b.Column(-3, 9, "u", b.Record(82, units) + date),
        b.Column(4, 9, "v",
                 b.Record(113, b.Short("what")) + b.Record(112, "\2" + b.Long("v=a+b"))
                     + b.Record(122, b.Word(3)) + b.Record(123, b.Words({0x010203, 4})) + b.Record(66, "\3")
                     + b.Numbers({1, -2.5, m, 1e300, 4, 5, 6, 7, 8})
                     + b.Record(116, "\1" + b.Number(1.5) + b.Word(255) + "\6" + b.Number(2.0) + b.Word(256)
                                         + "\10" + b.Number(-3.0) + b.Word(257))
                     + b.Record(114, b.Reals({0, m})) + b.Record(115, "\2\1" + b.Reals({0.5, 9.5, 0.25}))
                     + date + (in_new_book ? late : ""),
                 "\1\14\2\11\1\3\1"),
        b.Column(2, 9, "f",
                 b.Record(118, "\7") + b.Record(122, b.Word(3))
                     + b.Record(96, b.Words({9, 3}) + "\2\x39\xE5\1")
                     + b.Record(97, b.Word(3) + "\1" + b.Reals({1.5, 2.5, 9}))
                     + b.Record(98, b.Word(3) + "\6\3low\6middle\4high") + b.Record(99, b.Word(2))
                     + b.Record(100) + b.Record(101, b.Words({1, 2, 3})) + date),
        b.Column(3, 9, "t", b.Record(82, b.Word(9) + texts) + date),
        b.Column(33, 9, "l", b.Record(83, b.Words({9, 10000}) + long_texts) + date)};
    const std::string behind =
        b.Record(23, b.Word(1) + b.Long("setup\0"s) + "\6-dummy" + b.Word(2) + b.Long("one\0two\0"s))
        + b.Record(24, b.Word(2) + b.Long("first\0second\0"s)) + b.Record(35) + b.Record(39)
        + b.Record(25, b.Words({2, 4})) + b.Record(26, "\0\4list"s + b.Word(2) + "\1a\1b")
        + b.Record(26, "\4\3all") + b.Record(33, b.Word(3)) + b.Record(34, "\4kept" + b.Word(9) + "\5\1")
        + b.Record(34, "\0"s + b.Word(9) + "\2\0"s) + (in_new_book ? b.Record(37, "\1") : "");
    const std::string in_front = b.Record(29, b.Reals({153999.25})) + b.Record(36, "\0\1\0\0\0"s);
    return {b.Book({b.Sheet_With_Table(36, "Full", 1, 9, columns, in_front, behind, "\1\0\0\1"s)}),
            "u Ur1|r2|r3|r4|r5|r6|r7|r8|r9; v V1|-2.5|*|1e+300|4|5|6|7|8; f F1|2|3|*|1|1|2|3|1; "
            "t Ta||c|90 characters|e|f|g|h|i; l La|10000 characters|||||||z"};
}

/// A two-way Table with margins whose columns are labelled in this way.
inline Whole_Book Full_Table(const Book_Bytes& b, int label_state)
{
    const std::string date = b.Record(117, b.Reals({0}));
    const auto column = [&](const char* name, double level) {
        return b.Column(8, 3, name,
                        (label_state % 2 == 1 ? b.Record(119, b.Number(level)) : "")
                            + b.Numbers({1, 2, -1e307}) + date);
    };
    return {b.Book({b.Sheet_With_Table(
                36, "Table", 5, 3,
                {b.Column(2, 3, "down", b.Record(96, b.Words({3, 3}) + "\0\x31\4"s) + date), column("10", 7),
                 column("20.5", 1.5), b.Column(22, 3, "Margin", b.Numbers({1, 2, 3}) + date)},
                b.Record(29, b.Reals({0})) + b.Record(20, "\2\1\1") + b.Record(21, "\5\111\6across\0"s)
                    + b.Record(22, "\3All") + b.Record(19, "\3tab" + b.Byte(label_state)),
                b.Record(25, b.Words({1, 1})))}),
            "down F1|3|4; 10 T1|2|*; 20.5 T1|2|*; Margin T1|2|3"};
}

/// A matrix of one of the three shapes, or Scalars.
inline Whole_Book Full_Matrix(const Book_Bytes& b, int type)
{
    const std::string date = b.Record(117, b.Reals({0}));
    const auto units = [&] { return b.Column(-3, 3, "u", b.Record(82, b.Word(3) + "\1\1p\1q\1r") + date); };
    const auto column = [&](int column_type, const char* name, const std::vector<double>& cells) {
        return b.Column(column_type, static_cast<int>(cells.size()), name, b.Numbers(cells) + date);
    };
    const auto book = [&](const char* name, int rows, const Texts& columns, const std::string& own = {}) {
        return b.Book({b.Sheet_With_Table(36, name, type, rows, columns, b.Record(29, b.Reals({0})) + own,
                                          b.Record(25, b.Words({1, 1})))});
    };
    if (type == 2)
        return {book("Matrix", 3, {units(), column(5, "a", {1, 2, 3}), column(5, "b", {4, 5, 6})},
                     b.Record(19, "\1m\2")),
                "u Up|q|r; a M1|2|3; b M4|5|6"};
    if (type == 3)
        return {book("Matrix", 3,
                     {units(), column(7, "a", {1, 2, 3}), column(7, "b", {4, 5}), column(7, "c", {6})},
                     b.Record(19, "\1m\2")),
                "u Up|q|r; a S1|2|3; b S4|5; c S6"};
    if (type == 4)
        return {book("Diagonal", 3, {units(), column(6, "m", {1, 2, 3})}), "u Up|q|r; m D1|2|3"};
    return {book("Sheet1", 1, {column(1, "pi", {3.14159265358979})}), "pi S3.14159265358979"};
}

/// One of each kind.
inline std::vector<Whole_Book> Whole_Books(const Book_Bytes& b = {})
{
    return {Full_Vector(b),    Full_Table(b, 0),  Full_Table(b, 1),  Full_Table(b, 3),
            Full_Matrix(b, 2), Full_Matrix(b, 3), Full_Matrix(b, 4), Full_Matrix(b, 6)};
}

class Book_Test : public Request_Test {
protected:
    /// The book of these bytes, read; null when that fails.
    static Sheet* Read(const std::string& bytes)
    {
        Input_File file(std::as_bytes(std::span(bytes)), "b.tbk");
        const bool good = Read_TBK(file);
        EXPECT_EQ(good, Current_Sheet != nullptr);
        EXPECT_EQ(Current_Sheet == nullptr ? "" : Check_Sheet(*Current_Sheet), "");
        return Current_Sheet;
    }
    /// What was read of a book, without the column of rows; or "-" and what was told.
    [[nodiscard]] std::string Outcome(const std::string& bytes) const
    {
        const Sheet* const sheet = Read(bytes);
        return (sheet == nullptr ? "-" : Render(sheet)) + Messages();
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

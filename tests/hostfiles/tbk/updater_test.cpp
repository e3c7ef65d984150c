#include "hostfiles/tbk/book_sheets.h"
#include "interface/book_updates.h"
#include "platform/gzip_file.h"
#include "support/refusing.h"

#include <sys/wait.h>
#include <unistd.h>

namespace ingester {
namespace {

const Book_Bytes Little;
const Book_Bytes Big{std::endian::big};

class Book_Updater : public Book_Test {
protected:
    [[nodiscard]] std::string Rendered(const std::string& name, const std::string& page) const
    {
        request.Worksheet_Name = page;
        return Read_TBK_File(Request_Name(name).c_str()) ? Render(Current_Sheet) : "-" + Messages();
    }
    [[nodiscard]] std::string Scratch() const { return "$IG" + std::to_string(::getpid()) + "$.$X$"; }
};

TEST_F(Book_Updater, Finds_Free_Names)
{
    const struct {
        Texts names;
        const char* wanted;
        const char* found;
    } cases[] = {
        {{}, "Any", "Any"},
        {{"Sheet1", "Sheet2"}, "Sheet1", "Sheet3"},
        {{"Sheet1"}, "sheet1", "sheet1_1"},
        {{"Data"}, "data", "data_1"},
        {{"Data", "DATA_1"}, "Data", "Data_2"},
        {{"Sheet"}, "Sheet", "Sheet_1"},
        {{"Sheet0"}, "Sheet0", "Sheet0_1"},
        {{"Sheet9x"}, "Sheet9x", "Sheet1"},
        {{std::string(32, 'n')}, "nnnnnnnnnnnnnnnnnnnnnnnnnnnnnnnn", "nnnnnnnnnnnnnnnnnnnnnnnnnnnnn_1"},
    };
    for (auto [names, wanted, found] : cases) {
        EXPECT_EQ(Add_Unique_Page_Name(names, wanted), found);
        EXPECT_EQ(names.back(), found);
    }
    Texts names;
    for (int i = 0; i < 101; ++i)
        static_cast<void>(Add_Unique_Page_Name(names, std::string(32, 'n')));
    EXPECT_EQ(names[10], std::string(28, 'n') + "_10");
    EXPECT_EQ(names[100], std::string(27, 'n') + "_100");
}

TEST_F(Book_Updater, Adds_And_Replaces_And_Moves_Every_Offset)
{
    for (const Book_Bytes& b : {Little, Big}) {
        // The tables of columns are there to be moved.
        const std::string column = b.Variate(2, "x");
        const auto sheet = [&](const std::string& name, std::size_t at) {
            const std::string start = b.Sheet(name, 1, 1, 2, "").substr(0, 29);
            return start + b.Record(18, b.Word(static_cast<std::int64_t>(at + start.size() + 10))) + column
                   + b.Record(17);
        };
        const std::size_t size = sheet("A", 0).size();
        const std::string front = b.Record(13, b.Long("a/path"));
        const std::size_t first = 12 + 14 + front.size() + 14;
        const std::string comments = b.Record(128) + b.Record(130, std::string(24, '\0')) + b.Record(129);
        const std::string book =
            b.Book({sheet("A", first), sheet("B", first + size)}, front, comments + b.Record(300, "?"));
        Put("b.tbk", book + "rest");
        ASSERT_TRUE(Add("b.tbk", Full_Vector())) << Messages();
        ASSERT_TRUE(Add("b.tbk", Plain_Sheet("a", {"7"}))) << Messages();
        ASSERT_TRUE(Replace("b.tbk", Plain_Sheet("other", {"1", "2", "3", "4", "5"}), "B")) << Messages();
        std::string bytes = Get("b.tbk");
        const std::size_t unknown = bytes.find(b.Record(300, "?"));
        ASSERT_NE(unknown, std::string::npos) << "records that nobody knows stay";
        EXPECT_EQ(Pages("b.tbk"), (Texts{"A", "B", "Full", "a_1"}));
        EXPECT_EQ(Rendered("b.tbk", "A"), "x V1|2");
        EXPECT_EQ(Rendered("b.tbk", "2"), "x V1|2|3|4|5");
        EXPECT_EQ(Rendered("b.tbk", "a_1"), "x V7");
        request.Worksheet_Name.clear();
        EXPECT_EQ(Rendered("b.tbk", "Full"), Render(Full_Vector()));
        EXPECT_EQ(Messages(), "");
        EXPECT_FALSE(Walk_Book(bytes).faults.empty()) << "the unknown record";
    }
    EXPECT_EQ(Files(), "b.tbk");
}

TEST_F(Book_Updater, Leaves_Sound_Books)
{
    for (const Book_Bytes& b : {Little, Big}) {
        Put("b.tbk", b.Book({}));
        const auto walked = [&] { return Walk_Book(Get("b.tbk")); };
        for (Sheet* const sheet :
             {Full_Vector(), Full_Table(3), Full_Matrix(2), Full_Matrix(3), Full_Scalar()}) {
            ASSERT_TRUE(Add("b.tbk", sheet)) << Messages();
            EXPECT_EQ(walked().faults, "");
        }
        EXPECT_TRUE(walked().types.starts_with(
            "1 3 16 18 29 36 64 82 117 65 64 113 112 122 123 66 81 116 114 115 117 65 "))
            << "what came later is left out";
        EXPECT_EQ(Pages("b.tbk"), (Texts{"Full", "Table", "Matrix", "Matrix_1", "Sheet1"}));
        const std::string last = Rendered("b.tbk", "Sheet1");
        for (const char* const page : {"1", "table", "Matrix", "4"}) {
            ASSERT_TRUE(Replace("b.tbk", Plain_Sheet("any", {"1", "2"}), page)) << Messages();
            EXPECT_EQ(walked().faults, "");
            EXPECT_EQ(Rendered("b.tbk", page), "x V1|2");
            EXPECT_EQ(Rendered("b.tbk", "5"), last);
        }
        EXPECT_EQ(Pages("b.tbk"), (Texts{"Full", "table", "Matrix", "Matrix_1", "Sheet1"}));
        ASSERT_TRUE(Replace("b.tbk", Full_Vector(), "SHEET1"));
        EXPECT_EQ(walked().faults, "");
        EXPECT_EQ(Rendered("b.tbk", "SHEET1"), Render(Full_Vector()));
    }
    EXPECT_EQ(Files(), "b.tbk");
}

TEST_F(Book_Updater, Moves_The_Sections_Behind)
{
    const Book_Bytes& b = Little;
    const std::string sheet = b.Sheet("S", 1, 1, 1, b.Variate(1, "x"));
    const std::string first = b.Head(2) + b.Section({sheet}, 12);
    const auto second = [&](std::size_t at) { return b.Section({sheet, sheet}, at); };
    Put("b.tbk", first + second(first.size()));
    const std::size_t before = Get("b.tbk").size();
    ASSERT_TRUE(Add("b.tbk", Plain_Sheet("new")));
    const std::string bytes = Get("b.tbk");
    const std::size_t shift = bytes.size() - before;
    EXPECT_TRUE(bytes.ends_with(second(first.size() + shift)));
    EXPECT_EQ(Number_At<std::int32_t>(bytes.data() + 22), static_cast<std::int32_t>(first.size() + shift));
}

TEST_F(Book_Updater, Keeps_The_Old_Book_When_Anything_Fails)
{
    Sheet* const large = New_Sheet_With_Rows(150000);
    New_Data_Column(large, variate_column, "x", 150000);
    New_Data_Column(large, variate_column, "y", 150000);
    Sheet* const sheets[] = {Plain_Sheet("a"), large, Plain_Sheet("b")};
    const std::string old = Written(sheets);
    const std::string name = Request_Name("b.tbk");
    const auto update = [&](int road, const Refusal& refusal = {}) {
        const Refusing refusing(refusal);
        return road == 0 ? Add("b.tbk", large) : Replace("b.tbk", large, "a");
    };
    for (const bool kills : {false, true}) {
        for (int road = 0; road < 2; ++road) {
            bool good = false;
            int refused = 0;
            while (!good) {
                Put("b.tbk", old);
                const Refusal refusal{
                    .number = ++refused, .kinds = {Asked::write, Asked::rename}, .kills = kills};
                if (kills) {
                    const ::pid_t child = ::fork();
                    if (child == 0)
                        ::_exit(update(road, refusal) ? 0 : 1);
                    int how = 0;
                    ::waitpid(child, &how, 0);
                    good = WIFEXITED(how);
                } else {
                    good = update(road, refusal);
                }
                EXPECT_EQ(Get("b.tbk") == old, !good) << refused;
            }
            EXPECT_GT(refused, 5);
            EXPECT_EQ(Walk_Book(Get("b.tbk")).faults, "");
        }
    }
    const std::string told = Messages();
    EXPECT_TRUE(told.starts_with("Document not saved.\n"));
    EXPECT_TRUE(Has_Text(told, {"Error: Temporary file " + Request_Name(Scratch()).substr(0, 100)
                                + " could not be renamed to " + name.substr(0, 100)
                                + "\nDocument is saved in Temporary file only.\n"}));
    // Where no copy can be made, nothing is tried.
    std::filesystem::remove(Path(Scratch()));
    std::filesystem::create_directories(Path(Scratch()) + "/in the way");
    Put("b.tbk", old);
    EXPECT_FALSE(update(0));
    EXPECT_EQ(Messages(), "Tabulon Book file " + name.substr(0, 100) + " not saved.\n:\n");
    EXPECT_EQ(Get("b.tbk"), old);
}

TEST_F(Book_Updater, Refuses_What_Is_No_Sound_Book)
{
    const Book_Bytes& b = Little;
    const std::string sheet = b.Sheet("S", 1, 1, 1, b.Variate(1, "x"));
    const std::string good = b.Book({sheet, sheet});
    const std::string name = Request_Name("b.tbk");
    const std::string unlisted = "Unable to get Pagenames from Tabulon Book file " + name + ".\n:\n";
    const std::string unsaved = "Document not saved.\n:\n";
    const std::string corrupt = "Corrupt record found in Tabulon Book:\n" + name + " at Offset ";
    std::string other_offset = good;
    Put_Number<std::int32_t>(other_offset.data() + 32, 33);
    std::string twice = good;
    Put_Number<std::int32_t>(twice.data() + 36, 40);
    std::string negative = good;
    Put_Number<std::int32_t>(negative.data() + 40 + 29 + 2, -1);
    const struct {
        const char* what;
        std::string bytes, told;
    } cases[] = {
        {"no book", "no book", unlisted},
        {"an offset into a record", other_offset, unlisted},
        {"a sheet that no entry points at", twice, ""},
        {"no table", b.Head() + b.Record(1, b.Words({0, 40})) + b.Record(2), unlisted},
        {"a negative length", negative, corrupt + "45\nat Record Number 4, Type 64, Length -1.\n" + unsaved},
        {"a book in the book", b.Book({sheet}, "", b.Record(1, b.Words({0, 0}))),
         corrupt + "73\nat Record Number 8, Type 1, Length 8.\n" + unsaved},
        {"no end", good.substr(0, good.size() - 6),
         "End of File found too soon in " + name
             + "\nTabulon Book file is incomplete\nLast read record at Offset "
             + "C0, Record Number 12, Type 17, Length 0.\n" + unsaved},
    };
    for (const auto& [what, bytes, told] : cases) {
        Put("b.tbk", bytes);
        EXPECT_EQ(Add("b.tbk", Plain_Sheet("n")), told.empty()) << what;
        EXPECT_EQ(Messages(), told) << what;
        EXPECT_EQ(Get("b.tbk") == bytes, !told.empty()) << what;
    }
    Put("b.tbk", good);
    EXPECT_FALSE(Replace("b.tbk", Plain_Sheet("n"), "3"));
    EXPECT_EQ(Messages(), "Sheet 3 not found in Tabulon file " + name + ".\n:\n");
    EXPECT_FALSE(Add("b.tbk", nullptr) || Replace("b.tbk", nullptr, "S"));
    EXPECT_EQ(Get("b.tbk"), good);
    EXPECT_EQ(Files(), "b.tbk t.ERR");
}

TEST_F(Book_Updater, Survives_Books_That_End_Anywhere_Or_Lie)
{
    Sheet* const both[] = {Plain_Sheet("A"), Full_Scalar()};
    const std::string bytes = Written(both);
    Sheet* const added = Plain_Sheet("N");
    for (std::size_t size = 0; size < bytes.size(); ++size) {
        const std::string part = bytes.substr(0, size);
        Put("b.tbk", part);
        EXPECT_FALSE(Add("b.tbk", added) || Replace("b.tbk", added, "2")) << size;
        EXPECT_EQ(Get("b.tbk"), part);
    }
    for (std::size_t at = 12; at < bytes.size(); ++at) {
        std::string other = bytes;
        other[at] = "\0\1\xFF"[at % 3];
        Put("b.tbk", other);
        const std::size_t pages = Pages("b.tbk").size();
        if (Add("b.tbk", added)) {
            EXPECT_EQ(Pages("b.tbk").size(), pages + 1) << at;
            EXPECT_EQ(Pages("b.tbk").back(), "N") << at;
        } else {
            EXPECT_EQ(Get("b.tbk"), other) << at;
        }
    }
}

TEST_F(Book_Updater, Takes_Compressed_Books_And_Nothing_Else)
{
    const std::string name = Request_Name("b.tbk");
    Put("plain", Written(Plain_Sheet("A")));
    ASSERT_TRUE(Compress_File(Request_Name("plain"), name));
    EXPECT_TRUE(Add_Sheet(Plain_Sheet("B", {"5"}), name.c_str())
                && Replace_Sheet(Plain_Sheet("C"), name.c_str(), "a"))
        << Messages();
    EXPECT_TRUE(Get("b.tbk").starts_with("\x1F\x8B\b") && Get("b.tbk")[8] == 2)
        << "packed as closely as can be";
    ASSERT_TRUE(Add_Sheet(Plain_Sheet("D"), Request_Name("plain").c_str()));
    EXPECT_EQ(Pages("plain"), (Texts{"A", "D"}));
    Put("no.tbk", "a,b\n1,2\n");
    const std::string other = Request_Name("no.tbk");
    EXPECT_FALSE(Add_Sheet(Plain_Sheet("N"), other.c_str())
                 || Replace_Sheet(Plain_Sheet("N"), other.c_str(), "N"));
    EXPECT_EQ(Messages(),
              "The file, " + other.substr(0, 80)
                  + ", you chose to add sheets to is not in Tabulon Workbook (TBK) format.\nThe file, "
                  + other.substr(0, 80)
                  + ", you chose to replace sheets in is not in Tabulon Workbook (TBK) format.\n:\n");
    EXPECT_EQ(Files(), "b.tbk no.tbk plain w.tbk");
}

}  // namespace
}  // namespace ingester

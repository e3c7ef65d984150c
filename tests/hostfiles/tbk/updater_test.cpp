#include "hostfiles/tbk/book_fixture.h"
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
    [[nodiscard]] std::string Rendered(const std::string& page) const
    {
        request.Worksheet_Name = page;
        const std::string outcome = Outcome(Get("b.tbk"));
        request.Worksheet_Name.clear();
        return outcome;
    }
};

TEST_F(Book_Updater, Finds_Free_Names)
{
    const std::string longest(32, 'n');
    const struct {
        Texts names;
        std::string wanted, found;
    } cases[] = {
        {{}, "Any", "Any"},
        {{"Sheet1", "Sheet2"}, "Sheet1", "Sheet3"},
        {{"Sheet1"}, "sheet1", "sheet1_1"},
        {{"Data", "DATA_1"}, "data", "data_2"},
        {{"Sheet"}, "Sheet", "Sheet_1"},
        {{"Sheet0"}, "Sheet0", "Sheet0_1"},
        {{"Sheet9x"}, "Sheet9x", "Sheet1"},
    };
    for (auto [names, wanted, found] : cases) {
        EXPECT_EQ(Add_Unique_Page_Name(names, wanted), found);
        EXPECT_EQ(names.back(), found);
    }
    Texts names;
    for (int i = 0; i < 101; ++i)
        Add_Unique_Page_Name(names, longest);
    EXPECT_EQ(names[9], longest.substr(3) + "_9");
    EXPECT_EQ(names[10], longest.substr(4) + "_10");
    EXPECT_EQ(names[100], longest.substr(5) + "_100");
}

TEST_F(Book_Updater, Adds_Sheets_To_The_Byte_In_Either_Order)
{
    for (const Book_Bytes& b : {Little, Big})
        for (const Whole_Book& whole : Whole_Books(b)) {
            Put("b.tbk", b.Book({}));
            EXPECT_EQ(Outcome(whole.bytes), whole.cells);
            ASSERT_TRUE(Add("b.tbk", Current_Sheet)) << Messages();
            const bool full = whole.bytes == Full_Vector(b).bytes;  // what came later is left out
            EXPECT_TRUE(Get("b.tbk") == (full ? Full_Vector(b, false) : whole).bytes) << whole.cells;
        }
}

TEST_F(Book_Updater, Adds_And_Replaces_And_Moves_Every_Offset)
{
    for (const Book_Bytes& b : {Little, Big}) {
        const std::string front = b.Record(13, b.Long("a/path"));
        const auto sheet = [&](const std::string& name, std::size_t at) {
            return b.Sheet_With_Table(12 + 14 + front.size() + 14 + at, name, 1, 2, {b.Variate(2, "x")}, "",
                                      "");
        };
        const std::string unknown =
            b.Record(128) + b.Record(130, std::string(24, '\0')) + b.Record(129) + b.Record(300, "?");
        Put("b.tbk", b.Book({sheet("A", 0), sheet("B", sheet("A", 0).size())}, front, unknown) + "rest");
        Sheet* const full = Read(Full_Vector(b).bytes);
        ASSERT_TRUE(Add("b.tbk", full)) << Messages();
        ASSERT_TRUE(Add("b.tbk", Plain_Sheet("a", {"7"}))) << Messages();
        EXPECT_NE(Get("b.tbk").find(unknown), std::string::npos) << "records that nobody knows stay";
        EXPECT_EQ(Rendered("A"), "x V1|2");
        const std::string last = Rendered("a_1");
        for (const char* const page : {"B", "2", "full", "A"}) {
            ASSERT_TRUE(Replace("b.tbk", Plain_Sheet("other", {"1", "2", "3", "4", "5"}), page))
                << Messages();
            EXPECT_EQ(Rendered(page), "x V1|2|3|4|5");
            EXPECT_EQ(Rendered("4"), last);
            EXPECT_EQ(Faults_Of_Book(Get("b.tbk")), "");
        }
        ASSERT_TRUE(Replace("b.tbk", full, "A_1"));
        EXPECT_EQ(Rendered("4"), Full_Vector(b).cells);
        EXPECT_EQ(Pages("b.tbk"), (Texts{"A", "B", "full", "A_1"}));
    }
    const Book_Bytes& b = Little;
    const std::string sheet = b.Sheet("S", 1, 1, 1, b.Variate(1, "x"));
    const std::string first = b.Head(2) + b.Section({sheet}, 12);
    Put("b.tbk", first + b.Section({sheet, sheet}, first.size()));
    ASSERT_TRUE(Add("b.tbk", Plain_Sheet("new")));
    const auto end = Number_At<std::uint32_t>(Get("b.tbk").data() + 22);
    EXPECT_EQ(Get("b.tbk").substr(end), b.Section({sheet, sheet}, end)) << "a section behind";
    EXPECT_EQ(Files(), "b.tbk");
}

TEST_F(Book_Updater, Keeps_The_Old_Book_When_Anything_Fails)
{
    Sheet* const large = New_Sheet_With_Rows(150000);
    New_Data_Column(large, variate_column, "x", 150000);
    New_Data_Column(large, variate_column, "y", 150000);
    Sheet* const sheets[] = {Plain_Sheet("a"), large, Plain_Sheet("b")};
    const std::string old = Written(sheets);
    const std::string name = Request_Name("b.tbk");
    const std::string scratch = "$IG" + std::to_string(::getpid()) + "$.$X$";
    const auto update = [&](bool adds, const Refusal& refusal = {}) {
        const Refusing refusing(refusal);
        return adds ? Add("b.tbk", large) : Replace("b.tbk", large, "a");
    };
    for (const auto& [kills, adds] : {std::pair(false, false), {false, true}, {true, false}, {true, true}}) {
        bool good = false;
        int refused = 0;
        while (!good) {
            Put("b.tbk", old);
            const Refusal refusal{
                .number = ++refused, .kinds = {Asked::write, Asked::rename}, .kills = kills};
            if (kills) {
                const ::pid_t child = ::fork();
                if (child == 0)
                    ::_exit(update(adds, refusal) ? 0 : 1);
                int how = 0;
                ::waitpid(child, &how, 0);
                good = WIFEXITED(how);
            } else {
                good = update(adds, refusal);
            }
            EXPECT_EQ(Get("b.tbk") == old, !good) << refused;
        }
        EXPECT_GT(refused, 5);
        EXPECT_EQ(Faults_Of_Book(Get("b.tbk")), "");
    }
    const std::string told = Messages();
    EXPECT_TRUE(told.starts_with("Document not saved.\n"));
    EXPECT_NE(told.find("Error: Temporary file " + Request_Name(scratch).substr(0, 100)
                        + " could not be renamed to " + name.substr(0, 100)
                        + "\nDocument is saved in Temporary file only.\n"),
              std::string::npos);
    // Where no copy can be made, nothing is tried.
    std::filesystem::remove(Path(scratch));
    std::filesystem::create_directories(Path(scratch) + "/in the way");
    Put("b.tbk", old);
    EXPECT_FALSE(update(true));
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
    const std::string corrupt = "Corrupt record found in Tabulon Book:\n" + name + " at Offset ";
    const std::string unsaved = "Document not saved.\n:\n";
    const auto with = [](std::string bytes, std::size_t at, std::int32_t word) {
        Put_Number<std::int32_t>(bytes.data() + at, word);
        return bytes;
    };
    const std::string hidden = b.Book({sheet, b.Record(300, sheet)});
    const std::pair<std::string, std::string> cases[] = {
        {"no book", unlisted},
        {with(good, 32, 33), unlisted},                      // an offset into a record
        {with(good, 36, 40), ""},                            // a sheet that no entry points at
        {good.substr(0, 40 + sheet.size() + 28), unlisted},  // in front of a name
        {b.Head() + b.Record(1, b.Words({0, 40})) + b.Record(2), unlisted},
        {with(good, 40 + 29 + 2, -1), corrupt + "45\nat Record Number 4, Type 64, Length -1.\n" + unsaved},
        {b.Book({sheet}, "", b.Record(1, b.Words({0, 0}))),
         corrupt + "73\nat Record Number 8, Type 1, Length 8.\n" + unsaved},
        // An entry that points at what is in no place of a sheet.
        {with(hidden, 36, Number_At<std::int32_t>(hidden.data() + 36) + 6),
         corrupt + "CC\nat Record Number 9, Type 2, Length 0.\n" + unsaved},
        {good.substr(0, good.size() - 6),
         "End of File found too soon in " + name
             + "\nTabulon Book file is incomplete\nLast read record at Offset "
             + "C0, Record Number 12, Type 17, Length 0.\n" + unsaved},
    };
    for (const auto& [bytes, told] : cases) {
        Put("b.tbk", bytes);
        EXPECT_EQ(Add("b.tbk", Plain_Sheet("n")), told.empty());
        EXPECT_EQ(Messages(), told) << bytes.size();
        EXPECT_EQ(Get("b.tbk") == bytes, !told.empty());
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
    Sheet* const both[] = {Plain_Sheet("A"), Plain_Sheet("B")};
    const std::string bytes = Written(both);
    Sheet* const added = Plain_Sheet("N");
    for (std::size_t size = 0; size < bytes.size(); ++size) {
        Put("b.tbk", bytes.substr(0, size));
        EXPECT_FALSE(Add("b.tbk", added) || Replace("b.tbk", added, "2")) << size;
        EXPECT_EQ(Get("b.tbk"), bytes.substr(0, size));
    }
    for (std::size_t at = 12; at < bytes.size(); ++at) {
        std::string other = bytes;
        other[at] = "\0\1\xFF"[at % 3];
        Put("b.tbk", other);
        Texts pages = Pages("b.tbk");
        if (Add("b.tbk", added)) {
            pages.emplace_back("N");
            EXPECT_EQ(Pages("b.tbk"), pages) << at;
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
    std::string damaged = Get("b.tbk");
    damaged[damaged.size() - 6] ^= 1;  // in the check value
    Put("b.tbk", damaged);
    EXPECT_FALSE(Add_Sheet(Plain_Sheet("N"), name.c_str()));
    EXPECT_EQ(Get("b.tbk"), damaged);
    Put("no.tbk", "a,b\n1,2\n");
    const std::string other = Request_Name("no.tbk");
    EXPECT_FALSE(Add_Sheet(Plain_Sheet("N"), other.c_str())
                 || Replace_Sheet(Plain_Sheet("N"), other.c_str(), "N"));
    const std::string shown = other.substr(0, 80) + ", you chose to ";
    EXPECT_EQ(Messages(), "Compressed file is damaged or not complete.\nThe file, " + shown
                              + "add sheets to is not in Tabulon Workbook (TBK) format.\n" + "The file, "
                              + shown + "replace sheets in is not in Tabulon Workbook (TBK) format.\n:\n");
    EXPECT_EQ(Files(), "b.tbk no.tbk plain w.tbk");
}

}  // namespace
}  // namespace ingester

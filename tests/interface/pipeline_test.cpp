// Whole requests through the export: what is written, what is refused, what stays untouched.
#include "host_fixture.h"

#include <map>

#include <unistd.h>

namespace ingester {
namespace {

const std::string Crops = "plot,kind,yield\n1,oats,2.5\n2,rye,*\n";
const std::string Crops_Tab = "plot\tkind\tyield\r\n1\toats\t2.5\r\n2\trye\t*\r\n";

/// `part` so many times.
std::string Repeated(std::string_view part, std::size_t count)
{
    std::string text;
    while (count-- > 0)
        text += part;
    return text;
}

using Pipeline_Test = Host_Test;

TEST_F(Pipeline_Test, Converts)
{
    const std::string sparse = "a,b\n1,\n,\n3,\n";
    const std::string nul("a,b\n1,x\0y\n", 10);
    const std::string nul_words = "Warning: 1 NUL characters in the text were read as blanks.\n:\n";
    const std::string empty_words = "Warning: All rows in the input file are empty.\n"
                                    "Use KEEPEMTPY=rows to return the empty rows.\n:\n";
    const std::string few_words = "Note: Data contains fewer columns than the specified last column 9.\n:\n";
    const struct {
        std::string input, in, out, written, text, said = {};
        int status = 0;
    } cases[] = {
        {Crops, "c.csv", "o.tab", "o.tab", Crops_Tab},
        {Crops, "c.csv", "O.CSV/n", "O.CSV", "    1,\"oats\" ,   2.5\r\n    2,\"rye\"  ,     *\r\n"},
        {Crops, "c.csv", "o.xyz/z/n", "o.xyz", "    1 oats   2.5\r\n    2 rye      *\r\n"},
        {Crops, "c.csv/w/v/tr/c=2:3/db", "o.tab/a/e", "o.tab", "Worksheets\r\nSheet1\r\n"},
        {Crops, "c.csv/tr", "o.tab", "o.tab", "kind\toats\trye\r\nplot\t1\t2\r\nyield\t2.5\t*\r\n"},
        {Crops, "c.csv/tr=N", "o.tab", "o.tab",
         "C1\tC2\tC3\r\nplot\t1\t2\r\nkind\toats\trye\r\nyield\t2.5\t*\r\n"},
        {Crops, "c.csv/c=2:2", "o.tab", "o.tab", "kind\r\noats\r\nrye\r\n"},
        {Crops, "c.csv/c=3:9", "o.tab/e", "o.tab", "yield\r\n2.5\r\n*\r\n", few_words},
        {"a,b\n1.25,2\n3,1e9\n", "c.csv", "o.tab/f/d", "o.tab", "a\tb\r\n1.25\t2\r\n3.00\t1000000000\r\n"},
        {sparse, "c.csv", "o.tab", "o.tab", "a\r\n1\r\n3\r\n"},
        {sparse, "c.csv/k", "o.tab/e", "o.tab", "a\tb\r\n1\t*\r\n*\t*\r\n3\t*\r\n"},
        {"a,b\n,\n,\n", "c.csv/k", "o.tab", "o.tab", "a\tb\r\n*\t*\r\n", empty_words},
        {nul, "c.csv", "o.tab", "o.tab", "a\tb\r\n1\tx y\r\n", nul_words},
        {"a,b,c\n1\n2,3\n", "c.csv", "o.txt/rewrite=3", "o.txt", "a,b,c\n1,2,3\n", "", 7},
        {"a\n", "c.csv", "o.txt/rewrite=", "o.txt", "", "", 7},
    };
    for (const auto& one : cases) {
        Put("c.csv", one.input);
        EXPECT_EQ(Convert(one.in, one.out), (Host_Answer{one.status, one.said}));
        EXPECT_EQ(Get(one.written), one.text) << one.out;
        std::filesystem::remove(Path(one.written));
        EXPECT_EQ(Files(), "c.csv");
    }
}

TEST_F(Pipeline_Test, Refuses_With_Words_And_A_Status_And_Changes_Nothing)
{
    const std::map<std::string, std::string> files = {
        {"c.csv", Crops},
        {"o.tab", "old"},
        {"o.$$$", Crops},
        {"empty.csv", ""},
        {"void.csv", "a,b\n,\n,\n"},
        {"names.csv", "a,b\n"},
        {"binary.csv", "a,b\n1,\x01\n"},
        {"zip.zip", "PK\3\4"},
        {"c.loc", Crops},
        {"c.mrg", "2\n"},
        {"tall.csv", "a\n" + Repeated("1\n", 50001)},
    };
    for (const auto& [name, bytes] : files)
        Put(name, bytes);
    std::filesystem::create_directory(Path("folder.csv"));
    std::filesystem::create_hard_link(Path("c.csv"), Path("hard.tab"));
    std::filesystem::create_symlink(Path("c.csv"), Path("soft.tab"));
    std::filesystem::create_symlink("/dev/full", Path("full.tab"));
    const std::string f = Request_Name("");
    const std::string unopened = "Input file could not be opened.\nTrial files not supported.\n";
    const std::string same = "Input and output files are the same.\n";
    const std::string missing = " is not available in this version.\n";
    const std::string unwritten = "Output file not written.\n";
    const std::string removed = "Could not remove columns.\n";
    const std::tuple<std::string, std::string, int, std::string> cases[] = {
        {"none.csv", "o.tab", 2, unopened},
        {"folder.csv", "o.tab", 2, unopened},
        {"empty.csv", "o.tab", 2, "Input file is empty.\nTrial files not supported.\n"},
        {"binary.csv", "o.tab", 3, "Files type unknown.\n"},
        {"void.csv", "o.tab", 4, "All columns in the input file are empty.\n"},
        {"names.csv", "o.tab", 5, "No data could be imported.\n"},
        {"c.csv", "C.CSV", 6, same},
        {"c.csv", "folder.csv\\..\\c.csv/n", 6, same},
        {"c.csv", "hard.tab", 6, same},
        {"c.csv", "soft.tab", 6, same},
        {"c.csv", "c.csv/rewrite=2", 6, same},
        {"o.$$$", "o.tab", 6, same},
        {"c.csv", "no\\o.tab", 6, "Output directory " + f + "no\\ does not exist.\n"},
        {"c.csv", "folder.csv", 6, unwritten},
        {"c.csv", "full.tab", 6, unwritten},
        {"c.csv", "full.tab/rewrite=4", 7, unwritten},
        {"c.csv", "o.xlsx", 6, "Writing Excel 2007 workbook" + missing},
        {"c.csv", "o.tab/r", 5, "SHEETNAME must be provided with METHOD=replace.\n"},
        {"zip.zip", "o.tab", 11, "Zip files unsupported.\n"},
        {"c.csv/map", "o.tab", 16, "Incorrect options for QTL file.\n"},
        {"c.loc", "o.tab", 16, "Incorrect options for QTL file.\n"},
        {"c.loc/rqtl", "o.tab", 5, "Reading genotype files" + missing},
        {"c.csv/map=ftp:x", "o.tab", 19, "Could not download map file URL:\nftp:x\n"},
        {"c.csv", "o.tab/%=2", 17, "Merge columns not found in files.\n"},
        {"c.csv/c=3:2", "o.tab", 5, "Error: First column to be kept must be <= Last column.\n" + removed},
        {"c.csv/c=4", "o.tab", 5,
         "Error: Data contains fewer columns than first column to be kept.\n" + removed},
        {"tall.csv/tr", "o.tab", 5,
         "Cannot transpose a spreadsheet with more than 50000 rows\nThis sheet has 50001 rows.\n"
         "Unable to transpose input file.\n"},
        {"c.csv", "o.tab/a=k", 5, "Adding to an existing output" + missing},
    };
    const std::tuple<Texts, int, std::string> elsewhere[] = {
        {{"", "o.tab"}, 3, "Input file name is NULL or empty.\nFiles type unknown.\n"},
        {{"https:\\\\h\\c.csv", ""}, 19, "Could not download input URL:\nhttps:\\\\h\\c.csv\n"},
        {{"Clipboard.csv", "o.tab"}, 9, "Read Error: Cannot open clipboard for read.\n"},
        {{f + "c.csv", "clipboard.tab"},
         9,
         "Copy Error: Cannot open clipboard for write.\nCould not put data on the clipboard.\n"},
        {{f + "c.csv", "clipboard.xls"}, 6, "Clipboard format not supported.\n"},
    };
    const std::string before = Files();
    ::unsetenv("WAYLAND_DISPLAY");
    const auto expect = [&](const Texts& records, int status, const std::string& said) {
        EXPECT_EQ(Call(records), (Host_Answer{status, said + ":\n"})) << testing::PrintToString(records);
        EXPECT_EQ(Files(), before) << testing::PrintToString(records);
        for (const auto& [name, bytes] : files)
            EXPECT_EQ(Get(name), bytes);
    };
    for (const auto& [input, output, status, said] : cases)
        expect({f + input, f + output}, status, said);
    for (const char* const display : {"", ":9999"}) {
        ::setenv("DISPLAY", display, 1);
        for (const auto& [records, status, said] : elsewhere)
            expect(records, status, said);
    }
    ::unsetenv("DISPLAY");
}

TEST_F(Pipeline_Test, An_Old_Output_Is_Replaced_Whole)
{
    Put("c.csv", Crops);
    Put("victim", "untouched");
    for (const char* const options : {"", "/av"}) {
        Put("o.tab", "old");
        std::filesystem::create_symlink("victim", Path("o.$$$"));
        EXPECT_EQ(Convert("c.csv", std::string("o.tab") + options).first, 0);
        EXPECT_FALSE(std::filesystem::is_symlink(Path("o.tab")));
        EXPECT_EQ(Get("victim") + Get("o.tab"), "untouched" + Crops_Tab);
        std::filesystem::remove(Path("o.$$$"));
        EXPECT_EQ(Files(), "c.csv o.tab victim");
    }
}

TEST_F(Pipeline_Test, Pipes_Are_Written_And_Read_To_Their_Ends)
{
    Put("c.csv", Crops);
    int ends[2];
    ASSERT_EQ(::pipe(ends), 0);
    const auto name = [](int end) { return Request_Path("/dev/fd/" + std::to_string(end)); };
    EXPECT_EQ(Call({Request_Name("c.csv"), name(ends[1])}), (Host_Answer{0, ""}));
    ::close(ends[1]);
    EXPECT_EQ(Call({name(ends[0]), Request_Name("o.tab")}), (Host_Answer{0, ""}));
    ::close(ends[0]);
    EXPECT_EQ(Get("o.tab"), Crops_Tab);
    EXPECT_EQ(Files(), "c.csv o.tab");
}

TEST_F(Pipeline_Test, An_Output_Of_Options_Alone_Has_The_Usual_Name)
{
    const std::filesystem::path folder = std::filesystem::current_path();
    Put("c.csv", Crops);
    std::filesystem::current_path(Path(""));
    EXPECT_EQ(Call({"c.csv", "/q"}), (Host_Answer{0, ""}));
    EXPECT_EQ(Files(), "Ingester.TBK c.csv");
    std::filesystem::current_path(folder);
}

TEST_F(Pipeline_Test, Hostile_Texts_End_In_Good_Time)
{
    const std::string wide = Repeated("1,", 99999) + "1\n";
    Put("c.csv", wide + wide);
    EXPECT_TRUE(
        Convert("c.csv", "o.tab/n").second.starts_with("Maximum number of columns (50000) exceeded.\n"));
    Put("c.csv", "a\n" + std::string(200000, ',') + "\n");
    EXPECT_EQ(Convert("c.csv", "p.tab").first, 4);
    Put("c.csv", "a,b\n1,2\n" + Repeated(",\n", 300000));
    EXPECT_EQ(Convert("c.csv", "q.tab").first, 0);
    EXPECT_EQ(Get("q.tab"), "a\tb\r\n1\t2\r\n");
}

}  // namespace
}  // namespace ingester

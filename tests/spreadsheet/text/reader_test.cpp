#include "interface/request/request.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_test_support.h"
#include "support/check_sheet.h"
#include "support/progress.h"
#include "support/request_fixture.h"
#include "support/text.h"

#include <algorithm>
#include <cstdlib>
#include <functional>
#include <random>
#include <span>
#include <vector>

namespace ingester {
namespace {

using Change = std::function<void()>;

Change Separators(std::string_view text)
{
    return [text] { request.Custom_Separators = text; };
}

Change Missing(std::string_view text)
{
    return [text] { request.Missing_Input_Text = text; };
}

/// One text to a table: its name, its bytes, the Sheet (empty for none), what is set before, what is said.
struct Case {
    const char* told;
    const char* name;
    std::string text;
    std::string sheet;
    Change change = [] {};
    std::string message = {};
};

class Text_Reader : public Request_Test {
protected:
    /// The Sheet of a text in a request of its own; null for none.
    Sheet* Read(std::string_view text, const char* name, const Change& change)
    {
        Start_Request("t");
        change();
        Input_File file(std::as_bytes(std::span(text)), name);
        if (!Read_CSV(file))
            return nullptr;
        EXPECT_EQ(Check_Sheet(*Current_Sheet), "");
        return Current_Sheet;
    }

    void Try(std::span<const Case> cases)
    {
        for (const Case& tried : cases) {
            SCOPED_TRACE(tried.told);
            const Sheet* const sheet = Read(tried.text, tried.name, tried.change);
            EXPECT_EQ(sheet == nullptr ? "" : Render(sheet), tried.sheet);
            EXPECT_EQ(Messages(), tried.message.empty() ? "" : tried.message + ":\n");
        }
    }
};

TEST_F(Text_Reader, Decides_Whether_Names_Come_First)
{
    const Case cases[] = {
        {"digits", "x.csv", "1,2\n3,4\n", "C1 V1|3; C2 V2|4"},
        {"a sign", "x.csv", "a,-b\n1,2\n", "C1 Ta|1; C2 T-b|2"},
        {"a star", "x.csv", "a,*\n1,2\n", "C1 Ta|1; C2 V*|2"},
        {"a digit later in a field", "x.csv", "a1,b-2\n1,2\n", "a1 V1; b_2 V2"},
        {"a digit behind a blank", "x.csv", "year 1,b\n1,2\n", "C1 Tyear 1|1; C2 Tb|2"},
        {"a digit behind points", "x.csv", "a,..5\n1,2\n", "C1 Ta|1; C2 T..5|2"},
        {"a digit behind a quote", "x.csv", "a,\"2\"\n1,2\n", "a V1; %2 V2"},
        {"told that they do", "x.csv", "1,b\n1,2\n", "%1 V1; b V2", [] { request.Names_Given = true; }},
        {"told that they don't", "x.csv", "a,b\n1,2\n", "C1 Ta|1; C2 Tb|2", [] { request.No_Names = true; }},
        {"nothing but names", "x.csv", "a,b\n", ""},
        {"nothing behind names", "x.csv", "a\n\n1\n", "", [] {},
         "Warning: An empty line stands behind row 0, and what follows it was not read.\n"},
        {"names are made valid", "x.csv", "a b,,\"c,d\"\nx,2,3\n", "a_b Tx; C2 V2; c_d V3"},
        {"names that clash", "x.csv", "yield,yield\n1,2\n", "yield V1; yield1 V2"},
    };
    Try(cases);
}

TEST_F(Text_Reader, Chooses_Separators)
{
    const Case cases[] = {
        {"commas", "X.CSV", "a;b,c\td\n1;2,3\n", "a_b T1;2; c_d V3"},
        {"tabs by name", "x.tab", "a,b\tc\n1,2\t3\n", "a_b T1,2; c V3"},
        {"commas and semicolons by content", "x.txt", "a,b;c\n1;2,3\n", "a V1; b V2; c V3"},
        {"blanks otherwise", "x.txt", " a  b \n1   2;\n", "a V1; b T2;"},
        {"given ones", "x.txt", "a|b:c\td\n1:2|3\n", "a V1; b V2; c_d V3", Separators("|:")},
        {"a given point", "x.csv", "a.b\n1.5\n", "a V1; b V5", Separators(".")},
        {"a given letter", "x.csv", "ab\n1e5\n", "a V1; C2 V5", Separators("eb")},
        {"titles have no say", "x.txt", "\"one, two\tthree\"\na b\n1 2\n", "a V1; b V2"},
        {"titles end with the first other line", "x.txt", "\"t\"\n\"u\"\na,b\n\"v\"\n", "a Tv; b V*"},
    };
    Try(cases);
}

TEST_F(Text_Reader, Cuts_Lines_And_Fields)
{
    const Case cases[] = {
        {"a quoted separator", "x.csv", "a,b\n\"x,y\",'1,2'\n", "a Tx,y; b T1,2"},
        {"doubled quotes", "x.csv", "a,b\n\"x\"\"y\",'it''s'\n", "a Tx\"y; b Tit's"},
        {"an unclosed quote takes the line", "x.csv", "a,b\n\"x,y\nz,1\n", "a T\"x,y|z; b V*|1"},
        {"text behind the close", "x.csv", "a,b\n\"x\"y,1\n", "a T\"x\"y; b V1"},
        {"blanks and tabs around quotes", "x.csv", "a,b\n \"x\" \t, \"y\" \n", "a Tx; b Ty"},
        {"or stay", "x.csv", "a,b\n \" x \" , y\t\n", "a T x ; b Ty\t",
         [] { Get_Settings().trim_cells = 0; }},
        {"all ends mixed", "x.csv", "a,b\n1,x\r2,y\r\n3,z", "a V1|2|3; b Tx|y|z"},
        {"ragged rows", "x.csv", "a\n1,2,x\n3\n4,,\n", "a V1|3|4; C2 V2|*|*; C3 Tx||"},
        {"empty lines at the head", "x.csv", "\n\r\na\n1\n", "a V1"},
        {"an empty line ends the rows, not one of blanks", "x.csv", "a\n1\n  \n2\n\n3\n", "a V1|*|2", [] {},
         "Warning: An empty line stands behind row 3, and what follows it was not read.\n"},
        {"a NUL is a blank", "x.csv", std::string("a,b\n1,x\0y\n2,\0\"x,y\"\0\n", 20), "a V1|2; b Tx y|x,y",
         [] {}, "Warning: 3 NUL characters in the text were read as blanks.\n"},
    };
    Try(cases);
}

TEST_F(Text_Reader, Knows_Numbers_Texts_And_Missing_Cells)
{
    const Case cases[] = {
        {"forms of numbers", "x.csv", "a\n.5\n5.\n+3\n-1e3\n1E-2\n007\n12* \n", "a V0.5|5|3|-1000|0.01|7|12"},
        {"beyond a double", "x.csv", "a\n1e999\n1e308\n1e-999\n", "a V*|9.99999e+307|*"},
        {"no numbers", "x.csv", "a,b,c,d,e\n0x10,nan,inf,1e,1.2.3\n",
         "a T0x10; b Tnan; c Tinf; d T1e; e T1.2.3"},
        {"stars and nothing", "x.csv", "a,b\n*,x\n1,*\n,\n* ,\"\"\n", "a V*|1|*|*; b Tx|||"},
        {"a quoted star is text, but missing", "x.csv", "a\n1\n\"*\"\n", "a T1|"},
        {"NA", "x.csv", "a,b\nNA,na\n1,x\n\"Na\",*\n", "a V*|1|*; b T|x|", Missing("na")},
        {"a number that means missing", "x.csv", "a,b\n-9,x\n*,\"*\"\n-9.0,-9\n", "a V*|*|-9; b Tx|*|",
         Missing("-9")},
        {"marks", "x.csv", "x!,y$,z#,d:D,t:t!\n1,2,three,4,5\n", "x V1; y T2; z V*; d V4; t V5"},
        {"a marked number", "x.csv", "z#,y\n\" 12\",1\n3x,1\n*,1\n", "z V12|*|*; y V1|1|1"},
        {"wanted types overrule", "x.csv", "x$,y#,z\n1,a,3\n", "x V1; y Ta; z V3",
         [] {
             request.Column_Wanted_Types = {4, 3};
         }},
        {"90 characters", "x.csv", "a\n" + std::string(90, 'x') + "\n", "a T90 characters"},
        {"90 characters are kept", "x.csv", "a\n\"" + std::string(89, 'x') + "\"\" \"\n", "a T90 characters"},
        {"91 characters", "x.csv", "a\ny\n" + std::string(91, 'x') + "\n", "a Ly|91 characters"},
        {"12000 characters", "x.csv", "a\n" + std::string(12000, 'x') + "\n", "a L10000 characters"},
    };
    Try(cases);
}

TEST_F(Text_Reader, Takes_The_Lines_That_Are_Asked_For)
{
    const auto range = [](std::string_view text) { return [text] { request.Cell_Range = text; }; };
    const auto between = [](std::string_view start, std::string_view end) {
        return [start, end] { request.Start_Text = start, request.End_Text = end; };
    };
    const auto joined = [] { request.Lines_Per_Record = 2; };
    const std::string text = "x\na,b\n1,2\n3,4\nend,5\n";
    const std::string half(200000, '1');
    const Case cases[] = {
        {"lines 2 to 3", "x.csv", text, "a V1; b V2", range("2:3")},
        {"lines that end with a CR", "x.csv", "x\ra,b\r\n1,2\r3,4", "a V1|3; b V2|4", range("2")},
        {"to line 1", "x.csv", text, "", range(":1")},
        {"no such range", "x.csv", text, "", range("3:2"), "Error: First line > Last line in cell range.\n"},
        {"start and end", "x.csv", text, "a V1|3; b V2|4", between("a,", "en")},
        {"no start, no end", "x.csv", text, "", between("A", "z"),
         "Warning: Starting cell contents 'A' NOT found.\n"
         "Warning: Ending line start text 'z' NOT found.\n"},
        {"two lines to a record", "x.csv", "a \t\nb,\n1\n2,\n3,\n4\n", "a V1|3; b V2|4; C3 V*|*", joined},
        {"a record too long", "x.csv", half + "\n" + half + "\n1\n2\n", "C1 V*|1; C2 V*|2", joined,
         "Error: Combined CSV line length > 262140.\n"},
        {"a line too long", "x.csv", "a\n" + std::string(262141, '1') + "\n", "", [] {},
         "Error: Line 2 has more than 262140 characters.\n"},
        {"columns that are too many", "x.csv", "a\n1\n1,2,3\n1,2,3,4\n", "a V1|1|1; C2 V*|2|2",
         [] { request.Max_Columns = 2; },
         "Maximum number of columns (2) exceeded.\nIgnoring extra columns.\n"},
    };
    Try(cases);
    EXPECT_FALSE(Read_CSV_File(Temp_Name("none.csv").c_str()));
    EXPECT_EQ(Messages(), "CSV data file " + Temp_Name("none.csv") + " not found.\n:\n");
}

/// A column is settled by its last row as well as by its first.
TEST_F(Text_Reader, Settles_Types_Late)
{
    constexpr int count = 5000;
    const struct {
        const char* last;
        const char* types;
        std::int32_t column, row;
        const char* cell;
    } cases[] = {
        {"*,y,2", "VTV", 1, count, "*"},
        {"abc,y,2", "TTV", 1, 0, "007.50"},
        {"abc,y,2", "TTV", 1, count, "abc"},
        {"1,\"y\",nan", "VTT", 3, 0, "1e-3"},
        {"1,LONG,2", "VLV", 2, count, "200 characters"},
        {"1,x,2,3,*", "VTVVV", 4, count, "3"},
        {"1,x,2,,z", "VTVVT", 5, count, "z"},
        {"1,x,2,,z", "VTVVT", 5, 0, ""},
    };
    std::string rows;
    for (int i = 0; i < count; ++i)
        rows += "007.50,x,1e-3\n";
    for (const auto& tried : cases) {
        std::string last = tried.last;
        if (const std::size_t at = last.find("LONG"); at != std::string::npos)
            last.replace(at, 4, std::string(200, 'w'));
        Sheet* const sheet = Read(rows + last, "x.csv", [] {});
        std::string types;
        for (std::int32_t i = 1; i <= sheet->column_count; ++i)
            types += Render(*Column_At(sheet, i)).front();
        EXPECT_EQ(types, tried.types) << tried.last;
        Column* const column = Column_At(sheet, tried.column);
        EXPECT_EQ(Render(*column, *Cell_At(column, tried.row)), tried.cell) << tried.last;
    }
}

/// A file is mapped; what has been read is let go of in steps, and may be wanted again.
TEST_F(Text_Reader, Reads_Files_That_Change_And_That_Do_Not)
{
    static std::filesystem::path path;
    path = folder_ / "x.csv";
    std::string text;
    for (int row = 1; row < (1 << 22) / 8; ++row)
        text += "1234567\n";
    std::ofstream(path) << text << "abcdefg";
    ASSERT_TRUE(Read_CSV_File(path.c_str()));
    EXPECT_EQ(Column_At(Current_Sheet, 1)->first_cell->Text(), "1234567");

    std::ofstream(path) << text << text << text;
    progress_hook = [](const char*, std::int64_t, std::int64_t) {
        std::filesystem::resize_file(path, 5000000);
    };
    EXPECT_FALSE(Read_CSV_File(path.c_str()));
    progress_hook = nullptr;
    EXPECT_EQ(Messages(), "Error: Could not read all of file " + path.string() + ".\n:\n");
}

// --- The rules of cutting and typing once more, slowly ----------------------------------------------

struct Slow_Field {
    std::string text;
    bool unquoted = false;  ///< stood between quotes
};

std::vector<std::string> Slow_Lines(const std::string& text, bool strip_titles)
{
    std::vector<std::string> kept;
    for (std::size_t at = 0; at < text.size(); ++at) {
        const std::size_t end = std::min(text.find_first_of("\r\n", at), text.size());
        const std::string line = text.substr(at, end - at);
        at = text.compare(end, 2, "\r\n") == 0 ? end + 1 : end;
        strip_titles = strip_titles && line.size() > 1 && line.front() == '"' && line.back() == '"';
        if (!strip_titles && !(kept.empty() && line.empty()))
            kept.push_back(line);
    }
    return kept;
}

Slow_Field Slow_Content(std::string raw)
{
    raw.erase(0, std::min(raw.find_first_not_of(" \t"), raw.size()));
    const std::size_t last = raw.find_last_not_of(" \t");
    if (raw.empty() || (raw[0] != '"' && raw[0] != '\'') || last == 0 || raw[last] != raw[0])
        return {raw, false};
    std::string text;
    for (std::size_t i = 1; i < last; ++i) {
        text += raw[i];
        if (raw[i] == raw[0] && i + 1 < last && raw[i + 1] == raw[0])
            ++i;
    }
    return {text, true};
}

std::vector<Slow_Field> Slow_Fields(const std::string& line, char separator, char other)
{
    std::vector<Slow_Field> fields;
    for (std::size_t at = 0;; ++at) {
        at = std::min(line.find_first_not_of(' ', at), line.size());
        std::size_t end = at;
        if (const char quote = line[at]; quote == '"' || quote == '\'') {
            do
                end = line.find(quote, end + 1);
            while (end != line.npos && line[end + 1] == quote && ++end);
            end += end != line.npos ? 1 : 0;
        }
        while (end < line.size() && line[end] != separator && line[end] != other)
            ++end;
        fields.push_back(Slow_Content(line.substr(at, end - at)));
        if (end >= line.size() || (separator == ' ' && line.find_first_not_of(' ', end) == line.npos))
            return fields;
        at = end;
    }
}

bool Slow_Names(const std::string& line, char separator, char other)
{
    bool at_start = true;
    for (const char c : line) {
        if (at_start && (c == '1' || c == '-' || c == '*'))
            return false;
        if (c != '.')
            at_start = c == ' ' || c == '\t' || c == separator || c == other;
    }
    return true;
}

/// Whether a field makes its column Text; `cell` is what a numeric column gets.
bool Slow_Is_Text(const Slow_Field& field, std::string& cell)
{
    std::string text(Trim_Copy(field.text));
    char* end = text.data();
    const double value = std::strtod(end, &end);
    char printed[Number_Text_Room];
    cell = end == text.data() ? "*" : std::string(printed, Print_General(printed, value, 15));
    return *end != '\0' && (field.unquoted || std::string_view(end) != "*");
}

/// The types and cells of a text.
std::string Slow_Read(const std::string& text, const std::string& name)
{
    const std::vector<std::string> lines = Slow_Lines(text, name == "x.txt");
    const auto holds = [&](char c) {
        return std::any_of(lines.begin(), lines.end(), [c](auto& line) { return line.find(c) != line.npos; });
    };
    const bool tabs = name == "x.tab" || (name == "x.txt" && holds('\t'));
    const char separator = tabs ? '\t' : name == "x.csv" || holds(',') ? ',' : ' ';
    const char other = separator == ',' && name == "x.txt" ? ';' : separator;
    std::vector<std::vector<Slow_Field>> rows;
    std::size_t columns = 0;
    for (auto line = lines.begin(); line != lines.end() && !line->empty(); ++line) {
        const bool last = line + 1 == lines.end() || line[1].empty();
        columns = std::max(columns, rows.emplace_back(Slow_Fields(*line, separator, other)).size());
        if (last && line->find_first_not_of(" \t") == line->npos)
            rows.pop_back();
    }
    if (!rows.empty() && Slow_Names(lines[0], separator, other))
        rows.erase(rows.begin());
    std::string sheet;
    for (std::size_t column = 0; !rows.empty() && column < columns; ++column) {
        std::string numbers;
        std::string texts;
        bool is_text = false;
        for (auto& row : rows) {
            row.resize(columns);
            std::string cell;
            is_text |= Slow_Is_Text(row[column], cell);
            numbers += (numbers.empty() ? "V" : "|") + cell;
            const std::string trimmed(Trim_Copy(row[column].text));
            texts += (texts.empty() ? "T" : "|") + (trimmed == "*" ? "" : trimmed);
        }
        sheet += (is_text ? texts : numbers) + "\n";
    }
    return sheet;
}

TEST_F(Text_Reader, Reads_Any_Bytes_As_The_Rules_Say)
{
    constexpr std::string_view letters = ",\"' \t\n\r*1a.-;";
    constexpr const char* names[] = {"x.csv", "x.tab", "x.txt"};
    std::mt19937 random(7);
    for (int round = 0; round < 30000; ++round) {
        const bool is_long = round % 300 == 0;
        std::string text(random() % (is_long ? 12000 : 40), ' ');
        for (char& c : text)
            c = letters[random() % letters.size()];
        for (std::size_t i = 1; is_long && i < text.size(); ++i)  // no empty line ends it early
            if (text[i - 1] <= '\r' && text[i - 1] != '\t' && text[i] <= '\r')
                text[i] = '1';
        const char* const name = names[round % 3];
        Sheet* const sheet = Read(text, name, [] {});
        std::string got;
        for (std::int32_t i = 1; sheet != nullptr && i <= sheet->column_count; ++i)
            got += Render(*Column_At(sheet, i)) + "\n";
        ASSERT_EQ(got, Slow_Read(text, name)) << name << ": " << testing::PrintToString(text);
    }
}

}  // namespace
}  // namespace ingester

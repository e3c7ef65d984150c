#include "spreadsheet/text/text.h"

#include "support/progress.h"
#include "support/reader_fixture.h"
#include "support/text.h"

#include <algorithm>
#include <functional>
#include <random>
#include <span>

namespace ingester {
namespace {

using Case = Reader_Case;

class Text_Reader : public Reader_Test {
protected:
    static Sheet* Read(std::string_view text, const char* name, const Change& change = {})
    {
        return Read_Bytes(Read_CSV, text, name, change);
    }

    void Try(std::span<const Case> cases) const { Try_Bytes(Read_CSV, "X.CSV", cases); }
};

TEST_F(Text_Reader, Names_And_Separators)
{
    const auto split = [](std::string_view text) { return [text] { request.Custom_Separators = text; }; };
    const std::string end = "Warning: An empty line stands behind row 3, and what follows it was not read.\n";
    const std::string nul = "Warning: 3 NUL characters in the text were read as blanks.\n";
    const Case cases[] = {
        {"names with digits", "a1,b-2\n1,2\n", "a1 V1; b_2 V2"},
        {"names are made valid", "a b,,\"c,d\"\nx,2,3\n", "a_b Tx; C2 V2; c_d V3"},
        {"told that they come first", "1,b\n1,2\n", "%1 V1; b V2", [] { request.Names_Given = true; }},
        {"told that they don't", "a,b\n1,2\n", "C1 Ta|1; C2 Tb|2", [] { request.No_Names = true; }},
        {"nothing but names", "a,b\n", ""},
        {"separators", "a|b:c\td\n1:2|3\n", "a V1; b V2; c_d V3", split("|:")},
        {"a point for one", "a.b\n1.5\n", "a V1; b V5", split(".")},
        {"a letter for one", "ab\n1e5\n", "a V1; C2 V5", split("eb")},
        {"blanks stay", "a,b\n \" x \" , y\t\n", "a T x ; b Ty\t", [] { Get_Settings().trim_cells = 0; }},
        {"an empty line ends the rows, not one of blanks", "a\n1\n  \n2\n\n3\n", "a V1|*|2", {}, end},
        {"a NUL is a blank", std::string("a,b\n1,x\0y\n2,\0\"x,y\"\0\n", 20), "a V1|2; b Tx y|x,y", {}, nul},
    };
    Try(cases);
}

TEST_F(Text_Reader, Numbers_Texts_And_Missing_Cells)
{
    const auto numbered = [](std::size_t count) { return "a\n" + std::string(count, 'x') + "\n"; };
    const auto missing = [](std::string_view text) { return [text] { request.Missing_Input_Text = text; }; };
    const std::string cut = "Warning: 1 texts of more than 10000 characters were cut.\n";
    const auto types = [] { request.Column_Wanted_Types = {4, 3}; };
    const Case cases[] = {
        {"forms of numbers", "a\n.5\n5.\n+3\n-1e3\n1E-2\n007\n12* \n", "a V0.5|5|3|-1000|0.01|7|12"},
        {"beyond a double", "a\n1e999\n1e308\n1e-999\n", "a V*|9.99999e+307|*"},
        {"no numbers", "a,b,c,d\n0x10,nan,inf,1e\n", "a T0x10; b Tnan; c Tinf; d T1e"},
        {"NA", "a,b\nNA,na\n1,x\n\"Na\",*\n", "a V*|1|*; b T|x|", missing("na")},
        {"-9", "a,b\n-9,x\n*,\"*\"\n-9.0,-9\n", "a V*|*|-9; b Tx|*|", missing("-9")},
        {"marks", "x!,y$,z#,d:D,t:t!\n1,2,three,4,5\n", "x F1; y T2; z V*; d V4; t F1"},
        {"dates", "d:d,t:T,n:D\n1900-03-01,10:30,5\n*,12:00,6\n", "d V109573|*; t V0.4375|0.5; n V5|6"},
        {"a marked number", "z#,y\n\" 12\",1\n3x,1\n*,1\n", "z V12|*|*; y V1|1|1"},
        {"wanted types", "x$,y#\n1,a\n", "x V1; y Ta", types},
        {"90 characters", numbered(90), "a T90 characters"},
        {"90 are kept", "a\n\"" + std::string(89, 'x') + "\"\" \"\n", "a T90 characters"},
        {"91 characters", numbered(91), "a L91 characters"},
        {"12000 characters", numbered(12000), "a L10000 characters", {}, cut},
    };
    Try(cases);
}

TEST_F(Text_Reader, Takes_The_Lines_That_Are_Asked_For)
{
    const auto range = [](std::string_view text) { return [text] { request.Cell_Range = text; }; };
    const auto between = [](std::string_view start, std::string_view end) {
        return [start, end] { request.Start_Text = start, request.End_Text = end; };
    };
    const auto pairs = [](std::string_view lines, std::string_view end) {
        return [lines, end] {
            request.Lines_Per_Record = 2, request.Cell_Range = lines, request.End_Text = end;
        };
    };
    const auto two_columns = [] { request.Max_Columns = 2; };
    const std::string text = "x\na,b\n1,2\n3,4\nend,5\n";
    const std::string too_long = "Error: Line 2 has more than 262140 characters.\n";
    const std::string half(200000, '1');
    const std::string halves = half + "\n" + half + "\n1\n2\n";
    const Case cases[] = {
        {"lines 2 to 3", text, "a V1; b V2", range("2:3")},
        {"lines that end with a CR", "x\ra,b\r\n1,2\r3,4", "a V1|3; b V2|4", range("2")},
        {"to line 1", text, "", range(":1")},
        {"no such range", text, "", range("3:2"), "Error: First line > Last line in cell range.\n"},
        {"start and end", text, "a V1|3; b V2|4", between("a,", "en")},
        {"no start, no end", text, "", between("A", "z"),
         "Warning: Starting cell contents 'A' NOT found.\nWarning: Ending line start text 'z' NOT found.\n"},
        {"two lines to a record", "a \t\nb,\n1\n2,\n3,\n4\n", "a V1|3; b V2|4; C3 V*|*", pairs("", "")},
        {"to the end of the range", "a\nb\n1\n2\n3\n4\n", "a V1|3; b V2|*", pairs(":5", "")},
        {"to the end of the data", "a\nb\n1\nend\n2\n", "a V1; b V*", pairs("", "end")},
        {"long", halves, "C1 V*|1; C2 V*|2", pairs("", ""), "Error: Combined CSV line length > 262140.\n"},
        {"longer", "a\n1" + std::string(262140, '1') + "\n", "", {}, too_long},
        {"too many columns", "a\n1\n1,2,3\n1,2,3,4\n", "a V1|1|1; C2 V*|2|2", two_columns,
         "Maximum number of columns (2) exceeded.\nIgnoring extra columns.\n"},
    };
    Try(cases);
    const std::string none = Request_Name("none.csv");
    EXPECT_FALSE(Read_CSV_File(none.c_str()));
    EXPECT_EQ(Messages(), "CSV data file " + none + " not found.\n:\n");
}

/// A file is mapped; what has been read is let go of in steps, and may be wanted again.
TEST_F(Text_Reader, Reads_Files_That_Change_And_That_Do_Not)
{
    static std::filesystem::path path;
    path = Path("x.csv");
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

// --- The line services -------------------------------------------------------------------------------

using Text_Lines = Request_Test;

TEST_F(Text_Lines, One_Line_Becomes_A_Column)
{
    const std::string long_line(262141, 'x');
    const std::tuple<std::int32_t, std::string_view, std::string, std::string, std::string> cases[] = {
        {1, "", "a\tb\n x \t2\t\t*\r\nc\n", "C1 Tx|2||", ""},
        {2, ",;", "\r\rx,y;z," + std::string(95, 'y'), "C1 Tx|y;z|90 characters", ""},
        {1, "", long_line + "\n\n", "C1 T", ""},
        {1, "", "a\n" + long_line, "", "Error: Line 2 has more than 262140 characters.\n:\n"},
        {1, "", "a\n", "", "Could not read data file x.txt.\n:\n"},
    };
    for (const auto& [skipped, separators, text, sheet, message] : cases) {
        Start_Request("t");
        request.Fixed_Lines = skipped;
        request.Custom_Separators = separators;
        Input_File file(std::as_bytes(std::span(text)), "x.txt");
        const bool read = Read_Text_Lines(file);
        EXPECT_EQ(read ? Render(Current_Sheet) + Check_Sheet(*Current_Sheet) : "", sheet);
        EXPECT_EQ(Messages(), message);
    }
    const std::string none = Request_Name("none");
    EXPECT_FALSE(Read_Text_Lines(none.c_str()));
    EXPECT_EQ(Messages(), "Data file " + none + " not found.\nCould not read data file " + none + ".\n:\n");
}

TEST_F(Text_Lines, Lines_Are_Joined_To_Records)
{
    const std::string wide(70000, '1');
    const std::tuple<std::int32_t, std::string, std::string> cases[] = {
        {4, "1,2,\n3,4\r\n5,6,\n7,8", "1,2,3,4\n5,6,7,8\n"},
        {3, "1\n2\n3\n4\n5\n", "1,2,3\n4,5\n"},
        {6, "1,2,3\n\n4,5,6\n", "1,2,3,4,5,6\n"},
        {2, "1,2,3,4\n5\n6\n", "1,2,3,4\n5,6\n"},
        {2, wide + "\n" + wide + "\n", wide + "," + wide + "\n"},
        {3, "", ""},
    };
    const std::string input = Request_Name("in.csv");
    const std::string output = Request_Name("out.csv");
    const std::string none = Request_Name("none\\x.csv");
    for (const auto& [fields, from, to] : cases) {
        Put("in.csv", from);
        EXPECT_TRUE(Reflow_Lines_By_Fields(input.c_str(), output.c_str(), fields));
        EXPECT_EQ(Get("out.csv"), to) << from.substr(0, 80);
    }
    Put("in.csv", "1,2\n");
    EXPECT_FALSE(Reflow_Lines_By_Fields(none.c_str(), output.c_str(), 2));
    for (const std::string& refused : {none, input, std::string("/dev/full")})
        EXPECT_FALSE(Reflow_Lines_By_Fields(input.c_str(), refused.c_str(), 2));
    EXPECT_EQ(Get("in.csv"), "1,2\n");
    EXPECT_EQ(Messages(), "CSV data file " + none + " not found.\nCSV data file " + none
                              + " could not be opened.\nInput and output files are the same.\n:\n");
}

// --- The rules of cutting and typing once more, slowly ----------------------------------------------

using Slow_Field = std::pair<std::string, bool>;  ///< its text, and whether it stood between quotes

Texts Slow_Lines(const std::string& text, const std::string& name)
{
    Texts kept;
    bool strip_titles = name == "x.txt";
    const char* const blanks = name == "x.tab" ? " " : " \t";
    for (std::size_t at = 0; at < text.size(); ++at) {
        const std::size_t end = std::min(text.find_first_of("\r\n", at), text.size());
        const std::string line = text.substr(at, end - at);
        at = text.compare(end, 2, "\r\n") == 0 ? end + 1 : end;
        strip_titles = strip_titles && line.size() > 1 && line.front() == '"' && line.back() == '"';
        if (!strip_titles && !(kept.empty() && line.find_first_not_of(blanks) == line.npos))
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
    std::string text = raw.substr(1, last - 1);
    const std::string doubled(2, raw[0]);
    for (std::size_t at = 0; (at = text.find(doubled, at)) != text.npos; ++at)
        text.erase(at, 1);
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
        if (at_start && (c == '1' || c == '-' || c == '+' || c == '*'))
            return false;
        if (c != '.')
            at_start = c == ' ' || c == '\t' || c == separator || c == other;
    }
    return true;
}

/// Whether a field makes its column Text; `cell` is what a numeric column gets.
bool Slow_Is_Text(const Slow_Field& field, std::string& cell)
{
    std::string text(Trim_Copy(field.first));
    char* end = text.data();
    const double value = std::strtod(end, &end);
    char printed[Number_Text_Room];
    cell = end == text.data() ? "*" : std::string(printed, Print_General(printed, value, 15));
    return *end != '\0' && (field.second || std::string_view(end) != "*");
}

/// The types and cells of a text.
std::string Slow_Read(const std::string& text, const std::string& name)
{
    const Texts lines = Slow_Lines(text, name);
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
            const std::string trimmed(Trim_Copy(row[column].first));
            texts += (texts.empty() ? "T" : "|") + (trimmed == "*" ? "" : trimmed);
        }
        sheet += (sheet.empty() ? "" : "; ") + (is_text ? texts : numbers);
    }
    return sheet;
}

TEST_F(Text_Reader, Reads_Any_Bytes_As_The_Rules_Say)
{
    constexpr std::string_view letters = ",\"' \t\n\r*1a.-;+";
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
        ASSERT_EQ(Render(Read(text, name), false), Slow_Read(text, name))
            << name << ": " << testing::PrintToString(text);
    }
}

/// A column is settled by its last row as well as by its first.
TEST_F(Text_Reader, Settles_Types_Late)
{
    std::string rows;
    for (int i = 0; i < 5000; ++i)
        rows += "107.50,x,1e-3\n";
    for (const char* const last : {"*,y,2", "abc,,2", "1,\"y\",no", "1,x,2,3,*", "1,x,2,,z"})
        EXPECT_EQ(Render(Read(rows + last, "x.csv"), false), Slow_Read(rows + last, "x.csv"));
    const std::string sheet = Render(Read(rows + "1," + std::string(200, 'w'), "x.csv"), false);
    EXPECT_TRUE(sheet.find("; Lx|x|") < sheet.find("|200 characters; V0.001|"));
}

}  // namespace
}  // namespace ingester

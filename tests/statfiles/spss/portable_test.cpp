// Portable files put together from their fields.
#include "statfiles/shared/stat_fixture.h"
#include "statfiles/spss/portable_source.h"
#include "statfiles/spss/spss.h"

#include <cmath>
#include <random>

namespace ingester {

namespace {

using namespace std::string_literals;

std::string Splash()
{
    std::string text;
    for (int i = 0; i < 5; ++i)
        text += Padded("ASCII SPSS PORT FILE", 40);
    return text + std::string(256, '0') + "SPSSPORT";
}

std::string Number(std::size_t number)
{
    std::string text;
    for (; number > 0; number /= 30)
        text.insert(text.begin(), "0123456789ABCDEFGHIJKLMNOPQRST"[number % 30]);
    return (text.empty() ? "0" : text) + "/";
}

std::string Counted(const std::string& text)
{
    return Number(text.size()) + text;
}

std::string Variable(std::size_t width, const std::string& name, const std::string& format = "5/8/2/")
{
    return "7" + Number(width) + Counted(name) + format + format;
}

/// `line` of 0: without line ends.
std::string File(const std::string& tags, std::size_t line = 80, const std::string& end = "\r\n")
{
    const std::string text = Splash() + "A" + Counted("20260101") + Counted("120000") + tags + "Z";
    std::string file;
    for (std::size_t at = 0; at < text.size(); at += line == 0 ? text.size() : line)
        file += text.substr(at, line == 0 ? text.size() : line) + (line == 0 ? "" : end);
    return file;
}

/// `count` variables are to come.
std::string Begin(std::size_t count)
{
    return "1" + Counted("a product") + "4" + Number(count) + "9/";
}

class Spss_Portable : public Stat_Test {
protected:
    static Sheet* Read(const std::string& bytes, const Change& change = {})
    {
        return Read_Bytes(Read_Spss_Portable, bytes, "t.por", change);
    }
    static std::string Cells(const std::string& tags, const Change& change = {})
    {
        return Render(Read(File(tags), change));
    }
};

TEST_F(Spss_Portable, Numbers_Are_Rounded_Once)
{
    const auto real = [](const std::string& text) {
        Input_File file(std::as_bytes(std::span(text)));
        Portable_Source source(file);
        double value = -1;
        return source.Portable_Real(value) ? value : NAN;
    };
    EXPECT_EQ(real("-5.F/"), -5.5);
    EXPECT_EQ(real("1+2/"), 900);
    EXPECT_EQ(real("1-2/"), 1.0 / 900);
    EXPECT_EQ(real("T/"), 29);
    EXPECT_EQ(real("10/"), 30);
    EXPECT_EQ(real(" 1 . F/"), 1.5);
    EXPECT_EQ(real("*."), Missing_Value);
    EXPECT_EQ(real("/"), 0);
    EXPECT_EQ(real("123456789ABCDEFGHIJKLMNO9/"), real("123456789ABCDEFGHIJKLMNO/"));
    EXPECT_TRUE(std::isnan(real("12Z")));
    EXPECT_TRUE(std::isnan(real("12#/")));
    EXPECT_EQ(real("1+1000000/"), std::numeric_limits<double>::infinity());
    EXPECT_EQ(real("1-1000000/"), 0);
    // Against a division whose operands and quotient have more bits than it needs.
    std::mt19937_64 random(3);
    for (int i = 0; i < 20000; ++i) {
        const std::uint64_t mantissa = random() >> random() % 60;
        const auto power = static_cast<std::int64_t>(random() % 13);
        double exact = 1;
        for (int digit = 0; digit < power; ++digit)
            exact *= 30;  // has no more than 53 bits up to here
        if (mantissa < std::uint64_t{1} << 53) {
            ASSERT_EQ(Portable_Number(mantissa, -power), static_cast<double>(mantissa) / exact);
        }
        // The same number spelt with more digits.
        ASSERT_EQ(Portable_Number(Portable_Mantissa{mantissa} * 810000, -power - 4),
                  Portable_Number(mantissa, -power));
        ASSERT_EQ(Portable_Number(Portable_Mantissa{mantissa} * 27000, 37 - power),
                  Portable_Number(mantissa, 40 - power));
    }
}

TEST_F(Spss_Portable, Lines_May_End_Anyhow)
{
    const std::string tags = Begin(2) + Variable(0, "NUM") + "C" + Counted("a label")
                             + Variable(120, "TEXT", "1/3C/0/") + "C" + Counted(" ") + "F" + "1.F/"
                             + Counted("Z/" + std::string(110, 'x')) + "*." + Counted(" ab ") + "-1/"
                             + Counted("");
    const std::string expected = "NUM V1.5|*|-1; TEXT T90 characters|ab|";
    for (const char* const end : {"\n", "\r\n", "\r"})
        EXPECT_EQ(Render(Read(File(tags, 80, end))), expected);
    EXPECT_EQ(Render(Read(File(tags, 0))), expected);
    std::string trimmed;
    std::istringstream lines(File(tags, 80, "\n"));
    for (std::string line; std::getline(lines, line);)
        trimmed += line.substr(0, line.find_last_not_of(' ') + 1) + "\n";
    EXPECT_EQ(Render(Read(trimmed)), expected);
    const Column& number = *Column_At(Current_Sheet, 1);
    EXPECT_EQ(std::tuple(number.extra.view(), number.decimals, number.width), std::tuple("a label", 0, 5));
    EXPECT_EQ(Column_At(Current_Sheet, 2)->extra, "");
    EXPECT_EQ(Render(Read(File(tags), All_For_People)), "NUM V1.5|*|-1; TEXT L112 characters|ab|");
    EXPECT_EQ(Render(Read(File(tags),
                          [] {
                              request.Subset_Columns = request.Subset_Rows = true;
                              request.Subset_Names = {"TEXT"};
                              request.Subset_Row_Flags = {0, 1};
                          })),
              "TEXT Tab");
    Damage(Read_Spss_Portable,
           File(Begin(1) + Variable(0, "X") + "D1/" + Counted("X") + "1/1/" + Counted("one") + "F1/2/")
               .substr(480),
           "t.por");
}

TEST_F(Spss_Portable, Missing_Values_Labels_And_Dates)
{
    const std::string values = "F1/2/3/4/5/6/*.";
    const auto keep = [] { Get_Settings().ignore_value_case = 1; };
    for (const auto& [tags, cells] :
         std::initializer_list<std::pair<std::string, std::string>>{{"82/85/", "1|*|3|4|*|6|*"},
                                                                    {"93/", "*|*|*|4|5|6|*"},
                                                                    {"A5/", "1|2|3|4|*|*|*"},
                                                                    {"B2/4/", "1|*|*|*|5|6|*"},
                                                                    {"92/A6/83/", "*|*|*|4|5|*|*"}}) {
        EXPECT_EQ(Cells(Begin(1) + Variable(0, "X") + tags + values), "X V" + cells);
        EXPECT_EQ(Cells(Begin(1) + Variable(0, "X") + tags + values, keep), "X V1|2|3|4|5|6|*");
    }
    const std::string labels = "D1/" + Counted("x") + "2/2/" + Counted("two") + "9/" + Counted("nine");
    EXPECT_EQ(Cells(Begin(1) + Variable(0, "X") + labels + "F2/1/*."), "X F2|1|*");
    EXPECT_EQ(Levels_Of(Current_Sheet), "1 two");
    const std::string texts = Begin(1) + Variable(3, "T", "1/3/0/") + "D1/" + Counted("T") + "1/"
                              + Counted("b") + Counted("Beta") + "F" + Counted("b") + Counted("a")
                              + Counted("A") + Counted("");
    EXPECT_EQ(Cells(texts), "T F3|2|1|*");
    EXPECT_EQ(Levels_Of(Current_Sheet), "A a Beta");
    EXPECT_EQ(Cells(texts, keep), "T F2|1|1|*");
    EXPECT_EQ(Levels_Of(Current_Sheet), "a Beta");
    EXPECT_EQ(Cells(Begin(1) + Variable(0, "D", "K/B/0/") + "F0/"), "D V-6347");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->date_format, 1);
    EXPECT_EQ(Cells(Begin(1) + Variable(0, "X") + "F6+6S/"), "X V9.99999e+307");
    EXPECT_EQ(Messages(), "Numbers in greater than9.99999E+307 have been set to this value.\n:\n");
}

TEST_F(Spss_Portable, The_Code_Of_Letters_Is_Judged_For_People)
{
    const std::string utf8 = Begin(1) + Variable(3, "T", "1/3/0/") + "F" + Counted("é");
    EXPECT_EQ(Cells(utf8, All_For_People), "T Té");
    EXPECT_EQ(Cells(Begin(1) + Variable(3, "T", "1/3/0/") + "F" + Counted("\xE9"), All_For_People), "T Té");
    const std::string further = "2" + Counted("author") + "E2/" + Counted("one") + Counted("two") + Begin(1)
                                + Variable(0, "W") + "6" + Counted("W") + "F1/";
    EXPECT_EQ(Cells(further, All_For_People), "W V1");
    EXPECT_EQ(request.losses.Entries()[0].column, "W");
}

TEST_F(Spss_Portable, What_Is_Refused)
{
    const std::string cannot = "Cannot read SPSS Portable data file.\n";
    const std::string unexpected = "Unexpected record type in SPSS Portable file.\n" + cannot;
    const std::string x = Begin(1) + Variable(0, "X");
    std::string other_form = File(x + "F1/");
    other_form[42] = 'X';
    std::string other_mark = File(x + "F1/");
    other_mark[456 + 5 * 2] = 'X';
    const std::string no_variable = "Missing variable record in SPSS Portable file.\n" + cannot;
    const Reader_Case cases[] = {
        {"too short", Splash().substr(0, 199), "", {}, "SPSS Portable data file t.por is empty.\n"},
        {"not in ASCII", other_form, "", {}, "SPSS Portable data file t.por  is not in correct format.\n"},
        {"another mark", other_mark, "", {}, "SPSS Portable file t.por is not in correct format.\n"},
        {"no variables told",
         File("40/9/"),
         "",
         {},
         "SPSS Portable file: Number of fields is illegal.\n" + cannot},
        {"no tag 4",
         File(Variable(0, "X")),
         "",
         {},
         "Invalid variable length in SPSS Portable file.\n" + cannot},
        {"a width below 0",
         File(Begin(1) + "7-1/"),
         "",
         {},
         "Invalid variable length in SPSS Portable file.\n" + cannot},
        {"one more variable",
         File(x + Variable(0, "Y")),
         "",
         {},
         "Too many variable records in SPSS Portable file.\n" + cannot},
        {"labels for none",
         File(x + "D0/"),
         "",
         {},
         "Invalid Label record in SPSS Portable file.\n" + cannot},
        {"an author", File("2" + Counted("a")), "", {}, unexpected},
        {"a weight", File(x + "6" + Counted("X")), "", {}, unexpected},
        {"a document", File(x + "E0/"), "", {}, unexpected},
        {"8 in front", File(Begin(1) + "81/"), "", {}, no_variable},
        {"9 in front", File(Begin(1) + "91/"), "", {}, no_variable},
        {"A in front", File(Begin(1) + "A1/"), "", {}, no_variable},
        {"B in front", File(Begin(1) + "B1/2/"), "", {}, no_variable},
        {"C in front", File(Begin(1) + "C" + Counted("x")), "", {}, no_variable},
        {"no cases", File(x + "F"), "", {}, "SPSS Portable file contains no data records.\n"},
        {"no data", File(x), "", {}, "SPSS Portable file contains no data records.\n"},
        {"a text without end", File(x + "CTTTTTT/abc"), "", {}, cannot},
        {"a text below 0", File(x + "C-1/"), "", {}, cannot},
        {"a fault in a number", File(x + "F1/2?/3/Z"), "", {}, cannot},
        {"half a case", File(Begin(2) + Variable(0, "X") + Variable(0, "Y") + "F1/2/3/"), "X V1; Y V2"},
        {"columns beyond", File(Begin(2) + Variable(0, "X") + Variable(0, "Y") + "F1/2/3/4/"), "X V1|3",
         [] { request.Max_Columns = 1; }, "Warning Columns above 1 NOT transfered.\n"},
    };
    Try_Bytes(Read_Spss_Portable, "t.por", cases);
    EXPECT_FALSE(Read_Spss_Portable("none.por"));
    EXPECT_EQ(Messages(), "SPSS Portable data file none.por not found.\n:\n");
}

}  // namespace

}  // namespace ingester

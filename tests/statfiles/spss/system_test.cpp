// System files built record by record.
#include "statfiles/shared/stat_fixture.h"
#include "statfiles/spss/coded_cases.h"
#include "statfiles/spss/spss.h"

namespace ingester {

namespace {

using namespace std::string_literals;

constexpr double M = -std::numeric_limits<double>::max();

struct Told {
    std::string label = {};
    std::int32_t missing_count = 0;
    std::vector<double> missing = {};
    std::int32_t format = 5 << 16 | 8 << 8 | 2;
};

Items Head(std::int32_t slots, std::int32_t compression, std::int32_t cases, std::int32_t weight = 0)
{
    return Of(Raw{"$FL2"}, Raw{Padded("@(#) SPSS DATA FILE of a test", 60)}, 2, slots, compression, weight,
              cases, 100.0, Raw{std::string(84, ' ')});
}

Items Variable(std::int32_t type, const std::string& name, const Told& told = {})
{
    Items items = Of(2, type, told.label.empty() ? 0 : 1, told.missing_count, told.format, told.format,
                     Raw{Padded(name, 8)});
    if (!told.label.empty())
        items.Add(Of(static_cast<std::int32_t>(told.label.size()),
                     Raw{Padded(told.label, (told.label.size() + 3) / 4 * 4)}));
    items.Add(told.missing);
    return items;
}

Items Further(int slots)
{
    Items items;
    for (int i = 0; i < slots; ++i)
        items.Add(Variable(-1, ""));
    return items;
}

std::string Counted_Label(const std::string& label)
{
    return static_cast<char>(label.size()) + Padded(label, (label.size() + 8) / 8 * 8 - 1);
}

template <class Value> Items One_Label(const Value& value, const std::string& label)
{
    return Of(value, Raw{Counted_Label(label)});
}

Items Extension(std::int32_t subtype, const std::string& bytes)
{
    return Of(7, subtype, 1, bytes);
}

const Items End = Of(999, 0);
const Items Labels = Of(3, 4, One_Label(9.0, "refused"), One_Label(10.0, "ten"), One_Label(20.0, "twenty"),
                        One_Label(30.0, "thirty"), 4, 1, 1);
const Items Survey = Of(Variable(0, "Q", {"How many?", 1, {9.0}}), Labels, End);
const Items Survey_Cases = Of(10.0, 25.0, 9.0, 20.0);

std::string File(const Items& items, std::endian order = std::endian::little)
{
    return Encode(items, order);
}

class Spss_System : public Stat_Test {
protected:
    static Sheet* Read(const std::string& bytes, const Change& change = {})
    {
        return Read_Bytes(Read_Spss_System, bytes, "t.sav", change);
    }
    static Sheet* Read(const Items& items, const Change& change = {}) { return Read(File(items), change); }
};

TEST_F(Spss_System, Labelled_Numbers_Become_Factors)
{
    const Items items = Of(Head(1, 0, 4), Survey, Survey_Cases);
    EXPECT_EQ(Render(Read(items)), "Q F1|3|*|2");
    EXPECT_EQ(Levels_Of(Current_Sheet), "10=ten 20=twenty 25=25");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "How many?");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->factor_kind, factor_with_labels);
    EXPECT_EQ(Column_At(Current_Sheet, 1)->width, 8);
    Read(items, [] { request.Add_Unused_Labels = true; });
    EXPECT_EQ(Levels_Of(Current_Sheet), "10=ten 20=twenty 25=25 9=refused 30=thirty");
    EXPECT_EQ(Render(Read(items, [] { Get_Settings().ignore_value_case = 1; })), "Q F2|4|1|3");
    EXPECT_EQ(Levels_Of(Current_Sheet), "9=refused 10=ten 20=twenty 25=25");
    Read(items, [] { Get_Settings().auto_factors = 0; });
    EXPECT_EQ(Levels_Of(Current_Sheet), "10=ten 25=25 20=twenty");
    Read(items, All_For_People);
    EXPECT_EQ(request.losses.Entries().size(), 1U);
    EXPECT_EQ(request.losses.Entries()[0].example, "9");
}

TEST_F(Spss_System, Labels_Of_Other_Columns)
{
    const auto levels_of = [](const Items& variable, const Items& set, const Items& cases,
                              const Change& change = {}) {
        Read(Of(Head(1, 0, -1), variable, set, 4, 1, 1, End, cases), change);
        return Render(Current_Sheet, false) + ", " + Levels_Of(Current_Sheet);
    };
    const auto add_unused = [] { request.Add_Unused_Labels = true; };
    const Items texts = Of(3, 2, One_Label(Raw{"  b     "}, "Beta"), One_Label(Raw{"zz      "}, "Zeta"));
    const Items text_cases = Of(Raw{"a       "}, Raw{"  b     "});
    EXPECT_EQ(levels_of(Variable(8, "t"), texts, text_cases), "F1|2, a Beta");
    EXPECT_EQ(levels_of(Variable(8, "t"), texts, text_cases, [] { Get_Settings().trim_cells = 0; }),
              "F2|1, Beta a");
    EXPECT_EQ(levels_of(Variable(8, "t"), texts, text_cases, add_unused), "F1|2, a Beta Zeta");
    const Items one = Of(3, 2, One_Label(1.0, "one"), One_Label(7.0, ""));
    EXPECT_EQ(levels_of(Variable(0, "n"), one, Of(1 + 9e-13, 1.0 + 2e-12)), "F1|2, 1=one 1=1");
    EXPECT_EQ(levels_of(Variable(0, "n"), one, Of(1.0, 2.0)), "F1|2, one 2");
    EXPECT_EQ(levels_of(Variable(0, "n"), one, Of(1.0, 2.0), add_unused), "F1|2, 1=one 2=2 7=");
    EXPECT_EQ(levels_of(Variable(0, "n"), one, Of(M, M)), "F*|*, 1=one 7=");
    EXPECT_EQ(levels_of(Variable(0, "n"), Of(3, 1, One_Label(7.0, "")), Of(7.0, M)), "F1|*, 7");
    const Items day = Of(3, 1, One_Label(86400.0, "next"));
    EXPECT_EQ(levels_of(Variable(0, "d", {.format = 20 << 16}), day, Of(0.0, 86400.0)),
              "F1|2, -6347=-6347 -6346=next");
    EXPECT_EQ(levels_of(Variable(0, "n"), Of(3, 0), Of(7.0)), "V7, ");
}

TEST_F(Spss_System, Every_Coding_In_Either_Order)
{
    const Items records = Of(Variable(0, "NUM"), Variable(12, "TEXT"), Further(1), Variable(0, "LAST"),
                             Extension(13, "NUM=aNumber\tTEXT=aText\tNONE=x"), Extension(99, "?"),
                             Of(6, 1, Raw{std::string(80, 'd')}), End);
    const Items cases = Of(5.0, Raw{Padded("0123456789", 16)}, 0.5, M, Raw{Padded("", 16)}, -99.0);
    const std::string controls = "\0\xFD\xFD\xFD\xFD\xFF\xFE\xFE"s;  // the second case goes on behind a block
    const Items coded = Of(Raw{controls}, 5.0, Raw{"01234567"}, Raw{"89      "}, 0.5,
                           Raw{"\0\x01\xFC\xFD\xFD\xFD\xFD\xFD"s}, 3.0);
    const std::string expected = "aNumber V5|*; aText T0123456789|; LAST V0.5|-99";
    for (const std::endian order : {std::endian::little, std::endian::big})
        for (const std::int32_t count : {2, -1, 3, 2147483647}) {
            EXPECT_EQ(Render(Read(File(Of(Head(4, 0, count), records, cases), order))), expected);
            EXPECT_EQ(Render(Read(File(Of(Head(4, 1, count), records, coded), order))), expected);
        }
    EXPECT_EQ(Render(Read(Of(Head(9, 0, 1), records, cases, 7))), "aNumber V5; aText T0123456789; LAST V0.5");
    EXPECT_EQ(Messages(), "");
}

TEST_F(Spss_System, A_Coded_Case_May_End_Anywhere)
{
    const auto decode = [](const std::string& bytes, std::size_t slots, int cases) {
        Input_File file(std::as_bytes(std::span(bytes)));
        Case_Bytes source(file, -1);
        Case_Decoder decoder(source, 100, std::endian::little);
        std::vector<std::byte> buffer(8 * slots);
        std::ostringstream text;
        for (int i = 0; i < cases; ++i)
            text << (i > 0 ? " " : "") << decoder.Read_Compressed_Case(buffer.data(), slots);
        return text.str();
    };
    EXPECT_EQ(decode("\x65\x65\x65\xFC\x65\x65\x65\x65", 2, 3), "16 -1 0");
    EXPECT_EQ(decode("\x65\x65\xFC\x65\x65\x65\x65\x65", 2, 3), "16 0 0");
    EXPECT_EQ(decode("\x65\xFD\x65\x65\x65\x65\x65\x65"
                     "1234567",
                     2, 2),
              "-1 0");
    EXPECT_EQ(decode("\x65\x65\x65\x65\x65\x65\x65\x65\x65", 5, 2), "40 -1");
    EXPECT_EQ(decode(std::string(65536, '\0'), 2, 1), "0");
}

TEST_F(Spss_System, Numbers_That_Are_Missing)
{
    const Items values = Of(1.0, 2.0, 3.0, 4.0, 5.0, 6.0, -1e307, std::numeric_limits<double>::infinity(),
                            std::numeric_limits<double>::quiet_NaN(), 9.9999901e307);
    const struct {
        std::int32_t count;
        std::vector<double> missing;
        std::string cells;
    } cases[] = {
        {0, {}, "1|2|3|4|5|6"},
        {1, {2}, "1|*|3|4|5|6"},
        {3, {1, 3, 6}, "*|2|*|4|5|*"},
        {-2, {2, 4}, "1|*|*|*|5|6"},
        {-3, {2, 4, 6}, "1|*|*|*|5|*"},
        {-1, {2}, "1|*|3|4|5|6"},
        {5, {1, 2, 3, 4, 5}, "*|*|*|4|5|6"},
        {-4, {1, 2, 3, 4}, "*|*|*|4|5|6"},
    };
    for (const auto& tried : cases) {
        const Items variable = Variable(0, "x", {"", tried.count, tried.missing});
        EXPECT_EQ(Render(Read(Of(Head(1, 0, -1), variable, End, values))),
                  "x V" + tried.cells + "|*|*|*|9.99999e+307");
        EXPECT_EQ(Messages(), "Numbers greater than 9.99999E+307 have been set to this value.\n:\n");
        EXPECT_EQ(Render(Read(Of(Head(1, 0, -1), variable, End, values),
                              [] { Get_Settings().ignore_value_case = 1; })),
                  "x V1|2|3|4|5|6|*|*|*|9.99999e+307");
    }
}

TEST_F(Spss_System, Formats_Tell_Dates_And_Widths)
{
    constexpr std::pair<int, int> displays[] = {{20, 1},  {21, 36}, {22, 33}, {23, 24},
                                                {24, 35}, {25, 33}, {38, 2},  {39, 20}};
    for (const auto& [code, display] : displays) {
        const Items file = Of(Head(1, 0, 2), Variable(0, "d", {.format = code << 16 | 99 << 8 | 200}), End,
                              0.0, 13000000000.0);
        EXPECT_EQ(Render(Read(file)), "d V-6347|144115.962962963");
        const Column& column = *Column_At(Current_Sheet, 1);
        EXPECT_EQ(
            std::tuple(column.format, column.date_format, column.date_form, column.decimals, column.width),
            std::tuple(5, display, 1, 16, 90));
        const bool duration = code == 21 || code == 25;
        EXPECT_EQ(Render(Read(file, All_For_People)),
                  duration ? "d V0|150462.962962963" : "d V-6347|144115.962962963");
    }
}

TEST_F(Spss_System, Texts_Are_Cut_For_Hosts_And_Whole_For_People)
{
    const std::string text = "  " + std::string(87, 'x') + " " + std::string(210, 'y');
    const Items records = Of(Variable(255, "V"), Further(31), Variable(48, "V0"), Further(5),
                             Variable(8, "S"), Extension(14, "V=00300\0\t"s), End);
    // The first 255 bytes lie in the first piece, the others behind it.
    const Items cases =
        Of(Raw{Padded(text.substr(0, 255), 256)}, Raw{Padded(text.substr(255), 48)}, Raw{"        "});
    EXPECT_EQ(Render(Read(Of(Head(39, 0, 1), records, cases))),
              "V T" + std::string(87, 'x') + "; V0 T" + std::string(45, 'y') + "; S T");
    EXPECT_EQ(Render(Read(Of(Head(39, 0, 1), records, cases), [] { Get_Settings().trim_cells = 0; })),
              "V T  " + std::string(87, 'x') + "; V0 T" + std::string(45, 'y') + "; S T");
    EXPECT_EQ(request.losses.Entries().size(), 1U);
    EXPECT_EQ(Render(Read(Of(Head(39, 0, 1), records, cases), All_For_People)), "V L298 characters; S T");
    EXPECT_TRUE(request.losses.Entries().empty());
}

TEST_F(Spss_System, For_People_Texts_Have_Labels_Missing_Values_And_A_Code)
{
    const auto word = [](std::int32_t number) { return Bytes_Of(number, std::endian::little); };
    const auto counted = [&](const std::string& text) {
        return word(static_cast<std::int32_t>(text.size())) + text;
    };
    const std::string labels = counted("aText") + word(12) + word(1) + counted(Padded("long one", 12))
                               + counted("Gr\xF6\xDF"
                                         "e");
    const std::string missing = counted("aText") + "\1" + word(8) + "none    ";
    const Items records =
        Of(Variable(12, "T",
                    {"Gr\xF6\xDF"
                     "e"}),
           Further(1), Variable(8, "U", {"", 1}), Raw{"gone    "}, Extension(13, "T=aText"),
           Extension(21, labels), Extension(22, missing), Extension(20, "windows-1252"), End);
    const Items cases =
        Of(Raw{Padded("long one", 16)}, Raw{"gone    "}, Raw{Padded("none", 16)}, Raw{"\xE4       "});
    const std::string file = File(Of(Head(3, 0, 2), records, cases));
    EXPECT_EQ(Render(Read(file)), "aText Tlong one|none; U Tgone|\xE4");
    EXPECT_EQ(Render(Read(file, All_For_People)), "aText F1|*; U T|ä");
    EXPECT_EQ(Levels_Of(Current_Sheet), "Größe");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "Größe");
    Read(file, [] {
        All_For_People();
        request.Input_Encoding = "850";
    });
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "Gr÷▀e");
    const std::string page = std::string(28, '\0') + word(1250);
    EXPECT_EQ(Render(Read(Of(Head(1, 0, 1), Variable(8, "T"), Extension(3, page), End, Raw{"\xB9       "}),
                          All_For_People)),
              "T Tą");
}

/// Of bytes that fit one block, which are kept as they are.
std::string Zlib_Stream(const std::string& bytes)
{
    std::uint32_t a = 1;
    std::uint32_t b = 0;
    for (const char c : bytes) {
        a = (a + static_cast<std::uint8_t>(c)) % 65521;
        b = (b + a) % 65521;
    }
    const auto length = static_cast<std::uint16_t>(bytes.size());
    return "\x78\x01\x01" + Bytes_Of(length, std::endian::little)
           + Bytes_Of(static_cast<std::uint16_t>(~length), std::endian::little) + bytes
           + Bytes_Of(b << 16 | a, std::endian::big);
}

TEST_F(Spss_System, Packed_Cases_Are_For_People)
{
    std::string file = File(Of(Head(1, 2, 3), Variable(0, "x"), End));
    file[3] = '3';
    const std::string blocks = Zlib_Stream("\x65\x66\xFD\xFC\x01\x01\x01\x01") + Zlib_Stream(File(Of(0.5)));
    const auto place = static_cast<std::int64_t>(file.size());
    file += Bytes_Of(place, std::endian::little)
            + Bytes_Of(place + 24 + static_cast<std::int64_t>(blocks.size()), std::endian::little)
            + Bytes_Of(std::int64_t{48}, std::endian::little) + blocks + std::string(48, '?');
    EXPECT_EQ(Render(Read(file, All_For_People)), "x V1|2|0.5");
    EXPECT_EQ(Read(file), nullptr);
    Damage(Read_Spss_System, file, "t.sav", All_For_People);
}

TEST_F(Spss_System, What_Is_Refused_And_What_Is_Told)
{
    const Items one = Of(Variable(0, "x"), End, 1.0);
    const auto layout = [&](std::int32_t code, const std::string& product) {
        return File(Of(Raw{"$FL2"}, Raw{Padded(product, 60)}, code, 1, 0, 0, 1, 100.0,
                       Raw{std::string(84, ' ')}, one));
    };
    const Reader_Case cases[] = {
        {"not its magic", "$FL1" + File(Of(Head(1, 0, 1), one)).substr(4), ""},
        {"another product", layout(2, "@(#) SPSX"), "x V1", {},
         "Warning: t.sav may not be in standard SPSS windows format.\n"},
        {"layout 3", layout(3, "@(#) SPSS DATA FILE"), "x V1", {},
         "Warning: t.sav is not in standard SPSS windows format.\n"},
        {"layout 4", layout(4, "@(#) SPSS DATA FILE"), ""},
        {"no cases", File(Of(Head(1, 0, 0), one)), ""},
        {"none that could be counted", File(Of(Head(1, 0, -1), Variable(0, "x"), End)), ""},
        {"no slots", File(Of(Head(0, 0, 1), one)), ""},
        {"no variables", File(Of(Head(1, 0, 1), End, 1.0)), ""},
        {"a type below -1", File(Of(Head(1, 0, 1), Variable(-2, "x"), End, 1.0)), ""},
        {"a text without all its slots", File(Of(Head(1, 0, 1), Variable(9, "x"), End, 1.0)), ""},
        {"an unknown record", File(Of(Head(1, 0, 1), Variable(0, "x"), 5, End, 1.0)), ""},
        {"a label for slots that aren't there, and a further one",
         File(Of(Head(2, 0, 1), Variable(9, "x"), Further(1), Of(3, 1, One_Label(1.0, "a"), 4, 4, 0, -1, 2, 9),
                 End, Raw{Padded("a", 16)})),
         "x Ta"},
        {"half a case", File(Of(Head(1, 0, 2), Variable(0, "x"), End, 1.0, Raw{"1234567"})), "x V1"},
        {"columns beyond the greatest number", File(Of(Head(2, 0, 1), Variable(0, "x"), Variable(0, "y"), End, 1.0, 2.0)),
         "x V1", [] { request.Max_Columns = 1; }, "Warning Columns above 1 NOT transfered.\n"},
        {"columns and rows that are left out",
         File(Of(Head(2, 0, 3), Variable(0, "x"), Variable(0, "y"), End, 1.0, 2.0, 3.0, 4.0, 5.0, 6.0)), "y V2|6",
         [] {
             request.Subset_Columns = request.Subset_Rows = true;
             request.Subset_Names = {"y"};
             request.Subset_Row_Flags = {1, 0, 1};
         }},
    };
    Try_Bytes(Read_Spss_System, "t.sav", cases);
}

TEST_F(Spss_System, Damaged_Files_Are_Refused_Or_Read)
{
    const Items records = Of(Variable(0, "NUM", {"label", -3, {1.0, 2.0, 9.0}}), Variable(12, "TEXT"),
                             Further(1), Labels, Extension(13, "NUM=aNumber"), End);
    const Items plain =
        Of(Head(3, 0, 2, 1), records, 5.0, Raw{Padded("0123456789", 16)}, 7.0, Raw{Padded("", 16)});
    const Items coded = Of(Head(3, 1, -1), records, Raw{"\x69\xFE\xFE\xFF\xFD\xFD\x69\xFE"}, Raw{"01234567"},
                           Raw{"89      "});
    for (const std::endian order : {std::endian::little, std::endian::big}) {
        Damage(Read_Spss_System, File(plain, order), "t.sav");
        Damage(Read_Spss_System, File(coded, order), "t.sav", All_For_People);
    }
}

}  // namespace

}  // namespace ingester

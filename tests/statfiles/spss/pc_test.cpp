// System files of PC+ releases, section by section.
#include "statfiles/shared/stat_fixture.h"
#include "statfiles/spss/spss.h"

namespace ingester {

namespace {

using namespace std::string_literals;

constexpr double Sysmis = -1.66e308;

struct Pc_File {
    std::int32_t mark = 2;
    std::int32_t labels_mark = 3;
    std::int32_t labels_length = -1;  ///< below 0: what they take
    std::int16_t cases = 3;
    std::int32_t general_place = 40, variables_place = -1, labels_place = -1, data_place = -1;
    std::string data = {};
};

std::string Word(std::int16_t value, std::endian order)
{
    return Bytes_Of(value, order);
}

std::string Variable(std::endian order, const std::string& name, char type, double missing = Sysmis,
                     std::int32_t values = 0, std::int32_t end = 0, std::int32_t label = 0)
{
    return Encode(Of(values, end, label, Raw{"\2\x08"s + type + '\0'}, Raw{Padded(name, 8)}, missing), order);
}

std::string Bytes(const Pc_File& file, std::endian order = std::endian::little)
{
    const std::string labels = Encode(Of(1.0, Raw{"\3one"}, 2.0, Raw{"\3two"}), order) + "\5Label";
    const auto values_end = static_cast<std::int32_t>(labels.size()) - 6;
    const std::string variables =
        Variable(order, "$CASENUM", 5) + Variable(order, "$DATE", 1) + Variable(order, "$WEIGHT", 5)
        + Variable(order, "N", 5, 9.0, 1, values_end, values_end + 1) + Variable(order, "$T", 1)
        + Variable(order, "", 0) + Variable(order, "Q", 7);
    const std::string general = std::string(64, ' ') + Encode(Of(Sysmis), order) + std::string(12, '\0')
                                + Word(7, order) + Word(file.cases, order) + std::string(88, ' ');
    const auto length = static_cast<std::int32_t>(labels.size());
    const auto variables_place = static_cast<std::int32_t>(40 + general.size());
    const auto labels_place = variables_place + static_cast<std::int32_t>(variables.size());
    const auto data_place = labels_place + 8 + length;
    const auto place = [](std::int32_t wanted, std::int32_t usual) { return wanted < 0 ? usual : wanted; };
    const std::int32_t told = file.labels_length < 0 ? length : file.labels_length;
    return Encode(Of(file.mark, 0, file.general_place, 0, place(file.variables_place, variables_place), 0,
                     place(file.labels_place, labels_place), told, place(file.data_place, data_place), 0),
                  order)
           + general + variables + Encode(Of(file.labels_mark, told), order) + labels + file.data;
}

/// Three cases of seven slots: the third one has a number that takes eight bytes.
std::string Three_Cases(std::endian order)
{
    return "\x6A\1\x6A\x6A\1\1\0\x6B"s + "01/01/26" + "abcdefgh" + "ij      " + "\1\0\x72\1\0\0\x6C\1"s
           + "01/01/26" + "short   " + "01/01/26" + "\0\1\4\4\0\2\0\0"s + Encode(Of(1.0), order);
}

class Spss_Pc : public Stat_Test {
protected:
    static std::string Read(const std::string& bytes, const Change& change = {})
    {
        return Render(Read_Bytes(Read_Spss_Pc, bytes, "t.sys", change));
    }
};

TEST_F(Spss_Pc, Variables_Labels_And_Cases)
{
    for (const std::endian order : {std::endian::little, std::endian::big}) {
        EXPECT_EQ(Read(Bytes({.data = Three_Cases(order)}, order)), "N F1|*|1; %T Tabcdefghij|short|");
        EXPECT_EQ(Levels_Of(Current_Sheet), "one");
        EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "Label");
    }
    EXPECT_EQ(
        Read(Bytes({.data = Three_Cases(std::endian::little)}), [] { request.Add_Unused_Labels = true; }),
        "N F1|*|1; %T Tabcdefghij|short|");
    EXPECT_EQ(Levels_Of(Current_Sheet), "1=one 2=two");
    EXPECT_EQ(
        Read(Bytes({.data = Three_Cases(std::endian::little)}), [] { Get_Settings().ignore_value_case = 1; }),
        "N F1|2|1; %T Tabcdefghij|short|");
    EXPECT_EQ(Read(Bytes({.labels_length = 0, .labels_place = 0, .data = Three_Cases(std::endian::little)})),
              "N V1|*|1; %T Tabcdefghij|short|");
    for (const std::endian order : {std::endian::little, std::endian::big})
        Damage(Read_Spss_Pc, Bytes({.data = Three_Cases(order)}, order), "t.sys");
}

TEST_F(Spss_Pc, What_Is_Refused)
{
    const std::string cannot = "Cannot read SPSS/PC+ data file t.sys.\n";
    const std::string data = Three_Cases(std::endian::little);
    const std::string great = "\x6A\1\x6A\1\4\4\0\2"s + "01/01/26" + Encode(Of(1e308));
    const Reader_Case cases[] = {
        {"another mark",
         Bytes({.mark = 4, .data = data}),
         "",
         {},
         "SPSS/PC+ file t.sys is not in standard format.\n" + cannot},
        {"no cases",
         Bytes({.cases = 0, .data = data}),
         "",
         {},
         "No valid data in SPSS/PC+ file t.sys.\n" + cannot},
        {"no general section",
         Bytes({.general_place = 1 << 20, .data = data}),
         "",
         {},
         "Variable definition data not found in SPSS/PC+ file.\n" + cannot},
        {"no variables",
         Bytes({.variables_place = 1 << 20, .data = data}),
         "",
         {},
         "Variable definition data not found in SPSS/PC+ file.\n" + cannot},
        {"no labels",
         Bytes({.labels_place = 1 << 20, .data = data}),
         "",
         {},
         "Values definition data not found in SPSS/PC+ file.\n" + cannot},
        {"another mark of labels",
         Bytes({.labels_mark = 4, .data = data}),
         "",
         {},
         "SPSS/PC+ Value stream is invalid.\n" + cannot},
        {"labels of no length",
         Bytes({.labels_length = 1, .data = data})
             .replace(28 + 0, 4, Bytes_Of(std::int32_t{5}, std::endian::little)),
         "N V1|*|1; %T Tabcdefghij|short|"},
        {"no data",
         Bytes({.data_place = 1 << 20, .data = data}),
         "",
         {},
         "Record data not found in SPSS/PC+ file.\n" + cannot},
        {"no whole case", Bytes({.data = "\x6A\2"s}), "", {}, cannot},
        {"a great number",
         Bytes({.data = great}),
         "N F1; %T T",
         {},
         "Numbers greater than 9.99999E+307 have been set to this value.\n"},
    };
    Try_Bytes(Read_Spss_Pc, "t.sys", cases);
    std::string no_length = Bytes({.data = data});
    const auto labels = static_cast<std::size_t>(Number_At<std::int32_t>(no_length.data() + 24));
    no_length.replace(labels + 4, 4, std::string(4, '\0'));
    EXPECT_EQ(Read(no_length), "");
    EXPECT_EQ(Messages(), "SPSS/PC+ Value stream length is invalid.\n" + cannot + ":\n");
    EXPECT_FALSE(Read_Spss_Pc_File("none.sys"));
    EXPECT_EQ(Messages(), "SPSS data file none.sys not found.\n:\n");
}

}  // namespace

}  // namespace ingester

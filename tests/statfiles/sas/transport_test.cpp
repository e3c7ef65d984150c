// Transport files built record by record, and those that are written.
#include "statfiles/sas/sas.h"
#include "statfiles/sas/sas_numbers.h"
#include "statfiles/shared/stat_fixture.h"

namespace ingester {

namespace {

using namespace std::string_literals;

std::string Header(const std::string& kind, const std::string& rest = "")
{
    return Padded("HEADER RECORD*******" + Padded(kind, 8) + "HEADER RECORD!!!!!!!" + Padded(rest, 30, '0'),
                  80);
}

std::string Ibm(double number)
{
    std::string bytes(8, '\0');
    Double_To_Ibm(number, reinterpret_cast<std::byte*>(bytes.data()));
    return bytes;
}

struct Told {
    std::int16_t type = 1, length = 8;
    std::string name = "X", label = {}, format = {};
    std::int16_t decimals = 0;
    std::string behind = std::string(52, ' ');
};

template <class T> std::string Big(T value)
{
    return Bytes_Of(value, std::endian::big);
}

std::string Namestr(const Told& told, std::int32_t place)
{
    const auto zero = Big(std::int16_t{0});
    return Big(told.type) + zero + Big(told.length) + zero + Padded(told.name, 8) + Padded(told.label, 40)
           + Padded(told.format, 8) + zero + Big(told.decimals) + zero + zero + std::string(8, ' ') + zero
           + zero + Big(place) + Padded(told.behind, 52);
}

std::string To_80(const std::string& bytes)
{
    return Padded(bytes, (bytes.size() + 79) / 80 * 80);
}

const std::string Library = Header("LIBRARY") + Padded("SAS     SAS     SASLIB", 80) + Padded("", 80);

std::string Member(const std::vector<Told>& variables, const std::string& data,
                   const std::string& name = "DATA", std::size_t size = 140)
{
    std::string described;
    std::int32_t place = 0;
    for (const Told& told : variables) {
        described += Namestr(told, place).substr(0, size);
        place += told.length;
    }
    const std::string count = Format_Text("000000%04d", static_cast<int>(variables.size()));
    return Header("MEMBER", "0000000000000000016000000" + std::to_string(size))
               .replace(75, 5, std::to_string(size) + "  ")
           + Header("DSCRPTR") + Padded("SAS     " + Padded(name, 8) + "SASDATA 6.06", 80) + Padded("", 80)
           + Header("NAMESTR", count) + To_80(described) + Header("OBS") + To_80(data);
}

class Sas_Transport : public Stat_Test {
protected:
    static Sheet* Read(const std::string& bytes, const Change& change = {})
    {
        return Read_Bytes(Read_Sas_Transport, bytes, "t.xpt", change);
    }
    /// A file of one number.
    static std::string One(const Told& told, double number) { return Library + Member({told}, Ibm(number)); }

    [[nodiscard]] std::string Written(Sheet* sheet) const
    {
        EXPECT_TRUE(Write_Sas_Transport(sheet, Path("w.xpt").c_str()));
        return Get("w.xpt");
    }
};

TEST_F(Sas_Transport, Numbers_And_Texts)
{
    const std::vector<Told> variables = {{1, 8, "NUM", "Number", "", 2}, {2, 5, "TEXT"}, {1, 3, "", "short"}};
    const std::string rows = Ibm(1.5) + " ab  " + Ibm(3).substr(0, 3) + Ibm(Sas_Missing_Number('A')) + "     "
                             + Ibm(-7).substr(0, 3);
    for (const std::size_t size : {140U, 136U}) {
        EXPECT_EQ(Render(Read(Library + Member(variables, rows, "D", size))),
                  "NUM V1.5|*; TEXT T ab|; C3 V3|-7");
        const Column& column = *Column_At(Current_Sheet, 1);
        EXPECT_EQ(std::tuple(column.format, column.decimals, column.extra.view()),
                  std::tuple(3, 2, "Number"));
        EXPECT_EQ(Column_At(Current_Sheet, 3)->decimals, -1);
    }
    EXPECT_EQ(Current_Sheet->sheet_name, "D");
    Read(Library + Member(variables, rows), All_For_People);
    EXPECT_EQ(request.losses.Entries()[0].kind, Loss_Kind::missing_codes_merged);
    EXPECT_EQ(request.losses.Entries()[0].example, ".A");
    Damage(Read_Sas_Transport, Library + Member(variables, rows), "t.xpt");
}

TEST_F(Sas_Transport, The_Label_Of_Hosts_Goes_On_Up_To_A_NUL)
{
    const std::string file = One({1, 8, "X", "Label", "BEST"}, 1);
    Read(file);
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "Label                                   BEST");
    Read(file, All_For_People);
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "Label");
}

TEST_F(Sas_Transport, Dates_By_Their_Formats)
{
    const struct {
        std::string format;
        int display;
        double value;
        int people_display;
        double people_value;
    } cases[] = {
        {"DATE", 10, 131427, 10, 131428},
        {"datetime", 33, 131427, 33, 131428},
        {"TIME", 36, 131427, 36, 131428},
        {"TOD", 1, 0, 36, 131428},
        {"TOD\0"s, 33, 131427, 33, 131428},
        {"DAY", 1, 0, 10, 131428},
        {"DAY\0"s, 10, 131427, 10, 131428},
        {"MMDDYY", 10, 131427, 10, 131428},
        {"YYQ\0"s, 10, 131427, 10, 131428},
        {"QTRR", 10, 131427, 10, 131428},
        {"WORDDATX", 10, 131427, 10, 131428},
        {"HHMM", 36, 131427, 36, 131428},
        {"E8601DA", 1, 0, 27, 131428},
        {"E8601DT", 1, 0, 34, 131428},
        {"B8601DT", 1, 0, 34, 131428},
        {"IS8601DA", 1, 0, 27, 131428},
        {"DTDATE", 1, 0, 33, 131428},
        {"E8601TM", 1, 0, 36, 131428},
        {"BEST", 1, 0, 1, 0},
    };
    for (const auto& tried : cases) {
        const std::string file = One({1, 8, "X", "", tried.format}, 0);
        Read(file);
        EXPECT_EQ(Column_At(Current_Sheet, 1)->date_format, tried.display) << tried.format;
        EXPECT_EQ(Column_At(Current_Sheet, 1)->first_cell->value.number, tried.value) << tried.format;
        Read(file, All_For_People);
        EXPECT_EQ(Column_At(Current_Sheet, 1)->date_format, tried.people_display) << tried.format;
        EXPECT_EQ(Column_At(Current_Sheet, 1)->first_cell->value.number, tried.people_value) << tried.format;
    }
    EXPECT_EQ(Render(Read(One({1, 8, "X", "", "DATETIME"}, 43200))), "X V131427.5");
}

TEST_F(Sas_Transport, Members_By_Name_And_Number)
{
    const std::string two =
        Library + Member({{1, 8, "A"}}, Ibm(1), "FIRST") + Member({{1, 8, "B"}}, Ibm(2), "SECONDLY");
    const auto choose = [&](const std::string& name) {
        const std::string sheet = Render(Read(two, [&] { request.Worksheet_Name = name; }));
        return sheet + "," + Messages();
    };
    const auto inexact = [](const std::string& found, const std::string& asked) {
        return "Warning: inexact match on sheet name: '" + found + "' selected for '" + asked + "'.\n:\n";
    };
    EXPECT_EQ(Render(Read(two)), "A V1");
    EXPECT_EQ(choose("2"), "B V2,");
    EXPECT_EQ(choose("secondly"), "B V2,");
    EXPECT_EQ(choose("SECO"), "B V2," + inexact("SECONDLY", "SECO"));
    EXPECT_EQ(choose("FIRSTLY"), "A V1," + inexact("FIRST", "FIRSTLY"));
    EXPECT_EQ(choose("3"), ",Specifed sheet name not found in SAS Transport file.\n:\n");
    EXPECT_EQ(choose("X"), ",Specifed sheet name not found in SAS Transport file.\n:\n");
    EXPECT_EQ(Render(Read(two, [] { request.List_Sheets_Only = true; })), "Worksheets TFIRST|SECONDLY");
    const std::string one = Library + Member({{1, 8, "A"}}, Ibm(1));
    EXPECT_EQ(Render(Read(one, [] { request.Worksheet_Name = "none"; })), "A V1");
}

TEST_F(Sas_Transport, Padding_Is_No_Data_But_Blank_Rows_Are)
{
    const auto file = [](const std::string& data) { return Library + Member({{2, 8, "T"}}, data); };
    EXPECT_EQ(Render(Read(file(Padded("a", 8) + Padded("", 8) + Padded("b", 8)))), "T Ta");
    EXPECT_EQ(Render(Read(file(Padded("", 80) + Padded("b", 8)))), "T T||||||||||b");
    EXPECT_EQ(Render(Read(file(Padded("", 72) + Padded("b", 8)))), "");
    EXPECT_EQ(Messages(), "All SAS Transport records are blank.\n:\n");
    // Rows may look like the head of another member.
    EXPECT_EQ(
        Render(Read(Library + Member({{2, 80, "T"}}, Header("MEMBER") + Padded("x", 80)))).substr(0, 10),
        "T THEADER ");
}

TEST_F(Sas_Transport, Exponents_Beyond_Doubles_Are_Told)
{
    const std::string file = Library + Member({{}}, Ibm(1e76) + Ibm(1e-80) + Ibm(7.2e75) + Ibm(2));
    EXPECT_EQ(Render(Read(file)), "X V*|0|*|2");
    EXPECT_EQ(Messages(),
              "SAS Transport Conversion Warnings\n \nExponent overflow in Column X at row 1.\n"
              "Exponent overflow in Column X at row 2.\nExponent overflow in Column X at row 3.\n"
              "3 values in: t.xpt\noverflowed the 7 bit exponent in the SAS XPORT numerical format.\n"
              "The values where abs(X) > 1e+76 or abs(X) < 1e-76\n"
              "have been set to missing or zero respectively.\n"
              "A summary of this is detailed in the file "
                  + Message_File_Name() + ".\n:\n");
}

TEST_F(Sas_Transport, What_Is_Refused)
{
    const std::string good = Library + Member({{}}, Ibm(1));
    const auto changed = [&](std::size_t at, const std::string& bytes) {
        return std::string(good).replace(at, bytes.size(), bytes);
    };
    const std::string none = "The file is not a SAS transport file.\n";
    const std::string unreadable = "Cannot successfully read SAS transport file.\n";
    const auto text = [](int length) {
        return Library
               + Member({{2, static_cast<std::int16_t>(length), "T"}},
                        Padded("a", static_cast<std::size_t>(std::max(length, 1))));
    };
    const auto number = [](int length) {
        return Library + Member({{1, static_cast<std::int16_t>(length)}}, std::string(200, 'A'));
    };
    const Reader_Case cases[] = {
        {"no header", changed(0, "X"), "", {}, none},
        {"not of SAS", changed(88, "X"), "", {}, none},
        {"no member", Library, "", {}, none},
        {"a record of 100", changed(240 + 75, "100"), "", {}, unreadable},
        {"a lost header", changed(240 + 4 * 80, "X"), "", {}, unreadable},
        {"no data header",
         changed(240 + 7 * 80, "X"),
         "",
         {},
         "No Data header found in SAS transport file.\n"},
        {"no variables", Library + Member({}, Ibm(1)), "", {}, "SAS transport file t.xpt is empty.\n"},
        {"no rows", Library + Member({{}}, ""), "", {}, "SAS transport file t.xpt is empty.\n"},
        {"a number of two bytes", number(2), "", {}, unreadable},
        {"a number of nine bytes", number(9), "", {}, unreadable},
        {"a text of 0", Library + Member({{2, 0, "T"}, {}}, Ibm(1)), "", {}, unreadable},
        {"a text of 201", text(201), "", {}, unreadable},
        {"a text of 91",
         text(91),
         "T Ta",
         {},
         "Columns containing text longer than 90 have been truncated to this length.\n"},
        {"another type", Library + Member({{3, 8, "Z"}, {}}, Ibm(1) + Ibm(2)), "X V2"},
        {"too many columns", Library + Member({{}, {1, 8, "Y"}}, Ibm(1) + Ibm(2)), "X V1",
         [] { request.Max_Columns = 1; },
         "Too many variables in SAS dataset, only the first 1 will be imported."},
    };
    Try_Bytes(Read_Sas_Transport, "t.xpt", cases);
}

TEST_F(Sas_Transport, Version_8_Is_For_People)
{
    const std::string name = "a_long_name_of_version_8";
    const std::string label(60, 'l');
    const std::string long_label = Big(std::int16_t{1}) + Big(static_cast<std::int16_t>(name.size()))
                                   + Big(static_cast<std::int16_t>(label.size())) + name + label;
    const std::string file = Header("LIBV8") + Padded("SAS     SAS     SASLIB", 80) + Padded("", 80)
                             + Header("MEMBV8").replace(75, 3, "140") + Header("DSCPTV8")
                             + Padded("SAS     " + Padded("a_long_member", 32) + "SASDATA", 80)
                             + Padded("", 80) + Header("NAMSTV8", "0000000002")
                             + To_80(Namestr({1, 8, "a_long_n", "", "", 0, Padded(name, 32)}, 0)
                                     + Namestr({2, 300, "T", "", "", 0, Padded("Text", 32)}, 8))
                             + Header("LABELV8", "1                             ") + To_80(long_label)
                             + Header("OBSV8") + To_80(Ibm(4) + Padded(std::string(250, 't'), 300));
    EXPECT_EQ(Render(Read(file, All_For_People)), name + " V4; Text L250 characters");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, label);
    EXPECT_EQ(Current_Sheet->sheet_name, "a_long_member");
    EXPECT_EQ(Read(file), nullptr);
    Damage(Read_Sas_Transport, file, "t.xpt", All_For_People);
}

// --- Written -------------------------------------------------------------------------------------------

TEST_F(Sas_Transport, Every_Type_Of_Column_Is_Written)
{
    Sheet* const sheet = New_Sheet_With_Rows(2);
    sheet->source_file = "\\data\\my crops+.v1.csv";
    Add_Cells(sheet, variate_column, "a[1]", {"1", "*"})->decimals = 2;
    Column& day = *Add_Cells(sheet, variate_column, "longername1", {"131428", "*"});
    Column& moment = *Add_Cells(sheet, variate_column, "longername2", {"131428.5", "*"});
    Column& time = *Add_Cells(sheet, variate_column, "longername3", {"0.5", "131427.25"});
    Column& serial = *Add_Cells(sheet, variate_column, "s%", {"21916", "*"});
    for (Column* const column : {&day, &moment, &time, &serial}) {
        column->format = date_format_mark;
        column->date_form = 1;
    }
    serial.date_form = 0;
    moment.date_format = 33;
    time.date_format = 36;
    Add_Cells(sheet, text_column, "t", {"ab", ""})->extra = "A text";
    Add_Cells(sheet, factor_column, "f", {"2", "*"})->nlevels = 2;
    Put_Levels(*Add_Cells(sheet, factor_column, "v", {"2", "*"}), {5, 7});
    Put_Levels(*Add_Cells(sheet, factor_column, "l", {"2", "*"}), {5, 7}, {"x", "wide"});
    const std::string file = Written(sheet);
    EXPECT_EQ(file.size() % 80, 0U);
    EXPECT_EQ(file.substr(0, 80), Header("LIBRARY"));
    EXPECT_EQ(file.substr(80, 64), "SAS     SAS     SASLIB  6.12    WIN_NT                          ");
    EXPECT_EQ(file.substr(160, 16), file.substr(144, 16));
    EXPECT_EQ(file.substr(240, 80), Header("MEMBER", "000000000000000001600000000140"));
    EXPECT_EQ(file.substr(400, 32), "SAS     my_cropsSASDATA 6.12    ");
    EXPECT_EQ(file.substr(560, 80), Header("NAMESTR", "0000000009"));
    EXPECT_EQ(file.substr(640, 16), "\0\1\0\0\0\x08\0\x08"
                                    "a_1_    "s);
    EXPECT_EQ(file.substr(640 + 56, 32), "        \0\0\0\2\0\0\0\0        \0\0\0\0\0\0\0\0"s);
    EXPECT_EQ(file.substr(640 + 140 + 56, 32), "DATE    \0\x09\0\0\0\0\0\0DATE    \0\x09\0\0\0\0\0\x08"s);
    EXPECT_EQ(file.substr(640 + 280 + 8, 8), "longern1");
    EXPECT_EQ(file.substr(640 + 420 + 8, 8), "longern2");
    EXPECT_EQ(file.substr(640 + 280 + 56, 12), "DATETIME\0\x14\0\0"s);
    EXPECT_EQ(file.substr(640 + 420 + 56, 12), "TIME    \0\x08\0\0"s);
    EXPECT_EQ(file.substr(640 + 5 * 140, 2), "\0\2"s);
    EXPECT_EQ(file.substr(640 + 5 * 140 + 16, 40), Padded("A text", 40));
    const std::size_t data = file.size() - 160;
    EXPECT_EQ(file.substr(data - 80, 80), Header("OBS"));
    EXPECT_EQ(file.substr(data),
              To_80(Ibm(1) + Ibm(1) + Ibm(1.5 * 86400) + Ibm(43200) + Ibm(1) + "ab" + Ibm(2) + Ibm(7) + "wide"
                    + "." + std::string(7, '\0') + "." + std::string(7, '\0') + "." + std::string(7, '\0')
                    + Ibm(21600) + "." + std::string(7, '\0') + "  " + "." + std::string(7, '\0') + "."
                    + std::string(7, '\0') + "    "));
    EXPECT_EQ(Render(Read(file)),
              "a_1_ V1|*; longerna V131428|*; longern1 V131428.5|*; longern2 V131427.5|131427.25; "
              "sp V131428|*; t Tab|; f V2|*; v V7|*; l Twide|");
}

TEST_F(Sas_Transport, For_People_Day_0_Is_1_January_1960)
{
    for (const bool people : {false, true}) {
        Start_Request("t");
        if (people)
            All_For_People();
        Column& day = *Lone_Column(variate_column, {"131428"});
        day.format = date_format_mark;
        day.date_form = 1;
        const std::string file = Written(day.sheet);
        EXPECT_EQ(file.substr(file.size() - 80, 8), Ibm(people ? 0 : 1));
        EXPECT_EQ(Render(Read(file, people ? Change(All_For_People) : Change{})), "x V131428");
    }
}

TEST_F(Sas_Transport, A_Symmetric_Matrix_Is_Missing_Above_Its_Diagonal)
{
    Sheet* const sheet = New_Sheet_With_Rows(2);
    sheet->type = symmetric_matrix_sheet;
    Add_Cells(sheet, symmetric_matrix_column, "1", {"1", "2"});
    Add_Cells(sheet, symmetric_matrix_column, "2", {"3"});
    const std::string file = Written(sheet);
    EXPECT_EQ(file.substr(file.size() - 80), To_80(Ibm(1) + "." + std::string(7, '\0') + Ibm(2) + Ibm(3)));
}

TEST_F(Sas_Transport, What_The_Format_Lacks_Is_Told)
{
    Start_Request("t");
    Sheet* sheet = New_Sheet_With_Rows(1);
    Add_Cells(sheet, long_text_column, "t", {std::string(201, 'x')});
    Add_Cells(sheet, variate_column, "n", {"1e80"});
    EXPECT_EQ(Render(Read(Written(sheet), [] { All_For_People(); })), "t L200 characters; n V*");
    Start_Request("t");
    sheet = New_Sheet_With_Rows(1);
    Add_Cells(sheet, long_text_column, "t", {std::string(201, 'x')});
    static_cast<void>(Written(sheet));
    EXPECT_EQ(Messages(), "Columns containing text longer than 200 have been truncated to this length.\n:\n");
    EXPECT_EQ(request.losses.Entries()[0].kind, Loss_Kind::text_cut);
    EXPECT_FALSE(Write_Sas_Transport(New_Sheet(), Path("n.xpt").c_str()));
    EXPECT_EQ(Messages(), "");
    EXPECT_FALSE(Write_Sas_Transport(sheet, Path("none/n.xpt").c_str()));
    EXPECT_EQ(Messages(), "Write SAS Tranport file - could not open file " + Path("none/n.xpt").substr(0, 100)
                              + ".\n:\n");
    for (int i = 1; i < 10000; ++i)
        Add_Cells(sheet, variate_column, "same_name", {"1"});
    EXPECT_FALSE(Write_Sas_Transport(sheet, Path("n.xpt").c_str()));
    EXPECT_EQ(Messages(), "Too many columns for a SAS transport file (the maximum is 9999).\n:\n");
}

}  // namespace

}  // namespace ingester

#include "model/calendar.h"
#include "model/date_format.h"
#include "model/date_text.h"
#include "model/number_format.h"
#include "model/text_columns.h"
#include "request/people_rules.h"
#include "support/cell_lists.h"

#include <cmath>
#include <random>

namespace ingester {
namespace {

constexpr double gone = Missing_Value;

using Dates = Request_Test;

std::string Shown(double value, std::int32_t form, std::int32_t format)
{
    char text[Number_Text_Room];
    return {text, Format_Date_Time(text, value, form, format)};
}

/// What a text reads as, to the second; "no" for no date.
std::string Read(std::string_view text, std::int32_t format, bool strict)
{
    double value;
    const bool good = Text_To_Date(text, value, 1, format, gone, strict);
    EXPECT_TRUE(good || value == gone) << text;
    return good ? Shown(value, 1, 34) : "no";
}

TEST_F(Dates, Days_Have_Numbers_In_Both_Forms)
{
    struct Case {
        std::int32_t day, month, year;
        double serial, count;
    };
    const Case cases[] = {
        {1, 1, 1900, 1, 109514},   {28, 2, 1900, 59, 109572}, {29, 2, 1900, 60, 109573},
        {1, 3, 1900, 61, 109573},  {31, 12, 1899, 0, 109513}, {31, 12, 9999, 2958465, 3067977},
        {1, 3, 1600, 1, 1},        {29, 2, 1600, 0, 0},       {1, 2, 3, 1128, 110640},
        {1, 1, 99, 36161, 145673}, {1, 3, 1599, 0, 0},        {29, 2, 2100, 73110, 182622},
        {29, 2, 2001, gone, gone}, {31, 4, 2000, gone, gone}, {0, 1, 2000, gone, gone},
        {1, 13, 2000, gone, gone}, {1, 0, 2000, gone, gone},
    };
    for (const Case& day : cases) {
        EXPECT_EQ(Date_To_Number(day.day, day.month, day.year), day.serial) << day.count;
        EXPECT_EQ(Date_To_Number(day.day, day.month, day.year, 1), day.count) << day.serial;
    }
    EXPECT_LT(std::fabs(Today_Number(1) - Today_Number(0) - Serial_Offset), 1e-3);
}

TEST_F(Dates, Every_Day_Goes_Forth_And_Back)
{
    for (const std::int32_t form : {0, 1}) {
        Calendar_Date before = Number_To_Date(0, form);
        for (std::int32_t number = 0; number < Max_Date(form); ++number) {
            const auto [day, month, year] = Number_To_Date(number, form);
            const double back =
                Date_To_Number(static_cast<std::int32_t>(day), static_cast<std::int32_t>(month),
                               static_cast<std::int32_t>(year), form);
            const bool follows = number == 0 || (day == before.day + 1 && month == before.month)
                                 || (day == 1 && (month == before.month + 1 || (month == 1 && day == 1)));
            ASSERT_TRUE(back == number && follows) << number << " in form " << form;
            before = {day, month, year};
            double moved = number + 0.25;
            if (form == 0 && number != 60) {
                Serial_To_Day_Count(moved, gone);
                Day_Count_To_Serial(moved, gone);
                ASSERT_EQ(moved, number + 0.25);
            }
        }
    }
    double leap_day = 60;
    Serial_To_Day_Count(leap_day, gone);
    double early = -0.5;
    Serial_To_Day_Count(early, gone);
    double late = Serial_Offset - 1;
    Day_Count_To_Serial(late, gone);
    EXPECT_TRUE(leap_day == Serial_Offset + 60 && early == gone && late == gone);
}

TEST_F(Dates, Print_By_Code)
{
    const double in_1999 = Date_To_Number(5, 2, 1999, 1) + 14.0 / 24 + 5.0 / 1440 + 7.25 / 86400;
    const double in_2004 = Date_To_Number(15, 12, 2004, 1) + 9.0 / 24;
    std::string shown;
    for (std::int32_t format = 1; format <= 41; ++format)
        shown += Shown(in_1999, 1, format) + (format % 8 == 0 ? "\n" : "|");
    EXPECT_EQ(shown,
              "05/02/99|05/02/1999|5/2/99|5/2/1999|050299|05021999|05Feb99|05Feb1999\n"
              "05-Feb-99|05-Feb-1999|5Feb99|5Feb1999|5-Feb-99|5-Feb-1999|5-February-99|5-February-1999\n"
              "990205|19990205|99/02/05|1999/02/05|020599|02051999|02/05/99|02/05/1999\n"
              "050299|050299|1999-02-05|050299|050299|050299|050299|050299\n"
              "05/02/99 14:05:07.25|1999-02-05 14:05:07|5-Feb-1999 2:05:07 am|14:05:07| 2:05:07 pm|"
              "3497006:05:07|12589221907.250|145709\n050299|");
    const std::pair<std::int32_t, const char*> later[] = {
        {3, "15/12/2004"}, {17, "20041215"},   {33, "15/12/2004 09:00:00.00"},
        {-7, "15122004"},  {36, " 9:00:00"},   {35, "15-December-2004 9:00:00 pm"},
        {40, "147848"},    {37, " 9:00:00 am"}};
    for (const auto& [format, text] : later)
        EXPECT_EQ(Shown(in_2004, 1, format), text) << format;
    EXPECT_EQ(Shown(60, 0, 2) + Shown(0.999999999, 0, 34), "29/02/19001900-01-01 00:00:00");
    EXPECT_EQ(Shown(0.5, 1, 37) + Shown(0.55, 1, 37), "12:00:00 am 1:12:00 pm");
    EXPECT_EQ(Shown(-0.1, 1, 40) + Shown(std::nan(""), 0, 2) + Shown(1e300, 0, 2), "**1e+300");
    for (int second = 0; second < 86400; ++second)
        ASSERT_EQ(Shown(second / 86400.0, 1, 36),
                  Format_Text("%2d:%02d:%02d", second / 3600, second / 60 % 60, second % 60));
}

TEST_F(Dates, Cells_Print_In_Their_Columns_Form)
{
    Sheet* const sheet = New_Sheet_With_Rows(2);
    Column* const column = Add_Cells(sheet, variate_column, "x", {"61", "*"});
    column->format = date_format_mark;
    column->date_format = 27;
    char text[Number_Text_Room];
    EXPECT_EQ(std::string(text, Format_Cell_Number(text, *column, 61)), "1900-03-01");
    EXPECT_EQ(std::string(text, Format_Cell_Number(text, *column, gone)), "*");
    Compute_Column_Width(column);
    EXPECT_EQ(column->width, 11);
    request.Current_Date_Form = 1;
    EXPECT_EQ(std::string(text, Format_Number(text, 109573, 5, -1, gone)), "01/03/00");
    EXPECT_TRUE(Set_Cell_From_Text(column, 1, "1900-03-02") && Set_Cell_From_Text(column, 0, "63"));
    EXPECT_EQ(Numbers_Of(*column), (std::vector<double>{63, 62}));
}

TEST_F(Dates, What_Is_Printed_Reads_Back)
{
    std::mt19937_64 random(7);
    for (std::int32_t format = 1; format <= 40; ++format) {
        const bool no_form_of_its_own = format == 25 || format == 26 || (format > 27 && format < 33);
        if (no_form_of_its_own || format == 35 || format == 40)
            continue;
        for (int i = 0; i < 2000; ++i) {
            double value = static_cast<double>(1 + random() % 3067976);
            if (format == 36 || format == 37)
                value = 0.0;
            if (format >= 33)
                value += static_cast<double>(random() % (format == 37 ? 43200 : 86400))
                         / 86400;  // 37's noon is am
            const std::string text = Shown(value, 1, format);
            double back;
            ASSERT_TRUE(Text_To_Date(text, back, 1, format, gone, true)) << text << " by " << format;
            ASSERT_NEAR(back, value, 1e-7) << text << " by " << format;
        }
    }
}

TEST_F(Dates, Texts_Read_By_Code)
{
    struct Case {
        const char* strictly;
        const char* loosely;
        Texts texts;  ///< each behind the code that it is read by
    };
    const char* const february = "2003-02-01 00:00:00";
    const char* const in_1903 = "1903-02-01 00:00:00";
    const char* const same = nullptr;
    const Case cases[] = {
        {february,
         same,
         {"5 01022003", "17 20030201", "11 1FEB2003", "15 1-february-2003", "27 2003-2-1", "25 Feb-01-2003",
          "26 Feb012003", "28 Monday 1 February 2003"}},
        {in_1903, same, {"1 01/02/03", "17 030201", "30 Feb03"}},
        {"no",
         february,
         {"13 1-Febr-2003", "33 1/2/2003", "2 001/2/2003", "2 1st/2/2003AD", "2 1/2/2003/3", "2 1/002/2003"}},
        {"no", in_1903, {"5 010203 or so", "1 010203,4", "6 0102003"}},
        {"no",
         same,
         {"2 1/2/1599", "2 1/2/100", "2 1/2/10000", "2 31/04/2000", "2 1//2/2000", "2 +1/2/2000"}},
        {"no", same, {"2 1/2/", "2 //", "2 0", "11 1Febr2003", "15 1-feb-2003", "28 Noday 1 2 2003"}},
        {"no", same, {"2 1/2/2003 25:00", "2 1/2/2003 2:61", "2 1/2/2003 2:05:60.5", "2 1/2/2003 2:05:"}},
        {"no",
         same,
         {"36 25:00:00", "39 1e3x", "40 1e999", "41 1/2/2003", "0 1/2/2003", "1 1/2/2003 :", "36 :"}},
        {"no", same, {"17 20200230", "18 20200230", "6 08012020 25:00", "1 08012020 25:00", "2 8012020"}},
        {"1600-03-01 00:00:00", same, {"1  1 3-1600 "}},
        {"2000-02-29 00:00:00", same, {"2 29/2/2000"}},
        {"no", "1900-03-01 12:00:00", {"2 109573.5"}},
        {"1900-01-02 00:00:00", same, {"29 Monday"}},
        {"no", "1608-06-07 00:00:00", {"17 03021"}},
        {"2003-01-01 00:00:00", same, {"31 2003"}},
        {"2003-02-01 02:05:00", same, {"2 1/2/2003 2:05", "2 1 2 2003 2:05"}},
        {"no", "2003-02-01 02:05:00", {"2 1/2/2003 2:05h", "2 1/002/2003 2:05"}},
        {"no", "2003-02-01 14:05:00", {"2 1/2/2003 2:05 pm"}},
        {"no", "2003-02-01 00:05:30", {"2 1/2/2003 12:05:30 AM"}},
        {"2003-02-02 00:00:00", same, {"2 1/2/2003 24:00:00"}},
        {"2003-02-01 14:05:06", same, {"35 1-Feb-2003 2:05:06 pm"}},
        {"1600-02-29 12:30:00", same, {"36 12:30"}},
        {"no", "1600-02-29 00:30:00", {"36 12:30 am"}},
        {"1600-02-29 00:30:00", same, {"37 12:30am"}},
        {"1600-03-02 01:00:00", same, {"38 49:00:00"}}};
    for (const auto& [strictly, loosely, texts] : cases)
        for (const std::string& given : texts) {
            const std::int32_t code = std::stoi(given);
            const std::string text = given.substr(given.find(' ') + 1);
            EXPECT_EQ(Read(text, code, true), strictly) << text;
            EXPECT_EQ(Read(text, code, false), loosely != same ? loosely : strictly) << text;
            // All layouts at once say what each says by itself.
            const Strict_Readings readings = Read_By_All_Layouts(text);
            for (std::int32_t format = 1; format <= 40; ++format)
                EXPECT_EQ(readings.good >> Date_Layout_Of(format) & 1, Read(text, format, true) != "no")
                    << text << " by " << format;
        }
    for (const char* blank : {"", "  ", "*", "*x"})
        EXPECT_TRUE(Read(blank, 2, true) == "*" && Read_By_All_Layouts(blank).blank);
    EXPECT_EQ(Read(std::string(10000, '1'), 2, false), "no");
    EXPECT_EQ(Read("3067979", 2, false), "no") << "no day beyond the last one";
    EXPECT_EQ(Month_From_Short("Sept", false) + Month_From_Name("may", true), 9 + 5);
    EXPECT_EQ(Month_From_Short("Sept", true) + Month_From_Name("Ma", false), 0);
}

Texts Repeated(std::size_t count, const char* text, const Texts& others = {})
{
    Texts texts(count, text);
    texts.insert(texts.end(), others.begin(), others.end());
    return texts;
}

TEST_F(Dates, Formats_Are_Found)
{
    const Texts mixed = {"13/1/2000", "1/13/2000", "1/14/2000"};
    const std::tuple<Texts, Date_Format_Search, std::int32_t> cases[] = {
        {{"1/2/2000", "2/1/2000"}, {}, 1},
        {{"1/2/2000", "2/1/2000"}, {.wanted = 2}, 2},
        {{"1/2/2000", "2/1/2000"}, {.wanted = 24}, 24},
        {mixed, {}, 1},
        {Repeated(1, "3/13/2000", mixed), {}, 23},
        {{"2000-01-02", "x"}, {.wanted = 7}, 7},
        {{"2000-01-02", "", "x"}, {}, 1},
        {{"2000-01-02", "", "*"}, {}, 19},
        {{"1/2/1850", "1/2/2000", "3/2/2000"}, {}, -1},
        {{"1/2/2000 1:00", "2/1/2000 2:00"}, {.wanted = 34}, 33},
        {{"2000-2-3 1:00", "x", "2000-2-1 2:00", "2000-2-1 3:00"}, {}, 34},
        {{"10:00", "11:00"}, {}, 36},
        {{"10:00", "26:00", "27:00"}, {.time_mode = true}, 38},
        {{"1/2/2000", "x", "y"}, {.time_mode = true}, 1},
        {{"2000", "2001"}, {}, 31},
        {{"2000", "2001"}, {.sample = true}, 0},
        {{"1/2/2000", "x"}, {.sample = true}, 0},
        {{"1/2/2000", "x"}, {.sample = true, .has_default = true}, 1},
        {{"", "*"}, {.sample = true, .has_default = true}, 0},
        {Repeated(96, "1/2/2000", Repeated(50, "x")), {.sample = true}, 1},
        {Repeated(95, "1/2/2000", Repeated(50, "x")), {.sample = true}, 0},
        {Repeated(200, "", Repeated(96, "1/2/2000", Repeated(50, "x"))), {.sample = true}, 1},
        {Repeated(200, "", Repeated(94, "1/2/2000", Repeated(50, "x"))), {.sample = true}, 0},
    };
    for (const auto& [cells, search, format] : cases)
        EXPECT_EQ(Find_Date_Format(Lone_Column(text_column, cells), search), format)
            << cells.front() << " " << cells.size();
    EXPECT_EQ(Find_Date_Format(Lone_Column(variate_column, {"1"}), {}), 0);
}

TEST_F(Dates, Text_Columns_Become_Dates)
{
    Column* const dates =
        Lone_Column(text_column, {"1/2/1999", "*", "2/2/1999", "3-Feb-1999", "some day", "4/2/1999"});
    Column* const times = Lone_Column(text_column, {"10:30", "noon", "", "6:00 pm", "36:00"});
    ASSERT_TRUE(Text_Column_To_Date(dates, false) && Text_Column_To_Date(times, true));
    EXPECT_FALSE(Text_Column_To_Date(times, true));
    EXPECT_EQ(Render(dates->sheet), "x V145704|*|145705|145706|*|145707");
    EXPECT_EQ(Render(times->sheet), "x V0.4375|*|*|0.75|1.5");
    EXPECT_EQ((std::vector{dates->format, dates->date_format, 1 * dates->date_form, dates->decimals}),
              (std::vector{5, 1, 1, -1}));
    EXPECT_EQ(times->date_format, 37);
    Column* const some_times = Lone_Column(text_column, {"2020-01-05 10:30:15", "2020-01-07", "2020-01-08"});
    ASSERT_TRUE(Text_Column_To_Date(some_times, false));
    EXPECT_EQ(some_times->date_format, 34) << "a time that was read is shown";
    EXPECT_EQ(Messages(), "Text to Date Conversion Warnings\n \n"
                          "Column x Row    5: some day read as *\n"
                          "Column x Row    2: noon read as *\n:\n");
}

TEST_F(Dates, People_Write_Them_In_More_Ways)
{
    const std::pair<Texts, const char*> cases[] = {
        {{"2020-01-05T10:30:15.5", "2020-01-05T10:30:15Z", "x"}, "2020-01-05 10:30:15|2020-01-05 10:30:15|*"},
        {{"2020-01-05 10:30 AM", "2020-01-05 12:30 am", "2020-01-05 1:30 PM"},
         "2020-01-05 10:30:00|2020-01-05 00:30:00|2020-01-05 13:30:00"},
        {{"01/25/2020 10:30 AM", "01/26/2020 11:30 PM"}, "2020-01-25 10:30:00|2020-01-26 23:30:00"},
        {{"Jan 5, 2020", "January 6,2020", "3.1.2020"},
         "2020-01-05 00:00:00|2020-01-06 00:00:00|2020-01-03 00:00:00"},
        {{"Sept 15, 2020", "Sept. 16, 2020"}, "2020-09-15 00:00:00|2020-09-16 00:00:00"},
        {{"3.1.2020", "13.1.2020 8:15"}, "2020-01-03 00:00:00|2020-01-13 08:15:00"},
        {{"5/1/2020", "6/1/2020 10h30"}, "2020-01-05 00:00:00|2020-01-06 00:00:00"},
    };
    for (const auto& [texts, dates] : cases)
        for (const bool time_mode : {false, true}) {
            Start_Request("t");
            request.people.set(static_cast<std::size_t>(People_Rule::further_dates));
            Column* const column = Lone_Column(text_column, texts);
            ASSERT_TRUE(Text_Column_To_Date(column, time_mode));
            std::string read;
            for (const double value : Numbers_Of(*column))
                read.append(read.empty() ? "" : "|").append(Shown(value, 1, 34));
            EXPECT_EQ(read, dates) << texts.front();
            const bool lossy = texts.back() == "x" || texts.back().ends_with("h30");
            EXPECT_EQ(request.losses.Entries().size(), lossy ? 1 : 0) << texts.front();
        }
    for (const bool people : {false, true}) {
        request.people.set(static_cast<std::size_t>(People_Rule::further_dates), people);
        Column* const packed = Lone_Column(variate_column, {"20200105", "*"});
        Unpack_Dates(packed);
        EXPECT_EQ(Render(packed->sheet), people ? "x T20200105|" : "x V20200105|*");
    }
    Column* const early = Lone_Column(text_column, {"1999-01-05", "1998-02-06", "1997-03-04"});
    ASSERT_TRUE(Text_Column_To_Date(early, false));
    EXPECT_EQ(early->date_format, 27) << "years of four digits";
}

}  // namespace
}  // namespace ingester

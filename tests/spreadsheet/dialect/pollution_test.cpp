// A clean table, written with one fault or several at once, reads as the clean one.
#include "spreadsheet/text/text.h"
#include "support/reader_fixture.h"

#include <random>
#include <string>
#include <vector>

namespace ingester {
namespace {

using Cells = std::vector<std::vector<std::string>>;

/// A table on its way to a text.
struct Written_Table {
    Cells names = {{"plot", "site name", "yield", "sown", "code", "note"}};
    Cells rows;
    std::string separator = ",";
    char quote = '"';
    std::string escape;  ///< in front of a quote; empty: it is doubled
    std::string line_end = "\n";
    bool mixed_ends = false;
    bool quote_all = false;
    char decimal = '.';
    std::string front, behind;
    std::size_t odd_row = 1000;  ///< one row that is written by other rules
    std::string odd_separator;
    std::string odd_end;
    std::size_t empty_line = 1000;
    std::string every_end;
    std::string last_end = "\n";
    std::string code;
};

Written_Table Clean_Table()
{
    Written_Table table;
    const char* const sites[] = {"Kiel, north", "Oslo", "Nice", "Bern; old", "Graz"};
    for (int i = 1; i <= 20; ++i) {
        char date[16];
        std::snprintf(date, sizeof date, "2024-%02d-%02d", i % 12 + 1, i);
        table.rows.push_back({std::to_string(i), sites[i % 5], std::to_string(i * 3) + "." + "25", date,
                              "00" + std::to_string(i), i % 4 == 0 ? "" : "say \"hi\" " + std::to_string(i)});
    }
    return table;
}

std::string Written(const Written_Table& table, std::string text, const std::string& separator, bool data)
{
    if (data && table.decimal != '.' && text.size() > 3 && text[text.size() - 3] == '.')
        text[text.size() - 3] = table.decimal;
    const bool needed = text.find_first_of(",;\t|\n\"'") != std::string::npos
                        || text.find(separator) != text.npos
                        || (separator == " " && (text.empty() || text.find(' ') != text.npos));
    const bool comma_number = data && table.decimal == ',' && separator != "," && text.find(',') != text.npos
                              && text.find_first_not_of("0123456789,") == text.npos;
    if ((!needed || comma_number) && !(table.quote_all && !text.empty()))
        return text;
    std::string quoted(1, table.quote);
    for (const char c : text) {
        if (c == table.quote)
            quoted += table.escape.empty() ? std::string(1, c) : table.escape;
        quoted += c;
    }
    return quoted + table.quote;
}

std::string Line_Of(const Written_Table& table, const std::vector<std::string>& cells,
                    const std::string& separator, bool data)
{
    std::string line;
    for (std::size_t i = 0; i < cells.size(); ++i)
        line += (i > 0 ? separator : "") + Written(table, cells[i], separator, data);
    return line + table.every_end;
}

std::string In_Utf16(const std::string& text, bool big)
{
    std::string wide = big ? "\xFE\xFF" : "\xFF\xFE";
    for (const char c : text)
        wide.append(big ? std::string{'\0', c} : std::string{c, '\0'});
    return wide;
}

std::string Text_Of(const Written_Table& table)
{
    std::string text = table.front;
    std::size_t number = 0;
    const auto put = [&](const std::string& line) {
        const char* const mixed[] = {"\n", "\r\n", "\n", "\r"};
        text += line + (table.mixed_ends ? mixed[number % 4] : table.line_end);
        ++number;
    };
    for (const auto& names : table.names)
        put(Line_Of(table, names, table.separator, false));
    for (std::size_t row = 0; row < table.rows.size(); ++row) {
        if (row == table.empty_line)
            put("");
        const bool odd = row == table.odd_row;
        put(Line_Of(table, table.rows[row],
                    odd && !table.odd_separator.empty() ? table.odd_separator : table.separator, true)
            + (odd ? table.odd_end : ""));
    }
    if (table.last_end.empty())
        text.resize(text.find_last_not_of("\r\n") + 1);
    else if (table.last_end.size() > 1)
        text += table.line_end;
    text += table.behind;
    if (table.code == "mark")
        return "\xEF\xBB\xBF" + text;
    return table.code.empty() ? text : In_Utf16(text, table.code == "big");
}

/// One fault, at a row that chance gives.
struct Pollution {
    const char* told;
    void (*apply)(Written_Table& table, std::size_t row);
    int group;  ///< of one group only one is taken
};

constexpr Pollution Pollutions[] = {
    {"CR LF", [](Written_Table& t, std::size_t) { t.line_end = "\r\n"; }, 1},
    {"CR", [](Written_Table& t, std::size_t) { t.line_end = "\r"; }, 1},
    {"mixed line ends", [](Written_Table& t, std::size_t) { t.mixed_ends = true; }, 1},
    {"no end of the last line", [](Written_Table& t, std::size_t) { t.last_end = ""; }, 2},
    {"two ends of the last line", [](Written_Table& t, std::size_t) { t.last_end = "\n\n"; }, 2},
    {"semicolons", [](Written_Table& t, std::size_t) { t.separator = ";"; }, 3},
    {"tabs", [](Written_Table& t, std::size_t) { t.separator = "\t"; }, 3},
    {"bars", [](Written_Table& t, std::size_t) { t.separator = "|"; }, 3},
    {"comma and blank", [](Written_Table& t, std::size_t) { t.separator = ", "; }, 3},
    {"decimal commas", [](Written_Table& t, std::size_t) { t.separator = ";", t.decimal = ','; }, 3},
    {"single quotes", [](Written_Table& t, std::size_t) { t.quote = '\''; }, 4},
    {"backslashes", [](Written_Table& t, std::size_t) { t.escape = "\\"; }, 5},
    {"all quoted", [](Written_Table& t, std::size_t) { t.quote_all = true; }, 6},
    {"separators at the ends", [](Written_Table& t, std::size_t) { t.every_end = t.separator; }, 7},
    {"a separator too many",
     [](Written_Table& t, std::size_t row) { t.odd_row = row, t.odd_end = t.separator; }, 7},
    {"a row separated otherwise",
     [](Written_Table& t, std::size_t row) {
         t.odd_row = row;
         t.odd_separator = t.separator == ";" ? "," : ";";
         for (std::string& cell : t.rows[row])
             std::erase_if(cell, [](char c) { return c == ',' || c == ';' || c == '"'; });
     },
     7},
    {"an empty line", [](Written_Table& t, std::size_t row) { t.empty_line = row; }, 8},
    {"a title", [](Written_Table& t, std::size_t) { t.front = "Yields of 2024" + t.line_end; }, 9},
    {"a title and an empty line",
     [](Written_Table& t, std::size_t) {
         t.front = "Yields of 2024" + t.line_end + "Author: me" + t.line_end + t.line_end;
     },
     9},
    {"comments",
     [](Written_Table& t, std::size_t) {
         t.front = "# made by hand" + t.line_end + "# in 2024" + t.line_end;
     },
     9},
    {"a footer",
     [](Written_Table& t, std::size_t) { t.behind = t.line_end + "Source: the farm" + t.line_end; }, 2},
    {"a mark of UTF-8", [](Written_Table& t, std::size_t) { t.code = "mark"; }, 10},
    {"UTF-16", [](Written_Table& t, std::size_t) { t.code = "little"; }, 10},
    {"UTF-16, high bytes first", [](Written_Table& t, std::size_t) { t.code = "big"; }, 10},
    {"a line in a text", [](Written_Table& t, std::size_t row) { t.rows[row][5] = "two\nlines"; }, 11},
    {"a quote in a text", [](Written_Table& t, std::size_t row) { t.rows[row][1] = "5\" pipe"; }, 11},
    {"a missing word", [](Written_Table& t, std::size_t row) { t.rows[row][2] = "NA"; }, 12},
    {"a name in two lines",
     [](Written_Table& t, std::size_t) {
         t.names = {{"plot", "site", "yield", "sown", "code", "note"},
                    {"(no)", "name", "(t/ha)", "(date)", "", ""}};
     },
     13},
};

class Pollution_Test : public Reader_Test {
protected:
    static std::string Read(const Written_Table& table)
    {
        return Render(Read_Bytes(Read_CSV, Text_Of(table), "x.csv", [] {
            request.people.set();
            Use_Utf8_Text(true);
        }));
    }

    /// What the table reads as with what its faults do to cells, and nothing else.
    static std::string Wanted(const Written_Table& polluted)
    {
        Written_Table table = Clean_Table();
        table.rows = polluted.rows;
        if (polluted.names.size() == 2)
            table.names = {{"plot (no)", "site name", "yield (t/ha)", "sown (date)", "code", "note"}};
        return Read(table);
    }
};

TEST_F(Pollution_Test, Each_Alone_In_Every_Row)
{
    for (const Pollution& pollution : Pollutions)
        for (std::size_t row = 0; row < 20; ++row) {
            Written_Table table = Clean_Table();
            pollution.apply(table, row);
            ASSERT_EQ(Read(table), Wanted(table)) << pollution.told << ", row " << row << "\n"
                                                  << Text_Of(table);
        }
}

TEST_F(Pollution_Test, Several_At_Once)
{
    std::minstd_rand random(11);
    int wrong = 0;
    constexpr int tries = 2000;
    for (int i = 0; i < tries; ++i) {
        Written_Table table = Clean_Table();
        unsigned groups = 0;
        std::string told;
        std::vector<const Pollution*> chosen;
        for (int k = 0; k < 4; ++k)
            chosen.push_back(&Pollutions[random() % std::size(Pollutions)]);
        std::ranges::sort(chosen, [](const auto* a, const auto* b) { return a->group < b->group; });
        for (const Pollution* pollution : chosen)
            if ((groups & 1U << pollution->group) == 0) {
                groups |= 1U << pollution->group;
                pollution->apply(table, random() % 20);
                told += std::string(pollution->told) + ", ";
            }
        const bool equal = Read(table) == Wanted(table);
        wrong += equal ? 0 : 1;
        if (!equal && wrong <= 5)
            ADD_FAILURE() << told << "\n"
                          << Text_Of(table).substr(0, 700) << "\n"
                          << Read(table).substr(0, 600);
    }
    EXPECT_EQ(wrong, 0) << "of " << tries;
}

}  // namespace
}  // namespace ingester

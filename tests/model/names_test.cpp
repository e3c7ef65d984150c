#include "model/names.h"

#include "interface/request/request.h"
#include "support/text.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <deque>
#include <random>
#include <set>
#include <vector>

namespace ingester {
namespace {

using Texts = std::vector<std::string>;

class Names : public testing::Test {
protected:
    void SetUp() override { TearDown(); }
    void TearDown() override
    {
        request = Request_Globals{};
        Reset_Name_Counters();
    }
};

std::string Of(std::size_t count, char c = 'x')
{
    return std::string(count, c);
}

TEST_F(Names, Become_Valid)
{
    const std::pair<std::string, std::string> cases[] = {
        {" \t yield \n", "yield"},
        {"'yield'", "yield"},
        {"1abc", "%1abc"},
        {"%abc_", "%abc_"},
        {"p<q>=r@s", "pltqgteqrats"},
        {"a\xF2z\xF3", "agezle"},
        {"Temp (max) ", "Temp_max"},
        {"a\\^`b__c", "a_b__c"},
        {"a\x80\xA3 \x7F\xFFz", "a_z"},
        {"M\xFCller\xDF\xD7\x8A", "MullerBxS"},
        {"\xC5ngstr\xF6m", "%Angstrom"},
        {"***", "%"},
        {Of(70), Of(60)},
        {"1" + Of(69), "%1" + Of(58)},
        {Of(59) + "<", Of(59) + "l"},
        {"a[1][2]", "a[1][2]"},
        {"a[1,2]", "a[12]"},
        {"a[1[2", "a[1][2]"},
        {"a]b[1]", "a_b[1]"},
        {"a[[]]b", "ab"},
        {"a]7[", "a[7]"},
        {"a[7]b", "a_7_b"},
        {Of(58) + "[1", Of(58) + "_1"},
        {Of(70) + "[12]", Of(56) + "[12]"},
        {"1" + Of(55) + "[12]", "%1" + Of(54) + "[12]"},
        {"a[" + Of(80, '5') + "]", "a_" + Of(58, '5')},
    };
    for (const auto& [given, expected] : cases)
        EXPECT_EQ(Make_Valid_Name(given), expected) << given;
    request.Names_Kept_As_They_Stand = true;
    EXPECT_EQ(Make_Valid_Name(" 1st [kg] " + Of(60)), " 1st [kg] " + Of(50));
}

TEST_F(Names, A_Bracket_Without_Digits_Gets_A_Counter)
{
    EXPECT_EQ(Make_Valid_Name("Weight [kg]"), "Weight_[1]");
    for (int i = 2; i < 999; ++i)
        (void)Make_Valid_Name("w[x");
    EXPECT_EQ(Make_Valid_Name(Of(60) + "[x]"), Of(55) + "[999]");
    EXPECT_EQ(Make_Valid_Name("w[x]"), "w[1]");
}

TEST_F(Names, Quoted_Suffixes_Become_Numbers_Where_Wanted)
{
    const struct {
        std::string given, numbered, extra, kept;
    } cases[] = {
        {"s['Orders']", "s[1]", "old Orders", "s['Orders']"},
        {"s['WMeans']", "s[4]", "old WMeans", "s['WMeans']"},
        {"s['it's \xE9t\xE9]']", "s[1]", "old it's ete]", "s['it's ete]']"},
        {"s['a\t<", "s[2]", "old a <", "s['a <']"},
        {"s['a]", "s[3]", "old a", "s['a']"},
        {"s['Sums']['Trace'][x7]", "s[1][3][7]", "old Sums Trace", "s['Sums']['Trace'][7]"},
        {"s['']", "s", "old", "s"},
        {"s['a']b", "s_a_b", "old", "s_a_b"},
        {"s['" + Of(70) + "']", "s[4]", "old " + Of(57), "s['" + Of(55) + "']"},
        {Of(70) + "['q']", Of(55) + "[5]", "old q", Of(55) + "['q']"},
    };
    for (const auto& c : cases) {
        Column column;
        column.extra = "old";
        Get_Settings().bracket_names = 1;
        EXPECT_EQ(Make_Valid_Name(Make_Valid_Name(c.given)), c.numbered) << c.given;
        Get_Settings().bracket_names = 0;
        EXPECT_EQ(Make_Valid_Name(c.given), c.kept) << c.given;
        Use_Bracket_Text(column);
        Use_Bracket_Text(column);
        EXPECT_EQ(column.extra, c.extra) << c.given;
    }
}

TEST_F(Names, Automatic_Names_Count_On)
{
    EXPECT_EQ(
        (Texts{Make_Valid_Name(""), Make_Valid_Name(" '' "), Default_Column_Name(9), Make_Valid_Name("_")}),
        (Texts{"C1", "C2", "C9", "C3"}));
    Get_Settings().column_prefix = "Variate%";
    EXPECT_EQ(Default_Column_Name(0), "Variat4");
    Get_Settings().prefix_given = true;
    EXPECT_EQ(Default_Column_Name(0), "Variate%[5]");
}

TEST_F(Names, Of_Any_Bytes_Come_Out_Valid_And_Stay_So)
{
    constexpr std::string_view favourites = "[[[]]]''''_%ab1<@=\" \xE9\xA3\xF2";
    const testing::Matcher<std::string> has_valid_form =
        testing::MatchesRegex(R"([A-Za-z_%][A-Za-z0-9_%]*(\[[0-9]+\]|\['[ -~]+'\])*)");
    std::mt19937 random(20);
    for (int round = 0; round < 20000; ++round) {
        Get_Settings().bracket_names = static_cast<std::int16_t>(round % 2);
        std::string name(random() % (round % 5 == 0 ? 200 : 12), ' ');
        for (char& c : name)
            c = random() % 4 != 0 ? favourites[random() % favourites.size()]
                                  : static_cast<char>(1 + random() % 255);
        const std::string valid = Make_Valid_Name(name);
        ASSERT_TRUE(valid.size() <= Name_Width && has_valid_form.Matches(valid))
            << "'" << name << "' gave '" << valid << "'";
        ASSERT_EQ(Make_Valid_Name(valid), valid) << "from '" << name << "'";
    }
}

TEST_F(Names, Lose_Their_Marks)
{
    const std::pair<const char*, const char*> cases[] = {{"when:D", "when"},
                                                         {"at:t!", "at"},
                                                         {"at!:t", "at"},
                                                         {"w:2#", "w"},
                                                         {"w#:e", "w"},
                                                         {"x:Dy:E", "xy"},
                                                         {"Time 10:30", "Time 10:30"},
                                                         {"1:2 mix:E!", "1:2 mix"},
                                                         {"a:b", "a:b"},
                                                         {"x:", "x:"},
                                                         {"a!b", "a!b"},
                                                         {"a!#", "a!"},
                                                         {"$", ""}};
    for (const auto& [given, expected] : cases)
        EXPECT_EQ(Strip_Name_Mark(given), expected) << given;
}

/// Columns of these names, linked behind a row column of the first name.
struct Named_Columns {
    Sheet sheet;
    std::deque<Column> columns;

    explicit Named_Columns(const Texts& names) : columns(names.size() + 1)
    {
        columns[0].type = row_column;
        columns[0].name = names[0];
        for (std::size_t i = 0; i < names.size(); ++i) {
            columns[i + 1].name = names[i];
            columns[i].next = &columns[i + 1];
        }
        sheet.first_column = &columns[0];
    }
    ~Named_Columns() { sheet.first_column = nullptr; }
};

Texts Made_Unique(const Texts& names)
{
    Named_Columns all(names);
    Make_Column_Names_Unique(&all.sheet);
    Texts unique;
    for (const Column* column = all.columns[0].next; column != nullptr; column = column->next)
        unique.emplace_back(column->name.view());
    return unique;
}

TEST(Unique_Names, Clashes_Get_Numbers)
{
    const std::pair<Texts, Texts> cases[] = {
        {{"yield", "Yield", "yield", "yield"}, {"yield", "Yield", "yield1", "yield2"}},
        {{"ab", "ab", "ab"}, {"ab", "ab_1", "ab_2"}},
        {{"dry_8", "dry_8", "dry_8"}, {"dry_8", "dry_9", "dry_10"}},
        {{"dry_", "dry_1", "dry_"}, {"dry_", "dry_1", "dry_2"}},
        {{Of(32) + "a", Of(32) + "b"}, {Of(32) + "a", Of(31) + "1"}},
        {{Of(31) + "a", Of(31) + "b"}, {Of(31) + "a", Of(31) + "b"}},
        {{"p[1]", "p[2]", "p[1]"}, {"p[1]", "p[2]", "p_1[1]"}},
        {{"long[1]", "long", "long1[1]", "long[1]"}, {"long[1]", "long1", "long11[1]", "long2[1]"}},
        {{Of(32) + "a[1]", Of(32) + "b[2]", Of(32) + "c[1]"},
         {Of(32) + "a[1]", Of(32) + "b[2]", Of(31) + "1[1]"}},
    };
    for (const auto& [given, expected] : cases)
        EXPECT_EQ(Made_Unique(given), expected) << given.front();
    const Texts many = Made_Unique(Texts(101, Of(32)));
    EXPECT_EQ((Texts{many[10], many[100]}), (Texts{Of(30) + "10", Of(29) + "100"}));
}

TEST(Unique_Names, The_Old_Name_Goes_To_Extra)
{
    Named_Columns all({"yield", "yield", "yield", "yield"});
    all.columns[3].extra = "grain";
    all.columns[4].extra = Of(74);
    all.sheet.type = table_sheet;
    all.sheet.table_ways = 2;
    Make_Column_Names_Unique(&all.sheet);
    EXPECT_EQ(all.columns[2].name, "yield");
    all.sheet.table_ways = 1;
    Make_Column_Names_Unique(&all.sheet);
    for (const std::size_t i : {1U, 2U, 3U, 4U})
        EXPECT_EQ(all.columns[i].extra, (Texts{"", "", " yield", "yield: grain", Of(74)})[i]);
}

/// The rule as it is told: each name against all earlier ones, with rising numbers.
Texts Compared_One_By_One(Texts names)
{
    const auto parts = [](const std::string& name) {
        const std::size_t at = Bracket_Start(name);
        return std::pair(name.substr(0, std::min<std::size_t>(at, 32)), name.substr(at));
    };
    for (std::size_t i = 0; i < names.size(); ++i) {
        auto [stem, suffix] = parts(names[i]);
        int number = 1;
        if (stem.size() <= 2)
            stem += '_';
        else if (stem[stem.size() - 2] == '_' && Is_Digit(stem.back())) {
            number = stem.back() - '0';
            stem.pop_back();
        }
        const auto clashes = [&](const std::string& other) {
            const auto [mine, others] = std::pair(parts(names[i]), parts(other));
            const bool plain = mine.second.empty() || others.second.empty();
            return mine.first == others.first && (plain || mine.second == others.second);
        };
        while (std::any_of(names.data(), &names[i], clashes)) {
            const std::string digits = std::to_string(number++);
            names[i] = stem.substr(0, 32 - digits.size()) + digits + suffix;
        }
    }
    return names;
}

TEST(Unique_Names, As_By_Comparing_One_By_One)
{
    const Texts stems = {"a",     "a_",           "a_1",          "abc",  "abc1",
                         "abc_3", Of(29) + "yz1", Of(29) + "y_4", Of(32), Of(30)};
    const Texts suffixes = {"", "", "[1]", "[2]"};
    std::mt19937 random(4);
    for (std::size_t round = 1; round < 40; ++round) {
        Texts names(round * 5);
        for (std::string& name : names)
            name = stems[random() % stems.size()] + suffixes[random() % suffixes.size()];
        ASSERT_EQ(Made_Unique(names), Compared_One_By_One(names));
    }
}

TEST(Unique_Names, In_Wide_Sheets_Of_One_Name)
{
    for (const std::string& name : {Of(40), "x[" + Of(48, '1') + "]", "x[" + Of(56, '1') + "]"}) {
        const Texts unique = Made_Unique(Texts(50000, name));
        EXPECT_EQ(std::set<std::string>(unique.begin(), unique.end()).size(), unique.size()) << name;
    }
}

}  // namespace
}  // namespace ingester

#include "model/names.h"

#include "support/cell_lists.h"
#include "support/text.h"

#include <algorithm>
#include <random>

namespace ingester {
namespace {

using Names = Request_Test;

std::string Of(std::size_t count, char c = 'x')
{
    return std::string(count, c);
}

Texts Made_Valid(Texts names)
{
    for (std::string& name : names)
        name = Make_Valid_Name(name);
    return names;
}

TEST_F(Names, Become_Valid)
{
    const std::pair<Texts, Texts> cases[] = {
        {{"1abc", "%abc_", "***", "p<q>=r@s"}, {"%1abc", "%abc_", "%", "pltqgteqrats"}},
        {{" \t'yield'\n", "Temp (max) ", "a\\^`b__c"}, {"yield", "Temp_max", "a_b__c"}},
        {{"a\xF2z\xF3\x80 \x7Fz", "\xC5ngstr\xF6m\xDF\xD7\x8A"}, {"agezle_z", "%AngstromBxS"}},
        {{"a[1,2[3", "a]b[1]", "a[[]]b", "a]7[", "a[7]b"}, {"a[12][3]", "a_b[1]", "ab", "a[7]", "a_7_b"}},
        {{Of(70), "1" + Of(69), Of(59) + "<"}, {Of(60), "%1" + Of(58), Of(59) + "l"}},
        {{Of(58) + "[1", "1" + Of(70) + "[12]"}, {Of(58) + "_1", "%1" + Of(54) + "[12]"}},
        {{"a[" + Of(80, '5') + "]", "", " '' ", "_"}, {"a_" + Of(58, '5'), "C1", "C2", "C3"}},
    };
    for (const auto& [given, expected] : cases)
        EXPECT_EQ(Made_Valid(given), expected);
    Get_Settings().column_prefix = "Variate%";
    EXPECT_EQ(Default_Column_Name(0) + Default_Column_Name(9), "Variat4Variat9");
    Get_Settings().prefix_given = true;
    EXPECT_EQ(Default_Column_Name(0), "Variate%[5]");
    request.Names_Kept_As_They_Stand = true;
    EXPECT_EQ(Make_Valid_Name(" 1st [kg] " + Of(60)), " 1st [kg] " + Of(50));
}

TEST_F(Names, A_Bracket_Without_Digits_Gets_A_Counter)
{
    EXPECT_EQ(Made_Valid(Texts(998, "w [x"))[997], "w_[998]");
    EXPECT_EQ(Made_Valid({Of(60) + "[x]", "w[x]"}), (Texts{Of(55) + "[999]", "w[1]"}));
}

TEST_F(Names, Quoted_Suffixes_Become_Numbers_Where_Wanted)
{
    const std::tuple<std::string, std::string, std::string, std::string> cases[] = {
        {"s['Orders']", "s[1]", "old Orders", "s['Orders']"},
        {"s['it's \xE9t\xE9]']", "s[1]", "old it's ete]", "s['it's ete]']"},
        {"s['a\t<", "s[2]", "old a <", "s['a <']"},
        {"s['Sums']['Trace'][x7]", "s[1][3][7]", "old Sums Trace", "s['Sums']['Trace'][7]"},
        {"s['a']b", "s_a_b", "old", "s_a_b"},
        {"s['" + Of(70) + "']", "s[3]", "old " + Of(57), "s['" + Of(55) + "']"},
        {Of(70) + "['q']", Of(55) + "[4]", "old q", Of(55) + "['q']"},
    };
    for (const auto& [given, numbered, extra, kept] : cases) {
        Column column;
        column.extra = "old";
        Get_Settings().bracket_names = 1;
        EXPECT_EQ(Make_Valid_Name(Make_Valid_Name(given)), numbered) << given;
        Get_Settings().bracket_names = 0;
        EXPECT_EQ(Make_Valid_Name(given), kept) << given;
        Use_Bracket_Text(column);
        Use_Bracket_Text(column);
        EXPECT_EQ(column.extra, extra) << given;
    }
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
            c = random() % 4 != 0 ? favourites[random() % favourites.size()] : char(1 + random() % 255);
        const std::string valid = Make_Valid_Name(name);
        ASSERT_TRUE(valid.size() <= Name_Width && has_valid_form.Matches(valid))
            << "'" << name << "' gave '" << valid << "'";
        ASSERT_EQ(Make_Valid_Name(valid), valid) << "from '" << name << "'";
    }
}

TEST_F(Names, Lose_Their_Marks)
{
    Texts names = {"when:D",     "at:t!", "at!:t", "w:2#", "w#:e", "x:Dy:E",
                   "Time 10:30", "a:b",   "x:",    "a!#",  "$"};
    std::transform(names.begin(), names.end(), names.begin(), Strip_Name_Mark);
    EXPECT_EQ(names, (Texts{"when", "at", "at", "w", "w", "xy", "Time 10:30", "a:b", "x:", "a!", ""}));
}

using Unique_Names = Request_Test;

/// A Sheet with columns of these names.
Sheet* Named(const Texts& names)
{
    Sheet* const sheet = New_Sheet();
    sheet->first_column->name = names[0];
    for (const std::string& name : names)
        New_Column(sheet, variate_column, "x")->name = name;
    return sheet;
}

Texts Made_Unique(const Texts& names)
{
    Sheet* const sheet = Named(names);
    Make_Column_Names_Unique(sheet);
    Texts unique = Names_Of(sheet);
    unique.erase(unique.begin());
    return unique;
}

TEST_F(Unique_Names, The_Old_Name_Goes_To_Extra)
{
    Sheet* const sheet = Named(Texts(5, "yield"));
    Column_At(sheet, 3)->extra = "grain";
    Column_At(sheet, 4)->extra = Of(73);
    Column_At(sheet, 5)->extra = Of(74);  // is too long by one
    sheet->type = table_sheet;
    sheet->table_ways = 2;
    Make_Column_Names_Unique(sheet);
    EXPECT_EQ(Column_At(sheet, 2)->name, "yield");
    sheet->table_ways = 1;
    Make_Column_Names_Unique(sheet);
    const Texts extras = {"", "", " yield", "yield: grain", "yield: " + Of(73), Of(74)};
    for (const std::int32_t i : {1, 2, 3, 4, 5})
        EXPECT_EQ(Column_At(sheet, i)->extra, extras[static_cast<std::size_t>(i)]);
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

TEST_F(Unique_Names, As_By_Comparing_One_By_One)
{
    const std::string x = Of(29);
    const Texts stems = {"a",       "a_",      "a_1",     "abc",   "Abc",       "abc_3",
                         x + "yz1", x + "y_4", x + "xxx", x + "x", Of(32) + "y"};
    const Texts suffixes = {"", "", "[1]", "[2]"};
    std::mt19937 random(4);
    for (std::size_t round = 1; round < 40; ++round) {
        Texts names(round * 5);
        for (std::string& name : names)
            name = stems[random() % stems.size()] + suffixes[random() % suffixes.size()];
        ASSERT_EQ(Made_Unique(names), Compared_One_By_One(names));
    }
    EXPECT_EQ(Made_Unique(Texts(101, Of(32)))[100], Of(29) + "100");
}

TEST_F(Unique_Names, In_Wide_Sheets_Of_One_Name)
{
    for (const std::string& name : {Of(40), "x[" + Of(48, '1') + "]", "x[" + Of(56, '1') + "]"}) {
        const Texts unique = Made_Unique(Texts(50000, name));
        EXPECT_EQ(std::set<std::string>(unique.begin(), unique.end()).size(), unique.size()) << name;
    }
}

}  // namespace
}  // namespace ingester

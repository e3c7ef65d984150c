// Letters: counted, cut and compared in both codes.
#include "support/letters.h"

#include "support/distinct_keys.h"
#include "support/fixed_text.h"

#include <gtest/gtest.h>

#include <random>

namespace ingester {
namespace {

class Letters : public testing::TestWithParam<Letter_Code> {
protected:
    void SetUp() override { letter_code = GetParam(); }
    void TearDown() override { letter_code = Letter_Code::windows_1252; }
};

class Utf8_Letters : public testing::Test {
protected:
    void SetUp() override { letter_code = Letter_Code::utf_8; }
    void TearDown() override { letter_code = Letter_Code::windows_1252; }
};

std::string Random_Text(std::mt19937& random, std::size_t letters)
{
    constexpr char32_t alphabet[] = {U'a',   U'Z',   0xE9,   0x3A3,   0x5D0,
                                     0x20AC, 0x65E5, 0xFFFD, 0x1F33E, 0x10FFFF};
    std::string text;
    for (; letters > 0; --letters)
        Append_Utf8(text, alphabet[random() % std::size(alphabet)]);
    return text;
}

TEST_F(Utf8_Letters, None_Is_Cut_And_None_Too_Many_Kept)
{
    std::mt19937 random(1);
    for (int round = 0; round < 2000; ++round) {
        const std::size_t letters = random() % 80;
        const std::size_t limit = random() % 80;
        const std::string text = Random_Text(random, letters);
        const std::string_view first = First_Letters(text, limit);
        EXPECT_TRUE(text.starts_with(first));
        ASSERT_TRUE(Is_Utf8(first)) << text;
        EXPECT_EQ(Letter_Count(first), std::min(letters, limit));
        EXPECT_EQ(Has_More_Letters(text, limit), letters > limit);
        Fixed_Text<20> fixed(text);
        EXPECT_EQ(fixed, First_Letters(text, 20));
        Fixed_Text<20> other(Random_Text(random, random() % 30));
        const std::string joined = std::string(other).append(fixed);
        other.append(fixed);
        EXPECT_EQ(other, First_Letters(joined, 20));
        fixed = other;
        EXPECT_EQ(fixed, other.view());
        EXPECT_EQ(std::string(fixed.c_str()), fixed.view());
    }
    const std::string bad(500, '\x80');
    EXPECT_LE(First_Letters(bad, 20).size(), 80U);
    Fixed_Text<20> fixed(bad);
    fixed.append(bad);
    EXPECT_LE(fixed.size(), 80U);
}

TEST(Utf8, What_Is_Malformed_Is_Found_In_Parts_As_In_Whole)
{
    for (const char* const wrong :
         {"\xFC", "a\xC3", "\xE2\x82", "\x80", "\xC1\xBF", "\xE0\x9F\xBF", "\xC0\x80", "\xED\xA0\x80",
          "\xF4\x90\x80\x80", "\xF8\x88\x80\x80\x80", "\xF0\x8F\xBF\xBF"})
        EXPECT_FALSE(Is_Utf8(wrong)) << wrong;
    for (const char* const right : {"", "a", "\xC2\x80", "\xE0\xA0\x80", "\xED\x9F\xBF", "\xEE\x80\x80",
                                    "\xF0\x90\x80\x80", "\xF4\x8F\xBF\xBF"})
        EXPECT_TRUE(Is_Utf8(right)) << right;
    std::mt19937 random(2);
    for (int round = 0; round < 20000; ++round) {
        std::string text = Random_Text(random, random() % 12);
        if (!text.empty() && random() % 2 == 0)
            text[random() % text.size()] = static_cast<char>(random());
        bool expected = true;
        for (std::string_view rest = text; expected && !rest.empty();) {
            const std::size_t length = First_Utf8(rest).length;
            expected = length > 0;
            rest.remove_prefix(length);
        }
        Utf8_Check check;
        bool found = true;
        for (std::string_view rest = text; !rest.empty();) {
            const std::string_view part = rest.substr(0, 1 + random() % 5);
            found = check.Take(part) && found;
            rest.remove_prefix(part.size());
        }
        ASSERT_EQ(found && check.Is_Whole(), expected) << testing::PrintToString(text);
    }
}

TEST_P(Letters, Compare_Without_Case)
{
    struct Pair {
        const char* a;
        const char* b;
        bool utf8;  ///< equal there
        bool bytes;
    };
    const Pair pairs[] = {
        {"YIELD", "yield", true, true},
        {"\u00C9t\u00E9", "\u00E9T\u00C9", true, false},
        {"stra\u00DFe", "STRASSE", true, false},
        {"\u03A3\u03C2", "\u03C3\u03A3", true, false},
        {"\u212A", "k", true, false},
        {"\u0416\u0438", "\u0436\u0418", true, false},
        {"\u0130", "i", false, false},  // no Turkish rules, whatever the locale
        {"e", "\u00E9", false, false},
        {"a", "ab", false, false},
    };
    EXPECT_FALSE(Starts_Folded("yiel", "YIELD"));
    for (const auto& [a, b, utf8, bytes] : pairs) {
        const bool equal = GetParam() == Letter_Code::utf_8 ? utf8 : bytes;
        EXPECT_EQ(Equal_Folded(a, b), equal) << a << ' ' << b;
        EXPECT_EQ(Compare_Folded(a, b) == 0, equal) << a << ' ' << b;
        EXPECT_EQ(Folded(a) == Folded(b), equal) << a << ' ' << b;
        EXPECT_EQ(Folded(a) < Folded(b), Less_Folded(a, b)) << a << ' ' << b;
        if (equal) {
            EXPECT_EQ(Case_Free_Keys::Hash(a, 7), Case_Free_Keys::Hash(b, 7)) << a << ' ' << b;
            EXPECT_EQ(Folded_Start(a), Folded_Start(b)) << a << ' ' << b;
            EXPECT_TRUE(Starts_Folded(std::string(a) + "x", b)) << a << ' ' << b;
        }
    }
}

TEST_F(Utf8_Letters, Starts_Sort_As_Texts_Do)
{
    std::mt19937 random(3);
    for (int round = 0; round < 5000; ++round) {
        const std::string a = Random_Text(random, random() % 14);
        const std::string b = Random_Text(random, random() % 14);
        const auto start_a = Folded_Start(a);
        const auto start_b = Folded_Start(b);
        ASSERT_TRUE(start_a == start_b || (start_a < start_b) == Less_Folded(a, b)) << a << ' ' << b;
        const std::size_t common = Common_Letters(a, b);
        ASSERT_TRUE(Is_Utf8(a.substr(0, common)) && b.starts_with(a.substr(0, common)));
    }
}

INSTANTIATE_TEST_SUITE_P(Codes, Letters, testing::Values(Letter_Code::windows_1252, Letter_Code::utf_8));

}  // namespace
}  // namespace ingester

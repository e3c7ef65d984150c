// Texts as bytes: copied, searched, and written in other characters.
#include "support/text.h"

#include "support/byte_scan.h"
#include "support/windows_1252.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>

namespace ingester {
namespace {

using namespace std::string_view_literals;

TEST(Text, Copies_Trimmed_And_Clears_The_Rest)
{
    const std::tuple<std::string_view, bool, std::string_view> cases[] = {
        {" ab\t", false, "ab\0###"sv},
        {" ab\t", true, "ab\0\0\0#"sv},
        {"  abcdef", true, "abcd\0#"sv},
        {" ", false, "\0#####"sv},
    };
    for (const auto& [text, zero_fill, left] : cases) {
        char target[] = "######";
        Copy_Trimmed(target, text, 4, zero_fill);
        EXPECT_EQ(std::string_view(target, 6), left) << text;
    }
}

TEST(Byte_Scan, Agrees_With_A_Look_At_Each_Character)
{
    constexpr std::string_view alphabet = "\n\r,\t\"'\0ab"sv;
    std::mt19937 random(3);
    for (int round = 0; round < 100000; ++round) {
        // In half of the rounds most characters are plain ones, so that lines get long.
        const std::size_t size = random() % 301;
        const auto bytes = std::make_unique<char[]>(size);  // its end is watched by the sanitizers
        for (std::size_t i = 0; i < size; ++i)
            bytes[i] = round % 2 == 0 && random() % 64 != 0 ? 'a' : alphabet[random() % alphabet.size()];
        const std::string_view text(bytes.get(), size);
        const std::string_view members = alphabet.substr(random() % 5, random() % 5);
        std::vector<std::uint32_t> expected;
        for (std::uint32_t i = 0; i < size; ++i)
            if (members.find(text[i]) != members.npos)
                expected.push_back(i);
        std::vector<std::uint32_t> offsets((size + 63) / 64 * 64);
        offsets.resize(Byte_Finder(members).Find_All(text, offsets.data()));
        ASSERT_EQ(offsets, expected) << testing::PrintToString(text);
    }
}

TEST(Windows_1252, Goes_Into_Utf8_And_Comes_Back)
{
    std::string all;
    for (int byte = 0; byte < 256; ++byte)
        all += static_cast<char>(byte);
    const std::string utf8 = Windows_1252_To_Utf8(all);
    EXPECT_TRUE(Is_Utf8(utf8));
    EXPECT_EQ(Utf8_To_Windows_1252(utf8), all);
    EXPECT_EQ(Windows_1252_To_Utf8("\x80\xFC\x9F"), "\xE2\x82\xAC\xC3\xBC\xC5\xB8");
    EXPECT_EQ(Utf8_To_Windows_1252("\xF0\x9F\x8C\xBE\xC2\x80 \xEF\xBF\xBD"), "?? ?");
    for (const char* const wrong : {"\xFC", "a\xC3", "\xE2\x82", "\x80", "\xC1\xBF", "\xE0\x9F\xBF",
                                    "\xED\xA0\x80", "\xF4\x90\x80\x80", "\xF8\x88\x80\x80\x80"})
        EXPECT_FALSE(Is_Utf8(wrong)) << wrong;
}

}  // namespace
}  // namespace ingester

// Texts as bytes: copied, searched, and written in other characters.
#include "support/text.h"

#include "support/byte_scan.h"

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
        bool ascii = true;
        offsets.resize(Byte_Finder(members).Find_All(text, offsets.data(), ascii));
        ASSERT_TRUE(ascii);
        ASSERT_EQ(offsets, expected) << testing::PrintToString(text);
    }
}

}  // namespace
}  // namespace ingester

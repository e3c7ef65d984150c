#include "support/byte_scan.h"

#include <gtest/gtest.h>

#include <memory>
#include <random>
#include <string>
#include <vector>

namespace ingester {
namespace {

using namespace std::string_view_literals;

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
        SCOPED_TRACE(testing::PrintToString(text));

        const std::string_view members = alphabet.substr(random() % 5, random() % 5);
        const Byte_Finder finder(members);
        std::vector<std::uint32_t> expected;
        for (std::uint32_t i = 0; i < size; ++i)
            if (members.find(text[i]) != std::string_view::npos)
                expected.push_back(i);
        std::vector<std::uint32_t> offsets((size + 63) / 64 * 64);
        offsets.resize(finder.Find_All(text, offsets.data()));
        ASSERT_EQ(offsets, expected);
    }
}

}  // namespace
}  // namespace ingester

#include "support/byte_scan.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <random>
#include <string>
#include <vector>

namespace ingester {
namespace {

using namespace std::string_view_literals;

/// What a text is made of, told character by character.
Text_Facts Look_Plainly(std::string_view text)
{
    Text_Facts facts;
    std::size_t line_start = 0;
    for (std::size_t i = 0; i < text.size(); ++i) {
        facts.returns += text[i] == '\r';
        if (text[i] != '\n')
            continue;
        const bool return_feed = i > 0 && text[i - 1] == '\r';
        const std::size_t line_end = return_feed ? i - 1 : i;
        ++facts.line_feeds;
        facts.return_feeds += return_feed;
        facts.empty_lines = facts.empty_lines || line_end == line_start;
        facts.longest_line = std::max(facts.longest_line, i - line_start);
        line_start = i + 1;
    }
    facts.longest_line = std::max(facts.longest_line, text.size() - line_start);
    return facts;
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

        const Text_Facts facts = Look_At_Text(text);
        const Text_Facts plain = Look_Plainly(text);
        ASSERT_EQ(facts.line_feeds, plain.line_feeds);
        ASSERT_EQ(facts.returns, plain.returns);
        ASSERT_EQ(facts.return_feeds, plain.return_feeds);
        ASSERT_EQ(facts.empty_lines, plain.empty_lines);
        const bool seen[] = {facts.nuls, facts.tabs, facts.commas, facts.double_quotes, facts.single_quotes};
        for (std::size_t i = 0; i < 5; ++i)
            ASSERT_EQ(seen[i], text.find("\0\t,\"'"[i]) != std::string_view::npos);
        ASSERT_EQ(std::max<std::size_t>(facts.longest_line, 64),
                  std::max<std::size_t>(plain.longest_line, 64));
    }
}

}  // namespace
}  // namespace ingester

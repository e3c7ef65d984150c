#include "support/text.h"

#include <gtest/gtest.h>

#include <algorithm>

namespace ingester {
namespace {

TEST(Text, Copies_Trimmed_And_Clears_The_Rest)
{
    const std::tuple<std::string_view, bool, std::string_view> cases[] = {
        {" ab\t", false, {"ab\0###", 6}},
        {" ab\t", true, {"ab\0\0\0#", 6}},
        {"  abcdef", true, {"abcd\0#", 6}},
        {" ", false, {"\0#####", 6}},
    };
    for (const auto& [text, zero_fill, left] : cases) {
        char target[] = "######";
        Copy_Trimmed(target, text, 4, zero_fill);
        EXPECT_TRUE(std::equal(left.begin(), left.end(), target)) << text;
    }
}

}  // namespace
}  // namespace ingester

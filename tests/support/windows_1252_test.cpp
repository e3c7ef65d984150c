#include "support/windows_1252.h"

#include <gtest/gtest.h>

namespace ingester {
namespace {

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

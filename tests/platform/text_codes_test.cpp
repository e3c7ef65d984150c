// Text codes, compared with those of the system.
#include "platform/text_codes.h"

#include "support/letters.h"
#include "support/refusing.h"

#include <gtest/gtest.h>

#include <iconv.h>

namespace ingester {
namespace {

using namespace std::string_view_literals;

/// What the system makes of a text; nothing where it refuses any of it.
std::string By_System(std::string_view text, const char* from, const char* to)
{
    const iconv_t handle = ::iconv_open(to, from);
    EXPECT_NE(handle, reinterpret_cast<iconv_t>(std::intptr_t{-1})) << from << ' ' << to;
    std::string result(text.size() * 4 + 16, '\0');
    char* in = const_cast<char*>(text.data());
    char* out = result.data();
    std::size_t unread = text.size();
    std::size_t left = result.size();
    const bool good = ::iconv(handle, &in, &unread, &out, &left) != static_cast<std::size_t>(-1);
    ::iconv(handle, nullptr, nullptr, &out, &left);
    ::iconv_close(handle);
    result.resize(good ? result.size() - left : 0);
    return result;
}

/// Every character, but for surrogates and NUL.
std::string All_Characters()
{
    std::string all;
    for (char32_t character = 1; character <= 0x10FFFF; ++character)
        if (character < 0xD800 || character > 0xDFFF)
            Append_Utf8(all, character);
    return all;
}

struct Converted {
    std::string text;
    std::int64_t losses = 0;
    bool operator==(const Converted&) const = default;
};

void PrintTo(const Converted& converted, std::ostream* stream)
{
    *stream << testing::PrintToString(converted.text) << ", " << converted.losses << " lost";
}

Converted Convert(std::string_view text, const char* from, const char* to)
{
    Text_Converter converter;
    EXPECT_TRUE(converter.Open(Find_Text_Code(from), Find_Text_Code(to))) << from << ' ' << to;
    return {std::string(converter.Convert(text)), converter.Take_Losses()};
}

TEST(Text_Codes, Every_Byte_Of_Every_Page_Is_The_Systems_Letter)
{
    for (const std::int32_t page :
         {20127, 874,   1250,  1251,  1253,  1254,  1255,  1256,  1257,  1258,  437,   737,   775,   850,
          852,   855,   857,   858,   860,   861,   862,   863,   864,   865,   866,   869,   1125,  10000,
          10007, 10017, 10029, 10079, 28591, 28592, 28593, 28594, 28595, 28596, 28597, 28598, 28599, 28600,
          28601, 28603, 28604, 28605, 28606, 20866, 21866, 37,    273,   500,   1047,  1140}) {
        const Text_Code code = Text_Code_Of_Page(page);
        ASSERT_NE(code, nullptr) << page;
        Text_Converter in;
        Text_Converter out;
        ASSERT_TRUE(in.Open(code, Utf_8_Code()) && out.Open(Utf_8_Code(), code)) << page;
        for (int byte = 1; byte < 256; ++byte) {
            const std::string text(1, static_cast<char>(byte));
            const std::string expected = By_System(text, code->system_name, "UTF-8");
            const std::string letter(in.Convert(text));
            EXPECT_EQ(letter, expected.empty() ? "?" : expected) << page << ' ' << byte;
            EXPECT_EQ(in.Take_Losses(), expected.empty() ? 1 : 0) << page << ' ' << byte;
            if (expected.empty())
                continue;
            EXPECT_EQ(out.Convert(letter), By_System(letter, "UTF-8", code->system_name))
                << page << ' ' << byte;
        }
    }
}

TEST(Text_Codes, Windows_1252_Comes_Back_With_Every_Byte)
{
    std::string all;
    for (int byte = 0; byte < 256; ++byte)
        all += static_cast<char>(byte);
    const Converted utf8 = Convert(all, "cp1252", "UTF-8");
    EXPECT_TRUE(Is_Utf8(utf8.text));
    EXPECT_EQ(utf8.losses, 0);
    EXPECT_EQ(Convert(utf8.text, "UTF-8", "cp1252"), (Converted{all}));
    EXPECT_EQ(Convert("\x80\xFC\x9F\x81", "cp1252", "UTF-8"), (Converted{"\u20AC\u00FC\u0178\xC2\x81"}));
    for (int byte = 128; byte < 256; ++byte) {
        const std::string text(1, static_cast<char>(byte));
        const std::string expected = By_System(text, "CP1252", "UTF-8");
        EXPECT_TRUE(expected.empty() || Convert(text, "cp1252", "UTF-8").text == expected) << byte;
    }
}

TEST(Text_Codes, All_Characters_Go_Out_And_Come_Back)
{
    const std::string all = All_Characters();
    for (const char* const name : {"UTF-16LE", "UTF-16BE", "UTF-32LE", "UTF-32BE"}) {
        const Converted out = Convert(all, "UTF-8", name);
        EXPECT_EQ(out.losses, 0) << name;
        EXPECT_TRUE(out.text == By_System(all, "UTF-8", name)) << name;
        EXPECT_TRUE(Convert(out.text, name, "UTF-8").text == By_System(out.text, name, "UTF-8")) << name;
    }
    // What Windows-1252 lacks is one "?" each.
    EXPECT_EQ(Convert(all, "UTF-8", "1252").losses, 0x10FFFF - 2048 - 255);
}

TEST(Text_Codes, What_Is_Malformed_Or_Lacking_Is_A_Question_Mark_And_Counted)
{
    const std::tuple<std::string_view, const char*, const char*, Converted> cases[] = {
        {"a\xC3", "utf8", "utf8", {"a?", 1}},
        {"\xC0\xAF\xED\xA0\x80z", "utf8", "utf8", {"?????z", 5}},
        {"\xC3\xA9\xE2\x82x", "utf8", "latin1", {"\xE9??x", 2}},
        {"\xF0\x9F\x8C\xBE\xE2\x82\xAC", "utf8", "1252", {"?\x80", 1}},
        {"\u20AC", "utf8", "1047", {"\x6F", 1}},
        {"\u65E5\u0416", "utf8", "850", {"??", 2}},
        {"a\0\x3D\xD8"
         "b\0"sv,
         "utf16le",
         "utf8",
         {"a?b", 1}},
        {"\x3C\xDF"sv, "utf16le", "utf8", {"?", 1}},
        {"a\0b"sv, "utf16le", "utf8", {"a?", 1}},
        {"\xD8\x3C\xDF\x3E"sv, "utf16be", "utf8", {"\U0001F33E", 0}},
        {"\0\0\xD8\0\0\x11\0\0"sv, "utf32be", "utf8", {"??", 2}},
        {"\x93\xFA\x96", "cp932", "utf8", {"\u65E5?", 1}},
        {"\xFFz", "euc-jp", "utf8", {"?z", 1}},
        {"\u65E5\u0E01x", "utf8", "sjis", {"\x93\xFA?x", 1}},
        {"\u65E5\u0E01", "utf8", "iso-2022-jp", {"\x1B$BF|\x1B(B?", 1}},
        {"\xE9", "latin1", "cp1252", {"\xE9", 0}},
    };
    for (const auto& [text, from, to, expected] : cases)
        EXPECT_EQ(Convert(text, from, to), expected)
            << from << ' ' << to << ' ' << testing::PrintToString(text);
}

TEST(Text_Codes, A_Text_That_Stays_The_Same_Is_Not_Copied)
{
    const std::string text = "plain \u00E9";
    for (const auto& [from, to, size] : {std::tuple("utf8", "utf8", text.size()),
                                         {"cp850", "cp850", text.size()},
                                         {"utf8", "cp1252", std::size_t{5}},
                                         {"sjis", "utf8", std::size_t{5}}}) {
        Text_Converter converter;
        ASSERT_TRUE(converter.Open(Find_Text_Code(from), Find_Text_Code(to)));
        EXPECT_EQ(converter.Convert(std::string_view(text).substr(0, size)).data(), text.data())
            << from << ' ' << to;
    }
}

TEST(Text_Codes, Are_Found_By_Name_And_Number)
{
    const std::pair<const char*, std::int32_t> cases[] = {
        {"utf8", 65001},    {"65001", 65001},     {"CP1252", 1252},      {"windows-1252", 1252},
        {"WLATIN1", 1252},  {"latin1", 28591},    {"ISO_8859-1", 28591}, {"iso8859-15", 28605},
        {"l2", 28592},      {"437", 437},         {"ibm-850", 850},      {"pcoem850", 850},
        {"Shift_JIS", 932}, {"mac roman", 10000}, {"koi8-r", 20866},     {"UTF-16", 1200},
        {"EBCDIC-037", 37},
    };
    for (const auto& [name, page] : cases) {
        ASSERT_NE(Find_Text_Code(name), nullptr) << name;
        EXPECT_EQ(Find_Text_Code(name)->page, page) << name;
    }
    for (const char* const name : {"", "utf", "99999", "latin", "cp", "123456789012"})
        EXPECT_EQ(Find_Text_Code(name), nullptr) << name;
    EXPECT_EQ(Nearest_Code_Names("utf9").front(), "UTF-8");
    EXPECT_EQ(Nearest_Code_Names("windows1259").size(), 3U);
    EXPECT_EQ(Nearest_Code_Names("xyzzy").size(), 3U);
}

TEST(Text_Codes, Are_Told_From_Bytes)
{
    const Text_Code declared = Find_Text_Code("cp850");
    EXPECT_EQ(Code_Of_Bytes("\u00E9", nullptr), Windows_1252_Code());
    letter_code = Letter_Code::utf_8;
    EXPECT_EQ(Code_Of_Bytes("\u00E9", nullptr), Utf_8_Code());
    EXPECT_EQ(Code_Of_Bytes("\xE9", nullptr), Windows_1252_Code());
    EXPECT_EQ(Code_Of_Bytes("\xFF\xFE"
                            "a\0"sv,
                            nullptr),
              Find_Text_Code("utf16"));
    EXPECT_EQ(Code_Of_Bytes("\u00E9", declared), declared);
    std::vector<std::string> lines = {"\xEF\xBB\xBF"
                                      "3",
                                      "caf\xE9", "caf\u00E9"};
    Take_Lines_Into_Letters(lines);
    EXPECT_EQ(lines, (std::vector<std::string>{"3", "caf\u00E9", "caf\u00C3\u00A9"}));
    letter_code = Letter_Code::windows_1252;
}

TEST(Text_Codes, A_System_Without_Memory_Is_A_Failure)
{
    for (const char* const name : {"cp850", "cp932"}) {
        bool refused_by_system = false;
        for (int number = 1;; ++number) {
            Text_Converter converter;
            const Refusing refusing({.number = number, .kinds = {Asked::memory}});
            try {
                if (converter.Open(Find_Text_Code(name), Utf_8_Code()))
                    break;
                refused_by_system = true;
                EXPECT_EQ(converter.Convert("as it is"), "as it is");
            } catch (const std::bad_alloc&) {
                continue;  // as all containers say it
            }
        }
        EXPECT_TRUE(refused_by_system) << name;
    }
}

}  // namespace
}  // namespace ingester

// The target of text conversions: the first two bytes of an input choose the codes.
#include "function.h"
#include "platform/text_codes.h"
#include "support/letters.h"

#include <iterator>

namespace ingester {

namespace {

constexpr const char* Codes[] = {"utf8",    "1252",   "utf16le",     "utf16be", "utf32le", "utf32be",
                                 "cp437",   "1255",   "932",         "936",     "949",     "950",
                                 "gb18030", "euc-jp", "1047",        "cp874",   "koi8-r",  "latin2",
                                 "1258",    "mac",    "iso-2022-jp", "euc-kr"};

Text_Code Chosen(std::uint8_t byte)
{
    return Find_Text_Code(Codes[byte % std::size(Codes)]);
}

/// What came out in UTF-8 is sound, and what was lost is lost once.
void Try_Codes(Text_Code from, Text_Code to, std::string_view text)
{
    Text_Converter in;
    Text_Converter out;
    Text_Converter check;
    Must(in.Open(from, Utf_8_Code()) && out.Open(from, to) && check.Open(Utf_8_Code(), to), "no converter");
    const std::string utf8(in.Convert(text));
    const std::int64_t lost = in.Take_Losses();
    Must(Is_Utf8(utf8), "malformed UTF-8 comes out");
    Must(lost <= static_cast<std::int64_t>(text.size()), "more is lost than there was");
    const std::string direct(out.Convert(text));
    Must(from == to || direct == check.Convert(utf8), "two ways into a code differ");
    letter_code = Letter_Code::utf_8;
    for (const std::size_t limit : {std::size_t{1}, std::size_t{7}, std::size_t{60}})
        Must(Is_Utf8(First_Letters(utf8, limit)), "a letter is cut");
    Must(Equal_Folded(utf8, Folded(utf8)), "a folded text is another");
    static_cast<void>(Letter_Count(text) + First_Letters(text, 20).size() + Folded(text).size());
    letter_code = Letter_Code::windows_1252;
    static_cast<void>(Find_Text_Code(text));
    static_cast<void>(Nearest_Code_Names(text));
}

}  // namespace

/// The head: the codes that a text comes from and goes into.
void Try_Function(std::string_view head, std::string_view text)
{
    Try_Codes(Chosen(static_cast<std::uint8_t>(head[0])), Chosen(static_cast<std::uint8_t>(head[1])), text);
}

}  // namespace ingester

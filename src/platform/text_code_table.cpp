// The codes by their names.
#include "platform/text_codes.h"
#include "support/edit_distance.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace ingester {

namespace {

using enum Code_Kind;

constexpr Text_Code_Facts Text_Codes[] = {
    {65001, "UTF-8", "utf8 unicode", utf_8, "UTF-8"},
    {1252, "Windows-1252", "wlatin1 ansi winlatin1", one_byte, "CP1252"},
    {1200, "UTF-16LE", "utf16 ucs2 ucs2le", utf_16_little, "UTF-16LE"},
    {1201, "UTF-16BE", "ucs2be", utf_16_big, "UTF-16BE"},
    {12000, "UTF-32LE", "utf32 ucs4 ucs4le", utf_32_little, "UTF-32LE"},
    {12001, "UTF-32BE", "ucs4be", utf_32_big, "UTF-32BE"},
    {20127, "US-ASCII", "ascii ansix341968 iso646us", one_byte, "US-ASCII"},
    {874, "Windows-874", "wthai", one_byte, "CP874"},
    {1250, "Windows-1250", "wlatin2", one_byte, "CP1250"},
    {1251, "Windows-1251", "wcyrillic", one_byte, "CP1251"},
    {1253, "Windows-1253", "wgreek", one_byte, "CP1253"},
    {1254, "Windows-1254", "wturkish", one_byte, "CP1254"},
    {1255, "Windows-1255", "whebrew", system_over_ascii, "CP1255"},
    {1256, "Windows-1256", "warabic", one_byte, "CP1256"},
    {1257, "Windows-1257", "wbaltic", one_byte, "CP1257"},
    {1258, "Windows-1258", "wvietnamese", system_over_ascii, "CP1258"},
    {932, "Windows-932", "shiftjis sjis mskanji windows31j", system_over_ascii, "CP932"},
    {936, "GBK", "gb2312 euccn chinese", system_over_ascii, "GBK"},
    {949, "Windows-949", "uhc ksc5601 korean", system_over_ascii, "CP949"},
    {950, "Big5", "mswin950", system_over_ascii, "CP950"},
    {54936, "GB18030", "", system_over_ascii, "GB18030"},
    {437, "IBM437", "us", one_byte, "CP437"},
    {737, "IBM737", "", one_byte, "CP737"},
    {775, "IBM775", "", one_byte, "CP775"},
    {850, "IBM850", "", one_byte, "CP850"},
    {852, "IBM852", "", one_byte, "CP852"},
    {855, "IBM855", "", one_byte, "CP855"},
    {857, "IBM857", "", one_byte, "CP857"},
    {858, "IBM858", "", one_byte, "CP858"},
    {860, "IBM860", "", one_byte, "CP860"},
    {861, "IBM861", "", one_byte, "CP861"},
    {862, "IBM862", "", one_byte, "CP862"},
    {863, "IBM863", "", one_byte, "CP863"},
    {864, "IBM864", "", one_byte, "CP864"},
    {865, "IBM865", "", one_byte, "CP865"},
    {866, "IBM866", "", one_byte, "CP866"},
    {869, "IBM869", "", one_byte, "CP869"},
    {1125, "IBM1125", "ruscii", one_byte, "CP1125"},
    {10000, "Macintosh", "mac macroman xmacroman", one_byte, "MACINTOSH"},
    {10007, "Mac-Cyrillic", "xmaccyrillic", one_byte, "MAC-CYRILLIC"},
    {10017, "Mac-Ukrainian", "macuk xmacukrainian", one_byte, "MAC-UK"},
    {10029, "Mac-CentralEurope", "macce xmacce macceurope", one_byte, "MAC-CENTRALEUROPE"},
    {10079, "Mac-Iceland", "macis xmacicelandic", one_byte, "MAC-IS"},
    {28591, "ISO-8859-1", "latin1 l1 iso88591", one_byte, "ISO-8859-1"},
    {28592, "ISO-8859-2", "latin2 l2", one_byte, "ISO-8859-2"},
    {28593, "ISO-8859-3", "latin3 l3", one_byte, "ISO-8859-3"},
    {28594, "ISO-8859-4", "latin4 l4", one_byte, "ISO-8859-4"},
    {28595, "ISO-8859-5", "cyrillic", one_byte, "ISO-8859-5"},
    {28596, "ISO-8859-6", "arabic", one_byte, "ISO-8859-6"},
    {28597, "ISO-8859-7", "greek", one_byte, "ISO-8859-7"},
    {28598, "ISO-8859-8", "hebrew", one_byte, "ISO-8859-8"},
    {28599, "ISO-8859-9", "latin5 l5 turkish", one_byte, "ISO-8859-9"},
    {28600, "ISO-8859-10", "latin6 l6", one_byte, "ISO-8859-10"},
    {28601, "ISO-8859-11", "thai tis620", one_byte, "ISO-8859-11"},
    {28603, "ISO-8859-13", "latin7 l7 baltic", one_byte, "ISO-8859-13"},
    {28604, "ISO-8859-14", "latin8 l8", one_byte, "ISO-8859-14"},
    {28605, "ISO-8859-15", "latin9 l9 latin0", one_byte, "ISO-8859-15"},
    {28606, "ISO-8859-16", "latin10 l10", one_byte, "ISO-8859-16"},
    {20866, "KOI8-R", "koi8", one_byte, "KOI8-R"},
    {21866, "KOI8-U", "", one_byte, "KOI8-U"},
    {51932, "EUC-JP", "ujis japanese", system_over_ascii, "EUC-JP"},
    {50220, "ISO-2022-JP", "jis", system, "ISO-2022-JP"},
    {51949, "EUC-KR", "", system_over_ascii, "EUC-KR"},
    {37, "EBCDIC-037", "ebcdicus opened37", one_byte, "CP037"},
    {273, "EBCDIC-273", "", one_byte, "CP273"},
    {500, "EBCDIC-500", "opened500", one_byte, "CP500"},
    {1047, "EBCDIC-1047", "opened1047", one_byte, "CP1047"},
    {1140, "EBCDIC-1140", "opened1140", one_byte, "CP1140"},
};

/// Stand in front of a page's number.
constexpr std::string_view Page_Words[] = {"cp",  "windows", "win",  "ibm", "codepage",
                                           "dos", "pcoem",   "xwin", "ms",  "cswindows"};

/// Small letters and digits.
std::string Bare_Name(std::string_view name)
{
    std::string bare;
    for (const char c : name)
        if (Is_Letter(c) || Is_Digit(c))
            bare += To_Lower(c);
    return bare;
}

std::string_view Without_Page_Word(std::string_view bare)
{
    for (const std::string_view word : Page_Words)
        if (bare.starts_with(word) && bare.size() > word.size() && Is_Digit(bare[word.size()]))
            return bare.substr(word.size());
    return bare;
}

bool Has_Alias(std::string_view aliases, std::string_view bare)
{
    while (!aliases.empty()) {
        const std::size_t end = std::min(aliases.find(' '), aliases.size());
        if (aliases.substr(0, end) == bare)
            return true;
        aliases.remove_prefix(std::min(end + 1, aliases.size()));
    }
    return false;
}

/// To the nearest of a code's names.
std::size_t Least_Distance(const std::string& bare, const Text_Code_Facts& code)
{
    std::size_t least = Edit_Distance(bare, Bare_Name(code.name));
    if (code.page != 0)
        least =
            std::min(least, Edit_Distance(std::string(Without_Page_Word(bare)), std::to_string(code.page)));
    for (std::string_view rest = code.aliases; !rest.empty();) {
        const std::size_t end = std::min(rest.find(' '), rest.size());
        least = std::min(least, Edit_Distance(bare, std::string(rest.substr(0, end))));
        rest.remove_prefix(std::min(end + 1, rest.size()));
    }
    return least;
}

}  // namespace

Text_Code Text_Code_Of_Page(std::int32_t page)
{
    const auto* const found = std::ranges::find(Text_Codes, page, &Text_Code_Facts::page);
    return page == 0 || found == std::end(Text_Codes) ? nullptr : found;
}

Text_Code Find_Text_Code(std::string_view name)
{
    const std::string bare = Bare_Name(name);
    if (bare.empty())
        return nullptr;
    for (const Text_Code_Facts& code : Text_Codes)
        if (Bare_Name(code.name) == bare || Has_Alias(code.aliases, bare))
            return &code;
    constexpr std::size_t longest_number = 5;
    const std::string_view number = Without_Page_Word(bare);
    if (number.size() > longest_number || !std::ranges::all_of(number, Is_Digit))
        return nullptr;
    return Text_Code_Of_Page(static_cast<std::int32_t>(Leading_Integer(number)));
}

std::vector<std::string_view> Nearest_Code_Names(std::string_view name)
{
    constexpr std::size_t most_names = 3;
    constexpr std::size_t longest_name = 40;
    const std::string bare = Bare_Name(name.substr(0, longest_name));
    std::vector<std::pair<std::size_t, Text_Code>> near;
    for (const Text_Code_Facts& code : Text_Codes)
        near.emplace_back(Least_Distance(bare, code), &code);
    std::ranges::stable_sort(near, {}, [](const auto& entry) { return entry.first; });
    std::vector<std::string_view> names;
    for (std::size_t i = 0; i < std::min(near.size(), most_names); ++i)
        names.push_back(near[i].second->name);
    return names;
}

Text_Code Utf_8_Code()
{
    return &Text_Codes[0];
}

Text_Code Windows_1252_Code()
{
    return &Text_Codes[1];
}

static_assert(Text_Codes[0].page == 65001 && Text_Codes[1].page == 1252);

Text_Code Code_Of_Letters()
{
    return Letters_Are_Utf8() ? Utf_8_Code() : Windows_1252_Code();
}

Text_Code Code_Of_Pattern(std::string_view bytes)
{
    constexpr std::size_t looked_at = 200;
    constexpr std::size_t fewest = 4;
    bytes = bytes.substr(0, looked_at);
    std::size_t letters[] = {0, 0};  // with the other byte 0, by their place
    const std::size_t units = bytes.size() / 2;
    for (std::size_t i = 0; i + 1 < bytes.size(); i += 2)
        for (const std::size_t place : {0, 1}) {
            const char c = bytes[i + place];
            const bool text = (c >= ' ' && c < 127) || c == '\t' || c == '\r' || c == '\n';
            letters[place] += text && bytes[i + 1 - place] == '\0' ? 1 : 0;
        }
    for (const std::size_t place : {0, 1})
        if (units >= fewest && letters[place] * 10 >= units * 8)
            return Text_Code_Of_Page(place == 0 ? 1200 : 1201);
    return nullptr;
}

Text_Code Code_Of_Mark(std::string_view bytes, std::size_t& mark_length)
{
    struct Mark {
        std::string_view bytes;
        std::int32_t page;
    };
    using namespace std::string_view_literals;
    constexpr Mark marks[] = {{"\xEF\xBB\xBF"sv, 65001},
                              {"\xFF\xFE\0\0"sv, 12000},
                              {"\xFF\xFE"sv, 1200},
                              {"\xFE\xFF"sv, 1201},
                              {"\0\0\xFE\xFF"sv, 12001}};
    mark_length = 0;
    for (const Mark& mark : marks)
        if (bytes.starts_with(mark.bytes)) {
            mark_length = mark.bytes.size();
            return Text_Code_Of_Page(mark.page);
        }
    return nullptr;
}

Text_Code Code_Of_Bytes(std::string_view bytes, Text_Code declared)
{
    if (declared != nullptr || !Letters_Are_Utf8())
        return declared != nullptr ? declared : Code_Of_Letters();
    std::size_t mark_length;
    if (const Text_Code marked = Code_Of_Mark(bytes, mark_length); marked != nullptr)
        return marked;
    return Is_Utf8(bytes) ? Utf_8_Code() : Windows_1252_Code();
}

void Take_Lines_Into_Letters(std::vector<std::string>& lines)
{
    if (!Letters_Are_Utf8() || lines.empty())
        return;
    std::size_t mark_length;
    if (Code_Of_Mark(lines.front(), mark_length) == Utf_8_Code())
        lines.front().erase(0, mark_length);
    if (std::ranges::all_of(lines, Is_Utf8))
        return;
    Text_Converter converter = Sure_Converter(Windows_1252_Code(), Utf_8_Code());
    for (std::string& line : lines)
        line = std::string(converter.Convert(line));
}

}  // namespace ingester

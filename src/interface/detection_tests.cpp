#include "interface/detection_tests.h"

#include "interface/file_detection.h"
#include "request/people_rules.h"
#include "request/text_crossing.h"
#include "support/byte_fields.h"
#include "support/text.h"

#include <algorithm>
#include <span>
#include <utility>

namespace ingester {

using namespace std::string_view_literals;

bool Magic::Matches(const Detection_Head& head) const
{
    const std::string_view found = head.Text().substr(at, bytes.size());
    return folded ? Equal_Ignoring_Case(found, bytes) : found == bytes;
}

bool Detection_Test::Matches(const Detection_Head& head) const
{
    return std::ranges::all_of(magics, [&](const Magic& magic) { return magic.Matches(head); })
           && (endings.empty() || head.Name_Ends(endings)) && (predicate == nullptr || predicate(head));
}

bool Looks_Like_Cornell(const Detection_Head& head)
{
    constexpr std::size_t looked_at = 180;
    constexpr std::size_t longest_first_line = 80;
    constexpr int lines_looked_at = 4;
    if (!head.Name_Ends(".cep .crc .spe .env"))
        return false;
    const std::string_view text = head.Text().substr(0, head.length);
    int lines = 0;
    for (std::size_t i = 0; i < std::min(looked_at, text.size()) && lines < lines_looked_at; ++i) {
        const std::uint8_t byte = head.Byte(i);
        if (byte == '\n')
            ++lines;
        else if ((byte < ' ' && byte != '\r') || byte == 127)
            return false;
    }
    const std::size_t first_end = text.find('\n');
    if (first_end == std::string_view::npos)
        return false;
    const std::size_t first_length = first_end > 0 && text[first_end - 1] == '\r' ? first_end - 1 : first_end;
    if (first_length > longest_first_line)
        return false;
    const std::size_t open = text.find('(', first_end);
    return open != std::string_view::npos && text.find(')', open) != std::string_view::npos;
}

namespace {

constexpr Magic Bytes(std::size_t at, std::string_view bytes)
{
    return {at, bytes, false};
}

constexpr Magic Words(std::size_t at, std::string_view words)
{
    return {at, words, true};
}

constexpr Magic Zeros(std::size_t at, std::size_t count)
{
    return {at, "\0\0\0\0\0\0\0\0\0\0\0\0\0\0\0\0\0"sv.substr(0, count), false};
}

constexpr bool Is_Between(std::uint8_t value, std::uint8_t first, std::uint8_t last)
{
    return value >= first && value <= last;
}

/// Releases 5 to 12 begin with their number and a byte order, later ones with a byte order and a 1.
bool Is_Stata(const Detection_Head& head)
{
    const bool order = Is_Between(head.Byte(1), 1, 2);
    return order
           && ((Is_Between(head.Byte(0), 102, 112) && Is_Between(head.Byte(2), 1, 2))
               || (Is_Between(head.Byte(0), 113, 114) && head.Byte(2) == 1));
}

/// The second word of a binary microarray file.
bool Has_Version_1_To_4(const Detection_Head& head)
{
    const auto version = Number_At<std::uint32_t>(std::as_bytes(std::span(head.bytes)).data() + 4);
    return version >= 1 && version <= 4;
}

bool Has_Short_Name(const Detection_Head& head)
{
    return head.name.size() < 4;
}

bool Holds_Survey_Type(const Detection_Head& head)
{
    return Find_Ignoring_Case(head.Text(), "<!--DOCTYPE sss") != std::string_view::npos;
}

bool Holds_Econometric_Type(const Detection_Head& head)
{
    return Find_Ignoring_Case(head.Text(), "<!DOCTYPE gretldata") != std::string_view::npos;
}

/// The year since 1900, the month and the day of the last change: what little a table's head has of a
/// signature.
bool Has_Date(const Detection_Head& head, std::size_t year, std::size_t month, std::size_t day)
{
    return head.Byte(year) > 60 && Is_Between(head.Byte(month), 1, 12) && Is_Between(head.Byte(day), 1, 31);
}

bool Is_DBF(const Detection_Head& head)
{
    return ((head.Byte(0) & 7U) != 0 && Has_Date(head, 1, 2, 3))
           || (head.Byte(0) == 2 && Has_Date(head, 5, 3, 4));
}

/// Text by its first bytes. A NUL behind a line end is the end of a short file.
bool Looks_Like_Text(const Detection_Head& head)
{
    constexpr std::size_t sniffed = 55;
    bool line_end_seen = false;
    for (std::size_t i = 0; i < sniffed; ++i) {
        const std::uint8_t byte = head.Byte(i);
        if (byte == '\r' || byte == '\n')
            line_end_seen = true;
        else if (byte == 0 && line_end_seen)
            return true;
        else if ((byte < 32 && byte != '\t' && byte != '\f') || byte >= 128)
            return false;
    }
    return true;
}

/// Text in whatever code: only line ends, tabs and form feeds among the controls.
bool Holds_No_Controls(const Detection_Head& head)
{
    const std::string_view text = head.Text().substr(0, head.length);
    return std::ranges::all_of(text, [](char c) {
        const auto byte = static_cast<std::uint8_t>(c);
        return byte >= 32 || (byte >= '\t' && byte <= '\r');
    });
}

/// Mostly ASCII letters in UTF-16.
bool Is_Unmarked_Unicode(const Detection_Head& head)
{
    return Code_Of_Pattern(head.Text().substr(0, head.length)) != nullptr;
}

/// Only texts have a code of letters that a user can declare and no test knows.
bool Is_Declared_Text(const Detection_Head& /*head*/)
{
    return Declared_Code() != nullptr;
}

/// Numbers in magics are little-endian. Tests of text take either case unless the format is strict.
constexpr Detection_Test Detection_Tests[] = {
    {book_file, {Bytes(0, "TBK\x01KVX\0"sv)}},
    {spreadsheet_file, {Bytes(0, "\x03\x87\x2D\x03"sv)}},
    {spreadsheet_file, {Bytes(0, "\x03\x2D\x87\x03"sv)}},
    {spreadsheet_file, {Bytes(0, "\x14\xAE\x2D\x03"sv)}},
    {spreadsheet_file, {Bytes(0, "\x03\x2D\xAE\x14"sv)}},
    {spreadsheet_file, {Bytes(0, "QP>\x03"sv)}},
    {spreadsheet_file, {Bytes(0, "\x03>PQ"sv)}},
    {13, {Bytes(0, "\0S data\x01"sv)}},
    {21, {Bytes(0, "\x4B\x06\x1E\0\0\0\0\0"sv)}},
    {18, {Bytes(0, "\xFF\xFF\xFF\xFF\0\0\0\0"sv)}},
    {18, {Bytes(0, "\xDA\xDA"sv)}, ".dht"},
    {18, {Bytes(0, "\xDD\xDD"sv), Bytes(8, "\x86\0"sv)}},
    {18, {Bytes(0, "\xDA\xEE"sv), Zeros(3, 5)}},
    {18, {Bytes(0, "\xDD\xEE\x86\0"sv)}},
    {18, {Bytes(0, "\0\0\0\0\xCA\xCA\xCA\xEE"sv)}},
    {16,
     {Bytes(5, "\0"
               "3.00/EM"sv)}},
    {16,
     {Bytes(5, "\0"
               "3.00/EV"sv)}},
    {16,
     {Bytes(5, "\0"
               "4.00/EM"sv)}},
    {16,
     {Bytes(5, "\0"
               "4.00/EV"sv)}},
    {20, {Zeros(0, 4), Zeros(121, 4)}},
    {76, {Bytes(0, "MATLAB "), Zeros(121, 4)}, ".mat"},

    // Plain workbook streams of releases 2, 3 and 4, and the container of later ones.
    {5, {Bytes(0, "\x09\0\x04\0\x07\x05\x10\0"sv)}},
    {5, {Bytes(0, "\x09\0\x04\0\x07\0\x10\0"sv)}},
    {5, {Bytes(0, "\x09\0\x04\0"sv)}, ".xls"},
    {5, {Bytes(0, "\x09\x02\x06\0\0\0\x10\0"sv)}},
    {5, {Bytes(0, "\x09\x02\x06\0"sv)}, ".xls"},
    {5, {Bytes(0, "\x09\x04\x06\0\0\0\x10\0"sv)}},
    {5, {Bytes(0, "\xD0\xCF\x11\xE0\xA1\xB1"sv)}},
    {23, {}, "", Is_Stata},
    {8, {Bytes(0, "\0\0\x02\0\x20\x51"sv)}},
    {8, {Bytes(0, "\0\0\x02\0\x01\x10"sv)}},
    {8, {Bytes(0, "\0\0\x02\0\x02\x10"sv)}},
    {2, {Bytes(0, "\0\0\x02\0"sv)}},

    {26, {Bytes(0, "\0\0\x27\x0A"sv), Zeros(4, 17)}},
    {22, {Bytes(0, "$FL2")}},
    {15, {Bytes(0, "\x40\x0D")}},
    {7, {Bytes(0, "WORKSHEE")}},
    {35, {Words(0, "CSS "), Bytes(6, "\xFF\xFF"sv)}},
    {36, {Bytes(0, "\0\x04\0\0\0\x01\0\0\0\x03\0\0\0"sv)}},
    {68, {Bytes(0, "\x80\x06\0\0\0\0\0\0"sv), Zeros(8, 5)}},
    {37, {Bytes(0, "SAS"), Words(64, "SPARC")}},
    {37, {Bytes(0, "SAS"), Words(64, "ALPHA")}},
    {10, {Bytes(0, "SAS")}},
    {37, {Bytes(0, "\0\0\xFF\xFF\0\0"sv)}},
    {46, {Bytes(0, "\xC3\xFF\xFF\xFF"sv)}},
    {49, {Bytes(0, "\0\0\0\x01\0\0\0\x01"sv)}},
    {37, {Zeros(0, 8), Bytes(84, "SAS")}},
    {28, {Words(0, "HEADER RECORD*******LIBRARY HEADER RECORD!!!!!!!00")}},
    {45, {Words(40, "ASCII SPSS PORT FILE ")}},
    {59, {Bytes(0, "PK\x03\x04")}, ".xlsx .xlsm"},
    {zip_file, {Bytes(0, "PK\x03\x04")}, "", Has_Short_Name},
    {67, {Bytes(0, "PK\x03\x04")}, ".ods .sxc"},
    {zip_file, {Bytes(0, "PK\x03\x04")}},
    {80, {Bytes(0, "\x1F\x8B\x08\0\0\0\0\0"sv)}, ".gdt"},
    {compressed_file, {Bytes(0, "\x1F\x1E")}},
    {compressed_file, {Bytes(0, "\x1F\x8B")}},
    {compressed_file, {Bytes(0, "\x1F\x9E")}},
    {compressed_file, {Bytes(0, "\x1F\xA0")}},
    {81, {Bytes(0, "K\x06\x1E\0"sv)}},
    {81, {Bytes(0, "K\x06\x14\0"sv)}},
    {38, {Words(0, "Minitab Portable Worksheet")}},
    {40, {Words(0, "#!/usr/explorer/bin/explorer cxTablet binary")}},
    {40, {Words(0, "#!/usr/visualist/bin/visualist cxTablet binary")}},
    {41, {Words(0, "## Dump S Version 4 Dump ##")}},
    {42, {Words(0, "RDX2\nX\n")}},
    {43, {Words(0, "RDA2\n")}},
    {43, {Words(0, "RDA2\r\n")}},
    {50, {Bytes(0, "\x40\0\0\0\x04\0\0\0"sv)}},
    {51, {Bytes(0, "\x43\0\0\0"sv)}, "", Has_Version_1_To_4},
    {52, {Bytes(0, "\x41\0\0\0"sv)}, "", Has_Version_1_To_4},
    {55, {Bytes(0, "GeneChip Sequenc")}},
    {53, {Words(0, "[CEL]")}, ".cel"},
    {54, {Words(0, "[CDF]")}, ".cdf"},
    {69,
     {Bytes(0, "\x3B\x01\0\0\0\x01"sv), Words(10, "\0\0\0\x1B"
                                                  "affymetrix-calvin-intensity"sv)}},
    {70,
     {Bytes(0, "\x3B\x01\0\0\0\x01"sv), Words(10, "\0\0\0\x27"
                                                  "affymetrix-expression-probeset-analysis"sv)}},
    {70,
     {Bytes(0, "\x3B\x01\0\0\0\x02"sv), Words(10, "\0\0\0\x27"
                                                  "affymetrix-expression-probeset-analysis"sv)}},
    {70,
     {Bytes(0, "\x3B\x01\0\0\0\x01"sv), Words(10, "\0\0\0\x22"
                                                  "affymetrix-quantification-analysis"sv)}},
    {44, {Bytes(0, "\x02\0\0\0\0\0\0\0"sv)}, ".sav .sys"},
    {82, {Words(0, "<?xml")}, "", Holds_Survey_Type},
    {80, {Words(0, "<?xml")}, "", Holds_Econometric_Type},
    {27, {Words(0, "VERSION")}, ".mif"},
    {3, {}, "", Is_DBF},
    {71, {Bytes(0, "\x01\0\0\0"sv), Bytes(8, "\x01\0\0\0\0\0\0\0\x01\0\0\0"sv)}},
    {75, {Words(0, "[Dictionary]")}},
    {77, {Bytes(0, "New MicroTSP Workfile")}, ".wf1 .wf"},
    {77, {Bytes(0, "EViews File V01")}, ".wf1 .wf"},
    {78, {Bytes(0, "<stata_dta>")}, ".dta"},
    {79, {Bytes(0, "RAT4")}, ".rat"},
    {72, {}, "", Looks_Like_Cornell},

    // By name alone, where the head tells nothing.
    {33, {Words(0, "RIFF")}, ".wav"},
    {32, {Words(0, "BM")}, ".bmp"},
    {3, {}, ".dbf"},
    {9, {}, ".db"},
    {14, {}, ".sdd"},
    {17, {}, ".rec"},
    {39, {}, ".arff"},
    {60, {}, ".jpg"},
    {62, {}, ".gif"},
    {61, {}, ".tif .tiff"},
    {63, {}, ".png"},
    {64, {}, ".psd"},
    {65, {}, ".emf .wmf"},
    {66, {}, ".ico .pax .pcd .pcx .pbm .pgm .ppm .tga .tla .wbmp"},
    {qtl_locus_file, {}, ".loc"},
    {74, {}, ".qua .qda"},
};

/// Types that hosts take for text or for nothing.
constexpr Detection_Test Further_Tests[] = {
    {plain_text_file, {Bytes(0, "\xEF\xBB\xBF"sv)}},  // marks that texts in Unicode begin with
    {plain_text_file, {Bytes(0, "\xFF\xFE"sv)}},
    {plain_text_file, {Bytes(0, "\xFE\xFF"sv)}},
    {plain_text_file, {Bytes(0, "\0\0\xFE\xFF"sv)}},
    {22, {Bytes(0, "$FL3")}},
    {28, {Words(0, "HEADER RECORD*******LIBV8   HEADER RECORD!!!!!!!00")}},
};

constexpr Detection_Test Text_Tests[] = {
    {plain_text_file, {}, "", Looks_Like_Text},
};

/// Behind the text that hosts know.
constexpr Detection_Test Further_Text_Tests[] = {
    {plain_text_file, {}, "", Holds_No_Controls},
    {plain_text_file, {}, "", Is_Unmarked_Unicode},
    {plain_text_file, {}, "", Is_Declared_Text},
};

/// A magic must lie within the head.
consteval bool Magics_Fit(std::span<const Detection_Test> tests)
{
    return std::ranges::all_of(tests, [](const Detection_Test& test) {
        return std::ranges::all_of(test.magics, [](const Magic& magic) {
            return magic.at + magic.bytes.size() <= Detection_Head::size;
        });
    });
}

static_assert(Magics_Fit(Detection_Tests) && Magics_Fit(Further_Tests));

std::int32_t Code_Of_First_Match(std::span<const Detection_Test> tests, const Detection_Head& head)
{
    const auto found =
        std::ranges::find_if(tests, [&head](const Detection_Test& test) { return test.Matches(head); });
    return found == tests.end() ? unknown_file : found->code;
}

}  // namespace

std::int32_t Code_Of_Head(const Detection_Head& head)
{
    const bool further = For_People(People_Rule::further_types);
    const std::pair<bool, std::span<const Detection_Test>> in_order[] = {
        {true, Detection_Tests}, {further, Further_Tests}, {true, Text_Tests}, {further, Further_Text_Tests}};
    for (const auto& [asked, tests] : in_order)
        if (const std::int32_t code = asked ? Code_Of_First_Match(tests, head) : unknown_file;
            code != unknown_file)
            return code;
    return unknown_file;
}

}  // namespace ingester

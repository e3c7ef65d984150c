#include "book_parser.h"

#include <cstdint>
#include <cstring>
#include <map>
#include <vector>

namespace ingester {
namespace {

/// What a record holds: b a byte, w a word, d a double, s and l texts behind a byte or a word of length.
/// What stands behind "*" comes as often as the record's first word says. h and r are a byte for each column
/// and a bit for each row, k a word for each level, t a block of texts, m the members of a list.
const std::map<int, std::string> Layouts = {
    {1, "ww"},    {2, ""},        {12, "b"},          {13, "l"},          {16, "bwwdbbbbs"},
    {17, ""},     {19, "sb"},     {20, "bbb"},        {21, "bbsb"},       {22, "s"},
    {23, "tst"},  {24, "t"},      {26, "bsm"},        {34, "swr"},        {36, "h"},
    {101, "k"},   {25, "ww"},     {29, "d"},          {33, "w"},          {35, ""},
    {37, "b"},    {39, ""},       {40, ""},           {64, "bwsbbbbbbb"}, {65, ""},
    {66, "b"},    {81, "w*d"},    {82, "wb*s"},       {83, "ww*l"},       {97, "wb*d"},
    {98, "wb*s"}, {99, "w"},      {100, ""},          {112, "bl"},        {113, "s"},
    {114, "dd"},  {115, "bbddd"}, {116, "bdwbdwbdw"}, {117, "d"},         {118, "b"},
    {119, "d"},   {120, "w*www"}, {121, "b"},         {122, "w"},         {123, "ww"},
};

class Walker {
public:
    explicit Walker(const std::string& book) : bytes(book) {}

    Walked_Book Walk()
    {
        Expect(bytes.size() >= 12 && std::memcmp(bytes.data(), "TBK\1KVX", 8) == 0, "the magic");
        big = U8(8) == 0;
        Expect(U16(8) == 1 && U16(10) > 0, "order mark and sections");
        at = 12;
        for (int sections = big ? U8(11) : U8(10); sections > 0 && out.faults.empty();)
            sections -= Step() == 2 ? 1 : 0;
        Expect(at == bytes.size(), "the end");
        Check_Offsets();
        return out;
    }

private:
    void Expect(bool right, const std::string& what)
    {
        if (!right && out.faults.size() < 500)
            out.faults += what + " at record " + std::to_string(start) + "\n";
    }
    unsigned U8(std::size_t i) const { return i < bytes.size() ? static_cast<unsigned char>(bytes[i]) : 0; }
    unsigned U16(std::size_t i) const { return big ? U8(i) << 8U | U8(i + 1) : U8(i) | U8(i + 1) << 8U; }
    std::uint32_t U32(std::size_t i) const
    {
        return big ? U16(i) << 16U | U16(i + 2) : U16(i) | U16(i + 2) << 16U;
    }

    /// Goes over one record and gives its type.
    int Step()
    {
        start = at;
        const int type = static_cast<int>(U16(at));
        const std::size_t end = at + 6 + U32(at + 2);
        Expect(end <= bytes.size(), "a length beyond the book");
        if (!out.faults.empty())
            return 2;
        out.types += (out.types.empty() ? "" : " ") + std::to_string(type);
        found[start] = type;
        at += 6;
        Check_Place(type);
        Check_Payload(type, end);
        Expect(at == end, "type " + std::to_string(type) + " of a wrong length");
        at = end;
        return type;
    }

    void Check_Place(int type)
    {
        const bool opens = type == 1 || type == 16 || type == 64;
        const bool closes = type == 2 || type == 17 || type == 65;
        const std::size_t depth = type <= 13                              ? (type <= 2 ? 0U : 1U)
                                  : type == 16 || type == 17              ? 1U
                                  : type < 64 || type == 64 || type == 65 ? 2U
                                                                          : 3U;
        Expect(nesting.size() == depth + (closes ? 1 : 0), "type " + std::to_string(type) + " out of place");
        if (opens)
            nesting.push_back(type);
        else if (closes && !nesting.empty())
            nesting.pop_back();
    }

    void Check_Payload(int type, std::size_t end)
    {
        if (const auto layout = Layouts.find(type); layout != Layouts.end())
            Go_Over(layout->second);
        else
            Expect(type == 3 || type == 18 || type == 96, "an unknown type");
        if (type == 1)
            sheets = U32(start + 6), ends.push_back(U32(start + 10));
        if (type == 3 || type == 18)
            Take_Offsets(type == 3 ? sheets : columns, type == 3 ? 16 : 64);
        if (type == 16)
            columns = U32(start + 7), rows = U32(start + 11), margin = 0, table = U8(start + 6) == 5;
        if (type == 20)
            margin = U8(start + 7) != 0;
        if (type == 64)
            length = U32(start + 7), Expect(length <= rows, "a column longer than its sheet");
        if (type >= 81 && type <= 83)
            Expect(U32(start + 6) == length, "cells");
        if (type == 96)
            Codes(end);
        if (type == 97 || type == 98)
            Expect(U32(start + 6) == levels, "levels");
    }

    void Go_Over(const std::string& layout)
    {
        const std::size_t star = layout.find('*');
        const std::uint32_t times = star == std::string::npos ? 0 : U32(at);
        for (const char c : layout.substr(0, star))
            Go_Over(c);
        for (std::uint32_t i = 0; i < times && at <= bytes.size(); ++i)
            for (const char c : layout.substr(star + 1))
                Go_Over(c);
    }
    void Go_Over(char c)
    {
        if (c == 't')
            return Text_Block();
        if (c == 'm')
            return U8(start + 6) == 0 ? Go_Over("w*s") : void();
        at += c == 'b'   ? 1U
              : c == 'w' ? 4U
              : c == 'd' ? 8U
              : c == 's' ? 1U + U8(at)
              : c == 'l' ? 4U + U32(at)
              : c == 'h' ? columns
              : c == 'k' ? 4 * std::size_t{levels}
                         : (rows + 7) / 8 + (rows == 0);
    }

    void Text_Block()
    {
        const std::uint32_t count = U32(at);
        at += 4;
        if (count == 0)
            return;
        std::uint32_t ends_seen = 0;
        for (std::size_t i = at + 4; i < at + 4 + U32(at); ++i)
            ends_seen += U8(i) == 0;
        Expect(ends_seen == count, "a block of other texts");
        at += 4 + U32(at);
    }
    void Codes(std::size_t end)
    {
        levels = U32(start + 10);
        const std::uint64_t w = levels + (table && margin != 0 ? 1 : 0);
        const std::uint64_t n = length;
        const std::uint64_t bits = w < 4 ? 2 : w < 16 ? 4 : w < 256 ? 8 : w < 65536 ? 16 : 32;
        Expect(U32(start + 6) == length && U8(start + 14) <= 2, "a Factor's head");
        at += 9 + (n == 0 && bits < 8 ? 1 : (n * bits + 7) / 8);
        const auto unused = static_cast<unsigned>((8 - n * bits % 8) % 8);
        Expect(bits >= 8 || n == 0 || unused == 0 || U8(end - 1) >> (8 - unused) == 0,
               "bits that are no cell's");
    }
    void Take_Offsets(std::uint32_t count, int type)
    {
        for (; count > 0; --count, at += 4)
            offsets.emplace_back(U32(at), type);
    }
    void Check_Offsets()
    {
        for (const auto& [offset, type] : offsets)
            Expect(found.contains(offset) && found[offset] == type, "an offset " + std::to_string(offset));
        for (const std::uint32_t end : ends)
            Expect(end == bytes.size(), "an end at " + std::to_string(end));
    }

    const std::string& bytes;
    Walked_Book out;
    bool big = false;
    std::size_t at = 0;
    std::size_t start = 0;
    std::vector<int> nesting;
    std::map<std::size_t, int> found;
    std::vector<std::pair<std::uint32_t, int>> offsets;
    std::vector<std::uint32_t> ends;
    std::uint32_t sheets = 0, columns = 0, rows = 0, length = 0, levels = 0;
    unsigned margin = 0;
    bool table = false;
};

}  // namespace

Walked_Book Walk_Book(const std::string& bytes)
{
    return Walker(bytes).Walk();
}

}  // namespace ingester

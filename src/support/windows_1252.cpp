#include "support/windows_1252.h"

#include <algorithm>
#include <iterator>
#include <string_view>

namespace ingester {

namespace {

/// Sixteen bytes a line, from 128. Letters of two fold to the first of them.
constexpr std::string_view Folded_Letters = "___f______S_O_Z_"
                                            "__________s_o_zY"
                                            "__________a_____"
                                            "_____u____o_____"
                                            "AAAAAAACEEEEIIII"
                                            "DNOOOOOxOUUUUYPB"
                                            "aaaaaaaceeeeiiii"
                                            "dnooooo_ouuuuyp";

constexpr std::array<char, 127> Make_Fold_Table()
{
    std::array<char, 127> table{};
    std::copy(Folded_Letters.begin(), Folded_Letters.end(), table.begin());
    return table;
}

static_assert(Folded_Letters.size() == 127);

}  // namespace

const std::array<char, 127> Latin_Fold_Table = Make_Fold_Table();

namespace {

/// The characters of the bytes from 128, of which the others have their own numbers.
constexpr char32_t Signs[] = {
    0x20AC, 0x0081, 0x201A, 0x0192, 0x201E, 0x2026, 0x2020, 0x2021, 0x02C6, 0x2030, 0x0160,
    0x2039, 0x0152, 0x008D, 0x017D, 0x008F, 0x0090, 0x2018, 0x2019, 0x201C, 0x201D, 0x2022,
    0x2013, 0x2014, 0x02DC, 0x2122, 0x0161, 0x203A, 0x0153, 0x009D, 0x017E, 0x0178,
};
constexpr unsigned char First_Sign = 128;
static_assert(std::size(Signs) == 32);

}  // namespace

char32_t Windows_1252_Character(unsigned char byte)
{
    const bool sign = byte >= First_Sign && byte < First_Sign + std::size(Signs);
    return sign ? Signs[byte - First_Sign] : byte;
}

}  // namespace ingester

#include "support/windows_1252.h"

#include <algorithm>
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

}  // namespace ingester

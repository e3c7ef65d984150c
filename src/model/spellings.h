// How numbers were spelled where they came from a text: what only passes through keeps it.
#pragma once

#include "model/cells.h"
#include "support/arena.h"

#include <algorithm>
#include <cstdint>
#include <string_view>
#include <vector>

namespace ingester {

struct Column;

/// Of the numbers in a column: most are told by the fewest decimals that they print with, as "5.00" by two.
struct Number_Spellings {
    struct Kept {
        const Cell_Node* cell;
        const char* text;  ///< in `texts`
    };

    std::int32_t decimals = 0;
    std::vector<Kept> kept;  ///< the others, in the order of their cells' addresses
    Text_Arena texts;
};

/// Watches the decimals of a column's numbers go by.
struct Spelling_Watch {
    std::int32_t fewest = 400;  ///< decimals
    std::int32_t round = 0;     ///< most decimals of a number that ends with a zero
    std::int32_t sampled = 0;   ///< numbers that only some of were looked at
    bool strange = false;       ///< some print otherwise than they are spelled

    void Take(std::int32_t decimals, char last)
    {
        if (decimals < fewest) [[unlikely]]
            fewest = decimals;
        if (last == '0' && decimals > round) [[unlikely]]
            round = decimals;
    }
    /// Of numbers with more digits than are surely exact, most print as they are spelled or few do: some
    /// tell.
    [[nodiscard]] bool Samples_Number()
    {
        constexpr std::int32_t looked_at = 64;
        return ++sampled <= looked_at || sampled % looked_at == 0;
    }
    /// Whether all print as they are spelled, with the fewest decimals.
    [[nodiscard]] bool All_Are_Usual() const { return !strange && round <= fewest; }
};

/// Keeps how a cell's number is spelled. The cells of a column come in any order; `Settle_Spellings` makes
/// them ready.
void Keep_Spelling(Column& column, const Cell_Node& cell, std::string_view text);
void Keep_Decimals(Column& column, std::int32_t decimals);
void Settle_Spellings(Column& column);

/// Prints a number in its shortest form, with the column's decimals at least. `target` has
/// `Number_Text_Room`. Returns the end of the text.
char* Print_Usually(char* target, const Column& column, double value);

/// Prints the number of a cell as it was spelled, unless it is another by now; else as usually.
char* Print_As_Spelled(char* target, const Column& column, const Cell_Node& cell);

}  // namespace ingester

// The host's identifiers: every Column's name passes through here.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// `name` as the host accepts it: letters, digits, "_" and "%", at most 60, with a repaired bracket
/// suffix (`[1]`, `[1][2]`, and `['text']` unless `bracket_names` makes numbers of them). An empty name
/// becomes an automatic one. Left alone while the request keeps names as they stand (cut at 60 then).
[[nodiscard]] std::string Make_Valid_Name(std::string_view name);

/// The automatic name of column `number`, as "C1"; below 1, of the next number.
[[nodiscard]] std::string Default_Column_Name(std::int32_t number);

/// Cuts a name to `limit` characters, keeping a bracket suffix whole where it fits.
[[nodiscard]] std::string Shorten_Bracket_Name(std::string_view name, std::size_t limit);

/// The text of a quoted suffix that `Make_Valid_Name` replaced by a number, up to 80. It is kept until
/// it is used or the next one comes, since a cleaned name may be cleaned again on its way to a Column.
void Remember_Bracket_Text(std::string_view text);

/// Adds that text to `extra`, behind one blank when there is something, and forgets it.
void Use_Bracket_Text(Column& column);

/// Where the bracketed suffix of `name` begins: at "[" when it ends with "]", else its size.
[[nodiscard]] std::size_t Bracket_Start(std::string_view name);

/// A name as the host tells it from others: outer blanks don't count, and only 32 characters do, or the 32 in
/// front of a bracketed suffix and the suffix.
struct Telling_Parts {
    std::string_view stem;
    std::string_view suffix;
    bool operator==(const Telling_Parts&) const = default;
};
[[nodiscard]] Telling_Parts Tell_Parts(std::string_view name);

/// Starts the counters of bracket numbers anew.
void Reset_Name_Counters();

/// What automatic names, bracket numbers and the texts that these replaced have come to. A reading that
/// begins again goes back to it.
struct Name_Counters {
    std::int32_t next_bracket_number = 1;
    std::int32_t next_suffix_number = 1;
    Fixed_Text<Extra_Width> bracket_text;
    std::int32_t next_column_number = 1;
};
[[nodiscard]] Name_Counters Get_Name_Counters();
void Set_Name_Counters(const Name_Counters& counters);

/// Names must differ in their first 32 characters, a bracket suffix apart: later ones of a clash get a
/// number, and their old name goes to `extra`. For Vector, Scalar and one-way Table Sheets.
void Make_Column_Names_Unique(Sheet* sheet);

/// The marks of a name, which tell what becomes of its column.
struct Name_Marks {
    bool date = false;           ///< ":D"
    bool time = false;           ///< ":T", where no ":D" stands
    bool exponent = false;       ///< ":E" at the end
    std::int32_t decimals = -1;  ///< ":n" at the end, a digit; -1 for none
    std::int32_t type = 0;       ///< at the end: "!" Factor, "#" Variate, "$" Text; 0 for none
};
[[nodiscard]] Name_Marks Read_Name_Marks(std::string_view name);

/// A name that a list gives, without its marks and as a Column would bear it. Those with a quoted suffix are
/// left alone: cleaning numbers them. The numbers of the names to come stay as they are.
[[nodiscard]] std::string Name_In_Lists(std::string_view name);

/// `name` without its marks: every ":D" and ":T" (in either case), and at the end one "!", "#" or "$" and
/// one ":E" or ":" with a digit.
[[nodiscard]] std::string Strip_Name_Mark(std::string_view name);

/// The same of a name that an input has for a column: for people only the marks of types, dates and times go,
/// and a name that is nothing but a mark stands.
[[nodiscard]] std::string Strip_Input_Mark(std::string_view name);

}  // namespace ingester

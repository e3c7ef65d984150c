// How a text table is written, as far as its bytes tell: found once, before it is read, and kept for whoever
// wants to tell it.
#pragma once

#include "platform/text_codes.h"

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string_view>

namespace ingester {

/// The separator of a single column, whose texts may hold any sign: it ends fields where lines end.
constexpr char No_Separator = '\n';

/// The dialect of a text table. Lines count from 1, as the file has them.
struct Text_Dialect {
    Text_Code code = nullptr;         ///< of its letters, in the file
    char separator = ',';             ///< between fields; a blank with `runs`
    bool runs = false;                ///< several separators are one: blanks and tabs
    char quote = '"';                 ///< around texts; NUL: none
    char escape = '\0';               ///< in front of a quote inside a text; NUL: it is doubled
    char decimal = '.';               ///< between whole and fraction
    char thousands = '\0';            ///< between groups of three digits; NUL: none
    char comment = '\0';              ///< lines that begin with it are passed over; NUL: none
    bool late_comments = false;       ///< none was met, but may be: lines of one field behind "#"
    std::int64_t lines_in_front = 0;  ///< titles and the like that are passed over
    std::int32_t names_lines = 1;     ///< 0: the columns have no names
    bool rows_are_named = false;      ///< the line of names has none for the first column
    std::int32_t columns = 0;         ///< fields of most lines
    std::int32_t table = 1;           ///< which of the file's tables this is
    std::int64_t next_table = 0;      ///< line where another one begins that was not read; 0: none was met
};

/// What the user has told of it, which is never guessed.
struct Told_Dialect {
    std::string_view separators;       ///< empty: not told
    std::optional<char> quote;         ///< NUL: none
    char decimal = '\0';               ///< NUL: not told
    std::int32_t names_lines = -1;     ///< below 0: not told
    bool lines_in_front_told = false;  ///< they are gone already
    std::string_view file_name;        ///< its ending breaks ties
};

/// A dialect, and the part of the text that is the table.
struct Found_Table {
    Text_Dialect dialect;
    std::size_t first = 0;         ///< where its names begin, or its first row
    std::size_t last = 0;          ///< behind its last line, as far as that is known
    std::size_t lines_behind = 0;  ///< lines of the footer that stands there
};

/// The length of a first line as "sep=;", which tells the separator and belongs to no table; 0 for none.
[[nodiscard]] std::size_t Separator_Line(std::string_view text);

/// Finds the dialect of a text by samples from its start, middle and end; a short one is looked at whole.
[[nodiscard]] Found_Table Find_Dialect(std::string_view text, const Told_Dialect& told);

/// Whether a table of another shape than `dialect` tells begins with the lines at the head of `text`, which
/// stand behind an empty line.
[[nodiscard]] bool Begins_Other_Table(std::string_view text, const Text_Dialect& dialect);

/// Where table number `table` (from 1) of a text begins; beyond the last one the text's size.
[[nodiscard]] std::size_t Start_Of_Table(std::string_view text, std::int32_t table, const Told_Dialect& told);

/// The dialect of the text that the request has read; null where it has read none, or as for a host.
[[nodiscard]] const Text_Dialect* Found_Dialect();
void Set_Found_Dialect(const Text_Dialect& dialect);

}  // namespace ingester

// The questions that are put to a sample one after the other, each resting on the answers before it.
#pragma once

#include "spreadsheet/dialect/field_kind.h"
#include "spreadsheet/dialect/sample_rows.h"

#include <cstdint>
#include <span>

namespace ingester {

/// Separator, quote and escape: the steadiest count of fields that look like such.
[[nodiscard]] Text_Dialect Find_Separation(const Text_Sample& sample, const Told_Dialect& told);

/// Whether a blank stands behind each separator of a row, as behind commas in prose.
[[nodiscard]] bool Is_Spaced(std::span<const Sample_Field> fields);

/// Where in a sample the table is, by row.
struct Table_Place {
    std::size_t first = 0;   ///< its names, or first row
    std::size_t last = 0;    ///< behind its last row in the head of the sample
    std::size_t footer = 0;  ///< where lines behind the table begin in the sample's tail; else its size
    bool names_in_comment = false;  ///< the row in front is a comment, and holds the names
};

/// Tells comments, and what stands in front of a table and behind it, from its rows.
[[nodiscard]] Table_Place Find_Place(const Sample_Rows& rows, const Told_Dialect& told,
                                     Text_Dialect& dialect);

/// Decimal mark and marks of thousands.
void Find_Marks(const Sample_Rows& rows, std::span<const Sample_Row> table, const Told_Dialect& told,
                Text_Dialect& dialect);

/// How many lines of names a table begins with, and whether its rows have names, too.
void Find_Names(const Sample_Rows& rows, std::span<const Sample_Row> table, const Told_Dialect& told,
                Text_Dialect& dialect);

/// The number marks of a dialect.
[[nodiscard]] inline Number_Marks Marks_Of(const Text_Dialect& dialect)
{
    return {dialect.decimal, dialect.thousands};
}

}  // namespace ingester

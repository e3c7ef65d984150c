// Text columns that become numbers and dates.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// What `Find_Date_Format` looks for.
struct Date_Format_Search {
    std::int32_t wanted = 1;   ///< wins among equals, and stands where little was found
    bool sample = false;       ///< is this a column of dates? Only its first cells are looked at
    bool has_default = false;  ///< a sample with some dates will do
    bool time_mode = false;    ///< times; without a sample, times only
};

/// The display code in whose layout most texts of a column are written; negated when some of their dates
/// have negative numbers in the column's `date_form`. 0 for a sample without dates, or no text column.
[[nodiscard]] std::int32_t Find_Date_Format(const Column* column, const Date_Format_Search& search);

/// Turns a text-like column into a Variate of dates (with `time_mode`, times) in day counts. Texts that
/// are no dates become missing, and are told in the request's messages. False for a column of another type.
bool Text_Column_To_Date(Column* column, bool time_mode);

/// For people, turns a Variate whose numbers are too great for days back into texts: they are dates without
/// separators, as 20200105. Nothing happens to other columns.
void Unpack_Dates(Column* column);

/// Turns a text-like column into a Variate. Texts that don't say their number plainly are told in
/// the request's messages. False for a column of another type.
bool Text_Column_To_Number(Column* column);

}  // namespace ingester

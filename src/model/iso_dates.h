// Dates and times as ISO 8601 writes them, which every other program reads.
#pragma once

#include "model/sheet.h"

#include <cstdint>

namespace ingester {

enum class Iso_Form : std::uint8_t {
    date,       ///< yyyy-mm-dd
    date_time,  ///< yyyy-mm-dd hh:mm:ss
    time,       ///< hh:mm:ss, the hours those of all days
    number,     ///< the column counts seconds or days
};

/// The form that all dates of a column need: what it shows, and a time of day or a day where one of its
/// numbers, or of its level values, has one that it doesn't show.
[[nodiscard]] Iso_Form Iso_Form_Of(const Column& column);

/// Prints a present number of a column whose form that is, a date or not, so that it is read as the same
/// again; times to thousandths of a second. Nothing for a date that ISO can't write. `target` has
/// `Number_Text_Room`. Returns the end of the text.
char* Print_For_Others(char* target, const Column& column, Iso_Form form, double value);

}  // namespace ingester

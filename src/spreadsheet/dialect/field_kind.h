// What a field of a text says for people: nothing, a number, a date or time, or text.
#pragma once

#include "spreadsheet/dialect/text_dialect.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

enum class Field_Sense : std::uint8_t { nothing, number, date, time, date_time, text };

/// How numbers are written.
struct Number_Marks {
    char decimal = '.';
    char thousands = '\0';  ///< NUL: none
};

/// A number that fills its field.
struct Field_Number {
    double value = 0;
    bool clipped = false;  ///< it lies beyond the greatest, which took its place
};

/// Whether `text` is a number: digits with leading zeros, or more of them than a double holds, are none. One
/// too small for a double is 0, one too great the greatest.
[[nodiscard]] bool Read_Number(std::string_view text, Number_Marks marks, Field_Number& number);

/// A number with a point and without groups; `room` holds it where it is spelled otherwise.
[[nodiscard]] std::string_view Plain_Number(std::string_view text, Number_Marks marks, std::string& room);

/// Words for missing values.
inline constexpr std::string_view Missing_Words[] = {"NA", "N/A", "NaN", "NULL", "null", "-", "."};

/// Whether `text` is one of them, or nothing.
[[nodiscard]] bool Is_Missing_Word(std::string_view text);

/// A date, time of day or both, as ISO 8601 writes them with dashes and colons: days since the end of
/// February 1600, and the fraction of a day.
struct Iso_Moment {
    Field_Sense sense = Field_Sense::text;
    double value = 0;
    bool fraction = false;  ///< it tells thousandths of a second
    bool finer = false;     ///< and less, which is left out
};
[[nodiscard]] Iso_Moment Read_Iso_Moment(std::string_view text);

/// What a field says by itself.
[[nodiscard]] Field_Sense Sense_Of_Field(std::string_view text, Number_Marks marks);

/// What commas and points in a number tell of their use.
enum class Mark_Evidence : std::uint8_t {
    none,
    point,            ///< a decimal point
    comma,            ///< a decimal comma
    point_or_groups,  ///< "1.234"
    comma_or_groups,  ///< "1,234"
    comma_groups,     ///< "1,234,567" or "1,234.5"
    point_groups,     ///< "1.234.567" or "1.234,5"
};
[[nodiscard]] Mark_Evidence Evidence_Of(std::string_view text);

}  // namespace ingester

// Numbers to text and text to numbers: plain decimal, in no locale.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

enum class Number_Status : std::uint8_t {
    none,          ///< no number stands at the start
    good,          ///< a number, in the range of a double
    out_of_range,  ///< a number too great, or too small, for a double
};

struct Parsed_Number {
    const char* end;  ///< behind the last character taken; the start when there is no number
    double value;     ///< 0 unless `status` is good
    Number_Status status;
};

/// The longest number that stands at `first`: sign, digits with an optional point, and an exponent
/// `e` or `E`. Nothing else counts: no blanks, no "nan", no "inf", no hexadecimal.
[[nodiscard]] Parsed_Number Parse_Number(const char* first, const char* last);

/// The number that fills `first`..`last`, if it is written in a usual form: up to 18 digits, a point
/// among them, an exponent of two. Quicker than `Parse_Number`, which has the last word on what this
/// refuses. `Readable_Behind` bytes behind `last` may be read, whatever they are.
[[nodiscard]] bool Parse_Usual_Number(const char* first, const char* last, double& value);

/// The same, and how many decimals it has; below 0 for a number with an exponent.
[[nodiscard]] bool Parse_Usual_Number(const char* first, const char* last, double& value,
                                      std::int32_t& decimals);
constexpr std::size_t Readable_Behind = 16;

/// The number that the whole of `text` is, if it is one.
[[nodiscard]] inline bool Whole_Number_Text(std::string_view text, double& value)
{
    const Parsed_Number parsed = Parse_Number(text.data(), text.data() + text.size());
    value = parsed.value;
    return parsed.status == Number_Status::good && parsed.end == text.data() + text.size();
}

/// Room for any number printed by the functions below with at most 40 decimals.
constexpr std::size_t Number_Text_Room = 400;

/// As printf's "%.{digits}g" prints a finite `value`; 1 to 40 digits. Returns the end of the text.
char* Print_General(char* target, double value, int digits);

/// The shortest text that reads as the same finite `value`: without an exponent from 0.0001 to 10^17.
char* Print_Shortest(char* target, double value);

/// As printf's "%.{decimals}e" prints it; 0 to 40 decimals.
char* Print_Exponent(char* target, double value, int decimals);

/// As printf's "%.{decimals}f" prints it; 0 to 40 decimals.
char* Print_Fixed(char* target, double value, int decimals);

/// The digits of an integer.
char* Print_Integer(char* target, std::int64_t value);

}  // namespace ingester

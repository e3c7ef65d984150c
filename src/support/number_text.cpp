#include "support/number_text.h"

#include "support/byte_fields.h"
#include "support/text.h"

#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>

namespace ingester {

namespace {

/// Every power of ten that a double holds exactly.
constexpr std::array<double, 23> Exact_Powers = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,  1e7,
                                                 1e8,  1e9,  1e10, 1e11, 1e12, 1e13, 1e14, 1e15,
                                                 1e16, 1e17, 1e18, 1e19, 1e20, 1e21, 1e22};

constexpr int Greatest_Exact_Power = static_cast<int>(Exact_Powers.size()) - 1;

/// The decimal digits of a number: value = 0.d1d2d3... * 10^point.
struct Decimal_Digits {
    char text[32] = {};  ///< the digits stand at the end of the first half
    int count = 0;       ///< without the zeros at the end
    int point = 0;

    [[nodiscard]] const char* Digits(int all) const { return text + sizeof text / 2 - all; }
};

/// a * b as an unevaluated sum, exact while nothing overflows (Dekker's product).
void Multiply_Exactly(double a, double b, double& product, double& rest)
{
    constexpr double splitter = 134217729.0;  // 2^27 + 1
    product = a * b;
    const double a_split = a * splitter;
    const double b_split = b * splitter;
    const double a_high = a_split - (a_split - a);
    const double b_high = b_split - (b_split - b);
    const double a_low = a - a_high;
    const double b_low = b - b_high;
    rest = a_low * b_low - (((product - a_high * b_high) - a_low * b_high) - a_high * b_low);
}

/// `value` * 10^scale to the nearest integer, ties to even, as printf rounds.
std::uint64_t Round_Scaled(double value, int scale)
{
    double product;
    double rest;
    Multiply_Exactly(value, Exact_Powers[static_cast<std::size_t>(scale)], product, rest);
    auto whole = static_cast<std::uint64_t>(product);  // below 10^16: truncation is exact
    const double fraction = product - static_cast<double>(whole);
    if (fraction > 0.5 || (fraction == 0.5 && (rest > 0.0 || (rest == 0.0 && whole % 2 == 1))))
        return whole + 1;
    return whole;
}

/// The eight digits of a number below 10^8 as a word, the first in the low byte, each 0 to 9: the
/// number is halved to fours, pairs and digits, all at once.
std::uint64_t Spread_Digits(std::uint64_t number)
{
    const std::uint64_t fours = number / 10000 | (number % 10000) << 32;
    const std::uint64_t pair_heads = (fours * 10486 >> 20) & 0x0000007F0000007FU;
    const std::uint64_t pairs = pair_heads + ((fours - 100 * pair_heads) << 16);
    const std::uint64_t tens = (pairs * 103 >> 10) & 0x000F000F000F000FU;
    return tens + ((pairs - 10 * tens) << 8);
}

constexpr std::uint64_t Eight_Digits = 100000000;
constexpr std::uint64_t Zero_Characters = 0x3030303030303030U;

/// Sixteen digits with leading zeros; `zeros` gets how many stand at the end.
void Print_Sixteen_Digits(char* target, std::uint64_t number, int& zeros)
{
    const std::uint64_t high = Spread_Digits(number / Eight_Digits);
    const std::uint64_t low = Spread_Digits(number % Eight_Digits);
    zeros = low != 0 ? std::countl_zero(low) / 8 : 8 + std::countl_zero(high) / 8;
    Put_Number<std::uint64_t>(target, high | Zero_Characters);
    Put_Number<std::uint64_t>(target + 8, low | Zero_Characters);
}

/// Digits of a positive `value` in front of the decimal point, or one too few, by its power of two.
int Estimate_Point(double value)
{
    const int exponent = static_cast<int>(std::bit_cast<std::uint64_t>(value) >> 52) - 1023;
    return (exponent * 1233 >> 12) + 1;  // 1233 / 4096 is a little less than log10(2)
}

constexpr int Most_Quick_Digits = 15;

/// Digits of a positive `value` rounded to `wanted` of them, when doubles can do it exactly.
bool Round_To_Digits(double value, int wanted, Decimal_Digits& decimal)
{
    if (!(value >= 1e-5 && value < 1e15) || wanted > Most_Quick_Digits)
        return false;
    int scale = wanted - Estimate_Point(value);
    const auto limit = static_cast<std::uint64_t>(Exact_Powers[static_cast<std::size_t>(wanted)]);
    std::uint64_t rounded = 0;
    for (;; --scale) {
        if (scale < 0 || scale > Greatest_Exact_Power)
            return false;
        rounded = Round_Scaled(value, scale);
        if (rounded < limit)
            break;
    }
    int zeros;
    Print_Sixteen_Digits(decimal.text, rounded, zeros);
    decimal.count = wanted - zeros;
    decimal.point = wanted - scale;
    return rounded >= limit / 10;
}

/// Both write sixteen characters, of which `count` stay: a fixed length is two moves, no call.
char* Copy_Digits(char* target, const char* digits, int count)
{
    std::memcpy(target, digits, 16);
    return target + count;
}

char* Fill_Zeros(char* target, int count)
{
    std::memset(target, '0', 16);
    return target + count;
}

/// Lays `all` digits out without an exponent, trailing zeros gone.
char* Lay_Out_Plain(char* target, const Decimal_Digits& decimal, int all)
{
    const char* const digits = decimal.Digits(all);
    if (decimal.point <= 0) {
        *target++ = '0';
        *target++ = '.';
        return Copy_Digits(Fill_Zeros(target, -decimal.point), digits, decimal.count);
    }
    if (decimal.count <= decimal.point)
        return Fill_Zeros(Copy_Digits(target, digits, decimal.count), decimal.point - decimal.count);
    target = Copy_Digits(target, digits, decimal.point);
    *target++ = '.';
    return Copy_Digits(target, digits + decimal.point, decimal.count - decimal.point);
}

char* Print_By_Library(char* target, double value, std::chars_format format, int precision)
{
    return std::to_chars(target, target + Number_Text_Room, value, format, precision).ptr;
}

constexpr double Plain_Integer_Limit = 1e15;

bool Is_Plain_Integer(double value, double limit)
{
    return std::fabs(value) < limit && value == static_cast<double>(static_cast<std::int64_t>(value))
           && !(value == 0.0 && std::signbit(value));
}

}  // namespace

namespace {

constexpr std::uint64_t Exact_Integer_Limit = std::uint64_t{1} << 53;
constexpr int Safe_Digits = 18;  // that many fit a signed 64-bit integer

constexpr std::uint64_t Integer_Powers[] = {1, 10, 100, 1000, 10000, 100000, 1000000, 10000000, 100000000};

/// Up to eight characters as a word, the first in the low byte.
std::uint64_t Load_Word(const char* at)
{
    return Number_At<std::uint64_t>(at);
}

/// How many of the characters of `word` are digits, before the first that isn't. `word` has been
/// xor-ed with '0's, so that digits are 0 to 9.
int Leading_Digits(std::uint64_t word)
{
    const std::uint64_t others = ((word + 0x7676767676767676U) | word) & 0x8080808080808080U;
    return others == 0 ? 8 : std::countr_zero(others) / 8;
}

/// The number that `count` digits (1 to 8) at the low end of `word` make: neighbours are joined to
/// pairs, pairs to fours, fours to eight, all at once.
std::uint64_t Join_Digits(std::uint64_t word, int count)
{
    word <<= 64 - 8 * count;
    word = word * 10 + (word >> 8);
    constexpr std::uint64_t pairs = 0x000000FF000000FFU;
    return ((word & pairs) * 0x000F424000000064U + ((word >> 16) & pairs) * 0x0000271000000001U) >> 32;
}

/// A number under way: `digits` * 10^`exponent`, of `count` digits.
struct Decimal_Scan {
    std::uint64_t digits = 0;
    int count = 0;
    int exponent = 0;
};

/// Takes a run of digits; beyond `Safe_Digits` only their count goes on.
inline const char* Take_Digits(const char* at, Decimal_Scan& scan)
{
    constexpr std::uint64_t zeros = 0x3030303030303030U;
    for (;;) {
        const std::uint64_t word = Load_Word(at) ^ zeros;
        const int found = Leading_Digits(word);
        if (found == 0)
            return at;
        scan.count += found;
        if (scan.count <= Safe_Digits)
            scan.digits = scan.digits * Integer_Powers[found] + Join_Digits(word, found);
        at += found;
        if (found < 8 || scan.count > Safe_Digits)
            return at;
    }
}

/// An exponent counts only with a digit in it: "1e" is the number 1 and a letter.
const char* Take_Exponent(const char* at, Decimal_Scan& scan)
{
    const char* digit = at + 1;
    const bool negative = *digit == '-';
    if (negative || *digit == '+')
        ++digit;
    if (!Is_Digit(*digit))
        return at;
    int exponent = 0;
    for (; Is_Digit(*digit); ++digit)
        exponent = exponent < 10000 ? exponent * 10 + (*digit - '0') : exponent;
    scan.exponent += negative ? -exponent : exponent;
    return digit;
}

/// Where digits and power are exact as they are, one multiplication or division rounds once, which
/// makes the nearest double.
bool Convert_Exactly(const Decimal_Scan& scan, double& value)
{
    if (scan.digits > Exact_Integer_Limit)
        return false;
    value = static_cast<double>(static_cast<std::int64_t>(scan.digits));
    if (scan.exponent < 0)
        value /= Exact_Powers[static_cast<std::size_t>(-scan.exponent)];
    else
        value *= Exact_Powers[static_cast<std::size_t>(scan.exponent)];
    return true;
}

/// With a wider type for the one rounding, a second one to double does no harm unless the wide
/// result lies half-way between two doubles.
bool Convert_Widely(const Decimal_Scan& scan, double& value)
{
    using Wide = long double;
    if constexpr (std::numeric_limits<Wide>::digits != 64 || std::numeric_limits<double>::digits != 53)
        return false;
    auto wide = static_cast<Wide>(static_cast<std::int64_t>(scan.digits));
    if (scan.exponent < 0)
        wide /= static_cast<Wide>(Exact_Powers[static_cast<std::size_t>(-scan.exponent)]);
    else
        wide *= static_cast<Wide>(Exact_Powers[static_cast<std::size_t>(scan.exponent)]);
    std::uint64_t mantissa;
    std::memcpy(&mantissa, &wide, sizeof mantissa);
    value = static_cast<double>(wide);
    return (mantissa & 0x7FF) != 0x400;
}

/// The library takes what the quick roads don't.
Parsed_Number Parse_By_Library(const char* first, const char* last)
{
    const char* const start = *first == '+' ? first + 1 : first;
    double value = 0.0;
    const auto [end, error] = std::from_chars(start, last, value);
    if (error == std::errc::invalid_argument)
        return {first, 0.0, Number_Status::none};
    if (error != std::errc{})
        return {end, 0.0, Number_Status::out_of_range};
    return {end, value, Number_Status::good};
}

}  // namespace

Parsed_Number Parse_Number_In_Buffer(const char* first)
{
    const bool negative = *first == '-';
    const char* at = first + (negative || *first == '+' ? 1 : 0);
    Decimal_Scan scan;
    at = Take_Digits(at, scan);
    if (*at == '.') {
        const int whole_digits = scan.count;
        at = Take_Digits(at + 1, scan);
        scan.exponent = whole_digits - scan.count;
    }
    if (scan.count == 0)
        return {first, 0.0, Number_Status::none};
    if (*at == 'e' || *at == 'E')
        at = Take_Exponent(at, scan);
    double value;
    const bool in_reach = scan.count <= Safe_Digits && scan.exponent >= -Greatest_Exact_Power
                          && scan.exponent <= Greatest_Exact_Power;
    if (in_reach && (Convert_Exactly(scan, value) || Convert_Widely(scan, value)))
        return {at, negative ? -value : value, Number_Status::good};
    while (Is_Digit(*at) || *at == '.' || *at == '-' || *at == '+' || *at == 'e' || *at == 'E')
        ++at;
    return Parse_By_Library(first, at);
}

Parsed_Number Parse_Number(const char* first, const char* last)
{
    constexpr std::size_t room = 64;
    const auto length = static_cast<std::size_t>(last - first);
    if (length == 0)
        return {first, 0.0, Number_Status::none};
    if (length < room - Readable_Behind) {
        char padded[room];
        std::memcpy(padded, first, length);
        std::memset(padded + length, 0, room - length);
        const Parsed_Number parsed = Parse_Number_In_Buffer(padded);
        return {first + (parsed.end - padded), parsed.value, parsed.status};
    }
    // The library would also take "inf" and "nan", and a second sign behind a "+".
    const char* const digits = *first == '-' || *first == '+' ? first + 1 : first;
    if (!Is_Digit(*digits) && *digits != '.')
        return {first, 0.0, Number_Status::none};
    return Parse_By_Library(first, last);
}

char* Print_Integer(char* target, std::int64_t value)
{
    return std::to_chars(target, target + 24, value).ptr;
}

char* Print_General(char* target, double value, int digits)
{
    const double integer_limit =
        digits >= 15 ? Plain_Integer_Limit : Exact_Powers[static_cast<std::size_t>(digits)];
    if (Is_Plain_Integer(value, integer_limit))
        return Print_Integer(target, static_cast<std::int64_t>(value));
    Decimal_Digits decimal{};
    const double size = std::fabs(value);
    // "%g" leaves the plain form below 1e-4; a rounding up to 10^digits would leave it too.
    if (size >= 1e-4 && Round_To_Digits(size, digits, decimal) && decimal.point <= digits) {
        if (value < 0.0)
            *target++ = '-';
        return Lay_Out_Plain(target, decimal, digits);
    }
    return Print_By_Library(target, value, std::chars_format::general, digits);
}

char* Print_Exponent(char* target, double value, int decimals)
{
    return Print_By_Library(target, value, std::chars_format::scientific, decimals);
}

char* Print_Fixed(char* target, double value, int decimals)
{
    return Print_By_Library(target, value, std::chars_format::fixed, decimals);
}

}  // namespace ingester

#include "support/number_text.h"

#include "support/text.h"

#include <array>
#include <charconv>
#include <cmath>
#include <cstring>

namespace ingester {

namespace {

/// Every power of ten that a double holds exactly.
constexpr std::array<double, 23> Exact_Powers = {1e0,  1e1,  1e2,  1e3,  1e4,  1e5,  1e6,  1e7,
                                                 1e8,  1e9,  1e10, 1e11, 1e12, 1e13, 1e14, 1e15,
                                                 1e16, 1e17, 1e18, 1e19, 1e20, 1e21, 1e22};

constexpr int Greatest_Exact_Power = static_cast<int>(Exact_Powers.size()) - 1;

/// The decimal digits of a number: value = 0.d1d2d3... * 10^point.
struct Decimal_Digits {
    char digits[20];
    int count;
    int point;
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

/// Digits of a positive `value` rounded to `wanted` of them, when doubles can do it exactly.
bool Round_To_Digits(double value, int wanted, Decimal_Digits& decimal)
{
    if (!(value >= 1e-5 && value < 1e15) || wanted > 15)
        return false;
    int point = 0;  // digits in front of the decimal point
    if (value >= 1.0)
        while (value >= Exact_Powers[static_cast<std::size_t>(point)])
            ++point;
    else
        while (value * Exact_Powers[static_cast<std::size_t>(1 - point)] < 1.0)
            --point;
    const int scale = wanted - point;
    if (scale < 0 || scale > Greatest_Exact_Power)
        return false;
    const std::uint64_t rounded = Round_Scaled(value, scale);
    const auto printed = std::to_chars(decimal.digits, decimal.digits + sizeof decimal.digits, rounded);
    decimal.count = static_cast<int>(printed.ptr - decimal.digits);
    decimal.point = decimal.count - scale;
    return decimal.count == wanted || decimal.count == wanted + 1;
}

char* Copy_Digits(char* target, const char* digits, int count)
{
    std::memcpy(target, digits, static_cast<std::size_t>(count));
    return target + count;
}

char* Fill_Zeros(char* target, int count)
{
    std::memset(target, '0', static_cast<std::size_t>(count));
    return target + count;
}

/// Lays digits out without an exponent, trailing zeros gone.
char* Lay_Out_Plain(char* target, const Decimal_Digits& decimal)
{
    int count = decimal.count;
    while (count > 1 && decimal.digits[count - 1] == '0')
        --count;
    if (decimal.point <= 0) {
        *target++ = '0';
        *target++ = '.';
        return Copy_Digits(Fill_Zeros(target, -decimal.point), decimal.digits, count);
    }
    if (count <= decimal.point)
        return Fill_Zeros(Copy_Digits(target, decimal.digits, count), decimal.point - count);
    target = Copy_Digits(target, decimal.digits, decimal.point);
    *target++ = '.';
    return Copy_Digits(target, decimal.digits + decimal.point, count - decimal.point);
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

Parsed_Number Parse_Number(const char* first, const char* last)
{
    const char* start = first;
    if (start != last && *start == '+')
        ++start;
    // The library would also take "inf" and "nan", and a second sign behind our "+".
    const char* const digits = start != last && *start == '-' && start == first ? start + 1 : start;
    if (digits == last || !(Is_Digit(*digits) || *digits == '.'))
        return {first, 0.0, Number_Status::none};
    double value = 0.0;
    const auto [end, error] = std::from_chars(start, last, value);
    if (error == std::errc::invalid_argument)
        return {first, 0.0, Number_Status::none};
    if (error != std::errc{})
        return {end, 0.0, Number_Status::out_of_range};
    return {end, value, Number_Status::good};
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
    Decimal_Digits decimal;
    const double size = std::fabs(value);
    // "%g" leaves the plain form below 1e-4; a rounding up to 10^digits would leave it too.
    if (size >= 1e-4 && Round_To_Digits(size, digits, decimal) && decimal.point <= digits) {
        if (value < 0.0)
            *target++ = '-';
        return Lay_Out_Plain(target, decimal);
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

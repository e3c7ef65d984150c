#include "support/number_text.h"

#include "support/byte_fields.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <bit>
#include <charconv>
#include <cmath>
#include <cstring>
#include <limits>

#if defined(__SSE2__)
#include <immintrin.h>
#endif

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
    std::uint64_t number = 0;  ///< all digits; it is the value times 10^scale
    int scale = 0;

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
    decimal.number = rounded;
    decimal.scale = scale;
    return rounded >= limit / 10;
}

/// Whether the digits are read as just that `value`: both parts are exact, so the division rounds as a reader
/// does.
bool Read_Back_As(double value, const Decimal_Digits& decimal)
{
    return static_cast<double>(decimal.number) / Exact_Powers[static_cast<std::size_t>(decimal.scale)]
           == value;
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

constexpr std::uint64_t Integer_Powers[] = {1, 10, 100, 1000, 10000, 100000, 1000000, 10000000, 100000000};

constexpr unsigned Word_Digits = 8;
constexpr unsigned Most_Safe_Digits = 18;  // that many fit a signed 64-bit integer

/// The same character in all eight bytes of a word.
constexpr std::uint64_t Eight_Times(unsigned char c)
{
    return 0x0101010101010101U * c;
}

/// Up to eight digits as a word of values 0 to 9, the first in the low byte, zeros in front.
std::uint64_t Load_Digits(const char* at, unsigned count)
{
    return (Number_At<std::uint64_t>(at) ^ Eight_Times('0')) << (64 - 8 * count);
}

/// High bits where a loaded word holds something that is no digit.
std::uint64_t Strangers(std::uint64_t word)
{
    return ((word + Eight_Times(0x76)) | word) & Eight_Times(0x80);
}

/// The number that the digits of a word make: neighbours are joined to pairs, pairs to fours, fours
/// to eight, all at once.
std::uint64_t Join_Digits(std::uint64_t word)
{
    word = word * 10 + (word >> 8);
    constexpr std::uint64_t pairs = 0x000000FF000000FFU;
    return ((word & pairs) * 0x000F424000000064U + ((word >> 16) & pairs) * 0x0000271000000001U) >> 32;
}

/// Where the first decimal point stands in eight characters; 8 for none.
unsigned Find_Point(const char* at)
{
    const std::uint64_t word = Number_At<std::uint64_t>(at) ^ Eight_Times('.');
    const std::uint64_t zeros = (word - Eight_Times(1)) & ~word & Eight_Times(0x80);
    return zeros == 0 ? Word_Digits : static_cast<unsigned>(std::countr_zero(zeros)) / 8;
}

/// A number under way: `digits` * 10^`exponent`.
struct Decimal_Scan {
    std::uint64_t digits = 0;
    int exponent = 0;
};

/// Takes `count` digits behind those there are. False when others stand among them.
inline bool Take_Digits(const char* at, unsigned count, Decimal_Scan& scan)
{
    std::uint64_t strangers = 0;
    while (count > 0) {
        const unsigned taken = std::min(count, Word_Digits);
        const std::uint64_t word = Load_Digits(at, taken);
        scan.digits = scan.digits * Integer_Powers[taken] + Join_Digits(word);
        strangers |= Strangers(word);
        at += taken;
        count -= taken;
    }
    return strangers == 0;
}

/// Takes `length` characters, digits with at most one point between them. False for anything else.
bool Take_Mantissa_By_Words(const char* first, unsigned length, Decimal_Scan& scan)
{
    const unsigned whole = Find_Point(first);
    if (whole >= length)
        return length <= Most_Safe_Digits && Take_Digits(first, length, scan);
    const unsigned fraction = length - whole - 1;
    scan.exponent -= static_cast<int>(fraction);
    return whole != 0 && whole != Word_Digits && fraction != 0 && Take_Digits(first, whole, scan)
           && Take_Digits(first + whole + 1, fraction, scan);
}

#if defined(__SSE2__)
/// The same with all characters, where they are sixteen at most, in one register: the point is
/// closed up, zeros come in front, and neighbours are joined as above.
__attribute__((target("sse4.1"))) bool Take_Mantissa_At_Once(const char* first, unsigned length,
                                                             Decimal_Scan& scan)
{
    if (length > 16)
        return Take_Mantissa_By_Words(first, length, scan);
    const __m128i digits =
        _mm_sub_epi8(_mm_loadu_si128(reinterpret_cast<const __m128i*>(first)), _mm_set1_epi8('0'));
    const __m128i good = _mm_cmpeq_epi8(_mm_min_epu8(digits, _mm_set1_epi8(9)), digits);
    const unsigned strangers = ~static_cast<unsigned>(_mm_movemask_epi8(good)) & ((1U << length) - 1);
    unsigned whole = length;
    unsigned count = length;
    if (strangers != 0) {
        whole = static_cast<unsigned>(std::countr_zero(strangers));
        count = length - 1;
        if ((strangers & (strangers - 1)) != 0 || first[whole] != '.' || count == 0)
            return false;
        scan.exponent -= static_cast<int>(count - whole);
    }
    // Place i takes character i - (16 - count), or the next one from the point on; below 0, a zero.
    const __m128i places = _mm_setr_epi8(0, 1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15);
    __m128i from = _mm_sub_epi8(places, _mm_set1_epi8(static_cast<char>(16 - count)));
    from = _mm_sub_epi8(from, _mm_cmpgt_epi8(from, _mm_set1_epi8(static_cast<char>(whole - 1))));
    const __m128i ones = _mm_shuffle_epi8(digits, from);
    const __m128i pairs =
        _mm_maddubs_epi16(ones, _mm_setr_epi8(10, 1, 10, 1, 10, 1, 10, 1, 10, 1, 10, 1, 10, 1, 10, 1));
    const __m128i fours = _mm_madd_epi16(pairs, _mm_setr_epi16(100, 1, 100, 1, 100, 1, 100, 1));
    const __m128i eights = _mm_madd_epi16(_mm_packus_epi32(fours, fours),
                                          _mm_setr_epi16(10000, 1, 10000, 1, 10000, 1, 10000, 1));
    const auto both = static_cast<std::uint64_t>(_mm_cvtsi128_si64(eights));
    scan.digits = (both & 0xFFFFFFFFU) * Integer_Powers[Word_Digits] + (both >> 32);
    return true;
}

bool (*const Take_Mantissa)(const char*, unsigned, Decimal_Scan&) = __builtin_cpu_supports("sse4.1")
                                                                        ? Take_Mantissa_At_Once
                                                                        : Take_Mantissa_By_Words;
#else
constexpr auto Take_Mantissa = Take_Mantissa_By_Words;
#endif

/// Cuts an exponent of the usual form, as "e-05" or "e+10", off the end.
inline void Cut_Exponent(const char* first, const char*& last, Decimal_Scan& scan)
{
    constexpr std::ptrdiff_t width = 4;
    if (last - first <= width || (last[-4] != 'e' && last[-4] != 'E'))
        return;
    const bool negative = last[-3] == '-';
    if ((!negative && last[-3] != '+') || !Is_Digit(last[-2]) || !Is_Digit(last[-1]))
        return;
    const int exponent = (last[-2] - '0') * 10 + (last[-1] - '0');
    scan.exponent = negative ? -exponent : exponent;
    last -= width;
}

/// Where digits and power are exact as they are, one multiplication or division rounds once, which
/// makes the nearest double.
inline bool Convert_Exactly(const Decimal_Scan& scan, double& value)
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

}  // namespace

bool Parse_Usual_Number(const char* first, const char* last, double& value)
{
    std::int32_t decimals;
    return Parse_Usual_Number(first, last, value, decimals);
}

bool Parse_Usual_Number(const char* first, const char* last, double& value, std::int32_t& decimals)
{
    const bool negative = *first == '-';
    first += negative ? 1 : 0;
    Decimal_Scan scan;
    const char* const end = last;
    Cut_Exponent(first, last, scan);
    const std::ptrdiff_t length = last - first;
    if (length < 1 || length > static_cast<std::ptrdiff_t>(Most_Safe_Digits) + 1
        || !Take_Mantissa(first, static_cast<unsigned>(length), scan))
        return false;
    if (scan.exponent < -Greatest_Exact_Power || scan.exponent > Greatest_Exact_Power
        || !(Convert_Exactly(scan, value) || Convert_Widely(scan, value)))
        return false;
    value = negative ? -value : value;
    decimals = last == end ? -scan.exponent : -1;
    return true;
}

Parsed_Number Parse_Number(const char* first, const char* last)
{
    const char* start = first;
    if (start != last && *start == '+')
        ++start;
    // The library would also take "inf" and "nan", and a second sign behind a "+".
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

char* Print_Shortest(char* target, double value)
{
    constexpr double least_plain = 1e-4;
    constexpr double plain_end = 1e17;
    if (Is_Plain_Integer(value, Plain_Integer_Limit))
        return Print_Integer(target, static_cast<std::int64_t>(value));
    Decimal_Digits decimal{};
    const double size = std::fabs(value);
    if (size >= least_plain && Round_To_Digits(size, Most_Quick_Digits, decimal)
        && decimal.point <= Most_Quick_Digits && Read_Back_As(size, decimal)) {
        if (value < 0.0)
            *target++ = '-';
        return Lay_Out_Plain(target, decimal, Most_Quick_Digits);
    }
    const bool plain = (size >= least_plain && size < plain_end) || size == 0.0;
    return std::to_chars(target, target + Number_Text_Room, value,
                         plain ? std::chars_format::fixed : std::chars_format::scientific)
        .ptr;
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

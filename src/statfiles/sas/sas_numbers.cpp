#include "statfiles/sas/sas_numbers.h"

#include <cmath>

namespace ingester {

namespace {

constexpr std::uint64_t All_Ones = ~std::uint64_t{0};
constexpr std::uint64_t Sign = std::uint64_t{1} << 63;

/// Forms that stand for numbers which were too great; the first that stands for those too small.
constexpr std::uint64_t Too_Small_Form = All_Ones;
constexpr std::uint64_t Too_Great_Forms[] = {All_Ones >> 1, 0x0010000000000000, 0x8010000000000000};

/// The top 16 bits of a number that stands for a missing value, in front of the complement of its mark.
constexpr std::uint64_t Missing_Top = 0xFFFF;
constexpr unsigned Mark_Place = 40;

/// Of the binary exponent, 4 a digit of 16.
constexpr int Least_Exponent = -260;
constexpr int Greatest_Exponent = 248;
constexpr int Exponent_Of_One = 65;

/// A mark that isn't stored as its complement.
constexpr std::uint8_t Odd_Complement = 0xD2;
constexpr std::uint8_t Odd_Mark = 0x6D;

/// Numbers whose first digits are 0, which no usual program writes.
double Unusual_Number(std::uint64_t stored)
{
    const auto fraction = static_cast<double>(stored & (All_Ones >> 8));
    const int exponent = 4 * (static_cast<int>(stored >> 56 & 0x7F) - 64) - 56;
    return std::copysign(std::ldexp(fraction, exponent), (stored & Sign) != 0 ? -1.0 : 1.0);
}

}  // namespace

double Sas_Missing_Number(std::uint8_t mark)
{
    return std::bit_cast<double>(Missing_Top << 48
                                 | std::uint64_t{static_cast<std::uint8_t>(~mark)} << Mark_Place);
}

std::int32_t Ibm_To_Double(const std::byte* in8, double& out)
{
    const auto stored = Number_At<std::uint64_t, std::endian::big>(in8);
    out = Usual_Ibm_Number(stored);
    if (out == out)
        return 1;
    if (stored == Too_Small_Form) {
        out = 0;
        return 0;
    }
    for (const std::uint64_t form : Too_Great_Forms)
        if (stored == form) {
            out = Sas_Missing_Number('.');
            return 0;
        }
    const bool marked = stored << 8 == 0;
    out = marked ? Sas_Missing_Number(static_cast<std::uint8_t>(stored >> 56)) : Unusual_Number(stored);
    return 1;
}

void Double_To_Ibm(double in, std::byte* out8)
{
    const auto bits = std::bit_cast<std::uint64_t>(in);
    const int exponent = static_cast<int>(bits >> 52 & 0x7FF) - 1023;
    std::uint64_t stored = 0;
    if (bits >> 48 == Missing_Top) {
        const auto mark = static_cast<std::uint8_t>(~(bits >> Mark_Place));
        stored = std::uint64_t{mark == Odd_Complement ? Odd_Mark : mark} << 56;
    } else if (bits << 1 == 0) {
        stored = 0;
    } else if (exponent < Least_Exponent) {
        stored = Too_Small_Form;
    } else if (exponent > Greatest_Exponent) {
        stored = Too_Great_Forms[0];
    } else {
        const std::uint64_t fraction = (bits & (All_Ones >> 12)) | std::uint64_t{1} << 52;
        stored = (bits & Sign) | static_cast<std::uint64_t>((exponent >> 2) + Exponent_Of_One) << 56
                 | fraction << (exponent & 3);
    }
    Put_Number<std::uint64_t, std::endian::big>(out8, stored);
}

}  // namespace ingester

// The floating-point numbers of transport files: a sign, an exponent of 16 and 56 bits of a fraction.
#pragma once

#include "support/byte_fields.h"

#include <bit>
#include <cstddef>
#include <cstdint>

namespace ingester {

/// Converts a stored number of eight bytes. 0 for one of the forms that mean overflow, else 1; `out` is no
/// number where a missing value is stored.
std::int32_t Ibm_To_Double(const std::byte* in8, double& out);

/// The reverse; beyond the exponents that can be stored the bytes tell so.
void Double_To_Ibm(double in, std::byte* out8);

/// A SAS missing value as no number, by its first byte: '.', '_' or 'A' to 'Z'.
[[nodiscard]] double Sas_Missing_Number(std::uint8_t mark);

/// What a double of a usual stored number is; one that isn't a number stands for all others, which
/// `Ibm_To_Double` tells apart.
[[nodiscard]] inline double Usual_Ibm_Number(std::uint64_t stored)
{
    constexpr std::uint64_t sign = std::uint64_t{1} << 63;
    constexpr std::uint64_t fraction_bits = (std::uint64_t{1} << 56) - 1;
    const std::uint64_t fraction = stored & fraction_bits;
    if (fraction < std::uint64_t{1} << 52 || stored << 1 == 0xFFFFFFFFFFFFFFFE
        || (stored << 1 >> 1) == 0x0010000000000000) [[unlikely]]
        return stored == 0 ? 0.0 : std::bit_cast<double>(~std::uint64_t{0});
    const int shift = std::countl_zero(fraction) - 8;  // 0 to 3, since the first digit isn't 0
    const std::uint64_t exponent = 4 * (stored >> 56 & 0x7F) + 1023 - 256 - 1 - static_cast<unsigned>(shift);
    const std::uint64_t shifted = (fraction << shift << 8) << 1;  // without the bit that is implied
    return std::bit_cast<double>((stored & sign) | exponent << 52 | shifted >> 12);
}

}  // namespace ingester

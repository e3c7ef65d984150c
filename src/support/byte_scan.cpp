#include "support/byte_scan.h"

#include <bit>
#include <cstring>

#if defined(__SSE2__)
#include <immintrin.h>
#endif

namespace ingester {

namespace {

constexpr std::size_t Chunk_Size = 64;

/// A bit for each of the 64 bytes at `at` that is one of `members`; and whether one is beyond ASCII.
struct Chunk_Bits {
    std::uint64_t found = 0;
    std::uint64_t beyond_ascii = 0;
};
using Chunk_Look = Chunk_Bits (*)(const char* at, std::string_view members);

#if defined(__SSE2__)
Chunk_Bits Look_By_Sixteen(const char* at, std::string_view members)
{
    Chunk_Bits bits;
    for (unsigned part = 0; part < 4; ++part) {
        const __m128i bytes = _mm_loadu_si128(reinterpret_cast<const __m128i*>(at + 16 * part));
        __m128i found = _mm_setzero_si128();
        for (const char c : members)
            found = _mm_or_si128(found, _mm_cmpeq_epi8(bytes, _mm_set1_epi8(c)));
        bits.found |= static_cast<std::uint64_t>(static_cast<unsigned>(_mm_movemask_epi8(found)))
                      << (16 * part);
        bits.beyond_ascii |= static_cast<unsigned>(_mm_movemask_epi8(bytes));
    }
    return bits;
}

__attribute__((target("avx2"))) Chunk_Bits Look_By_Thirty_Two(const char* at, std::string_view members)
{
    const __m256i low = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(at));
    const __m256i high = _mm256_loadu_si256(reinterpret_cast<const __m256i*>(at + 32));
    __m256i found_low = _mm256_setzero_si256();
    __m256i found_high = _mm256_setzero_si256();
    for (const char c : members) {
        const __m256i wanted = _mm256_set1_epi8(c);
        found_low = _mm256_or_si256(found_low, _mm256_cmpeq_epi8(low, wanted));
        found_high = _mm256_or_si256(found_high, _mm256_cmpeq_epi8(high, wanted));
    }
    return {static_cast<std::uint64_t>(static_cast<unsigned>(_mm256_movemask_epi8(found_high))) << 32
                | static_cast<unsigned>(_mm256_movemask_epi8(found_low)),
            static_cast<unsigned>(_mm256_movemask_epi8(_mm256_or_si256(low, high)))};
}

const Chunk_Look Look_At_Chunk = __builtin_cpu_supports("avx2") ? Look_By_Thirty_Two : Look_By_Sixteen;
#else
Chunk_Bits Look_At_Chunk(const char* at, std::string_view members)
{
    Chunk_Bits bits;
    for (std::size_t i = 0; i < Chunk_Size; ++i) {
        bits.found |= std::uint64_t{members.find(at[i]) != std::string_view::npos} << i;
        bits.beyond_ascii |= static_cast<unsigned char>(at[i]) & 0x80U;
    }
    return bits;
}
#endif

}  // namespace

Byte_Finder::Byte_Finder(std::string_view members) : members_(members)
{
    for (const char c : members)
        holds_[static_cast<unsigned char>(c)] = true;
}

std::size_t Byte_Finder::Find_All(std::string_view text, std::uint32_t* offsets, bool& ascii) const
{
    const std::uint32_t* const start = offsets;
    std::uint64_t beyond_ascii = 0;
    const auto take = [&](const Chunk_Bits& chunk, std::size_t at, std::uint64_t within) {
        beyond_ascii |= chunk.beyond_ascii;
        for (std::uint64_t bits = chunk.found & within; bits != 0; bits &= bits - 1)
            *offsets++ = static_cast<std::uint32_t>(at) + static_cast<std::uint32_t>(std::countr_zero(bits));
    };
    std::size_t at = 0;
    for (; at + Chunk_Size <= text.size(); at += Chunk_Size)
        take(Look_At_Chunk(text.data() + at, members_), at, ~std::uint64_t{0});
    if (const std::size_t left = text.size() - at; left > 0) {
        char tail[Chunk_Size] = {};
        std::memcpy(tail, text.data() + at, left);
        take(Look_At_Chunk(tail, members_), at, (std::uint64_t{1} << left) - 1);
    }
    ascii = ascii && beyond_ascii == 0;
    return static_cast<std::size_t>(offsets - start);
}

}  // namespace ingester

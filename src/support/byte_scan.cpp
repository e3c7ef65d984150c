#include "support/byte_scan.h"

#include <algorithm>
#include <bit>
#include <cstring>

#if defined(__SSE2__)
#include <emmintrin.h>
#endif

namespace ingester {

namespace {

/// 64 bytes of a text, to be asked where a character stands in them: a bit for each byte.
class Chunk {
public:
    static constexpr std::size_t size = 64;

#if defined(__SSE2__)
    explicit Chunk(const char* at)
    {
        for (std::size_t part = 0; part < 4; ++part)
            bytes_[part] = _mm_loadu_si128(reinterpret_cast<const __m128i*>(at + 16 * part));
    }

    [[nodiscard]] std::uint64_t Where(char c) const
    {
        const __m128i wanted = _mm_set1_epi8(c);
        std::uint64_t bits = 0;
        for (unsigned part = 0; part < 4; ++part) {
            const int found = _mm_movemask_epi8(_mm_cmpeq_epi8(bytes_[part], wanted));
            bits |= static_cast<std::uint64_t>(static_cast<unsigned>(found)) << (16 * part);
        }
        return bits;
    }

    /// Whether a character has been seen in any of the chunks looked at.
    struct Sighting {
        __m128i seen = _mm_setzero_si128();
    };
    void Look_For(char c, Sighting& sighting) const
    {
        const __m128i wanted = _mm_set1_epi8(c);
        for (const __m128i part : bytes_)
            sighting.seen = _mm_or_si128(sighting.seen, _mm_cmpeq_epi8(part, wanted));
    }
    [[nodiscard]] static bool Seen(const Sighting& sighting)
    {
        return _mm_movemask_epi8(sighting.seen) != 0;
    }

private:
    __m128i bytes_[4];
#else
    explicit Chunk(const char* at) : at_(at) {}

    [[nodiscard]] std::uint64_t Where(char c) const
    {
        std::uint64_t bits = 0;
        for (std::size_t i = 0; i < size; ++i)
            bits |= std::uint64_t{at_[i] == c} << i;
        return bits;
    }

    struct Sighting {
        std::uint64_t seen = 0;
    };
    void Look_For(char c, Sighting& sighting) const
    {
        sighting.seen |= Where(c);
    }
    [[nodiscard]] static bool Seen(const Sighting& sighting)
    {
        return sighting.seen != 0;
    }

private:
    const char* at_;
#endif
};

/// Calls `look` with each 64 bytes of `text`, their offset, and the bits that count; the last ones
/// are copied, so that nothing behind the text is read.
template <class Look> void For_Each_Chunk(std::string_view text, Look look)
{
    std::size_t at = 0;
    for (; at + Chunk::size <= text.size(); at += Chunk::size)
        look(Chunk(text.data() + at), at, ~std::uint64_t{0});
    const std::size_t left = text.size() - at;
    if (left == 0)
        return;
    char tail[Chunk::size];
    std::memset(tail, ' ', sizeof tail);
    std::memcpy(tail, text.data() + at, left);
    look(Chunk(tail), at, (std::uint64_t{1} << left) - 1);
}

}  // namespace

Byte_Finder::Byte_Finder(std::string_view members) : members_(members)
{
    for (const char c : members)
        holds_[static_cast<unsigned char>(c)] = true;
}

std::size_t Byte_Finder::Find_All(std::string_view text, std::uint32_t* offsets) const
{
    const std::uint32_t* const start = offsets;
    For_Each_Chunk(text, [&](const Chunk& chunk, std::size_t at, std::uint64_t counting) {
        std::uint64_t bits = 0;
        for (const char c : members_)
            bits |= chunk.Where(c);
        for (bits &= counting; bits != 0; bits &= bits - 1)
            *offsets++ = static_cast<std::uint32_t>(at) + static_cast<std::uint32_t>(std::countr_zero(bits));
    });
    return static_cast<std::size_t>(offsets - start);
}

namespace {

/// The places of line ends, gathered chunk by chunk; what the last chunk ended with is carried on.
class Line_End_Counter {
public:
    explicit Line_End_Counter(Text_Facts& facts) : facts_(facts) {}

    void Take(std::uint64_t feeds, std::uint64_t returns, std::size_t at)
    {
        const std::uint64_t behind_feed = feeds << 1 | feed_;
        const std::uint64_t blank_returns = returns & behind_feed;
        empty_ |= feeds & (behind_feed | blank_returns << 1 | blank_return_);
        if (feeds != 0)
            Measure_Line(feeds, at);
        facts_.line_feeds += Count_Bits(feeds);
        facts_.returns += Count_Bits(returns);
        facts_.return_feeds += Count_Bits(feeds & (returns << 1 | return_));
        feed_ = feeds >> 63;
        return_ = returns >> 63;
        blank_return_ = blank_returns >> 63;
    }

    void Finish(std::size_t size)
    {
        facts_.longest_line = std::max(facts_.longest_line, size - line_start_);
        facts_.empty_lines = empty_ != 0;
    }

private:
    /// Few bits are set: line ends are far apart.
    static std::int64_t Count_Bits(std::uint64_t bits)
    {
        std::int64_t count = 0;
        for (; bits != 0; bits &= bits - 1)
            ++count;
        return count;
    }

    void Measure_Line(std::uint64_t feeds, std::size_t at)
    {
        const auto first = at + static_cast<std::size_t>(std::countr_zero(feeds));
        facts_.longest_line = std::max(facts_.longest_line, first - line_start_);
        line_start_ = at + 64 - static_cast<std::size_t>(std::countl_zero(feeds));
    }

    Text_Facts& facts_;
    std::size_t line_start_ = 0;
    std::uint64_t feed_ = 1;  // a line end stands, as it were, in front of the text
    std::uint64_t return_ = 0;
    std::uint64_t blank_return_ = 0;
    std::uint64_t empty_ = 0;
};

}  // namespace

Text_Facts Look_At_Text(std::string_view text)
{
    Text_Facts facts;
    Line_End_Counter line_ends(facts);
    Chunk::Sighting nuls;
    Chunk::Sighting tabs;
    Chunk::Sighting commas;
    Chunk::Sighting double_quotes;
    Chunk::Sighting single_quotes;
    For_Each_Chunk(text, [&](const Chunk& chunk, std::size_t at, std::uint64_t) {
        line_ends.Take(chunk.Where('\n'), chunk.Where('\r'), at);
        chunk.Look_For('\0', nuls);
        chunk.Look_For('\t', tabs);
        chunk.Look_For(',', commas);
        chunk.Look_For('"', double_quotes);
        chunk.Look_For('\'', single_quotes);
    });
    line_ends.Finish(text.size());
    facts.nuls = Chunk::Seen(nuls);
    facts.tabs = Chunk::Seen(tabs);
    facts.commas = Chunk::Seen(commas);
    facts.double_quotes = Chunk::Seen(double_quotes);
    facts.single_quotes = Chunk::Seen(single_quotes);
    return facts;
}

}  // namespace ingester

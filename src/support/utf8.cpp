#include "support/utf8.h"

#include <array>
#include <initializer_list>

namespace ingester {

namespace {

/// What may come next, each as the place of its six bits in a word of the table: `malformed` is a step to
/// itself, whatever comes.
enum State : std::uint8_t {
    malformed = 0,
    between = 6,  ///< a letter may begin
    one_more = 12,
    two_more = 18,
    three_more = 24,
    behind_e0 = 30,  ///< overlong below A0
    behind_ed = 36,  ///< a surrogate from A0 on
    behind_f0 = 42,  ///< overlong below 90
    behind_f4 = 48,  ///< beyond the last character from 90 on
};

using Steps = std::array<std::uint64_t, 256>;

constexpr void Add_Steps(Steps& steps, unsigned first, unsigned last, State from, State to)
{
    for (unsigned byte = first; byte <= last; ++byte)
        steps[byte] |= std::uint64_t{to} << from;
}

constexpr Steps Make_Steps()
{
    struct Lead {
        unsigned first, last;
        State to;
    };
    constexpr Lead leads[] = {
        {0x00, 0x7F, between},   {0xC2, 0xDF, one_more},   {0xE0, 0xE0, behind_e0},
        {0xE1, 0xEC, two_more},  {0xED, 0xED, behind_ed},  {0xEE, 0xEF, two_more},
        {0xF0, 0xF0, behind_f0}, {0xF1, 0xF3, three_more}, {0xF4, 0xF4, behind_f4},
    };
    Steps steps{};
    for (const Lead& lead : leads)
        Add_Steps(steps, lead.first, lead.last, between, lead.to);
    Add_Steps(steps, 0x80, 0xBF, one_more, between);
    Add_Steps(steps, 0x80, 0xBF, two_more, one_more);
    Add_Steps(steps, 0x80, 0xBF, three_more, two_more);
    Add_Steps(steps, 0xA0, 0xBF, behind_e0, one_more);
    Add_Steps(steps, 0x80, 0x9F, behind_ed, one_more);
    Add_Steps(steps, 0x90, 0xBF, behind_f0, two_more);
    Add_Steps(steps, 0x80, 0x8F, behind_f4, two_more);
    return steps;
}

constexpr Steps Next_States = Make_Steps();

inline __attribute__((always_inline)) std::uint64_t Step(char c, std::uint64_t state)
{
    return Next_States[static_cast<unsigned char>(c)] >> (state & 63U);
}

/// The state behind a text. One look-up and one shift a byte; the shifts wait for each other, so that two
/// halves, of which the second begins with a letter, are walked at once.
inline __attribute__((always_inline)) std::uint64_t Walk_Bytes(std::string_view text, std::uint64_t state)
{
    std::size_t half = text.size() / 2;
    while (half > 0 && Goes_On(text[half]))
        --half;
    std::uint64_t second = between;
    for (std::size_t i = 0; i < half; ++i) {
        state = Step(text[i], state);
        second = Step(text[half + i], second);
    }
    if (half > 0 && (state & 63U) != between)
        return malformed;
    state = half > 0 ? second : state;
    for (const char c : text.substr(2 * half))
        state = Step(c, state);
    return state & 63U;
}

std::uint64_t Walk_Plainly(std::string_view text, std::uint64_t state)
{
    return Walk_Bytes(text, state);
}

#if defined(__x86_64__)
/// There shifts by any number take one step.
__attribute__((target("bmi2"))) std::uint64_t Walk_Fast(std::string_view text, std::uint64_t state)
{
    return Walk_Bytes(text, state);
}

const auto Walk = __builtin_cpu_supports("bmi2") ? Walk_Fast : Walk_Plainly;
#else
const auto Walk = Walk_Plainly;
#endif

}  // namespace

bool Utf8_Check::Take(std::string_view part)
{
    state_ = Walk(part, state_);
    return state_ != malformed;
}

bool Utf8_Check::Is_Whole() const
{
    return state_ == between;
}

bool Is_Utf8(std::string_view text)
{
    Utf8_Check check;
    return Is_Ascii(text) || (check.Take(text) && check.Is_Whole());
}

}  // namespace ingester

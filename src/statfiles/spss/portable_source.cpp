#include "statfiles/spss/portable_source.h"

#include "model/sheet.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cmath>
#include <cstring>
#include <limits>

namespace ingester {

namespace {

constexpr std::size_t Line_Length = 80;
constexpr std::size_t Buffer_Size = std::size_t{1} << 16;
constexpr std::int32_t Base = 30;

/// What a digit counts; -1 for what is none. Letters go on where digits end.
constexpr std::int32_t Digit_Of(char c)
{
    if (c >= '0' && c <= '9')
        return c - '0';
    return c >= 'A' && c <= 'Y' ? c - 'A' + 10 : -1;
}

/// 15 to powers that a word holds; the twos of 30 are shifts.
constexpr std::size_t Word_Powers = 16;
constexpr auto Powers_Of_15 = [] {
    std::array<std::uint64_t, Word_Powers + 1> powers{1};
    for (std::size_t i = 1; i <= Word_Powers; ++i)
        powers[i] = 15 * powers[i - 1];
    return powers;
}();

constexpr auto Digits = [] {
    std::array<std::int8_t, 256> digits{};
    for (std::size_t c = 0; c < digits.size(); ++c)
        digits[c] = static_cast<std::int8_t>(Digit_Of(static_cast<char>(c)));
    return digits;
}();

/// `mantissa` over 30 to the power of `power`, which is at most `Word_Powers`. Where a number has 64 bits one
/// division tells all bits of a double, unless it falls just between two of them.
double Quotient(std::uint64_t mantissa, std::size_t power)
{
    constexpr std::uint64_t bits_behind = 0x7FF;
    constexpr std::uint64_t just_between = 0x400;
    constexpr double powers_of_half[] = {0x1p0,   0x1p-1,  0x1p-2,  0x1p-3,  0x1p-4,  0x1p-5,
                                         0x1p-6,  0x1p-7,  0x1p-8,  0x1p-9,  0x1p-10, 0x1p-11,
                                         0x1p-12, 0x1p-13, 0x1p-14, 0x1p-15, 0x1p-16};
    if constexpr (std::numeric_limits<long double>::digits == 64) {
        const long double quotient =
            static_cast<long double>(mantissa) / static_cast<long double>(Powers_Of_15[power]);
        std::uint64_t bits;
        std::memcpy(&bits, &quotient, sizeof bits);
        if ((bits & bits_behind) != just_between) [[likely]]
            return static_cast<double>(quotient) * powers_of_half[power];
    }
    return Portable_Number(mantissa, -static_cast<std::int64_t>(power));
}

}  // namespace

// --- Characters --------------------------------------------------------------------------------------

/// Takes a piece of a line, and its end where that is found in it.
void Portable_Source::Take_Piece()
{
    constexpr std::size_t longest_piece = 128;
    const char* const start = buffer_.data() + buffer_at_;
    const std::size_t length = std::min({buffer_end_ - buffer_at_, Buffer_Size - end_, longest_piece});
    const void* const feed = std::memchr(start, '\n', length);
    std::size_t piece =
        feed == nullptr ? length : static_cast<std::size_t>(static_cast<const char*>(feed) - start);
    if (const void* const back = std::memchr(start, '\r', piece); back != nullptr)
        piece = static_cast<std::size_t>(static_cast<const char*>(back) - start);
    std::memcpy(line_.data() + end_, start, piece);
    end_ += piece;
    line_length_ += piece;
    buffer_at_ += piece;
    if (piece == length)
        return;
    ++buffer_at_;
    const bool second_half = start[piece] == '\n' && behind_return_ && line_length_ == 0;
    behind_return_ = start[piece] == '\r';
    if (!second_half && line_length_ < Line_Length) {
        std::memset(line_.data() + end_, ' ', Line_Length - line_length_);
        end_ += Line_Length - line_length_;
    }
    line_length_ = 0;
}

/// Takes the file's next bytes, without line ends and with the blanks that they stand for.
bool Portable_Source::Fill()
{
    line_.resize(Buffer_Size + Line_Length);
    buffer_.resize(Buffer_Size);
    at_ = 0;
    end_ = 0;
    while (end_ < Buffer_Size) {
        if (buffer_at_ == buffer_end_) {
            buffer_at_ = 0;
            buffer_end_ = file_->Read(buffer_.data(), buffer_.size());
            if (buffer_end_ == 0)
                break;
        }
        Take_Piece();
    }
    return end_ > 0;
}

std::string_view Portable_Source::Next_Piece()
{
    if (at_ == end_ && !Fill()) {
        ended_ = true;
        return {};
    }
    const std::string_view piece(line_.data() + at_, end_ - at_);
    at_ = end_;
    return piece;
}

std::string Portable_Source::Next_Text(std::size_t count)
{
    std::string text;
    for (; count > 0; --count) {
        const char c = Next();
        if (ended_)
            break;
        text += c;
    }
    return text;
}

char Portable_Source::Portable_Char()
{
    const char c = Next();
    ended_ = ended_ || c == 'Z';
    return c;
}

char Portable_Source::Next_Of_Number()
{
    char c = Next();
    while (c == ' ' && !ended_)
        c = Next();
    ended_ = ended_ || c == 'Z';
    return c;
}

// --- Numbers -----------------------------------------------------------------------------------------

bool Portable_Source::Portable_Int(std::int32_t& value)
{
    constexpr int most_characters = 9;
    constexpr std::int32_t missing = -32767;
    std::int64_t number = 0;
    bool negative = false;
    for (int taken = 0; taken < most_characters; ++taken) {
        const char c = Next_Of_Number();
        if (ended_)
            return false;
        if (c == '/')
            break;
        if (c == '*') {
            static_cast<void>(Next());
            value = missing;
            return true;
        }
        const std::int32_t digit = Digit_Of(c);
        if (digit < 0 && c != '-')
            return false;
        negative = negative || c == '-';
        number = digit < 0 ? number : number * Base + digit;
    }
    constexpr std::int64_t greatest = std::numeric_limits<std::int32_t>::max();
    value = static_cast<std::int32_t>(std::min(number, greatest)) * (negative ? -1 : 1);
    return true;
}

/// The quick road: up to twelve digits, a point among them, and the end, with no line end or blank between.
bool Portable_Source::Usual_Real(double& value)
{
    constexpr std::size_t longest = 16;
    constexpr std::size_t most_digits = 12;
    if (end_ - at_ < longest)
        return false;
    const char* c = line_.data() + at_;
    const bool negative = *c == '-';
    c += negative ? 1 : 0;
    std::uint64_t mantissa = 0;
    std::size_t digits = 0;
    std::size_t in_front = most_digits + 1;  // of the point
    for (; digits <= most_digits; ++c) {
        const std::int32_t digit = Digits[static_cast<unsigned char>(*c)];
        if (digit >= 0) [[likely]] {
            mantissa = mantissa * Base + static_cast<std::uint64_t>(digit);
            ++digits;
        } else if (*c == '.' && in_front > most_digits) {
            in_front = digits;
        } else {
            break;
        }
    }
    if (*c != '/' || digits > most_digits || digits == 0)
        return false;
    at_ = static_cast<std::size_t>(c + 1 - line_.data());
    value = Quotient(mantissa, in_front > most_digits ? 0 : digits - in_front);
    value = negative ? -value : value;
    return true;
}

bool Portable_Source::Portable_Real(double& value)
{
    if (Usual_Real(value)) [[likely]]
        return true;
    constexpr int most_characters = 24;
    Portable_Mantissa mantissa = 0;
    std::int64_t fraction_digits = 0;
    std::int64_t exponent = 0;
    bool negative = false;
    bool in_fraction = false;
    int exponent_sign = 0;
    for (int taken = 0; taken < most_characters; ++taken) {
        const char c = Next_Of_Number();
        if (ended_)
            return false;
        if (const std::int32_t digit = Digit_Of(c); digit >= 0) {
            if (exponent_sign != 0) {
                exponent = std::min<std::int64_t>(exponent * Base + digit, std::int64_t{1} << 32);
            } else {
                mantissa = mantissa * Base + static_cast<unsigned>(digit);
                fraction_digits += in_fraction ? 1 : 0;
            }
        } else if (c == '/') {
            break;
        } else if (c == '*') {
            static_cast<void>(Next());
            value = Missing_Value;
            return true;
        } else if (c == '.') {
            in_fraction = true;
        } else if (c == '-' && taken == 0) {
            negative = true;
        } else if (c == '+' || c == '-') {
            exponent_sign = c == '+' ? 1 : -1;
        } else {
            return false;
        }
    }
    value = Portable_Number(mantissa, exponent_sign * exponent - fraction_digits);
    if (negative)
        value = -value;
    return true;
}

namespace {

constexpr int Wide_Bits = 128;

int Bits_Of(Portable_Mantissa number)
{
    const auto high = static_cast<std::uint64_t>(number >> 64);
    return high != 0 ? Wide_Bits - std::countl_zero(high)
                     : 64 - std::countl_zero(static_cast<std::uint64_t>(number));
}

/// More digits than 128 bits hold, the least first. Only the first bits and whether any follow matter.
class Long_Number {
public:
    explicit Long_Number(Portable_Mantissa number)
    {
        for (; number != 0; number >>= 32)
            words_.push_back(static_cast<std::uint32_t>(number));
    }
    void Multiply(std::uint32_t factor)
    {
        std::uint64_t carry = 0;
        for (std::uint32_t& word : words_) {
            carry += std::uint64_t{word} * factor;
            word = static_cast<std::uint32_t>(carry);
            carry >>= 32;
        }
        if (carry != 0)
            words_.push_back(static_cast<std::uint32_t>(carry));
    }
    void Divide(std::uint32_t divisor)
    {
        std::uint64_t rest = 0;
        for (std::size_t i = words_.size(); i-- > 0;) {
            rest = rest << 32 | words_[i];
            words_[i] = static_cast<std::uint32_t>(rest / divisor);
            rest %= divisor;
        }
        inexact_ = inexact_ || rest != 0;
        while (!words_.empty() && words_.back() == 0)
            words_.pop_back();
    }
    void Shift_Words(std::size_t words) { words_.insert(words_.begin(), words, 0); }

    /// The number times 2 to the power of `exponent`, rounded once.
    [[nodiscard]] double Rounded(std::int64_t exponent) const
    {
        constexpr std::size_t kept = 4;
        Portable_Mantissa first = 0;
        const std::size_t dropped = words_.size() > kept ? words_.size() - kept : 0;
        for (std::size_t i = words_.size(); i-- > dropped;)
            first = first << 32 | words_[i];
        const bool more =
            inexact_
            || std::any_of(words_.begin(), words_.begin() + static_cast<std::ptrdiff_t>(dropped),
                           [](std::uint32_t word) { return word != 0; });
        if (more)
            first |= 1;
        return std::ldexp(static_cast<double>(first),
                          static_cast<int>(exponent + 32 * static_cast<std::int64_t>(dropped)));
    }

private:
    std::vector<std::uint32_t> words_;
    bool inexact_ = false;
};

double Long_Product(Portable_Mantissa mantissa, std::int64_t exponent)
{
    constexpr std::size_t bits_of_word = 32;
    constexpr std::size_t bits_of_15 = 4;
    Long_Number number(mantissa);
    if (exponent >= 0) {
        for (std::int64_t i = 0; i < exponent; ++i)
            number.Multiply(15);
        return number.Rounded(exponent);
    }
    // So many zeros go behind that enough bits are left in front of the point.
    const std::size_t words = (static_cast<std::size_t>(-exponent) * bits_of_15 + Wide_Bits) / bits_of_word;
    number.Shift_Words(words);
    for (std::int64_t i = 0; i < -exponent; ++i)
        number.Divide(15);
    return number.Rounded(exponent - static_cast<std::int64_t>(bits_of_word * words));
}

}  // namespace

double Portable_Number(Portable_Mantissa mantissa, std::int64_t exponent)
{
    constexpr std::int64_t beyond_doubles = 300;
    if (mantissa == 0)
        return 0;
    if (exponent > beyond_doubles)
        return std::numeric_limits<double>::infinity();
    if (exponent < -beyond_doubles)
        return 0;
    const auto power = static_cast<std::size_t>(std::abs(exponent));
    if (power > Word_Powers)
        return Long_Product(mantissa, exponent);
    const std::uint64_t factor = Powers_Of_15[power];
    const auto shift = static_cast<int>(exponent);
    if (exponent >= 0)
        return Bits_Of(mantissa) + Bits_Of(factor) <= Wide_Bits
                   ? std::ldexp(static_cast<double>(mantissa * factor), shift)
                   : Long_Product(mantissa, exponent);
    const int room = Wide_Bits - Bits_Of(mantissa);
    const Portable_Mantissa wide = mantissa << room;
    Portable_Mantissa quotient = wide / factor;
    if (quotient * factor != wide)
        quotient |= 1;  // far behind the last bit of a double, so that rounding sees that more follows
    return std::ldexp(static_cast<double>(quotient), shift - room);
}

// --- Texts -------------------------------------------------------------------------------------------

bool Portable_Source::Portable_String(std::string& text, std::size_t most)
{
    std::int32_t length;
    text.clear();
    if (!Portable_Int(length) || length < 0)
        return false;
    for (auto left = static_cast<std::size_t>(length); left > 0;) {
        if (at_ == end_ && !Fill()) {
            ended_ = true;
            return false;
        }
        const std::size_t piece = std::min(left, end_ - at_);
        text.append(line_.data() + at_, std::min(piece, most - std::min(most, text.size())));
        at_ += piece;
        left -= piece;
    }
    return true;
}

}  // namespace ingester

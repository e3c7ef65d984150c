// Numbers against the C library's, on very many of each kind. Seeds are fixed.
#include "support/number_text.h"

#include "support/text.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <bit>
#include <cerrno>
#include <charconv>
#include <cmath>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <random>
#include <string>

namespace ingester {
namespace {

using namespace std::string_view_literals;
using Random = std::mt19937_64;

/// Doubles as they come in files, and as they hurt: any bits, decimals, powers of ten and their
/// neighbours, halves at every scale.
double Random_Double(Random& random)
{
    const auto what = random() % 4;
    const int power = static_cast<int>(random() % 36) - 18;
    const auto decimal = static_cast<double>(random() >> (1 + random() % 62));
    double value = std::bit_cast<double>(random());
    if (what == 1)
        value = std::strtod(Format_Text("-%.0fe%i", decimal, power).c_str(), nullptr);
    else if (what == 2)
        value = std::nextafter(std::pow(10.0, power), random() % 2 == 0 ? 0.0 : HUGE_VAL);
    else if (what == 3 || !std::isfinite(value))
        value = std::ldexp(decimal + 0.5, power);
    return value;
}

TEST(Number_Text, Prints_As_The_C_Library_Does)
{
    Random random(1);
    char mine[Number_Text_Room];
    const std::pair<decltype(&Print_General), const char*> ways[] = {
        {Print_General, "%.*g"}, {Print_Fixed, "%.*f"}, {Print_Exponent, "%.*e"}};
    for (int i = 0; i < 1000000; ++i) {
        const double value = Random_Double(random);
        const auto& [print, format] = ways[random() % 2 * (random() % 3)];
        const auto most = i % 2 == 0 ? 18U : 41U;  // usual ones, and all that are asked for
        const int digits = std::max(static_cast<int>(random() % most), print == Print_General ? 1 : 0);
        const std::string_view printed(mine, static_cast<std::size_t>(print(mine, value, digits) - mine));
        ASSERT_EQ(printed, Format_Text(format, digits, value)) << format << " of " << digits << " digits";
    }
}

/// The number at the start of `text`, as the C library takes it.
Parsed_Number Parse_Plainly(const std::string& text)
{
    const std::string decimal = text.substr(0, text.find_first_of("xX"));
    const char* const first = decimal.c_str();
    const char* const number = *first == '+' || *first == '-' ? first + 1 : first;
    if (!Is_Digit(*number) && *number != '.')
        return {text.c_str(), 0.0, Number_Status::none};  // neither blanks nor "inf" and "nan"
    char* end;
    errno = 0;
    const double value = std::strtod(first, &end);
    const bool beyond = std::isinf(value) || (value == 0.0 && errno == ERANGE);
    return {text.c_str() + (end - first), beyond ? 0.0 : value,
            end == first ? Number_Status::none
            : beyond     ? Number_Status::out_of_range
                         : Number_Status::good};
}

std::string Random_Text(Random& random)
{
    constexpr std::string_view junk = "0123456789012345678900009999..++--eeEE *,naifxX\t\0"sv;
    if (random() % 4 == 0)
        return Format_Text("%.*g", 1 + static_cast<int>(random() % 20), Random_Double(random));
    // Either characters at random, or digits with a point and perhaps an exponent; a few very long.
    const bool tidy = random() % 2 == 0;
    std::string text(random() % (random() % 50 == 0 ? 400 : 26), '0');
    for (char& c : text)
        c = junk[random() % (tidy ? 20 : junk.size())];
    if (tidy) {
        text.insert(random() % (text.size() + 1), ".");
        text += random() % 2 == 0 ? Format_Text("e%i", static_cast<int>(random() % 700) - 350) : "";
    }
    return text;
}

/// Where a number ends, and what it is to the bit.
std::string Told(const Parsed_Number& number, const char* first)
{
    return Format_Text("%td %i %a", number.end - first, static_cast<int>(number.status), number.value);
}

TEST(Number_Text, Parses_As_The_C_Library_Does)
{
    Random random(2);
    constexpr std::size_t room = 600;
    const auto buffer = std::make_unique<char[]>(room);  // its end is watched by the sanitizers
    for (int i = 0; i < 1000000; ++i) {
        const std::string text = Random_Text(random);
        const std::string expected = Told(Parse_Plainly(text), text.c_str());
        char* const end = buffer.get() + room;
        char* const alone = end - text.size();
        std::memcpy(alone, text.data(), text.size());
        ASSERT_EQ(Told(Parse_Number(alone, end), alone), expected) << text;
        char* const amid = alone - Readable_Behind;
        std::memcpy(amid, text.data(), text.size());
        std::memset(amid + text.size(), '0' + static_cast<int>(random() % 10), Readable_Behind);
        amid[text.size()] = ",;\t\n\"\0 x"[random() % 8];
        Parsed_Number usual{amid + text.size(), 0.0, Number_Status::good};
        if (Parse_Usual_Number(amid, usual.end, usual.value)) {
            ASSERT_EQ(Told(usual, amid), expected) << text;
        }
    }
    EXPECT_EQ(Parse_Number(nullptr, nullptr).status, Number_Status::none);
}

/// Without the exponent and the zeros at either end.
std::size_t Digits_In(std::string text)
{
    text.resize(std::min(text.find('e'), text.size()));
    std::erase_if(text, [](char c) { return !Is_Digit(c); });
    const std::size_t first = text.find_first_not_of('0');
    return first == text.npos ? 0 : text.find_last_not_of('0') + 1 - first;
}

TEST(Number_Text, Prints_No_More_Digits_Than_Are_Read_Back)
{
    Random random(3);
    for (int i = 0; i < 300000; ++i) {
        double value = std::bit_cast<double>(random());
        if (i % 3 > 0)  // with few digits, or one step beside such a number
            value =
                static_cast<double>(random() % 1000000000) / std::pow(10, static_cast<double>(random() % 12));
        if (i % 3 > 1)
            value = std::nextafter(value, 0);
        if (!std::isfinite(value))
            continue;
        char text[Number_Text_Room + 1] = {};
        char* const end = Print_Shortest(text, value);
        ASSERT_EQ(std::strtod(text, nullptr), value) << text;
        char least[Number_Text_Room];
        const auto shortest = std::to_chars(least, std::end(least), value, std::chars_format::scientific);
        ASSERT_TRUE(std::fabs(value) >= 1e15 || Digits_In({text, end}) <= Digits_In({least, shortest.ptr}))
            << text;
    }
}

}  // namespace
}  // namespace ingester

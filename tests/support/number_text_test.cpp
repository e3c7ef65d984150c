// Numbers against the C library's, on very many of each kind. Seeds are fixed.
#include "support/number_text.h"

#include "support/text.h"

#include <gtest/gtest.h>

#include <bit>
#include <cmath>
#include <cstdio>
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
    double value = 0.0;
    const int power = static_cast<int>(random() % 36) - 18;
    const auto decimal = static_cast<double>(random() >> (1 + random() % 62));
    switch (random() % 4) {
    case 0:
        do
            value = std::bit_cast<double>(random());
        while (!std::isfinite(value));
        return value;
    case 1:
        value = std::strtod(Format_Text("%.0fe%i", decimal, power).c_str(), nullptr);
        break;
    case 2:
        value = std::pow(10.0, power);
        for (auto steps = static_cast<int>(random() % 3); steps > 0; --steps)
            value = std::nextafter(value, random() % 2 == 0 ? 0.0 : HUGE_VAL);
        break;
    default:
        value = std::ldexp(decimal + 0.5, static_cast<int>(random() % 20) - 16);
    }
    return random() % 2 == 0 ? value : -value;
}

TEST(Number_Text, Prints_As_The_C_Library_Does)
{
    Random random(1);
    char mine[Number_Text_Room];
    char theirs[Number_Text_Room];
    struct Way {
        char* (*print)(char* target, double value, int digits);
        const char* format;
        int least, most;
    };
    const Way ways[] = {{Print_General, "%.*g", 1, 17},
                        {Print_General, "%.*g", 1, 40},
                        {Print_Fixed, "%.*f", 0, 40},
                        {Print_Exponent, "%.*e", 0, 40}};
    for (int i = 0; i < 1000000; ++i) {
        const double value = Random_Double(random);
        const Way& way = ways[i % 4 < 2 ? 0 : random() % 4];
        const int digits =
            way.least + static_cast<int>(random() % static_cast<unsigned>(way.most + 1 - way.least));
        const std::string_view printed(mine, static_cast<std::size_t>(way.print(mine, value, digits) - mine));
        std::snprintf(theirs, sizeof theirs, way.format, digits, value);
        ASSERT_EQ(printed, theirs) << way.format << " of " << digits << " digits";
    }
}

const char* Skip_Digits(const char* at)
{
    while (Is_Digit(*at))
        ++at;
    return at;
}

/// The number at the start of `text` by its grammar alone, with the C library's value for it.
Parsed_Number Parse_Plainly(const std::string& text)
{
    const char* const first = text.c_str();
    const char* const whole = *first == '+' || *first == '-' ? first + 1 : first;
    const char* end = Skip_Digits(whole);
    auto digits = end - whole;
    if (*end == '.') {
        const char* const fraction = end + 1;
        end = Skip_Digits(fraction);
        digits += end - fraction;
    }
    if (digits == 0)
        return {first, 0.0, Number_Status::none};
    const bool nonzero = std::string_view(whole, end).find_first_of("123456789") != std::string_view::npos;
    if (*end == 'e' || *end == 'E') {
        const char* const power = end[1] == '+' || end[1] == '-' ? end + 2 : end + 1;
        if (Is_Digit(*power))
            end = Skip_Digits(power);
    }
    const double value = std::strtod(std::string(first, end).c_str(), nullptr);
    if (std::isinf(value) || (value == 0.0 && nonzero))
        return {end, 0.0, Number_Status::out_of_range};
    return {end, value, Number_Status::good};
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

TEST(Number_Text, Parses_As_The_C_Library_Does)
{
    Random random(2);
    constexpr std::size_t room = 600;
    const auto buffer = std::make_unique<char[]>(room);  // its end is watched by the sanitizers
    for (int i = 0; i < 1000000; ++i) {
        const std::string text = Random_Text(random);
        const Parsed_Number expected = Parse_Plainly(text);
        const auto expect_same = [&](const Parsed_Number& parsed, const char* first) {
            ASSERT_EQ(parsed.end - first, expected.end - text.c_str()) << "'" << text << "'";
            ASSERT_EQ(parsed.status, expected.status) << "'" << text << "'";
            ASSERT_EQ(std::bit_cast<std::uint64_t>(parsed.value),
                      std::bit_cast<std::uint64_t>(expected.value))
                << "'" << text << "'";
        };
        char* const end = buffer.get() + room;
        char* const alone = end - text.size();
        std::memcpy(alone, text.data(), text.size());
        expect_same(Parse_Number(alone, end), alone);
        char* const amid = alone - Readable_Behind;
        std::memcpy(amid, text.data(), text.size());
        std::memset(amid + text.size(), '0' + static_cast<int>(random() % 10), Readable_Behind);
        amid[text.size()] = ",;\t\n\"\0 x"[random() % 8];
        double value;
        if (Parse_Usual_Number(amid, amid + text.size(), value))
            expect_same({amid + text.size(), value, Number_Status::good}, amid);
        if (HasFatalFailure())
            return;
    }
    EXPECT_EQ(Parse_Number(nullptr, nullptr).status, Number_Status::none);
}

}  // namespace
}  // namespace ingester

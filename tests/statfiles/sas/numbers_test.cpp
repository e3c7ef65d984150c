// The numbers of transport files against bytes worked out by hand.
#include "statfiles/sas/sas_numbers.h"

#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <random>
#include <string>

namespace ingester {

namespace {

std::string Stored(double number)
{
    std::array<std::byte, 8> bytes;
    Double_To_Ibm(number, bytes.data());
    std::string text;
    for (const std::byte byte : bytes)
        text += "0123456789ABCDEF"[std::to_integer<int>(byte) >> 4],
            text += "0123456789ABCDEF"[std::to_integer<int>(byte) & 15];
    return text;
}

std::int32_t Read(std::uint64_t stored, double& number)
{
    std::array<std::byte, 8> bytes;
    Put_Number<std::uint64_t, std::endian::big>(bytes.data(), stored);
    return Ibm_To_Double(bytes.data(), number);
}

TEST(Sas_Numbers, Are_Stored_As_Worked_Out)
{
    EXPECT_EQ(Stored(1), "4110000000000000");
    EXPECT_EQ(Stored(-118.625), "C276A00000000000");
    EXPECT_EQ(Stored(0.1), "401999999999999A");
    EXPECT_EQ(Stored(7.2e75), "7FFFFFFFFFFFFFFF");
    EXPECT_EQ(Stored(1e76), "7FFFFFFFFFFFFFFF");
    EXPECT_EQ(Stored(1e-80), "FFFFFFFFFFFFFFFF");
    EXPECT_EQ(Stored(0), "0000000000000000");
    EXPECT_EQ(Stored(-0.0), "0000000000000000");
    EXPECT_EQ(Stored(0x1p-260), "0010000000000000");
    EXPECT_EQ(Stored(0x1p248), "7F10000000000000");
    EXPECT_EQ(Stored(Sas_Missing_Number('.')), "2E00000000000000");
    EXPECT_EQ(Stored(Sas_Missing_Number('Q')), "5100000000000000");
    EXPECT_EQ(Stored(Sas_Missing_Number(0xD2)), "6D00000000000000");
}

TEST(Sas_Numbers, Come_Back_Exactly)
{
    std::mt19937_64 random(5);
    double number = 0;
    for (int i = 0; i < 300000; ++i) {
        const double fraction = 1 + std::ldexp(static_cast<double>(random() >> 12), -52);
        const double value =
            std::ldexp(random() % 2 == 0 ? fraction : -fraction, static_cast<int>(random() % 508) - 259);
        std::array<std::byte, 8> bytes;
        Double_To_Ibm(value, bytes.data());
        ASSERT_EQ(Ibm_To_Double(bytes.data(), number), 1);
        ASSERT_EQ(number, value);
    }
}

TEST(Sas_Numbers, Odd_Forms)
{
    const struct {
        std::uint64_t stored;
        std::int32_t result;
        double number;
    } cases[] = {
        {0, 1, 0},
        {0xFFFFFFFFFFFFFFFF, 0, 0},
        {0x7FFFFFFFFFFFFFFF, 0, NAN},
        {0x0010000000000000, 0, NAN},
        {0x8010000000000000, 0, NAN},
        {0x2E00000000000000, 1, NAN},
        {0x5F00000000000000, 1, NAN},
        {0x4101000000000000, 1, 1.0 / 16},  // its first digit is 0
        {0xC100000000000001, 1, -0x1p-52},
        {0x41FFFFFFFFFFFFFF, 1, 0x1.FFFFFFFFFFFFFp3},  // bits beyond a double's are cut
    };
    for (const auto& tried : cases) {
        double number = 5;
        EXPECT_EQ(Read(tried.stored, number), tried.result) << std::hex << tried.stored;
        EXPECT_TRUE(number == tried.number || (number != number && tried.number != tried.number))
            << std::hex << tried.stored << " " << number;
    }
}

}  // namespace

}  // namespace ingester

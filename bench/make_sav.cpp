// Makes system files for the benchmarks: the same bytes for the same arguments.

#include <array>
#include <bit>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <random>
#include <string>
#include <string_view>
#include <vector>

namespace {

struct Order {
    const char* name = nullptr;
    std::string form;  ///< plain, coded or uncounted
    long rows = 0, numbers = 0, texts = 0, labels = 0, distinct = 0;
};

std::FILE* file = nullptr;

template <class T> void Put(T value)
{
    std::fwrite(&value, sizeof value, 1, file);
}

void Put_Padded(std::string text, std::size_t width)
{
    text.resize(width, ' ');
    std::fwrite(text.data(), 1, width, file);
}

void Put_Words(std::initializer_list<std::int32_t> words)
{
    for (const std::int32_t word : words)
        Put(word);
}

void Put_Variable(std::int32_t type, const std::string& name)
{
    constexpr std::int32_t format = 5 << 16 | 8 << 8 | 2;
    Put_Words({2, type, 0, 0, format, format});
    Put_Padded(name, 8);
}

void Put_Labels(long count, std::int32_t slot)
{
    Put_Words({3, static_cast<std::int32_t>(count)});
    for (long i = 1; i <= count; ++i) {
        const std::string label = "label" + std::to_string(i);
        Put(static_cast<double>(i));
        Put(static_cast<std::uint8_t>(label.size()));
        Put_Padded(label, (label.size() + 8) / 8 * 8 - 1);
    }
    Put_Words({4, 1, slot});
}

/// Variables N1, N2, ... with long names, T1, T2, ... and, with `distinct`, L.
void Put_Dictionary(const Order& order)
{
    const auto slots =
        static_cast<std::int32_t>(order.numbers + 2 * order.texts + (order.distinct > 0 ? 1 : 0));
    std::fputs("$FL2", file);
    Put_Padded("@(#) SPSS DATA FILE", 60);
    Put_Words({2, slots, order.form == "coded" ? 1 : 0, 0,
               order.form == "uncounted" ? -1 : static_cast<std::int32_t>(order.rows)});
    Put(100.0);
    Put_Padded("", 84);
    std::string names;
    for (long i = 1; i <= order.numbers; ++i) {
        Put_Variable(0, "N" + std::to_string(i));
        names += "N" + std::to_string(i) + "=aLongNameOfANumber" + std::to_string(i) + "\t";
    }
    for (long i = 1; i <= order.texts; ++i) {
        Put_Variable(12, "T" + std::to_string(i));
        Put_Variable(-1, "");
    }
    if (order.distinct > 0)
        Put_Variable(0, "L");
    if (order.labels > 0)
        Put_Labels(order.labels, slots);
    Put_Words({7, 13, 1, static_cast<std::int32_t>(names.size())});
    std::fwrite(names.data(), 1, names.size(), file);
    Put_Words({999, 0});
}

/// The slots of one case, and the control byte of each in coded files.
struct Case {
    std::vector<std::array<char, 8>> slots;
    std::vector<std::uint8_t> codes;
};

void Add(Case& one, const void* bytes, std::uint8_t code)
{
    one.slots.emplace_back();
    std::memcpy(one.slots.back().data(), bytes, 8);
    one.codes.push_back(code);
}

void Fill(Case& one, const Order& order, long row, std::mt19937_64& random)
{
    constexpr std::uint8_t literal = 253;
    constexpr std::uint8_t bias = 100;
    static constexpr std::string_view words[] = {"alpha   ", "beta    ", "gamma   ", "delta   "};
    one = {};
    for (long i = 0; i < order.numbers; ++i) {
        const double number = static_cast<double>(random() >> 11) * 0x1p-53;
        Add(one, &number, literal);
    }
    for (long i = 0; i < order.texts; ++i) {
        char text[32];
        std::snprintf(text, sizeof text, "%08ld", row);
        Add(one, i % 2 == 0 ? words[random() % 4].data() : text, literal);
        Add(one, "        ", 254);
    }
    if (order.distinct > 0) {
        const double level = 1 + static_cast<double>(random() % static_cast<std::uint64_t>(order.distinct));
        Add(one, &level, level <= 100 ? static_cast<std::uint8_t>(level + bias) : literal);
    }
}

/// Control bytes of coded cases wait with their values until there are eight.
class Coded_Cases {
public:
    void Put_Case(const Case& one)
    {
        for (std::size_t i = 0; i < one.codes.size(); ++i) {
            codes_[used_++] = static_cast<char>(one.codes[i]);
            if (one.codes[i] == 253)
                values_.append(one.slots[i].data(), 8);
            if (used_ == codes_.size())
                Flush();
        }
    }
    void End()
    {
        if (used_ > 0)
            Flush();
    }

private:
    void Flush()
    {
        std::fwrite(codes_.data(), 1, codes_.size(), file);
        std::fwrite(values_.data(), 1, values_.size(), file);
        values_.clear();
        codes_.fill('\0');
        used_ = 0;
    }
    std::array<char, 8> codes_{};
    std::size_t used_ = 0;
    std::string values_;
};

void Put_Cases(const Order& order)
{
    std::mt19937_64 random(1);
    Coded_Cases coded;
    Case one;
    for (long row = 0; row < order.rows; ++row) {
        Fill(one, order, row, random);
        if (order.form == "coded")
            coded.Put_Case(one);
        else
            std::fwrite(one.slots.data(), 8, one.slots.size(), file);
    }
    coded.End();
}

}  // namespace

int main(int argc, char** argv)
{
    static_assert(std::endian::native == std::endian::little);
    constexpr int all = 8;
    if (argc != all) {
        std::fputs("usage: make_sav FILE plain|coded|uncounted ROWS NUMBERS TEXTS LABELS DISTINCT\n", stderr);
        return EXIT_FAILURE;
    }
    Order order{argv[1], argv[2]};
    long* const numbers[] = {&order.rows, &order.numbers, &order.texts, &order.labels, &order.distinct};
    for (int i = 3; i < all; ++i)
        *numbers[i - 3] = std::atol(argv[i]);
    file = std::fopen(order.name, "wb");
    if (file == nullptr)
        return EXIT_FAILURE;
    Put_Dictionary(order);
    Put_Cases(order);
    return std::fclose(file) == 0 ? EXIT_SUCCESS : EXIT_FAILURE;
}

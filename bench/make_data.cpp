// Makes tables of comma text for the benchmarks: the same bytes for the same arguments.

#include <array>
#include <charconv>
#include <cmath>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <string>
#include <string_view>
#include <vector>

namespace {

/// splitmix64: small, quick, and the same everywhere.
class Random {
public:
    explicit Random(std::uint64_t seed) : state_(seed) {}
    std::uint64_t Next()
    {
        std::uint64_t z = (state_ += 0x9E3779B97F4A7C15U);
        z = (z ^ (z >> 30)) * 0xBF58476D1CE4E5B9U;
        z = (z ^ (z >> 27)) * 0x94D049BB133111EBU;
        return z ^ (z >> 31);
    }
    /// A whole number from 0 to `count` - 1.
    std::uint64_t Below(std::uint64_t count) { return Next() % count; }
    bool Chance(std::uint64_t percent) { return Below(100) < percent; }
    /// From 0 to below 1, all 53 bits.
    double Unit() { return static_cast<double>(Next() >> 11) * 0x1p-53; }

private:
    std::uint64_t state_;
};

/// One large buffer in front of the file.
class Table_File {
public:
    explicit Table_File(const char* name) : file_(std::fopen(name, "wb")), buffer_(1 << 20) {}
    Table_File(const Table_File&) = delete;
    Table_File& operator=(const Table_File&) = delete;
    ~Table_File() { Close(); }

    [[nodiscard]] bool Is_Open() const { return file_ != nullptr; }

    void Put(std::string_view text)
    {
        std::memcpy(Room(text.size()), text.data(), text.size());
        used_ += text.size();
    }
    void Put(char c)
    {
        *Room(1) = c;
        ++used_;
    }
    template <class Number, class... Form> void Put_Number(Number number, Form... form)
    {
        constexpr std::size_t longest = 64;
        char* const place = Room(longest);
        used_ += static_cast<std::size_t>(std::to_chars(place, place + longest, number, form...).ptr - place);
    }

    bool Close()
    {
        if (file_ == nullptr)
            return false;
        Flush();
        const bool closed = std::fclose(file_) == 0;
        file_ = nullptr;
        return closed && whole_;
    }

private:
    char* Room(std::size_t count)
    {
        if (buffer_.size() - used_ < count)
            Flush();
        return buffer_.data() + used_;
    }
    void Flush()
    {
        whole_ = std::fwrite(buffer_.data(), 1, used_, file_) == used_ && whole_;
        used_ = 0;
    }

    std::FILE* file_;
    std::vector<char> buffer_;
    std::size_t used_ = 0;
    bool whole_ = true;
};

void Put_Letters(Table_File& file, Random& random, std::uint64_t least, std::uint64_t most)
{
    for (std::uint64_t left = least + random.Below(most - least + 1); left > 0; --left)
        file.Put(static_cast<char>('a' + random.Below(26)));
}

void Put_Fixed(Table_File& file, double value, int decimals)
{
    file.Put_Number(value, std::chars_format::fixed, decimals);
}

/// The kinds of number that tables of measurements hold, one after the other.
void Put_Measured_Number(Table_File& file, Random& random, std::int64_t row, std::int64_t column)
{
    switch (column % 10) {
    case 0:
        return file.Put_Number(row + 1);
    case 1:
        return file.Put_Number(random.Below(10000));
    case 2:
        return file.Put_Number(static_cast<std::int64_t>(random.Below(2000001)) - 1000000);
    case 3:
        return Put_Fixed(file, 1000 * random.Unit(), 2);
    case 4:
        return Put_Fixed(file, 200 * random.Unit() - 100, 4);
    case 5:
        return Put_Fixed(file, 100 * random.Unit(), 3);
    case 6:
        return file.Put_Number(random.Unit());
    case 7:
        return file.Put_Number(2e4 * random.Unit() - 1e4);
    case 8:
        return file.Put_Number(std::ldexp(random.Unit() + 0.5, static_cast<int>(random.Below(120)) - 60),
                               std::chars_format::scientific, 6);
    default:
        return Put_Fixed(file, 100 * random.Unit(), 1);
    }
}

constexpr std::size_t label_count = 40;
using Label_Table = std::array<std::string, label_count>;

/// Distinct labels of 25 to 40 characters.
Label_Table Make_Labels(Random& random)
{
    Label_Table labels;
    for (std::size_t i = 0; i < label_count; ++i) {
        std::string& label = labels[i];
        label = "Treatment " + std::to_string(i + 1) + " of ";
        const std::size_t size = 25 + random.Below(16);
        while (label.size() < size)
            label += static_cast<char>('a' + random.Below(26));
    }
    return labels;
}

void Put_Mixed_Cell(Table_File& file, Random& random, const Label_Table& labels, std::int64_t row,
                    std::int64_t column)
{
    switch (column % 8) {
    case 0:
        return file.Put_Number(row + 1);
    case 1:
        return random.Chance(5) ? void() : Put_Fixed(file, 500 * random.Unit(), 2);
    case 2:
        return random.Chance(10) ? void() : file.Put_Number(2 * random.Unit() - 1);
    case 3:
        return Put_Letters(file, random, 3, 8);
    case 4:
        return file.Put(labels[random.Below(label_count)]);
    case 5:
        file.Put('"');
        Put_Letters(file, random, 4, 10);
        file.Put(", ");
        Put_Letters(file, random, 3, 8);
        return file.Put('"');
    case 6:
        return random.Chance(20) ? void() : file.Put_Number(random.Below(100000));
    default:
        return random.Chance(2) ? void() : Put_Fixed(file, 60 * random.Unit() - 20, 3);
    }
}

void Put_Names(Table_File& file, std::int64_t columns)
{
    for (std::int64_t i = 0; i < columns; ++i) {
        file.Put(i == 0 ? "v" : ",v");
        file.Put_Number(i + 1);
    }
    file.Put('\n');
}

template <class Put_Cell>
void Put_Rows(Table_File& file, std::int64_t rows, std::int64_t columns, Put_Cell put_cell)
{
    Put_Names(file, columns);
    for (std::int64_t row = 0; row < rows; ++row) {
        for (std::int64_t column = 0; column < columns; ++column) {
            if (column > 0)
                file.Put(',');
            put_cell(row, column);
        }
        file.Put('\n');
    }
}

}  // namespace

int main(int count, char** arguments)
{
    if (count != 6) {
        std::fputs("usage: make_data numeric|mixed|wide|text ROWS COLUMNS SEED FILE\n", stderr);
        return 2;
    }
    const std::string_view kind = arguments[1];
    const std::int64_t rows = std::atoll(arguments[2]);
    const std::int64_t columns = std::atoll(arguments[3]);
    Random random(static_cast<std::uint64_t>(std::atoll(arguments[4])));
    Table_File file(arguments[5]);
    if (!file.Is_Open()) {
        std::perror(arguments[5]);
        return 1;
    }
    if (kind == "numeric" || kind == "wide") {
        Put_Rows(file, rows, columns, [&](std::int64_t row, std::int64_t column) {
            Put_Measured_Number(file, random, row, column);
        });
    } else if (kind == "mixed") {
        const Label_Table labels = Make_Labels(random);
        Put_Rows(file, rows, columns, [&](std::int64_t row, std::int64_t column) {
            Put_Mixed_Cell(file, random, labels, row, column);
        });
    } else if (kind == "text") {
        Put_Rows(file, rows, columns, [&](std::int64_t, std::int64_t) { Put_Letters(file, random, 8, 20); });
    } else {
        std::fprintf(stderr, "make_data: no kind is called '%s'\n", arguments[1]);
        return 2;
    }
    if (!file.Close()) {
        std::perror(arguments[5]);
        return 1;
    }
    return 0;
}

// A host in the test's process: it writes pass files, calls the export and reads the answers.
#pragma once

#include "ingester/ingester.h"
#include "support/request_fixture.h"

#include <algorithm>
#include <array>
#include <bit>

#include <unistd.h>

namespace ingester {

template <class T> std::string Little(T value)
{
    auto bytes = std::bit_cast<std::array<char, sizeof(T)>>(value);
    if constexpr (std::endian::native == std::endian::big)
        std::ranges::reverse(bytes);
    return {bytes.begin(), bytes.end()};
}

inline std::string Word(std::uint32_t word)
{
    return Little(word);
}

inline std::string Record(const std::string& text)
{
    return Word(0) + Word(static_cast<std::uint32_t>(text.size())) + text;
}

inline std::string Pass_Bytes(double count, const Texts& records)
{
    std::string bytes = Little(count);
    for (const std::string& record : records)
        bytes += Record(record);
    return bytes;
}

/// Files that this process has open.
inline int Descriptors()
{
    int count = 0;
    for (const auto& entry : std::filesystem::directory_iterator("/proc/self/fd"))
        count += entry.exists() ? 1 : 0;
    return count;
}

/// What came back: the status, -1 for no result file, and the messages, empty for no message file.
using Host_Answer = std::pair<int, std::string>;

/// Files are named by their place in the private folder, which is the temporary one as well.
class Host_Test : public Request_Test {
protected:
    [[nodiscard]] static std::string Stem() { return "IG" + std::to_string(::getpid()); }

    /// Takes the answer out of the files named `stem`.
    [[nodiscard]] Host_Answer Take_Answer(const std::string& stem, const std::string& result) const
    {
        const std::string bytes = Get(result);
        const bool whole = bytes.size() == 8 && bytes.substr(1) == std::string(7, '\0');
        const Host_Answer answer{whole ? bytes[0] : -1, Get(stem + ".ERR")};
        std::filesystem::remove(Path(result));
        std::filesystem::remove(Path(stem + ".ERR"));
        return answer;
    }

    [[nodiscard]] Host_Answer Call_With_Bytes(const std::string& bytes) const
    {
        Put(Stem() + ".inp", bytes);
        EXPECT_EQ(INGESTER("", "", 0, 0), 0);
        return Take_Answer(Stem(), Stem() + ".out");
    }

    [[nodiscard]] Host_Answer Call(const Texts& records) const
    {
        return Call_With_Bytes(Pass_Bytes(static_cast<double>(records.size()), records));
    }

    /// One conversion: the strings begin with names in the folder.
    [[nodiscard]] Host_Answer Convert(const std::string& input, const std::string& output) const
    {
        return Call({Request_Name(input), Request_Name(output)});
    }
};

}  // namespace ingester

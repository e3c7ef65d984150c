// A host in the test's process: it writes pass files, calls the export and reads the answers.
#pragma once

#include "ingester/ingester.h"
#include "support/request_fixture.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

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

inline std::string Record(std::string_view text)
{
    return Word(0) + Word(static_cast<std::uint32_t>(text.size())) + std::string(text);
}

inline std::string Pass_Bytes(double count, const std::vector<std::string>& records)
{
    std::string bytes = Little(count);
    for (const std::string& record : records)
        bytes += Record(record);
    return bytes;
}

/// What came back: status -1 for no result file, messages empty for no message file.
struct Host_Answer {
    int status = -1;
    std::string messages;
};

/// Files are named by their place in the private folder, which is the temporary one as well.
class Host_Test : public Request_Test {
protected:
    [[nodiscard]] static std::string Path(const std::string& name)
    {
        return std::string(std::getenv("TMPDIR")) + "/" + name;
    }

    /// As a request names it: no slash but those of the options in `name`.
    [[nodiscard]] static std::string Request_Name(const std::string& name)
    {
        std::string folder = Path("");
        std::ranges::replace(folder, '/', '\\');
        return folder + name;
    }

    [[nodiscard]] static std::string Stem() { return "IG" + std::to_string(::getpid()); }

    static void Put(const std::string& name, const std::string& bytes)
    {
        std::ofstream(Path(name), std::ios::binary) << bytes;
    }

    [[nodiscard]] static bool Exists(const std::string& name) { return std::filesystem::exists(Path(name)); }

    [[nodiscard]] static std::string Get(const std::string& name)
    {
        std::ifstream file(Path(name), std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    /// All files in the folder, in order, a blank between them.
    [[nodiscard]] static std::string Files()
    {
        std::vector<std::string> names;
        for (const auto& entry : std::filesystem::directory_iterator(Path("")))
            names.push_back(entry.path().filename().string());
        std::ranges::sort(names);
        std::string text;
        for (const std::string& name : names)
            text.append(text.empty() ? "" : " ").append(name);
        return text;
    }

    /// Takes the answer out of the files named `stem`.
    [[nodiscard]] static Host_Answer Take_Answer(const std::string& stem, const std::string& result)
    {
        Host_Answer answer;
        const std::string bytes = Get(result);
        if (bytes.size() == 8 && bytes.substr(1) == std::string(7, '\0'))
            answer.status = bytes[0];
        answer.messages = Get(stem + ".ERR");
        std::filesystem::remove(Path(result));
        std::filesystem::remove(Path(stem + ".ERR"));
        return answer;
    }

    [[nodiscard]] static Host_Answer Call_With_Bytes(const std::string& bytes)
    {
        Put(Stem() + ".inp", bytes);
        EXPECT_EQ(INGESTER("", "", 0, 0), 0);
        return Take_Answer(Stem(), Stem() + ".out");
    }

    [[nodiscard]] static Host_Answer Call(const std::vector<std::string>& records)
    {
        return Call_With_Bytes(Pass_Bytes(static_cast<double>(records.size()), records));
    }

    /// One conversion: the strings begin with names in the folder.
    [[nodiscard]] static Host_Answer Convert(const std::string& input, const std::string& output)
    {
        return Call({Request_Name(input), Request_Name(output)});
    }
};

}  // namespace ingester

// A private folder for each test, which is the temporary one as well.
#pragma once

#include "platform/folders.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <set>
#include <string>
#include <vector>

namespace ingester {

using Texts = std::vector<std::string>;

/// With "|" for its line ends.
inline std::string On_One_Line(std::string text)
{
    std::erase(text, '\r');
    std::ranges::replace(text, '\n', '|');
    return text;
}

class Folder_Test : public testing::Test {
protected:
    void SetUp() override
    {
        static const std::string pattern = std::filesystem::temp_directory_path() / "ingester-test-XXXXXX";
        folder_ = pattern;
        ASSERT_NE(::mkdtemp(folder_.data()), nullptr);
        ASSERT_EQ(::setenv("TMPDIR", folder_.c_str(), 1), 0);
    }
    void TearDown() override { std::filesystem::remove_all(folder_); }

    [[nodiscard]] std::string Path(const std::string& name) const { return folder_ + "/" + name; }

    /// As a request names it: no slash but those of the options in `name`.
    [[nodiscard]] std::string Request_Name(const std::string& name) const
    {
        return Request_Path(Path("")) + name;
    }

    void Put(const std::string& name, const std::string& bytes) const
    {
        std::ofstream(Path(name), std::ios::binary) << bytes;
    }
    [[nodiscard]] std::string Get(const std::string& name) const
    {
        std::ifstream file(Path(name), std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

    /// All that is in the folder, in order, a blank between.
    [[nodiscard]] std::string Files() const
    {
        std::set<std::string> names;
        for (const auto& entry : std::filesystem::recursive_directory_iterator(folder_))
            names.insert(entry.path().lexically_relative(folder_));
        std::string text;
        for (const std::string& name : names)
            text.append(text.empty() ? "" : " ").append(name);
        return text;
    }

private:
    std::string folder_;
};

}  // namespace ingester

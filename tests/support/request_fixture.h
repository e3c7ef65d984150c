// A request of its own for each test, with a private temporary folder.
#pragma once

#include "interface/process_request.h"
#include "interface/request/messages.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <string>

namespace ingester {

class Request_Test : public testing::Test {
protected:
    void SetUp() override
    {
        const char* const earlier = std::getenv("TMPDIR");
        earlier_ = earlier == nullptr ? "" : earlier;
        std::string folder = (std::filesystem::temp_directory_path() / "ingester-test-XXXXXX").string();
        ASSERT_NE(::mkdtemp(folder.data()), nullptr);
        folder_ = folder;
        ::setenv("TMPDIR", folder.c_str(), 1);
        Start_Request("t");
    }

    void TearDown() override
    {
        Start_Request("t");
        std::filesystem::remove_all(folder_);
        if (earlier_.empty())
            ::unsetenv("TMPDIR");
        else
            ::setenv("TMPDIR", earlier_.c_str(), 1);
    }

    /// What was reported since the last call, with the closing mark; empty when nothing was.
    [[nodiscard]] std::string Messages() const
    {
        Close_Message_File();
        std::ifstream file(folder_ / "t.ERR", std::ios::binary);
        const std::string text(std::istreambuf_iterator<char>(file), {});
        Start_Message_File();
        return text;
    }

    std::filesystem::path folder_;

private:
    std::string earlier_;
};

}  // namespace ingester

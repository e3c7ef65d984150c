// A request of its own, with a private temporary folder, for tests of what runs inside one.
#pragma once

#include "interface/process_request.h"
#include "interface/request/messages.h"

#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <iterator>
#include <optional>
#include <string>

namespace ingester {

class Request_Test : public testing::Test {
protected:
    void SetUp() override
    {
        if (const char* const earlier = std::getenv("TMPDIR"))
            earlier_folder_ = earlier;
        folder_ = (std::filesystem::temp_directory_path() / "ingester_test_XXXXXX").string();
        ASSERT_NE(::mkdtemp(folder_.data()), nullptr);
        ::setenv("TMPDIR", folder_.c_str(), 1);
        Start_Request("t");
    }

    void TearDown() override
    {
        Close_Message_File();
        if (earlier_folder_)
            ::setenv("TMPDIR", earlier_folder_->c_str(), 1);
        else
            ::unsetenv("TMPDIR");
        std::filesystem::remove_all(folder_);
    }

    /// Ends the message file and returns its text; empty when there were no messages.
    std::string Messages()
    {
        Close_Message_File();
        std::ifstream file(folder_ + "/t.ERR", std::ios::binary);
        return {std::istreambuf_iterator<char>(file), {}};
    }

private:
    std::string folder_;
    std::optional<std::string> earlier_folder_;
};

}  // namespace ingester

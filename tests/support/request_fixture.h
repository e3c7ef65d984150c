// A request of its own for each test: fresh globals, no Sheets, and a private temporary folder.
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
        std::string folder = testing::TempDir() + "request.XXXXXX";
        ASSERT_NE(mkdtemp(folder.data()), nullptr);
        folder_ = folder;
        setenv("TMPDIR", folder.c_str(), 1);
        Start_Request("t");
    }

    void TearDown() override
    {
        Start_Request("t");
        unsetenv("TMPDIR");
        std::filesystem::remove_all(folder_);
    }

    /// The messages since the last call, as the host finds them: with ":\n" behind; empty for none.
    [[nodiscard]] std::string Messages() const
    {
        Close_Message_File();
        std::ifstream file(folder_ / "t.ERR", std::ios::binary);
        const std::string text(std::istreambuf_iterator<char>(file), {});
        Start_Message_File();
        return text;
    }

    std::filesystem::path folder_;
};

}  // namespace ingester

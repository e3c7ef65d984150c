// A request of its own for each test, in a private folder.
#pragma once

#include "interface/process_request.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/folder_fixture.h"

namespace ingester {

class Request_Test : public Folder_Test {
protected:
    void SetUp() override
    {
        Folder_Test::SetUp();
        request = Request_Globals{};  // with what outlives requests
        Start_Request("t");
    }
    void TearDown() override
    {
        Start_Request("t");
        Folder_Test::TearDown();
    }

    /// What was reported since the last call, with the closing mark; empty when nothing was.
    [[nodiscard]] std::string Messages() const
    {
        Close_Message_File();
        const std::string text = Get("t.ERR");
        Start_Message_File();
        return text;
    }
};

}  // namespace ingester

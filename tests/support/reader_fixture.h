// Bytes, read in a request of their own, and the Sheet that comes of them as a text.
#pragma once

#include "interface/host_fixture.h"
#include "platform/files.h"
#include "support/cell_lists.h"
#include "support/check_sheet.h"

#include <functional>
#include <span>
#include <string_view>

namespace ingester {

/// What is set before a file is read.
using Change = std::function<void()>;

/// One file to a table: its bytes, the Sheet as `Render` tells it (empty for none), what is set before, what
/// is said.
struct Reader_Case {
    const char* told;
    std::string bytes, sheet;
    Change change = {};
    std::string message = {};
};

class Reader_Test : public Host_Test {
protected:
    using File_Reader = bool (*)(Input_File& file);

    /// The Sheet of a file in memory, called `name`; null when it was refused. Any Sheet has to be sound.
    static Sheet* Read_Bytes(File_Reader read, std::string_view bytes, const char* name,
                             const Change& change = {})
    {
        Start_Request("t");
        if (change)
            change();
        Input_File file(std::as_bytes(std::span(bytes)), name);
        if (!read(file))
            return nullptr;
        EXPECT_EQ(Check_Sheet(*Current_Sheet), "");
        return Current_Sheet;
    }

    void Try_Bytes(File_Reader read, const char* name, std::span<const Reader_Case> cases) const
    {
        for (const Reader_Case& tried : cases) {
            EXPECT_EQ(Render(Read_Bytes(read, tried.bytes, name, tried.change)), tried.sheet) << tried.told;
            EXPECT_EQ(Messages(), tried.message.empty() ? "" : tried.message + ":\n") << tried.told;
        }
    }
};

}  // namespace ingester

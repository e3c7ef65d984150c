#include "interface/file_detection.h"

#include "interface/request/messages.h"
#include "platform/files.h"

#include <array>

namespace ingester {

namespace {

/// What the tests look at: the name, and the head of the file, with zeros behind a short one.
struct Detection_Head {
    std::string_view name;
    std::array<std::uint8_t, 200> bytes{};
};

/// Text by its first bytes. A NUL behind a line end is the end of a short file.
bool Looks_Like_Text(const Detection_Head& head)
{
    constexpr std::size_t sniffed = 55;
    bool line_end_seen = false;
    for (std::size_t i = 0; i < sniffed; ++i) {
        const std::uint8_t byte = head.bytes[i];
        if (byte == '\r' || byte == '\n')
            line_end_seen = true;
        else if (byte == 0 && line_end_seen)
            return true;
        else if ((byte < 32 && byte != '\t' && byte != '\f') || byte >= 128)
            return false;
    }
    return true;
}

struct Detection_Test {
    std::int32_t code;
    bool (*matches)(const Detection_Head& head);
};

/// The first match decides.
constexpr Detection_Test Detection_Tests[] = {
    {plain_text_file, Looks_Like_Text},
};

std::int32_t Unreadable(std::string_view why)
{
    Report_Message(why);
    return unreadable_file;
}

}  // namespace

std::int32_t Detect_File_Type(std::string_view file_name)
{
    if (file_name.empty()) {
        Report_Message("Input file name is NULL or empty.\n");
        return unknown_file;
    }
    Input_File file;
    if (!file.Open(file_name))
        return Unreadable("Input file could not be opened.\n");
    Detection_Head head{file_name};
    if (file.Read(head.bytes.data(), head.bytes.size()) == 0)
        return Unreadable("Input file is empty.\n");
    for (const Detection_Test& test : Detection_Tests)
        if (test.matches(head))
            return test.code;
    return unknown_file;
}

}  // namespace ingester

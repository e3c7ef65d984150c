#include "interface/file_detection.h"

#include "interface/detection_tests.h"
#include "platform/files.h"
#include "platform/gzip_file.h"
#include "request/messages.h"

namespace ingester {

namespace {

std::int32_t Unreadable(std::string_view why)
{
    Report_Message(why);
    return unreadable_file;
}

std::int32_t Unknown(std::string_view why)
{
    Report_Message(why);
    return unknown_file;
}

}  // namespace

std::int32_t Detect_File_Type(std::string_view file_name)
{
    if (file_name.empty())
        return Unknown("Input file name is NULL or empty.\n");
    Input_File file;
    if (!file.Open(file_name))
        return Unreadable("Input file could not be opened.\n");
    Detection_Head head{file_name};
    head.length = file.Read_Head(head.bytes.data(), head.bytes.size());
    if (file.Failed())
        return Unreadable("Input file could not be read.\n");
    return head.length == 0 ? Unreadable("Input file is empty.\n") : Code_Of_Head(head);
}

std::int32_t Detect_Compressed_File_Type(std::string_view file_name)
{
    constexpr std::size_t looked_at = 100;
    Gzip_File file;
    if (!file.Open(file_name))
        return Unknown("Cannot open compressed file.\n");
    Detection_Head head{file_name};
    head.length = file.Read(head.bytes.data(), looked_at);
    if (!file.Close())
        return Unknown("Cannot close compressed file.\n");
    return Code_Of_Head(head);
}

bool Looks_Like_Cornell(std::string_view file_name)
{
    Input_File file;
    Detection_Head head{file_name};
    if (!file.Open(file_name))
        return false;  // silent by design: no such file is one of them
    head.length = file.Read_Head(head.bytes.data(), head.bytes.size());
    return Looks_Like_Cornell(head);
}

}  // namespace ingester

#include "interface/request/messages.h"

#include "interface/request/request.h"
#include "platform/files.h"
#include "platform/folders.h"

#include <memory>
#include <string>

namespace ingester {

namespace {

/// The open message file; null before the first message and after the last.
std::unique_ptr<Output_File> message_file;

std::string Message_File_Name()
{
    return Get_Temp_Folder().append(request.Scratch_Stem).append(".ERR");
}

}  // namespace

void Start_Message_File()
{
    message_file.reset();
    Delete_File(Message_File_Name());
}

void Report_Message(std::string_view text)
{
    if (message_file == nullptr) {
        auto file = std::make_unique<Output_File>(Output_File::small_buffer);
        if (!file->Open_Scratch(Message_File_Name()))
            return;  // silent by design: messages have no other way out
        message_file = std::move(file);
    }
    message_file->Write(text);
}

void Report_Message_Text(const char* format, const char* text)
{
    Fail(format, text);
}

void Report_Message_Long(const char* format, long value)
{
    Fail(format, value);
}

void Report_Message_Real(const char* format, double value)
{
    Fail(format, value);
}

bool Fail(std::string_view text)
{
    Report_Message(text);
    return false;
}

void Close_Message_File()
{
    if (message_file == nullptr)
        return;
    message_file->Write(":\n");
    static_cast<void>(message_file->Close());  // silent by design: see above
    message_file.reset();
}

}  // namespace ingester

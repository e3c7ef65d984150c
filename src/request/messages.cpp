#include "request/messages.h"

#include "platform/faults.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "request/request.h"
#include "support/letters.h"

#include <algorithm>
#include <array>
#include <memory>
#include <string>
#include <utility>

namespace ingester {

namespace {

/// The open message file; null before the first message and after the last.
std::unique_ptr<Output_File> message_file;

/// Its native path, for whoever can't make one.
std::array<char, 4096> message_path{};

/// What a survived fault has to say, until there is time for it.
std::string_view words_of_fault;

constexpr std::string_view End_Mark = ":\n";

}  // namespace

std::string Message_File_Name()
{
    return Get_Temp_Folder().append(request.Scratch_Stem).append(".ERR");
}

void Start_Message_File()
{
    message_file.reset();
    words_of_fault = {};
    const std::string name = Message_File_Name();
    Delete_File(name);
    const std::string path = Native_Path(name);
    message_path[path.copy(message_path.data(), message_path.size() - 1)] = '\0';
}

namespace {

/// A text that a format has cut inside a letter loses the rest of it.
std::string Without_Cut_Letters(std::string_view text)
{
    std::string whole;
    while (!text.empty()) {
        const std::size_t length = First_Utf8(text).length;
        whole.append(text.substr(0, length));
        text.remove_prefix(std::max<std::size_t>(length, 1));
    }
    return whole;
}

}  // namespace

void Report_Message(std::string_view text)
{
    if (message_file == nullptr) {
        auto file = std::make_unique<Output_File>(Output_File::small_buffer);
        if (!file->Open_Scratch(Message_File_Name()))
            return;  // silent by design: messages have no other way out
        message_file = std::move(file);
    }
    if (Letters_Are_Utf8() && !Is_Utf8(text))
        message_file->Write(Without_Cut_Letters(text));
    else
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

bool Fail_To_Read(const std::string& file_name)
{
    return Fail("Error: Could not read all of file %.500s.\n", file_name.c_str());
}

void Report_In_Fault(std::string_view text, bool ending)
{
    if (!ending) {
        words_of_fault = text;
        return;
    }
    if (message_file != nullptr) {
        message_file->Write(text);
        message_file->Write(End_Mark);
        static_cast<void>(message_file->Close());
    } else if (!text.empty()) {
        std::array<char, 200> whole{};
        std::size_t length = text.copy(whole.data(), whole.size() - End_Mark.size());
        length += End_Mark.copy(whole.data() + length, End_Mark.size());
        Write_Scratch_In_Fault(message_path.data(), {whole.data(), length});
    }
}

void Close_Message_File()
{
    if (!words_of_fault.empty())
        Report_Message(std::exchange(words_of_fault, {}));
    if (message_file == nullptr)
        return;
    message_file->Write(End_Mark);
    static_cast<void>(message_file->Close());  // silent by design: see above
    message_file.reset();
}

}  // namespace ingester

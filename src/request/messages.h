// The one way in which the library tells the user something: the request's message file.
#pragma once

#include "support/text.h"

#include <string>
#include <string_view>

namespace ingester {

/// Writes `text` as it is to the message file, which the first message makes.
/// Where the file can't be made the text is lost: there is nobody left to tell.
void Report_Message(std::string_view text);

/// Report `format` with its one "%s" (any precision), "%li" or "%g"-like mark filled in.
void Report_Message_Text(const char* format, const char* text);
void Report_Message_Long(const char* format, long value);
void Report_Message_Real(const char* format, double value);

/// Reports, and is false: `return Fail("...")` where a fault is seen.
bool Fail(std::string_view text);
template <class First, class... Rest> bool Fail(const char* format, First first, Rest... rest)
{
    Report_Message(Format_Text(format, first, rest...));
    return false;
}

/// Reports what the user should know of a request that goes on.
template <class First, class... Rest> void Warn(const char* format, First first, Rest... rest)
{
    Report_Message(Format_Text(format, first, rest...));
}

/// Reports that a file, or a list, could not be read to its end. Always false.
bool Fail_To_Read(const std::string& file_name);

/// What the message file is called.
[[nodiscard]] std::string Message_File_Name();

/// Ends the request's messages: closes the file, behind the mark the host looks for.
void Close_Message_File();

/// Reports from inside the handler of a signal: kernel calls only, no heap. With `ending` the file is
/// closed as well, as `Close_Message_File` does; without, `text` (a literal) is told at the request's end.
void Report_In_Fault(std::string_view text, bool ending);

/// Forgets the message file of an earlier request and removes the one that `<temp><stem>.ERR` names.
void Start_Message_File();

}  // namespace ingester

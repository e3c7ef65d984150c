#include "interface/clipboard.h"

#include "platform/clipboard.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>

namespace ingester {

bool Is_Clipboard_Input(std::string_view name)
{
    constexpr std::string_view names[] = {"clipboard", "clipboard.tab", "clipboard.csv", "clipboard.rda"};
    return std::ranges::any_of(names,
                               [name](std::string_view known) { return Equal_Ignoring_Case(name, known); });
}

bool Is_Clipboard_Output(std::string_view name)
{
    return Starts_Ignoring_Case(name, "clipboard.");
}

bool Read_Clipboard_To_File(const std::string& name)
{
    switch (Copy_Clipboard_To(name)) {
    case Clipboard_Answer::done:
        Report_Message("Data read from the clipboard.\n");
        return true;
    case Clipboard_Answer::unavailable:
        return Fail("Read Error: Cannot open clipboard for read.\n");
    case Clipboard_Answer::no_text:
        return Fail("Clipboard does not contain text.\n");
    default:
        return Fail("%s could not be written from the clipboard.\n", name.c_str());
    }
}

namespace {

bool Tell_Put(Clipboard_Answer answer)
{
    if (answer == Clipboard_Answer::unavailable)
        return Fail("Copy Error: Cannot open clipboard for write.\n");
    if (answer != Clipboard_Answer::done)
        return Fail("Copy Error: Could not write data to clipboard.\n");
    Report_Message("Data written to the clipboard.\n");
    return true;
}

}  // namespace

bool Put_File_On_Clipboard(const std::string& name, bool remove)
{
    Input_File file;
    if (!file.Open(name))
        return Fail("%s could not be found for loading to the clipboard.\n", name.c_str());
    const bool empty = file.Size() == 0;
    file.Close();
    const bool put = empty ? Fail("Nothing to write to the clipboard.\n") : Tell_Put(Copy_To_Clipboard(name));
    if (remove)
        Delete_File(name);
    return put;
}

}  // namespace ingester

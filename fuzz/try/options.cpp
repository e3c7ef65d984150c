#include "function.h"
#include "interface/people_options.h"
#include "interface/slash_options.h"
#include "request/messages.h"
#include "request/request.h"

namespace ingester {

/// The head: which of the request's strings it is.
void Try_Function(std::string_view head, std::string_view text)
{
    request = Request_Globals{};
    const std::span<const Slash_Option> tables[] = {Genotype_Options(), Input_Options(), Output_Options()};
    std::string rest(text);
    std::string other;
    Take_People_Options(rest, other);
    static_cast<void>(Take_Reflow_Order(rest));
    Cut_Options(tables[Choice(head[0], 3)], rest);
    Must(rest.size() <= text.size(), "options leave more than there was");
    Must(request.Text_Number_Mode >= 0 && request.Text_Number_Mode <= 4, "no such mode");
    Must(request.Lines_Per_Record >= 1, "a record of no lines");
    Must(request.Merge_Key_Count >= 0 && request.Merge_Key_Count <= 9, "too many keys");
    Close_Message_File();
}

}  // namespace ingester

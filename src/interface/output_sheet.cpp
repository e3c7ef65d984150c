#include "interface/output_sheet.h"

#include "interface/format_drivers.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

/// Stands for a file of one table, whose sheet has no name.
constexpr std::string_view Only_Sheet = "1";

void Update_Sheet(std::string_view name, bool already_there)
{
    request.Output_Sheet_Name = name;
    request.Update_Sheet_Name = name;
    request.Sheet_Already_There = already_there;
}

/// The sheet to update; where none is named, the one of the same name as a sheet asked of the input.
std::string Wanted_Sheet()
{
    if (!request.Merge_Sheet_Name.empty())
        return std::string(request.Merge_Sheet_Name);
    if (request.Worksheet_Name.empty() || request.Worksheet_Name.view() == Only_Sheet)
        return {};
    return std::string(request.Used_Sheet_Name.empty() ? request.Worksheet_Name : request.Used_Sheet_Name);
}

/// The first sheet, in the place of one that isn't there or wasn't named.
void Use_First_Sheet(const std::vector<std::string>& names, const std::string& wanted,
                     const std::string& output_name)
{
    if (!wanted.empty())
        Report_Message(
            Format_Text("Warning: sheet %s not found in file %s.\n", wanted.c_str(), output_name.c_str()));
    else if (names.size() > 1)
        Report_Message(Format_Text("Using sheet %s within the file.\n", names.front().c_str()));
    Update_Sheet(names.front(), true);
    request.Add_To_Output = true;
}

}  // namespace

bool Find_Output_Sheet(const std::string& output_name)
{
    const std::string wanted = Wanted_Sheet();
    if (!File_Exists(output_name))
        return true;
    // Of formats that hold one table nothing is asked: what is wrong with the file is told when it is read.
    const bool hidden = !For_People(People_Rule::further_endings) && Ends_Ignoring_Case(output_name, ".gz");
    const bool several = hidden || Output_Driver_Of(output_name).sheet_names != nullptr;
    const auto listed = several ? List_Sheet_Names(output_name) : std::vector<std::string>{};
    if (!listed)
        return false;
    if (listed->empty()) {
        request.Add_To_Output = false;
        return true;
    }
    const auto found = std::ranges::find_if(
        *listed, [&wanted](const std::string& name) { return Equal_Folded(name, wanted); });
    if (!wanted.empty() && found != listed->end()) {
        Update_Sheet(*found, true);
        request.Add_To_Output = true;
        return true;
    }
    if (request.Add_Mode == Add_Modes::none && request.Source_Key_Given)
        Update_Sheet(wanted.empty() ? std::string_view(listed->front()) : wanted, wanted.empty());
    else
        Use_First_Sheet(*listed, wanted, output_name);
    return true;
}

}  // namespace ingester

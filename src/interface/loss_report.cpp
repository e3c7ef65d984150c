#include "interface/loss_report.h"

#include "platform/files.h"
#include "platform/folders.h"
#include "platform/text_codes.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <nlohmann/json.hpp>
#include <string>

namespace ingester {

namespace {

/// More would push what else was told out of sight.
constexpr std::size_t Most_Lines = 30;

std::string Line_Of(const Loss& loss)
{
    std::string line = "Lost";
    if (!loss.column.empty())
        line.append(" in ").append(loss.column);
    line.append(": ").append(Words_Of(loss.kind));
    if (loss.count > 1)
        line.append(Format_Text(", %lld times", static_cast<long long>(loss.count)));
    std::string first;
    if (loss.first_row > 0)
        first = Format_Text("row %lld", static_cast<long long>(loss.first_row));
    if (!loss.example.empty())
        first.append(first.empty() ? "" : ": ").append(loss.example);
    if (!first.empty())
        line.append(loss.count > 1 ? " (first: " : " (").append(first).append(")");
    return line + ".\n";
}

/// One entry, in an order that people like to read.
nlohmann::ordered_json Entry_Of(const Loss& loss)
{
    nlohmann::ordered_json entry;
    entry["kind"] = Key_Of(loss.kind);
    entry["column"] = In_Utf8(loss.column);
    entry["first_row"] = loss.first_row;
    entry["count"] = loss.count;
    entry["example"] = In_Utf8(loss.example);
    return entry;
}

std::string Report_Text()
{
    nlohmann::ordered_json losses = nlohmann::ordered_json::array();
    for (const Loss& loss : request.losses.Entries())
        losses.push_back(Entry_Of(loss));
    nlohmann::ordered_json report;
    report["losses"] = std::move(losses);
    return report.dump(2, ' ', false, nlohmann::json::error_handler_t::replace) + "\n";
}

}  // namespace

void Tell_Losses()
{
    if (!For_People(People_Rule::told_losses))
        return;
    const auto& losses = request.losses.Entries();
    for (std::size_t i = 0; i < losses.size() && i < Most_Lines; ++i)
        Report_Message(Line_Of(losses[i]));
    if (losses.size() > Most_Lines)
        Report_Message(
            Format_Text("And %zu more of the kind; a report lists them all.\n", losses.size() - Most_Lines));
}

bool Write_Loss_Report(std::string_view file_name)
{
    const Scratch_File scratch(std::string(file_name).append(".$$$"));  // an older report stays until then
    Output_File file(Output_File::small_buffer);
    bool written = Delete_File(scratch.Name()) && file.Open(scratch.Name());
    if (written) {
        file.Write(Report_Text());
        written = file.Close() && Replace_File(scratch.Name(), file_name);
    }
    return written || Fail("The report %.500s could not be written.\n", std::string(file_name).c_str());
}

}  // namespace ingester

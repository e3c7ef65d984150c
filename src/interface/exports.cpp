// The exported functions.
#include "ingester/ingester.h"

#include "interface/export_frame.h"
#include "interface/pass_file.h"
#include "interface/process_request.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <optional>
#include <string>

namespace ingester {

namespace {

/// A host doubles the backslashes of its carrier file's name.
std::string Carrier_Name(std::string_view text)
{
    constexpr std::size_t greatest_length = 577;
    std::string name;
    text = text.substr(0, greatest_length);
    for (std::size_t i = 0; i < text.size(); ++i) {
        name += text[i];
        if (text.substr(i, 2) == "\\\\")
            ++i;
    }
    return name;
}

/// Names by the process, or by the request id in the host's carrier file.
Call_Files Find_Call_Files(std::string_view first)
{
    const std::string temp = Get_Temp_Folder();
    const long pid = Process_Id();
    Call_Files by_process = {temp + Format_Text("IG%li.inp", pid), temp + Format_Text("IG%li.out", pid),
                             Format_Text("IG%li", pid)};
    if (File_Exists(by_process.pass))
        return by_process;
    if (const auto id = static_cast<unsigned long>(Read_Carrier_Id(Carrier_Name(first))); id > 0)
        return {temp + Format_Text("IG%lX.tmp", id), temp + Format_Text("IG%lX.out", id),
                Format_Text("IG%lX", id)};
    return {temp + "ingester.inp", temp + "ingester.out", "TxtToNum"};
}

/// A number in place of a sheet's name, as "3".
bool Is_Positive_Number(std::string_view text)
{
    return !text.empty() && std::all_of(text.begin(), text.end(), Is_Digit) && Leading_Integer(text) > 0;
}

/// Whether the sheet that was read isn't the one that was asked for.
bool Another_Sheet_Was_Used()
{
    std::string_view wanted = request.Worksheet_Name;
    const std::string_view used = request.Used_Sheet_Name;
    if (wanted.empty() || used.empty() || request.Sheet_Name_Was_Exact)
        return false;
    const bool prefixed = wanted.size() >= 2 && wanted[1] == ':' && (wanted[0] == 'S' || wanted[0] == 'R');
    if (prefixed)
        return !Equal_Ignoring_Case(wanted.substr(2), used);
    return Is_Positive_Number(wanted) && !Equal_Ignoring_Case(wanted, used);
}

/// What the user has to know of the sheet, and what that makes of the status.
Request_Status Check_Sheet_Name(Request_Status status)
{
    if (!Another_Sheet_Was_Used())
        return status;
    Warn("\n***** Warning: An inexact match for the SHEET name occurred. *****\n"
         "Data from %s was used when %s was specified.\n"
         "Note: A closest match algorithm is used and case is ignored.\n",
         request.Used_Sheet_Name.c_str(), request.Worksheet_Name.c_str());
    return status == Request_Status::not_imported ? Request_Status::inexact_sheet : status;
}

/// One call of INGESTER, step by step.
class Ingester_Call {
public:
    explicit Ingester_Call(Call_Files files) : files_(std::move(files)) {}
    Ingester_Call(const Ingester_Call&) = delete;
    Ingester_Call& operator=(const Ingester_Call&) = delete;
    ~Ingester_Call()
    {
        if (!asked_.secondary_scratch.empty())
            Delete_File(asked_.secondary_scratch);
    }

    /// False when no answer may be given.
    [[nodiscard]] bool Run()
    {
        if (!Take_Request())
            return !asked_.secondary_failed;
        status_ = Process_Request(asked_.infile, asked_.outfile, rows_);
        if (status_ == Request_Status::success && rows_ == 0)
            status_ = Request_Status::no_rows;
        return true;
    }

    [[nodiscard]] Request_Status Status() const { return status_; }

private:
    bool Take_Request()
    {
        Input_File file;
        if (!file.Open(files_.pass))
            return Fail("Pass file %s not found./n", files_.pass.c_str());
        const bool good = Read_Pass_File(file, asked_);
        file.Close();
        if (good)
            Delete_File(files_.pass);
        return good;
    }

    Call_Files files_;
    Pass_Request asked_;
    std::int32_t rows_ = 0;
    Request_Status status_ = Request_Status::no_request;
};

std::optional<std::int32_t> Convert_As_Asked(const Call_Files& files)
{
    Ingester_Call call(files);
    if (!call.Run())
        return std::nullopt;
    return static_cast<std::int32_t>(Check_Sheet_Name(call.Status()));
}

constexpr Export Conversion = {Find_Call_Files, Convert_As_Asked,
                               static_cast<std::int32_t>(Request_Status::no_data)};

}  // namespace

}  // namespace ingester

std::int32_t INGESTER(const char* pass_name, const char* result_name, std::int32_t pass_name_length,
                      std::int32_t result_name_length)
{
    using namespace ingester;
    Run_Export(Conversion, Argument_Name(pass_name, pass_name_length),
               Argument_Name(result_name, result_name_length));
    return 0;
}

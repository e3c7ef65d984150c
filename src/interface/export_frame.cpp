#include "interface/export_frame.h"

#include "interface/float_faults.h"
#include "interface/pass_file.h"
#include "interface/process_request.h"
#include "model/sheet.h"
#include "request/messages.h"

#include <exception>

namespace ingester {

namespace {

/// Runs the work as a request. Lack of memory is a fault like any other.
std::optional<std::int32_t> Run_Request(const Export& what, const Call_Files& files)
{
    std::optional<std::int32_t> status;
    try {
        Start_Request(files.stem);
        status = what.work(files);
    } catch (const std::exception&) {  // no room, or a length beyond what any room could hold
        Free_Sheets();                 // room for the answer
        Report_In_Fault("Error: Not enough memory to read data.\n", true);
        status = what.without_memory;
    }
    Close_Message_File();
    Free_Sheets();  // the next request may be hours away
    return status;
}

void Run_Call(const Export& what, std::string_view first, std::string_view result_name)
{
    Call_Files files = what.find_files(first);
    if (!result_name.empty())
        files.result = result_name;
    if (const std::optional<std::int32_t> status = Run_Request(what, files))
        Write_Result_File(files.result, *status);
}

}  // namespace

std::string_view Argument_Name(const char* name, std::int32_t length)
{
    if (name == nullptr || length <= 0)
        return {};
    const std::string_view text(name, static_cast<std::size_t>(length));
    return text.substr(0, text.find('\0'));
}

void Run_Export(const Export& what, std::string_view first, std::string_view result_name)
{
    const Fault_Guard guard(Report_Float_Fault);
    try {
        Run_Call(what, first, result_name);
    } catch (const std::exception&) {
        // silent by design: a host without a result file knows; nothing may be thrown into it
    }
}

}  // namespace ingester

// The fuzz target of every reader; reader.h tells what else it takes.
#include "reader.h"

#include "interface/process_request.h"
#include "model/sheet.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/check_sheet.h"

#include <cstdio>
#include <cstdlib>
#include <filesystem>

namespace {

std::filesystem::path scratch_folder;

}  // namespace

extern "C" int LLVMFuzzerInitialize(int* /*count*/, char*** /*arguments*/)
{
    std::string folder = std::filesystem::temp_directory_path() / "fuzz_XXXXXX";
    if (mkdtemp(folder.data()) == nullptr || setenv("TMPDIR", folder.c_str(), 1) != 0)
        return 1;
    scratch_folder = folder;
    return std::atexit([] { std::filesystem::remove_all(scratch_folder); });
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    using namespace ingester;
    auto bytes = std::as_bytes(std::span(data, size));
    Start_Request();
    if (size % 2 == 1) {  // half of the inputs are read as for people
        request.people.set();
        Use_Utf8_Text(true);
        request.Names_Kept_As_They_Stand = true;
    }
    const std::string_view name = Prepare_Input(bytes);
    Input_File file(bytes, name);
    static_cast<void>(Read_Input(file));  // refusing is as good as reading
    Close_Message_File();
    const std::string faults = Current_Sheet == nullptr ? "" : Check_Sheet(*Current_Sheet);
    if (!faults.empty()) {
        std::fputs(faults.c_str(), stderr);
        std::abort();
    }
    Free_Sheets();
    return 0;
}

// Times one read of delimited text or of a spreadsheet or book of the host into a Sheet and, if asked, one
// write of the Sheet as comma text, as a command script, as a spreadsheet or as a book; of the last two then
// also a plain copy through the same streams. Or times one read of some columns only, told by number. Prints
// "name value" lines: seconds, counts and bytes.

#include "hostfiles/script/script.h"
#include "hostfiles/tbk/tbk.h"
#include "hostfiles/tss/tss.h"
#include "interface/process_request.h"
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "spreadsheet/text/text.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <string>
#include <string_view>

namespace {

using namespace ingester;

/// A line of /proc/self/status, as "VmHWM:", in bytes.
long long Memory_Now(std::string_view wanted)
{
    long long kilobytes = -1;
    if (std::FILE* const status = std::fopen("/proc/self/status", "r")) {
        char line[256];
        while (std::fgets(line, sizeof line, status) != nullptr)
            if (std::string_view(line).starts_with(wanted))
                std::sscanf(line + wanted.size(), "%lld", &kilobytes);
        std::fclose(status);
    }
    return kilobytes * 1024;
}

void Print_Memory(const char* moment)
{
    std::printf("peak_%s %lld\nresident_%s %lld\n", moment, Memory_Now("VmHWM:"), moment,
                Memory_Now("VmRSS:"));
}

/// Runs `work` and prints its seconds; its truth is passed on.
template <class Work> bool Time(const char* name, Work work)
{
    const auto start = std::chrono::steady_clock::now();
    const bool done = work();
    const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
    std::printf("%s %.6f\n", name, taken.count());
    return done;
}

/// Numbers with commas between them.
void Keep_Columns_Of(std::string_view list)
{
    request.Subset_Columns = request.Subset_By_Number = true;
    for (std::size_t end; !list.empty(); list.remove_prefix(std::min(end + 1, list.size()))) {
        end = std::min(list.find(','), list.size());
        request.Subset_Names.emplace_back(list.substr(0, end));
    }
}

constexpr std::string_view Forms[] = {"packed", "padded", "script", "tss", "tbk"};

bool Read_Input(const char* name)
{
    const std::string_view file = name;
    if (file.ends_with(".tss"))
        return Read_TSS_File(name);
    return file.ends_with(".tbk") ? Read_TBK_File(name) : Read_CSV_File(name);
}

bool Write_As(std::string_view form, const char* name)
{
    if (form == "tss")
        return Write_TSS_File(Current_Sheet, name);
    if (form == "tbk")
        return Write_TBK_File(Current_Sheet, name);
    return form == "script" ? Write_Host_Script(Current_Sheet, name)
                            : Write_Text_File(Current_Sheet, name, false);
}

}  // namespace

int main(int count, char** arguments)
{
    const std::string_view form = count == 4 ? arguments[3] : "packed";
    if (count < 2 || count > 4 || std::ranges::find(Forms, form) == std::end(Forms)) {
        std::fputs("usage: time_text FILE [OUTPUT packed|padded|script|tss|tbk]\n"
                   "       time_text FILE COLUMN,COLUMN...\n",
                   stderr);
        return 2;
    }
    Start_Request();
    if (count == 3)
        Keep_Columns_Of(arguments[2]);
    Print_Memory("before");
    const bool read = Time("read_seconds", [&] { return Read_Input(arguments[1]); });
    Print_Memory("after_read");
    if (!read || Current_Sheet == nullptr) {
        Close_Message_File();
        std::fprintf(stderr, "time_text: %s could not be read\n", arguments[1]);
        return 1;
    }
    std::printf("rows %lld\ncolumns %lld\n", static_cast<long long>(Current_Sheet->row_count),
                static_cast<long long>(Current_Sheet->column_count));
    if (count == 4) {
        request.CSV_Output = true;
        request.Packed_Csv_Output = form == "packed";
        request.settings.csv_title = 0;
        Current_Sheet->settings.csv_title = 0;
        const bool written = Time("write_seconds", [&] { return Write_As(form, arguments[2]); });
        Print_Memory("after_write");
        if (!written) {
            Close_Message_File();
            std::fprintf(stderr, "time_text: %s could not be written\n", arguments[2]);
            return 1;
        }
    }
    Free_Sheets();
    if (form == "tss" || form == "tbk") {
        const std::string copy = std::string(arguments[2]) + ".copy";
        const bool copied = Time("copy_seconds", [&] { return Copy_File(arguments[2], copy); });
        Delete_File(copy);
        return copied ? 0 : 1;
    }
    return 0;
}

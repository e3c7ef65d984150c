// Times one read of delimited text or of a spreadsheet or book of the host into a Sheet and, if asked, one
// write of the Sheet as comma text, as a command script, as a spreadsheet or as a book; of the last two then
// also a plain copy through the same streams. Or times one read of some columns only, told by number. Prints
// "name value" lines: seconds, counts and bytes.

#include "hostfiles/script/script.h"
#include "hostfiles/tbk/tbk.h"
#include "hostfiles/tss/tss.h"
#include "interface/process_request.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <iterator>
#include <malloc.h>
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

/// What is asked for on the command line.
struct Task {
    const char* input;
    const char* output = nullptr;   ///< null: the input is read, no more
    const char* columns = nullptr;  ///< not null: their numbers, with commas between them
    std::string_view form = "packed";
    bool utf8 = false;  ///< the request's text is UTF-8
};

bool Fail_On(const char* name, const char* done)
{
    Close_Message_File();
    std::fprintf(stderr, "time_text: %s could not be %s\n", name, done);
    return false;
}

bool Time_Reading(const Task& task)
{
    Start_Request();
    Use_Utf8_Text(task.utf8);
    if (task.columns != nullptr)
        Keep_Columns_Of(task.columns);
    Print_Memory("before");
    const bool read = Time("read_seconds", [&] { return Read_Input(task.input); });
    Print_Memory("after_read");
    if (!read || Current_Sheet == nullptr)
        return Fail_On(task.input, "read");
    std::printf("rows %lld\ncolumns %lld\n", static_cast<long long>(Current_Sheet->row_count),
                static_cast<long long>(Current_Sheet->column_count));
    return true;
}

bool Time_Writing(const Task& task)
{
    request.CSV_Output = true;
    request.Packed_Csv_Output = task.form == "packed";
    request.settings.csv_title = 0;
    Current_Sheet->settings.csv_title = 0;
    const bool written = Time("write_seconds", [&] { return Write_As(task.form, task.output); });
    Print_Memory("after_write");
    return written || Fail_On(task.output, "written");
}

bool Time_Copy(const Task& task)
{
    const std::string copy = std::string(task.output) + ".copy";
    const bool copied = Time("copy_seconds", [&] { return Copy_File(task.output, copy); });
    Delete_File(copy);
    return copied;
}

bool Do(const Task& task)
{
    if (!Time_Reading(task))
        return false;
    if (task.output == nullptr)
        return true;
    const bool written = Time_Writing(task);
    Free_Sheets();
    return written && ((task.form != "tss" && task.form != "tbk") || Time_Copy(task));
}

/// What is freed stays with the process: a virtual machine may take its time to find memory.
void Hold_Memory()
{
    mallopt(M_MMAP_MAX, 0);
    mallopt(M_TRIM_THRESHOLD, -1);
}

}  // namespace

int main(int count, char** arguments)
{
    const bool held = count > 1 && std::string_view(arguments[1]) == "--held";
    if (held)
        ++arguments, --count;
    const bool utf8 = count > 1 && std::string_view(arguments[1]) == "--utf8";
    if (utf8)
        ++arguments, --count;
    Task task{count > 1 ? arguments[1] : nullptr};
    task.utf8 = utf8;
    if (count == 3)
        task.columns = arguments[2];
    if (count == 4) {
        task.output = arguments[2];
        task.form = arguments[3];
    }
    if (count < 2 || count > 4 || std::ranges::find(Forms, task.form) == std::end(Forms)) {
        std::fputs(
            "usage: time_text [--held] [--utf8] FILE [OUTPUT packed|padded|script|tss|tbk]\n"
            "       time_text [--held] [--utf8] FILE COLUMN,COLUMN...\n"
            "--held does all of it twice, the second time in the memory of the first;\n"
            "of lines with the same name the last one counts. --utf8 reads and writes as for people.\n",
            stderr);
        return 2;
    }
    if (held) {
        Hold_Memory();
        if (!Do(task))
            return 1;
        Free_Sheets();
    }
    return Do(task) ? 0 : 1;
}

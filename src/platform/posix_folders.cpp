#include "platform/folders.h"

#include "platform/refusals.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <climits>
#include <cstdlib>
#include <ctime>
#include <initializer_list>

#include <sys/stat.h>
#include <sys/statvfs.h>
#include <unistd.h>

namespace ingester {

namespace {

constexpr char Native_Separator = '/';
constexpr char Request_Separator = '\\';

bool Is_Separator(char c)
{
    return c == Native_Separator || c == Request_Separator;
}

std::string With_Separator(std::string_view name, char separator)
{
    std::string text(name);
    std::replace_if(text.begin(), text.end(), Is_Separator, separator);
    return text;
}

/// A native path off the heap. The system takes no longer ones; here they are empty.
class Stack_Path {
public:
    explicit Stack_Path(std::string_view name)
    {
        const std::size_t length = name.size() < bytes_.size() ? name.size() : 0;
        std::replace_copy_if(name.begin(), name.begin() + length, bytes_.begin(), Is_Separator,
                             Native_Separator);
        bytes_[length] = '\0';
    }
    [[nodiscard]] const char* c_str() const { return bytes_.data(); }

private:
    std::array<char, PATH_MAX> bytes_;
};

bool Look_At(std::string_view name, struct stat& facts)
{
    return ::stat(Stack_Path(name).c_str(), &facts) == 0;
}

}  // namespace

std::string Native_Path(std::string_view name)
{
    return With_Separator(name, Native_Separator);
}

std::string Request_Path(std::string_view native)
{
    return With_Separator(native, Request_Separator);
}

std::string Get_Temp_Folder()
{
    for (const char* variable : {"TMPDIR", "TMP", "TEMP"}) {
        const char* const folder = std::getenv(variable);
        if (folder == nullptr || *folder == '\0')
            continue;
        std::string name = Request_Path(folder);
        if (name.back() != Request_Separator)
            name += Request_Separator;
        return name;
    }
    return "\\tmp\\";
}

long Process_Id()
{
    return static_cast<long>(::getpid());
}

bool File_Exists(std::string_view name)
{
    struct stat facts;
    return Look_At(name, facts) && !S_ISDIR(facts.st_mode);
}

bool Folder_Exists(std::string_view name)
{
    struct stat facts;
    return Look_At(name, facts) && S_ISDIR(facts.st_mode);
}

std::uint64_t Scratch_Room(std::string_view folder)
{
    struct statvfs space;
    if (::statvfs(Native_Path(folder).c_str(), &space) != 0)
        return 0;
    return std::uint64_t{space.f_bavail} * space.f_frsize / 10 * 9;
}

bool Is_Special_File(std::string_view name)
{
    struct stat facts;
    return Look_At(name, facts) && !S_ISREG(facts.st_mode) && !S_ISDIR(facts.st_mode);
}

bool Same_File(std::string_view a, std::string_view b)
{
    struct stat facts_a;
    struct stat facts_b;
    return Look_At(a, facts_a) && Look_At(b, facts_b) && facts_a.st_dev == facts_b.st_dev
           && facts_a.st_ino == facts_b.st_ino;
}

bool Delete_File(std::string_view name) noexcept
{
    return (Allowed(Asked::remove) && ::unlink(Stack_Path(name).c_str()) == 0) || !File_Exists(name);
}

bool Replace_File(std::string_view from, std::string_view to)
{
    const std::string from_path = Native_Path(from);
    struct stat facts;
    if (Look_At(to, facts))
        static_cast<void>(::chmod(from_path.c_str(), facts.st_mode & 07777));  // where that is ours to do
    return Allowed(Asked::rename) && ::rename(from_path.c_str(), Native_Path(to).c_str()) == 0;
}

std::string Resolved_Name(std::string_view name)
{
    std::array<char, PATH_MAX> whole;
    const bool there = ::realpath(Native_Path(name).c_str(), whole.data()) != nullptr;
    return there ? Request_Path(whole.data()) : std::string(name);
}

bool Make_Link(std::string_view name, std::string_view file)
{
    std::array<char, PATH_MAX> whole;
    return ::realpath(Native_Path(file).c_str(), whole.data()) != nullptr
           && ::symlink(whole.data(), Native_Path(name).c_str()) == 0;
}

std::string_view Folder_Of(std::string_view name)
{
    return name.substr(0, name.size() - File_Part_Of(name).size());
}

std::string_view File_Part_Of(std::string_view name)
{
    const std::size_t last = name.find_last_of("\\/");
    return last == std::string_view::npos ? name : name.substr(last + 1);
}

std::size_t Extension_Start(std::string_view name)
{
    const std::string_view file = File_Part_Of(name);
    const std::size_t dot = file.rfind('.');
    return dot == std::string_view::npos ? name.size() : name.size() - file.size() + dot;
}

std::string With_Extension(std::string_view name, std::string_view extension)
{
    return std::string(name.substr(0, Extension_Start(name))).append(extension);
}

std::string Find_Companion(const std::string& name)
{
    const std::size_t start = Extension_Start(name);
    std::string small = name;
    std::string capital = name;
    std::transform(name.begin() + static_cast<std::ptrdiff_t>(start), name.end(),
                   small.begin() + static_cast<std::ptrdiff_t>(start), To_Lower);
    std::transform(name.begin() + static_cast<std::ptrdiff_t>(start), name.end(),
                   capital.begin() + static_cast<std::ptrdiff_t>(start), To_Upper);
    for (const std::string* const form : std::initializer_list<const std::string*>{&name, &small, &capital})
        if (File_Exists(*form))
            return *form;
    return name;
}

Local_Time Local_Time_Now()
{
    const std::time_t now = std::time(nullptr);
    std::tm parts{};
    ::localtime_r(&now, &parts);
    return {parts.tm_hour, parts.tm_min, parts.tm_sec, parts.tm_mon + 1, parts.tm_mday, parts.tm_year + 1900};
}

}  // namespace ingester

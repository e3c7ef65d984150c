#include "platform/files.h"
#include "platform/folders.h"
#include "platform/host_settings.h"
#include "support/text.h"

#include <array>
#include <climits>
#include <cstdlib>

#include <unistd.h>

namespace ingester {

namespace {

constexpr std::size_t Longest_Line = 4096;

std::string Settings_File_Name()
{
    if (std::string named = Environment_Value("TABULON_SETTINGS"); !named.empty())
        return named;
    std::string folder = Environment_Value("XDG_CONFIG_HOME");
    if (folder.empty())
        folder = Environment_Value("HOME").append("/.config");
    return folder.append("/tabulon/settings.ini");
}

/// "[name]".
bool Is_Group(std::string_view line, std::string_view name)
{
    return line.size() == name.size() + 2 && line.back() == ']'
           && Equal_Ignoring_Case(line.substr(1, name.size()), name);
}

}  // namespace

std::string Host_Setting(std::string_view group, std::string_view key)
{
    Input_File file;
    std::string line;
    bool in_group = false;
    if (!file.Open(Settings_File_Name()))
        return {};
    while (file.Read_Line(line, Longest_Line)) {
        const std::string_view text = Trim_Copy(line);
        const std::size_t equals = text.find('=');
        if (text.starts_with('['))
            in_group = Is_Group(text, group);
        else if (in_group && equals != std::string_view::npos
                 && Equal_Ignoring_Case(Trim_Copy(text.substr(0, equals)), key))
            return std::string(Trim_Copy(text.substr(equals + 1)));
    }
    return {};
}

std::string Install_Folder()
{
    std::array<char, PATH_MAX> path;
    const ::ssize_t length = ::readlink("/proc/self/exe", path.data(), path.size());
    std::string_view folder(path.data(), length > 0 ? static_cast<std::size_t>(length) : 0);
    for (int level = 0; level < 2; ++level)
        folder = folder.substr(0, folder.rfind('/') == std::string_view::npos ? 0 : folder.rfind('/'));
    return Request_Path(folder).append("\\");
}

std::string Environment_Value(std::string_view name)
{
    const char* const value = std::getenv(std::string(name).c_str());
    return value == nullptr ? std::string() : value;
}

}  // namespace ingester

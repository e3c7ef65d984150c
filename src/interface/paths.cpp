#include "interface/paths.h"

#include "platform/download.h"
#include "platform/folders.h"
#include "platform/host_settings.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

constexpr std::string_view Url_Starts[] = {"ftp:", "http:", "https:", "file:"};

std::string Temporary_Folder(std::string_view)
{
    return Get_Temp_Folder();
}

std::string Installed_Folder(std::string_view sub_folder)
{
    return Install_Folder().append(sub_folder);
}

template <const char* group, const char* key> std::string Set_Folder(std::string_view)
{
    return Request_Path(Host_Setting(group, key));
}

constexpr char Options_Group[] = "Options";
constexpr char Version_32_Group[] = "Version32";
constexpr char Version_64_Group[] = "Version64";
constexpr char Add_In_Key[] = "AddInFolder";
constexpr char Location_Key[] = "Location";

/// A text that stands for a folder, wherever it stands in a name.
struct Path_Token {
    std::string_view token;
    std::string (*folder)(std::string_view sub_folder);
    std::string_view sub_folder;
};

/// In the order in which they are searched.
constexpr Path_Token Path_Tokens[] = {
    {"%TMP%", Temporary_Folder, ""},
    {"%TEMP%", Temporary_Folder, ""},
    {"%TABDIR%", Installed_Folder, ""},
    {"%DATA%", Installed_Folder, "Data\\"},
    {"%EXAMPLES%", Installed_Folder, "Examples\\"},
    {"%PROCLIB%", Installed_Folder, "Proclib\\"},
    {"%SYSTEMADDINS%", Installed_Folder, "Addins\\"},
    {"%USERADDINS%", Set_Folder<Options_Group, Add_In_Key>, ""},
    {"%TABDIR32%", Set_Folder<Version_32_Group, Location_Key>, ""},
    {"%TABDIR64%", Set_Folder<Version_64_Group, Location_Key>, ""},
};

/// Where the "\" behind "%NAME%" at the start of `name` stands, or npos.
std::size_t Variable_End(std::string_view name)
{
    const std::size_t end = name.find('\\');
    const bool variable =
        name.starts_with('%') && end != std::string_view::npos && end > 2 && name[end - 1] == '%';
    return variable ? end : std::string_view::npos;
}

/// The first token of the table that `name` holds; null for none.
const Path_Token* Token_In(std::string_view name)
{
    const auto* const found = std::ranges::find_if(Path_Tokens, [name](const Path_Token& row) {
        return Find_Ignoring_Case(name, row.token) != std::string_view::npos;
    });
    return found == std::end(Path_Tokens) ? nullptr : found;
}

bool Expand_Folder(std::string& name, std::string_view temp_folder)
{
    const Path_Token* const row = Token_In(name);
    if (row == nullptr)
        return false;
    const bool temporary = row->folder == Temporary_Folder;
    std::string folder = temporary ? std::string(temp_folder) : row->folder(row->sub_folder);
    if (folder.empty())
        return false;
    const std::string rest = name.substr(Find_Ignoring_Case(name, row->token) + row->token.size());
    if (temporary && rest.starts_with('\\') && folder.ends_with('\\'))
        folder.pop_back();
    name = folder + rest;
    return true;
}

bool Expand_Variable(std::string& name)
{
    const std::size_t end = Variable_End(name);
    if (end == std::string_view::npos)
        return false;
    std::string value = Request_Path(Environment_Value(std::string_view(name).substr(1, end - 2)));
    if (value.empty())
        return false;
    if (value.ends_with('\\'))
        value.pop_back();
    name = value + name.substr(end);
    return true;
}

}  // namespace

bool Is_Url(std::string_view name)
{
    return std::any_of(std::begin(Url_Starts), std::end(Url_Starts),
                       [name](std::string_view start) { return Starts_Ignoring_Case(name, start); });
}

bool Holds_Path_Token(std::string_view name)
{
    return !Is_Url(name) && (Token_In(name) != nullptr || Variable_End(name) != std::string_view::npos);
}

void Expand_Path_Tokens(std::string& name, std::string_view temp_folder)
{
    if (Is_Url(name) || name.size() > Longest_Token_Name)
        return;
    const bool folder = Expand_Folder(name, temp_folder);
    if ((Expand_Variable(name) || folder) && name.size() > Longest_Expanded_Name)
        name.resize(Longest_Expanded_Name);
}

namespace {

bool Starts_As_Number(std::string_view text)
{
    if (text.starts_with('-') || text.starts_with('+'))
        text.remove_prefix(1);
    return !text.empty() && Is_Digit(text.front());
}

}  // namespace

std::int32_t Read_Host_Setting(std::string_view group, std::string_view key, std::int32_t low,
                               std::int32_t high, std::int32_t otherwise)
{
    const std::string text = Host_Setting(group, key);
    const long number = Leading_Integer(text);
    return !Starts_As_Number(text) || number < low || number > high ? otherwise
                                                                    : static_cast<std::int32_t>(number);
}

std::string Host_Delete_Marker()
{
    const std::string version = Host_Setting("Host", "Version");
    const std::size_t point = version.find('.');
    const long major = Leading_Integer(version);
    const long minor =
        point == std::string::npos ? 0 : Leading_Integer(std::string_view(version).substr(point + 1));
    return major < 1 || minor < 0 ? "T181D" : Format_Text("T%li%liD", major, minor);
}

bool Is_Host_Scratch_File(std::string_view name)
{
    const std::string temp = Get_Temp_Folder();
    const std::string_view folder = Folder_Of(name);
    const bool in_temp = folder.empty() ? temp == ".\\" : Equal_Ignoring_Case(folder, temp);
    return in_temp && Starts_Ignoring_Case(File_Part_Of(name), request.Return_Delete_Marker)
           && Ends_With_One_Of(name, ".TSS .TBK");
}

namespace {

/// The URL's own extension, when it is a short one.
std::string_view Scratch_Extension(std::string_view url)
{
    constexpr std::size_t longest = 8;
    const std::string_view extension = url.substr(Extension_Start(url));
    return extension.empty() || extension.size() > longest ? ".dat" : extension;
}

Download_Limits Limits_Of_Host(const std::string& temp_folder)
{
    constexpr std::int32_t longest = 86400;
    Download_Limits limits;
    limits.connect_seconds = Read_Host_Setting("Download", "ConnectSeconds", 1, longest, 30);
    limits.total_seconds = Read_Host_Setting("Download", "TotalSeconds", 1, longest, 1800);
    limits.bytes = Scratch_Room(temp_folder);
    return limits;
}

}  // namespace

bool Fetch_Url(std::string& name, std::string_view label, std::string& source_url,
               const std::string& temp_folder, bool& downloaded)
{
    downloaded = false;
    if (!Is_Url(name))
        return true;
    std::string url = name;
    std::replace(url.begin(),
                 url.begin() + static_cast<std::ptrdiff_t>(std::min(url.size(), Long_Name_Width)), '\\', '/');
    std::string scratch =
        std::string(temp_folder).append(label).append(request.Scratch_Stem).append(Scratch_Extension(name));
    if (!Download(url, scratch, Limits_Of_Host(temp_folder)))
        return false;
    source_url = std::move(url);
    name = std::move(scratch);  // nothing may fail from here to the mark that has it deleted
    downloaded = true;
    return true;
}

}  // namespace ingester

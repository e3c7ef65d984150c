#include "interface/paths.h"

#include "interface/request/request.h"
#include "platform/folders.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

constexpr std::string_view Url_Starts[] = {"ftp:", "http:", "https:", "file:"};

/// Texts that stand for folders wherever they stand in a name.
constexpr std::string_view Path_Tokens[] = {
    "%TMP%",     "%TEMP%",         "%TABDIR%",     "%DATA%",     "%EXAMPLES%",
    "%PROCLIB%", "%SYSTEMADDINS%", "%USERADDINS%", "%TABDIR32%", "%TABDIR64%",
};

/// "%NAME%\\" at the start.
bool Begins_With_Variable(std::string_view name)
{
    const std::size_t folder = Folder_Of(name).find('\\');
    return name.starts_with('%') && folder != std::string_view::npos && folder > 1 && name[folder - 1] == '%';
}

}  // namespace

bool Holds_Path_Token(std::string_view name)
{
    return !Is_Url(name)
           && (Begins_With_Variable(name) || std::ranges::any_of(Path_Tokens, [name](std::string_view token) {
                   return Find_Ignoring_Case(name, token) != std::string_view::npos;
               }));
}

bool Is_Host_Scratch_File(std::string_view name)
{
    const std::string temp = Get_Temp_Folder();
    const std::string_view folder = Folder_Of(name);
    const bool in_temp = folder.empty() ? temp == ".\\" : Equal_Ignoring_Case(folder, temp);
    return in_temp && Starts_Ignoring_Case(File_Part_Of(name), request.Return_Delete_Marker)
           && (Ends_Ignoring_Case(name, ".TSS") || Ends_Ignoring_Case(name, ".TBK"));
}

bool Is_Url(std::string_view name)
{
    return std::any_of(std::begin(Url_Starts), std::end(Url_Starts),
                       [name](std::string_view start) { return Starts_Ignoring_Case(name, start); });
}

bool Fetch_Url(std::string& name, std::string_view, std::string&, bool& downloaded)
{
    downloaded = false;
    return !Is_Url(name);
}

}  // namespace ingester

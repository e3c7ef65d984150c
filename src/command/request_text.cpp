#include "command/request_text.h"

#include "interface/paths.h"
#include "interface/people_options.h"
#include "interface/slash_options.h"
#include "platform/folders.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <cstddef>
#include <cstdint>
#include <iterator>

namespace ingester {

namespace {

/// Messages cut no name shorter than this.
constexpr std::size_t Shortest_Cut = 100;

/// One text that a message may hold, and what it becomes.
struct Spelling {
    std::string_view request;
    std::string_view native;
    bool may_be_cut;
};

/// The forms of one name, the longest first. Without a folder both names are the same anyway.
std::array<Spelling, 4> Spellings_Of(const Sent_Name& name)
{
    const std::string_view request = name.request;
    const std::string_view native = name.native;
    std::array<Spelling, 4> spellings{{{request, native, true}}};
    if (request.size() != native.size())
        return spellings;  // a stand-in of ours: its parts mean nothing to the user
    const std::size_t folder = Folder_Of(request).size();
    const std::size_t lengths[] = {Extension_Start(request), folder, folder > 1 ? folder - 1 : 0};
    for (std::size_t i = 0; i < std::size(lengths); ++i)
        spellings[i + 1] = {request.substr(0, lengths[i]), native.substr(0, lengths[i]), false};
    return spellings;
}

/// Names in messages stand between these.
constexpr std::string_view Before_A_Name = " \t\r\n'\"`(:=";
constexpr std::string_view Behind_A_Name = " \t\r\n'\"`).,;:";

/// How much of `message`, which begins at a possible start of a name, is `spelling`; 0 when none.
std::size_t Match_Length(std::string_view message, const Spelling& spelling)
{
    const std::size_t common = Common_Start(message, spelling.request);
    if (common == spelling.request.size())
        return common == message.size() || Behind_A_Name.find(message[common]) != std::string_view::npos
                   ? common
                   : 0;
    return spelling.may_be_cut && common >= Shortest_Cut ? common : 0;
}

struct Found_Name {
    std::size_t length = 0;  ///< in the message; 0 when no name was found
    std::string_view native;
};

/// The longest spelling that `message` begins with. A cut one is as short in its native form.
Found_Name Name_At_Start(std::string_view message, const std::array<std::array<Spelling, 4>, 2>& all)
{
    Found_Name found;
    for (const auto& spellings : all) {
        for (const Spelling& spelling : spellings) {
            const std::size_t length = Match_Length(message, spelling);
            const bool same_size = spelling.native.size() == spelling.request.size();
            if (length > found.length)
                found = {length, same_size ? spelling.native.substr(0, length) : spelling.native};
        }
    }
    return found;
}

}  // namespace

std::string Fault_Of_Name(std::string_view native)
{
    if (Native_Path(Request_Path(native)) != native)
        return "a request reads the backslash in this name as the end of a folder's name; "
               "rename the file, or give it another name by a link";
    if (Trim_Copy(native) != native)
        return "a request drops blanks at the ends of a name; rename the file, or use a link";
    if (Is_Url(native))
        return {};
    if (Holds_Path_Token(Request_Path(native)))
        return "a request puts a folder in the place of a name between per cent signs; "
               "rename the file or its folder, or use a link";
    return {};
}

namespace {

/// What `asked` says once input options are taken.
template <class Asked> auto Input_Options_Ask_For(std::string_view options, Asked asked)
{
    std::string rest(options);
    std::string none;
    Take_People_Options(rest, none);
    static_cast<void>(Cut_Options(Genotype_Options(), rest));
    static_cast<void>(Cut_Options(Input_Options(), rest));
    const auto result = asked();
    request = Request_Globals{};
    return result;
}

/// Whether output options, once they are taken, make `asked` true.
template <class Asked> bool Options_Ask_For(std::string_view options, Asked asked)
{
    std::string rest(options);
    const Reflow_Order reflow = Take_Reflow_Order(rest);
    std::string none;
    Take_People_Options(rest, none);
    static_cast<void>(Cut_Options(Output_Options(), rest));
    const bool result = !reflow.asked && asked();
    request = Request_Globals{};
    return result;
}

}  // namespace

bool Options_Add_To_Output(std::string_view options)
{
    return Options_Ask_For(options,
                           [] { return request.Add_To_Output || request.Add_Mode != Add_Modes::none; });
}

bool Options_Join_With_Output(std::string_view options)
{
    return Options_Ask_For(options, [] { return request.Add_Mode != Add_Modes::none; });
}

std::int32_t Options_Rewrite_Lines(std::string_view options)
{
    std::string rest(options);
    return Take_Reflow_Order(rest).fields;
}

bool Options_Name_Joined_Sheet(std::string_view options)
{
    return Options_Ask_For(
        options, [] { return request.Add_Mode != Add_Modes::none && !request.Output_Sheet_Name.empty(); });
}

bool Options_Keep_Columns(std::string_view options)
{
    return Input_Options_Ask_For(
        options, [] { return request.First_Column > 0 || request.Last_Column < Every_Column; });
}

bool Options_Print_Summary(std::string_view options)
{
    return Input_Options_Ask_For(options, [] { return request.Print_Summary && !request.List_Sheets_Only; });
}

std::string Report_Of_Options(std::string_view options)
{
    return Input_Options_Ask_For(options, [] { return std::string(request.Loss_Report_Name.view()); });
}

std::string With_Native_Names(std::string_view message, const Sent_Name& input, const Sent_Name& output)
{
    const std::array<std::array<Spelling, 4>, 2> all{Spellings_Of(input), Spellings_Of(output)};
    std::string told;
    bool name_may_start = true;
    while (!message.empty()) {
        const Found_Name found = name_may_start ? Name_At_Start(message, all) : Found_Name{};
        const std::size_t taken = std::max<std::size_t>(found.length, 1);
        told.append(found.length > 0 ? found.native : message.substr(0, 1));
        name_may_start = Before_A_Name.find(message[taken - 1]) != std::string_view::npos;
        message.remove_prefix(taken);
    }
    return told;
}

}  // namespace ingester

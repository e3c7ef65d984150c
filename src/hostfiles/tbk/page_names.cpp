#include "hostfiles/tbk/page_names.h"

#include "hostfiles/shared/host_text.h"
#include "hostfiles/tbk/tbk.h"
#include "request/losses.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

bool Read_Sheet_Table(Book_Source& source, std::int32_t sheets, Sheet_Offsets& offsets)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(std::int32_t));
    if (source.Record().length != size * sheets)
        return source.Corrupt();
    offsets.clear();
    for (std::int32_t i = 0; i < sheets; ++i)  // grows as the bytes come, whatever the head claims
        if (!source.Read(offsets.emplace_back()))
            return false;
    return true;
}

namespace {

/// Walks to the table of sheets, which stands among the first records.
bool Find_Sheet_Table(Book_Source& source, Sheet_Offsets& offsets)
{
    constexpr long most_records = 1000;
    std::int32_t sheets = -1;
    while (source.Record().number < most_records && source.Next_Record()) {
        if (source.Record().type == book_start_record && (!source.Read(sheets) || sheets < 0))
            return false;
        if (source.Record().type == sheet_table_record)
            return sheets >= 0 && Read_Sheet_Table(source, sheets, offsets);
    }
    return false;
}

}  // namespace

bool List_Pages(Input_File& file, Sheet_Offsets& offsets, std::vector<std::string>& names)
{
    Book_Source source(file, Book_Walker::lister, file.Name());
    if (!source.Read_Head() || !Find_Sheet_Table(source, offsets))
        return false;
    names.clear();
    for (const std::int32_t offset : offsets)
        if (!source.Peek_Page_Name(offset, names.emplace_back()))
            return false;
    return true;
}

std::optional<std::vector<std::string>> Read_Page_Names(const char* file_name)
{
    Input_File file;
    Sheet_Offsets offsets;
    std::vector<std::string> names;
    if (!file.Open(file_name) || !List_Pages(file, offsets, names))
        return std::nullopt;
    return names;
}

std::size_t Sheet_Number_Of(std::string_view request_text, std::size_t sheets)
{
    const long number = Leading_Integer(request_text);
    const bool whole = number > 0 && request_text == std::to_string(number);
    return whole && static_cast<std::size_t>(number) <= sheets ? static_cast<std::size_t>(number) : 0;
}

std::string Page_Name_Of(const Sheet& sheet)
{
    const std::string_view asked = request.Output_Sheet_Name;
    const std::string_view name = sheet.sheet_name.empty() ? asked : sheet.sheet_name.view();
    if (name.empty())
        return "Sheet1";
    std::string held = As_Held_By_Host(First_Letters(name, Page_Name_Width));
    if (const std::string_view whole = asked.starts_with(name) ? asked : name; held != whole)
        Note_Loss(Loss_Kind::name_changed, {}, 0, std::string("sheet ").append(whole));
    return held;
}

std::string Add_Unique_Page_Name(std::vector<std::string>& names, std::string_view name)
{
    constexpr long most_tries = 999;
    constexpr std::string_view automatic = "Sheet";
    const bool numbered = name.starts_with(automatic) && Leading_Integer(name.substr(automatic.size())) > 0;
    const auto taken = [&](const std::string& candidate) {
        return std::ranges::any_of(names,
                                   [&](const std::string& other) { return Equal_Folded(other, candidate); });
    };
    std::string candidate(name);
    for (long n = 1; n <= most_tries && taken(candidate); ++n) {
        const std::string_view base = First_Letters(name, n < 10 ? 29 : n < 100 ? 28 : 27);
        candidate =
            numbered ? Format_Text("Sheet%li", n) : Format_Text("%s_%li", std::string(base).c_str(), n);
    }
    names.push_back(candidate);
    return candidate;
}

}  // namespace ingester

#include "hostfiles/shared/host_sheet.h"
#include "request/messages.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <set>
#include <string>
#include <unordered_map>
#include <vector>

namespace ingester {

namespace {

constexpr std::size_t Most_Levels = 7;

/// One bracket of a member's name.
struct Member_Level {
    std::string text;
    bool quoted;
    long number;  ///< 0: still to be found
};

struct Member {
    Column* column;
    std::string key;  ///< stem and numbers of the outer levels, case folded
    std::string stem;
    std::vector<Member_Level> levels;
};

/// Takes one bracket off the front of `rest`. False where none stands.
bool Take_Level(std::string_view& rest, Member_Level& level)
{
    const bool quoted = rest.starts_with("['");
    const std::size_t open = quoted ? 2 : 1;
    const std::size_t end = rest.find(quoted ? "']" : "]", open);
    if (!rest.starts_with('[') || end == std::string_view::npos || end < open)
        return false;
    const std::string_view text = rest.substr(open, end - open);
    if (!quoted && (text.empty() || !std::ranges::all_of(text, Is_Digit)))
        return false;
    level = {std::string(text), quoted, quoted ? 0 : Leading_Integer(text)};
    rest.remove_prefix(end + open);
    return true;
}

/// Takes a name apart. False for a name that is no member of a pointer.
bool Take_Apart(Column& column, Member& member)
{
    std::string_view rest = column.name;
    const std::size_t open = std::min(rest.find('['), rest.size());
    member = {&column, Folded(rest.substr(0, open)), std::string(rest.substr(0, open)), {}};
    rest.remove_prefix(open);
    Member_Level level;
    while (!rest.empty()) {
        if (!Take_Level(rest, level))
            return false;
        if (member.levels.size() == Most_Levels) {
            Report_Message("Too many nested pointers (must no more than than 6 deep).\n");
            break;
        }
        member.levels.push_back(level);
    }
    return open > 0 && !member.levels.empty();
}

/// The numbers of one level, below one stem and the same outer numbers.
struct Level_Numbers {
    std::set<long> taken;
    std::unordered_map<std::string, long> by_text;
    long next = 1;  ///< all below are taken

    long Number_Of(const std::string& text)
    {
        long& number = by_text[text];
        if (number == 0) {
            while (taken.contains(next))
                ++next;
            number = next++;
        }
        return number;
    }
};

void Number_Level(std::vector<Member>& members, std::size_t depth)
{
    std::unordered_map<std::string, Level_Numbers> numbers;
    for (const Member& member : members)
        if (depth < member.levels.size() && !member.levels[depth].quoted)
            numbers[member.key].taken.insert(member.levels[depth].number);
    for (Member& member : members) {
        if (depth >= member.levels.size())
            continue;
        Member_Level& level = member.levels[depth];
        if (level.quoted)
            level.number = numbers[member.key].Number_Of(Folded(level.text));
        member.key.append("[").append(std::to_string(level.number));
    }
}

void Rename_Member(const Member& member)
{
    if (std::ranges::none_of(member.levels, &Member_Level::quoted))
        return;
    std::string name = member.stem;
    std::string texts;
    for (const Member_Level& level : member.levels) {
        name.append(Format_Text("[%li]", level.number));
        texts.append(level.quoted ? "['" : "[").append(level.text).append(level.quoted ? "']" : "]");
    }
    member.column->name = name;
    if (member.column->extra.empty())
        member.column->extra = texts;
}

}  // namespace

void Restore_Pointer_Names(Sheet* sheet)
{
    if (sheet == nullptr || sheet->settings.bracket_names != 0)
        return;
    std::vector<Member> members;
    bool any_quoted = false;
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next)
        any_quoted = any_quoted || column->name.view().find("['") != std::string_view::npos;
    if (!any_quoted)
        return;
    Member member;
    for (Column* column = sheet->first_column->next; column != nullptr; column = column->next)
        if (Take_Apart(*column, member))
            members.push_back(member);
    for (std::size_t depth = 0; depth < Most_Levels; ++depth)
        Number_Level(members, depth);
    for (const Member& each : members)
        Rename_Member(each);
}

}  // namespace ingester

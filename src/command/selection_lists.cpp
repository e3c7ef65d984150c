#include "command/selection_lists.h"

#include "interface/var_file.h"
#include "model/names.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "support/text.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <charconv>
#include <cstdint>
#include <map>
#include <optional>
#include <string_view>

namespace ingester {

namespace {

/// The last column or row that a list may name: its list has a line for each one in front of it.
constexpr std::int64_t Greatest_Number = 100'000'000;

/// The most columns that a list may name.
constexpr long Most_Columns = 10'000'000;

struct Type_Mark {
    std::string_view type;
    std::string_view mark;
};
constexpr Type_Mark Type_Marks[] = {
    {"factor", "!"}, {"text", "$"}, {"number", "#"}, {"date", ":D"}, {"time", ":T"},
};

struct Number_Range {
    std::int64_t first;
    std::int64_t last;
};

std::optional<std::int64_t> Whole_Number(std::string_view text)
{
    std::int64_t number = 0;
    const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
    const bool whole = error == std::errc() && end == text.data() + text.size();
    return whole && number >= 1 && number <= Greatest_Number ? std::optional(number) : std::nullopt;
}

/// "7", "3-9" or "3:9".
std::optional<Number_Range> Range_Of(std::string_view text)
{
    const std::size_t middle = std::min(text.find_first_of("-:"), text.size());
    const auto first = Whole_Number(Trim_Copy(text.substr(0, middle)));
    const auto last = middle == text.size() ? first : Whole_Number(Trim_Copy(text.substr(middle + 1)));
    if (!first || !last || *first > *last)
        return std::nullopt;
    return Number_Range{*first, *last};
}

bool Holds_Controls(std::string_view text)
{
    return std::ranges::any_of(text, [](char c) { return static_cast<unsigned char>(c) < ' '; });
}

/// Columns by number when all entries are numbers; the names of a host never are.
std::string Column_List(const std::vector<std::string>& keep, std::string& fault)
{
    std::string lines;
    long count = 0;
    const bool numbers =
        std::ranges::all_of(keep, [](const std::string& text) { return Range_Of(text).has_value(); });
    for (const std::string& text : keep) {
        if (Trim_Copy(text).empty() || Holds_Controls(text)) {
            fault = "--keep: '" + text + "' is no name of a column";
            return {};
        }
        if (!numbers) {
            lines.append(text).append("\n");
            ++count;
            continue;
        }
        const Number_Range range = *Range_Of(text);
        if (count + range.last - range.first >= Most_Columns) {
            fault = "--keep: these are more columns than a table can have";
            return {};
        }
        for (std::int64_t number = range.first; number <= range.last; ++number, ++count)
            lines.append(std::to_string(number)).append("\n");
    }
    return std::to_string(count).append(numbers ? "\nN\n" : "\nV\n").append(lines);
}

void Flag_Rows(std::string& flags, Number_Range rows)
{
    const auto last = static_cast<std::size_t>(rows.last);
    if (flags.size() < last)
        flags.resize(last, '0');
    std::fill(flags.begin() + rows.first - 1, flags.begin() + rows.last, '1');
}

/// One flag a line, for each row up to the last one that is kept.
std::string Row_List(const std::string& native, std::string& fault)
{
    constexpr std::size_t longest_line = 1000;
    Input_File file;
    std::string line;
    std::string flags;
    if (!file.Open(Request_Path(native))) {
        fault = "--rows: " + native + " can't be opened";
        return {};
    }
    for (long number = 1; file.Read_Line(line, longest_line); ++number) {
        const std::string_view text = Trim_Copy(line);
        if (text.empty() || text.starts_with('#'))
            continue;
        const auto rows = Range_Of(text);
        if (!rows) {
            fault = "--rows: line " + std::to_string(number) + " of " + native
                    + " is no row number or range of them, as 7 or 3-9 (up to 100000000)";
            return {};
        }
        Flag_Rows(flags, *rows);
    }
    std::string lines = std::to_string(flags.size()).append("\n");
    lines.reserve(lines.size() + 2 * flags.size());
    for (const char flag : flags)
        lines.append(1, flag).append("\n");
    return lines;
}

/// What becomes of one column.
struct Column_Change {
    std::string name;
    std::string_view mark;
    bool dropped = false;
};
using Column_Changes = std::map<std::string, Column_Change, std::less<>>;

/// "name=value" in two, both without outer blanks.
std::pair<std::string_view, std::string_view> Split_At_Equals(std::string_view text)
{
    const std::size_t equals = text.find('=');
    if (equals == std::string_view::npos)
        return {};
    return {Trim_Copy(text.substr(0, equals)), Trim_Copy(text.substr(equals + 1))};
}

std::string Take_Rename(const std::string& text, Column_Changes& changes)
{
    const auto [name, new_name] = Split_At_Equals(text);
    if (name.empty() || new_name.empty())
        return "--rename: '" + text + "' is not of the form OLD=NEW";
    if (Holds_Controls(text) || new_name.starts_with('*') || Strip_Name_Mark(new_name) != new_name)
        return "--rename: '" + std::string(new_name) + "' can't be the name of a column";
    changes[std::string(name)].name = new_name;
    return {};
}

std::string Take_Type(const std::string& text, Column_Changes& changes)
{
    const auto [name, type] = Split_At_Equals(text);
    const auto* const found = std::ranges::find(Type_Marks, type, &Type_Mark::type);
    if (name.empty() || Holds_Controls(text) || found == std::end(Type_Marks))
        return "--type: '" + text + "' is not NAME=factor, text, number, date or time";
    changes[std::string(name)].mark = found->mark;
    return {};
}

std::string Take_Drop(const std::string& text, Column_Changes& changes)
{
    const std::string_view name = Trim_Copy(text);
    if (name.empty() || Holds_Controls(name) || name.find('=') != std::string_view::npos)
        return "--drop: '" + text + "' is no name of a column";
    changes[std::string(name)].dropped = true;
    return {};
}

std::string Change_List(const Chosen_Data& chosen, std::string& fault)
{
    Column_Changes changes;
    const std::pair<const std::vector<std::string>&, std::string (*)(const std::string&, Column_Changes&)>
        steps[] = {{chosen.rename, Take_Rename}, {chosen.type, Take_Type}, {chosen.drop, Take_Drop}};
    for (const auto& [texts, take] : steps)
        for (const std::string& text : texts)
            if (fault = take(text, changes); !fault.empty())
                return {};
    std::string lines;
    for (const auto& [name, change] : changes) {
        lines.append(name).append("=");
        if (change.dropped)
            lines.append("*\n");
        else
            lines.append(change.name.empty() ? name : change.name).append(change.mark).append("\n");
    }
    return lines.empty() ? lines : std::string(By_Names_Line).append("\n").append(lines);
}

}  // namespace

void Offer_Choices(CLI::App& app, Chosen_Data& chosen)
{
    const struct {
        const char* name;
        std::vector<std::string>& texts;
        const char* type;
        const char* help;
    } lists[] = {
        {"--keep", chosen.keep, "NAME,...", "Columns to keep, by name; or by number, as 1,4-6"},
        {"--drop", chosen.drop, "NAME,...", "Columns to leave out"},
        {"--rename", chosen.rename, "OLD=NEW,...", "Columns that get another name"},
        {"--type", chosen.type, "NAME=TYPE,...", "Columns that become factor, text, number, date or time"},
    };
    for (const auto& list : lists)
        app.add_option(list.name, list.texts, list.help)
            ->type_name(list.type)
            ->delimiter(',')
            ->expected(1)
            ->take_all()
            ->group("Columns and rows");
    app.add_option("--rows", chosen.rows_file,
                   "File of the rows to keep: a number or a range such as 3-9 in each line")
        ->type_name("FILE")
        ->group("Columns and rows");
}

Choice_Lists Make_Lists(const Chosen_Data& chosen, std::string& fault)
{
    Choice_Lists lists;
    if (!chosen.keep.empty())
        lists.columns = Column_List(chosen.keep, fault);
    if (fault.empty() && !chosen.rows_file.empty())
        lists.rows = Row_List(chosen.rows_file, fault);
    if (fault.empty())
        lists.changes = Change_List(chosen, fault);
    return fault.empty() ? lists : Choice_Lists{};
}

}  // namespace ingester

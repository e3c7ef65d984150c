// The shape of a text: how many rows and columns, whether names come first, what the columns are.
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/names.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <algorithm>
#include <optional>
#include <string>
#include <unordered_map>
#include <vector>

namespace ingester {

namespace {

/// Whether the first line holds names: a number, a sign or "*" at the start of a field says no.
class Names_Decision {
public:
    explicit Names_Decision(const Text_Scan_Options& options) : options_(options) {}

    /// Looks at the first line of `text`.
    [[nodiscard]] bool Decide(std::string_view text)
    {
        for (const char c : text) {
            if (c == '\n' || c == '\r')
                break;
            if (Says_No(c))
                return false;
        }
        return true;
    }

private:
    bool Says_No(char c)
    {
        if (at_start_ && (Is_Digit(c) || c == '-' || c == '+' || c == '*'))
            return true;
        const bool quote = c == '"' || c == '\'';
        if (c == ' ' || c == '\t' || Separates(c))
            at_start_ = true;
        else if (quote && at_start_)
            at_start_ = !options_.separators_given;
        else if (c != '.' && !Passes_Over(c))
            at_start_ = false;
        return false;
    }

    [[nodiscard]] bool Separates(char c) const
    {
        return options_.separators_given && options_.separators.view().find(c) != std::string_view::npos;
    }

    [[nodiscard]] bool Passes_Over(char c) const
    {
        return !options_.separators_given && (c == ',' || c == ';' || c == '|');
    }

    const Text_Scan_Options& options_;
    bool at_start_ = true;
};

/// What the marks at the end of a name ask for: "!" a Factor, "$" Text, "#" a Variate.
void Take_Name_Mark(std::string_view name, Column_Scan& column)
{
    if (name.ends_with('!'))
        column.make_factor = true;
    else if (name.ends_with('$'))
        column.type = text_column;
    else if (name.ends_with('#'))
        column.type = variate_column;
}

/// Finds the entry of the wanted types that speaks of a column: by its name, by its place, or by its place
/// among the columns of the subset that the list was written for.
class Wanted_Entries {
public:
    Wanted_Entries()
    {
        const bool by_number = request.Subset_Columns && request.Subset_By_Number;
        const std::vector<std::string>& names =
            request.Column_Wanted_Names.empty() ? request.Subset_Names : request.Column_Wanted_Names;
        for (std::size_t i = 0; i < names.size(); ++i) {
            if (request.Column_Wanted_Names.empty() && by_number)
                places_.emplace(Leading_Integer(names[i]), i);
            else
                names_.emplace(names[i], i);
            names_.emplace(Name_In_Lists(names[i]), i);
        }
    }

    /// Nothing for a column that no entry speaks of.
    [[nodiscard]] std::optional<std::size_t> Find(std::size_t column, std::string_view name) const
    {
        if (request.Column_Wanted_Names.empty() && !request.Subset_Columns)
            return column;
        if (!places_.empty())
            return Find_In(places_, static_cast<long>(column) + 1);
        const std::string stripped = Strip_Name_Mark(name);
        const auto found = Find_In(names_, stripped);
        return found ? found : Find_In(names_, Name_In_Lists(stripped));
    }

private:
    template <class Map, class Key> static std::optional<std::size_t> Find_In(const Map& map, const Key& key)
    {
        const auto found = map.find(key);
        return found == map.end() ? std::nullopt : std::optional(found->second);
    }

    std::unordered_map<long, std::size_t> places_;
    std::unordered_map<std::string, std::size_t> names_;
};

/// A list of wanted types overrules the marks of the names.
void Take_Wanted_Type(std::size_t entry, Column_Scan& column)
{
    if (entry >= request.Column_Wanted_Types.size())
        return;
    const std::int32_t wanted = request.Column_Wanted_Types[entry];
    if (wanted <= 0)
        return;
    column.make_factor = wanted == factor_column;
    if (!column.make_factor)
        column.type = wanted;
}

/// Whether Text has to be Long Text shows when it is kept.
void Take_Field(const Field_Content& content, Column_Scan& column)
{
    double value;
    if (column.type == Undecided_Type && Kind_Of_Field(content, value) == Field_Kind::text)
        column.type = text_column;
}

/// Looks at the fields of one line; `names` when it is the line of names.
void Scan_Line(Field_Walker& walker, bool names, Text_Shape& shape)
{
    std::int32_t index = 0;
    do {
        const Text_Field field = walker.Next();
        if (index >= request.Max_Columns) {  // no Sheet takes more
            walker.Skip_Line();
            return;
        }
        if (index >= shape.columns) {
            shape.columns = index + 1;
            shape.types.emplace_back();
        }
        Column_Scan& column = shape.types[static_cast<std::size_t>(index++)];
        if (names)
            Take_Name_Mark(Trim_Copy(walker.Content(field).text), column);
        else
            Take_Field(walker.Content(field), column);
    } while (walker.Has_More());
}

/// The names of the columns, for lists that go by name.
std::vector<std::string> Names_Of_Line(Field_Walker& walker)
{
    std::vector<std::string> names;
    walker.Go_To(walker.First_Line());
    do
        names.emplace_back(Trim_Copy(walker.Content(walker.Next()).text));
    while (walker.Has_More());
    return names;
}

void Take_Wanted_Types(Field_Walker& walker, Text_Shape& shape)
{
    if (request.Column_Wanted_Types.empty())
        return;
    std::vector<std::string> names;
    if (shape.has_names)
        names = Names_Of_Line(walker);
    names.resize(shape.types.size());
    const Wanted_Entries entries;
    for (std::size_t index = 0; index < names.size(); ++index)
        if (const auto entry = entries.Find(index, names[index]))
            Take_Wanted_Type(*entry, shape.types[index]);
}

}  // namespace

bool Scan_Text_Dimensions(Text_Shape& shape, const Text_Scan_Options& options, const Text_Buffer& buffer,
                          std::int64_t lines)
{
    shape = Text_Shape{};
    Field_Walker walker(options, buffer);
    const char* const first = walker.First_Line();
    walker.Go_To(first);
    if (!walker.At_Line())
        return true;
    shape.has_names =
        options.names_mode == names_given
        || (options.names_mode == names_decided && Names_Decision(options).Decide({first, buffer.last}));
    const char* line = first;
    for (; walker.At_Line() && shape.rows < lines; ++shape.rows) {
        line = walker.Place();
        Scan_Line(walker, shape.rows == 0 && shape.has_names, shape);
        if (!Line_Is_Short_Enough({line, walker.Place()}, buffer.lines_before + shape.rows + 1))
            return false;
    }
    shape.bytes = static_cast<std::size_t>(walker.Place() - first);
    shape.whole = !walker.At_Line();
    if (shape.whole && walker.Is_Blank_Line(line))
        --shape.rows;
    Take_Wanted_Types(walker, shape);
    shape.nuls = walker.Nuls();
    if (!shape.whole)
        return true;
    for (Column_Scan& column : shape.types)
        if (column.type == Undecided_Type)
            column.type = variate_column;
    return true;
}

}  // namespace ingester

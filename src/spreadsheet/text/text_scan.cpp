// The shape of a text: how many rows and columns, whether names come first, what the columns are.
#include "interface/request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>

namespace ingester {

namespace {

/// Fields count for the type with so many characters.
constexpr std::size_t Scanned_Width = 180;

/// Whether the first line holds names: a number, a sign or "*" at the start of a field says no.
class Names_Decision {
public:
    explicit Names_Decision(const Text_Scan_Options& options) : options_(options) {}

    [[nodiscard]] bool Decide(const char* at)
    {
        for (; *at != '\n' && *at != '\0'; ++at)
            if (Says_No(*at))
                return false;
        return true;
    }

private:
    bool Says_No(char c)
    {
        if (at_start_ && (Is_Digit(c) || c == '-' || c == '+' || c == '*'))
            return true;
        const bool quote = c == '"' || c == '\'';
        if (c == '.' || (!options_.separators_given && (c == ',' || c == ';' || c == '|')))
            return false;
        if (c == ' ' || c == '\t')
            at_start_ = true;
        else if (quote && at_start_ && !options_.separators_given)
            return false;
        else
            at_start_ =
                options_.separators_given && options_.separators.view().find(c) != std::string_view::npos;
        return false;
    }

    const Text_Scan_Options& options_;
    bool at_start_ = true;
};

bool Is_Blank_Line(std::string_view line)
{
    return std::all_of(line.begin(), line.end(), Is_Blank_Or_Control);
}

/// Lines from `at` up to the first empty one; a blank one at the end doesn't count.
std::int64_t Count_Lines(const char* at, const char* last)
{
    std::int64_t lines = 0;
    std::string_view line;
    while (at != last && *at != '\n') {
        const void* const feed = std::memchr(at, '\n', static_cast<std::size_t>(last - at));
        const char* const end = feed == nullptr ? last : static_cast<const char*>(feed);
        line = {at, static_cast<std::size_t>(end - at)};
        ++lines;
        at = end == last ? last : end + 1;
    }
    return lines > 0 && Is_Blank_Line(line) ? lines - 1 : lines;
}

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

/// The entry of the wanted types that speaks of a column: its place, or its place among the columns
/// of the subset that the list was written for. Below 0 for none.
std::int64_t Wanted_Entry(std::int32_t column, std::string_view name)
{
    if (!request.Subset_Columns)
        return column;
    for (std::size_t i = 0; i < request.Subset_Names.size(); ++i) {
        const std::string& entry = request.Subset_Names[i];
        if (request.Subset_By_Number ? Leading_Integer(entry) == column + 1 : entry == name)
            return static_cast<std::int64_t>(i);
    }
    return -1;
}

/// A list of wanted types overrules the marks of the names.
void Take_Wanted_Type(std::int32_t index, std::string_view name, Column_Scan& column)
{
    const std::int64_t entry = Wanted_Entry(index, name);
    if (entry < 0 || entry >= static_cast<std::int64_t>(request.Column_Wanted_Types.size()))
        return;
    const std::int32_t wanted = request.Column_Wanted_Types[static_cast<std::size_t>(entry)];
    if (wanted <= 0)
        return;
    column.make_factor = wanted == factor_column;
    const bool long_enough = wanted == text_column && column.type == long_text_column;
    if (!column.make_factor && !long_enough)
        column.type = wanted;
}

void Take_Field(std::string_view content, bool quoted, Column_Scan& column)
{
    double value;
    while (!content.empty() && static_cast<unsigned char>(content.back()) <= 32)
        content.remove_suffix(1);
    if (column.type == Undecided_Type && Kind_Of_Field(content, quoted, value) == Field_Kind::text)
        column.type = text_column;
    if (column.type == text_column && content.size() >= Long_Field)
        column.type = long_text_column;
}

/// Looks at the fields of one line; `names` when it is the line of names.
const char* Scan_Line(const Field_Cutter& cutter, const char* at, bool names, Text_Shape& shape)
{
    for (std::int32_t index = 0;; ++index) {
        const Text_Field field = cutter.Cut(at);
        at = field.last;
        if (index >= request.Max_Columns) {  // no Sheet takes more
            while (*at != '\n')
                ++at;
            break;
        }
        if (index >= shape.columns) {
            shape.columns = index + 1;
            shape.types.emplace_back();
        }
        Column_Scan& column = shape.types[static_cast<std::size_t>(index)];
        std::string_view content = cutter.Content(field).substr(0, Scanned_Width);
        if (names)
            Take_Name_Mark(Trim_Copy(content), column);
        else
            Take_Field(content, field.quoted, column);
        if (!cutter.Step_Over_Separator(at))
            break;
    }
    return at;
}

void Take_Wanted_Types(const Field_Cutter& cutter, const char* names, Text_Shape& shape)
{
    if (request.Column_Wanted_Types.empty())
        return;
    for (std::int32_t index = 0; index < shape.columns; ++index) {
        std::string_view name;
        if (names != nullptr && *names != '\n') {
            const Text_Field field = cutter.Cut(names);
            name = Trim_Copy(cutter.Content(field));
            names = field.last;
            if (!cutter.Step_Over_Separator(names))
                names = nullptr;
        }
        Take_Wanted_Type(index, name, shape.types[static_cast<std::size_t>(index)]);
    }
}

}  // namespace

void Scan_Text_Dimensions(Text_Shape& shape, const Text_Scan_Options& options, std::string_view text,
                          std::int64_t field_lines)
{
    const Field_Cutter cutter(options);
    const char* const first = cutter.First_Line(text);
    const char* const last = text.data() + text.size();
    shape = Text_Shape{};
    if (first == last)
        return;
    shape.has_names = options.names_mode == names_given
                      || (options.names_mode == names_decided && Names_Decision(options).Decide(first));
    shape.rows = Count_Lines(first, last);
    const char* at = first;
    bool names = shape.has_names;
    for (std::int64_t line = 0; line < std::min(shape.rows, field_lines); ++line) {
        at = Scan_Line(cutter, at, names, shape) + 1;
        names = false;
    }
    Take_Wanted_Types(cutter, shape.has_names ? first : nullptr, shape);
    if (field_lines < shape.rows)
        return;
    for (Column_Scan& column : shape.types)
        if (column.type == Undecided_Type)
            column.type = variate_column;
}

}  // namespace ingester

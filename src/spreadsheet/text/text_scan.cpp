// The shape of a text: how many rows and columns, whether names come first, what the columns are.
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <algorithm>
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

/// Whether Text has to be Long Text shows when it is kept.
void Take_Field(const Field_Content& content, Column_Scan& column, bool for_people)
{
    double value;
    if (for_people) {  // what the column holds is settled while it is filled
        column.has_data = column.has_data || !Trim_Copy(content.text).empty();
        return;
    }
    if (column.has_data && column.type != Undecided_Type)
        return;
    const Field_Kind kind = Kind_Of_Field(content, value);
    column.has_data = column.has_data || kind != Field_Kind::nothing;
    if (column.type == Undecided_Type && kind == Field_Kind::text)
        column.type = text_column;
}

/// Looks at the fields of one line; `names` when it is the line of names.
void Scan_Line(Field_Walker& walker, bool names, Text_Shape& shape, const Text_Dialect* dialect)
{
    std::int32_t index = names && dialect != nullptr && dialect->rows_are_named ? 1 : 0;
    if (index > shape.columns) {
        shape.columns = index;
        shape.types.resize(1);
    }
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
            Take_Field(walker.Content(field), column, dialect != nullptr);
    } while (walker.Has_More());
}

}  // namespace

bool Scan_Text_Dimensions(Text_Shape& shape, const Text_Scan_Options& options, const Text_Buffer& buffer,
                          std::int64_t lines)
{
    shape = Text_Shape{};
    Field_Walker walker(options, buffer);
    const char* const first = walker.First_Line();
    walker.Go_To(first);
    if (!walker.At_Row())
        return true;
    const std::int64_t names_lines = options.dialect != nullptr ? options.dialect->names_lines : 1;
    shape.has_names = options.dialect != nullptr
                          ? names_lines > 0
                          : options.names_mode == names_given
                                || (options.names_mode == names_decided
                                    && Names_Decision(options).Decide({first, buffer.last}));
    const char* line = first;
    for (; walker.At_Row() && shape.rows < lines; ++shape.rows) {
        line = walker.Place();
        Scan_Line(walker, shape.rows < names_lines && shape.has_names, shape, options.dialect);
        if (!Line_Is_Short_Enough({line, walker.Place()}, buffer.lines_before + shape.rows + 1))
            return false;
    }
    shape.bytes = static_cast<std::size_t>(walker.Place() - first);
    shape.whole = !walker.At_Line();
    if (options.dialect == nullptr && shape.whole && walker.Is_Blank_Line(line))
        --shape.rows;
    shape.nuls = walker.Nuls();
    if (!shape.whole || options.dialect != nullptr)
        return true;
    for (Column_Scan& column : shape.types)
        if (column.type == Undecided_Type)
            column.type = variate_column;
    return true;
}

}  // namespace ingester

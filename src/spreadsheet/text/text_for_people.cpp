// Where a text's table stands and how it is cut, as its lines tell.
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_format.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

namespace {

/// What the request tells, in the words of hosts or of people.
Told_Dialect Told_By_Request(const std::string& name)
{
    Told_Dialect told;
    told.separators =
        request.Told_Separators.empty() ? request.Custom_Separators.view() : request.Told_Separators.view();
    told.quote = request.Told_Quote;
    told.decimal = request.Told_Decimal;
    told.names_lines = request.Told_Names_Lines;
    if (told.names_lines < 0 && request.No_Names)
        told.names_lines = 0;
    else if (told.names_lines < 0 && request.Names_Given)
        told.names_lines = 1;
    told.lines_in_front_told = request.Told_Skipped_Lines >= 0;
    told.file_name = name;
    return told;
}

void Skip_Lines(Text_Buffer& buffer, std::int64_t lines)
{
    for (; lines > 0 && buffer.first != buffer.last; --lines, ++buffer.lines_before) {
        const std::size_t end = std::min(buffer.Text().find_first_of("\r\n"), buffer.Text().size() - 1);
        const bool pair = buffer.Text().substr(end, 2) == "\r\n";
        buffer.first += end + (pair ? 2 : 1);
    }
}

/// Tells what stands around the table and isn't read. A title of our own says nothing.
void Tell_Rest(const Text_Buffer& buffer, const Found_Table& found)
{
    std::string_view front = buffer.Text().substr(0, found.first);
    std::int64_t lines = found.dialect.lines_in_front;
    if (const std::size_t line = Separator_Line(front); line > 0) {
        front.remove_prefix(line);
        --lines;
    }
    const bool own = front.find(Title_Words) != std::string_view::npos && lines == 1;
    if (lines > 0 && !own && !Trim_Copy(front).empty())
        request.losses.Note_Unread("lines in front of its table", lines);
    if (found.lines_behind > 0)
        request.losses.Note_Unread("lines behind its table", static_cast<std::int64_t>(found.lines_behind));
}

}  // namespace

Text_Scan_Options Options_For_People(const std::string& name, Text_Buffer& buffer, bool& rewritten,
                                     Text_Dialect& dialect)
{
    const Told_Dialect told = Told_By_Request(name);
    Skip_Lines(buffer, request.Told_Skipped_Lines);
    const std::int32_t table = std::max(request.Told_Table, 1);
    if (table > 1)
        buffer.first += Start_Of_Table(buffer.Text(), table, told);
    const Found_Table found = Find_Dialect(buffer.Text(), told);
    Tell_Rest(buffer, found);
    dialect = found.dialect;
    dialect.table = table;
    buffer.last = buffer.first + found.last;
    buffer.first += found.first;
    buffer.lines_before += dialect.lines_in_front;
    if (dialect.runs && buffer.Holds('\t')) {
        std::replace(buffer.first, buffer.last, '\t', ' ');
        rewritten = true;
    }
    Set_Found_Dialect(dialect);
    Text_Scan_Options options;
    options.trim_cells = Get_Settings().trim_cells != 0;
    options.dialect = &dialect;
    options.separators =
        told.separators.size() > 1 ? told.separators : std::string_view(&dialect.separator, 1);
    options.separators_given = true;
    options.cells_may_shift = dialect.runs;
    return options;
}

}  // namespace ingester

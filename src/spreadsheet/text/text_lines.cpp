// The two line services: one line read as a column, and lines joined by their number of fields.
#include "model/cell_text.h"
#include "model/names.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_format.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

/// From the first to behind the last place that a field of a column takes in any line.
struct Column_Extent {
    std::size_t first;
    std::size_t last;
};

void Widen(std::vector<Column_Extent>& columns, std::string_view line)
{
    std::size_t index = 0;
    for (std::size_t at = 0; (at = line.find_first_not_of(' ', at)) != std::string_view::npos; ++index) {
        const std::size_t end = std::min(line.find(' ', at), line.size());
        if (index == columns.size())
            columns.push_back({at, end});
        columns[index] = {std::min(columns[index].first, at), std::max(columns[index].last, end)};
        at = end;
    }
}

}  // namespace

bool Fields_Stand_In_Columns(Input_File& file)
{
    std::vector<Column_Extent> columns;
    std::size_t length = 0;
    for (std::string line; file.Read_Line(line, Greatest_Line) && !line.empty();) {
        if (line.find(Title_Words) != std::string::npos)
            continue;
        if (Letters_Are_Utf8())
            std::erase_if(line, Goes_On);  // a byte a letter
        const bool padded = length == 0 || line.size() == length;
        if (!padded || line.find_first_of(",\t") != std::string::npos)
            return true;  // written by others, or not in such columns
        length = line.size();
        Widen(columns, line);
    }
    const auto overlap = [](const Column_Extent& a, const Column_Extent& b) { return a.last > b.first; };
    return std::ranges::adjacent_find(columns, overlap) == columns.end();
}

bool Read_Text_Lines(const char* file_name)
{
    Input_File file;
    if (file.Open(file_name))
        return Read_Text_Lines(file);
    Report_Message_Text("Data file %.100s not found.\n", file_name);
    return Fail("Could not read data file %.200s.\n", file_name);
}

bool Read_Text_Lines(Input_File& file)
{
    std::string line;
    const long wanted = std::max(request.Fixed_Lines, 0) + 1L;
    for (long number = 1; number <= wanted; ++number)
        if (!file.Read_Line(line, line.max_size()))
            return Fail("Could not read data file %.200s.\n", file.Name().c_str());
    if (!Line_Is_Short_Enough(line, wanted) || !Take_Line_Into_Code(line))
        return false;
    const char separator =
        request.Custom_Separators.empty() ? '\t' : request.Custom_Separators.view().front();
    const auto fields = std::count(line.begin(), line.end(), separator) + 1;
    Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(fields));
    Column* const column =
        New_Data_Column(sheet, text_column, Default_Column_Name(1), static_cast<std::int32_t>(fields));
    if (column == nullptr)
        return false;
    std::string_view rest = line;
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next) {
        const std::size_t end = std::min(rest.find(separator), rest.size());
        Set_Cell_From_Text(*column, *cell, First_Letters(Trim_Copy(rest.substr(0, end)), Text_Cell_Width));
        rest.remove_prefix(std::min(end + 1, rest.size()));
    }
    return file.Close();
}

bool Reflow_Lines_By_Fields(const char* input, const char* output, std::int32_t fields_per_record)
{
    Input_File from;
    if (!from.Open(input))
        return Fail("CSV data file %.100s not found.\n", input);
    if (Same_File(input, output))
        return Fail("Input and output files are the same.\n");
    Output_File to;
    if (!to.Open(output))
        return Fail("CSV data file %.100s could not be opened.\n", output);
    std::string line;
    std::int64_t commas = 0;
    bool record_open = false;
    bool field_open = false;  // the record doesn't end with a comma
    while (from.Read_Line(line, line.max_size())) {
        const std::int64_t more = std::count(line.begin(), line.end(), ',');
        // The last field of one line and the first of the next stay apart.
        const bool joint = field_open && !line.empty();
        commas += more + (joint ? 1 : 0);
        if (record_open && commas >= fields_per_record) {
            to.Write("\n");
            commas = more;
        } else if (joint) {
            to.Write(",");
        }
        to.Write(line);
        record_open = true;
        field_open = line.empty() ? field_open : line.back() != ',';
    }
    if (record_open)
        to.Write("\n");
    return to.Close() && from.Close();
}

}  // namespace ingester

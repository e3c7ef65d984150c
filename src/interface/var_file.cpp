#include "interface/var_file.h"

#include "interface/list_lines.h"
#include "model/column_names.h"
#include "model/date_format.h"
#include "model/factors.h"
#include "model/names.h"
#include "model/subset.h"
#include "model/text_columns.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/text_codes.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>
#include <set>
#include <string>
#include <utility>
#include <vector>

namespace ingester {

namespace {

constexpr std::size_t Longest_Line = 1024;

/// Lines that are read of a list without a count.
constexpr long Lines_Without_Count = 16000;

/// Days between the starts of the two ways in which spreadsheets count dates.
constexpr double Days_To_1904 = 1462.0;

struct Var_List {
    long count = 0;  ///< 0: not told
    bool by_name = false;
    std::vector<std::string> lines;  ///< behind the count
};

Var_List Load_Var_List(Input_File& file)
{
    Var_List list;
    std::string line;
    bool more = file.Read_Line(line, Longest_Line);
    Cut_Mark(line);
    list.by_name = more && Trim_Copy(line) == By_Names_Line;
    list.count = more ? std::max(Leading_Integer(line), 0L) : 0;
    if (list.by_name || list.count > 0)
        more = file.Read_Line(line, Longest_Line);
    const bool counted = list.count > 0;
    const long told = list.by_name ? Every_Column : (counted ? list.count : Lines_Without_Count);
    const long most = std::min<long>(told, request.Max_Columns);  // no table has more columns
    // One more than the names: the structure's own.
    for (long read = 0; more && read <= most; ++read, more = file.Read_Line(line, Longest_Line)) {
        std::ranges::replace(line, '\0', ' ');  // which would end a name
        list.lines.emplace_back(Trim_Copy(line));
    }
    Take_Lines_Into_Letters(list.lines);
    return list;
}

/// "old=new" taken apart; without a "=" all of it is the old name.
std::pair<std::string, std::string> Split_Entry(std::string_view line)
{
    const std::size_t equals = std::min(line.find('='), line.size());
    const std::string_view changed = line.substr(std::min(equals + 1, line.size()));
    return {std::string(Trim_Copy(line.substr(0, equals))), std::string(Trim_Copy(changed))};
}

}  // namespace

bool Read_Var_File(std::string_view file_name)
{
    Input_File file;
    if (!File_Exists(file_name))
        return true;
    if (!file.Open(file_name))
        return Fail_To_Read(file.Name());
    const Var_List list = Load_Var_List(file);
    if (!file.Close())
        return Fail_To_Read(file.Name());
    std::vector<std::int32_t> types;
    std::vector<std::string> names;
    for (const std::string& line : list.lines) {
        if (!list.by_name && list.count > 0 && std::ssize(types) == list.count)
            break;
        const auto [old_name, new_name] = list.by_name ? Split_Entry(line) : std::pair(std::string(), line);
        types.push_back(Read_Name_Marks(new_name).type);
        if (list.by_name)
            names.push_back(old_name);
    }
    if (std::ranges::count(types, 0) == std::ssize(types))
        return true;
    request.Column_Wanted_Types = std::move(types);
    request.Column_Wanted_Count = list.by_name ? 0 : list.count;
    request.Column_Wanted_Names = std::move(names);
    return true;
}

namespace {

/// Dates that count from 1904 are brought to those of all others.
void Count_From_1899(Column& column)
{
    if (!request.Dates_From_1904 || column.date_form != 0 || column.format == date_format_mark)
        return;
    const double missing = column.sheet->missing_value;
    const bool levels = column.type == factor_column;
    for (Cell_Node* cell = levels ? column.level_values : column.first_cell; cell != nullptr;
         cell = cell->next)
        if (cell->value.number > missing)
            cell->value.number += Days_To_1904;
}

void Make_Date_Column(Column& column, bool time)
{
    if (Is_Text_Like(column.type)) {
        Text_Column_To_Date(&column, time);
        return;
    }
    Count_From_1899(column);
    column.format = date_format_mark;
    column.date_format = time ? time_format : day_month_year_format;
    if (request.Date_Base_Text.empty())
        column.date_form = 1;
}

void Set_Number_Format(Column& column, const Name_Marks& marks)
{
    if (Is_Text_Like(column.type) || (!marks.exponent && marks.decimals < 0))
        return;
    column.format = marks.exponent ? exponent_format : fixed_format;
    column.decimals = marks.decimals;
}

void Change_Type(Column& column, std::int32_t wanted)
{
    const bool trim = column.sheet->settings.trim_cells != 0;
    const bool text = Is_Text_Like(column.type);
    const bool factor = column.type == factor_column;
    if (wanted == factor_column && text)
        Text_To_Factor(&column, false, trim, 0);
    else if (wanted == factor_column && column.type == variate_column)
        Variate_To_Factor(&column, true, 0);
    else if (wanted == variate_column && text)
        Text_Column_To_Number(&column);
    else if (wanted == variate_column && factor)
        Factor_To_Variate(&column, true);
    else if (wanted == text_column && factor)
        Factor_To_Text(&column);
    else if (wanted == text_column && column.type == variate_column)
        Variate_To_Text(&column);
}

void Act_On_Marks(Column& column, const Name_Marks& marks)
{
    if (marks.date || marks.time)
        Make_Date_Column(column, marks.time);
    Set_Number_Format(column, marks);
    const bool was_text = Is_Text_Like(column.type);
    Change_Type(column, marks.type);
    if (was_text)
        Set_Number_Format(column, marks);  // a text has become a number just now
}

/// What one line of a list says of a column.
void Change_Column(Column* column, const std::string& line)
{
    if (column == nullptr || line.empty())
        return;
    if (line.front() == '*') {
        Delete_Column(column, true);
        return;
    }
    if (request.Names_Kept_As_They_Stand && !For_People(People_Rule::free_names)) {
        column->name = line;  // and with its marks
        return;
    }
    if (column->sheet->type == vector_sheet)
        Act_On_Marks(*column, Read_Name_Marks(line));
    const std::string name = Strip_Name_Mark(line);
    if (name.empty())
        return;  // nothing but marks: the column keeps its name
    Name_By_Choice(*column, name);
    column->table_label.clear();  // the name is what labels it from now on
}

std::vector<Column*> Columns_Of(const Sheet& sheet)
{
    std::vector<Column*> columns;
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        columns.push_back(column);
    return columns;
}

/// Which line (from 0) goes with which column; false when that can't be told.
bool Pair_Lines(const std::vector<Column*>& columns, long count, std::vector<std::size_t>& lines)
{
    const List_Pairing pairing = Pairing_Of_List(count, std::ssize(columns));
    if (count > std::ssize(columns))
        Report_Message(request.Subset_Columns
                           ? "Too many column names provided.\n"
                             "If subsetting columns, just provide names for remaining columns.\n"
                             "Attempting to rename correct columns.\n"
                           : "Too many column names provided.\n");
    if (pairing == List_Pairing::unknown)
        return Fail("Could not locate correct columns to rename.\n");
    for (std::size_t i = 0; i < columns.size(); ++i) {
        const bool placed = pairing == List_Pairing::by_input_place && columns[i]->input_place > 0;
        lines.push_back(placed ? static_cast<std::size_t>(columns[i]->input_place) - 1 : i);
    }
    return true;
}

bool Has_Structure_Name(const Sheet& sheet)
{
    const bool one_way = sheet.type == table_sheet && sheet.table_ways == 1;
    return sheet.type >= matrix_sheet && sheet.type <= table_sheet && !one_way;
}

void Apply_In_Order(Sheet& sheet, const Var_List& list)
{
    const bool structure = Has_Structure_Name(sheet);
    // The list that is written for a structure holds its name alone.
    if (structure && list.count == 1 && list.lines.size() == 1) {
        sheet.structure_name = Make_Valid_Name(list.lines.front());
        return;
    }
    const long count = list.count > 0 ? list.count : sheet.column_count;
    const std::vector<Column*> columns = Columns_Of(sheet);
    std::vector<std::size_t> lines;
    if (!Pair_Lines(columns, count, lines))
        return;
    const auto named = std::min(list.lines.size(), static_cast<std::size_t>(count));
    for (std::size_t i = 0; i < columns.size(); ++i)
        if (lines[i] < named)
            Change_Column(columns[i], list.lines[lines[i]]);
    if (structure && named < list.lines.size() && !list.lines[named].empty())
        sheet.structure_name = Make_Valid_Name(list.lines[named]);
}

/// All are found before the first is changed, so that names may change places.
void Apply_By_Name(Sheet& sheet, const Var_List& list)
{
    std::vector<std::string> old_names;
    std::vector<std::string> new_names;
    for (const std::string& line : list.lines) {
        auto [old_name, new_name] = Split_Entry(line);
        if (old_name.empty())
            continue;
        old_names.push_back(std::move(old_name));
        new_names.push_back(std::move(new_name));
    }
    Missing_Names missing("Warning: column %.60s was not found, or holds no data, and was not changed.\n");
    std::set<const Column*> changed;
    const std::vector<Column*> columns = Find_Listed(sheet, old_names);
    for (std::size_t i = 0; i < columns.size(); ++i)
        if (columns[i] == nullptr)
            missing.Tell(old_names[i]);
        else if (changed.insert(columns[i]).second)
            Change_Column(columns[i], new_names[i]);
}

}  // namespace

bool Apply_Var_File(Sheet* sheet, std::string_view file_name)
{
    Input_File file;
    return (file.Open(file_name) && Apply_Var_List(*sheet, file) && file.Close())
           || Fail_To_Read(file.Name());
}

bool Apply_Var_List(Sheet& sheet, Input_File& file)
{
    const Var_List list = Load_Var_List(file);
    if (list.by_name)
        Apply_By_Name(sheet, list);
    else
        Apply_In_Order(sheet, list);
    return true;
}

namespace {

std::string Var_List_Text(const Sheet& sheet)
{
    if (Has_Structure_Name(sheet))
        return Format_Text("1\n%s\n", sheet.structure_name.c_str());
    std::string text = Format_Text("%li\n", static_cast<long>(sheet.column_count));
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        text.append(column->name.view()).append("\n");
    return text;
}

/// Writes beside an old list, which stays until the new one is whole.
bool Put_In_Place(const std::string& text, std::string_view file_name)
{
    const Scratch_File scratch(std::string(file_name).append(".$$$"));
    Output_File file(Output_File::small_buffer);
    if (!Delete_File(scratch.Name()) || !file.Open(scratch.Name()))
        return false;
    file.Write(text);
    return file.Close() && Replace_File(scratch.Name(), file_name);
}

}  // namespace

bool Write_Var_File(const Sheet& sheet, std::string_view file_name)
{
    const std::string text = Var_List_Text(sheet);
    return Put_In_Place(text, file_name)
           || Put_In_Place(text, Get_Temp_Folder().append(With_Extension(File_Part_Of(file_name), ".VAR")))
           || Fail("Warning: The list of columns %.500s could not be written.\n",
                   std::string(file_name).c_str());
}

}  // namespace ingester

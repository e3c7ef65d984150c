// Transport files: the records that describe a Sheet, and its rows as observations.
#include "model/calendar.h"
#include "model/date_format.h"
#include "model/dropped_metadata.h"
#include "model/level_tables.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "statfiles/sas/sas.h"
#include "statfiles/sas/sas_dates.h"
#include "statfiles/sas/sas_format.h"
#include "statfiles/sas/sas_numbers.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <cstring>
#include <span>
#include <string>
#include <unordered_set>
#include <vector>

namespace ingester {

namespace {

/// What a column's values become.
enum class Written : std::uint8_t { number, days, seconds, times, level_number, level_value, text, label };

struct Written_Column {
    const Column* column = nullptr;
    Written kind = Written::number;
    std::string name = {};
    std::int32_t length = 8;
    std::int64_t offset = 0;
    std::string_view format = {};
    std::int16_t format_length = 0;
    bool is_date = false;  ///< level values among them
    std::vector<double> level_values = {};
    std::vector<const char*> labels = {};
    const Cell_Node* next = nullptr;  ///< the cell that is written next
    bool texts_cut = false;
};

// --- Names -------------------------------------------------------------------------------------------

constexpr std::size_t Written_Name = Namestr_Layout::name_size;

/// As many letters as fit `bytes`.
std::string_view Cut_To_Bytes(std::string_view text, std::size_t bytes)
{
    std::string_view cut = text.substr(0, bytes);
    while (Letters_Are_Utf8() && cut.size() < text.size() && !cut.empty()
           && (static_cast<unsigned char>(text[cut.size()]) & 0xC0U) == 0x80)
        cut.remove_suffix(1);
    return cut;
}

std::string Plain_Name(std::string_view name)
{
    std::string plain(Cut_To_Bytes(name, Written_Name));
    for (char& c : plain)
        c = c == '[' || c == ']' ? '_' : c == '%' ? 'p' : c;
    return plain;
}

using Known_Names = std::unordered_set<std::string>;

/// The last letter counts up while an earlier column is called so.
std::string Name_Of_Its_Own(std::string name, const Known_Names& known)
{
    constexpr std::string_view counters = "123456789ABCDEFGHIJKLMNOPQRSTUVWXYZ";
    const std::string start(Cut_To_Bytes(name, Written_Name - 1));
    for (const char counter : counters) {
        if (!known.contains(name))
            break;
        name = start + counter;
    }
    return name;
}

void Name_Columns(std::vector<Written_Column>& columns)
{
    Known_Names known;
    for (Written_Column& written : columns) {
        written.name = Name_Of_Its_Own(Plain_Name(written.column->name), known);
        known.insert(written.name);
        if (written.name != written.column->name.view())
            Note_Loss(Loss_Kind::name_changed, written.column->name, 0, written.name);
    }
}

// --- What becomes of columns -----------------------------------------------------------------------------

constexpr double Serial_Of_Sas_Day_Zero = 21916;
constexpr double Most_Days_Of_Times = 60;

/// What stands in front of day 0 of SAS in a column's form.
double Offset_Of(const Column& column)
{
    return column.date_form == 0 ? Serial_Of_Sas_Day_Zero : Sas_Day_Zero();
}

double Value_Of(const Written_Column& written, double cell)
{
    return written.level_values.empty()
               ? cell
               : Of_Level(written.level_values, cell, written.column->sheet->missing_value);
}

bool Holds_Times(const Written_Column& written)
{
    const Column& column = *written.column;
    const double greatest = Offset_Of(column) + Most_Days_Of_Times;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        if (const double value = Value_Of(written, cell->value.number);
            Is_Present(*column.sheet, value) && value > greatest)
            return false;
    return true;
}

void Settle_Date(Written_Column& written)
{
    const std::int32_t display = written.column->date_format;
    const bool days = display < date_time_format || display == plain_format;
    written.is_date = true;
    if (days) {
        written.kind = Written::days;
        written.format = "DATE";
        written.format_length = 9;
    } else if (display >= time_format && Holds_Times(written)) {
        written.kind = Written::times;
        written.format = "TIME";
        written.format_length = 8;
    } else {
        written.kind = Written::seconds;
        written.format = "DATETIME";
        written.format_length = 20;
    }
}

std::int32_t Longest(const Written_Column& written)
{
    std::size_t longest = 0;
    if (written.kind == Written::label)
        for (const char* const label : written.labels)
            longest = std::max(longest, Text_Arena::View(label).size());
    else
        for (const Cell_Node* cell = written.column->first_cell; cell != nullptr; cell = cell->next)
            longest = std::max(longest, cell->Text().size());
    return static_cast<std::int32_t>(longest);
}

void Settle_Text(Written_Column& written)
{
    const std::int32_t longest = Longest(written);
    written.texts_cut = longest > Longest_Sas_Text;
    written.length = std::min(longest, Longest_Sas_Text);
    if (written.kind == Written::text)
        written.length = std::max(written.length, 1);
}

void Settle_Factor(Written_Column& written)
{
    const Column& column = *written.column;
    if (column.factor_kind == factor_with_labels) {
        written.kind = Written::label;
        written.labels = Label_Table(column);
        return Settle_Text(written);
    }
    if (column.factor_kind == factor_with_levels)
        written.level_values = Level_Table(column);
    written.kind = written.level_values.empty() ? Written::level_number : Written::level_value;
}

Written_Column Settled(const Column& column)
{
    Written_Column written{.column = &column, .next = column.first_cell};
    if (Is_Text_Like(column.type)) {
        written.kind = Written::text;
        Settle_Text(written);
    } else if (column.type == factor_column) {
        Settle_Factor(written);
    }
    const bool text = written.kind == Written::text || written.kind == Written::label;
    if (column.format == date_format_mark && !text)
        Settle_Date(written);
    return written;
}

void Tell_Cut_Texts(const std::vector<Written_Column>& columns)
{
    if (std::ranges::any_of(columns, &Written_Column::texts_cut))
        Report_Message_Long("Columns containing text longer than %li have been truncated to this length.\n",
                            Longest_Sas_Text);
}

std::vector<Written_Column> Settle_Columns(const Sheet& sheet)
{
    std::vector<Written_Column> columns;
    std::int64_t offset = 0;
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        columns.push_back(Settled(*column));
        columns.back().offset = offset;
        offset += columns.back().length;
    }
    Name_Columns(columns);
    Tell_Cut_Texts(columns);
    return columns;
}

// --- Records -----------------------------------------------------------------------------------------

/// The last component of the source's name up to its first ".", made of what names are made of.
std::string Data_Set_Name(const Sheet& sheet)
{
    std::string_view source = sheet.source_file;
    source = source.substr(source.find_last_of("\\/") + 1);
    std::string name(Cut_To_Bytes(source.substr(0, source.find('.')), Written_Name));
    for (char& c : name)
        if (c == ' ')
            c = '_';
        else if (!Is_Letter(c) && !Is_Digit(c) && c != '_')
            c = 'X';
    return name.empty() ? "TABULON " : name;
}

std::string Stamp()
{
    constexpr const char* months[] = {"JAN", "FEB", "MAR", "APR", "MAY", "JUN",
                                      "JUL", "AUG", "SEP", "OCT", "NOV", "DEC"};
    const Local_Time now = Local_Time_Now();
    return Format_Text("%02li%3.3s%02li:%02li:%02li:%02li", static_cast<long>(now.day), months[now.month - 1],
                       static_cast<long>(now.year % 100), static_cast<long>(now.hour),
                       static_cast<long>(now.minute), static_cast<long>(now.second));
}

void Put_Heads(Output_File& file, const std::string& name, std::size_t columns)
{
    const std::string stamp = Stamp();
    const std::string stamp_record = Format_Text("%16.16s%64s", stamp.c_str(), "");
    file.Write("HEADER RECORD*******LIBRARY HEADER RECORD!!!!!!!000000000000000000000000000000  ");
    file.Write(Format_Text("SAS     SAS     SASLIB  6.12    WIN_NT                          %16.16s",
                           stamp.c_str()));
    file.Write(stamp_record);
    file.Write("HEADER RECORD*******MEMBER  HEADER RECORD!!!!!!!000000000000000001600000000140  ");
    file.Write("HEADER RECORD*******DSCRPTR HEADER RECORD!!!!!!!000000000000000000000000000000  ");
    file.Write(Format_Text("SAS     %8.8sSASDATA 6.12    WIN_NT                          %16.16s",
                           name.c_str(), stamp.c_str()));
    file.Write(stamp_record);
    file.Write(
        Format_Text("HEADER RECORD*******NAMESTR HEADER RECORD!!!!!!!000000%04li00000000000000000000  ",
                    static_cast<long>(columns)));
}

void Put_Text(std::span<char> record, std::size_t place, std::string_view text)
{
    std::ranges::copy(text, record.begin() + static_cast<std::ptrdiff_t>(place));
}

void Put_Label(std::span<char> record, const Column& column)
{
    const std::string_view label = Cut_To_Bytes(column.extra, Namestr_Layout::label_size);
    if (label.size() < column.extra.size())
        Note_Loss(Loss_Kind::text_cut, column.name, 0, column.extra);
    Put_Text(record, Namestr_Layout::nlabel, label);
}

void Put_Variable(Output_File& file, const Written_Column& written, std::int16_t name_length)
{
    using Layout = Namestr_Layout;
    std::array<char, Layout::size> record;
    record.fill(' ');
    const auto bytes = std::as_writable_bytes(std::span(record));
    const bool text = written.kind == Written::text || written.kind == Written::label;
    const std::int32_t decimals = written.is_date || text ? 0 : std::max(written.column->decimals, 0);
    Layout::ntype.Put(bytes, text ? sas_text : sas_number);
    Layout::nhfun.Put(bytes, 0);
    Layout::nlng.Put(bytes, static_cast<std::int16_t>(written.length));
    Layout::nvar0.Put(bytes, name_length);
    Put_Text(record, Layout::nname, written.name);
    Put_Label(record, *written.column);
    Put_Text(record, Layout::nform, written.format);
    Layout::nfl.Put(bytes, written.format_length);
    Layout::nfd.Put(bytes, static_cast<std::int16_t>(decimals));
    Layout::nfj.Put(bytes, 0);
    Layout::nfill.Put(bytes, 0);
    Put_Text(record, Layout::niform, written.format);
    Layout::nifl.Put(bytes, written.format_length);
    Layout::nifd.Put(bytes, 0);
    Layout::npos.Put(bytes, static_cast<std::int32_t>(written.offset));
    file.Write(record.data(), record.size());
}

void Fill_Record(Output_File& file)
{
    constexpr auto size = static_cast<std::int64_t>(Sas_Record_Size);
    file.Write(std::string(static_cast<std::size_t>((size - file.Position() % size) % size), ' '));
}

// --- Observations ------------------------------------------------------------------------------------

/// SAS counts by the calendar, whatever the form of a column.
double Sas_Value(const Written_Column& written, double value, double missing)
{
    const Column& column = *written.column;
    const Epoch epoch{Sas_Day_Zero(), written.kind == Written::days ? 1.0 : Seconds_Per_Day};
    if (written.kind == Written::times)
        return (value > Most_Days_Of_Times ? value - Offset_Of(column) : value) * Seconds_Per_Day;
    if (column.date_form == 0)
        Serial_To_Day_Count(value, missing);
    return epoch.From_Days(value);
}

/// The number of a cell, not yet a date; missing for one that holds none.
double Number_Of(const Written_Column& written, double cell, double missing)
{
    if (written.column->type != factor_column)
        return cell;
    return cell >= 1.0 ? Value_Of(written, cell) : missing;
}

/// Whether the exponents of the format hold a number.
bool Is_Held(double value)
{
    constexpr double least = 0x1p-260;
    constexpr double beyond = 0x1p249;
    const double size = std::abs(value);
    return (size >= least && size < beyond) || size == 0.0;
}

void Note_Not_Held(const Written_Column& written, double value, std::int64_t row)
{
    char room[Number_Text_Room];
    Note_Loss(Loss_Kind::number_not_held, written.column->name, row,
              std::string_view(room, Print_General(room, value, 15)));
}

void Put_Numbers(Written_Column& written, std::byte* target, std::size_t row_size, std::size_t rows,
                 std::int64_t first_row)
{
    const double missing = written.column->sheet->missing_value;
    constexpr std::uint8_t missing_mark = '.';
    const double missing_number = Sas_Missing_Number(missing_mark);
    const bool plain = written.kind == Written::number;
    const Cell_Node* cell = written.next;
    for (std::size_t i = 0; i < rows && cell != nullptr; ++i, target += row_size, cell = cell->next) {
        Bring_Nodes_Near(cell);
        double value = plain ? cell->value.number : Number_Of(written, cell->value.number, missing);
        if (!(value > missing))
            value = missing_number;
        else if (written.is_date)
            value = Sas_Value(written, value, missing);
        if (!Is_Held(value) && value == value) [[unlikely]]
            Note_Not_Held(written, value, first_row + static_cast<std::int64_t>(i));
        Double_To_Ibm(value, target);
    }
    written.next = cell;
}

std::string_view Text_Of(const Written_Column& written, const Cell_Node& cell)
{
    return written.kind == Written::text
               ? cell.Text()
               : Text_Arena::View(Of_Level(written.labels, cell.value.number, Text_Arena::Empty()));
}

void Put_Texts(Written_Column& written, std::byte* target, std::size_t row_size, std::size_t rows,
               std::int64_t first_row)
{
    const auto length = static_cast<std::size_t>(written.length);
    const Cell_Node* cell = written.next;
    for (std::size_t i = 0; i < rows && cell != nullptr; ++i, target += row_size, cell = cell->next) {
        Bring_Nodes_Near(cell);
        const std::string_view whole = Text_Of(written, *cell);
        const std::string_view text = whole.size() <= length ? whole : Cut_To_Bytes(whole, length);
        if (text.size() < whole.size())
            Note_Loss(Loss_Kind::text_cut, written.column->name, first_row + static_cast<std::int64_t>(i),
                      whole);
        std::memcpy(target, text.data(), text.size());
    }
    written.next = cell;
}

/// Rows in which a column has no cell: in front of its first one, and behind its last.
void Put_Missing(const Written_Column& written, std::byte* target, std::size_t row_size, std::size_t rows)
{
    if (written.kind == Written::text || written.kind == Written::label)
        return;
    for (std::size_t i = 0; i < rows; ++i, target += row_size)
        Double_To_Ibm(Sas_Missing_Number('.'), target);
}

struct Row_Range {
    std::size_t first = 0;
    std::size_t count = 0;
};

void Put_Column(Written_Column& written, std::byte* block, std::size_t row_size, const Row_Range& rows)
{
    const auto first = static_cast<std::size_t>(First_Row_Of(*written.column));
    const auto length = static_cast<std::size_t>(std::max(written.column->length, 0));
    const std::size_t begin = std::clamp(first, rows.first, rows.first + rows.count) - rows.first;
    const std::size_t end = std::clamp(first + length, rows.first, rows.first + rows.count) - rows.first;
    std::byte* const target = block + written.offset;
    Put_Missing(written, target, row_size, begin);
    Put_Missing(written, target + end * row_size, row_size, rows.count - end);
    if (end <= begin)
        return;
    const auto put =
        written.kind == Written::text || written.kind == Written::label ? Put_Texts : Put_Numbers;
    put(written, target + begin * row_size, row_size, end - begin,
        static_cast<std::int64_t>(rows.first + begin) + 1);
}

void Put_Observations(Output_File& file, const Sheet& sheet, std::vector<Written_Column>& columns)
{
    constexpr std::size_t block_bytes = std::size_t{1} << 17;
    const auto row_size = static_cast<std::size_t>(columns.back().offset + columns.back().length);
    const auto rows = static_cast<std::size_t>(sheet.row_count);
    const std::size_t rows_at_once =
        std::clamp<std::size_t>(block_bytes / std::max<std::size_t>(row_size, 1), 1, rows);
    std::vector<std::byte> block(row_size * rows_at_once);
    for (std::size_t row = 0; row < rows; row += rows_at_once) {
        const Row_Range range{row, std::min(rows_at_once, rows - row)};
        std::ranges::fill(block, std::byte{' '});
        for (Written_Column& written : columns)
            Put_Column(written, block.data(), row_size, range);
        file.Write(block.data(), row_size * range.count);
        Show_Progress("Writing", static_cast<std::int64_t>(row), sheet.row_count);
    }
}

}  // namespace

bool Write_Sas_Transport(Sheet* sheet, const char* file_name)
{
    if (sheet == nullptr || sheet->row_count < 1 || sheet->column_count < 1)
        return false;  // silent by design
    if (sheet->column_count > Most_Sas_Columns)
        return Fail("Too many columns for a SAS transport file (the maximum is 9999).\n");
    Output_File file;
    if (!file.Open(file_name))
        return Fail("Write SAS Tranport file - could not open file %.100s.\n", file_name);
    Note_Dropped_Level_Values(*sheet);
    std::vector<Written_Column> columns = Settle_Columns(*sheet);
    const std::string name = Data_Set_Name(*sheet);
    Put_Heads(file, name, columns.size());
    for (const Written_Column& written : columns)
        Put_Variable(file, written, static_cast<std::int16_t>(Trim_Copy(name).size()));
    Fill_Record(file);
    file.Write("HEADER RECORD*******OBS     HEADER RECORD!!!!!!!000000000000000000000000000000  ");
    Put_Observations(file, *sheet, columns);
    Fill_Record(file);
    return file.Close();
}

}  // namespace ingester

// A Sheet as text: tabs, commas, or columns of fixed width.
#include "model/column_printer.h"
#include "model/dropped_metadata.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_format.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

namespace ingester {

namespace {

constexpr std::size_t Greatest_Written_Line = 65535;
constexpr std::string_view Line_End = "\r\n";

enum class Layout : std::uint8_t { tabs, commas, fixed };

struct Text_Layout {
    Layout layout;
    bool padded;     ///< fields fill their column's width
    bool quoted;     ///< texts stand in quotes
    char separator;  ///< between fields, and where a line that is too long is broken
};

Text_Layout Layout_Of_Request(bool tab_mode)
{
    if (tab_mode)
        return {Layout::tabs, false, false, '\t'};
    if (request.CSV_Output)
        return {Layout::commas, !request.Packed_Csv_Output, Get_Settings().csv_quote_text != 0, ','};
    return {Layout::fixed, true, false, ' '};
}

using Cell_Kind = Column_Printer::Kind;

bool Keeps_Spelling(const Column& column)
{
    return For_People(People_Rule::sniffed_texts) && !request.Use_Formats
           && column.format != date_format_mark;
}

/// A column on its way out.
struct Column_Writing {
    Column_Printer printer;
    bool left;               ///< which side of its width a field stands at
    std::int32_t first_row;  ///< no cells above (Symmetric Matrix)
    bool as_spelled;         ///< numbers print as a text spelled them, or in their shortest form
    std::int32_t width = 0;
    const Cell_Node* cell = nullptr;  ///< of the row being written
};

/// A line under way; fields are printed straight into it.
class Line_Buffer {
public:
    /// Room for `count` more characters.
    char* Reserve(std::size_t count)
    {
        if (bytes_.size() - used_ < count)
            bytes_.resize(std::max(bytes_.size() * 2, used_ + count));
        return bytes_.data() + used_;
    }
    void Advance_To(const char* end) { used_ = static_cast<std::size_t>(end - bytes_.data()); }
    void Put(char c)
    {
        *Reserve(1) = c;
        ++used_;
    }
    void Put(std::string_view text)
    {
        std::memcpy(Reserve(text.size()), text.data(), text.size());
        used_ += text.size();
    }
    [[nodiscard]] std::size_t Size() const { return used_; }
    [[nodiscard]] std::string_view View() const { return {bytes_.data(), used_}; }
    void Clear() { used_ = 0; }

    /// Widens the field that began at `start` to `width`, on its far or on its near side.
    void Pad(std::size_t start, std::int32_t width, bool left)
    {
        const std::size_t size = used_ - start;
        const std::size_t letters = Letter_Count(View().substr(start));
        if (letters >= static_cast<std::size_t>(width))
            return;
        const std::size_t blanks = static_cast<std::size_t>(width) - letters;
        Reserve(blanks);
        char* const field = bytes_.data() + start;
        if (!left)
            std::memmove(field + blanks, field, size);
        std::memset(left ? field + size : field, ' ', blanks);
        used_ += blanks;
    }

private:
    std::vector<char> bytes_ = std::vector<char>(1 << 16);
    std::size_t used_ = 0;
};

Printing_Rules Rules_Of_Request()
{
    const Number_Print numbers = request.Use_Formats ? Number_Print::by_format : Number_Print::general;
    return {.numbers = numbers, .level_values = numbers, .margins = true};
}

/// The mark behind a name by which a reader knows the column's type again.
std::string_view Name_Mark(const Column& column)
{
    if (request.No_Name_Marks)
        return "";
    return column.type == factor_column ? "!" : column.format == date_format_mark ? ":D" : "";
}

/// Whether a field of fixed width is read as one, by the blanks around it; a separator of others, too, would
/// mislead the reader.
bool Stays_In_Place(std::string_view printed)
{
    return !printed.empty() && printed.front() != '"' && printed.front() != '\''
           && printed.find_first_of(" \t,\r\n") == std::string_view::npos;
}

/// The old data of a join come through the new file, and the old file is there until that is whole.
bool Keeps_Old_Output()
{
    return request.Add_Mode != Add_Modes::none && request.Write_Via_Temp;
}

class Text_Table_Writer {
public:
    Text_Table_Writer(Sheet& sheet, const Text_Layout& layout, Output_File& file)
        : sheet_(sheet), layout_(layout), file_(file)
    {
        Print_Missing();
        for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
            Start_Column(*column);
    }

    /// Whether a reader would find each cell of fixed width in its column.
    [[nodiscard]] bool Cells_Stay() const { return layout_.layout != Layout::fixed || cells_stay_; }

    void Write_Title(std::string_view name);
    void Write_Names();
    /// False when lines had to be broken that must stay whole.
    [[nodiscard]] bool Write_Rows();

private:
    void Print_Missing();
    void Start_Column(const Column& column);
    std::int32_t Measured_Width(const Column_Writing& state);
    void Put_Level(const Column_Writing& state, std::int32_t level);
    void Put_Cell(const Column_Writing& state, const Cell_Node& cell);
    void Put_Factor(const Column_Writing& state, double value);
    void Put_Text(std::string_view text);
    [[nodiscard]] bool Would_Be_Misread(std::string_view text) const;
    void Put_Quoted(std::string_view text);
    void Put_Field(Column_Writing& state, std::int32_t row);
    void Write_Line();

    Sheet& sheet_;
    Text_Layout layout_;
    Output_File& file_;
    Printing_Rules rules_ = Rules_Of_Request();
    std::vector<Column_Writing> columns_;
    Line_Buffer line_;
    std::string missing_;  ///< as a missing value prints
    long broken_lines_ = 0;
    bool cells_stay_ = true;
};

/// The text for missing values may hold a separator, too.
void Text_Table_Writer::Print_Missing()
{
    missing_ = request.Missing_Text.view();
    if (layout_.layout == Layout::fixed || !Would_Be_Misread(missing_))
        return;
    Put_Quoted(missing_);
    missing_ = line_.View();
    line_.Clear();
}

void Text_Table_Writer::Start_Column(const Column& column)
{
    const bool left =
        column.justify == default_side ? Is_Text_Like(column.type) : column.justify == left_side;
    columns_.push_back({Column_Printer(column, rules_), left, First_Row_Of(column), Keeps_Spelling(column)});
    Column_Writing& state = columns_.back();
    state.cell = column.first_cell;
    if (layout_.padded)
        state.width = Measured_Width(state);
}

/// The widest printed cell, or the name with its mark, and 1. The levels of a Factor count whether
/// they occur or not; a missing cell only where there is one.
std::int32_t Text_Table_Writer::Measured_Width(const Column_Writing& state)
{
    const Column& column = state.printer.Printed();
    const bool factor = state.printer.Kind_Of_Cells() == Cell_Kind::factor;
    const std::int32_t listed = state.printer.Listed_Levels();
    std::size_t widest = Letter_Count(column.name) + (factor ? 1 : Name_Mark(column).size());
    const auto take_printed = [&] {
        if (line_.Size() > widest)
            widest = std::max(widest, Letter_Count(line_.View()));
        cells_stay_ = cells_stay_ && Stays_In_Place(line_.View());
        line_.Clear();
    };
    line_.Clear();
    for (std::int32_t level = 1; level <= listed; ++level) {
        Put_Level(state, level);
        take_printed();
    }
    if (factor && listed < column.nlevels) {
        Put_Level(state, column.nlevels);
        take_printed();
    }
    if (factor && state.printer.Is_Level(column.nlevels + 1)) {
        Put_Level(state, column.nlevels + 1);
        take_printed();
    }
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        if (factor && state.printer.Is_Level(cell->value.number))
            continue;
        Put_Cell(state, *cell);
        take_printed();
    }
    return static_cast<std::int32_t>(widest) + 1;
}

/// Without quotes around it, a reader would take the text apart or cut quotes of its own.
bool Text_Table_Writer::Would_Be_Misread(std::string_view text) const
{
    return text.starts_with('"') || text.starts_with('\'') || text.find(layout_.separator) != text.npos
           || text.find_first_of("\r\n") != text.npos;
}

void Text_Table_Writer::Put_Quoted(std::string_view text)
{
    line_.Put('"');
    for (std::size_t quote; (quote = text.find('"')) != std::string_view::npos;
         text.remove_prefix(quote + 1)) {
        line_.Put(text.substr(0, quote + 1));
        line_.Put('"');
    }
    line_.Put(text);
    line_.Put('"');
}

void Text_Table_Writer::Put_Text(std::string_view text)
{
    if (text.empty())
        return;
    if (layout_.layout != Layout::fixed && (layout_.quoted || Would_Be_Misread(text)))
        Put_Quoted(text);
    else
        line_.Put(text);
}

/// A number is printed where it goes.
void Text_Table_Writer::Put_Level(const Column_Writing& state, std::int32_t level)
{
    char* const room = line_.Reserve(Number_Text_Room);
    const std::string_view text = state.printer.Level(level, room);
    if (text.data() == room)
        line_.Advance_To(room + text.size());
    else if (state.printer.Printed().factor_kind == factor_with_labels)
        Put_Text(text);
    else
        line_.Put(text);
}

void Text_Table_Writer::Put_Factor(const Column_Writing& state, double value)
{
    if (state.printer.Is_Level(value))
        Put_Level(state, static_cast<std::int32_t>(value));
    else
        line_.Put(state.printer.Printed().factor_kind == factor_with_labels ? std::string_view(" ")
                                                                            : std::string_view(missing_));
}

inline void Text_Table_Writer::Put_Cell(const Column_Writing& state, const Cell_Node& cell)
{
    const double value = cell.value.number;
    switch (state.printer.Kind_Of_Cells()) {
    case Cell_Kind::number:
        if (!(value > sheet_.missing_value))
            line_.Put(missing_);
        else if (state.as_spelled)
            line_.Advance_To(
                Print_As_Spelled(line_.Reserve(Number_Text_Room), state.printer.Printed(), cell));
        else
            line_.Advance_To(state.printer.Print_Number(line_.Reserve(Number_Text_Room), value));
        break;
    case Cell_Kind::text:
        Put_Text(cell.Text());
        break;
    case Cell_Kind::factor:
        Put_Factor(state, value);
        break;
    }
}

inline void Text_Table_Writer::Put_Field(Column_Writing& state, std::int32_t row)
{
    const std::size_t start = line_.Size();
    // In fixed width every field begins with its separating blank, whichever side it stands at.
    if (layout_.layout == Layout::fixed && state.left)
        line_.Put(' ');
    if (row >= state.first_row && state.cell != nullptr) {
        Bring_Nodes_Near(state.cell);
        Put_Cell(state, *state.cell);
        state.cell = state.cell->next;
    }
    if (layout_.padded)
        line_.Pad(start, state.width, state.left);
}

/// Breaks a line that is too long behind the last separator in reach.
void Text_Table_Writer::Write_Line()
{
    std::string_view line = line_.View();
    if (line.size() > Greatest_Written_Line)
        ++broken_lines_;
    while (line.size() > Greatest_Written_Line) {
        const std::size_t found = line.substr(0, Greatest_Written_Line).rfind(layout_.separator);
        std::size_t taken = found == std::string_view::npos ? Greatest_Written_Line : found + 1;
        while (Letters_Are_Utf8() && taken > 1 && Goes_On(line[taken]))
            --taken;
        file_.Write(line.substr(0, taken));
        file_.Write(Line_End);
        line.remove_prefix(taken);
    }
    file_.Write(line);
    file_.Write(Line_End);
    line_.Clear();
}

void Text_Table_Writer::Write_Title(std::string_view name)
{
    const Local_Time now = Local_Time_Now();
    line_.Clear();
    line_.Put('"');
    line_.Put(name);
    line_.Put(Title_Words);
    line_.Put(Format_Text("%02d:%02d:%02d %02d/%02d/%02d)", now.hour, now.minute, now.second, now.month,
                          now.day, now.year % 100));
    line_.Put('"');
    Write_Line();
}

void Text_Table_Writer::Write_Names()
{
    line_.Clear();
    for (const Column_Writing& state : columns_) {
        const std::size_t start = line_.Size();
        if (start > 0 && layout_.layout != Layout::fixed)
            line_.Put(layout_.separator);
        const Column& column = state.printer.Printed();
        const std::string name = std::string(column.name).append(Name_Mark(column));
        const bool left = column.justify == left_side;
        if (layout_.layout == Layout::fixed) {
            if (left)
                line_.Put(' ');
            line_.Put(name);
            line_.Pad(start, state.width, left);
        } else if (Would_Be_Misread(name)) {
            Put_Quoted(name);
        } else {
            line_.Put(name);
        }
    }
    Write_Line();
}

bool Text_Table_Writer::Write_Rows()
{
    constexpr std::int32_t progress_step = 1 << 14;
    line_.Clear();
    for (std::int32_t row = 0; row < sheet_.row_count && !file_.Failed(); ++row) {
        bool first = true;
        for (Column_Writing& state : columns_) {
            if (!first && layout_.layout != Layout::fixed)
                line_.Put(layout_.separator);
            first = false;
            Put_Field(state, row);
        }
        Write_Line();
        if (row % progress_step == 0)
            Show_Progress("Writing", row, sheet_.row_count);
    }
    if (broken_lines_ > 0 && Keeps_Old_Output())
        return Fail("Error: The output was left as it is, since lines of it would be broken.\n");
    if (broken_lines_ > 0) {
        Report_Message_Long("Warning: %li lines were too long and have been broken.\n", broken_lines_);
        Note_Loss(Loss_Kind::beyond_limit, {}, 0, "lines that were broken, which read as more rows",
                  broken_lines_);
    }
    return true;
}

/// What the title calls the output.
std::string Title_Name(std::string_view file_name)
{
    std::string_view name = File_Part_Of(file_name);
    if (Ends_Ignoring_Case(name, ".$$$"))
        name.remove_suffix(4);
    if (Starts_Ignoring_Case(name, "clipboard") || Starts_Ignoring_Case(name, "$Clip$")
        || Starts_Ignoring_Case(name, "$Std_In$"))
        name = request.Source_Base_Name;
    return std::string(name);
}

}  // namespace

bool Write_Text_File(Sheet* sheet, const char* file_name, bool tab_mode)
{
    if (sheet == nullptr || sheet->row_count < 1 || sheet->column_count < 1)
        return false;
    const bool real_file = *file_name != '\0';
    const Text_Layout layout = Layout_Of_Request(tab_mode);
    Output_File file;
    Text_Table_Writer writer(*sheet, layout, file);
    if (request.Add_Mode != Add_Modes::none && !writer.Cells_Stay())
        return Fail(
            "Error: The output was left as it is, since texts with blanks, or empty ones, can't be told "
            "apart in columns of fixed width.\n");
    if (!real_file)
        file.Open_Standard_Output();
    else if (!file.Open(file_name))
        return false;  // silent by design: the pipeline tells that the output was not written
    if (layout.layout == Layout::fixed && Get_Settings().csv_title != 0 && real_file)
        writer.Write_Title(Title_Name(file_name));
    if (!request.Omit_Header)
        writer.Write_Names();
    Note_Dropped_Metadata(*sheet);
    return writer.Write_Rows() && file.Close();
}

}  // namespace ingester

// A Sheet as text: tabs, commas, or columns of fixed width.
#include "model/column_printer.h"
#include "model/dropped_metadata.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "request/text_crossing.h"
#include "spreadsheet/text/text.h"
#include "spreadsheet/text/text_format.h"
#include "spreadsheet/text/text_layout.h"
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
    bool quoted = false;              ///< its texts, which would be read as numbers or dates
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
        std::ranges::copy(text, Reserve(text.size()));
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

Printing_Rules Rules_Of_Request(bool plain)
{
    const Number_Print otherwise = plain ? Number_Print::for_others : Number_Print::general;
    const Number_Print numbers = request.Use_Formats ? Number_Print::by_format : otherwise;
    return {.numbers = numbers, .level_values = numbers, .margins = true};
}

/// The mark behind a name by which a reader knows the column's type again.
std::string_view Name_Mark(const Column& column, const Text_Layout& layout)
{
    if (!layout.marked)
        return "";
    if (column.type == factor_column)
        return "!";
    if (column.format != date_format_mark)
        return "";
    return layout.plain && Iso_Form_Of(column) == Iso_Form::time ? ":T" : ":D";
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

    /// What comes first, and how letters get into the file. False after a message.
    [[nodiscard]] bool Begin_File();
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
    void Put_Number(const Column_Writing& state, double value);
    void Put_Lost_Date(const Column_Writing& state, double value);
    void Put_Text(const Column_Writing& state, std::string_view text);
    [[nodiscard]] bool Would_Be_Misread(std::string_view text) const;
    [[nodiscard]] bool Needs_Quotes(std::string_view text) const;
    [[nodiscard]] bool Is_First(const Column& column) const { return column.prev == sheet_.first_column; }
    [[nodiscard]] bool Texts_Look_Like_Data(const Column_Writing& state) const;
    void Put_Quoted(std::string_view text);
    void Put_Field(Column_Writing& state, std::int32_t row);
    void Write_Line();
    void Write_Bytes(std::string_view text);
    void Write_Converted(std::string_view text);
    void Tell_Lost_Letters();

    Sheet& sheet_;
    Text_Layout layout_;
    Output_File& file_;
    Printing_Rules rules_ = Rules_Of_Request(layout_.plain);
    std::vector<Column_Writing> columns_;
    Line_Buffer line_;
    std::string missing_;       ///< as a missing value prints
    Text_Converter converter_;  ///< of the file's code, if it has one of its own
    std::int64_t row_ = 0;      ///< that is written, from 1
    long broken_lines_ = 0;
    bool cells_stay_ = true;
};

/// The text for missing values may hold a separator, too.
void Text_Table_Writer::Print_Missing()
{
    missing_ = layout_.missing;
    const bool quoted = layout_.plain ? Needs_Quotes(missing_) : Would_Be_Misread(missing_);
    if (layout_.layout == Layout::fixed || !quoted)
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
    state.quoted = layout_.tells_texts && Texts_Look_Like_Data(state);
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
    std::size_t widest = Letter_Count(column.name) + (factor ? 1 : Name_Mark(column, layout_).size());
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

/// Whether a line that begins so may be taken for a comment.
bool Begins_Comment(std::string_view text)
{
    return text.starts_with('#') || text.starts_with('%');
}

/// Whether the reader of another program needs quotes to see the text as it stands.
bool Text_Table_Writer::Needs_Quotes(std::string_view text) const
{
    if (text.empty())
        return false;
    const auto is_blank = [](char c) { return c == ' ' || c == '\t'; };
    const auto holds = [text](char c) { return text.find(c) != std::string_view::npos; };
    // Nothing but the signs in its texts would tell how a single column is separated.
    const bool misleads = sheet_.column_count == 1 && text.find_first_of(",;|\t") != std::string_view::npos;
    return misleads || text.front() == '\'' || is_blank(text.front()) || is_blank(text.back())
           || holds(layout_.separator) || holds('"') || holds('\n') || holds('\r');
}

/// Whether nothing in a column of texts would tell that it is one.
bool Text_Table_Writer::Texts_Look_Like_Data(const Column_Writing& state) const
{
    const Column& column = state.printer.Printed();
    if (column.type == factor_column) {
        const Level_Node* label = column.factor_kind == factor_with_labels ? column.labels : nullptr;
        const bool listed = label != nullptr;
        for (; label != nullptr && Looks_Like_Data(label->Text()); label = label->next)
            ;
        return listed && label == nullptr;
    }
    if (!Is_Text_Like(column.type))
        return false;
    const Cell_Node* cell = column.first_cell;
    for (; cell != nullptr && Looks_Like_Data(cell->Text()); cell = cell->next)
        ;
    return cell == nullptr;
}

void Text_Table_Writer::Put_Text(const Column_Writing& state, std::string_view text)
{
    if (layout_.plain) {
        const bool comment = Begins_Comment(text) && Is_First(state.printer.Printed());
        const bool misleads = layout_.tells_texts && (comment || (!text.empty() && Looks_Missing(text)));
        state.quoted || misleads || Needs_Quotes(text) ? Put_Quoted(text) : line_.Put(text);
    } else if (text.empty()) {
        return;
    } else if (layout_.layout != Layout::fixed && (layout_.quoted || Would_Be_Misread(text))) {
        Put_Quoted(text);
    } else {
        line_.Put(text);
    }
}

/// A number is printed where it goes.
void Text_Table_Writer::Put_Level(const Column_Writing& state, std::int32_t level)
{
    char* const room = line_.Reserve(Number_Text_Room);
    const std::string_view text = state.printer.Level(level, room);
    if (text.data() == room)
        line_.Advance_To(room + text.size());
    else if (state.printer.Printed().factor_kind == factor_with_labels)
        Put_Text(state, text);
    else
        line_.Put(text);
}

void Text_Table_Writer::Put_Factor(const Column_Writing& state, double value)
{
    if (state.printer.Is_Level(value))
        Put_Level(state, static_cast<std::int32_t>(value));
    else
        line_.Put(state.printer.Printed().factor_kind == factor_with_labels && !layout_.plain
                      ? std::string_view(" ")
                      : std::string_view(missing_));
}

/// A date that nothing else reads is missing.
void Text_Table_Writer::Put_Lost_Date(const Column_Writing& state, double value)
{
    line_.Put(missing_);
    Note_Loss(Loss_Kind::date_out_of_range, state.printer.Printed().name, row_,
              Format_Text("day %.15g", value));
}

inline void Text_Table_Writer::Put_Number(const Column_Writing& state, double value)
{
    char* const room = line_.Reserve(Number_Text_Room);
    char* const end = state.printer.Print_Number(room, value);
    line_.Advance_To(end);
    if (end == room) [[unlikely]]
        Put_Lost_Date(state, value);
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
            Put_Number(state, value);
        break;
    case Cell_Kind::text:
        Put_Text(state, cell.Text());
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

/// Letters that the file's code lacks are told by the columns that have them.
void Text_Table_Writer::Tell_Lost_Letters()
{
    Line_Buffer field;
    std::swap(field, line_);
    for (const Column_Writing& state : columns_) {
        const Column& column = state.printer.Printed();
        const Cell_Node* const cell = state.cell == nullptr ? column.last_cell : state.cell->prev;
        line_.Clear();
        if (row_ == 0)
            line_.Put(column.name);
        else if (cell != nullptr)
            Put_Cell(state, *cell);
        static_cast<void>(converter_.Convert(line_.View()));
        if (const std::int64_t lost = converter_.Take_Losses(); lost > 0)
            Note_Loss(Loss_Kind::letter_replaced, column.name, row_, line_.View(), lost);
    }
    std::swap(field, line_);
}

inline void Text_Table_Writer::Write_Bytes(std::string_view text)
{
    if (layout_.code == nullptr)
        file_.Write(text);
    else
        Write_Converted(text);
}

void Text_Table_Writer::Write_Converted(std::string_view text)
{
    file_.Write(converter_.Convert(text));
    if (converter_.Take_Losses() > 0)
        Tell_Lost_Letters();
}

bool Text_Table_Writer::Begin_File()
{
    constexpr std::string_view mark = "\xEF\xBB\xBF";
    const Text_Code code = layout_.code != nullptr ? layout_.code : Code_Of_Letters();
    if (layout_.code != nullptr && !Open_Converter(converter_, Code_Of_Letters(), code))
        return false;
    if (layout_.code_mark && !Is_Unicode(code))
        return Fail("Error: A text in the encoding %s can't begin with the mark of Unicode.\n",
                    std::string(code->name).c_str());
    if (layout_.code_mark)
        file_.Write(Sure_Converter(Utf_8_Code(), code).Convert(mark));
    return true;
}

/// Breaks a line that is too long behind the last separator in reach.
void Text_Table_Writer::Write_Line()
{
    std::string_view line = line_.View();
    if (line.size() > layout_.longest_line)
        ++broken_lines_;
    while (line.size() > layout_.longest_line) {
        const std::size_t found = line.substr(0, layout_.longest_line).rfind(layout_.separator);
        std::size_t taken = found == std::string_view::npos ? layout_.longest_line : found + 1;
        while (Letters_Are_Utf8() && taken > 1 && Goes_On(line[taken]))
            --taken;
        Write_Bytes(line.substr(0, taken));
        Write_Bytes(layout_.line_end);
        line.remove_prefix(taken);
    }
    Write_Bytes(line);
    Write_Bytes(layout_.line_end);
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
        const std::string name = std::string(column.name).append(Name_Mark(column, layout_));
        const bool left = column.justify == left_side;
        if (layout_.layout == Layout::fixed) {
            if (left)
                line_.Put(' ');
            line_.Put(name);
            line_.Pad(start, state.width, left);
        } else if (layout_.plain ? Needs_Quotes(name) || Name_Looks_Like_Data(name) || Begins_Comment(name)
                                 : Would_Be_Misread(name)) {
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
        if (layout_.plain && line_.Size() == 0)
            Put_Quoted({});  // most readers pass over empty lines
        row_ = row + 1;
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
    const Text_Layout layout = Layout_Of_Request(tab_mode);
    const std::int32_t least_rows = layout.plain ? 0 : 1;
    if (sheet == nullptr || sheet->row_count < least_rows || sheet->column_count < 1)
        return false;
    const bool real_file = *file_name != '\0';
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
    if (!writer.Begin_File())
        return false;
    if (layout.layout == Layout::fixed && Get_Settings().csv_title != 0 && real_file)
        writer.Write_Title(Title_Name(file_name));
    if (!request.Omit_Header)
        writer.Write_Names();
    Note_Dropped_Metadata(*sheet);
    if (layout.plain)
        Note_Dropped_Orders(*sheet);
    return writer.Write_Rows() && file.Close();
}

}  // namespace ingester

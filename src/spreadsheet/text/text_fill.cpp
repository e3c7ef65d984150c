// The fields of a text into the cells of its Sheet.
#include "model/cell_appender.h"
#include "model/cell_text.h"
#include "model/claims.h"
#include "model/column_names.h"
#include "model/date_format.h"
#include "model/names.h"
#include "model/subset.h"
#include "model/text_columns.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text_filler.h"
#include "spreadsheet/text/text_format.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

/// One trailing mark of a name has done its work when the scan is over.
void Cut_Type_Mark(Column& column)
{
    const std::string_view name = column.name;
    if (name.empty())
        column.name = Default_Column_Name(0);
    else if (!For_People(People_Rule::free_names) && name.find_last_of("!#$") == name.size() - 1)
        column.name = std::string(name.substr(0, name.size() - 1));
}

/// A number that is too great or too small for a cell.
bool Is_Beyond_Doubles(std::string_view text)
{
    return Parse_Number(text.data(), text.data() + text.size()).status == Number_Status::out_of_range;
}

}  // namespace

Sheet_Filler::Sheet_Filler(Sheet& sheet, Text_Shape& shape, const Text_Scan_Options& options,
                           const Text_Buffer& buffer, File_Image* image)
    : sheet_(sheet), shape_(shape), walker_(options, buffer), trim_(options.trim_cells),
      cells_may_shift_(options.cells_may_shift), buffer_(buffer), image_(image), dialect_(options.dialect)
{
    missing_.number = sheet.missing_value;
    empty_.text = Text_Arena::Empty();
    double number;
    const auto is_number = [&](const std::string& word) { return Whole_Number_Text(word, number); };
    no_number_is_missing_ = !Whole_Number_Text(request.Missing_Input_Text, number)
                            && std::ranges::none_of(request.Missing_Words, is_number);
    if (dialect_ != nullptr) {
        marks_ = {dialect_->decimal, dialect_->thousands};
        no_number_is_missing_ = no_number_is_missing_ && marks_.decimal == '.';
    }
    Column* column = sheet.first_column->next;
    for (const Cell_Appender& cells :
         Make_Appenders(sheet, sheet.first_column->next, Expected_Rows(), &ahead_)) {
        Start_Column(*column, cells);
        column = column->next;
    }
    Limit_Rows();
}

/// By the lines that were looked at; where rows turn out to be longer than that, blocks are left unused.
std::int64_t Sheet_Filler::Expected_Rows() const
{
    if (shape_.whole)
        return shape_.rows + Spare_Rows;
    const auto size = static_cast<double>(buffer_.Text().size());
    const double by_sample = size / static_cast<double>(shape_.bytes) * static_cast<double>(shape_.rows);
    const double by_columns = size / shape_.columns;  // a cell takes at least its separator
    return static_cast<std::int64_t>(std::min(by_sample * 1.02, by_columns)) + Spare_Rows;
}

/// A few hostile bytes could ask for any number of cells: a long first line, then short ones.
void Sheet_Filler::Limit_Rows()
{
    row_limit_ = Most_Rows(std::ssize(columns_), std::ssize(buffer_.Text()));
}

void Sheet_Filler::Start_Column(Column& column, const Cell_Appender& cells)
{
    const Column_Scan& scan = shape_.types[columns_.size()];
    const Filling filling = Is_Text_Like(column.type)     ? Filling::texts
                            : scan.type == Undecided_Type ? Filling::numbers_so_far
                                                          : Filling::numbers;
    columns_.push_back(Column_Filling{.column = &column, .cells = cells, .filling = filling, .spelling = {}});
}

void Sheet_Filler::Name_Column(std::size_t index, std::string_view text)
{
    Column& column = *columns_[index].column;
    Column_Scan& scan = shape_.types[index];
    const Name_Marks marks = Read_Name_Marks(text);
    scan.make_date = marks.date;
    scan.make_time = marks.time;
    Name_From_Input(column, text, Strip_Input_Mark(text));
}

/// An empty field leaves a column the name it has.
void Sheet_Filler::Fill_Names()
{
    std::size_t index = 0;
    do {
        const Field_Content content = walker_.Content(walker_.Next());
        const std::string_view name = Text_Of(content);
        if (index >= columns_.size())
            Refuse_Extra_Columns();
        else if (!name.empty() || content.quote != '\0')
            Name_Column(index, name);
        ++index;
    } while (walker_.Has_More());
    uneven_lines_ += index < columns_.size() ? 1 : 0;
}

/// The names as they will be, which is what a list of columns goes by.
void Sheet_Filler::Settle_Names()
{
    for (Column_Filling& state : columns_)
        Cut_Type_Mark(*state.column);
    Make_Column_Names_Unique(&sheet_);
    Leave_Out_Unlisted();
    Take_Wanted_Types();
}

/// A column that nobody wants is not filled: its fields are only passed over.
void Sheet_Filler::Leave_Out(std::size_t index)
{
    columns_[index].filling = Filling::left_out;
    shape_.types[index] = Column_Scan{};
}

void Sheet_Filler::Leave_Out_Unlisted()
{
    const std::vector<bool> wanted = Wanted_Columns(sheet_);
    for (std::size_t index = 0; index < columns_.size(); ++index)
        if (!wanted[index])
            Leave_Out(index);
}

/// Before there is a cell. Columns that are to hold numbers decide by their fields, so that texts are there
/// to be converted.
void Sheet_Filler::Take_Wanted_Types()
{
    if (request.Column_Wanted_Types.empty())
        return;
    std::vector<bool> kept;
    for (const Column_Filling& state : columns_)
        kept.push_back(state.filling != Filling::left_out);
    const std::vector<std::int32_t> types = Wanted_Types(sheet_, shape_, kept);
    for (std::size_t index = 0; index < columns_.size(); ++index) {
        const std::int32_t type = types[index];
        if (type <= 0)
            continue;
        Column_Filling& state = columns_[index];
        shape_.types[index].make_factor = type == factor_column;
        if (type == text_column)
            Become(state, text_column, Filling::texts);
        else if (type == variate_column)
            Become(state, variate_column, Filling::numbers_so_far);
    }
}

void Sheet_Filler::Become(Column_Filling& state, std::int32_t type, Filling filling)
{
    Column& column = *state.column;
    const bool text = type == text_column;
    column.type = type;
    column.format = text ? general_format : significant_digits_format;
    column.decimals = text ? 0 : -1;
    state.filling = filling;
}

/// A field's text, doubled quotes made single, cut and trimmed.
inline std::string_view Sheet_Filler::Text_Of(const Field_Content& content)
{
    std::string_view text = content.text;
    const bool escaped = dialect_ != nullptr && dialect_->escape != '\0';
    const char pair[] = {escaped ? dialect_->escape : content.quote, content.quote};
    const std::string_view doubled(pair, 2);
    if (content.quote != '\0' && text.find(doubled) != std::string_view::npos) {
        undoubled_.clear();
        for (std::size_t i = 0; i < text.size(); ++i) {
            const bool pair_here = text.substr(i, 2) == doubled;
            i += pair_here ? 1 : 0;
            undoubled_ += text[i];
        }
        text = undoubled_;
    }
    cut_texts_ += Has_More_Letters(text, Long_Text_Width) ? 1 : 0;
    text = First_Letters(text, Long_Text_Width);
    return trim_ ? Trim_Copy(text) : text;
}

std::string_view Sheet_Filler::Said_By(const Field_Content& content)
{
    return Text_Of(content);
}

inline void Sheet_Filler::Put_Text(const Text_Field& field, Column& column, Cell_Node& cell)
{
    const Field_Content content = walker_.Content(field);
    const std::string_view text = Text_Of(content);
    bare_texts_ = bare_texts_ || (content.quote == '\0' && !text.empty());
    if (dialect_ != nullptr && !request.Missing_Words.empty() && Says_Nothing(text))
        return;
    Make_Room_For(column, text);
    if (!text.empty() && (content.quote != '\0' || text != "*"))
        Set_Cell_From_Text(column, cell, text);
}

void Sheet_Filler::Fill_Text(const Text_Field& field, Column& column, Cell_Node& cell)
{
    Put_Text(field, column, cell);
}

/// The column's numbers so far are taken back; their texts are fetched when all rows are in.
void Sheet_Filler::Turn_To_Text(Column_Filling& state)
{
    Become(state, text_column, Filling::texts);
    for (Cell_Node* cell = &state.cells.Last(); cell != nullptr; cell = cell->prev)
        cell->value = empty_;
    state.rows_to_redo = row_;
    request.losses.Withdraw(Loss_Kind::number_not_held, state.column->name);  // as texts they can be held
    request.losses.Withdraw(Loss_Kind::number_clipped, state.column->name);
    request.losses.Withdraw(Loss_Kind::date_part_dropped, state.column->name);
}

/// A field that is not simply a number up to its separator; its cell is there, and missing.
void Sheet_Filler::Fill_Checked(const Text_Field& field, Column_Filling& state)
{
    if (dialect_ != nullptr)
        return Fill_For_People(field, state);
    double value;
    switch (Kind_Of_Field(walker_.Content(field), value)) {
    case Field_Kind::number:
        state.cells.Last().value.number = value;
        if (value == Greatest_Number)
            Note_Field(Loss_Kind::number_clipped, *state.column, field);
        break;
    case Field_Kind::nothing:
        if (Is_Beyond_Doubles(Trim_Copy(walker_.Content(field).text)))
            Note_Field(Loss_Kind::number_not_held, *state.column, field);
        break;
    case Field_Kind::text:
        if (state.filling == Filling::numbers_so_far)
            Turn_To_Text(state);
        Fill_Text(field, *state.column, state.cells.Last());
        if (state.filling == Filling::numbers)
            Note_Field(Loss_Kind::text_not_number, *state.column, field);
        break;
    }
}

/// What a field of the row under way loses in its column.
void Sheet_Filler::Note_Field(Loss_Kind kind, const Column& column, const Text_Field& field) const
{
    Note_Loss(kind, column.name, row_ + 1, Trim_Copy(walker_.Content(field).text));
}

namespace {

/// Whether a number for people is one without a closer look, and prints as it is spelled but for zeros.
inline bool Is_Plainly_Spelled(const Text_Field& field, std::int32_t decimals, Spelling_Watch& watch)
{
    constexpr std::ptrdiff_t surely_exact = 15;
    const char* const digits = field.first + (*field.first == '-' ? 1 : 0);
    if (*digits == '.' || (*digits == '0' && digits + 1 != field.last && digits[1] != '.')
        || field.last[-1] == '.') [[unlikely]]
        return false;
    const bool sampled = decimals < 0 || field.last - digits > surely_exact;
    if (sampled && (decimals == 0 || watch.Samples_Number())) [[unlikely]]
        return false;
    if (decimals < 0)
        return true;
    watch.Take(decimals, field.last[-1]);
    return true;
}

}  // namespace

/// The quick road: a number that fills its field, as most do.
inline void Sheet_Filler::Fill_Number(const Text_Field& field, Column_Filling& state)
{
    Cell_Value value;
    std::int32_t decimals;
    if (no_number_is_missing_ && Parse_Usual_Number(field.first, field.last, value.number, decimals)
        && (dialect_ == nullptr || Is_Plainly_Spelled(field, decimals, state.spelling))) [[likely]] {
        state.cells.Append(value);
    } else {
        state.cells.Append(missing_);
        Fill_Checked(field, state);
    }
}

inline void Sheet_Filler::Append_Blank(Column_Filling& state)
{
    if (state.filling == Filling::left_out)
        return;
    ++state.gaps;
    state.cells.Append_Missing();
}

void Sheet_Filler::Refuse_Extra_Columns()
{
    if (!columns_full_)
        Report_Message_Long("Maximum number of columns (%li) exceeded.\nIgnoring extra columns.\n",
                            request.Max_Columns);
    columns_full_ = true;
    Note_Loss(Loss_Kind::beyond_limit, {}, 0, "columns beyond the greatest number");
    request.losses.Bar_Replacing("columns beyond the greatest number would be lost");
}

/// A line with more fields than any before it. Columns have as many cells as there are rows.
bool Sheet_Filler::Add_Late_Column()
{
    const auto number = static_cast<std::int32_t>(columns_.size()) + 1;
    Column* const column = New_Data_Column(&sheet_, variate_column, Default_Column_Name(number), 0);
    if (column == nullptr) {
        Refuse_Extra_Columns();
        return false;
    }
    column->width = New_Column_Width;
    ++uneven_lines_;  // some before this one
    shape_.types.emplace_back();
    shape_.columns = number;
    Start_Column(*column, Cell_Appender(*column, row_ + Spare_Rows));
    column->input_place = request.Subset_Columns ? column->index : 0;
    if (!subset_.Keeps(column->index, column->name)) {
        Leave_Out(columns_.size() - 1);
        return true;
    }
    columns_.back().cells.Append_Missing(row_);
    columns_.back().gaps = row_;
    Limit_Rows();
    return row_ < row_limit_;
}

/// Columns without a field in this line get a cell too.
inline void Sheet_Filler::Fill_Row()
{
    std::size_t index = 0;
    do {
        if (index == columns_.size() && (columns_full_ || !Add_Late_Column())) [[unlikely]] {
            walker_.Skip_Line();
            break;
        }
        if (index + Columns_Ahead < columns_.size())  // in a wide sheet every cell is far from the last
            columns_[index + Columns_Ahead].cells.Prefetch();
        Column_Filling& state = columns_[index++];
        Text_Field field = walker_.Next();
        if (index == 1 && (*field.last == '\n' || *field.last == '\r') && Rewrite_Line(field)) [[unlikely]]
            field = walker_.Next();
        if (state.filling < Filling::moments)
            Fill_Number(field, state);
        else if (state.filling == Filling::texts)
            Put_Text(field, *state.column, state.cells.Append(empty_));
        else if (state.filling == Filling::moments)
            Fill_Moment(field, state);
    } while (walker_.Has_More());
    if (index == columns_.size()) [[likely]]
        return;
    ++uneven_lines_;
    for (; index < columns_.size(); ++index)
        Append_Blank(columns_[index]);
}

inline bool Sheet_Filler::Row_Is_Acceptable(const char* line)
{
    if (row_ >= row_limit_)
        return Fail("Error: More than %li rows of %li columns are too many for a text of %li characters.\n",
                    static_cast<long>(row_limit_), static_cast<long>(columns_.size()),
                    static_cast<long>(buffer_.Text().size()));
    return Line_Is_Short_Enough({line, walker_.Place()},
                                buffer_.lines_before + (shape_.has_names ? 2 : 1) + row_);
}

inline void Sheet_Filler::Tell_Progress()
{
    constexpr std::ptrdiff_t step = std::ptrdiff_t{1} << 22;
    if (walker_.Place() - told_ < step)
        return;
    told_ = walker_.Place();
    ahead_.Come_To(static_cast<std::size_t>(row_) * sizeof(Cell_Node));
    Show_Progress("Reading", told_ - buffer_.first, buffer_.last - buffer_.first);
    if (image_ != nullptr && !edited_ && shape_.nuls + walker_.Nuls() == 0)
        image_->Release_Before(std::min<const char*>(told_, buffer_.last - 1));  // whose line end may be ours
}

bool Sheet_Filler::Fill_Rows()
{
    const char* line = walker_.Place();
    told_ = line;
    ahead_.Come_To(0);
    for (; walker_.At_Row() && !(walker_.Passed_Empty_Line() && Ends_Table()); ++row_) {
        line = walker_.Place();
        Fill_Row();
        if (!Row_Is_Acceptable(line))
            return false;
        Tell_Progress();
    }
    Finish_Rows(line);
    return true;
}

/// A blank line at the end is no row.
void Sheet_Filler::Finish_Rows(const char* last_line)
{
    if (dialect_ == nullptr && row_ > 0 && walker_.Is_Blank_Line(last_line)) {
        --row_;
        uneven_lines_ -= columns_.size() > 1 ? 1 : 0;
    }
    if (dialect_ != nullptr)
        Settle_Quoted_Columns();
    if (row_ == 0)
        return;
    Expect_Rows(&sheet_, static_cast<std::int32_t>(row_));
    for (Column_Filling& state : columns_)
        state.cells.Finish(sheet_.row_count);
}

void Sheet_Filler::Report_Oddities() const
{
    if (const long nuls = shape_.nuls + walker_.Nuls(); nuls > 0) {
        Report_Message_Long("Warning: %li NUL characters in the text were read as blanks.\n", nuls);
        Note_Loss(Loss_Kind::letter_replaced, {}, 0, "NUL", nuls);
    }
    if (const long quotes = walker_.Open_Quotes(); quotes > 0)
        Report_Message_Long("Warning: %li quotes that nothing closes were read as letters.\n", quotes);
    if (walker_.Comments() > 0)
        request.losses.Note_Unread("comments among its rows", walker_.Comments());
    const std::string_view rest(walker_.Place(), static_cast<std::size_t>(buffer_.last - walker_.Place()));
    if (dialect_ == nullptr && rest.find_first_not_of(" \t\r\n") != std::string_view::npos) {
        Report_Message_Long(
            "Warning: An empty line stands behind row %li, and what follows it was not read.\n",
            sheet_.row_count);
        request.losses.Note_Unread("lines behind an empty line of it");
    }
    if (uneven_lines_ > 0 && cells_may_shift_)
        request.losses.Bar_Replacing("its lines differ in their number of fields");
}

void Sheet_Filler::Report_Cut_Texts() const
{
    if (cut_texts_ == 0)
        return;
    Report_Message_Long("Warning: %li texts of more than 10000 characters were cut.\n", cut_texts_);
    Note_Loss(Loss_Kind::text_cut, {}, 0, "more than 10000 letters", cut_texts_);
    request.losses.Bar_Replacing("texts of it would be cut");
}

/// One line once more, for the columns whose texts are still wanted.
void Sheet_Filler::Redo_Row()
{
    std::size_t index = 0;
    do {
        const Text_Field field = walker_.Next();
        if (index == columns_.size())
            continue;
        Column_Filling& state = columns_[index++];
        if (row_ >= state.rows_to_redo)
            continue;
        if (Is_Text_Like(state.column->type))
            Fill_Text(field, *state.column, *state.cell_to_redo);
        else
            Redo_Spelling(field, state);
    } while (walker_.Has_More());
    for (Column_Filling& state : columns_)
        if (row_ < state.rows_to_redo)
            state.cell_to_redo = state.cell_to_redo->next;
}

/// Columns that turned into Text late get the texts of their first rows.
void Sheet_Filler::Redo_Rows(const char* first_row)
{
    std::int64_t rows = 0;
    for (Column_Filling& state : columns_) {
        rows = std::max(rows, state.rows_to_redo);
        state.cell_to_redo = state.column->first_cell;
    }
    walker_.Go_To(first_row);
    for (row_ = 0; row_ < rows && walker_.At_Row(); ++row_)
        Redo_Row();
}

/// Marked columns: texts are read as dates or times, numbers are such already.
void Sheet_Filler::Make_Dates()
{
    for (std::size_t index = 0; index < columns_.size(); ++index) {
        const Column_Scan& scan = shape_.types[index];
        Column& column = *columns_[index].column;
        if ((!scan.make_date && !scan.make_time) || columns_[index].filling == Filling::moments)
            continue;
        if (scan.make_date)
            Unpack_Dates(&column);
        if (Text_Column_To_Date(&column, scan.make_time))
            continue;
        column.format = date_format_mark;
        column.date_format = scan.make_time ? time_format : day_month_year_format;
        if (request.Date_Base_Text.empty())
            column.date_form = 1;
    }
}

void Sheet_Filler::Drop_Left_Out()
{
    std::vector<bool> wanted;
    std::vector<Column_Scan> types;
    for (std::size_t index = 0; index < columns_.size(); ++index) {
        wanted.push_back(columns_[index].filling != Filling::left_out);
        if (wanted.back())
            types.push_back(shape_.types[index]);
    }
    Keep_Wanted_Columns(sheet_, wanted);
    if (types.size() == columns_.size())
        return;
    shape_.types = std::move(types);
    shape_.columns = sheet_.column_count;
}

bool Sheet_Filler::Fill()
{
    walker_.Go_To(walker_.First_Line());
    if (dialect_ != nullptr)
        Fill_Names_In_Lines();
    else if (shape_.has_names)
        Fill_Names();
    Settle_Names();
    const char* const first_row = walker_.Place();
    if (!Fill_Rows())
        return false;
    Report_Oddities();
    if (dialect_ != nullptr)
        Settle_Spellings();
    Redo_Rows(first_row);
    if (dialect_ != nullptr)
        for (const Column_Filling& state : columns_)
            ingester::Settle_Spellings(*state.column);
    Report_Cut_Texts();
    Make_Dates();
    if (dialect_ != nullptr) {
        Settle_Moments();
        Leave_Out_Last_Columns();
    }
    return sheet_.row_count > 0 || Names_Alone();
}

Sheet* Setup_Text_Sheet(const Text_Shape& shape, std::int32_t default_type)
{
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = New_Sheet();
    for (std::int32_t index = 0; index < shape.columns; ++index) {
        const std::int32_t type = shape.types[static_cast<std::size_t>(index)].type;
        Column* const column = New_Data_Column(sheet, type == Undecided_Type ? default_type : type,
                                               Default_Column_Name(index + 1), 0);
        if (column == nullptr) {
            Current_Sheet = earlier;
            return nullptr;
        }
        column->width = New_Column_Width;
    }
    return sheet;
}

bool Fill_Text_Sheet(Sheet* sheet, Text_Shape& shape, const Text_Scan_Options& options,
                     const Text_Buffer& buffer, File_Image* image)
{
    if (sheet == nullptr)
        return false;
    Sheet_Filler filler(*sheet, shape, options, buffer, image);
    if (!filler.Fill())
        return false;
    filler.Drop_Left_Out();
    return true;
}

}  // namespace ingester

// The fields of a text into the cells of its Sheet.
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/cell_text.h"
#include "model/names.h"
#include "spreadsheet/text/text_format.h"
#include "support/number_text.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

/// What is done with the fields of a column.
enum class Filling : std::uint8_t {
    numbers_so_far,  ///< undecided: numbers until a field says otherwise
    numbers,         ///< a Variate by its mark: what isn't a number is missing
    texts,
    passed_over,  ///< in the second walk: a column that the first one filled
};

struct Column_Filling {
    Column* column;
    Cell_Node* cell;  ///< of the row being filled; null behind the last
    Filling filling;
    std::int64_t rows_to_redo = 0;  ///< rows filled with numbers before the column became Text
};

/// A text of fewer cells than this is never refused; above, most of its cells must be there.
constexpr std::int64_t Always_Allowed_Cells = 40'000'000;
constexpr std::int64_t Cells_Per_Byte = 2;

/// A few hostile bytes could ask for any number of cells: a long first line, then short ones.
bool Cells_Are_Plausible(std::int64_t rows, std::int64_t columns, std::size_t bytes)
{
    if (rows * columns <= std::max(Always_Allowed_Cells, Cells_Per_Byte * static_cast<std::int64_t>(bytes)))
        return true;
    return Fail("Error: %li rows of %li columns are too many for a text of %li characters.\n",
                static_cast<long>(rows), static_cast<long>(columns), static_cast<long>(bytes));
}

class Sheet_Filler {
public:
    Sheet_Filler(Sheet& sheet, Text_Shape& shape, const Text_Scan_Options& options, const Text_Buffer& buffer)
        : sheet_(sheet), shape_(shape), walker_(options, buffer), trim_(options.trim_cells),
          text_(buffer.text)
    {
        for (Column* column = sheet.first_column->next; column != nullptr; column = column->next)
            Start_Column(column);
    }

    bool Fill()
    {
        walker_.Go_To(walker_.First_Line());
        if (shape_.has_names)
            Fill_Names();
        const char* const first_row = walker_.Place();
        if (!Fill_Rows())
            return false;
        walker_.Go_To(first_row);
        Redo_Rows();
        return true;
    }

private:
    void Start_Column(Column* column);
    void Fill_Names();
    void Name_Column(Column& column, std::string_view text);
    bool Fill_Rows();
    void Redo_Rows();
    void Fill_Row();
    void Fill_Number(const Text_Field& field, Column_Filling& state);
    void Fill_Checked(const Text_Field& field, Column_Filling& state);
    void Fill_Text(const Text_Field& field, Column_Filling& state);
    void Turn_To_Text(Column_Filling& state);
    std::string_view Text_Of(const Text_Field& field, bool& unquoted);
    bool Add_Late_Column();

    Sheet& sheet_;
    Text_Shape& shape_;
    Field_Walker walker_;
    bool trim_;
    std::string_view text_;
    std::vector<Column_Filling> columns_;
    std::int64_t row_ = 0;
    bool columns_full_ = false;
    bool failed_ = false;
    std::string undoubled_;
};

void Sheet_Filler::Start_Column(Column* column)
{
    const Column_Scan& scan = shape_.types[columns_.size()];
    const Filling filling = Is_Text_Like(column->type)    ? Filling::texts
                            : scan.type == Undecided_Type ? Filling::numbers_so_far
                                                          : Filling::numbers;
    columns_.push_back({column, column->first_cell, filling});
}

void Sheet_Filler::Name_Column(Column& column, std::string_view text)
{
    column.name = Make_Valid_Name(Strip_Name_Mark(text));
    Use_Bracket_Text(column);
}

/// An empty field leaves a column the name it has.
void Sheet_Filler::Fill_Names()
{
    std::size_t index = 0;
    do {
        bool unquoted;
        const std::string_view name = Text_Of(walker_.Next(), unquoted);
        if (index < columns_.size() && (!name.empty() || unquoted))
            Name_Column(*columns_[index].column, name);
        ++index;
    } while (walker_.Has_More());
}

/// A field's text: without its quotes, if it has them, and with doubled ones inside made single.
std::string_view Sheet_Filler::Text_Of(const Text_Field& field, bool& unquoted)
{
    std::string_view content = walker_.Content(field);
    unquoted = content.data() != field.first && (content.data()[-1] == '"' || content.data()[-1] == '\'');
    const char pair[] = {unquoted ? content.data()[-1] : '\0', unquoted ? content.data()[-1] : '\0'};
    const std::string_view doubled(pair, 2);
    if (unquoted && content.find(doubled) != std::string_view::npos) {
        undoubled_.clear();
        for (std::size_t i = 0; i < content.size(); ++i) {
            undoubled_ += content[i];
            if (content.substr(i, 2) == doubled)
                ++i;
        }
        content = undoubled_;
    }
    content = content.substr(0, Long_Text_Width);
    return trim_ ? Trim_Copy(content) : content;
}

void Sheet_Filler::Fill_Text(const Text_Field& field, Column_Filling& state)
{
    bool unquoted;
    std::string_view content = Text_Of(field, unquoted);
    if (content.empty())
        return;
    if (content.size() >= Long_Field && state.column->type == text_column)
        state.column->type = long_text_column;
    if (content == "*" && !unquoted)
        content = {};
    Set_Cell_From_Text(*state.column, *state.cell, content);
}

/// The column's numbers so far are taken back; their text is fetched in a second walk.
void Sheet_Filler::Turn_To_Text(Column_Filling& state)
{
    Column& column = *state.column;
    column.type = text_column;
    column.format = general_format;
    column.decimals = 0;
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        cell->value.text = Text_Arena::Empty();
    state.filling = Filling::texts;
    state.rows_to_redo = row_;
    shape_.types[static_cast<std::size_t>(&state - columns_.data())].type = text_column;
}

/// A field that is not simply a number up to its separator.
void Sheet_Filler::Fill_Checked(const Text_Field& field, Column_Filling& state)
{
    double value;
    switch (Kind_Of_Field(walker_.Content(field), field.quoted, value)) {
    case Field_Kind::number:
        state.cell->value.number = value;
        break;
    case Field_Kind::nothing:
        break;
    case Field_Kind::text:
        if (state.filling == Filling::numbers_so_far) {
            Turn_To_Text(state);
            Fill_Text(field, state);
        }
        break;
    }
}

/// The quick road: a number that fills its field, as most do.
inline void Sheet_Filler::Fill_Number(const Text_Field& field, Column_Filling& state)
{
    const Parsed_Number parsed = Parse_Number_In_Buffer(field.first);
    if (parsed.end == field.last && parsed.status == Number_Status::good) [[likely]]
        state.cell->value.number = std::min(parsed.value, Greatest_Number);
    else
        Fill_Checked(field, state);
}

/// A line with more fields than any that the scan saw.
bool Sheet_Filler::Add_Late_Column()
{
    const auto columns = static_cast<std::int64_t>(columns_.size()) + 1;
    if (columns > request.Max_Columns) {
        if (!columns_full_)
            Report_Message_Long("Maximum number of columns (%li) exceeded.\nIgnoring extra columns.\n",
                                request.Max_Columns);
        columns_full_ = true;
        return false;
    }
    Column* const column =
        Cells_Are_Plausible(sheet_.row_count, columns, text_.size())
            ? New_Data_Column(&sheet_, variate_column,
                              Default_Column_Name(static_cast<std::int32_t>(columns)), sheet_.row_count)
            : nullptr;
    if (column == nullptr) {
        failed_ = true;
        return false;
    }
    shape_.types.emplace_back();
    shape_.columns = static_cast<std::int32_t>(columns);
    Start_Column(column);
    columns_.back().cell = Cell_At(column, static_cast<std::int32_t>(row_));
    return true;
}

/// Columns without a field in this line move on to the next row too.
void Sheet_Filler::Fill_Row()
{
    std::size_t index = 0;
    do {
        if (index == columns_.size() && (columns_full_ || !Add_Late_Column())) [[unlikely]] {
            walker_.Skip_Line();
            return;
        }
        Column_Filling& state = columns_[index++];
        Cell_Node* const cell = state.cell;
        const Text_Field field = walker_.Next();
        if (state.filling <= Filling::numbers)
            Fill_Number(field, state);
        else if (state.filling == Filling::texts)
            Fill_Text(field, state);
        state.cell = cell->next;
    } while (walker_.Has_More());
    for (; index < columns_.size(); ++index)
        columns_[index].cell = columns_[index].cell->next;
}

bool Sheet_Filler::Fill_Rows()
{
    constexpr std::ptrdiff_t progress_step = std::ptrdiff_t{1} << 22;
    const char* told = walker_.Place();
    for (row_ = 0; row_ < sheet_.row_count && !failed_; ++row_) {
        Fill_Row();
        if (walker_.Place() - told >= progress_step) {
            told = walker_.Place();
            Show_Progress("Reading", told - text_.data(), static_cast<std::int64_t>(text_.size()));
        }
    }
    return !failed_;
}

/// Columns that turned into Text late get the texts of their first rows.
void Sheet_Filler::Redo_Rows()
{
    std::int64_t rows = 0;
    for (Column_Filling& state : columns_) {
        rows = std::max(rows, state.rows_to_redo);
        state.filling = state.rows_to_redo > 0 ? Filling::texts : Filling::passed_over;
        state.cell = state.column->first_cell;
    }
    columns_full_ = true;
    for (row_ = 0; row_ < rows; ++row_) {
        Fill_Row();
        for (Column_Filling& state : columns_)
            if (row_ + 1 == state.rows_to_redo)
                state.filling = Filling::passed_over;
    }
}

}  // namespace

Sheet* Setup_Text_Sheet(const Text_Shape& shape, std::int32_t default_type)
{
    const std::int64_t rows = shape.rows - (shape.has_names ? 1 : 0);
    if (rows > std::numeric_limits<std::int32_t>::max()) {
        Report_Message_Long("Error: %li rows are more than a spreadsheet holds.\n", static_cast<long>(rows));
        return nullptr;
    }
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = New_Sheet_With_Rows(static_cast<std::int32_t>(rows));
    if (sheet == nullptr)
        return nullptr;
    for (std::int32_t index = 0; index < shape.columns; ++index) {
        const std::int32_t type = shape.types[static_cast<std::size_t>(index)].type;
        Column* const column = New_Data_Column(sheet, type == Undecided_Type ? default_type : type,
                                               Default_Column_Name(index + 1), sheet->row_count);
        if (column == nullptr) {
            Current_Sheet = earlier;
            return nullptr;
        }
        column->width = 6;
    }
    return sheet;
}

bool Fill_Text_Sheet(Sheet* sheet, Text_Shape& shape, const Text_Scan_Options& options,
                     const Text_Buffer& buffer)
{
    return sheet != nullptr && Sheet_Filler(*sheet, shape, options, buffer).Fill();
}

bool Text_Fits_In_Memory(const Text_Shape& shape, std::size_t bytes)
{
    return Cells_Are_Plausible(shape.rows, shape.columns, bytes);
}

}  // namespace ingester

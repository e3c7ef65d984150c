#include "statfiles/shared/row_filler.h"

#include "model/calendar.h"
#include "model/cell_text.h"
#include "model/claims.h"
#include "support/progress.h"

#include <algorithm>
#include <utility>

namespace ingester {

namespace {

/// A block stays in the processor's near memory while its columns are filled one after the other.
constexpr std::size_t Block_Bytes = std::size_t{1} << 17;
constexpr std::size_t Most_Block_Rows = 4096;

/// Rows between two looks at how far all is.
constexpr std::size_t Told_Step = std::size_t{1} << 16;

}  // namespace

Row_Filler::Row_Filler(Sheet& sheet, std::size_t row_size, std::vector<Row_Field> plan,
                       const Row_Texts& texts, std::int64_t file_bytes)
    : sheet_(sheet), row_size_(row_size), plan_(std::move(plan)), texts_(texts), selection_(Narrow_Rows()),
      missing_(sheet.missing_value), last_day_(Max_Date(1)),
      most_rows_(Most_Rows(std::ssize(plan_), file_bytes))
{}

void Row_Filler::Expect(std::int64_t rows)
{
    rows = std::min(rows, most_rows_);
    if (selection_.active)
        rows = std::min<std::int64_t>(rows, std::ssize(selection_.flags));
    for (Cell_Appender& cells : Make_Appenders(sheet_, sheet_.first_column->next, rows + 1, &ahead_))
        cells_.push_back(cells);
}

std::size_t Row_Filler::Rows_Per_Block() const
{
    return std::clamp<std::size_t>(Block_Bytes / std::max<std::size_t>(row_size_, 1), 1, Most_Block_Rows);
}

/// Brings the rows that are kept together. How many there are.
std::size_t Row_Filler::Keep_Wanted(std::byte* rows, std::size_t count)
{
    numbers_.clear();
    for (std::size_t i = 0; i < count; ++i) {
        const std::int64_t row = rows_ + static_cast<std::int64_t>(i);
        if (!selection_.Keeps(row))
            continue;
        std::memmove(rows + numbers_.size() * row_size_, rows + i * row_size_, row_size_);
        numbers_.push_back(row + 1);
    }
    return numbers_.size();
}

bool Row_Filler::Count(std::size_t rows, std::size_t kept)
{
    rows_ += static_cast<std::int64_t>(rows);
    kept_ += static_cast<std::int64_t>(kept);
    told_ += rows;
    if (told_ >= Told_Step) {
        told_ = 0;
        ahead_.Come_To(static_cast<std::size_t>(kept_) * sizeof(Cell_Node));
    }
    return rows_ <= most_rows_
           || Fail("Error: More than %li rows of %li columns are too many for this file.\n",
                   static_cast<long>(most_rows_), static_cast<long>(std::ssize(plan_)));
}

bool Row_Filler::Take(std::byte* rows, std::size_t count)
{
    Row_Block block{rows, row_size_, count, rows_ + 1};
    if (selection_.active) {
        block.count = Keep_Wanted(rows, count);
        block.numbers = numbers_.data();
    }
    for (Row_Field& field : plan_)
        field.fill(*this, field, block);
    return Count(count, block.count);
}

void Row_Filler::Append_Number(Row_Field& field, double value)
{
    const std::int64_t row = rows_ + 1;
    if (!(value > missing_ && value <= Greatest_Number)) [[unlikely]]
        value = Unusual_Number(field, nullptr, value, row);
    else if (field.missing.Holds(value))
        value = Merged(field, value, row);
    if (field.dated && value > missing_)
        value = Dated(field, value, row);
    Cells_Of(field).Append({.number = value});
}

bool Row_Filler::End_Row(bool kept)
{
    return Count(1, kept ? 1 : 0);
}

double Row_Filler::Unusual_Number(Row_Field& field, const std::byte* stored, double value, std::int64_t row)
{
    if (!(value > missing_))
        return settle ? settle(field, stored, value, row) : missing_;
    if (infinity_is_missing && value > std::numeric_limits<double>::max())
        return missing_;
    return field.missing.Holds(value) ? Merged(field, value, row)
                                      : held_.Held_Number(value, *field.column, row);
}

double Row_Filler::Merged(Row_Field& field, double value, std::int64_t row) const
{
    if (field.merged++ == 0) {
        char room[Number_Text_Room];
        field.first_merged_row = row;
        field.merged_example.assign(room, Print_General(room, value, 15));
    }
    return missing_;
}

double Row_Filler::Dated(Row_Field& field, double value, std::int64_t row) const
{
    const double days = field.epoch.To_Days(value);
    if (!(days >= 0.0 && days < last_day_ + 1.0) && field.not_shown++ == 0)
        field.first_not_shown_row = row;
    return days;
}

void Row_Filler::Set_Whole_Text(Row_Field& field, Cell_Node& cell, std::string_view text, std::int64_t row)
{
    if (std::ranges::find(field.missing_texts, text) == field.missing_texts.end())
        return Set_Wide_Text(*field.column, cell, text, row);
    if (field.merged++ == 0) {
        field.first_merged_row = row;
        field.merged_example = text;
    }
}

void Row_Filler::Append_Text(Row_Field& field, std::string_view text, std::int64_t row)
{
    Column& column = *field.column;
    Cell_Node& cell = Cells_Of(field).Append({.text = Text_Arena::Empty()});
    text = Without_Blanks(text, false);
    if (text.empty())
        return;
    if (texts_.crossing != nullptr) {
        texts_.crossing->Go_To_Row(row);
        text = texts_.crossing->Cross(text);
    }
    if (texts_.whole)
        return Set_Whole_Text(field, cell, Without_Blanks(text, texts_.trim_front), row);
    const std::string_view kept = First_Letters(text, Text_Cell_Width);
    if (kept.size() < text.size())
        Note_Loss(Loss_Kind::text_cut, column.name, row, text);
    Set_Text(column, cell, Without_Blanks(kept, texts_.trim_front));
}

void Fill_Texts(Row_Filler& filler, Row_Field& field, const Row_Block& block)
{
    const std::byte* stored = block.rows + field.offset;
    filler.Go_To(*field.column);
    for (std::size_t i = 0; i < block.count; ++i, stored += block.row_size)
        filler.Append_Text(field, {reinterpret_cast<const char*>(stored), field.width}, block.Number_Of(i));
}

void Fill_Texts_In_Pieces(Row_Filler& filler, Row_Field& field, const Row_Block& block)
{
    std::string text;
    const std::byte* row = block.rows + field.offset;
    filler.Go_To(*field.column);
    for (std::size_t i = 0; i < block.count; ++i, row += block.row_size) {
        text.clear();
        for (const std::byte* piece = row; text.size() < field.width; piece += Piece_Stride)
            text.append(reinterpret_cast<const char*>(piece),
                        std::min(Piece_Length, field.width - text.size()));
        filler.Append_Text(field, text, block.Number_Of(i));
    }
}

void Row_Filler::Note_Losses() const
{
    for (const Row_Field& field : plan_) {
        if (field.merged > 0)
            Note_Loss(Loss_Kind::missing_codes_merged, field.column->name, field.first_merged_row,
                      field.merged_example, field.merged);
        if (field.not_shown > 0)
            Note_Loss(Loss_Kind::date_out_of_range, field.column->name, field.first_not_shown_row, {},
                      field.not_shown);
    }
}

bool Row_Filler::Finish()
{
    for (Cell_Appender& cells : cells_)
        cells.Finish(static_cast<std::int32_t>(kept_));
    Expect_Rows(&sheet_, static_cast<std::int32_t>(kept_));
    Note_Losses();
    return rows_ > 0;
}

bool Fill_From_File(Row_Filler& filler, Input_File& file, std::int64_t end, std::int64_t most_rows,
                    const Rows_Before_End& rows_before_end)
{
    const auto size = static_cast<std::int64_t>(filler.Row_Size());
    const auto block_rows = static_cast<std::int64_t>(filler.Rows_Per_Block());
    std::vector<std::byte> buffer(static_cast<std::size_t>(size * block_rows));
    while (true) {
        const std::int64_t left = std::max<std::int64_t>(end - file.Position(), 0) / size;
        const auto wanted = static_cast<std::size_t>(size * std::min({block_rows, left, most_rows}));
        const std::size_t rows = file.Read(buffer.data(), wanted) / filler.Row_Size();
        const Row_Block block{buffer.data(), filler.Row_Size(), rows, filler.Rows() + 1};
        const std::size_t in_front = rows_before_end ? rows_before_end(block) : rows;
        if (!filler.Take(buffer.data(), in_front))
            return false;
        if (in_front < rows || rows == 0)
            break;
        most_rows -= static_cast<std::int64_t>(rows);
        Show_Progress("Reading", file.Position(), end);
    }
    return !file.Failed();
}

}  // namespace ingester

// Files of rows of a fixed size into cells, by a plan that is made once from what the file tells of its
// columns.
#pragma once

#include "model/cell_appender.h"
#include "model/sheet.h"
#include "model/subset.h"
#include "platform/files.h"
#include "platform/memory_ahead.h"
#include "request/text_crossing.h"
#include "statfiles/shared/epoch.h"
#include "statfiles/shared/held_numbers.h"
#include "statfiles/shared/missing_rule.h"
#include "support/byte_fields.h"
#include "support/text.h"

#include <cstddef>
#include <cstdint>
#include <cstring>
#include <functional>
#include <limits>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

class Row_Filler;
struct Row_Field;
struct Row_Block;

/// Appends a block's cells of one field.
using Fill_Cells = void (*)(Row_Filler& filler, Row_Field& field, const Row_Block& block);

/// A column's place in the rows.
struct Row_Field {
    Column* column = nullptr;
    std::size_t offset = 0;
    std::size_t width = sizeof(double);  ///< in bytes; of a text in pieces, that of all of it
    Fill_Cells fill = nullptr;
    Missing_Rule missing = {};
    Epoch epoch = {};
    bool dated = false;                           ///< `epoch` shifts its numbers
    std::vector<std::string> missing_texts = {};  ///< as the cells would hold them

    // While it is filled.
    std::int64_t merged = 0;  ///< numbers that became missing by the rule
    std::int64_t first_merged_row = 0;
    std::string merged_example = {};
    std::int64_t not_shown = 0;  ///< dates in front of the first day, or behind the last
    std::int64_t first_not_shown_row = 0;
};

/// Some rows, one behind the other.
struct Row_Block {
    const std::byte* rows = nullptr;
    std::size_t row_size = 0;
    std::size_t count = 0;
    std::int64_t first_row = 0;             ///< in the file, from 1
    const std::int64_t* numbers = nullptr;  ///< of each row, where some between were left out

    [[nodiscard]] std::int64_t Number_Of(std::size_t i) const
    {
        return numbers != nullptr ? numbers[i] : first_row + static_cast<std::int64_t>(i);
    }
};

/// A text of a fixed width without the blanks at its end; what stands behind a NUL is none of it.
[[nodiscard]] inline std::string_view Without_Blanks(std::string_view text, bool at_front)
{
    text = text.substr(0, text.find('\0'));
    return at_front ? Trim_Copy(text) : text.substr(0, text.find_last_not_of(' ') + 1);
}

/// What is done with the texts of a file.
struct Row_Texts {
    bool trim_front = false;  ///< blanks at their ends always go
    bool whole = false;  ///< those beyond a text cell's width make their column Long Text; else they are cut
    Text_Crossing* crossing = nullptr;  ///< into the request's code
};

/// What a number is that no cell holds as it stands: not one, or below all that are present.
using Settle_Number =
    std::function<double(const Row_Field& field, const std::byte* stored, double value, std::int64_t row)>;

class Row_Filler {
public:
    /// The rows that a request keeps are filled into the columns of `plan`; more of them than a file of
    /// `file_bytes` may stand for are refused.
    Row_Filler(Sheet& sheet, std::size_t row_size, std::vector<Row_Field> plan, const Row_Texts& texts,
               std::int64_t file_bytes);

    /// What becomes of numbers that no cell holds, else they are missing; and whether infinity is one.
    Settle_Number settle = {};
    bool infinity_is_missing = true;

    /// Makes the cells ready: about so many rows are to come.
    void Expect(std::int64_t rows);

    /// The next rows of the file, in this memory, which may be changed. False when there are too many.
    [[nodiscard]] bool Take(std::byte* rows, std::size_t count);

    // The same value by value, for files whose rows have no fixed size.
    [[nodiscard]] std::span<Row_Field> Fields() { return plan_; }
    [[nodiscard]] bool Keeps_Next_Row() const { return selection_.Keeps(rows_); }
    void Append_Number(Row_Field& field, double value);
    void Append_Text(Row_Field& field, std::string_view text)
    {
        Go_To(*field.column);
        Append_Text(field, text, rows_ + 1);
    }
    /// Ends a row, of which `kept` tells whether it was filled. False when there are too many.
    [[nodiscard]] bool End_Row(bool kept);

    /// Rows of the file so far.
    [[nodiscard]] std::int64_t Rows() const { return rows_; }
    [[nodiscard]] std::size_t Row_Size() const { return row_size_; }
    /// How many rows are best handed over at a time.
    [[nodiscard]] std::size_t Rows_Per_Block() const;

    /// Ends the columns and gives the Sheet its rows; what was lost goes to the ledger. False where the file
    /// has none.
    [[nodiscard]] bool Finish();

    /// Which have been cut down to the greatest.
    [[nodiscard]] Held_Numbers& Held() { return held_; }

    // For those that fill.
    [[nodiscard]] double Missing() const { return missing_; }
    [[nodiscard]] Cell_Appender& Cells_Of(const Row_Field& field) { return cells_[Place_Of(field)]; }
    [[nodiscard]] double Unusual_Number(Row_Field& field, const std::byte* stored, double value,
                                        std::int64_t row);
    [[nodiscard]] double Merged(Row_Field& field, double value, std::int64_t row) const;
    [[nodiscard]] double Dated(Row_Field& field, double value, std::int64_t row) const;
    /// The texts that come are of this column.
    void Go_To(const Column& column) const
    {
        if (texts_.crossing != nullptr)
            texts_.crossing->Go_To(column.name);
    }
    void Append_Text(Row_Field& field, std::string_view text, std::int64_t row);

private:
    [[nodiscard]] std::size_t Place_Of(const Row_Field& field) const
    {
        return static_cast<std::size_t>(&field - plan_.data());
    }
    static void Set_Whole_Text(Row_Field& field, Cell_Node& cell, std::string_view text, std::int64_t row);
    [[nodiscard]] std::size_t Keep_Wanted(std::byte* rows, std::size_t count);
    [[nodiscard]] bool Count(std::size_t rows, std::size_t kept);
    void Note_Losses() const;

    Sheet& sheet_;
    std::size_t row_size_;
    std::vector<Row_Field> plan_;
    Row_Texts texts_;
    Row_Selection selection_;
    std::vector<std::int64_t> numbers_;  ///< of the rows kept in a block
    std::vector<Cell_Appender> cells_;
    Memory_Ahead ahead_;
    Held_Numbers held_;
    double missing_;
    double last_day_;
    std::int64_t most_rows_;
    std::int64_t rows_ = 0;
    std::int64_t kept_ = 0;
    std::size_t told_ = 0;
};

/// Fills by a decoder: `static double Decode(const std::byte* stored, std::size_t width)`.
template <class Decoder> void Fill_Numbers(Row_Filler& filler, Row_Field& field, const Row_Block& block)
{
    const double missing = filler.Missing();
    const bool has_rule = !field.missing.Is_Empty();
    const bool dated = field.dated;
    const std::size_t width = field.width;
    Cell_Appender cells = filler.Cells_Of(field);
    const std::byte* stored = block.rows + field.offset;
    for (std::size_t i = 0; i < block.count; ++i, stored += block.row_size) {
        double value = Decoder::Decode(stored, width);
        if (!(value > missing && value <= Greatest_Number)) [[unlikely]]
            value = filler.Unusual_Number(field, stored, value, block.Number_Of(i));
        else if (has_rule && field.missing.Holds(value))
            value = filler.Merged(field, value, block.Number_Of(i));
        if (dated && value > missing)
            value = filler.Dated(field, value, block.Number_Of(i));
        cells.Append({.number = value});
    }
    filler.Cells_Of(field) = cells;
}

/// Numbers of eight bytes in an order.
template <std::endian order> struct Stored_Double {
    static double Decode(const std::byte* stored, std::size_t) { return Number_At<double, order>(stored); }
};

[[nodiscard]] inline Fill_Cells Fill_Doubles(std::endian order)
{
    return order == std::endian::little ? Fill_Numbers<Stored_Double<std::endian::little>>
                                        : Fill_Numbers<Stored_Double<std::endian::big>>;
}

/// Texts that fill their width with blanks, or end at a NUL.
void Fill_Texts(Row_Filler& filler, Row_Field& field, const Row_Block& block);

/// Texts of more than `Piece_Length` bytes, which lie in pieces `Piece_Stride` bytes apart.
constexpr std::size_t Piece_Length = 255;
constexpr std::size_t Piece_Stride = 256;
void Fill_Texts_In_Pieces(Row_Filler& filler, Row_Field& field, const Row_Block& block);

/// Tells how many rows of a block stand in front of the end of the data.
using Rows_Before_End = std::function<std::size_t(const Row_Block& block)>;

/// Fills by the rows that stand in a file from here to the position `end`, `most_rows` at most; half a row at
/// the end is let go. False when there are too many rows.
[[nodiscard]] bool Fill_From_File(Row_Filler& filler, Input_File& file, std::int64_t end,
                                  std::int64_t most_rows, const Rows_Before_End& rows_before_end = {});

}  // namespace ingester

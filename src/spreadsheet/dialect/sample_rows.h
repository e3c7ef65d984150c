// Parts of a text, cut into rows of fields by a dialect that is tried.
#pragma once

#include "spreadsheet/dialect/text_dialect.h"

#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <vector>

namespace ingester {

/// Pieces of a text, which begin and end with lines.
struct Text_Sample {
    std::vector<std::string_view> pieces;
    bool whole = false;          ///< one piece is all of it
    const char* last = nullptr;  ///< of the text, where it goes on behind its pieces; else null

    [[nodiscard]] bool Holds(std::string_view found) const;
};

/// A short text whole; else its start, and a little of its middle and its end.
[[nodiscard]] Text_Sample Take_Sample(std::string_view text);

struct Sample_Field {
    std::string_view text;  ///< without its quotes and outer blanks
    bool quoted = false;
    bool odd = false;  ///< a quote stands where none should
};

struct Sample_Row {
    const char* first = nullptr;
    std::size_t begin = 0;  ///< its first field among all
    std::int32_t count = 0;
    bool empty = false;    ///< no field says anything
    bool comment = false;  ///< it begins with a sign that marks comments
};

/// What a sample holds by one dialect.
class Sample_Rows {
public:
    Sample_Rows(const Text_Sample& sample, const Text_Dialect& dialect);

    [[nodiscard]] const std::vector<Sample_Row>& Rows() const { return rows_; }
    [[nodiscard]] std::span<const Sample_Field> Fields(const Sample_Row& row) const
    {
        return std::span(fields_).subspan(row.begin, static_cast<std::size_t>(row.count));
    }
    /// Rows of the first piece.
    [[nodiscard]] std::size_t Head_Rows() const { return head_rows_; }
    /// Where the last piece's rows begin.
    [[nodiscard]] std::size_t Tail_Start() const { return tail_start_; }

private:
    void Cut_Piece(std::string_view piece, const char* reach, const Text_Dialect& dialect);
    void Cut_Row(const char*& at, const char* last, const char* reach, const Text_Dialect& dialect);
    void Drop_Inside_Of_Quotes(std::size_t first, char quote);

    std::vector<Sample_Field> fields_;
    std::vector<Sample_Row> rows_;
    std::size_t head_rows_ = 0;
    std::size_t tail_start_ = 0;
    bool reads_on_ = false;  ///< a text in quotes goes on behind its piece
};

/// The field count that most rows with content have, and how many have it.
struct Usual_Count {
    std::int32_t count = 0;
    std::int64_t rows = 0;
    std::int64_t near_rows = 0;  ///< with a field more or less
    std::int64_t all = 0;
};
[[nodiscard]] Usual_Count Find_Usual_Count(std::span<const Sample_Row> rows);

}  // namespace ingester

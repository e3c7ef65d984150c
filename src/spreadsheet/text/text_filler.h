// The fields of a text on their way into the cells of its Sheet.
#pragma once

#include "model/cell_appender.h"
#include "model/spellings.h"
#include "model/subset.h"
#include "request/losses.h"
#include "spreadsheet/dialect/field_kind.h"
#include "spreadsheet/text/text_format.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// What is done with the fields of a column.
enum class Filling : std::uint8_t {
    numbers_so_far,  ///< undecided: numbers until a field says otherwise
    numbers,         ///< a Variate by its mark: what isn't a number is missing
    moments,         ///< dates or times, until a field is none
    texts,
    left_out,  ///< a Variate without cells, which goes when the text is read
};

struct Column_Filling {
    Column* column;
    Cell_Appender cells;
    Filling filling = Filling::numbers_so_far;
    std::int64_t rows_to_redo = 0;  ///< rows filled with numbers before the column became Text
    Cell_Node* cell_to_redo = nullptr;

    // For people only.
    std::int64_t gaps = 0;                     ///< rows in which no field says anything
    std::int64_t quoted = 0;                   ///< numbers and moments in quotes
    std::int64_t fractions = 0;                ///< moments with thousandths of a second
    Field_Sense sense = Field_Sense::nothing;  ///< of moments
    Spelling_Watch spelling;
};

class Sheet_Filler {
public:
    Sheet_Filler(Sheet& sheet, Text_Shape& shape, const Text_Scan_Options& options, const Text_Buffer& buffer,
                 File_Image* image);

    bool Fill();

    /// Takes out the columns that the request leaves out.
    void Drop_Left_Out();

private:
    [[nodiscard]] std::int64_t Expected_Rows() const;
    void Limit_Rows();
    void Start_Column(Column& column, const Cell_Appender& cells);
    void Fill_Names();
    void Name_Column(std::size_t index, std::string_view text);
    void Settle_Names();
    void Leave_Out(std::size_t index);
    void Leave_Out_Unlisted();
    void Take_Wanted_Types();
    bool Fill_Rows();
    void Finish_Rows(const char* last_line);
    void Report_Oddities() const;
    void Report_Cut_Texts() const;
    void Redo_Rows(const char* first_row);
    void Redo_Row();
    void Fill_Row();
    void Fill_Number(const Text_Field& field, Column_Filling& state);
    void Fill_Checked(const Text_Field& field, Column_Filling& state);
    void Fill_Text(const Text_Field& field, Column& column, Cell_Node& cell);
    void Put_Text(const Text_Field& field, Column& column, Cell_Node& cell);
    void Note_Field(Loss_Kind kind, const Column& column, const Text_Field& field) const;
    void Append_Blank(Column_Filling& state);
    void Turn_To_Text(Column_Filling& state);
    static void Become(Column_Filling& state, std::int32_t type, Filling filling);
    std::string_view Text_Of(const Field_Content& content);
    std::string_view Said_By(const Field_Content& content);  ///< the same, for calls from elsewhere
    void Refuse_Extra_Columns();
    bool Add_Late_Column();
    bool Row_Is_Acceptable(const char* line);
    void Tell_Progress();
    void Make_Dates();

    // For people.
    void Fill_Names_In_Lines();
    void Fill_For_People(const Text_Field& field, Column_Filling& state);
    void Fill_Moment(const Text_Field& field, Column_Filling& state);
    void Begin_Moments(Column_Filling& state, const Iso_Moment& moment);
    void Take_Moment(Column_Filling& state, const Iso_Moment& moment);
    bool Rewrite_Line(const Text_Field& field);
    bool Ends_Table();
    void Settle_Quoted_Columns();
    void Settle_Moments();
    void Settle_Spellings();
    void Watch_Spelling(std::string_view text, Column_Filling& state);
    void Redo_Spelling(const Text_Field& field, Column_Filling& state);
    void Leave_Out_Last_Columns();
    [[nodiscard]] bool Names_Alone() const;
    [[nodiscard]] bool Says_Nothing(std::string_view text) const;

    Sheet& sheet_;
    Text_Shape& shape_;
    Field_Walker walker_;
    bool trim_;
    bool cells_may_shift_;
    const Text_Buffer& buffer_;
    File_Image* image_;
    Cell_Value missing_;
    Cell_Value empty_;
    std::vector<Column_Filling> columns_;
    Memory_Ahead ahead_;
    std::int64_t row_ = 0;
    std::int64_t row_limit_ = 0;
    const char* told_ = nullptr;  ///< how far progress has been told
    bool columns_full_ = false;
    std::int64_t uneven_lines_ = 0;  ///< with fewer fields than there are columns
    long cut_texts_ = 0;
    Column_Subset subset_;
    bool no_number_is_missing_;  ///< else one does by `Missing_Input_Text`, and all are looked at
    std::string undoubled_;
    const Text_Dialect* dialect_;  ///< null for hosts
    Number_Marks marks_;
    bool edited_ = false;      ///< the image is no longer the file's
    bool bare_texts_ = false;  ///< texts without quotes have been seen
    int looks_at_tables_ = 0;
};

constexpr std::int32_t New_Column_Width = 6;
constexpr std::int64_t Spare_Rows = 8;
constexpr std::size_t Columns_Ahead = 12;

}  // namespace ingester

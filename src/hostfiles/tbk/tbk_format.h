// The layout of the host's book, for its reader, its writer and its updater.
//
// A head, and then records: a 16-bit type, the 32-bit length of what follows, and as many bytes. Between
// a start and an end record each stand the sections of the book, their sheets, and the columns of these.
#pragma once

#include "hostfiles/shared/host_sheet.h"
#include "model/sheet.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <limits>
#include <string_view>

namespace ingester {

/// What `format_version` is of a Sheet in a book.
constexpr std::int32_t Book_Version = 5;

/// The book begins with it; an order mark and the number of sections follow, 16 bits each.
constexpr std::string_view Book_Magic{"TBK\1KVX\0", 8};
constexpr std::uint16_t Order_Mark = 1;
constexpr std::size_t Book_Head_Size = 12;

constexpr std::size_t Record_Head_Size = 6;

enum Record_Type : std::uint16_t {
    book_start_record = 1,
    book_end_record = 2,
    sheet_table_record = 3,
    old_number_record = 4,
    old_words_record = 5,
    old_integer_record = 6,
    old_mark_a_record = 7,
    old_factor_record = 8,
    old_sheet_mark_record = 9,
    old_mark_b_record = 10,
    old_mark_c_record = 11,
    population_record = 12,
    source_file_record = 13,
    sheet_start_record = 16,
    sheet_end_record = 17,
    column_table_record = 18,
    structure_name_record = 19,
    table_shape_record = 20,
    table_factor_record = 21,
    margin_label_record = 22,
    analysis_record = 23,
    title_record = 24,
    current_cell_record = 25,
    host_pointer_record = 26,
    dde_link_record = 28,
    sheet_date_record = 29,
    split_column_record = 33,
    restriction_record = 34,
    conditional_mode_record = 35,
    hidden_map_record = 36,
    sheet_iprint_record = 37,
    old_sheet_mark_b_record = 38,
    conditional_background_record = 39,
    table_in_columns_record = 40,
    column_start_record = 64,
    column_end_record = 65,
    column_decimals_record = 66,
    number_cells_record = 81,
    text_cells_record = 82,
    long_text_cells_record = 83,
    factor_cells_record = 96,
    level_values_record = 97,
    level_labels_record = 98,
    reference_level_record = 99,
    recoded_record = 100,
    factor_colours_record = 101,
    attached_text_record = 112,
    column_extra_record = 113,
    range_limits_record = 114,
    gradient_record = 115,
    conditional_format_record = 116,
    column_date_record = 117,
    column_option_record = 118,
    table_level_record = 119,
    cell_colours_record = 120,
    column_iprint_record = 121,
    colour_source_record = 122,
    column_colours_record = 123,
    comments_start_record = 128,
    comments_end_record = 129,
    cell_comment_record = 130,
};

/// In `sheet_start_record`, in front of the name.
constexpr std::size_t Sheet_Facts_Size = 21;

/// The most that a text with a length of one byte can hold.
constexpr std::size_t Short_Text_Width = 255;

constexpr std::size_t Page_Name_Width = decltype(Sheet::sheet_name)::width;

/// Offsets in a book are signed words.
constexpr std::int64_t Greatest_Offset = std::numeric_limits<std::int32_t>::max();

constexpr std::int32_t Greatest_Record_Decimals = 18;
constexpr std::int32_t Greatest_IPRINT = 2;
constexpr std::int32_t Greatest_Pointer_Kind = 7;
constexpr std::int32_t Column_Factor_Date_Base = 64;  ///< a date above is a negative one

// --- Cells of Factors ------------------------------------------------------------------------------

/// A cell takes fewer bits where there are few levels.
struct Factor_Packing {
    std::int64_t below;  ///< levels
    int bits;
};
constexpr std::array<Factor_Packing, 5> Factor_Packings = {
    {{4, 2}, {16, 4}, {256, 8}, {65536, 16}, {std::numeric_limits<std::int64_t>::max(), 32}}};

/// Levels that a cell may have: a Table counts the margin as one more.
[[nodiscard]] inline std::int64_t Levels_Of_Cells(const Column& column)
{
    const Sheet& sheet = *column.sheet;
    return std::int64_t{column.nlevels} + (sheet.type == table_sheet && sheet.has_margins != 0 ? 1 : 0);
}

/// The length of the record of `cells` packed cells: half a byte more than none is a byte.
[[nodiscard]] constexpr std::int64_t Factor_Record_Length(const Factor_Packing& packing, std::int64_t cells)
{
    constexpr std::int64_t in_front = 9;
    const int to_a_byte = 8 / packing.bits;
    return to_a_byte > 1 ? (cells - 1) / to_a_byte + 1 + in_front : packing.bits / 8 * cells + in_front;
}

// --- Which columns ---------------------------------------------------------------------------------

[[nodiscard]] inline bool Is_Short_Text(const Column& column)
{
    return column.type == text_column || column.type == units_text_column;
}

[[nodiscard]] inline bool Is_Plain_Number(const Column& column)
{
    return !Is_Text_Like(column.type) && column.type != factor_column;
}

[[nodiscard]] inline bool Has_Column_Option(const Column& column)
{
    return column.type == factor_column || Is_Text_Like(column.type);
}

/// The body of a Table whose columns are labelled.
[[nodiscard]] inline bool Is_Labelled_Table_Column(const Column& column)
{
    return column.type == table_column && Is_Many_Way_Table(*column.sheet)
           && column.sheet->table_in_columns == 0;
}

/// A Sheet whose columns have identifiers, where others have labels.
[[nodiscard]] inline bool Has_Identifiers(const Sheet& sheet)
{
    return sheet.type == vector_sheet || sheet.type == scalar_sheet
           || (sheet.type == table_sheet && (sheet.table_ways == 1 || sheet.table_in_columns != 0));
}

/// Bytes of a vector of a bit for each row.
[[nodiscard]] constexpr std::int64_t Bit_Vector_Size(std::int64_t rows)
{
    return (rows - 1) / 8 + 1;
}

}  // namespace ingester

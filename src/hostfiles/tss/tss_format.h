// The layout of the host's spreadsheet file, for its reader and its writer.
//
// The file is a stream without record marks: a head, a block by the type of Sheet, a record for each
// column, and then the records that bits of the head announce. All numbers are 32-bit integers or doubles;
// a counted text is its length and its bytes.
#pragma once

#include "hostfiles/shared/host_sheet.h"
#include "model/host_fields.h"
#include "model/sheet.h"

#include <cstdint>
#include <tuple>

namespace ingester {

constexpr std::int32_t Written_Version = 3;

/// The first word of a file in the order of the machine that wrote it. Files in front of version 1 have
/// none: they begin with the Sheet's type.
struct TSS_Magic {
    std::uint32_t word;
    std::int32_t version;
};
constexpr TSS_Magic TSS_Magics[] = {{0x033E5051, 3}, {0x032DAE14, 2}, {0x032D8703, 1}};

// --- Runs of numbers -------------------------------------------------------------------------------

/// A number of a record: where it is kept, and the first version whose files have it. A record's layout is
/// the list of these.
template <class Record, class Number> struct Field {
    constexpr Field(Number Record::*kept_in, std::int32_t first_version = 0)
        : member(kept_in), since(first_version)
    {}

    Number Record::*member;
    std::int32_t since;
};

struct Head_Record {
    std::int32_t sheet_type = 0;
    std::int32_t column_count = 0;  ///< with the row marks
    std::int32_t row_count = -1;
    double missing_value = 0;
    std::int32_t host_flag_a = 0;
    std::int32_t read_only = 0;
    std::int32_t present_flags = 0;
    std::int32_t reserved = 0;
    std::int32_t pointer_length = 0;  ///< of a name that stands behind it
};
constexpr std::tuple Head_Fields{Field{&Head_Record::sheet_type},       Field{&Head_Record::column_count},
                                 Field{&Head_Record::row_count},        Field{&Head_Record::missing_value},
                                 Field{&Head_Record::host_flag_a, 2},   Field{&Head_Record::read_only, 3},
                                 Field{&Head_Record::present_flags, 3}, Field{&Head_Record::reserved, 3},
                                 Field{&Head_Record::pointer_length, 3}};

/// Of a Table, in front of the names of one with two or more ways.
struct Table_Record {
    std::int32_t table_ways = 0;
    std::int32_t has_margins = 0;
    std::int32_t has_second_margin = 0;  ///< of two or more ways only
};

/// Of each column, behind its type, length, name and description; the attached text follows.
struct Display_Record {
    std::int32_t format = 0;
    std::int32_t width = 0;
    std::int32_t justify = 0;
    std::int32_t date_word = 0;   ///< `date_form` * 64 + `date_format`
    std::int32_t flags_word = 0;  ///< protected + 2 * `extra_flag` + 256 * `column_option`
};
constexpr std::tuple Display_Fields{Field{&Display_Record::format, 1}, Field{&Display_Record::width, 1},
                                    Field{&Display_Record::justify, 2}, Field{&Display_Record::date_word, 3},
                                    Field{&Display_Record::flags_word, 3}};

constexpr std::int32_t Date_Word_Base = 64;
constexpr std::int32_t Greatest_Date_Code = 40;

/// Of a Factor; `decimals` follows where there are level values, and the width of the labels where there
/// are labels. Then come the values, the labels and the cells.
struct Factor_Record {
    std::int32_t level_count = 0;
    std::int32_t value_count = 0;
    std::int32_t label_count = 0;
    std::int32_t factor_kind = 0;
};
constexpr std::tuple Factor_Fields{Field{&Factor_Record::level_count}, Field{&Factor_Record::value_count},
                                   Field{&Factor_Record::label_count}, Field{&Factor_Record::factor_kind, 2}};

/// The record of the rows' restrictions, which counts as a column: one number for each row.
constexpr std::int32_t Row_Marks_Type = 21;

// --- What follows the columns ----------------------------------------------------------------------

/// Bits of `present_flags`, each for a record behind the columns but for those that are flags themselves.
enum Present_Flag : std::uint32_t {
    print_block_bit = 1U << 0,
    bookmarks_bit = 1U << 1,
    analysis_bit = 1U << 2,
    title_bit = 1U << 3,
    current_cell_bit = 1U << 4,
    pointers_bit = 1U << 5,
    ignored_integers_bit = 1U << 6,
    host_flag_b_bit = 1U << 7,  ///< no record
    conditions_bit = 1U << 9,
    range_limits_bit = 1U << 10,
    dde_link_bit = 1U << 11,
    gradients_bit = 1U << 12,
    host_flag_c_bit = 1U << 13,  ///< no record
    creation_dates_bit = 1U << 14,
    split_column_bit = 1U << 15,
    saved_restrictions_bit = 1U << 16,
    page_name_bit = 1U << 18,
    column_factor_bit = 1U << 19,
    reference_levels_bit = 1U << 20,
    cell_colours_bit = 1U << 21,
    iprint_bit = 1U << 22,
    hidden_columns_bit = 1U << 23,
    factor_colours_bit = 1U << 24,
    recode_genotypes_bit = 1U << 25,    ///< no record
    cond_on_background_bit = 1U << 26,  ///< no record
    trial_seasons_bit = 1U << 27,
    column_colours_bit = 1U << 28,
    table_in_columns_bit = 1U << 29,  ///< no record
};

struct Current_Cell_Record {
    std::int32_t column = 0;
    std::int32_t row = 0;  ///< from 1
};
constexpr std::tuple Current_Cell_Fields{Field{&Current_Cell_Record::column},
                                         Field{&Current_Cell_Record::row}};

/// One of the three rules of a column.
struct Condition_Record {
    std::int32_t op = 0;
    double value = 0;
    std::int32_t colour = 0;
};
constexpr std::tuple Condition_Fields{Field{&Condition_Record::op}, Field{&Condition_Record::value},
                                      Field{&Condition_Record::colour}};

struct Range_Record {
    std::int32_t ordinal = 0;
    double low = 0;
    double high = 0;
};
constexpr std::tuple Range_Fields{Field{&Range_Record::ordinal}, Field{&Range_Record::low},
                                  Field{&Range_Record::high}};

struct Gradient_Record {
    std::int32_t ordinal = 0;
    std::int32_t scale = 0;
    std::int32_t reversed = 0;
    double low = 0;
    double high = 0;
    double strength = 0;
};
constexpr std::tuple Gradient_Fields{Field{&Gradient_Record::ordinal},  Field{&Gradient_Record::scale},
                                     Field{&Gradient_Record::reversed}, Field{&Gradient_Record::low},
                                     Field{&Gradient_Record::high},     Field{&Gradient_Record::strength}};

/// The factor across a Table's columns, behind its description.
struct Column_Factor_Record {
    std::int32_t format = 0;
    std::int32_t date_word = 0;
    std::int32_t decimals = 0;
};
constexpr std::tuple Column_Factor_Fields{Field{&Column_Factor_Record::format},
                                          Field{&Column_Factor_Record::date_word},
                                          Field{&Column_Factor_Record::decimals}};

/// A number that one column has: its reference level, or its IPRINT setting.
struct Setting_Record {
    std::int32_t ordinal = 0;
    std::int32_t value = 0;
};
constexpr std::tuple Setting_Fields{Field{&Setting_Record::ordinal}, Field{&Setting_Record::value}};

constexpr std::tuple Cell_Colour_Fields{Field{&Cell_Colour::row}, Field{&Cell_Colour::text_colour},
                                        Field{&Cell_Colour::back_colour}};

struct Column_Colours_Record {
    std::int32_t ordinal = 0;
    std::int32_t text_colour = 0;
    std::int32_t back_colour = 0;
};
constexpr std::tuple Column_Colours_Fields{Field{&Column_Colours_Record::ordinal},
                                           Field{&Column_Colours_Record::text_colour},
                                           Field{&Column_Colours_Record::back_colour}};

// --- Limits ----------------------------------------------------------------------------------------

constexpr std::int32_t Most_Table_Ways = 9;
constexpr std::int32_t Greatest_Text_Block = 10000000;

/// Doubles that are moved at once.
constexpr std::size_t Numbers_Per_Block = 8192;

}  // namespace ingester

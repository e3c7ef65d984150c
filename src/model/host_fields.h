// What Sheets and Columns hold for the host's window only: nothing here changes what the data are, and
// all of it is kept from one of the host's files to the next. Colours are 0x00BBGGRR.
#pragma once

#include "support/fixed_text.h"

#include <array>
#include <cstdint>
#include <string>
#include <vector>

namespace ingester {

struct Column;

/// The colours of one cell.
struct Cell_Colour {
    std::int32_t row;
    std::int32_t text_colour;
    std::int32_t back_colour;
};

/// A list of columns that the host knows by a name.
struct Host_Pointer {
    std::string name;
    std::int32_t kind = 0;             ///< 0: its members are listed; 4: all Variates
    std::vector<std::string> members;  ///< of kind 0
};

/// A restriction that was put aside under a name.
struct Saved_Restriction {
    std::string name;
    std::string bits;  ///< bit i % 8 of byte i / 8 is 1 where row i (from 0) is restricted
};

constexpr std::size_t Condition_Count = 3;

struct Column_Host_Fields {
    Fixed_Text<60> table_label;  ///< text label of a Table's column
    std::string attached_text;   ///< the calculation that the host makes the column by
    std::int32_t attached_mode = 0;
    std::int32_t column_option = 0;
    std::int16_t extra_flag = 0;
    std::int16_t cond_active = 0;  ///< cells are coloured by the conditions
    std::array<std::int16_t, Condition_Count> cond_op{};
    std::array<double, Condition_Count> cond_value{};
    std::array<std::int32_t, Condition_Count> cond_colour{};
    std::int32_t gradient_scale = 0;  ///< above 0: cells are coloured by their value
    std::int16_t gradient_reversed = 0;
    double gradient_low = 0;
    double gradient_high = 0;
    double gradient_strength = 0;
    double creation_date = 0;         ///< 0: not known
    std::int16_t factor_recoded = 0;  ///< levels stand for genotypes
    std::int16_t hidden = 0;
    std::vector<Cell_Colour> cell_colours;
    std::int32_t iprint = 0;
    Column* colour_source = nullptr;  ///< the Factor whose colours paint the cells; see `has_colour_sources`
    std::int32_t text_colour = 0;
    std::int32_t back_colour = 0;
    std::int32_t reference_level = 0;
    std::vector<std::int32_t> factor_colours;  ///< one for each level
};

struct Sheet_Host_Fields {
    std::int32_t column_factor_format = 0;  ///< how the factor across a Table's columns is shown
    std::int32_t column_factor_date = 0;    ///< negative: day counts
    std::int32_t column_factor_decimals = 0;
    std::int16_t has_second_margin = 0;
    std::int16_t table_in_columns = 0;
    std::int16_t labelled_columns = 0;
    std::int32_t margin_level = 0;  ///< of the last classifying Factor
    std::int16_t host_flag_a = 0;
    std::int16_t host_flag_b = 0;
    std::int16_t host_flag_c = 0;
    std::int16_t title_cleared = 0;  ///< the user emptied the title
    std::string analysis_setup;      ///< commands, a NUL behind each
    std::int32_t analysis_setup_count = 0;
    std::string analysis_commands;  ///< the same
    std::int32_t analysis_command_count = 0;
    Fixed_Text<60> analysis_dummy;
    std::int16_t analysis_dummy_plain = 0;
    std::vector<Host_Pointer> pointers;
    std::int16_t cond_mode = 0;
    std::int16_t cond_on_background = 0;
    std::string dde_topic;
    std::string dde_source;
    std::string dde_item;
    std::string dde_extra;
    std::array<std::int16_t, 4> dde_flags{};
    double creation_date = 0;
    std::int16_t split_set = 0;
    std::int32_t split_column = 0;
    std::vector<Saved_Restriction> saved_restrictions;
    std::int32_t iprint = 0;
    std::int16_t population_set = 0;
    std::uint8_t population_code = 0;     ///< of marker data
    std::int16_t has_short_columns = 0;   ///< some end before the last row: a Vector's may
    std::int16_t has_colour_sources = 0;  ///< some Column may have one, to be cleared when that one goes
};

}  // namespace ingester

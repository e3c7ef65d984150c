// What the host lets its users set, with the defaults of a new request.
#pragma once

#include "support/fixed_text.h"

#include <array>
#include <cstdint>
#include <string_view>

namespace ingester {

/// Month and day names begin and end with a mark that no date holds.
constexpr std::string_view Name_List_Mark = "***";

/// One record for the request (`Get_Settings`), and a copy of it in every Sheet.
struct Settings {
    std::int16_t delete_empty_rows = 1;   ///< empty rows are removed after reading
    std::int16_t trim_cells = 1;          ///< text cells lose their outer blanks
    std::int16_t auto_factors = 1;        ///< levels of new Factors are sorted
    std::int16_t date_form = 0;           ///< of new Columns: 0 spreadsheet serials, 1 day count
    std::int16_t ignore_value_case = 0;   ///< case of factor labels in some sources
    std::int16_t csv_quote_text = 1;      ///< text is quoted in comma text
    std::int16_t csv_title = 1;           ///< fixed-width text begins with a title line
    std::int16_t bracket_names = 1;       ///< quoted suffixes of names become numbers
    std::int32_t date_format = 1;         ///< date display code of new Columns
    std::int32_t max_factor_levels = 50;  ///< most distinct values that suggest a Factor
    Fixed_Text<8> column_prefix = "C";    ///< of automatic column names
    bool prefix_given = false;            ///< the user chose `column_prefix`
    Fixed_Text<8> date_template = "DD.MM.YY";
    Fixed_Text<8> header_prefix = "%";    ///< of a name made from a number
    std::int32_t next_column_number = 1;  ///< counter of `Default_Column_Name`

    std::array<Fixed_Text<22>, 14> month_names = {
        Name_List_Mark, "January", "February",  "March",   "April",    "May",      "June",
        "July",         "August",  "September", "October", "November", "December", Name_List_Mark};
    std::array<Fixed_Text<3>, 14> month_abbreviations = {Name_List_Mark, "Jan", "Feb", "Mar",         "Apr",
                                                         "May",          "Jun", "Jul", "Aug",         "Sep",
                                                         "Oct",          "Nov", "Dec", Name_List_Mark};
    std::array<Fixed_Text<15>, 9> day_names = {Name_List_Mark, "Sunday",    "Monday",
                                               "Tuesday",      "Wednesday", "Thursday",
                                               "Friday",       "Saturday",  Name_List_Mark};
};

/// The settings of the request that runs.
[[nodiscard]] Settings& Get_Settings();

}  // namespace ingester

// What the three kinds of SPSS files tell of their variables, and the Columns that these become.
#pragma once

#include "model/sheet.h"
#include "request/text_crossing.h"
#include "statfiles/shared/missing_rule.h"
#include "statfiles/shared/row_filler.h"
#include "statfiles/shared/value_labels.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// How numbers are shown: of the packed word, the lowest byte is the decimals.
struct Spss_Format {
    std::int32_t decimals = 0;
    std::int32_t width = 0;
    std::int32_t code = 0;

    static Spss_Format Of_Packed(std::int32_t packed)
    {
        return {packed & 0xFF, packed >> 8 & 0xFF, packed >> 16 & 0xFF};
    }
};

/// Missing values of a variable that act; files may list more.
constexpr std::size_t Most_Missing_Values = 3;

/// Texts are in the file's code.
struct Spss_Variable {
    std::string name = {};       ///< the short one, without blanks at its end
    std::string long_name = {};  ///< empty: there is none
    std::string label = {};
    std::int32_t text_width = 0;  ///< in bytes; 0: a number
    std::size_t offset = 0;       ///< in a case
    bool in_pieces = false;       ///< of a very long text
    Spss_Format format = {};
    Missing_Rule missing = {};
    std::vector<std::string> missing_texts = {};
    std::int32_t label_set = -1;  ///< -1: none

    [[nodiscard]] bool Is_Text() const { return text_width > 0; }
    [[nodiscard]] const std::string& Full_Name() const { return long_name.empty() ? name : long_name; }
};

struct Spss_Dictionary {
    std::vector<Spss_Variable> variables = {};
    std::vector<Label_Set> label_sets = {};
    std::size_t case_size = 0;  ///< in bytes
};

/// A reading that has its dictionary: its Sheet, and what becomes of its texts.
struct Spss_Reading {
    Sheet* sheet = nullptr;
    Spss_Dictionary dictionary = {};
    std::vector<Column*> columns = {};  ///< by variable, null for those left out
    Text_Crossing crossing = {};        ///< from the file's code
    bool labels_by_case_free = false;
    bool formats_are_kept = true;  ///< decimals and widths of formats reach the Columns
};

/// By what a name is found: without case, and without the blanks at its end.
[[nodiscard]] std::string Name_Key(std::string_view name);

/// How far a variable's numbers lie from the day counts of its dates; false for one that holds none.
[[nodiscard]] bool Epoch_Of_Format(const Spss_Format& format, Epoch& epoch);

/// Takes a new Sheet, with a Column for each variable that the request keeps. Variables beyond the greatest
/// number are told, and have none. False for want of memory.
[[nodiscard]] bool Make_Spss_Columns(Spss_Reading& reading);

/// The plan by which cases become cells, with numbers filled by `fill_numbers`.
[[nodiscard]] std::vector<Row_Field> Plan_Of_Cases(Spss_Reading& reading, Fill_Cells fill_numbers);

/// What is done with the texts of cases.
[[nodiscard]] Row_Texts Texts_Of_Cases(Spss_Reading& reading);

/// Whether texts of a variable, in front of the limit of 90, are taken whole, and texts that its users have
/// declared missing are.
[[nodiscard]] bool Texts_Are_Whole();

/// Makes Factors of the Columns whose variables have labels.
void Label_Spss_Columns(Spss_Reading& reading);

}  // namespace ingester

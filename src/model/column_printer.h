// What the cells of a Column print as, on their way out of the model.
#pragma once

#include "model/iso_dates.h"
#include "model/number_format.h"
#include "model/sheet.h"
#include "support/number_text.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// How numbers print; dates print by their Column's format but where others are to read them.
enum class Number_Print : std::uint8_t {
    general,     ///< with `digits` digits
    by_format,   ///< by the Column's format and decimals
    as_said,     ///< the same where the Column says its decimals, else with all digits
    for_others,  ///< as any program reads the same again: all digits that it takes, ISO dates
};

struct Printing_Rules {
    Number_Print numbers = Number_Print::as_said;
    Number_Print level_values = Number_Print::as_said;
    int digits = 15;       ///< for `general`: a double holds so many decimal ones
    bool margins = false;  ///< one more level of a Table's Factor stands for its margin
};

/// What prints in the place of a missing number or level; a missing level of a Factor with labels is told
/// apart.
struct Missing_Prints {
    std::string_view number = "*";
    std::string_view label;
};

/// What the level values, or the labels, of a Factor print as, by level from 1 at 0. Labels stand where they
/// are kept; what is printed goes into `room`.
[[nodiscard]] std::vector<const char*> Printed_Levels(const Column& factor, Number_Print level_values,
                                                      int digits, Text_Arena& room);

/// Prints the cells of one Column. The lists of a Factor are looked at once, so they must stay as they are.
class Column_Printer {
public:
    enum class Kind : std::uint8_t { number, text, factor };

    explicit Column_Printer(const Column& column, const Printing_Rules& rules = {});

    [[nodiscard]] const Column& Printed() const { return *column_; }
    [[nodiscard]] Kind Kind_Of_Cells() const { return kind_; }

    /// What a cell prints as; valid until `room` (of `Number_Text_Room`) changes.
    [[nodiscard]] std::string_view Print(const Cell_Node& cell, char* room,
                                         const Missing_Prints& missing = {}) const;

    /// Prints a number that is not missing; nothing for a date that others can't read. Returns the end of the
    /// text.
    char* Print_Number(char* target, double value) const
    {
        if (digits_ > 0)
            return Print_General(target, value, digits_);
        return digits_ == Digits_Needed ? Print_Shortest(target, value) : Print_By_Column(target, value);
    }

    /// Whether a Factor's cell holds a level, a margin among them where the rules say so.
    [[nodiscard]] bool Is_Level(double value) const { return value >= 1.0 && value < level_end_; }

    /// Levels that have a label or a level value of their own.
    [[nodiscard]] std::int32_t Listed_Levels() const { return static_cast<std::int32_t>(levels_.size()); }

    /// What level `level` (from 1) prints as: its label, its value, or its number, printed into `room`;
    /// behind the last one the margin's label.
    [[nodiscard]] std::string_view Level(std::int32_t level, char* room) const
    {
        return level <= Listed_Levels() ? levels_[static_cast<std::size_t>(level) - 1]
                                        : Unlisted_Level(level, room);
    }

private:
    static constexpr int Digits_Needed = -1;  ///< to be read as the same number again

    char* Print_By_Column(char* target, double value) const;
    [[nodiscard]] std::string_view Unlisted_Level(std::int32_t level, char* room) const;

    const Column* column_;
    std::vector<std::string> levels_;  ///< short ones stand in the list itself, so that a look-up is one
    double level_end_ = 0;
    int digits_ = 0;  ///< 0: the Column decides
    Number_Print numbers_ = Number_Print::general;
    Iso_Form iso_form_ = Iso_Form::number;  ///< of dates, for others
    Kind kind_;
};

}  // namespace ingester

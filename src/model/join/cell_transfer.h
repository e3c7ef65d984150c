// Cells of one Column as cells of another.
#pragma once

#include "model/level_finder.h"
#include "model/sheet.h"
#include "support/distinct_keys.h"

#include <cstdint>
#include <vector>

namespace ingester {

/// The level of a Factor with just the label that a present number of `source` prints as, by its Column's
/// format or with the fewest digits that tell it; 0 for none.
[[nodiscard]] std::int32_t Level_Labelled_As(Level_Finder& levels, const Column& source, double number);

struct Transfer_Rules {
    double tolerance = 0.0;    ///< by which level values may differ, as a ratio
    bool ignore_case = false;  ///< of labels
    bool as_appended =
        false;  ///< numbers name labels by "%.20g" first, and hosts leave dates of levels as they are
    bool words_by_number = false;  ///< among numbers, labels stand for the numbers of their levels
};

/// Brings cells of one Column into another, whatever their types: levels are told by their labels or
/// values, dates change their form, numbers print into texts.
class Cell_Transfer {
public:
    /// Readies the way from `source` to `target`, which gets the levels, or the width, that it lacks.
    /// False for want of room.
    [[nodiscard]] bool Prepare(Column& target, const Column& source, const Transfer_Rules& rules);

    /// The Column whose cells are to be put: `source`, or what it had to become.
    [[nodiscard]] const Column& Source() const { return *source_; }
    [[nodiscard]] Column& Target() const { return *target_; }

    /// Puts the value of a cell of `Source()`.
    void Put(Cell_Node& to, const Cell_Value& from);

    /// Whether such a value is there at all.
    [[nodiscard]] bool Is_Missing(const Cell_Value& from) const;

    /// Some value that was there had no place in the target, or none of its own.
    [[nodiscard]] bool Has_Lost() const { return lost_; }

private:
    enum class Way : std::uint8_t {
        number,
        date,
        level,
        level_to_number,
        level_to_text,
        number_to_level,
        print,
        text,
        read
    };

    [[nodiscard]] bool Has_To_Be_Factor() const;
    [[nodiscard]] bool Make_Source_A_Factor();
    void Move_Dates(Column& copy);
    [[nodiscard]] bool Prepare_Levels();
    void Prepare_Printed_Levels();
    [[nodiscard]] double Value_Of_Level(double value) const;
    void Prepare_Numbers();
    void Prepare_Texts();
    void Make_Target_Long(bool longer) const;
    void Make_Levels_For_Numbers();
    [[nodiscard]] double Moved_Date(double value) const;
    [[nodiscard]] double Level_Of_Number(double value);
    [[nodiscard]] double Find_Level(double value);
    [[nodiscard]] double Find_Label(double value);
    [[nodiscard]] double Nearest_Of(double value);
    void Read_Text(Cell_Node& to, std::string_view text);
    void Put_Missing(Cell_Node& to) const;

    Column* target_ = nullptr;
    const Column* source_ = nullptr;
    Transfer_Rules rules_;
    Way way_ = Way::number;
    bool lost_ = false;
    std::vector<std::int32_t> level_map_;
    std::vector<double> numbers_;             ///< by level of the source
    std::vector<const char*> texts_;          ///< the same
    Distinct_Keys<double, Number_Keys> met_;  ///< numbers that were looked up as levels
    std::vector<double> met_levels_;
    Level_Finder levels_;  ///< of the target
};

}  // namespace ingester

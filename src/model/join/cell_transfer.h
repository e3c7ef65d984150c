// Cells of one Column as cells of another.
#pragma once

#include "model/level_finder.h"
#include "model/sheet.h"
#include "support/distinct_keys.h"

#include <cstdint>
#include <vector>

namespace ingester {

/// A copy of a Column in a Sheet of its own, as Text or Variate when it is a units column: for
/// conversions that must leave the Column itself alone. Null for want of room.
[[nodiscard]] Column* Copy_Column_Aside(const Column& column);

/// Adds a Column like `source`, with its look and its levels but without its data, behind those of `sheet`.
/// Null when the Sheet can't have it, mostly after a message.
[[nodiscard]] Column* Add_Column_Like(Sheet& sheet, const Column& source);

/// Brings cells of one Column into another, whatever their types: levels are told by their labels or
/// values, dates change their form, numbers print into texts.
class Cell_Transfer {
public:
    /// Readies the way from `source` to `target`, which gets the levels, or the width, that it lacks.
    /// False for want of room.
    [[nodiscard]] bool Prepare(Column& target, const Column& source, double tolerance, bool ignore_case);

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

    [[nodiscard]] bool Prepare_Levels(double tolerance, bool ignore_case);
    void Prepare_Numbers();
    void Prepare_Texts();
    [[nodiscard]] double Moved_Date(double value) const;
    [[nodiscard]] double Level_Of_Number(double value);
    [[nodiscard]] double Find_Level(double value);
    void Read_Text(Cell_Node& to, std::string_view text);
    void Put_Missing(Cell_Node& to) const;

    Column* target_ = nullptr;
    const Column* source_ = nullptr;
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

// Labels that a file gives to values of its variables: labelled variables become Factors.
#pragma once

#include "model/sheet.h"
#include "request/text_crossing.h"
#include "statfiles/shared/epoch.h"
#include "support/arena.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// Letters of a label that are kept.
constexpr std::size_t Value_Label_Width = 90;

/// Labels in the order of the file, in its code. Which of both values counts is a matter of the variable.
struct Label_Set {
    std::vector<double> values = {};      ///< of numbers
    std::vector<std::string> texts = {};  ///< of texts
    std::vector<const char*> labels = {};
    Text_Arena room = {};

    void Add(double value, std::string_view text, std::string_view label)
    {
        values.push_back(value);
        texts.emplace_back(text);
        labels.push_back(room.Store(label));
    }
};

/// How a variable's labels are applied.
struct Label_Terms {
    bool dated = false;  ///< the cells were shifted by `epoch`
    Epoch epoch = {};
    bool trim_front = false;    ///< texts of cells have lost the blanks at their front
    bool by_case_free = false;  ///< texts that differ in case alone are one level
    bool add_unused = false;    ///< labels that no cell has become levels as well
    std::size_t width = Value_Label_Width;
    Text_Crossing* crossing = nullptr;  ///< into the request's code
    /// Labels of no cell that all columns may still have together: a set of many may be that of many
    /// variables.
    std::int64_t unused_left = 500'000;
};

/// Makes a Factor of a Variate or a Text column, whose levels take the labels of their values. A column of
/// too many distinct values stays what it is, after a message. Labels beyond `unused_left` are entered in the
/// ledger.
void Apply_Value_Labels(Column& column, const Label_Set& set, Label_Terms& terms);

}  // namespace ingester

// Numbers of files that are greater than any that a cell holds.
#pragma once

#include "model/sheet.h"
#include "request/losses.h"
#include "request/messages.h"
#include "support/number_text.h"

#include <cstdint>
#include <string_view>

namespace ingester {

/// Cuts numbers down to `Greatest_Number`, and tells so once.
class Held_Numbers {
public:
    /// The number that `column` holds for `value`, of a row from 1.
    [[nodiscard]] double Held_Number(double value, const Column& column, std::int64_t row)
    {
        if (!(value > Greatest_Number))
            return value;
        constexpr int all_digits = 17;
        char room[Number_Text_Room];
        Note_Loss(Loss_Kind::number_clipped, column.name, row,
                  value > Greatest_Double ? "inf"
                                          : std::string_view(room, Print_General(room, value, all_digits)));
        any_ = true;
        return Greatest_Number;
    }

    /// `words`, with or without a "%s" for the greatest number, once all is read; nothing where none was cut.
    void Report(const char* words) const
    {
        if (any_)
            Report_Message_Text(words, "9.99999E+307");
    }

private:
    static constexpr double Greatest_Double = 1.7976931348623157e308;
    bool any_ = false;
};

/// What most formats say.
constexpr const char* Greater_Numbers_Were_Set = "Numbers greater than %s have been set to this value.\n";

}  // namespace ingester

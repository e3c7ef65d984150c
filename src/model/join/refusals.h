// Why a join can't be done.
#pragma once

#include "request/messages.h"

#include <initializer_list>
#include <string_view>

namespace ingester {

struct Join_Fault {
    bool holds;
    std::string_view words;
};

constexpr std::string_view Nothing_To_Join = "There is no table in the output that these data could join.\n";
constexpr std::string_view Output_Is_Read_Only =
    "The table in the output is read-only, and stays as it is.\n";
constexpr std::string_view No_Rows_To_Join = "The new data have no rows.\n";

/// Reports the first fault that holds; true when one does.
[[nodiscard]] inline bool Is_Refused(std::initializer_list<Join_Fault> faults)
{
    for (const Join_Fault& fault : faults)
        if (fault.holds)
            return !Fail(fault.words);
    return false;
}

}  // namespace ingester

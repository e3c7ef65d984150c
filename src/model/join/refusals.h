// Why a join can't be done: words that several have in common.
#pragma once

#include <string_view>

namespace ingester {

constexpr std::string_view Nothing_To_Join = "There is no table in the output that these data could join.\n";
constexpr std::string_view Output_Is_Read_Only =
    "The table in the output is read-only, and stays as it is.\n";
constexpr std::string_view No_Rows_To_Join = "The new data have no rows.\n";

}  // namespace ingester

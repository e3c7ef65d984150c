// What SAS files of every kind tell of their variables, and the Columns that these become.
#pragma once

#include "model/sheet.h"
#include "request/text_crossing.h"
#include "statfiles/shared/row_filler.h"

#include <cstdint>
#include <string>
#include <vector>

namespace ingester {

struct Sas_Variable {
    std::int32_t type = 0;    ///< a `Sas_Type`; others are passed over
    std::int32_t length = 0;  ///< in bytes
    std::int32_t offset = 0;  ///< in an observation
    std::string name = {};
    std::string label = {};
    std::string format = {};  ///< its name, all of its field
    std::int32_t decimals = 0;
};

struct Sas_Reading {
    Sheet* sheet = nullptr;
    std::vector<Sas_Variable> variables = {};
    std::int64_t row_size = 0;
    Text_Crossing crossing = {};
    const char* columns_beyond = nullptr;  ///< what is said of them
    std::int32_t longest_text = 0;         ///< that is no fault
};

/// Takes a new Sheet, with a Column for each variable that the request keeps, and makes the plan by which
/// rows become cells. False for a variable that can't be held, silently.
[[nodiscard]] bool Make_Sas_Columns(Sas_Reading& reading, Fill_Cells fill_numbers,
                                    std::vector<Row_Field>& plan);

}  // namespace ingester

// What the steps of the reader of system files hand to each other.
#pragma once

#include "platform/field_source.h"
#include "statfiles/spss/spss_dictionary.h"
#include "statfiles/spss/spss_system_format.h"

#include <array>
#include <cstdint>
#include <map>
#include <string>
#include <vector>

namespace ingester {

struct Spss_System_Reading {
    Field_Source source;
    Spss_Head head = {};
    Spss_Reading common = {};
    bool packed = false;                                  ///< by its magic
    std::vector<std::int32_t> variable_of_slot = {};      ///< -1: a further slot of one
    std::map<std::int32_t, std::string> extensions = {};  ///< bytes, by their `Spss_Extension`
};

/// Reads the records up to the end of the dictionary. False where one is faulty.
[[nodiscard]] bool Read_Spss_Records(Spss_System_Reading& reading);

/// Gives the variables what the extensions tell of them.
[[nodiscard]] bool Apply_Spss_Extensions(Spss_System_Reading& reading);

}  // namespace ingester

// The members of a transport file, each a table.
#pragma once

#include "platform/files.h"

#include <cstdint>
#include <string>
#include <vector>

namespace ingester {

struct Sas_Member {
    std::int64_t offset = 0;  ///< of its first header record
    std::string name = {};
};

/// Finds them all. False where the file isn't one of transport, or has none.
[[nodiscard]] bool Find_Sas_Members(Input_File& file, std::vector<Sas_Member>& members);

/// Finds the one that the request names, of several; the first where it names none. False after a message.
[[nodiscard]] bool Choose_Sas_Member(const std::vector<Sas_Member>& members, std::size_t& chosen);

/// Where the next header record of the file begins, from its place on, or where it ends.
[[nodiscard]] std::int64_t Next_Sas_Header(Input_File& file);

}  // namespace ingester

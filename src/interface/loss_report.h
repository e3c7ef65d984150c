// What a request could not keep, for its user: as messages, and as JSON.
#pragma once

#include <string_view>

namespace ingester {

/// Reports a line for each kind and column, where people asked to be told.
void Tell_Losses();

/// Writes all of the ledger as JSON. False after a message.
[[nodiscard]] bool Write_Loss_Report(std::string_view file_name);

}  // namespace ingester

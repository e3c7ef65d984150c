// The spine: one request from its two strings to the written output.
#pragma once

#include "interface/status.h"

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// Begins a request: its globals are fresh, the Sheets and messages of the one before are gone.
/// `stem` names the message file, `<temp><stem>.ERR`.
void Start_Request(std::string_view stem = {});

/// Runs every stage on the two strings. `rows` gets the number of rows of the Sheet that was written.
/// Start the request first.
[[nodiscard]] Request_Status Process_Request(std::string infile, std::string outfile, std::int32_t& rows);

}  // namespace ingester

// What was read goes together with what the output file holds already.
#pragma once

#include "interface/status.h"
#include "model/sheet.h"

#include <cstdint>
#include <string>

namespace ingester {

/// The keys on which a request merges.
constexpr std::int32_t Most_Asked_Keys = 4;

/// Read the file at `path` and join `sheet` with it: columns beside its columns, rows beneath its rows, or
/// rows on keys. The result becomes the `Current_Sheet`. A status after a message tells why it can't be;
/// the file itself stays as it is.
Request_Status Concatenate_With_Output(Sheet* sheet, const std::string& path);
Request_Status Append_To_Output(Sheet* sheet, const std::string& path);
Request_Status Merge_With_Output(Sheet* sheet, const std::string& path);

}  // namespace ingester

// Which reader a file-type code has, and which writer an extension. The one table that knows every
// format by name, put together from one of each family.
#pragma once

#include "interface/formats/format_driver.h"

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// All formats, by code.
[[nodiscard]] std::span<const Format_Driver> All_Formats();

/// The format of an output, by the name's extension, for people by the one in front of ".gz"; fixed-width
/// text for an unknown one.
[[nodiscard]] const Format_Driver& Output_Driver_Of(std::string_view file_name);

/// The format of a code, of an input or an output; null when there is none.
[[nodiscard]] const Format_Driver* Driver_Of_Code(std::int32_t code);

/// Whether an output is the text of fixed width that all unknown extensions give.
[[nodiscard]] bool Is_Fixed_Width_Text(const Format_Driver& driver);

/// The names of the sheets in a file of several, 4096 at most; none for any other file. Nothing when the
/// file can't be read.
[[nodiscard]] std::optional<std::vector<std::string>> List_Sheet_Names(const std::string& file_name);

/// Reads a file of a known type. Messages name it by `source_name`, or by the URL that it was fetched
/// from. False when no Sheet was made; formats without a reader give it without a message.
[[nodiscard]] bool Read_Data_File(const std::string& file_name, std::int32_t type,
                                  std::string_view source_name);

/// Whether a type is one of the host's own.
[[nodiscard]] bool Is_Host_File(std::int32_t type);

/// Whether what was read last is a file of the host's own, be it inside a compressed one.
[[nodiscard]] bool A_Host_File_Was_Read();

}  // namespace ingester

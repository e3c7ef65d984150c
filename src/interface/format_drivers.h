// Which reader a file-type code has, and which writer an extension. The one table that knows every
// format by name.
#pragma once

#include "model/sheet.h"
#include "request/request.h"

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// Readers leave their Sheet in `Current_Sheet`; false after a message.
using Reader = bool (*)(const char* file_name);
using Writer = bool (*)(Sheet* sheet, const char* file_name);
/// The names of a file's sheets, in order; nothing for a file that can't be understood.
using Sheet_Lister = std::optional<std::vector<std::string>> (*)(const char* file_name);

/// One format. Detection gives inputs their code, the extension gives it to outputs. A format that this
/// build knows by name only has neither `read` nor `write`.
struct Format_Driver {
    std::int32_t code;
    std::string_view name;
    Reader read = nullptr;
    std::string_view extensions = {};  ///< of outputs, with blanks between them
    Writer write = nullptr;
    std::int32_t max_columns = Default_Max_Columns;  ///< of outputs
    Sheet_Lister sheet_names = nullptr;              ///< of formats that hold several sheets
};

/// All formats, by code.
[[nodiscard]] std::span<const Format_Driver> All_Formats();

/// The format of an output, by the name's extension; fixed-width text for an unknown one.
[[nodiscard]] const Format_Driver& Output_Driver_Of(std::string_view file_name);

/// The format of an output code.
[[nodiscard]] const Format_Driver& Output_Driver_Of(std::int32_t code);

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

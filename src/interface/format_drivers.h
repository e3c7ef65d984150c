// Which reader a file-type code has, and which writer an extension. The one table that knows every
// format by name.
#pragma once

#include "model/sheet.h"

#include <cstdint>
#include <span>
#include <string_view>

namespace ingester {

/// Readers leave their Sheet in `Current_Sheet`; false after a message.
using Reader = bool (*)(const char* file_name);
using Writer = bool (*)(Sheet* sheet, const char* file_name);

/// A format that is read, under the code that detection gives it.
struct Input_Driver {
    std::int32_t code;
    std::string_view name;
    Reader read;
};

/// A format that is written, chosen by the output's extension. `write` is null for those that this
/// build knows by name only.
struct Output_Driver {
    std::string_view extension;
    std::int32_t code;
    std::string_view name;
    Writer write;
    std::int32_t max_columns;
};

/// The reader of a code, or null.
[[nodiscard]] Reader Reader_Of(std::int32_t code);

/// The driver of an output name; fixed-width text for an unknown extension.
[[nodiscard]] const Output_Driver& Output_Driver_Of(std::string_view file_name);

}  // namespace ingester

// The clipboard as an input and an output.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// The clipboard's text goes into the scratch file `name`. Tells how it went.
[[nodiscard]] bool Read_Clipboard_To_File(const std::string& name);

/// The bytes of `name` become the clipboard's text; the file goes if `remove` says so. Tells how it went.
[[nodiscard]] bool Put_File_On_Clipboard(const std::string& name, bool remove);

/// Names of inputs and outputs that stand for the clipboard.
[[nodiscard]] bool Is_Clipboard_Input(std::string_view name);
[[nodiscard]] bool Is_Clipboard_Output(std::string_view name);

}  // namespace ingester

// The clipboard of the desktop, through the programs that serve it (wl-clipboard, xclip).
#pragma once

#include <cstdint>
#include <string_view>

namespace ingester {

enum class Clipboard_Answer : std::uint8_t {
    done,
    unavailable,  ///< no display, or no program for it
    no_text,      ///< nothing that is text, or nothing at all
    failed,       ///< the file could not be made, or the program didn't end well
};

/// Copies the clipboard's text to a scratch file, in Windows-1252.
[[nodiscard]] Clipboard_Answer Copy_Clipboard_To(std::string_view scratch_name);

/// Makes a file's text, in Windows-1252 or UTF-8, the clipboard's.
[[nodiscard]] Clipboard_Answer Copy_To_Clipboard(std::string_view name);

}  // namespace ingester

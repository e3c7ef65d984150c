// Names of files that are not local ones.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// Whether a name begins with "ftp:", "http:", "https:" or "file:".
[[nodiscard]] bool Is_Url(std::string_view name);

/// Whether a name holds one of the tokens that stand for folders, as "%TEMP%", or begins with a variable
/// of the environment, as "%HOME%\\".
[[nodiscard]] bool Holds_Path_Token(std::string_view name);

/// Whether `name` is a scratch file of the host's own: in the temporary folder, beginning with the
/// request's `Return_Delete_Marker`, a ".TSS" or ".TBK".
[[nodiscard]] bool Is_Host_Scratch_File(std::string_view name);

/// Makes a local copy of a URL, under a scratch name that begins with `label`, and puts that into
/// `name`. True without doing anything for other names. False when the copy could not be made, and
/// `name` is as it was: this build has no transfer of its own yet.
[[nodiscard]] bool Fetch_Url(std::string& name, std::string_view label, std::string& source_url,
                             bool& downloaded);

}  // namespace ingester

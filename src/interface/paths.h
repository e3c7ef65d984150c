// Names of files that are not local ones.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// Whether a name begins with "ftp:", "http:", "https:" or "file:".
[[nodiscard]] bool Is_Url(std::string_view name);

/// Makes a local copy of a URL, under a scratch name that begins with `label`, and puts that into
/// `name`. True without doing anything for other names. False when the copy could not be made, and
/// `name` is as it was: this build has no transfer of its own yet.
[[nodiscard]] bool Fetch_Url(std::string& name, std::string_view label, std::string& source_url,
                             bool& downloaded);

}  // namespace ingester

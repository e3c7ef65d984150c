// Names as requests carry them: with tokens for folders, as URLs, or as the host's own scratch files.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// The longest name whose tokens are looked at, and the longest that comes of them.
constexpr std::size_t Longest_Token_Name = 1138;
constexpr std::size_t Longest_Expanded_Name = 280;

/// Whether a name begins with "ftp:", "http:", "https:" or "file:".
[[nodiscard]] bool Is_Url(std::string_view name);

/// Whether a name holds one of the tokens that stand for folders, as "%TEMP%", or begins with a variable
/// of the environment, as "%HOME%\".
[[nodiscard]] bool Holds_Path_Token(std::string_view name);

/// Puts the folder in the place of the first token in `name` and of all in front of it; then the value of a
/// variable at its start. A token without a value stands. URLs stay as they are.
void Expand_Path_Tokens(std::string& name, std::string_view temp_folder);

/// The host's stored number, or `otherwise` when it is none or not from `low` to `high`.
[[nodiscard]] std::int32_t Read_Host_Setting(std::string_view group, std::string_view key, std::int32_t low,
                                             std::int32_t high, std::int32_t otherwise);

/// What the host's scratch names begin with: "T181D" for its version 18.1, or for an unknown one.
[[nodiscard]] std::string Host_Delete_Marker();

/// Whether `name` is a scratch file of the host's own: in the temporary folder, beginning with the
/// request's `Return_Delete_Marker`, a ".TSS" or ".TBK".
[[nodiscard]] bool Is_Host_Scratch_File(std::string_view name);

/// Makes a local copy of a URL, under a scratch name in `temp_folder` that begins with `label`, and puts that
/// into `name`. True without doing anything for other names. False when the copy could not be made, and
/// `name` is as it was.
[[nodiscard]] bool Fetch_Url(std::string& name, std::string_view label, std::string& source_url,
                             const std::string& temp_folder, bool& downloaded);

}  // namespace ingester

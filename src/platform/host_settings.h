// What the host keeps for its library beside the requests: a file of settings, and where it is installed.
//
// The file is $TABULON_SETTINGS, else tabulon/settings.ini in the user's configuration folder: lines
// "[group]" and "key=value"; lines that begin with ";" or "#" are comments.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// The value of `key` in `group`, both in either case; empty when there is none.
[[nodiscard]] std::string Host_Setting(std::string_view group, std::string_view key);

/// The folder two levels above the running program, in its request form with a backslash at the end.
[[nodiscard]] std::string Install_Folder();

/// A variable of the environment; empty when there is none.
[[nodiscard]] std::string Environment_Value(std::string_view name);

}  // namespace ingester

// What is said of a command line that is wrong.
#pragma once

#include "command/options.h"

#include <string>
#include <string_view>

namespace CLI {
class App;
class ParseError;
}  // namespace CLI

namespace ingester {

/// The exit status of a wrong command line: what others use for it, and no status of a request.
constexpr int Usage_Error = 64;

/// Prints help, version or what is wrong, with the option that was probably meant. Returns the exit status.
[[nodiscard]] int End_Parsing(const CLI::App& app, const CLI::ParseError& end);

/// The task whose name was probably meant by a word that names no file and ends a command line too early;
/// empty for none.
[[nodiscard]] std::string_view Probable_Task(std::string_view word);

/// The commonest calls, for somebody who gave no argument.
void Print_Usage();

}  // namespace ingester

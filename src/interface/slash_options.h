// The option language: "/key" and "/key=value" anywhere in the Infile and Outfile strings.
#pragma once

#include <cstddef>
#include <span>
#include <string>
#include <string_view>

namespace ingester {

/// One option. `take` acts on what stands behind the key at `at` and returns the end of what it took.
struct Slash_Option {
    std::string_view key;
    std::size_t (*take)(std::string_view text, std::size_t at);
    std::string_view help;
};

/// The options of both strings, in the order in which they are searched.
[[nodiscard]] std::span<const Slash_Option> Input_Options();
[[nodiscard]] std::span<const Slash_Option> Output_Options();

/// Finds each option of the table in `text`, acts on it and cuts it out; what stays is the name.
void Cut_Options(std::span<const Slash_Option> options, std::string& text);

}  // namespace ingester

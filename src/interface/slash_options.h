// The option language: "/key" and "/key=value" anywhere in the Infile and Outfile strings.
#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// What stands behind an option of the command line that has a name.
enum class Value_Form : std::uint8_t {
    none,      ///< a flag
    bare,      ///< up to the next "/"
    range,     ///< "FIRST:LAST", numbers of which one may be left out
    quoted,    ///< any text
    path,      ///< a file: any text, with the separators of requests
    optional,  ///< bare, or left out
};

/// How the command line offers an option: as `--name VALUE`. Without a name it doesn't.
struct Named_Option {
    std::string_view name = {};
    Value_Form form = Value_Form::none;
    std::string_view value = {};       ///< the value in the help
    std::string_view join = "=";       ///< between key and value, unless the key ends with it
    std::string_view other_name = {};  ///< a second one, where the key does two things
    bool takes_empty = false;          ///< no text at all is a value
};

/// One option. `take` acts on what stands behind the key at `at` and returns the end of what it took.
struct Slash_Option {
    std::string_view key;
    std::size_t (*take)(std::string_view text, std::size_t at);
    std::string_view help;
    Named_Option named = {};
    bool of_some_readers = false;  ///< means nothing to formats that don't list it
};

/// The options of both strings, in the order in which they are searched; of the Infile those of
/// genotype files come first, by themselves.
[[nodiscard]] std::span<const Slash_Option> Genotype_Options();
[[nodiscard]] std::span<const Slash_Option> Input_Options();
[[nodiscard]] std::span<const Slash_Option> Output_Options();

/// Finds each option of the table in `text`, acts on it and cuts it out; what stays is the name. The keys
/// that were found, of the table.
std::vector<std::string_view> Cut_Options(std::span<const Slash_Option> options, std::string& text);

/// "/rewrite=n" in the Outfile: lines are to be joined until they hold `fields` fields.
struct Reflow_Order {
    bool asked = false;
    bool has_number = false;
    std::int32_t fields = 0;
};

/// Cuts that order out of `outfile`.
[[nodiscard]] Reflow_Order Take_Reflow_Order(std::string& outfile);

}  // namespace ingester

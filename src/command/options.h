// The command line.
#pragma once

#include "command/named_options.h"
#include "command/selection_lists.h"
#include "request/people_rules.h"

#include <bitset>
#include <optional>
#include <string>
#include <vector>

namespace ingester {

/// The exit status for what can't be asked of the library: among those of wrong command lines.
constexpr int Wrong_Values = 105;

/// The name that stands for standard input or output.
constexpr const char* Standard_Stream = "-";

struct Command_Options {
    std::string input;
    std::string output;
    std::string sheet;
    std::string range;
    std::string input_options;  ///< in the option language of requests, such as "/csv=2/n"
    std::string output_options;
    Given_Options named_input_options;  ///< added to `input_options` when the line is parsed
    Given_Options named_output_options;
    Chosen_Data chosen;
    std::vector<std::string> merge_keys;        ///< "key", or "key=key" of output and input
    std::bitset<People_Rule_Count> host_rules;  ///< the rules for people that are not asked for
    bool summary = false;                       ///< only describe the columns
    bool dry_run = false;                       ///< show the request, don't send it
    bool padded = false;                        ///< comma text keeps its columns under each other
    bool force = false;
    bool quiet = false;
    bool lines = false;  ///< standard output gets lines as the system ends them
};

/// The exit status when nothing is left to run: help and version were printed, or the command line
/// is wrong and that was said.
[[nodiscard]] std::optional<int> Parse_Command_Line(int argc, const char* const* argv,
                                                    Command_Options& options);

}  // namespace ingester

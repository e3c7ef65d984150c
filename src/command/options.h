// The command line.
#pragma once

#include "command/named_options.h"
#include "command/selection_lists.h"
#include "request/people_rules.h"

#include <bitset>
#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// What a command line asks for, by its first word.
enum class Task : std::uint8_t {
    convert,  ///< no such word
    info,
    head,
    summary,
    sheets,
    formats,
};

/// Words that begin a command line. A file of such a name is reached as "./formats".
struct Task_Name {
    Task task;
    std::string_view name;
    std::string_view description;
};
[[nodiscard]] std::span<const Task_Name> Task_Names();
[[nodiscard]] const Task_Name& Name_Of(Task task);

/// Calls of the command with what they do, and its exit status.
[[nodiscard]] std::string_view Command_Examples();

/// The name that stands for standard input or output.
constexpr const char* Standard_Stream = "-";

/// How rows are merged; the option language has a list file for the keys.
struct Merge_Choice {
    bool into_equal_names = false;
    std::string rows = "all";
};

struct Command_Options {
    Task task = Task::convert;
    std::string input;
    std::string output;
    std::string sheet;
    std::string range;
    std::string input_options;  ///< in the option language of requests, such as "/csv=2/n"
    std::string output_options;
    Given_Options named_input_options;  ///< added to `input_options` when the line is parsed
    Given_Options named_output_options;
    Chosen_Data chosen;
    Merge_Choice merge;
    std::vector<std::string> merge_keys;        ///< "key", or "key=key" of output and input
    std::bitset<People_Rule_Count> host_rules;  ///< the rules for people that are not asked for
    bool json = false;                          ///< what is told is for programs
    std::int32_t rows = 10;                     ///< that are shown at most
    bool dry_run = false;                       ///< show the request, don't send it
    bool padded = false;                        ///< comma text keeps its columns under each other
    bool force = false;
    bool quiet = false;
};

/// Takes the arguments behind the word of a task, which `argv` begins with. The exit status when nothing is
/// left to run: help and version were printed, or the command line is wrong and that was said.
[[nodiscard]] std::optional<int> Parse_Command_Line(int argc, const char* const* argv,
                                                    Command_Options& options);

/// Has `app` take all options of a task, into `options`, which must outlive it.
void Offer_Options(CLI::App& app, Command_Options& options);

}  // namespace ingester

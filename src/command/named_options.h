// The option language by names: `--missing NA` is "/x='NA'" behind the input.
#pragma once

#include "interface/slash_options.h"

#include <span>
#include <string>
#include <vector>

namespace CLI {
class App;
}

namespace ingester {

/// One option as the user gave it.
struct Given_Option {
    const Slash_Option* option;
    bool given = false;
    std::string value;
};

/// The named options of one of the request's strings.
using Given_Options = std::vector<Given_Option>;

/// Offers the options of the tables that have a name, under the heading `group`.
void Offer_Named_Options(CLI::App& app, const char* group,
                         std::span<const std::span<const Slash_Option>> tables, Given_Options& given);

/// What the given options are in the option language.
[[nodiscard]] std::string Spell_Options(const Given_Options& given);

/// Why the option language can't carry the value of one of them, and what to do; empty when it can.
[[nodiscard]] std::string Fault_Of_Options(const Given_Options& given);

/// The key of a given option that stands in `text` as well, in the option language; empty for none.
[[nodiscard]] std::string_view Key_Given_Twice(std::string_view text, const Given_Options& given);

}  // namespace ingester

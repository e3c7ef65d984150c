// Options beside the host's language: the rules for people, and what goes with them. Their keys begin with
// "/+", as no other key does, and may stand in either string.
#pragma once

#include "interface/slash_options.h"
#include "request/people_rules.h"

#include <bitset>
#include <span>
#include <string>
#include <string_view>

namespace ingester {

/// A rule, the key that asks for it, and the flag by which the command does without it.
struct People_Rule_Option {
    People_Rule rule;
    std::string_view key;
    std::string_view host_flag;
    std::string_view host_help;
};

[[nodiscard]] std::span<const People_Rule_Option> People_Rule_Options();

/// Those keys, as a string of options holds them, that ask for the rules in `wanted`.
[[nodiscard]] std::string Spell_People_Rules(const std::bitset<People_Rule_Count>& wanted);

/// What is no rule: options that carry a value, or refuse.
[[nodiscard]] std::span<const Slash_Option> People_Options();

/// Takes all of these out of both strings, in front of any other option.
void Take_People_Options(std::string& infile, std::string& outfile);

}  // namespace ingester

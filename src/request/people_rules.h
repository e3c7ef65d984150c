// What stands beside the host's rules, for people: each rule is off unless an option of its own asks for it.
#pragma once

#include <cstddef>
#include <cstdint>

namespace ingester {

/// A rule that serves people better than what hosts count on.
enum class People_Rule : std::uint8_t {
    utf8_text,        ///< all text of the request is UTF-8 instead of Windows-1252
    free_names,       ///< names stand as they are until a target's own rule changes them
    told_losses,      ///< what could not be kept is told at the end of the messages
    told_options,     ///< an option that means nothing to the input's format is told
    further_endings,  ///< outputs are known by endings that hosts don't use
    further_types,    ///< inputs are recognised that hosts take for text, or for nothing
    kept_levels,      ///< joins match levels by what they say and add new ones; labels of units are kept
    further_dates,    ///< dates are read in more of their usual forms
    plain_texts,      ///< comma text and tabs are written as other programs take them
    sniffed_texts,    ///< the dialect of a text is found from its lines, and its types as people mean them
    calendar_dates,   ///< dates of statistics files come and go by the calendar, durations as such
    whole_texts,      ///< texts of statistics files stay whole, and all that they tell of texts acts
};
constexpr std::size_t People_Rule_Count = 12;

/// Whether the request that runs asks for a rule.
[[nodiscard]] bool For_People(People_Rule rule);

/// Turns `utf8_text` on or off, before the request has any text of its own: the letters follow it.
void Use_Utf8_Text(bool on);

}  // namespace ingester

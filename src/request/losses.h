// The ledger of a request: what its readers, stages and writers could not keep.
#pragma once

#include <cstddef>
#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <unordered_map>
#include <vector>

namespace ingester {

enum class Loss_Kind : std::uint8_t {
    text_cut,              ///< a text beyond what the model or the target holds
    letter_replaced,       ///< "?" for a letter that the target's code lacks, or for malformed bytes
    name_changed,          ///< a column's name that the target can't hold as it stands
    number_clipped,        ///< a number beyond the greatest became the greatest
    number_not_held,       ///< a number that the target's form can't hold, or not with all its digits
    text_not_number,       ///< a text among numbers became missing
    date_out_of_range,     ///< a date or time that can't be held
    date_part_dropped,     ///< what stood behind a date, or a time, and was not understood
    label_dropped,         ///< a label that was left out, or two that became one
    missing_codes_merged,  ///< missing codes that differ became the one missing value
    beyond_limit,          ///< a column or row beyond what can be held
    metadata_dropped,      ///< what a column or table told of itself and the target can't hold
    input_unread,          ///< a part of the input that was not read
};
constexpr std::size_t Loss_Kind_Count = 13;

/// The losses of one kind in one column.
struct Loss {
    Loss_Kind kind = Loss_Kind::text_cut;
    std::string column;          ///< empty: of the whole table, or of columns beyond those listed
    std::int64_t first_row = 0;  ///< from 1; 0: of no row
    std::int64_t count = 0;
    std::string example;
};

/// Adding up is quick, and bounded: columns beyond `most_entries` share an entry a kind.
class Loss_Ledger {
public:
    static constexpr std::size_t most_entries = 1000;
    static constexpr std::size_t longest_example = 200;  ///< in letters

    /// `row` counts from 1, 0 for none; `example` is what was lost, or why.
    void Note(Loss_Kind kind, std::string_view column, std::int64_t row, std::string_view example,
              std::int64_t count = 1);

    /// Takes back what was noted: it could be kept in another way.
    void Withdraw(Loss_Kind kind, std::string_view column);

    /// Adds what another ledger holds.
    void Add(const Loss_Ledger& other);

    /// A part of the input, as "lines behind an empty line", is not in its Sheet: the file can't be replaced.
    void Note_Unread(std::string_view part, std::int64_t count = 1);

    /// The file that was read can't be replaced by its Sheet, though nothing was left unread.
    void Bar_Replacing(std::string_view why) { barred_.emplace(why); }

    /// Why that is so, the reason given last; empty when it can.
    [[nodiscard]] std::string Barred() const { return barred_.value_or(""); }

    /// In the order in which they were first noted.
    [[nodiscard]] const std::vector<Loss>& Entries() const { return entries_; }

private:
    Loss& Entry_Of(Loss_Kind kind, std::string_view column);
    [[nodiscard]] static std::string Key_Of_Entry(Loss_Kind kind, std::string_view column);

    std::vector<Loss> entries_;
    std::unordered_map<std::string, std::size_t> places_;  ///< of the entries, by kind and column
    std::optional<std::string> barred_;                    ///< a fresh ledger holds no memory
};

/// Enters a loss of the request that runs.
void Note_Loss(Loss_Kind kind, std::string_view column, std::int64_t row, std::string_view example,
               std::int64_t count = 1);

/// Whether what was lost so far may be; false after a message where the request is to be strict.
[[nodiscard]] bool Losses_Are_Allowed();

/// A kind in words, as "texts cut", and as one word for programs, as "text_cut".
[[nodiscard]] std::string_view Words_Of(Loss_Kind kind);
[[nodiscard]] std::string_view Key_Of(Loss_Kind kind);

}  // namespace ingester

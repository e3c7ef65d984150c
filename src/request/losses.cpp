#include "request/losses.h"

#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"

#include <algorithm>
#include <array>
#include <utility>

namespace ingester {

namespace {

struct Kind_Words {
    Loss_Kind kind;
    std::string_view key;
    std::string_view words;
};

constexpr std::array<Kind_Words, Loss_Kind_Count> Kinds = {{
    {Loss_Kind::text_cut, "text_cut", "texts cut"},
    {Loss_Kind::letter_replaced, "letter_replaced", "letters replaced by \"?\""},
    {Loss_Kind::name_changed, "name_changed", "names changed"},
    {Loss_Kind::number_clipped, "number_clipped", "numbers cut down to the greatest"},
    {Loss_Kind::number_not_held, "number_not_held", "numbers that can't be held"},
    {Loss_Kind::text_not_number, "text_not_number", "texts that are no numbers or dates"},
    {Loss_Kind::date_out_of_range, "date_out_of_range", "dates out of range"},
    {Loss_Kind::date_part_dropped, "date_part_dropped", "dates that were not read whole"},
    {Loss_Kind::label_dropped, "label_dropped", "labels dropped or merged"},
    {Loss_Kind::missing_codes_merged, "missing_codes_merged", "missing codes merged"},
    {Loss_Kind::beyond_limit, "beyond_limit", "columns or rows beyond a limit"},
    {Loss_Kind::metadata_dropped, "metadata_dropped", "descriptions and the like that are not kept"},
    {Loss_Kind::input_unread, "input_unread", "parts of the input not read"},
}};

constexpr bool Kinds_Are_In_Order()
{
    for (std::size_t i = 0; i < Kinds.size(); ++i)
        if (static_cast<std::size_t>(Kinds[i].kind) != i)
            return false;
    return true;
}

static_assert(Kinds_Are_In_Order());

}  // namespace

std::string Loss_Ledger::Key_Of_Entry(Loss_Kind kind, std::string_view column)
{
    return std::string(1, static_cast<char>(kind)).append(column);
}

Loss& Loss_Ledger::Entry_Of(Loss_Kind kind, std::string_view column)
{
    std::string key = Key_Of_Entry(kind, column);
    if (entries_.size() >= most_entries && !places_.contains(key)) {
        column = {};
        key = Key_Of_Entry(kind, column);
    }
    if (const auto found = places_.find(key); found != places_.end())
        return entries_[found->second];
    places_.emplace(std::move(key), entries_.size());
    Loss& loss = entries_.emplace_back();
    loss.kind = kind;
    loss.column = column;
    return loss;
}

void Loss_Ledger::Note(Loss_Kind kind, std::string_view column, std::int64_t row, std::string_view example,
                       std::int64_t count)
{
    Loss& loss = Entry_Of(kind, column);
    if (loss.count == 0) {
        loss.first_row = row;
        loss.example = First_Letters(example, longest_example);
        std::ranges::replace_if(
            loss.example, [](char c) { return c >= 0 && c < ' '; }, ' ');
    }
    loss.count += count;
}

void Loss_Ledger::Withdraw(Loss_Kind kind, std::string_view column)
{
    const auto found = places_.find(Key_Of_Entry(kind, column));
    if (found == places_.end())
        return;
    const std::size_t place = found->second;
    entries_.erase(entries_.begin() + static_cast<std::ptrdiff_t>(place));
    places_.erase(found);
    for (auto& [key, later] : places_)
        later -= later > place ? 1 : 0;
}

void Loss_Ledger::Add(const Loss_Ledger& other)
{
    for (const Loss& loss : other.entries_)
        Note(loss.kind, loss.column, loss.first_row, loss.example, loss.count);
    if (other.barred_)
        barred_ = other.barred_;
}

void Loss_Ledger::Note_Unread(std::string_view part, std::int64_t count)
{
    Note(Loss_Kind::input_unread, {}, 0, part, count);
    Bar_Replacing(std::string(part).append(" would be lost"));
}

void Note_Loss(Loss_Kind kind, std::string_view column, std::int64_t row, std::string_view example,
               std::int64_t count)
{
    request.losses.Note(kind, column, row, example, count);
}

bool Losses_Are_Allowed()
{
    return !request.Strict || request.losses.Entries().empty()
           || Fail("Error: The output was left as it was, since it can't hold all data as they are.\n");
}

std::string_view Words_Of(Loss_Kind kind)
{
    return Kinds[static_cast<std::size_t>(kind)].words;
}

std::string_view Key_Of(Loss_Kind kind)
{
    return Kinds[static_cast<std::size_t>(kind)].key;
}

}  // namespace ingester

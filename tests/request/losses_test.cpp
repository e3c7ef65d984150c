// The ledger: what it adds up, and that nothing makes it grow without end.
#include "request/losses.h"

#include "request/request.h"

#include <gtest/gtest.h>

namespace ingester {
namespace {

TEST(Losses, Add_Up_By_Kind_And_Column)
{
    Loss_Ledger ledger;
    ledger.Note(Loss_Kind::text_cut, "a", 7, "first of all");
    ledger.Note(Loss_Kind::letter_replaced, "a", 2, "x", 5);
    ledger.Note(Loss_Kind::text_cut, "b", 1, "y");
    ledger.Note(Loss_Kind::text_cut, "a", 3, "later", 2);
    ledger.Note_Unread("lines behind its end");
    ASSERT_EQ(ledger.Entries().size(), 4U);
    const Loss& loss = ledger.Entries().front();
    EXPECT_EQ(loss.count, 3);
    EXPECT_EQ(loss.first_row, 7);
    EXPECT_EQ(loss.example, "first of all");
    EXPECT_EQ(ledger.Barred(), "lines behind its end would be lost");

    Loss_Ledger other;
    other.Bar_Replacing("it is odd");
    other.Note(Loss_Kind::text_cut, "b", 9, "z", 4);
    ledger.Add(other);
    EXPECT_EQ(ledger.Entries()[2].count, 5);
    EXPECT_EQ(ledger.Entries()[2].first_row, 1);
    EXPECT_EQ(ledger.Barred(), "it is odd");

    ledger.Withdraw(Loss_Kind::letter_replaced, "a");
    ledger.Withdraw(Loss_Kind::date_out_of_range, "a");
    ledger.Note(Loss_Kind::text_cut, "b", 9, "z");
    ASSERT_EQ(ledger.Entries().size(), 3U);
    EXPECT_EQ(ledger.Entries()[1].count, 6);
}

TEST(Losses, Of_A_Million_Columns_Stay_Few)
{
    Loss_Ledger ledger;
    constexpr std::int64_t columns = 1'000'000;
    const std::string long_text(10'000, 'x');
    for (std::int64_t i = 0; i < columns; ++i)
        ledger.Note(static_cast<Loss_Kind>(i % static_cast<std::int64_t>(Loss_Kind_Count)),
                    "column " + std::to_string(i), i, long_text);
    EXPECT_LE(ledger.Entries().size(), Loss_Ledger::most_entries + Loss_Kind_Count);
    std::int64_t count = 0;
    for (const Loss& loss : ledger.Entries()) {
        count += loss.count;
        EXPECT_LE(loss.example.size(), Loss_Ledger::longest_example);
    }
    EXPECT_EQ(count, columns);
    EXPECT_EQ(ledger.Entries().back().column, "") << "columns beyond the limit share an entry a kind";
}

}  // namespace
}  // namespace ingester

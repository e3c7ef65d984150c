#include "support/check_sheet.h"
#include "support/request_fixture.h"

#include <sys/resource.h>

#include <random>

namespace ingester {
namespace {

static_assert(sizeof(Cell_Node) == 24 && sizeof(Row_Node) <= 24);

TEST(Cells, Texts_Stay_As_They_Were_Stored)
{
    std::mt19937 random(4);
    Text_Arena arena;
    std::vector<std::pair<std::string, const char*>> stored;
    for (int i = 0; i < 50000; ++i) {
        std::string text(random() % (i % 1000 == 0 ? 70000 : 12), static_cast<char>('a' + random() % 3));
        if (text.size() > 3)
            text[text.size() / 3] = static_cast<char>(random());
        const char* const kept = arena.Store(text);
        ASSERT_EQ(arena.Store(std::string(text)), kept);  // repeated texts cost nothing
        stored.emplace_back(text.substr(0, Text_Arena::greatest_length), kept);
    }
    for (const auto& [text, kept] : stored)
        ASSERT_TRUE(Text_Arena::View(kept) == text && kept[text.size()] == '\0');
}

using Cells_Without_Room = Request_Test;

TEST_F(Cells_Without_Room, Leave_The_Sheet_As_It_Was)
{
#ifdef INGESTER_SANITIZED
    GTEST_SKIP() << "sanitizers need all the address space";
#endif
    Sheet* const sheet = New_Sheet_With_Rows(2);
    Column* const column = New_Column(sheet, text_column, "x");
    rlimit before{};
    ASSERT_EQ(getrlimit(RLIMIT_AS, &before), 0);
    const rlimit narrow{300U << 20, before.rlim_max};  // one block fits
    ASSERT_EQ(setrlimit(RLIMIT_AS, &narrow), 0);
    constexpr std::int32_t too_many = 20'000'000;
    EXPECT_EQ(New_Data_Column(sheet, variate_column, "z", too_many), nullptr);
    EXPECT_FALSE(Fill_Column(column, text_column, too_many, 0, "text") || Make_Labels(*column, too_many));
    EXPECT_EQ(New_Sheet_With_Rows(too_many), nullptr);
    EXPECT_EQ(Alloc_Zeroed(std::size_t{1} << 40), nullptr);
    EXPECT_EQ(setrlimit(RLIMIT_AS, &before), 0);
    EXPECT_EQ(Current_Sheet, sheet);
    EXPECT_TRUE(Fill_Column(column, text_column, 2, 0, "text"));
    EXPECT_EQ(Check_Sheet(*sheet), "");
    const std::string out = "Ingester out of memory.\n";
    EXPECT_EQ(Messages(), out + out + out + out + "Error: Not enough memory to read data.\n:\n");
}

}  // namespace
}  // namespace ingester

#include "platform/memory_ahead.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <memory>
#include <vector>

#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

namespace ingester {
namespace {

struct Free {
    void operator()(std::uint64_t* words) const { std::free(words); }
};
using Words = std::unique_ptr<std::uint64_t, Free>;

constexpr std::size_t Region_Words = std::size_t{1} << 20;

Words New_Region()
{
    return Words(static_cast<std::uint64_t*>(std::malloc(Region_Words * sizeof(std::uint64_t))));
}

// What is filled while pages are asked for stays as it was filled, side by side or one after the other.
TEST(Memory_Ahead, LeavesWhatIsFilled)
{
    for (const bool limited : {true, false}) {
        std::vector<Words> regions;
        Memory_Ahead ahead;
        for (int i = 0; i < 4; ++i) {
            regions.push_back(New_Region());
            ahead.Expect(regions.back().get(), Region_Words * sizeof(std::uint64_t));
        }
        for (std::size_t word = 0; word < Region_Words; ++word) {
            if (limited && word % 4096 == 0)
                ahead.Come_To(word * sizeof(std::uint64_t));
            for (const Words& region : regions)
                region.get()[word] = word;
        }
        for (const Words& region : regions)
            for (std::size_t word = 0; word < Region_Words; ++word)
                ASSERT_EQ(region.get()[word], word);
    }
}

// Only a limited part is made ready, and never a page beyond the region.
TEST(Memory_Ahead, KeepsToItsRegionAndDistance)
{
    constexpr std::size_t page = 4096;
    constexpr std::size_t bytes = std::size_t{64} << 20;
    constexpr std::size_t guard = std::size_t{16} << 20;
    void* const map =
        ::mmap(nullptr, bytes + guard, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
    ASSERT_NE(map, MAP_FAILED);
    const auto resident = [&](std::size_t from, std::size_t size) {
        std::vector<unsigned char> pages(size / page);
        EXPECT_EQ(::mincore(static_cast<std::byte*>(map) + from, size, pages.data()), 0);
        return std::ranges::count_if(pages, [](unsigned char flags) { return (flags & 1) != 0; });
    };
    {
        Memory_Ahead ahead;
        ahead.Come_To(0);
        ahead.Expect(static_cast<std::byte*>(map) + 8, bytes - 16);
        for (int wait = 0; wait < 50 && resident(0, bytes) == 0; ++wait)
            ::usleep(1000);
    }
    EXPECT_LE(resident(0, bytes), static_cast<std::ptrdiff_t>((std::size_t{4} << 20) / page));
    EXPECT_EQ(resident(bytes, guard), 0);
    ::munmap(map, bytes + guard);
}

}  // namespace
}  // namespace ingester

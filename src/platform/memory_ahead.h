// Fresh memory made ready by a second processor, while the first one fills what comes before it.
#pragma once

#include <cstddef>
#include <limits>
#include <memory>

namespace ingester {

/// The system hands out memory by pages, and clears each when it is first touched: for the cells of a large
/// table that takes longer than reading them. A thread asks for the pages shortly before they are needed.
/// Nothing depends on it: where there is one processor, or the system can't, pages come as they always do.
class Memory_Ahead {
public:
    Memory_Ahead() = default;
    Memory_Ahead(const Memory_Ahead&) = delete;
    Memory_Ahead& operator=(const Memory_Ahead&) = delete;
    ~Memory_Ahead();

    /// `bytes` from `start` on are filled soon, from the start on. Several regions are filled side by side;
    /// `lists` is how many of equal length lie one behind the other in this one.
    void Expect(void* start, std::size_t bytes, std::size_t lists = 1);

    /// Keeps to a distance ahead of `bytes`, the place that is filled next in each list. Without this all
    /// that is expected is made ready.
    void Come_To(std::size_t bytes);

private:
    struct Work;
    void Start_On(void* start, std::size_t bytes, std::size_t lists);
    std::shared_ptr<Work> work_;  ///< the thread's as well: it may outlive a reader that a fault ended
    std::size_t limit_ = std::numeric_limits<std::size_t>::max();
};

}  // namespace ingester

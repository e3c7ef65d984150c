#include "platform/memory_ahead.h"
#include "platform/quiet_thread.h"

#include <algorithm>
#include <condition_variable>
#include <cstdint>
#include <mutex>
#include <new>
#include <thread>
#include <vector>

#include <sys/mman.h>

#ifndef MADV_POPULATE_WRITE
#define MADV_POPULATE_WRITE 23
#endif

namespace ingester {

namespace {

constexpr std::size_t Step = std::size_t{1} << 20;      ///< bytes asked for at once
constexpr std::size_t Distance = std::size_t{1} << 21;  ///< bytes ahead of the one who fills
constexpr std::size_t Least_Region = 2 * Step;          ///< smaller ones aren't worth a thread
constexpr std::size_t Page = 4096;

struct Region {
    std::byte* start;
    std::size_t bytes;
    std::size_t lists;
    std::size_t ready = 0;

    [[nodiscard]] std::size_t Ready_In_Each() const { return ready / lists; }
};

}  // namespace

struct Memory_Ahead::Work {
    std::mutex mutex;
    std::condition_variable changed;
    std::vector<Region> regions;
    std::size_t limit = 0;
    bool ended = false;
    std::thread thread;

    void Run();

private:
    Region* Next_Region();
};

/// The region that is least ready, if there is something to do.
Region* Memory_Ahead::Work::Next_Region()
{
    std::erase_if(regions, [](const Region& region) { return region.ready >= region.bytes; });
    const auto least = std::ranges::min_element(regions, {}, &Region::Ready_In_Each);
    return least == regions.end() || least->Ready_In_Each() >= limit ? nullptr : &*least;
}

void Memory_Ahead::Work::Run()
{
    std::unique_lock lock(mutex);
    while (!ended) {
        Region* const region = Next_Region();
        if (region == nullptr) {
            changed.wait(lock);
            continue;
        }
        std::byte* const from = region->start + region->ready;
        const std::size_t size = std::min(Step, region->bytes - region->ready);
        region->ready += size;
        lock.unlock();
        const bool done = ::madvise(from, size, MADV_POPULATE_WRITE) == 0;
        lock.lock();
        ended = ended || !done;  // an old system, or no memory
    }
}

void Memory_Ahead::Expect(void* start, std::size_t bytes, std::size_t lists)
{
    if (bytes < Least_Region || !Has_Second_Processor())
        return;
    try {
        Start_On(start, bytes, lists);
    } catch (const std::bad_alloc&) {
        // Pages come as they are touched.
    }
}

void Memory_Ahead::Start_On(void* start, std::size_t bytes, std::size_t lists)
{
    if (work_ == nullptr) {
        work_ = std::make_shared<Work>();
        work_->limit = limit_;
        work_->thread = Start_Quiet_Thread([work = work_] { work->Run(); });
    }
    // Whole pages only: the one at each end may be somebody else's as well.
    const auto address = reinterpret_cast<std::uintptr_t>(start);
    const std::size_t skipped = (Page - address % Page) % Page;
    const std::lock_guard lock(work_->mutex);
    work_->regions.push_back(
        {static_cast<std::byte*>(start) + skipped, (bytes - skipped) / Page * Page, lists});
    work_->changed.notify_one();
}

void Memory_Ahead::Come_To(std::size_t bytes)
{
    limit_ = bytes + Distance;
    if (work_ == nullptr)
        return;
    const std::lock_guard lock(work_->mutex);
    work_->limit = limit_;
    work_->changed.notify_one();
}

Memory_Ahead::~Memory_Ahead()
{
    if (work_ == nullptr)
        return;
    {
        const std::lock_guard lock(work_->mutex);
        work_->ended = true;
        work_->changed.notify_one();
    }
    if (work_->thread.joinable())
        work_->thread.join();
}

}  // namespace ingester

#include "platform/quiet_thread.h"
#include "platform/write_behind.h"

#include <algorithm>
#include <cerrno>
#include <new>
#include <utility>

#include <unistd.h>

namespace ingester {

bool Write_To_System(int descriptor, const char* bytes, std::size_t count)
{
    while (count > 0) {
        const ::ssize_t put = ::write(descriptor, bytes, std::min(count, Greatest_Request));
        if (put >= 0) {
            bytes += put;
            count -= static_cast<std::size_t>(put);
        } else if (errno != EINTR) {
            return false;
        }
    }
    return true;
}

Write_Behind::Write_Behind(int descriptor, std::size_t buffer_size)
    : descriptor_(descriptor), buffer_(std::make_unique_for_overwrite<char[]>(buffer_size))
{}

std::unique_ptr<Write_Behind> Write_Behind::Start(int descriptor, std::size_t buffer_size)
{
    if (!Has_Second_Processor())
        return nullptr;
    try {
        std::unique_ptr<Write_Behind> behind(new Write_Behind(descriptor, buffer_size));
        behind->thread_ = Start_Quiet_Thread([work = behind.get()] { work->Run(); });
        return behind->thread_.joinable() ? std::move(behind) : nullptr;
    } catch (const std::bad_alloc&) {
        return nullptr;  // one buffer has to do
    }
}

void Write_Behind::Run()
{
    std::unique_lock lock(mutex_);
    while (true) {
        changed_.wait(lock, [this] { return count_ > 0 || ended_; });
        if (count_ == 0)
            return;
        lock.unlock();
        const bool written = Write_To_System(descriptor_, buffer_.get(), count_);
        lock.lock();
        failed_ = failed_ || !written;
        count_ = 0;
        changed_.notify_all();
    }
}

bool Write_Behind::Take(std::unique_ptr<char[]>& buffer, std::size_t count)
{
    std::unique_lock lock(mutex_);
    changed_.wait(lock, [this] { return count_ == 0; });
    if (failed_)
        return false;
    std::swap(buffer, buffer_);
    count_ = count;
    changed_.notify_all();
    return true;
}

bool Write_Behind::Settle()
{
    std::unique_lock lock(mutex_);
    changed_.wait(lock, [this] { return count_ == 0; });
    return !failed_;
}

Write_Behind::~Write_Behind()
{
    if (!thread_.joinable())
        return;
    {
        const std::lock_guard lock(mutex_);
        ended_ = true;
        changed_.notify_all();
    }
    thread_.join();
}

}  // namespace ingester

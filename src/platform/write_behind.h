// Full buffers go to the system on a second thread, while the next one is filled.
#pragma once

#include <condition_variable>
#include <cstddef>
#include <memory>
#include <mutex>
#include <thread>

namespace ingester {

/// The system takes no more bytes at once.
constexpr std::size_t Greatest_Request = std::size_t{1} << 30;

/// Writes all `count` bytes to an open file. False when the system refused.
[[nodiscard]] bool Write_To_System(int descriptor, const char* bytes, std::size_t count);

/// One buffer at a time is on its way to a file.
class Write_Behind {
public:
    /// Null where there is no second processor or no thread to be had.
    [[nodiscard]] static std::unique_ptr<Write_Behind> Start(int descriptor, std::size_t buffer_size);

    Write_Behind(const Write_Behind&) = delete;
    Write_Behind& operator=(const Write_Behind&) = delete;
    ~Write_Behind();

    /// Takes `count` bytes of a buffer of the size told at the start, and puts an empty one in its place.
    /// False when an earlier one was refused.
    [[nodiscard]] bool Take(std::unique_ptr<char[]>& buffer, std::size_t count);

    /// Waits until the system has all that was taken. False when it refused.
    [[nodiscard]] bool Settle();

private:
    Write_Behind(int descriptor, std::size_t buffer_size);
    void Run();

    int descriptor_;
    std::mutex mutex_;
    std::condition_variable changed_;
    std::unique_ptr<char[]> buffer_;
    std::size_t count_ = 0;  ///< bytes of the buffer that are on their way
    bool failed_ = false;
    bool ended_ = false;
    std::thread thread_;
};

}  // namespace ingester

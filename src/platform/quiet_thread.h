// Threads that a host doesn't notice.
#pragma once

#include <csignal>
#include <exception>
#include <thread>

namespace ingester {

/// Whether a second thread is any help.
[[nodiscard]] inline bool Has_Second_Processor()
{
    return std::thread::hardware_concurrency() > 1;
}

/// Starts a thread in which no signal of the host is handled. Not joinable where the system has no more.
template <class Function> [[nodiscard]] std::thread Start_Quiet_Thread(Function function)
{
    sigset_t all;
    sigset_t before;
    sigfillset(&all);
    pthread_sigmask(SIG_SETMASK, &all, &before);
    std::thread thread;
    try {
        thread = std::thread(function);
    } catch (const std::exception&) {
        // Whoever asked goes on alone.
    }
    pthread_sigmask(SIG_SETMASK, &before, nullptr);
    return thread;
}

}  // namespace ingester

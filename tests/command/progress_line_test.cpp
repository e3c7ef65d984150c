#include "command/progress_line.h"

#include "support/progress.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <string>
#include <thread>

#include <fcntl.h>
#include <poll.h>
#include <unistd.h>

namespace ingester {
namespace {

/// Standard error is a terminal of our own while this lives.
class Terminal {
public:
    Terminal() : master_(::posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK)), before_(::dup(STDERR_FILENO))
    {
        if (::grantpt(master_) != 0 || ::unlockpt(master_) != 0)
            return;
        const int slave = ::open(::ptsname(master_), O_RDWR | O_NOCTTY);
        ::dup2(slave, STDERR_FILENO);
        ::close(slave);
    }
    ~Terminal()
    {
        Give_Back();
        ::close(master_);
    }
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    std::string Shown()
    {
        constexpr int quiet_time = 200;  // the kernel passes text on in its own time
        std::string text;
        char part[4096];
        for (::pollfd ready{master_, POLLIN, 0}; ::poll(&ready, 1, quiet_time) > 0;) {
            const ::ssize_t got = ::read(master_, part, sizeof part);
            if (got <= 0)
                break;
            text.append(part, static_cast<std::size_t>(got));
        }
        Give_Back();
        return text;
    }

private:
    void Give_Back()
    {
        if (before_ >= 0) {
            ::dup2(before_, STDERR_FILENO);
            ::close(before_);
        }
        before_ = -1;
    }

    int master_;
    int before_;
};

void Work_For(std::chrono::milliseconds time)
{
    const auto end = std::chrono::steady_clock::now() + time;
    while (std::chrono::steady_clock::now() < end) {
        Show_Progress("Reading", 1, 2);
        std::this_thread::sleep_for(std::chrono::milliseconds(5));
    }
}

TEST(Progress_Line, Long_Work_Is_Shown_Ten_Times_A_Second_At_Most_And_Erased)
{
    Terminal terminal;
    {
        const Progress_Line line(true);
        Work_For(std::chrono::milliseconds(1500));
    }
    const std::string shown = terminal.Shown();
    const std::string drawn = "\rReading  50%\r";
    const std::string erased = "\r" + std::string(drawn.size() - 2, ' ') + "\r";
    ASSERT_EQ(shown.substr(0, drawn.size()), drawn);
    ASSERT_TRUE(shown.ends_with(erased)) << testing::PrintToString(shown);
    EXPECT_LE(std::ranges::count(shown, 'R'), 5);
    EXPECT_EQ(shown.find('\n'), std::string::npos);
    EXPECT_EQ(progress_hook, nullptr);
}

TEST(Progress_Line, Short_Or_Quiet_Work_And_Work_Without_A_Terminal_Shows_Nothing)
{
    Terminal terminal;
    {
        const Progress_Line brief(true);
        Work_For(std::chrono::milliseconds(50));
    }
    {
        const Progress_Line unwanted(false);
        EXPECT_EQ(progress_hook, nullptr);
    }
    EXPECT_EQ(terminal.Shown(), "");

    const int before = ::dup(STDERR_FILENO);
    const int nowhere = ::open("/dev/null", O_WRONLY);
    ::dup2(nowhere, STDERR_FILENO);
    {
        const Progress_Line no_terminal(true);
        EXPECT_EQ(progress_hook, nullptr);
    }
    ::dup2(before, STDERR_FILENO);
    ::close(nowhere);
    ::close(before);
}

}  // namespace
}  // namespace ingester

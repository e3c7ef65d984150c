#include "command/progress_line.h"

#include "support/progress.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <string>
#include <thread>

#include <fcntl.h>
#include <unistd.h>

namespace ingester {
namespace {

/// What a line shows on standard error, a terminal or none, in the given time.
std::string Shown(bool wanted, bool terminal, int milliseconds)
{
    const int master = ::posix_openpt(O_RDWR | O_NOCTTY | O_NONBLOCK);
    EXPECT_TRUE(::grantpt(master) == 0 && ::unlockpt(master) == 0);
    const int slave = ::open(terminal ? ::ptsname(master) : "/dev/null", O_RDWR | O_NOCTTY);
    const int before = ::dup(STDERR_FILENO);
    ::dup2(slave, STDERR_FILENO);
    {
        const Progress_Line line(wanted);
        EXPECT_EQ(progress_hook != nullptr, wanted && terminal);
        const auto end = std::chrono::steady_clock::now() + std::chrono::milliseconds(milliseconds);
        for (; std::chrono::steady_clock::now() < end;
             std::this_thread::sleep_for(std::chrono::milliseconds(5)))
            Show_Progress("Reading", 1, 2);
    }
    EXPECT_EQ(progress_hook, nullptr);
    ::dup2(before, STDERR_FILENO);
    std::this_thread::sleep_for(std::chrono::milliseconds(200));  // the kernel passes text on in its own time
    char text[4096];
    const ::ssize_t size = ::read(master, text, sizeof text);
    for (const int descriptor : {master, slave, before})
        ::close(descriptor);
    return {text, static_cast<std::size_t>(std::max<::ssize_t>(size, 0))};
}

TEST(Progress_Line, Long_Work_Is_Shown_Ten_Times_A_Second_At_Most_And_Erased)
{
    const std::string shown = Shown(true, true, 1500);
    const std::string drawn = "\rReading  50%\r";
    const std::string erased = "\r" + std::string(drawn.size() - 2, ' ') + "\r";
    EXPECT_TRUE(shown.starts_with(drawn) && shown.ends_with(erased)) << testing::PrintToString(shown);
    EXPECT_LE(std::ranges::count(shown, 'R'), 5);
    EXPECT_EQ(shown.find('\n'), std::string::npos);
}

TEST(Progress_Line, Short_Or_Quiet_Work_And_Work_Without_A_Terminal_Shows_Nothing)
{
    EXPECT_EQ(Shown(true, true, 50) + Shown(false, true, 50) + Shown(true, false, 50), "");
}

}  // namespace
}  // namespace ingester

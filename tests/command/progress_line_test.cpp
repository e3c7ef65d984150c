#include "command/progress_line.h"

#include "support/progress.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <thread>

#include <pty.h>
#include <unistd.h>

namespace ingester {
namespace {

/// What a process shows that works for so long on a terminal of its own.
std::string Shown(bool wanted, int milliseconds, bool terminal = true)
{
    using Clock = std::chrono::steady_clock;
    int master = -1;
    if (::forkpty(&master, nullptr, nullptr, nullptr) == 0) {
        if (!terminal)
            ::close(STDERR_FILENO);
        {
            const Progress_Line line(wanted);
            if (!terminal && progress_hook != nullptr)
                ::_exit(static_cast<int>(::write(STDOUT_FILENO, "hooked", 6)));
            for (const auto end = Clock::now() + std::chrono::milliseconds(milliseconds);
                 Clock::now() < end;) {
                Show_Progress("Reading", 1, 2);
                std::this_thread::sleep_for(std::chrono::milliseconds(5));
            }
        }
        Show_Progress("Nobody looks", 1, 2);
        ::_exit(0);
    }
    std::string text;
    for (char c; ::read(master, &c, 1) == 1;)
        text += c;
    ::close(master);
    return text;
}

TEST(Progress_Line, Long_Work_Is_Shown_Ten_Times_A_Second_At_Most_And_Erased)
{
    const std::string shown = Shown(true, 1500);
    const std::string drawn = "\rReading  50%\r";
    const std::string erased = "\r" + std::string(drawn.size() - 2, ' ') + "\r";
    EXPECT_TRUE(shown.starts_with(drawn) && shown.ends_with(erased)) << testing::PrintToString(shown);
    EXPECT_LE(std::ranges::count(shown, 'R'), 5);
    EXPECT_EQ(shown.find('\n'), std::string::npos);
}

TEST(Progress_Line, Short_Or_Quiet_Work_And_Work_Without_A_Terminal_Shows_Nothing)
{
    EXPECT_EQ(Shown(true, 50) + Shown(false, 1200) + Shown(true, 50, false), "");
}

}  // namespace
}  // namespace ingester

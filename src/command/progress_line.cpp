#include "command/progress_line.h"

#include "platform/host_process.h"
#include "support/progress.h"
#include "support/text.h"

#include <algorithm>
#include <chrono>
#include <cstdint>
#include <cstdio>
#include <string>

namespace ingester {

namespace {

using Clock = std::chrono::steady_clock;

constexpr auto Silent_Time = std::chrono::seconds(1);
constexpr auto Between_Lines = std::chrono::milliseconds(100);

/// What stands on the terminal. The hook of the library is a plain function, so this is no member.
struct Shown_Line {
    Clock::time_point next;
    std::size_t width = 0;
};
Shown_Line shown;

void Draw(const std::string& text)
{
    // Blanks cover what a longer line left behind.
    const std::size_t rest = shown.width - std::min(shown.width, text.size());
    std::fprintf(stderr, "\r%s%*s\r", text.c_str(), static_cast<int>(rest), "");
    std::fflush(stderr);
    shown.width = text.size();
}

void Show(const char* what, std::int64_t done, std::int64_t total)
{
    const Clock::time_point now = Clock::now();
    if (now < shown.next)
        return;
    shown.next = now + Between_Lines;
    const double share = total > 0 ? static_cast<double>(done) / static_cast<double>(total) : 0;
    Draw(total > 0 ? Format_Text("%.40s %3.0f%%", what, 100 * std::clamp(share, 0.0, 1.0))
                   : Format_Text("%.40s ...", what));
}

}  // namespace

Progress_Line::Progress_Line(bool wanted)
{
    if (!wanted || !Standard_Error_Is_Terminal())
        return;
    shown = {Clock::now() + Silent_Time, 0};
    progress_hook = Show;
}

Progress_Line::~Progress_Line()
{
    progress_hook = nullptr;
    if (shown.width > 0)
        Draw("");
}

}  // namespace ingester

#include "platform/clipboard.h"
#include "platform/files.h"
#include "platform/folders.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <ctime>
#include <string>

#include <fcntl.h>
#include <spawn.h>
#include <sys/wait.h>
#include <unistd.h>

extern char** environ;  // NOLINT(readability-redundant-declaration): not every system declares it

namespace ingester {

namespace {

/// A desktop that tells of itself by a variable of the environment, and its programs.
struct Clipboard_Service {
    const char* variable;
    const char* get[6];
    const char* put[6];
};

constexpr Clipboard_Service Services[] = {
    {"WAYLAND_DISPLAY", {"wl-paste", "--no-newline", "--type", "text"}, {"wl-copy", "--type", "text/plain"}},
    {"DISPLAY",
     {"xclip", "-selection", "clipboard", "-o", "-t", "UTF8_STRING"},
     {"xclip", "-selection", "clipboard", "-i"}},
};

bool Is_Set(const char* variable)
{
    const char* const value = std::getenv(variable);
    return value != nullptr && *value != '\0';
}

/// How a program ended.
enum class Ending : std::uint8_t { good, bad, not_there };

/// Waits for a program, which the owner of the clipboard may keep waiting for ever.
Ending Wait_For(::pid_t child)
{
    constexpr int most_waits = 2000;
    constexpr std::timespec a_moment{0, 10000000};
    for (int wait = 0; wait < most_waits; ++wait) {
        int how = 0;
        const ::pid_t ended = ::waitpid(child, &how, WNOHANG);
        if (ended == child)
            return WIFEXITED(how) && WEXITSTATUS(how) == 0 ? Ending::good : Ending::bad;
        if (ended < 0 && errno != EINTR)
            return Ending::bad;
        ::nanosleep(&a_moment, nullptr);
    }
    ::kill(child, SIGKILL);
    ::waitpid(child, nullptr, 0);
    return Ending::bad;
}

/// Runs a program between two files, without words of its own.
Ending Run(const char* const (&words)[6], const char* input, const char* output)
{
    char* arguments[7] = {};
    std::transform(std::begin(words), std::end(words), arguments,
                   [](const char* word) { return const_cast<char*>(word); });
    ::posix_spawn_file_actions_t streams;
    ::posix_spawn_file_actions_init(&streams);
    ::posix_spawn_file_actions_addopen(&streams, STDIN_FILENO, input, O_RDONLY, 0);
    ::posix_spawn_file_actions_addopen(&streams, STDOUT_FILENO, output, O_WRONLY, 0);
    ::posix_spawn_file_actions_addopen(&streams, STDERR_FILENO, "/dev/null", O_WRONLY, 0);
    ::pid_t child = 0;
    const int fault = ::posix_spawnp(&child, words[0], &streams, nullptr, arguments, environ);
    ::posix_spawn_file_actions_destroy(&streams);
    if (fault != 0)
        return fault == ENOENT ? Ending::not_there : Ending::bad;
    return Wait_For(child);
}

/// Runs the program of the first service that is there.
template <class Words_Of> Ending Run_Service(Words_Of words_of, const char* input, const char* output)
{
    for (const Clipboard_Service& service : Services) {
        if (!Is_Set(service.variable))
            continue;
        if (const Ending ending = Run(words_of(service), input, output); ending != Ending::not_there)
            return ending;
    }
    return Ending::not_there;
}

}  // namespace

Clipboard_Answer Copy_Clipboard_To(std::string_view scratch_name)
{
    Output_File made;
    if (!made.Open_Scratch(scratch_name) || !made.Close())
        return Clipboard_Answer::failed;
    const auto get = [](const Clipboard_Service& service) -> const auto&
    {
        return service.get;
    };
    switch (Run_Service(get, "/dev/null", Native_Path(scratch_name).c_str())) {
    case Ending::good:
        return Clipboard_Answer::done;
    case Ending::bad:
        return Clipboard_Answer::no_text;
    default:
        return Clipboard_Answer::unavailable;
    }
}

Clipboard_Answer Copy_To_Clipboard(std::string_view name)
{
    const auto put = [](const Clipboard_Service& service) -> const auto&
    {
        return service.put;
    };
    switch (Run_Service(put, Native_Path(name).c_str(), "/dev/null")) {
    case Ending::good:
        return Clipboard_Answer::done;
    case Ending::bad:
        return Clipboard_Answer::failed;
    default:
        return Clipboard_Answer::unavailable;
    }
}

}  // namespace ingester

#include "platform/clipboard.h"
#include "platform/files.h"
#include "platform/text_codes.h"
#include "support/utf8.h"

#include <algorithm>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <ctime>
#include <string>

#include <fcntl.h>
#include <spawn.h>
#include <sys/mman.h>
#include <sys/stat.h>
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
    const char* unreachable;  ///< in the words of a program that found no desktop
};

constexpr Clipboard_Service Services[] = {
    {"WAYLAND_DISPLAY",
     {"wl-paste", "--no-newline", "--type", "text"},
     {"wl-copy", "--type", "text/plain"},
     "Failed to connect"},
    {"DISPLAY",
     {"xclip", "-selection", "clipboard", "-o", "-t", "UTF8_STRING"},
     {"xclip", "-selection", "clipboard", "-i"},
     "Can't open display"},
};

/// A file without a name, behind a stream of a program.
class Memory_File {
public:
    Memory_File() : descriptor_(::memfd_create("ingester", MFD_CLOEXEC))
    {
        if (descriptor_ < 0 || descriptor_ > STDERR_FILENO)
            return;
        const int low = descriptor_;  // a host may have closed its streams
        descriptor_ = ::fcntl(low, F_DUPFD_CLOEXEC, STDERR_FILENO + 1);
        ::close(low);
    }
    Memory_File(const Memory_File&) = delete;
    Memory_File& operator=(const Memory_File&) = delete;
    ~Memory_File()
    {
        if (descriptor_ >= 0)
            ::close(descriptor_);
    }

    [[nodiscard]] int Descriptor() const { return descriptor_; }

    /// For the next program, which begins at its start.
    [[nodiscard]] bool Rewind() const { return ::lseek(descriptor_, 0, SEEK_SET) == 0; }

    [[nodiscard]] bool Set_Text(std::string_view text) const
    {
        while (!text.empty()) {
            const ::ssize_t put = ::write(descriptor_, text.data(), text.size());
            if (put < 0 && errno != EINTR)
                return false;
            text.remove_prefix(static_cast<std::size_t>(std::max<::ssize_t>(put, 0)));
        }
        return true;
    }

    [[nodiscard]] std::string Text() const
    {
        struct stat facts {};
        ::fstat(descriptor_, &facts);
        std::string text(static_cast<std::size_t>(facts.st_size), '\0');
        std::size_t got = 0;
        for (::ssize_t part = 1; part > 0; got += static_cast<std::size_t>(std::max<::ssize_t>(part, 0)))
            part = ::pread(descriptor_, text.data() + got, text.size() - got, static_cast<::off_t>(got));
        text.resize(got);
        return text;
    }

private:
    int descriptor_;
};

/// What a program reads and writes.
struct Streams {
    Memory_File input, output, words;
};

bool Is_Set(const char* variable)
{
    const char* const value = std::getenv(variable);
    return value != nullptr && *value != '\0';
}

/// How a program ended. Without a desktop it counts as not there.
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

/// Runs a program between two files, and keeps its words.
Ending Run(const char* const (&words)[6], const Streams& streams)
{
    char* arguments[7] = {};
    std::transform(std::begin(words), std::end(words), arguments,
                   [](const char* word) { return const_cast<char*>(word); });
    const Memory_File* const files[] = {&streams.input, &streams.output, &streams.words};
    if (!std::ranges::all_of(files, [](const Memory_File* file) { return file->Rewind(); }))
        return Ending::bad;
    ::posix_spawn_file_actions_t actions;
    ::posix_spawn_file_actions_init(&actions);
    for (int stream = STDIN_FILENO; stream <= STDERR_FILENO; ++stream)
        ::posix_spawn_file_actions_adddup2(&actions, files[stream]->Descriptor(), stream);
    ::pid_t child = 0;
    const int fault = ::posix_spawnp(&child, words[0], &actions, nullptr, arguments, environ);
    ::posix_spawn_file_actions_destroy(&actions);
    if (fault != 0)
        return fault == ENOENT ? Ending::not_there : Ending::bad;
    return Wait_For(child);
}

/// Runs the program of the first service that is there.
template <class Words_Of> Ending Run_Service(Words_Of words_of, const Streams& streams)
{
    for (const Clipboard_Service& service : Services) {
        if (!Is_Set(service.variable))
            continue;
        const Ending ending = Run(words_of(service), streams);
        const bool reached =
            ending == Ending::good || streams.words.Text().find(service.unreachable) == std::string::npos;
        if (ending != Ending::not_there && reached)
            return ending;
    }
    return Ending::not_there;
}

/// What desktops carry is UTF-8, and a NUL ends it.
bool Keep_Text(std::string text, std::string_view scratch_name)
{
    text.resize(std::min(text.find('\0'), text.size()));
    Output_File file;
    if (!file.Open_Scratch(scratch_name))
        return false;
    Text_Converter converter = Sure_Converter(Utf_8_Code(), Code_Of_Letters());
    file.Write(Is_Utf8(text) ? converter.Convert(text) : text);
    return file.Close();
}

/// A text that came from a file in UTF-8 is what a desktop wants already.
bool Load_Text(std::string_view name, const Memory_File& target)
{
    Input_File file;
    if (!file.Open(name))
        return false;
    std::string text(static_cast<std::size_t>(file.Size()), '\0');
    Text_Converter converter = Sure_Converter(Code_Of_Letters(), Utf_8_Code());
    return file.Read_Exactly(text.data(), text.size())
           && target.Set_Text(Is_Utf8(text) ? text : converter.Convert(text));
}

}  // namespace

Clipboard_Answer Copy_Clipboard_To(std::string_view scratch_name)
{
    const auto get = [](const Clipboard_Service& service) -> const auto&
    {
        return service.get;
    };
    const Streams streams;
    switch (Run_Service(get, streams)) {
    case Ending::good:
        return Keep_Text(streams.output.Text(), scratch_name) ? Clipboard_Answer::done
                                                              : Clipboard_Answer::failed;
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
    const Streams streams;
    if (!Load_Text(name, streams.input))
        return Clipboard_Answer::failed;
    switch (Run_Service(put, streams)) {
    case Ending::good:
        return Clipboard_Answer::done;
    case Ending::bad:
        return Clipboard_Answer::failed;
    default:
        return Clipboard_Answer::unavailable;
    }
}

}  // namespace ingester

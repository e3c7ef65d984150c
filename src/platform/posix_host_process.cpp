#include "platform/host_process.h"

#include "platform/files.h"
#include "platform/folders.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <csignal>
#include <cstddef>
#include <cstdlib>
#include <filesystem>
#include <iterator>
#include <memory>
#include <system_error>

#include <dirent.h>
#include <fcntl.h>
#include <unistd.h>

namespace ingester {

namespace {

constexpr std::size_t Copy_Size = 1 << 16;

constexpr int Ending_Signals[] = {SIGHUP, SIGINT, SIGQUIT, SIGPIPE, SIGTERM, SIGABRT,
                                  SIGBUS, SIGFPE, SIGILL,  SIGSEGV, SIGXCPU};

/// Paths that the signal handler removes, where it can read them without the heap. Empty: none.
std::array<char, PATH_MAX> doomed_folder{};
std::array<char, PATH_MAX> doomed_file{};

/// Signals wait while this lives, so that a handler never sees half a path.
class Signals_Held {
public:
    Signals_Held()
    {
        sigset_t all;
        ::sigfillset(&all);
        ::sigprocmask(SIG_BLOCK, &all, &before_);
    }
    Signals_Held(const Signals_Held&) = delete;
    Signals_Held& operator=(const Signals_Held&) = delete;
    ~Signals_Held() { ::sigprocmask(SIG_SETMASK, &before_, nullptr); }

private:
    sigset_t before_{};
};

void Set_Path(std::array<char, PATH_MAX>& target, const std::string& path)
{
    const std::size_t length = path.size() < target.size() ? path.size() : 0;
    std::copy_n(path.begin(), length, target.begin());
    target[length] = '\0';
}

/// Calls of the kernel alone: nothing else is allowed in a signal handler. Scratch files lie flat in
/// the folder, so there is nothing to descend into.
void Remove_Doomed_Folder()
{
    const int folder = ::open(doomed_folder.data(), O_RDONLY | O_DIRECTORY | O_CLOEXEC);
    if (folder < 0)
        return;
    alignas(dirent64) std::byte entries[4096];
    for (::ssize_t got; (got = ::getdents64(folder, entries, sizeof entries)) > 0;) {
        for (std::size_t at = 0; at < static_cast<std::size_t>(got);) {
            const auto* entry = reinterpret_cast<const dirent64*>(entries + at);
            ::unlinkat(folder, entry->d_name, 0);
            at += entry->d_reclen;
        }
    }
    ::close(folder);
    ::rmdir(doomed_folder.data());
}

/// What was in force for each of `Ending_Signals`, to be put back before one of them takes effect.
std::array<struct sigaction, std::size(Ending_Signals)> earlier_actions{};

bool Is_Fault(int signal_number, const siginfo_t& facts)
{
    return facts.si_code > 0
           && (signal_number == SIGSEGV || signal_number == SIGBUS || signal_number == SIGFPE
               || signal_number == SIGILL);
}

extern "C" void Clean_Up_And_End(int signal_number, siginfo_t* facts, void*)
{
    if (doomed_file.front() != '\0')
        ::unlink(doomed_file.data());
    if (doomed_folder.front() != '\0')
        Remove_Doomed_Folder();
    for (std::size_t i = 0; i < std::size(Ending_Signals); ++i)
        if (Ending_Signals[i] == signal_number)
            ::sigaction(signal_number, &earlier_actions[i], nullptr);
    if (!Is_Fault(signal_number, *facts))  // a fault comes again by itself, and tells its place then
        ::raise(signal_number);
}

void Watch_Ending_Signals()
{
    struct sigaction action {};
    action.sa_sigaction = Clean_Up_And_End;
    action.sa_flags = SA_SIGINFO;
    ::sigfillset(&action.sa_mask);
    for (std::size_t i = 0; i < std::size(Ending_Signals); ++i) {
        struct sigaction& earlier = earlier_actions[i];
        if (::sigaction(Ending_Signals[i], nullptr, &earlier) == 0 && earlier.sa_handler != SIG_IGN)
            ::sigaction(Ending_Signals[i], &action, nullptr);  // ignored ones stay so, as under nohup
    }
}

}  // namespace

void Start_Host_Process()
{
    // Each stream is opened the wrong way round, so that using it fails as it does when closed.
    constexpr int useless_modes[] = {O_WRONLY, O_RDONLY, O_RDONLY};
    for (int stream = 0; stream < 3; ++stream)
        if (::fcntl(stream, F_GETFD) < 0 && errno == EBADF)
            static_cast<void>(::open("/dev/null", useless_modes[stream]));  // takes the lowest free number
    std::signal(SIGXFSZ, SIG_IGN);
}

bool Private_Folder::Make()
{
    std::string path = Native_Path(Get_Temp_Folder()).append("ingester-XXXXXX");
    Watch_Ending_Signals();
    const Signals_Held held;
    if (::mkdtemp(path.data()) == nullptr)
        return false;
    Set_Path(doomed_folder, path);
    name_ = Request_Path(path).append("\\");
    return ::setenv("TMPDIR", path.c_str(), 1) == 0;
}

Private_Folder::~Private_Folder()
{
    if (name_.empty())
        return;
    std::error_code ignored;  // silent by design: nothing depends on it any more
    std::filesystem::remove_all(Native_Path(name_), ignored);
    const Signals_Held held;
    Set_Path(doomed_folder, {});
}

void Remove_On_Signal(std::string_view name)
{
    const Signals_Held held;
    Set_Path(doomed_file, Native_Path(name));
}

bool Standard_Error_Is_Terminal()
{
    return ::isatty(STDERR_FILENO) != 0;
}

bool Copy_Standard_Input(std::string_view name)
{
    Output_File target;
    if (!target.Open_Scratch(name))
        return false;
    const auto buffer = std::make_unique_for_overwrite<char[]>(Copy_Size);
    const std::uint64_t most = Scratch_Room(Folder_Of(name));
    std::uint64_t copied = 0;
    ::ssize_t got;
    do {
        got = ::read(STDIN_FILENO, buffer.get(), Copy_Size);
        if (got > 0)
            target.Write(buffer.get(), static_cast<std::size_t>(got));
        copied += got > 0 ? static_cast<std::uint64_t>(got) : 0;
    } while (!target.Failed() && copied <= most && (got > 0 || (got < 0 && errno == EINTR)));
    return got == 0 && target.Close();
}

bool Copy_To_Standard_Output(std::string_view name)
{
    Input_File source;
    if (!source.Open(name))
        return false;
    Output_File target;
    target.Open_Standard_Output();
    const auto buffer = std::make_unique_for_overwrite<char[]>(Copy_Size);
    std::size_t got;
    do {
        got = source.Read(buffer.get(), Copy_Size);
        target.Write(buffer.get(), got);
    } while (got > 0 && !target.Failed());
    return target.Close() && source.Close();
}

}  // namespace ingester

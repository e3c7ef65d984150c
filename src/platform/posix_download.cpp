#include "platform/download.h"
#include "platform/files.h"
#include "platform/folders.h"

#include <cerrno>
#include <csignal>
#include <ctime>
#include <memory>

#include <curl/curl.h>

namespace ingester {

namespace {

constexpr long Most_Redirections = 10;

/// A connection that breaks must not end the host. Its handlers are its own, so the signal is held back in
/// this thread, and taken before it gets through; one that came from elsewhere, earlier, stays.
class Broken_Pipes_Held {
public:
    Broken_Pipes_Held()
    {
        ::sigemptyset(&broken_pipe_);
        ::sigaddset(&broken_pipe_, SIGPIPE);
        sigset_t pending;
        ::sigpending(&pending);
        was_pending_ = ::sigismember(&pending, SIGPIPE) == 1;
        ::pthread_sigmask(SIG_BLOCK, &broken_pipe_, &before_);
    }
    Broken_Pipes_Held(const Broken_Pipes_Held&) = delete;
    Broken_Pipes_Held& operator=(const Broken_Pipes_Held&) = delete;
    ~Broken_Pipes_Held()
    {
        constexpr std::timespec at_once{0, 0};
        while (!was_pending_ && ::sigtimedwait(&broken_pipe_, nullptr, &at_once) < 0 && errno == EINTR) {
        }
        ::pthread_sigmask(SIG_SETMASK, &before_, nullptr);
    }

private:
    sigset_t broken_pipe_{};
    sigset_t before_{};
    bool was_pending_ = false;
};

struct Curl_Deleter {
    void operator()(CURL* transfer) const { curl_easy_cleanup(transfer); }
};

/// Where the bytes go, and how many may still come.
struct Arriving_File {
    Output_File file;
    std::uint64_t room;
};

/// Takes a block of the body; any other count than its own ends the transfer.
std::size_t Take_Block(char* bytes, std::size_t size, std::size_t count, void* target)
{
    auto& arriving = *static_cast<Arriving_File*>(target);
    const std::size_t length = size * count;
    if (length > arriving.room || arriving.file.Failed())
        return 0;
    arriving.room -= length;
    arriving.file.Write(bytes, length);
    return length;
}

std::string With_Escaped_Blanks(const std::string& url)
{
    std::string escaped;
    for (const char c : url)
        escaped += c == ' ' ? "%20" : std::string_view(&c, 1);
    return escaped;
}

void Set_Up_Transfer(CURL* transfer, const std::string& url, const Download_Limits& limits,
                     Arriving_File& target)
{
    curl_easy_setopt(transfer, CURLOPT_URL, url.c_str());
    curl_easy_setopt(transfer, CURLOPT_PROTOCOLS_STR, "ftp,http,https,file");
    curl_easy_setopt(transfer, CURLOPT_REDIR_PROTOCOLS_STR, "ftp,http,https");
    curl_easy_setopt(transfer, CURLOPT_FOLLOWLOCATION, 1L);
    curl_easy_setopt(transfer, CURLOPT_MAXREDIRS, Most_Redirections);
    curl_easy_setopt(transfer, CURLOPT_FAILONERROR, 1L);
    curl_easy_setopt(transfer, CURLOPT_CONNECTTIMEOUT, limits.connect_seconds);
    curl_easy_setopt(transfer, CURLOPT_TIMEOUT, limits.total_seconds);
    curl_easy_setopt(transfer, CURLOPT_NOSIGNAL, 1L);  // the host's handlers are its own
    curl_easy_setopt(transfer, CURLOPT_USERAGENT, "ingester");
    curl_easy_setopt(transfer, CURLOPT_WRITEFUNCTION, Take_Block);
    curl_easy_setopt(transfer, CURLOPT_WRITEDATA, &target);
}

}  // namespace

bool Download(const std::string& url, std::string_view scratch_name, const Download_Limits& limits)
{
    static const bool ready = curl_global_init(CURL_GLOBAL_DEFAULT) == CURLE_OK;
    const Broken_Pipes_Held held;  // to the end of the transfer's life, which may send a last word
    const std::string escaped = With_Escaped_Blanks(url);  // nothing may fail for want of memory from here on
    const std::unique_ptr<CURL, Curl_Deleter> transfer(ready ? curl_easy_init() : nullptr);
    Arriving_File target{Output_File(), limits.bytes};
    if (transfer == nullptr || !target.file.Open_Scratch(scratch_name))
        return false;
    Set_Up_Transfer(transfer.get(), escaped, limits, target);
    const bool good = curl_easy_perform(transfer.get()) == CURLE_OK;
    if (target.file.Close() && good)
        return true;
    Delete_File(scratch_name);
    return false;
}

}  // namespace ingester

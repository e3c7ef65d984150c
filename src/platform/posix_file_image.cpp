#include "platform/file_image.h"

#include "platform/refusals.h"
#include "support/progress.h"

#include <algorithm>
#include <csignal>
#include <cstdint>
#include <cstdlib>
#include <cstring>

#include <sys/mman.h>
#include <unistd.h>

namespace ingester {

namespace {

/// The one mapping that is being watched. A request reads one file at a time.
struct Watched_Mapping {
    std::uintptr_t first = 0;
    std::size_t length = 0;
    volatile std::sig_atomic_t lost = 0;
    struct sigaction earlier = {};
};

Watched_Mapping watched;

std::size_t Page_Size()
{
    static const auto size = static_cast<std::size_t>(::sysconf(_SC_PAGESIZE));
    return size;
}

/// The system signals a touch of a page that the file has lost meanwhile. Zeros take its place, and
/// the reader learns of it at the end; any other bus error is the earlier handler's.
void Replace_Lost_Page(int signal, siginfo_t* facts, void*)
{
    const auto address = reinterpret_cast<std::uintptr_t>(facts->si_addr);
    if (address - watched.first < watched.length) {
        const std::uintptr_t page = address & ~(Page_Size() - 1);
        void* const mapped = ::mmap(reinterpret_cast<void*>(page), Page_Size(), PROT_READ | PROT_WRITE,
                                    MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED, -1, 0);
        watched.lost = 1;
        if (mapped != MAP_FAILED)
            return;
    }
    ::sigaction(signal, &watched.earlier, nullptr);
}

void Watch(const void* bytes, std::size_t length)
{
    struct sigaction action = {};
    action.sa_sigaction = Replace_Lost_Page;
    action.sa_flags = SA_SIGINFO | SA_ONSTACK;  // where a host keeps a stack for signals
    ::sigemptyset(&action.sa_mask);
    watched.first = reinterpret_cast<std::uintptr_t>(bytes);
    watched.length = length;
    watched.lost = 0;
    ::sigaction(SIGBUS, &action, &watched.earlier);
}

void Stop_Watching()
{
    ::sigaction(SIGBUS, &watched.earlier, nullptr);
    watched.length = 0;
}

constexpr std::size_t Read_Block = std::size_t{16} << 20;
constexpr std::size_t First_Room = std::size_t{1} << 20;

}  // namespace

File_Image::~File_Image()
{
    Free();
}

void File_Image::Free()
{
    if (mapped_ == 0) {
        std::free(bytes_);
        return;
    }
    Stop_Watching();
    ::munmap(bytes_, mapped_);
}

bool File_Image::Replace(std::string_view bytes)
{
    auto* const own = static_cast<char*>(Take_Memory(nullptr, bytes.size() + slack));
    if (own == nullptr)
        return false;
    std::memcpy(own, bytes.data(), bytes.size());
    changed_ = Changed();
    Free();
    bytes_ = own;
    size_ = bytes.size();
    mapped_ = released_ = 0;
    return true;
}

bool File_Image::Changed() const
{
    return changed_ || (mapped_ != 0 && watched.lost != 0);
}

void File_Image::Release_Before(const char* at)
{
    if (mapped_ == 0)
        return;
    const std::size_t place = static_cast<std::size_t>(at - bytes_) / Page_Size() * Page_Size();
    if (place <= released_)
        return;
    ::madvise(bytes_ + released_, place - released_, MADV_DONTNEED);
    released_ = place;
}

/// The file's pages lie over the head of an empty mapping, whose tail is the slack.
bool File_Image::Map(const Input_File& file)
{
    const auto size = static_cast<std::size_t>(file.Size());
    const std::size_t page = Page_Size();
    const std::size_t length = (size + slack + page - 1) / page * page;
    if (!Allowed(Asked::memory))
        return false;
    void* const whole =
        ::mmap(nullptr, length, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS | MAP_NORESERVE, -1, 0);
    if (whole == MAP_FAILED)
        return false;
    if (::mmap(whole, size, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_FIXED | MAP_NORESERVE,
               file.Descriptor(), 0)
        == MAP_FAILED) {
        ::munmap(whole, length);
        return false;
    }
    ::madvise(whole, size, MADV_SEQUENTIAL);
    bytes_ = static_cast<char*>(whole);
    size_ = size;
    mapped_ = length;
    Watch(bytes_, length);
    return true;
}

bool File_Image::Read_All(Input_File& file)
{
    const std::int64_t known = file.Size();
    std::size_t room = std::max(static_cast<std::size_t>(known) + 1, First_Room);
    for (;;) {
        if (bytes_ == nullptr || size_ == room) {
            room = bytes_ == nullptr ? room : room * 2;
            void* const larger = Take_Memory(bytes_, room + slack);
            if (larger == nullptr)
                return false;
            bytes_ = static_cast<char*>(larger);
        }
        const std::size_t wanted = std::min(room - size_, Read_Block);
        const std::size_t got = file.Read(bytes_ + size_, wanted);
        size_ += got;
        Show_Progress("Loading", file.Position(), known);
        if (got < wanted)
            break;
    }
    return !file.Failed();
}

bool File_Image::Load(Input_File& file)
{
    if (file.Descriptor() >= 0 && file.Position() == 0 && file.Size() > 0 && watched.length == 0 && Map(file))
        return true;
    return Read_All(file);
}

}  // namespace ingester

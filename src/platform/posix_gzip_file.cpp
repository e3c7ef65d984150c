#include "platform/files.h"
#include "platform/folders.h"
#include "platform/gzip_file.h"
#include "platform/refusals.h"

#include <algorithm>
#include <span>
#include <vector>

#include <fcntl.h>
#include <unistd.h>
#include <zlib.h>

namespace ingester {

Gzip_File::~Gzip_File()
{
    if (stream_ != nullptr)
        gzclose_r(stream_);
}

bool Gzip_File::Open(std::string_view name)
{
    constexpr unsigned buffer_size = 1U << 18;
    if (stream_ != nullptr)
        gzclose_r(stream_);
    failed_ = false;
    const std::string path = Native_Path(name);
    const int descriptor = Allowed(Asked::open) ? ::open(path.c_str(), O_RDONLY | O_CLOEXEC) : -1;
    stream_ = descriptor < 0 ? nullptr : gzdopen(descriptor, "rb");
    if (stream_ == nullptr && descriptor >= 0)
        ::close(descriptor);
    return stream_ != nullptr && gzbuffer(stream_, buffer_size) == 0 && gzdirect(stream_) == 0;
}

std::size_t Gzip_File::Read(void* target, std::size_t count)
{
    constexpr std::size_t greatest_request = std::size_t{1} << 30;
    auto* const at = static_cast<char*>(target);
    std::size_t done = 0;
    while (stream_ != nullptr && done < count) {
        const auto part = static_cast<unsigned>(std::min(count - done, greatest_request));
        const int got = Allowed(Asked::read) ? gzread(stream_, at + done, part) : -1;
        failed_ = failed_ || got < 0;
        if (got <= 0)
            break;
        done += static_cast<std::size_t>(got);
    }
    return done;
}

bool Gzip_File::Close()
{
    const bool good = stream_ != nullptr && gzclose_r(stream_) == Z_OK && !failed_;
    stream_ = nullptr;
    return good;
}

namespace {

bool Compress(Input_File& source, gzFile target, std::span<char> block)
{
    while (const std::size_t got = source.Read(block.data(), block.size()))
        if (!Allowed(Asked::write) || gzwrite(target, block.data(), static_cast<unsigned>(got)) <= 0)
            return false;
    return !source.Failed();
}

}  // namespace

bool Compress_File(std::string_view from, std::string_view to)
{
    Input_File source;
    const std::string path = Native_Path(to);
    std::vector<char> block(std::size_t{1} << 20);  // before there is anything to be cleared away
    if (!source.Open(from))
        return false;
    Delete_File(to);
    const int flags = O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC;
    const int descriptor = Allowed(Asked::open) ? ::open(path.c_str(), flags, 0600) : -1;
    gzFile target = descriptor < 0 ? nullptr : gzdopen(descriptor, "wb9");
    if (target == nullptr && descriptor >= 0)
        ::close(descriptor);
    const bool packed = target != nullptr && Compress(source, target, block);
    const bool closed = target != nullptr && gzclose_w(target) == Z_OK && Allowed(Asked::close);
    if (!packed || !closed)
        Delete_File(to);
    return packed && closed;
}

}  // namespace ingester

#include "platform/file_changes.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/gzip_file.h"

#include <algorithm>

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
    const int descriptor = ::open(Native_Path(name).c_str(), O_RDONLY | O_CLOEXEC);
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
        const int got = gzread(stream_, at + done, part);
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

bool Compress(Input_File& source, gzFile target)
{
    constexpr std::size_t block_size = std::size_t{1} << 20;
    const auto block = std::make_unique_for_overwrite<char[]>(block_size);
    while (const std::size_t got = source.Read(block.get(), block_size))
        if (!File_Change_Allowed() || gzwrite(target, block.get(), static_cast<unsigned>(got)) <= 0)
            return false;
    return !source.Failed();
}

}  // namespace

bool Compress_File(std::string_view from, std::string_view to)
{
    Input_File source;
    const std::string path = Native_Path(to);
    if (!source.Open(from))
        return false;
    ::unlink(path.c_str());
    const int descriptor = ::open(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW | O_CLOEXEC, 0600);
    gzFile target = descriptor < 0 ? nullptr : gzdopen(descriptor, "wb9");
    if (target == nullptr && descriptor >= 0)
        ::close(descriptor);
    const bool packed = target != nullptr && Compress(source, target);
    const bool closed = target != nullptr && gzclose_w(target) == Z_OK;
    if (!packed || !closed)
        Delete_File(to);
    return packed && closed;
}

}  // namespace ingester

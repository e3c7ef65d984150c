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

}  // namespace ingester

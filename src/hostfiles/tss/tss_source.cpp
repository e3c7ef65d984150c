#include "hostfiles/tss/tss_source.h"

namespace ingester {

namespace {

constexpr std::int64_t Bytes_At_Once = 1 << 14;

}  // namespace

bool TSS_Source::Read_Bytes(std::int64_t length, std::size_t kept, std::string& text)
{
    text.clear();
    std::int64_t left = std::min(std::max<std::int64_t>(length, 0), static_cast<std::int64_t>(kept));
    const std::int64_t beyond = std::max<std::int64_t>(length, 0) - left;
    while (left > 0) {
        const auto part = static_cast<std::size_t>(std::min(left, Bytes_At_Once));
        const std::size_t held = text.size();
        text.resize(held + part);
        if (!Read_Raw(text.data() + held, part))
            return false;
        left -= static_cast<std::int64_t>(part);
    }
    return Skip(beyond);
}

bool TSS_Source::Skip(std::int64_t bytes)
{
    char passed[Bytes_At_Once];
    while (bytes > 0) {
        const std::int64_t part = std::min(bytes, Bytes_At_Once);
        if (!Read_Raw(passed, static_cast<std::size_t>(part)))
            return false;
        bytes -= part;
    }
    return true;
}

std::int64_t TSS_Source::Possible(std::int64_t claimed, std::int64_t size) const
{
    constexpr std::int64_t unknown_size = 1 << 16;
    const std::int64_t all = file_->Size();
    return std::min(claimed,
                    all > 0 ? std::max<std::int64_t>(all - file_->Position(), 0) / size : unknown_size);
}

}  // namespace ingester

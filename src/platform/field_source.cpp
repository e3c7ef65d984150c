#include "platform/field_source.h"

#include <algorithm>

namespace ingester {

namespace {

constexpr std::int64_t Bytes_At_Once = 1 << 14;

}  // namespace

bool Field_Source::Seek(std::int64_t position)
{
    return position >= 0 && position <= file_->Size() && file_->Seek(position);
}

bool Field_Source::Read_Bytes(std::int64_t length, std::size_t kept, std::string& text)
{
    text.clear();
    length = std::max<std::int64_t>(length, 0);
    std::int64_t left = kept < static_cast<std::uint64_t>(length) ? static_cast<std::int64_t>(kept) : length;
    const std::int64_t beyond = length - left;
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

/// A stream has no other way over them than to read them.
bool Field_Source::Skip(std::int64_t bytes)
{
    if (bytes > Bytes_At_Once && bytes <= file_->Size() - file_->Position())
        return file_->Seek(file_->Position() + bytes);
    char passed[Bytes_At_Once];
    while (bytes > 0) {
        const std::int64_t part = std::min(bytes, Bytes_At_Once);
        if (!Read_Raw(passed, static_cast<std::size_t>(part)))
            return false;
        bytes -= part;
    }
    return true;
}

std::int64_t Field_Source::Possible(std::int64_t claimed, std::int64_t size) const
{
    constexpr std::int64_t unknown_size = 1 << 16;
    const std::int64_t all = file_->Size();
    return std::min(claimed, all > 0 ? std::max<std::int64_t>(all - file_->Position(), 0)
                                           / std::max<std::int64_t>(size, 1)
                                     : unknown_size);
}

}  // namespace ingester

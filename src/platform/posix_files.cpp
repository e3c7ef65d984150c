#include "platform/files.h"

#include "platform/folders.h"
#include "platform/refusals.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <ctime>

#include <fcntl.h>
#include <sys/stat.h>
#include <unistd.h>

namespace ingester {

bool (*refusal_hook)(Asked what) = nullptr;

namespace {

constexpr std::size_t Input_Buffer_Size = 1 << 16;

}  // namespace

Input_File::Input_File(std::span<const std::byte> bytes, std::string_view name) : name_(name), memory_(bytes)
{}

Input_File::~Input_File()
{
    Close();
}

bool Input_File::Open(std::string_view name)
{
    Close();
    name_ = name;
    position_ = read_so_far_ = 0;
    buffer_next_ = buffer_end_ = 0;
    failed_ = false;
    if (Allowed(Asked::open))
        descriptor_ = ::open(Native_Path(name).c_str(), O_RDONLY | O_CLOEXEC);
    struct stat facts;
    if (descriptor_ >= 0 && (::fstat(descriptor_, &facts) != 0 || S_ISDIR(facts.st_mode)))
        Close();
    return descriptor_ >= 0;
}

std::int64_t Input_File::Size() const
{
    if (descriptor_ < 0)
        return static_cast<std::int64_t>(memory_.size());
    struct stat facts;
    return ::fstat(descriptor_, &facts) == 0 && S_ISREG(facts.st_mode) ? facts.st_size : 0;
}

bool Input_File::Write_Time(Local_Time& time) const
{
    struct stat facts;
    std::tm parts{};
    if (descriptor_ < 0 || ::fstat(descriptor_, &facts) != 0
        || ::localtime_r(&facts.st_mtim.tv_sec, &parts) == nullptr)
        return false;
    time = {parts.tm_hour,
            parts.tm_min,
            parts.tm_sec,
            parts.tm_mon + 1,
            parts.tm_mday,
            parts.tm_year + 1900,
            static_cast<int>(facts.st_mtim.tv_nsec / 1000000)};
    return true;
}

bool Input_File::Seek(std::int64_t position)
{
    if (position < 0)
        return false;
    if (descriptor_ >= 0) {
        if (!Allowed(Asked::seek) || ::lseek(descriptor_, position, SEEK_SET) != position)
            return false;
        read_so_far_ = position;
        buffer_next_ = buffer_end_ = 0;
    } else if (position > static_cast<std::int64_t>(memory_.size())) {
        return false;
    }
    position_ = position;
    return true;
}

std::size_t Input_File::Read_Directly(void* target, std::size_t count)
{
    auto* at = static_cast<char*>(target);
    std::size_t done = 0;
    while (done < count) {
        const bool allowed = Allowed(Asked::read);
        const std::size_t part = std::min(count - done, Greatest_Request);
        const ::ssize_t got = allowed ? ::read(descriptor_, at + done, part) : -1;
        if (got > 0)
            done += static_cast<std::size_t>(got);
        else if (got == 0)
            break;
        else if (!allowed || errno != EINTR) {
            failed_ = true;
            break;
        }
    }
    read_so_far_ += static_cast<std::int64_t>(done);
    return done;
}

bool Input_File::Fill_Buffer()
{
    buffer_.resize(Input_Buffer_Size);
    buffer_next_ = 0;
    buffer_end_ = Read_Directly(buffer_.data(), buffer_.size());
    return buffer_end_ > 0;
}

std::size_t Input_File::Read(void* target, std::size_t count)
{
    std::size_t done = 0;
    if (descriptor_ < 0) {
        const auto left = memory_.size() - static_cast<std::size_t>(position_);
        done = std::min(count, left);
        if (done > 0)
            std::memcpy(target, memory_.data() + position_, done);
    } else {
        auto* at = static_cast<std::byte*>(target);
        while (done < count) {
            const std::size_t held = std::min(count - done, buffer_end_ - buffer_next_);
            if (held > 0) {
                std::memcpy(at + done, buffer_.data() + buffer_next_, held);
                buffer_next_ += held;
                done += held;
            } else if (count - done >= Input_Buffer_Size) {
                done += Read_Directly(at + done, count - done);
                break;
            } else if (!Fill_Buffer()) {
                break;
            }
        }
    }
    position_ += static_cast<std::int64_t>(done);
    return done;
}

std::size_t Input_File::Read_Head(void* target, std::size_t count)
{
    if (descriptor_ < 0)
        return Read(target, count);
    const std::size_t done = Read_Directly(target, count);
    position_ += static_cast<std::int64_t>(done);
    return done;
}

int Input_File::Peek()
{
    if (descriptor_ < 0)
        return static_cast<std::size_t>(position_) < memory_.size()
                   ? std::to_integer<int>(memory_[static_cast<std::size_t>(position_)])
                   : -1;
    if (buffer_next_ == buffer_end_ && !Fill_Buffer())
        return -1;
    return std::to_integer<int>(buffer_[buffer_next_]);
}

int Input_File::Step()
{
    ++position_;
    if (descriptor_ >= 0)
        ++buffer_next_;
    return Peek();
}

void Input_File::Pass_Line_End(int c)
{
    if (c == '\r' && Step() != '\n')
        return;
    if (c == '\r' || c == '\n')
        static_cast<void>(Step());
}

bool Input_File::Take_Line(std::string& line, std::size_t limit, bool cut)
{
    line.clear();
    int c = Peek();
    if (c < 0)
        return false;
    for (; c >= 0 && c != '\n' && c != '\r' && line.size() < limit; c = Step())
        line.push_back(static_cast<char>(c));
    while (cut && c >= 0 && c != '\n' && c != '\r')
        c = Step();
    Pass_Line_End(c);
    return true;
}

bool Input_File::Read_Line(std::string& line, std::size_t limit)
{
    return Take_Line(line, limit, false);
}

bool Input_File::Read_Cut_Line(std::string& line, std::size_t limit)
{
    return Take_Line(line, limit, true);
}

bool Input_File::Close()
{
    if (descriptor_ >= 0)
        ::close(descriptor_);
    descriptor_ = -1;
    if (memory_.data() != nullptr)
        position_ = 0;  // nothing is left to read
    memory_ = {};
    return !failed_;
}

Output_File::~Output_File()
{
    behind_.reset();
    if (descriptor_ >= 0 && owned_)
        ::close(descriptor_);
}

bool Output_File::Start(int descriptor)
{
    behind_.reset();
    if (descriptor_ >= 0 && owned_)
        ::close(descriptor_);
    descriptor_ = descriptor;
    owned_ = true;
    failed_ = descriptor < 0;
    used_ = 0;
    flushed_ = 0;
    is_large_ = false;
    return !failed_;
}

void Output_File::Need_Buffer()
{
    if (buffer_ == nullptr)
        buffer_ = std::make_unique_for_overwrite<char[]>(buffer_size_);
}

bool Output_File::Make(std::string_view name, int how, unsigned permissions)
{
    Need_Buffer();  // before there is a file
    const std::string path = Native_Path(name);
    return Start(
        Allowed(Asked::open) ? ::open(path.c_str(), O_WRONLY | O_CREAT | O_CLOEXEC | how, permissions) : -1);
}

bool Output_File::Open(std::string_view name)
{
    return Make(name, O_TRUNC, 0666);
}

bool Output_File::Open_Scratch(std::string_view name)
{
    Delete_File(name);
    return Make(name, O_EXCL | O_NOFOLLOW, 0600);
}

void Output_File::Open_Standard_Output()
{
    Need_Buffer();
    static_cast<void>(Start(STDOUT_FILENO));
    owned_ = false;
}

void Output_File::Write_Directly(const char* bytes, std::size_t count)
{
    Settle();
    failed_ = failed_ || (count > 0 && !Allowed(Asked::write));
    flushed_ += static_cast<std::int64_t>(count);
    failed_ = failed_ || !Write_To_System(descriptor_, bytes, count);
}

void Output_File::Settle()
{
    if (behind_ != nullptr && !behind_->Settle())
        failed_ = true;
}

/// The buffers of a large file are written behind its back; a pipe's reader sees them when they are full.
void Output_File::Flush()
{
    constexpr std::int64_t large = std::int64_t{1} << 22;
    if (owned_ && !is_large_ && flushed_ >= large) {
        is_large_ = true;
        behind_ = Write_Behind::Start(descriptor_, buffer_size_);
    }
    if (behind_ == nullptr) {
        Write_Directly(buffer_.get(), used_);
    } else {
        failed_ = failed_ || !Allowed(Asked::write) || !behind_->Take(buffer_, used_);
        flushed_ += static_cast<std::int64_t>(used_);
    }
    used_ = 0;
}

void Output_File::Write(const void* bytes, std::size_t count)
{
    if (count == 0)
        return;  // there may be no bytes to point at
    if (descriptor_ < 0) {
        failed_ = true;
        return;
    }
    if (count > buffer_size_ - used_)
        Flush();
    if (count > buffer_size_) {
        Write_Directly(static_cast<const char*>(bytes), count);
        return;
    }
    std::memcpy(buffer_.get() + used_, bytes, count);
    used_ += count;
}

void Output_File::Write_At(std::int64_t position, const void* bytes, std::size_t count)
{
    if (position < 0 || position + static_cast<std::int64_t>(count) > Position()) {
        failed_ = true;
        return;
    }
    const auto* at = static_cast<const char*>(bytes);
    Settle();
    if (position < flushed_ && count > 0)
        failed_ = failed_ || !Allowed(Asked::write);
    while (position < flushed_ && count > 0 && !failed_) {
        const auto part = std::min(count, static_cast<std::size_t>(flushed_ - position));
        const ::ssize_t put = ::pwrite(descriptor_, at, part, position);
        if (put >= 0) {
            at += put;
            position += put;
            count -= static_cast<std::size_t>(put);
        } else if (errno != EINTR) {
            failed_ = true;
        }
    }
    if (count > 0 && !failed_)
        std::memcpy(buffer_.get() + (position - flushed_), at, count);
}

/// How many of the bytes the system could copy.
std::int64_t Output_File::Copy_In_System(const Input_File& source, std::int64_t count)
{
    constexpr std::int64_t at_once = 1 << 26;
    std::int64_t done = 0;
    ::off_t from = source.Position();
    while (done < count && !failed_) {
        if (!Allowed(Asked::write)) {
            failed_ = true;
            break;
        }
        if (!Allowed(Asked::read))
            break;
        const auto part = static_cast<std::size_t>(std::min(count - done, at_once));
        const ::ssize_t copied = ::copy_file_range(source.Descriptor(), &from, descriptor_, nullptr, part, 0);
        if (copied <= 0)
            break;  // what can't be copied so may be read and written
        done += copied;
    }
    flushed_ += done;
    return done;
}

bool Output_File::Copy_From(Input_File& source, std::int64_t count)
{
    constexpr std::int64_t block_size = 1 << 20;
    Flush();
    Settle();
    if (source.Descriptor() >= 0 && descriptor_ >= 0 && !failed_) {
        const std::int64_t copied = Copy_In_System(source, count);
        count -= copied;
        if (!source.Seek(source.Position() + copied))
            return false;
    }
    if (count == 0)
        return !failed_;
    const auto block = std::make_unique_for_overwrite<char[]>(block_size);
    while (count > 0 && !failed_) {
        const auto part = static_cast<std::size_t>(std::min(count, block_size));
        if (!source.Read_Exactly(block.get(), part))
            return false;
        Write(block.get(), part);
        count -= static_cast<std::int64_t>(part);
    }
    return !failed_;
}

bool Output_File::Close()
{
    if (descriptor_ < 0)
        return false;
    Flush();
    Settle();
    behind_.reset();
    if (owned_ && (::close(descriptor_) != 0 || !Allowed(Asked::close)))
        failed_ = true;
    descriptor_ = -1;
    return !failed_;
}

bool Copy_File(std::string_view from, std::string_view to, std::uint64_t most)
{
    constexpr std::size_t block_size = std::size_t{1} << 20;
    Input_File source;
    Output_File target;
    const auto block = std::make_unique_for_overwrite<char[]>(block_size);
    if (!source.Open(from) || !target.Open_Scratch(to))
        return false;
    std::uint64_t copied = 0;
    while (const std::size_t got = source.Read(block.get(), block_size)) {
        copied += got;
        if (copied > most || target.Failed())
            break;
        target.Write(block.get(), got);
    }
    const bool good = target.Close() && source.Close() && copied <= most;
    if (!good)
        Delete_File(to);
    return good;
}

Scratch_File::~Scratch_File()
{
    if (!name_.empty())
        Delete_File(name_);
}

}  // namespace ingester

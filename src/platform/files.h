// Files: RAII, large reads, typed reads. Names are request names, native ones will do as well.
#pragma once

#include "platform/folders.h"
#include "platform/write_behind.h"
#include "support/byte_fields.h"

#include <cstddef>
#include <cstdint>
#include <limits>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// A file open for reading, or bytes in memory that stand for one.
class Input_File {
public:
    Input_File() = default;
    /// Reads from `bytes`, which must outlive it.
    explicit Input_File(std::span<const std::byte> bytes, std::string_view name = {});
    Input_File(const Input_File&) = delete;
    Input_File& operator=(const Input_File&) = delete;
    ~Input_File();

    /// Opens a regular file, a device or a pipe. A folder can't be opened.
    [[nodiscard]] bool Open(std::string_view name);

    [[nodiscard]] const std::string& Name() const { return name_; }

    /// The system's number of the open file; below 0 for bytes in memory. For this floor only.
    [[nodiscard]] int Descriptor() const { return descriptor_; }

    /// Bytes in all; 0 where that isn't known before they are read.
    [[nodiscard]] std::int64_t Size() const;
    [[nodiscard]] std::int64_t Position() const { return position_; }
    /// When the file was last written. False for bytes in memory.
    [[nodiscard]] bool Write_Time(Local_Time& time) const;
    [[nodiscard]] bool Seek(std::int64_t position);

    /// Up to `count` bytes; fewer only at the end, or after a fault (see `Failed`).
    [[nodiscard]] std::size_t Read(void* target, std::size_t count);
    [[nodiscard]] bool Read_Exactly(void* target, std::size_t count) { return Read(target, count) == count; }
    /// As `Read`, from the start of the file and nothing beyond: a look at a file that others will read.
    [[nodiscard]] std::size_t Read_Head(void* target, std::size_t count);
    template <class T> [[nodiscard]] bool Read_Little(T& value)
    {
        std::byte bytes[sizeof(T)];
        if (!Read_Exactly(bytes, sizeof bytes))
            return false;
        value = Number_At<T>(bytes);
        return true;
    }

    /// The next line without its end (LF, CR LF or CR); at most `limit` characters at a time.
    /// False at the end of the file.
    [[nodiscard]] bool Read_Line(std::string& line, std::size_t limit);

    /// The same, but the rest of a line beyond `limit` is dropped with it.
    [[nodiscard]] bool Read_Cut_Line(std::string& line, std::size_t limit);

    /// The system refused a read.
    [[nodiscard]] bool Failed() const { return failed_; }

    /// False when reading failed. Closing twice is harmless.
    bool Close();

private:
    [[nodiscard]] std::size_t Read_Directly(void* target, std::size_t count);
    [[nodiscard]] bool Fill_Buffer();
    [[nodiscard]] int Peek();
    [[nodiscard]] int Step();
    void Pass_Line_End(int c);
    [[nodiscard]] bool Take_Line(std::string& line, std::size_t limit, bool cut);

    std::string name_;
    int descriptor_ = -1;
    std::span<const std::byte> memory_;
    std::int64_t position_ = 0;     ///< of the caller
    std::int64_t read_so_far_ = 0;  ///< of the system
    bool failed_ = false;
    std::vector<std::byte> buffer_;
    std::size_t buffer_next_ = 0;
    std::size_t buffer_end_ = 0;
};

/// A file being written through one large buffer. Unless `Close` said true it may be incomplete.
class Output_File {
public:
    static constexpr std::size_t large_buffer = std::size_t{1} << 20;
    static constexpr std::size_t small_buffer = std::size_t{1} << 12;  ///< for a few lines

    explicit Output_File(std::size_t buffer_size = large_buffer) : buffer_size_(buffer_size) {}
    Output_File(const Output_File&) = delete;
    Output_File& operator=(const Output_File&) = delete;
    ~Output_File();

    /// Makes the file, or empties an old one.
    [[nodiscard]] bool Open(std::string_view name);
    /// Makes a scratch file that nobody else can read; an old file or link of that name goes first.
    [[nodiscard]] bool Open_Scratch(std::string_view name);
    /// Writes to standard output.
    void Open_Standard_Output();

    [[nodiscard]] bool Is_Open() const { return descriptor_ >= 0; }

    /// Bytes written so far.
    [[nodiscard]] std::int64_t Position() const { return flushed_ + static_cast<std::int64_t>(used_); }

    void Write(const void* bytes, std::size_t count);
    /// Puts other bytes in the place of some that were written; not on a pipe.
    void Write_At(std::int64_t position, const void* bytes, std::size_t count);
    void Write(std::string_view text) { Write(text.data(), text.size()); }
    template <class T> void Write_Little(T value)
    {
        std::byte bytes[sizeof(T)];
        Put_Number<T>(bytes, value);
        Write(bytes, sizeof bytes);
    }

    /// Writes the next `count` bytes of `source`, which the system copies by itself where it can. False when
    /// they aren't there, or after a refusal.
    [[nodiscard]] bool Copy_From(Input_File& source, std::int64_t count);

    /// The system refused a write; later ones are dropped.
    [[nodiscard]] bool Failed() const { return failed_; }

    /// Writes what is buffered and closes: true when every byte was taken.
    [[nodiscard]] bool Close();

private:
    void Need_Buffer();
    [[nodiscard]] bool Make(std::string_view name, int how, unsigned permissions);
    [[nodiscard]] bool Start(int descriptor);
    void Flush();
    void Settle();
    [[nodiscard]] std::int64_t Copy_In_System(const Input_File& source, std::int64_t count);
    void Write_Directly(const char* bytes, std::size_t count);

    int descriptor_ = -1;
    bool owned_ = false;
    bool failed_ = false;
    std::size_t buffer_size_;
    std::unique_ptr<char[]> buffer_;
    std::size_t used_ = 0;
    std::int64_t flushed_ = 0;  ///< bytes given to the system, or on their way to it
    bool is_large_ = false;
    std::unique_ptr<Write_Behind> behind_;  ///< of a large file
};

/// Copies all bytes of `from` into the scratch file `to`. False, and no copy, when either fails or there are
/// more than `most`.
[[nodiscard]] bool Copy_File(std::string_view from, std::string_view to,
                             std::uint64_t most = std::numeric_limits<std::uint64_t>::max());

/// Deletes the named file when it goes out of sight.
class Scratch_File {
public:
    explicit Scratch_File(std::string name) : name_(std::move(name)) {}
    Scratch_File(const Scratch_File&) = delete;
    Scratch_File& operator=(const Scratch_File&) = delete;
    ~Scratch_File();
    [[nodiscard]] const std::string& Name() const { return name_; }
    /// It stays after all.
    void Keep() { name_.clear(); }

private:
    std::string name_;
};

}  // namespace ingester

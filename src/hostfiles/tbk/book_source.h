// The records of a book, read one behind the other in the book's byte order.
#pragma once

#include "hostfiles/shared/host_text.h"
#include "hostfiles/tbk/tbk_format.h"
#include "platform/files.h"
#include "support/byte_fields.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>

namespace ingester {

/// Who walks, and so how a bad book is told of.
enum class Book_Walker : std::uint8_t { reader, updater, lister /* tells nobody */ };

/// The record that the walk is at.
struct Book_Record {
    std::int64_t offset = 0;
    std::int64_t length = 0;
    long number = 0;  ///< from 1
    std::int32_t type = 0;
};

/// Whatever is false here was told of.
class Book_Source {
public:
    /// Messages name the book by `shown`.
    Book_Source(Input_File& file, Book_Walker walker, std::string_view shown);

    [[nodiscard]] bool Read_Head();
    [[nodiscard]] std::endian Order() const { return order_; }
    [[nodiscard]] std::int32_t Sections() const { return sections_; }
    [[nodiscard]] std::int64_t Size() const { return file_->Size(); }
    [[nodiscard]] const std::string& Shown() const { return shown_; }

    /// Goes to the record behind this one, or at `Jump`'s offset.
    [[nodiscard]] bool Next_Record();
    [[nodiscard]] const Book_Record& Record() const { return record_; }
    [[nodiscard]] bool Jump(std::int64_t offset);

    /// Bytes of the record that were not read yet.
    [[nodiscard]] std::int64_t Left() const { return unread_ + std::int64_t(end_ - next_); }
    /// The same, but no more than the file can hold.
    [[nodiscard]] std::int64_t Left_In_File() const { return std::min(Left(), Size() - record_.offset); }
    [[nodiscard]] bool Skip_Rest();
    /// Copies the rest of a large record.
    [[nodiscard]] bool Copy_Rest(Output_File& target);

    /// The next `count` bytes (`Bytes_At_Once` at most), which stand until the next call; null when the
    /// record has no more.
    [[nodiscard]] const std::byte* Take(std::size_t count);
    static constexpr std::size_t Bytes_At_Once = std::size_t{1} << 16;

    template <class T> [[nodiscard]] bool Read(T& value)
    {
        const std::byte* const bytes = Take(sizeof(T));
        if (bytes == nullptr)
            return false;
        value = Number_At<T>(bytes, order_);
        return true;
    }
    template <class First, class Second, class... Rest>
    [[nodiscard]] bool Read(First& first, Second& second, Rest&... rest)
    {
        return Read(first) && Read(second, rest...);
    }

    /// `length` bytes, `kept` of them at most into `text`; the same of a text.
    [[nodiscard]] bool Read_Bytes(std::int64_t length, std::size_t kept, std::string& text);
    [[nodiscard]] bool Read_Letters(std::int64_t length, std::size_t kept, std::string& text)
    {
        if (!Read_Bytes(length, kept, text))
            return false;
        Take_From_Host(text);
        return true;
    }
    [[nodiscard]] bool Skip(std::int64_t count);

    /// A text behind its length. A null `text` passes over it. The length in the book, below 0 for a fault.
    [[nodiscard]] std::int32_t Read_Short_Text(std::string* text, std::size_t limit);
    [[nodiscard]] bool Read_Long_Text(std::string& text, std::size_t limit);

    /// Tells that the record is bad, and why if there is more to say. Always false.
    bool Corrupt(const char* fault = nullptr);

    /// The `sheet_start_record` that should stand at `offset`: reads no more than it, and nothing behind.
    /// False, and nobody is told, where there is none.
    [[nodiscard]] bool Peek_Page_Name(std::int64_t offset, std::string& name);

private:
    [[nodiscard]] bool Short_Read();
    [[nodiscard]] bool Refill(std::size_t count);

    Input_File* file_;
    Book_Walker walker_;
    std::string shown_;
    std::endian order_ = std::endian::little;
    std::int32_t sections_ = 0;
    Book_Record record_;
    std::int64_t unread_ = 0;  ///< of the record, in the file
    std::unique_ptr<std::byte[]> block_;
    std::size_t next_ = 0;
    std::size_t end_ = 0;
};

}  // namespace ingester

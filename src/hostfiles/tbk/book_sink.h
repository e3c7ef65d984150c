// The stream that a book is written to, in the book's byte order.
#pragma once

#include "hostfiles/shared/host_text.h"
#include "hostfiles/tbk/tbk_format.h"
#include "platform/files.h"
#include "support/byte_fields.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <string_view>

namespace ingester {

class Book_Sink {
public:
    Book_Sink(Output_File& file, std::endian order) : file_(&file), order_(order) {}

    [[nodiscard]] std::endian Order() const { return order_; }
    [[nodiscard]] std::int64_t Position() const { return file_->Position(); }

    /// A write was refused, or something is too large for the words that tell of it.
    [[nodiscard]] bool Failed() const { return too_large_ || file_->Failed(); }

    template <class T> void Put(T value)
    {
        std::byte bytes[sizeof(T)];
        Put_In_Order(bytes, value);
        file_->Write(bytes, sizeof bytes);
    }
    template <class First, class Second, class... Rest> void Put(First first, Second second, Rest... rest)
    {
        Put(first);
        Put(second, rest...);
    }
    void Put_Byte(std::int32_t value) { Put(static_cast<std::uint8_t>(value)); }
    void Put_Bytes(std::string_view bytes) { file_->Write(bytes); }
    void Put_Bytes(const std::byte* bytes, std::size_t count) { file_->Write(bytes, count); }
    /// The file itself, for bytes that are copied to it.
    [[nodiscard]] Output_File& File() { return *file_; }
    void Put_Short_Text(std::string_view text)
    {
        text = texts_.In_File(text).substr(0, Short_Text_Width);
        Put(static_cast<std::uint8_t>(text.size()));
        Put_Bytes(text);
    }
    void Put_Long_Text(std::string_view text)
    {
        text = texts_.In_File(text);
        Put(In_A_Word(static_cast<std::int64_t>(text.size())));
        Put_Bytes(text);
    }

    [[nodiscard]] Host_Text_Out& Texts() { return texts_; }

    /// Puts a number into bytes that go out later.
    template <class T> void Put_In_Order(std::byte* bytes, T value) const
    {
        if (order_ == std::endian::little)
            Put_Number<T, std::endian::little>(bytes, value);
        else
            Put_Number<T, std::endian::big>(bytes, value);
    }

    /// The head of a record of known length; of one whose length is told by `End_Record`.
    void Put_Record_Head(std::int32_t type, std::int64_t length)
    {
        Put(static_cast<std::uint16_t>(type), In_A_Word(length));
    }
    void Start_Record(Record_Type type)
    {
        record_at_ = Position();
        Put_Record_Head(type, 0);
    }
    void End_Record()
    {
        const auto head = static_cast<std::int64_t>(Record_Head_Size);
        Put_Word_At(record_at_ + static_cast<std::int64_t>(sizeof(std::uint16_t)),
                    Position() - record_at_ - head);
    }
    void Put_Mark(Record_Type type) { Put_Record_Head(type, 0); }

    /// Puts a word in the place of one that was written as a stand-in.
    void Put_Word_At(std::int64_t position, std::int64_t value)
    {
        std::byte bytes[sizeof(std::int32_t)];
        Put_In_Order(bytes, In_A_Word(value));
        file_->Write_At(position, bytes, sizeof bytes);
    }

    /// Lengths and offsets are signed words.
    [[nodiscard]] std::int32_t In_A_Word(std::int64_t value)
    {
        too_large_ = too_large_ || value < 0 || value > Greatest_Offset;
        return static_cast<std::int32_t>(std::clamp<std::int64_t>(value, 0, Greatest_Offset));
    }

private:
    Output_File* file_;
    Host_Text_Out texts_;
    std::endian order_;
    bool too_large_ = false;
    std::int64_t record_at_ = 0;
};

}  // namespace ingester

// The stream that a book is written to, in the book's byte order.
#pragma once

#include "hostfiles/shared/host_text.h"
#include "hostfiles/tbk/tbk_format.h"
#include "platform/field_sink.h"

#include <algorithm>
#include <cstdint>
#include <string_view>

namespace ingester {

class Book_Sink : public Field_Sink {
public:
    using Field_Sink::Field_Sink;

    /// A write was refused, or something is too large for the words that tell of it.
    [[nodiscard]] bool Failed() const { return too_large_ || Field_Sink::Failed(); }

    void Put_Byte(std::int32_t value) { Put(static_cast<std::uint8_t>(value)); }
    void Put_Short_Text(std::string_view text)
    {
        Put_Text<std::uint8_t>(texts_.Cross(text).substr(0, Short_Text_Width));
    }
    void Put_Long_Text(std::string_view text)
    {
        text = texts_.Cross(text);
        Put(In_A_Word(static_cast<std::int64_t>(text.size())));
        Put_Bytes(text);
    }

    [[nodiscard]] Host_Text_Out& Texts() { return texts_; }

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
    void Put_Word_At(std::int64_t position, std::int64_t value) { Put_At(position, In_A_Word(value)); }

    /// Lengths and offsets are signed words.
    [[nodiscard]] std::int32_t In_A_Word(std::int64_t value)
    {
        too_large_ = too_large_ || value < 0 || value > Greatest_Offset;
        return static_cast<std::int32_t>(std::clamp<std::int64_t>(value, 0, Greatest_Offset));
    }

private:
    Host_Text_Out texts_;
    bool too_large_ = false;
    std::int64_t record_at_ = 0;
};

}  // namespace ingester

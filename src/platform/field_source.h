// Typed fields of a file, one behind the other, in the byte order that the file has.
#pragma once

#include "platform/files.h"
#include "support/byte_fields.h"

#include <bit>
#include <concepts>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <tuple>
#include <type_traits>

namespace ingester {

/// What a field can hold: an integer or a floating-point number of 1, 2, 4 or 8 bytes.
template <class T>
concept Field_Number = std::is_arithmetic_v<T>;

/// Nothing is reported here, and no length or position that a file claims is trusted.
class Field_Source {
public:
    explicit Field_Source(Input_File& file, std::endian byte_order = std::endian::little)
        : order(byte_order), file_(&file)
    {}

    std::endian order;

    [[nodiscard]] Input_File& File() { return *file_; }
    [[nodiscard]] std::int64_t Position() const { return file_->Position(); }

    /// Goes to a position of the file, which may be its end. False where there is none.
    [[nodiscard]] bool Seek(std::int64_t position);

    template <Field_Number T> [[nodiscard]] bool Read(T& value)
    {
        std::byte bytes[sizeof(T)];
        if (!Read_Raw(bytes, sizeof bytes))
            return false;
        value = Number_At<T>(bytes, order);
        return true;
    }
    template <Field_Number First, Field_Number... Rest>
    [[nodiscard]] bool Read(First& first, Rest&... rest) requires(sizeof...(Rest) > 0)
    {
        return Read(first) && (Read(rest) && ...);
    }

    /// The members of a record, in the order of its layout: a tuple of pointers to them.
    template <class Record, class... Numbers>
    [[nodiscard]] bool Read_Record(Record& record, const std::tuple<Numbers Record::*...>& layout)
    {
        return std::apply([&](const auto&... member) { return (Read(record.*member) && ...); }, layout);
    }

    /// A number of a list, from 0.
    template <std::integral T> [[nodiscard]] bool Read_Count(T& count) { return Read(count) && count >= 0; }

    template <Field_Number T, std::size_t extent>
    [[nodiscard]] bool Read_Numbers(std::span<T, extent> numbers)
    {
        if (!Read_Raw(numbers.data(), numbers.size_bytes()))
            return false;
        Turn_Native(std::span<T>(numbers), order);
        return true;
    }

    /// `length` bytes (none when negative), of which `kept` at most go to `text` and the others are
    /// passed over. `text` grows as the bytes come, whatever `length` claims.
    [[nodiscard]] bool Read_Bytes(std::int64_t length, std::size_t kept, std::string& text);

    /// A text behind its length, a number of type `Length`. False for a negative one.
    template <std::integral Length = std::int32_t>
    [[nodiscard]] bool Read_Text(std::size_t kept, std::string& text)
    {
        Length length;
        return Read_Count(length) && Read_Bytes(static_cast<std::int64_t>(length), kept, text);
    }
    template <std::integral Length = std::int32_t> [[nodiscard]] bool Skip_Text()
    {
        Length length;
        return Read_Count(length) && Skip(static_cast<std::int64_t>(length));
    }

    /// Passes over bytes that must be there; none when negative.
    [[nodiscard]] bool Skip(std::int64_t bytes);

    /// How many items of `size` bytes, of `claimed` ones, the rest of the file can hold.
    [[nodiscard]] std::int64_t Possible(std::int64_t claimed, std::int64_t size) const;

    /// Whether the file was found to end before what was to be read.
    [[nodiscard]] bool Ended() const { return ended_; }

private:
    [[nodiscard]] bool Read_Raw(void* target, std::size_t count)
    {
        const bool whole = file_->Read_Exactly(target, count);
        ended_ = ended_ || !whole;
        return whole;
    }

    Input_File* file_;
    bool ended_ = false;
};

}  // namespace ingester

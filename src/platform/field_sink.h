// Typed fields into a file, one behind the other, in the byte order that the file is to have.
#pragma once

#include "platform/field_source.h"
#include "platform/files.h"
#include "support/byte_fields.h"

#include <algorithm>
#include <bit>
#include <cstddef>
#include <cstdint>
#include <span>
#include <string_view>
#include <tuple>

namespace ingester {

class Field_Sink {
public:
    explicit Field_Sink(Output_File& file, std::endian order = std::endian::little)
        : file_(&file), order_(order)
    {}

    [[nodiscard]] Output_File& File() { return *file_; }
    [[nodiscard]] std::endian Order() const { return order_; }
    [[nodiscard]] std::int64_t Position() const { return file_->Position(); }
    [[nodiscard]] bool Failed() const { return file_->Failed(); }

    template <Field_Number T> void Put(T value)
    {
        std::byte bytes[sizeof(T)];
        Put_In_Order(bytes, value);
        file_->Write(bytes, sizeof bytes);
    }
    template <Field_Number First, Field_Number... Rest>
    void Put(First first, Rest... rest) requires(sizeof...(Rest) > 0)
    {
        Put(first);
        (Put(rest), ...);
    }

    /// The members of a record, as `Field_Source::Read_Record` reads them.
    template <class Record, class... Numbers>
    void Put_Record(const Record& record, const std::tuple<Numbers Record::*...>& layout)
    {
        std::apply([&](const auto&... member) { (Put(record.*member), ...); }, layout);
    }

    /// Numbers at once; they are turned where they stand.
    template <Field_Number T, std::size_t extent> void Put_Numbers(std::span<T, extent> numbers)
    {
        Turn_Native(std::span<T>(numbers), order_);
        file_->Write(numbers.data(), numbers.size_bytes());
    }

    void Put_Bytes(std::string_view bytes) { file_->Write(bytes); }
    void Put_Bytes(const std::byte* bytes, std::size_t count) { file_->Write(bytes, count); }

    void Fill(std::int64_t count, char filler = '\0')
    {
        char block[256];
        std::ranges::fill(block, filler);
        for (; count > 0; count -= std::ssize(block))
            file_->Write(block, static_cast<std::size_t>(std::min<std::int64_t>(count, std::ssize(block))));
    }

    /// A text of `width` bytes, cut or filled up at its end.
    void Put_Padded(std::string_view text, std::size_t width, char filler = ' ')
    {
        text = text.substr(0, width);
        Put_Bytes(text);
        Fill(static_cast<std::int64_t>(width - text.size()), filler);
    }

    /// A text behind its length, a number of type `Length`, which it must fit.
    template <std::integral Length = std::int32_t> void Put_Text(std::string_view text)
    {
        Put(static_cast<Length>(text.size()));
        Put_Bytes(text);
    }

    /// Leaves room for a number that is known later, and tells where; nothing of this works on a pipe.
    template <Field_Number T> [[nodiscard]] std::int64_t Leave_Room()
    {
        const std::int64_t place = Position();
        Put(T{});
        return place;
    }
    template <Field_Number T> void Put_At(std::int64_t place, T value)
    {
        std::byte bytes[sizeof(T)];
        Put_In_Order(bytes, value);
        file_->Write_At(place, bytes, sizeof bytes);
    }

    /// Puts a number into bytes that go out later.
    template <Field_Number T> void Put_In_Order(std::byte* bytes, T value) const
    {
        if (order_ == std::endian::little)
            Put_Number<T, std::endian::little>(bytes, value);
        else
            Put_Number<T, std::endian::big>(bytes, value);
    }

private:
    Output_File* file_;
    std::endian order_;
};

}  // namespace ingester

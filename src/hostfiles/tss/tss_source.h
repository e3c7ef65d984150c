// The stream that the file is read from, in the byte order of its magic word.
#pragma once

#include "hostfiles/shared/host_text.h"
#include "hostfiles/tss/tss_format.h"
#include "platform/files.h"

#include <algorithm>
#include <bit>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace ingester {

class TSS_Source {
public:
    explicit TSS_Source(Input_File& file) : file_(&file) {}

    std::endian order = std::endian::native;
    std::int32_t version = 0;

    [[nodiscard]] Input_File& File() { return *file_; }

    [[nodiscard]] bool Read(std::int32_t& value) { return Read_Value(value); }
    [[nodiscard]] bool Read(double& value) { return Read_Value(value); }

    /// A number of a list, from 0.
    [[nodiscard]] bool Read_Count(std::int32_t& count) { return Read(count) && count >= 0; }

    /// The fields that this version has.
    template <class Record, class... Fields>
    [[nodiscard]] bool Read(Record& record, const std::tuple<Fields...>& layout)
    {
        const auto read = [&](const auto& field) {
            return field.since > version || Read(record.*field.member);
        };
        return std::apply([&](const auto&... field) { return (read(field) && ...); }, layout);
    }

    [[nodiscard]] bool Read_Numbers(std::span<double> numbers)
    {
        if (!Read_Raw(numbers.data(), numbers.size_bytes()))
            return false;
        Turn_Native(numbers, order);
        return true;
    }

    /// `length` bytes (none when negative), of which `kept` at most go to `text` and the others are
    /// passed over. `text` grows as the bytes come, whatever `length` claims.
    [[nodiscard]] bool Read_Bytes(std::int64_t length, std::size_t kept, std::string& text);

    /// The same, of a text.
    [[nodiscard]] bool Read_Letters(std::int64_t length, std::size_t kept, std::string& text)
    {
        if (!Read_Bytes(length, kept, text))
            return false;
        Take_From_Host(text);
        return true;
    }

    /// A counted text. False for a negative length.
    [[nodiscard]] bool Read_Text(std::size_t kept, std::string& text)
    {
        std::int32_t length;
        return Read_Count(length) && Read_Letters(length, kept, text);
    }

    [[nodiscard]] bool Skip(std::int64_t bytes);
    [[nodiscard]] bool Skip_Text()
    {
        std::int32_t length;
        return Read_Count(length) && Skip(length);
    }

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

    template <class T> [[nodiscard]] bool Read_Value(T& value)
    {
        std::byte bytes[sizeof(T)];
        if (!Read_Raw(bytes, sizeof bytes))
            return false;
        value = Number_At<T>(bytes, order);
        return true;
    }

    Input_File* file_;
    bool ended_ = false;
};

}  // namespace ingester

// The stream that the file is read from, in the byte order of its magic word.
#pragma once

#include "hostfiles/shared/host_text.h"
#include "hostfiles/tss/tss_format.h"
#include "platform/field_source.h"

#include <bit>
#include <cstdint>
#include <tuple>

namespace ingester {

class TSS_Source : public Field_Source {
public:
    explicit TSS_Source(Input_File& file) : Field_Source(file, std::endian::native) {}

    std::int32_t version = 0;

    using Field_Source::Read;

    /// The fields that this version has.
    template <class Record, class... Fields>
    [[nodiscard]] bool Read(Record& record, const std::tuple<Fields...>& layout)
    {
        const auto read = [&](const auto& field) {
            return field.since > version || Read(record.*field.member);
        };
        return std::apply([&](const auto&... field) { return (read(field) && ...); }, layout);
    }

    /// As `Read_Bytes`, of a text.
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
};

}  // namespace ingester

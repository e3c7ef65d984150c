// Books from records, in either byte order, sound or not.
#pragma once

#include "support/byte_fields.h"

#include <bit>
#include <cstdint>
#include <string>
#include <vector>

namespace ingester {

struct Book_Bytes {
    std::endian order = std::endian::little;

    template <class T> [[nodiscard]] std::string Number(T value) const
    {
        std::string bytes(sizeof(T), '\0');
        order == std::endian::little ? Put_Number<T, std::endian::little>(bytes.data(), value)
                                     : Put_Number<T, std::endian::big>(bytes.data(), value);
        return bytes;
    }
    [[nodiscard]] static std::string Byte(int value) { return std::string(1, static_cast<char>(value)); }
    [[nodiscard]] std::string Word(std::int64_t value) const
    {
        return Number(static_cast<std::int32_t>(value));
    }
    [[nodiscard]] std::string Words(const std::vector<std::int64_t>& values) const
    {
        std::string bytes;
        for (const std::int64_t value : values)
            bytes += Word(value);
        return bytes;
    }
    [[nodiscard]] std::string Reals(const std::vector<double>& values) const
    {
        std::string bytes;
        for (const double value : values)
            bytes += Number(value);
        return bytes;
    }
    [[nodiscard]] static std::string Short(const std::string& text)
    {
        return Byte(static_cast<int>(text.size())) + text;
    }
    [[nodiscard]] std::string Long(const std::string& text) const
    {
        return Word(static_cast<std::int64_t>(text.size())) + text;
    }

    [[nodiscard]] std::string Record(int type, const std::string& payload = {}) const
    {
        return Record_Head(type, static_cast<std::int64_t>(payload.size())) + payload;
    }
    [[nodiscard]] std::string Record_Head(int type, std::int64_t length) const
    {
        return Number(static_cast<std::uint16_t>(type)) + Word(length);
    }

    [[nodiscard]] std::string Head(int sections = 1) const
    {
        return std::string("TBK\1KVX\0", 8) + Number(std::uint16_t{1})
               + Number(static_cast<std::uint16_t>(sections));
    }

    /// A column with its own records in `body`.
    [[nodiscard]] std::string Column(int type, int rows, const std::string& name,
                                     const std::string& body) const
    {
        return Record(64, Byte(type) + Word(rows) + Short(name) + std::string("\1\6\0\1\0\0\0", 7)) + body
               + Record(65);
    }
    /// A Variate of 1, 2, ...
    [[nodiscard]] std::string Variate(int rows, const std::string& name) const
    {
        std::string cells = Word(rows);
        for (int row = 1; row <= rows; ++row)
            cells += Number(static_cast<double>(row));
        return Column(4, rows, name, Record(81, cells));
    }

    [[nodiscard]] std::string Sheet(const std::string& name, int type, int columns, int rows,
                                    const std::string& body) const
    {
        return Record(16, Byte(type) + Words({columns, rows}) + Number(-1e307) + std::string(4, '\0')
                              + Short(name))
               + body + Record(17);
    }

    /// One section: its table points at the sheets.
    [[nodiscard]] std::string Section(const std::vector<std::string>& sheets, std::size_t at,
                                      const std::string& in_front = {}, const std::string& behind = {}) const
    {
        std::string all;
        std::vector<std::int64_t> offsets;
        const std::size_t first = at + 14 + in_front.size() + 6 + 4 * sheets.size();
        for (const std::string& sheet : sheets) {
            offsets.push_back(static_cast<std::int64_t>(first + all.size()));
            all += sheet;
        }
        all += behind + Record(2);
        return Record(1, Words({static_cast<std::int64_t>(sheets.size()),
                                static_cast<std::int64_t>(first + all.size())}))
               + in_front + Record(3, Words(offsets)) + all;
    }
    [[nodiscard]] std::string Book(const std::vector<std::string>& sheets, const std::string& in_front = {},
                                   const std::string& behind = {}) const
    {
        return Head() + Section(sheets, 12, in_front, behind);
    }
    /// A book of one Vector Sheet "S" with this body.
    [[nodiscard]] std::string Vector(int columns, int rows, const std::string& body) const
    {
        return Book({Sheet("S", 1, columns, rows, body)});
    }
};

}  // namespace ingester

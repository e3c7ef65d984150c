// Books from records, in either byte order, sound or not.
#pragma once

#include "hostfiles/shared/bytes_of.h"

#include <cstdint>
#include <string>
#include <vector>

namespace ingester {

struct Book_Bytes {
    std::endian order = std::endian::little;

    template <class T> [[nodiscard]] std::string Number(T value) const { return Bytes_Of(value, order); }
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

    [[nodiscard]] std::string Record_Head(int type, std::int64_t length) const
    {
        return Number(static_cast<std::uint16_t>(type)) + Word(length);
    }
    [[nodiscard]] std::string Record(int type, const std::string& payload = {}) const
    {
        return Record_Head(type, static_cast<std::int64_t>(payload.size())) + payload;
    }
    [[nodiscard]] std::string Head(int sections = 1) const
    {
        return std::string("TBK\1KVX\0", 8) + Number(std::uint16_t{1})
               + Number(static_cast<std::uint16_t>(sections));
    }

    /// A column with its own records in `body`.
    [[nodiscard]] std::string Column(int type, int rows, const std::string& name, const std::string& body,
                                     const std::string& display = std::string("\1\6\0\1\0\0\0", 7)) const
    {
        return Record(64, Byte(type) + Word(rows) + Short(name) + display) + body + Record(65);
    }
    [[nodiscard]] std::string Numbers(const std::vector<double>& cells) const
    {
        return Record(81, Word(static_cast<std::int64_t>(cells.size())) + Reals(cells));
    }
    /// A Variate of 1, 2, ...
    [[nodiscard]] std::string Variate(int rows, const std::string& name) const
    {
        std::vector<double> cells;
        for (int row = 1; row <= rows; ++row)
            cells.push_back(row);
        return Column(4, rows, name, Numbers(cells));
    }
    [[nodiscard]] std::string Sheet(const std::string& name, int type, int columns, int rows,
                                    const std::string& body, const std::string& flags = {}) const
    {
        std::string four = flags;
        four.resize(4);
        return Record(16, Byte(type) + Words({columns, rows}) + Number(-1e307) + four + Short(name)) + body
               + Record(17);
    }
    /// A sheet that stands at `at`, with the table of its columns.
    [[nodiscard]] std::string Sheet_With_Table(std::size_t at, const std::string& name, int type, int rows,
                                               const std::vector<std::string>& columns,
                                               const std::string& in_front, const std::string& behind,
                                               const std::string& flags = {}) const
    {
        const auto count = static_cast<int>(columns.size());
        std::vector<std::int64_t> offsets;
        std::string all;
        at += Sheet(name, type, count, rows, "").size() + 4 * columns.size() + in_front.size();  // without 17
        for (const std::string& column : columns) {
            offsets.push_back(static_cast<std::int64_t>(at + all.size()));
            all += column;
        }
        return Sheet(name, type, count, rows, Record(18, Words(offsets)) + in_front + all + behind, flags);
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

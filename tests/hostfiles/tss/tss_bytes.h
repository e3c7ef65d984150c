// Spreadsheet files put together number by number, in either order of bytes and in every version.
#pragma once

#include "model/sheet.h"
#include "support/byte_fields.h"

#include <bit>
#include <cstdint>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace ingester {

/// Bytes that stand for themselves.
struct Raw {
    std::string bytes;
};

/// A piece of a file: integers, doubles and bytes. A counted text is two of them.
class Items : public std::vector<std::variant<std::int32_t, double, Raw>> {
public:
    Items& operator<<(std::int32_t value)
    {
        emplace_back(value);
        return *this;
    }
    Items& operator<<(double value)
    {
        emplace_back(value);
        return *this;
    }
    Items& operator<<(const Raw& raw)
    {
        emplace_back(raw);
        return *this;
    }
    Items& operator<<(const std::string& text)
    {
        return *this << static_cast<std::int32_t>(text.size()) << Raw{text};
    }
    Items& operator<<(const char* text) { return *this << std::string(text); }
    Items& operator<<(const Items& more)
    {
        insert(end(), more.begin(), more.end());
        return *this;
    }
};

template <class... Values> Items Of(const Values&... values)
{
    Items items;
    static_cast<void>((items << ... << values));
    return items;
}

inline std::string Encode(const Items& items, std::endian order = std::endian::little)
{
    std::string bytes;
    const auto put = [&](auto value) {
        char number[sizeof value];
        if (order == std::endian::little)
            Put_Number<decltype(value), std::endian::little>(number, value);
        else
            Put_Number<decltype(value), std::endian::big>(number, value);
        bytes.append(number, sizeof number);
    };
    for (const auto& item : items)
        if (const auto* raw = std::get_if<Raw>(&item))
            bytes += raw->bytes;
        else if (const auto* integer = std::get_if<std::int32_t>(&item))
            put(*integer);
        else
            put(std::get<double>(item));
    return bytes;
}

/// What stands behind a column's name.
struct Shown {
    std::string description = {};
    std::int32_t format = 3;
    std::int32_t width = 8;
    std::int32_t justify = 0;
    std::int32_t date_word = 1;
    std::int32_t flags = 0;
    std::string attached = {};
};

/// Puts down what a version has.
struct Maker {
    std::int32_t version = 3;

    [[nodiscard]] Items Head(std::int32_t type, std::int32_t columns, std::int32_t rows,
                             std::uint32_t flags = 0, double missing = Missing_Value) const
    {
        constexpr std::int32_t magics[] = {0, 53315331, 53325332, 54415441};
        Items items;
        if (version > 0)
            items << magics[version];
        items << type << columns << rows << missing;
        if (version >= 2)
            items << 0;
        if (version >= 3)
            items << 0 << static_cast<std::int32_t>(flags) << 0 << 0;
        return items;
    }
    [[nodiscard]] Items Column(std::int32_t type, std::int32_t length, const std::string& name,
                               const Shown& shown = {}) const
    {
        Items items = Of(type, length, name);
        if (version >= 3)
            items << shown.description;
        if (version >= 1)
            items << shown.format << shown.width;
        if (version >= 2)
            items << shown.justify;
        if (version >= 3)
            items << shown.date_word << shown.flags << shown.attached;
        return items;
    }
    [[nodiscard]] Items Numbers(std::int32_t type, const std::string& name, const std::vector<double>& cells,
                                const Shown& shown = {}) const
    {
        Items items = Column(type, static_cast<std::int32_t>(cells.size()), name, shown);
        items << 2;
        for (const double cell : cells)
            items << cell;
        return items;
    }
    [[nodiscard]] Items Texts(std::int32_t type, const std::string& name,
                              const std::vector<std::string>& cells, std::int32_t width,
                              Shown shown = {}) const
    {
        shown.format = 4;
        Items items = Column(type, static_cast<std::int32_t>(cells.size()), name, shown);
        items << width;
        for (const std::string& cell : cells)
            items << cell;
        return items;
    }
    /// Lists may be empty; `kind` is told from version 2.
    [[nodiscard]] Items Factor(const std::string& name, std::int32_t levels,
                               const std::vector<double>& values, const std::vector<std::string>& labels,
                               std::int32_t kind, const std::vector<double>& cells, Shown shown = {}) const
    {
        if (kind == 2)
            shown.format = 4;
        Items items = Column(2, static_cast<std::int32_t>(cells.size()), name, shown);
        items << levels << static_cast<std::int32_t>(values.size())
              << static_cast<std::int32_t>(labels.size());
        if (version >= 2)
            items << kind;
        if (!values.empty())
            items << 1;
        std::size_t widest = 1;
        for (const std::string& label : labels)
            widest = std::max(widest, label.size());
        if (!labels.empty())
            items << static_cast<std::int32_t>(widest);
        for (const double value : values)
            items << value;
        for (const std::string& label : labels)
            items << label;
        for (const double cell : cells)
            items << cell;
        return items;
    }
};

/// A Vector of four columns and three rows with records behind it, by the bit of the head; the current
/// cell and the creation dates are always there.
inline Items With_Records(std::map<int, Items> records)
{
    constexpr double m = Missing_Value;
    const Maker make;
    records.try_emplace(4, Of(1, 1));
    records.try_emplace(14, Of(0.0, 4, 0.0, 0.0, 0.0, 0.0));
    std::uint32_t flags = 0;
    for (const auto& [bit, record] : records)
        flags |= 1U << bit;
    Items items = make.Head(1, 4, 3, flags);
    items << make.Factor("f", 3, {}, {"a", "bb", "c"}, 2, {1.0, m, 3.0})
          << make.Numbers(4, "x", {1.5, m, -2.0}) << make.Texts(3, "t", {"one", "", "three"}, 5)
          << make.Numbers(4, "y", {7.0, 8.0, 9.0});
    for (const auto& [bit, record] : records)
        items << record;
    return items;
}

/// A small file, and what it reads as.
struct Small_File {
    std::string what;
    Items items;
    std::string cells;
    bool comes_back = true;  ///< written again it has the same bytes
};

/// The records that the writer always sets.
constexpr std::uint32_t Always_Written = 1U << 4 | 1U << 14;

inline Items Always_Behind(std::int32_t columns)
{
    Items items = Of(1, 1, 0.0, columns);
    for (std::int32_t i = 0; i < columns; ++i)
        items << 0.0;
    return items;
}

/// One of each kind of Sheet that `version` has.
inline std::vector<Small_File> Small_Files(std::int32_t version)
{
    constexpr double m = Missing_Value;
    const Maker make{version};
    const bool newest = version == 3;
    std::vector<Small_File> files;
    const auto add = [&](const char* what, std::int32_t type, std::int32_t columns, std::int32_t rows,
                         const Items& body, const char* cells, bool comes_back = true,
                         std::int32_t marks = 0) {
        Items items = make.Head(type, columns + marks, rows, newest ? Always_Written : 0);
        items << body;
        if (newest)
            items << Always_Behind(columns);
        files.push_back({what, items, cells, comes_back && newest});
    };
    const Items x = make.Numbers(4, "x", {1.5, m, -2.0});
    add("numbers", 1, 1, 3, x, "x V1.5|*|-2");
    add("kinds of vectors", 1, 6, 2,
        Of(make.Texts(-3, "u", {"r1", "r2"}, 2), make.Factor("p", 2, {}, {}, 0, {2.0, 1.0}),
           make.Factor("v", 2, {0.5, 1.5}, {}, 1, {1.0, m}),
           make.Factor("l", 2, {1.0, 2.0}, {"lo", "hi"}, 2, {2.0, m}), make.Texts(3, "t", {"", "x y"}, 3),
           make.Texts(3, "g", {std::string(91, 'g'), ""}, 91)),
        "u Ur1|r2; p F2|1; v F1|*; l F2|*; t T|x y; g L91 characters|");
    add("a short column", 1, 2, 3, Of(x, make.Numbers(-4, "s", {4.0})), "s U4; x V1.5|*|-2", false);
    add("row marks", 1, 1, 3, Of(x, 21, 3, 1, 0, 1), "x V1.5|*|-2", true, 1);
    add("a Matrix", 2, 3, 2,
        Of("M", 1, make.Texts(-3, "rows", {"a", "b"}, 1), make.Numbers(5, "c1", {1.0, 2.0}),
           make.Numbers(5, "c 2", {3.0, m})),
        "rows Ua|b; c1 M1|2; c 2 M3|*");
    add("a Symmetric Matrix", 3, 2, 2,
        Of("S", 0, make.Numbers(7, "1", {1.0, 2.0}), make.Numbers(7, "2", {3.0})), "1 S1|2; 2 S3");
    add("a Symmetric Matrix in full", 3, 2, 2,
        Of("S", 0, make.Numbers(7, "1", {1.0, 2.0}), make.Numbers(7, "2", {2.0, 3.0})), "1 S1|2; 2 S3",
        false);
    add("a Diagonal Matrix", 4, 1, 2, make.Numbers(6, "D", {1.0, 2.0}), "D D1|2");
    add("a Scalar", 6, 2, 1, Of(make.Numbers(1, "a", {1.0}), make.Numbers(1, "b", {m})), "a S1; b S*");
    const Items one_way = newest ? Of(1, 0) : Of(1);
    add("a Table of one way", 5, 2, 2,
        Of(one_way, make.Factor("f", 2, {}, {"a", "b"}, 2, {1.0, 2.0}), make.Numbers(8, "T", {5.0, 6.0})),
        "f F1|2; T T5|6");
    const Items two_ways = newest ? Of(2, 0, 0) : Of(2);
    Items level_3 = make.Column(8, 2, "third");
    level_3 << 3.5 << 2 << 5.0 << 6.0;
    const Items behind = newest ? Of("across", 1, 65, 3) : Items();
    files.push_back({"a Table of two ways",
                     Of(make.Head(5, 2, 2, newest ? Always_Written | 1U << 19 : 0), two_ways, "T", 3, "g",
                        make.Factor("f", 2, {}, {"a", "b"}, 2, {1.0, 2.0}), level_3,
                        newest ? Always_Behind(2) : Items(), behind),
                     "f F1|2; third T5|6", newest});
    if (newest)
        files.push_back({"a Table with margins",
                         Of(make.Head(5, 3, 3, Always_Written | 1U << 19), 2, 1, 1, "T", 2, "g",
                            make.Factor("f", 3, {}, {"a", "b", "All"}, 2, {1.0, 2.0, 3.0}),
                            make.Numbers(8, "g1", {1.0, 2.0, 3.0}), make.Numbers(22, "All", {1.0, 2.0, 3.0}),
                            Always_Behind(3), "", 1, 0, -1),
                         "f F1|2|3; g1 T1|2|3; All T1|2|3"});
    return files;
}

}  // namespace ingester

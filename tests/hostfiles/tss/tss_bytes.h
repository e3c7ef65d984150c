// Spreadsheet files put together number by number, in either order of bytes and in every version.
#pragma once

#include "model/sheet.h"
#include "support/items.h"

#include <cstdint>
#include <map>
#include <string>
#include <variant>
#include <vector>

namespace ingester {

template <class T> std::int32_t Count(const std::vector<T>& values)
{
    return static_cast<std::int32_t>(values.size());
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

    /// `items` from version `since`.
    [[nodiscard]] Items From(std::int32_t since, const Items& items) const
    {
        return version >= since ? items : Items();
    }
    [[nodiscard]] Items Head(std::int32_t type, std::int32_t columns, std::int32_t rows,
                             std::uint32_t flags = 0, double missing = Missing_Value) const
    {
        constexpr std::int32_t magics[] = {0, 53315331, 53325332, 54415441};
        return Of(From(1, Of(magics[version])), type, columns, rows, missing, From(2, Of(0)),
                  From(3, Of(0, static_cast<std::int32_t>(flags), 0, 0)));
    }
    [[nodiscard]] Items Column(std::int32_t type, std::int32_t length, const std::string& name,
                               const Shown& shown = {}) const
    {
        return Of(type, length, name, From(3, Of(shown.description)), From(1, Of(shown.format, shown.width)),
                  From(2, Of(shown.justify)), From(3, Of(shown.date_word, shown.flags, shown.attached)));
    }
    [[nodiscard]] Items Numbers(std::int32_t type, const std::string& name, const std::vector<double>& cells,
                                const Shown& shown = {}) const
    {
        return Of(Column(type, Count(cells), name, shown), 2, cells);
    }
    [[nodiscard]] Items Texts(std::int32_t type, const std::string& name,
                              const std::vector<std::string>& cells, std::int32_t width,
                              Shown shown = {}) const
    {
        shown.format = 4;
        return Of(Column(type, Count(cells), name, shown), width, cells);
    }
    /// Lists may be empty; `kind` is told from version 2.
    [[nodiscard]] Items Factor(const std::string& name, std::int32_t levels,
                               const std::vector<double>& values, const std::vector<std::string>& labels,
                               std::int32_t kind, const std::vector<double>& cells, Shown shown = {}) const
    {
        std::size_t widest = 1;
        for (const std::string& label : labels)
            widest = std::max(widest, label.size());
        if (kind == 2)
            shown.format = 4;
        return Of(Column(2, Count(cells), name, shown), levels, Count(values), Count(labels),
                  From(2, Of(kind)), values.empty() ? Items() : Of(1),
                  labels.empty() ? Items() : Of(static_cast<std::int32_t>(widest)), values, labels, cells);
    }
};

using Records = std::map<int, Items>;

/// A Vector of four columns and three rows with records behind it, by the bit of the head; the current
/// cell and the creation dates are always there.
inline Items With_Records(Records records, std::int32_t date_word = 1)
{
    constexpr double m = Missing_Value;
    const Maker make;
    const Shown shown{.date_word = date_word};
    records.try_emplace(4, Of(1, 1));
    records.try_emplace(14, Of(0.0, 4, 0.0, 0.0, 0.0, 0.0));
    std::uint32_t flags = 0;
    Items behind;
    for (const auto& [bit, record] : records) {
        flags |= 1U << bit;
        behind.Add(record);
    }
    return Of(make.Head(1, 4, 3, flags), make.Factor("f", 3, {}, {"a", "bb", "c"}, 2, {1.0, m, 3.0}, shown),
              make.Numbers(4, "x", {1.5, m, -2.0}, shown), make.Texts(3, "t", {"one", "", "three"}, 5, shown),
              make.Numbers(4, "y", {7.0, 8.0, 9.0}, shown), behind);
}

/// A small file, and what it reads as.
struct Small_File {
    std::string what;
    Items items;
    std::string cells;
    bool comes_back = true;  ///< written again it has the same bytes
};

/// One of each kind of Sheet that `version` has.
inline std::vector<Small_File> Small_Files(std::int32_t version)
{
    constexpr double m = Missing_Value;
    const Maker make{version};
    const bool newest = version == 3;
    std::vector<Small_File> files;
    const auto add = [&](const char* what, std::int32_t type, std::int32_t columns, std::int32_t rows,
                         const Items& body, const char* cells, bool comes_back = true,
                         const Items& factor_across = {}, std::int32_t marks = 0) {
        const std::uint32_t flags = 1U << 4 | 1U << 14 | (factor_across.empty() ? 0 : 1U << 19);
        const std::vector<double> dates(static_cast<std::size_t>(columns));
        files.push_back({what,
                         Of(make.Head(type, columns + marks, rows, flags), body,
                            make.From(3, Of(1, 1, 0.0, columns, dates, factor_across))),
                         cells, comes_back && newest});
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
    add("row marks", 1, 1, 3, Of(x, 21, 3, 1, 0, 1), "x V1.5|*|-2", true, {}, 1);
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
    const Items down = make.Factor("f", 2, {}, {"a", "b"}, 2, {1.0, 2.0});
    add("a Table of one way", 5, 2, 2, Of(1, make.From(3, Of(0)), down, make.Numbers(8, "T", {5.0, 6.0})),
        "f F1|2; T T5|6");
    add("a Table of two ways", 5, 2, 2,
        Of(2, make.From(3, Of(0, 0)), "T", 3, "g", down, make.Column(8, 2, "third"), 3.5, 2, 5.0, 6.0),
        "f F1|2; third T5|6", true, Of("across", 1, 65, 3));
    if (newest)
        add("a Table with margins", 5, 3, 3,
            Of(2, 1, 1, "T", 2, "g",
               make.Factor("f", 3, {0.5, 1.5, 3.0}, {"a", "b", "All"}, 2, {1.0, 2.0, 3.0}),
               make.Numbers(8, "g1", {1.0, 2.0, 3.0}), make.Numbers(22, "All", {1.0, 2.0, 3.0})),
            "f F1|2|3; g1 T1|2|3; All T1|2|3", true, Of("", 1, 0, -1));
    return files;
}

}  // namespace ingester

// Files put together number by number, in either order of bytes.
#pragma once

#include "hostfiles/shared/bytes_of.h"

#include <cstdint>
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
    void Add(std::int32_t value) { emplace_back(value); }
    void Add(double value) { emplace_back(value); }
    void Add(const Raw& raw) { emplace_back(raw); }
    void Add(const std::string& text)
    {
        Add(static_cast<std::int32_t>(text.size()));
        Add(Raw{text});
    }
    void Add(const char* text) { Add(std::string(text)); }
    void Add(const Items& more) { insert(end(), more.begin(), more.end()); }
    template <class T> void Add(const std::vector<T>& values)
    {
        for (const T& value : values)
            Add(value);
    }
};

template <class... Values> Items Of(const Values&... values)
{
    Items items;
    (items.Add(values), ...);
    return items;
}

inline std::string Encode(const Items& items, std::endian order = std::endian::little)
{
    std::string bytes;
    for (const auto& item : items)
        if (const auto* raw = std::get_if<Raw>(&item))
            bytes += raw->bytes;
        else if (const auto* integer = std::get_if<std::int32_t>(&item))
            bytes += Bytes_Of(*integer, order);
        else
            bytes += Bytes_Of(std::get<double>(item), order);
    return bytes;
}

}  // namespace ingester

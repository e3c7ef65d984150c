#include "book_parser.h"

#include <cstdint>
#include <map>
#include <vector>

namespace ingester {

std::string Faults_Of_Book(const std::string& bytes)
{
    constexpr std::size_t head = 6;
    const bool big = bytes.size() > 8 && bytes[8] == '\0';
    const auto number = [&](std::size_t at, std::size_t size) {
        std::uint32_t value = 0;
        for (std::size_t i = 0; i < size && at + i < bytes.size(); ++i) {
            const std::uint32_t byte = static_cast<unsigned char>(bytes[at + i]);
            value = big ? value << 8 | byte : value | byte << 8 * i;
        }
        return value;
    };
    std::map<std::size_t, std::uint32_t> records;                   // their types, by their offsets
    std::vector<std::pair<std::uint32_t, std::uint32_t>> pointers;  // an offset, and the type it is for
    for (std::size_t at = 12; at < bytes.size(); at += head + number(at + 2, 4)) {
        const std::uint32_t type = records[at] = number(at, 2);
        if (type == 1)
            pointers.emplace_back(number(at + 10, 4), 0);
        for (std::size_t i = 0; (type == 3 || type == 18) && i < number(at + 2, 4); i += 4)
            pointers.emplace_back(number(at + head + i, 4), type == 3 ? 16 : 64);
        records[at + head + number(at + 2, 4)] = 0;  // the end, if nothing follows
    }
    std::string faults = records.contains(bytes.size()) ? "" : "a record goes beyond the end\n";
    for (const auto& [offset, type] : pointers)
        if (type == 0 ? offset != bytes.size() : !records.contains(offset) || records[offset] != type)
            faults += "nothing of type " + std::to_string(type) + " at " + std::to_string(offset) + "\n";
    return faults;
}

}  // namespace ingester

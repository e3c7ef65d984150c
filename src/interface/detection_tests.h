// The tests that tell a file's type from its first bytes and its name.
#pragma once

#include "support/text.h"

#include <array>
#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

/// What the tests look at: the name, and the head of the file, with zeros behind a short one.
struct Detection_Head {
    static constexpr std::size_t size = 200;

    std::string_view name;
    std::array<char, size> bytes{};
    std::size_t length = size;  ///< bytes that the file really has, up to `size`

    [[nodiscard]] std::string_view Text() const { return {bytes.data(), size}; }
    [[nodiscard]] std::uint8_t Byte(std::size_t at) const { return static_cast<std::uint8_t>(bytes[at]); }
    [[nodiscard]] bool Name_Ends(std::string_view endings) const { return Ends_With_One_Of(name, endings); }
};

/// Bytes that must stand at a place of the head.
struct Magic {
    std::size_t at = 0;
    std::string_view bytes;
    bool folded = false;  ///< letters match in either case

    [[nodiscard]] bool Matches(const Detection_Head& head) const;
};

/// One test. What it names must all hold: the magics, an ending of the name, a predicate.
struct Detection_Test {
    std::int32_t code;
    std::array<Magic, 2> magics{};
    std::string_view endings = {};
    bool (*predicate)(const Detection_Head& head) = nullptr;

    [[nodiscard]] bool Matches(const Detection_Head& head) const;
};

/// The code of the first test that matches, from the most specific to the least; 0 for none.
[[nodiscard]] std::int32_t Code_Of_Head(const Detection_Head& head);

/// Whether the name has an extension of ecological data, and the head a Fortran format in its second line.
[[nodiscard]] bool Looks_Like_Cornell(const Detection_Head& head);

}  // namespace ingester

// Dates out of texts, by the layouts of the display codes.
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>

namespace ingester {

/// Codes that `Text_To_Date` has layouts for lie in 1..42.
constexpr std::int32_t Greatest_Date_Format = 42;

/// Reads a date in the layout of `format` into a day number of `form`; no text, and one that begins with
/// "*", are `missing`. A strict reading takes nothing that isn't part of the layout; the other one makes
/// do with numbers that begin the parts, and takes a plain number for a day number. False for no date,
/// `value` is `missing` then.
bool Text_To_Date(std::string_view text, double& value, std::int32_t form, std::int32_t format,
                  double missing, bool strict);

/// Codes that read alike share a layout, by number from 0; `No_Layout` is that of a code without one.
constexpr std::size_t No_Layout = 24;
[[nodiscard]] std::size_t Date_Layout_Of(std::int32_t format);

/// What the strict reading says of one text under all layouts at once.
struct Strict_Readings {
    std::uint64_t good = 0;   ///< layouts that the text has, a bit each
    std::uint64_t early = 0;  ///< those of them by which it is a date in front of 1900
    double value = 0.0;       ///< by the first of the good ones, in day counts
    bool colon = false;       ///< there is a time in it
    bool blank = false;       ///< no text, or one that begins with "*", which has any layout
};
[[nodiscard]] Strict_Readings Read_By_All_Layouts(std::string_view text);

/// The month, 1 to 12, of a three-letter name or of a whole one, in any case; 0 for none. A strict name
/// stands alone; otherwise any text that begins with the three letters, or with the name, will do.
[[nodiscard]] std::int32_t Month_From_Short(std::string_view text, bool strict);
[[nodiscard]] std::int32_t Month_From_Name(std::string_view text, bool strict);

}  // namespace ingester

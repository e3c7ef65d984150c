// What the steps of the reader hand to each other.
#pragma once

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tss/tss_format.h"
#include "hostfiles/tss/tss_source.h"

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// The rows that the request keeps.
struct Row_Selection {
    bool active = false;
    std::span<const std::int32_t> flags;  ///< rows beyond are left out

    [[nodiscard]] bool Keeps(std::int32_t row) const
    {
        return !active
               || (row < static_cast<std::int32_t>(flags.size())
                   && flags[static_cast<std::size_t>(row)] != 0);
    }
    /// How many of the first `rows`.
    [[nodiscard]] std::int32_t Count(std::int32_t rows) const;
};

struct TSS_Reading {
    TSS_Source source;
    Sheet* sheet = nullptr;
    Head_Record head = {};
    std::int32_t columns = 0;  ///< records to read
    Row_Selection rows = {};
    bool selects_columns = false;
    std::vector<std::int8_t> row_marks = {};  ///< of the rows kept
    bool colours_corrupt = false;             ///< a record of colours or the like was
};

/// Reads the record of column `ordinal`. False where the columns end, silently.
[[nodiscard]] bool Read_TSS_Column(TSS_Reading& reading, std::int32_t ordinal);

/// A number of the file, with the Sheet's own mark for "missing".
[[nodiscard]] inline double Clean_Number(double value, double missing)
{
    return !Is_Surely_Present(value) && Is_Missing_In_File(value, missing) ? missing : value;
}

/// A cleaned name that no Column gets: what its brackets held must not come to the next Column that is made.
[[nodiscard]] std::string Valid_Name_Of_No_Column(std::string_view name);

/// Whether the request's list of columns has a name, or a number.
[[nodiscard]] bool Is_Column_Selected(std::int32_t ordinal, std::string_view name);

/// Reads what the head announces behind the columns, up to a fault. False for a fault that leaves no Sheet.
[[nodiscard]] bool Read_Auxiliary_Records(TSS_Reading& reading);

}  // namespace ingester

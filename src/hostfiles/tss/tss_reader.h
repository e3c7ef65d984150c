// What the steps of the reader hand to each other.
#pragma once

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/shared/selection.h"
#include "hostfiles/tss/tss_format.h"
#include "hostfiles/tss/tss_source.h"
#include "platform/memory_ahead.h"

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

struct TSS_Reading {
    TSS_Source source;
    Sheet* sheet = nullptr;
    Head_Record head = {};
    std::int32_t columns = 0;  ///< records to read
    Row_Selection rows = {};
    std::vector<std::int32_t> new_rows = {};  ///< the places that `rows` gives them
    Column_Subset subset = {};
    bool selects_columns = false;
    std::vector<std::uint8_t> row_marks = {};  ///< of the rows kept
    Memory_Ahead ahead = {};
    std::vector<Column*> columns_read = {};  ///< for the records behind them, which name them by ordinals
    std::int32_t factors_read = 0;           ///< of these
    bool colours_corrupt = false;            ///< a record of colours or the like was
    bool ends_early = false;                 ///< the file does, which is to be told

    /// For a read that came short, where no other message is due. Always false.
    [[nodiscard]] bool Ends_Early()
    {
        ends_early = true;
        return false;
    }
};

/// Reads the record of column `ordinal`. False where the columns end, silently.
[[nodiscard]] bool Read_TSS_Column(TSS_Reading& reading, std::int32_t ordinal);

/// A number of the file, with the Sheet's own mark for "missing".
[[nodiscard]] inline double Clean_Number(double value, double missing)
{
    return !Is_Surely_Present(value) && Is_Missing_In_File(value, missing) ? missing : value;
}

/// Reads what the head announces behind the columns, up to a fault. False for a fault that leaves no Sheet.
[[nodiscard]] bool Read_Auxiliary_Records(TSS_Reading& reading);

}  // namespace ingester

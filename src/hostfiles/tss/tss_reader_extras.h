// The records behind the columns, for the files that read them: each reads one, where it stands. What is
// false when one breaks off or tells what can't be has been reported, but for what the list of the records
// says about all of its faults.
#pragma once

#include "hostfiles/tss/tss_reader.h"

#include <cstdint>
#include <tuple>

namespace ingester {

/// The column of an ordinal; null for none.
[[nodiscard]] Column* Column_Of(const TSS_Reading& reading, std::int32_t ordinal);

/// `count` records of a layout, each given to `take`, until one is refused.
template <class Record, class... Fields, class Take> [[nodiscard]] bool
Read_Records(TSS_Reading& reading, std::int32_t count, const std::tuple<Fields...>& layout, Take take)
{
    for (std::int32_t i = 0; i < count; ++i) {
        Record record{};
        if (!reading.source.Read(record, layout) || !take(record))
            return false;
    }
    return true;
}

// Records of old files.
[[nodiscard]] bool Read_Print_Block(TSS_Reading& reading);
[[nodiscard]] bool Read_Bookmarks(TSS_Reading& reading);
[[nodiscard]] bool Read_Ignored_Integers(TSS_Reading& reading);
[[nodiscard]] bool Read_DDE_Link(TSS_Reading& reading);
[[nodiscard]] bool Read_Trial_Seasons(TSS_Reading& reading);

// Texts.
[[nodiscard]] bool Read_Analysis(TSS_Reading& reading);
[[nodiscard]] bool Read_Title(TSS_Reading& reading);
[[nodiscard]] bool Read_Pointers(TSS_Reading& reading);
[[nodiscard]] bool Read_Page_Name(TSS_Reading& reading);

// Factors and colours.
[[nodiscard]] bool Read_Column_Factor(TSS_Reading& reading);
[[nodiscard]] bool Read_Reference_Levels(TSS_Reading& reading);
[[nodiscard]] bool Read_Cell_Colours(TSS_Reading& reading);
[[nodiscard]] bool Read_Factor_Colours(TSS_Reading& reading);
[[nodiscard]] bool Read_Column_Colours(TSS_Reading& reading);

}  // namespace ingester

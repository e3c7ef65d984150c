// Rows of two Sheets joined on key columns.
#pragma once

#include "model/sheet.h"

#include <array>
#include <cstddef>
#include <cstdint>

namespace ingester {

/// A request has fewer.
constexpr std::size_t Most_Merge_Keys = 16;

/// Which rows of the source that have no row of the target to themselves make new rows.
enum Merge_Fill_Mode : std::int32_t {
    fill_none = 0,
    fill_copies = 1,  ///< those of a key that is there: as copies of its last row
    fill_all = 2,     ///< those of other keys as well, at the end, in the order of the keys
};

struct Merge_Request {
    Sheet* target = nullptr;
    Sheet* source = nullptr;
    std::int32_t key_count = 0;
    std::array<Column*, Most_Merge_Keys> target_keys{};
    std::array<Column*, Most_Merge_Keys> source_keys{};
    bool update_columns = false;  ///< a column of a name that is there is written into that one
    std::int32_t fill_mode = fill_all;
    bool ignore_case = false;
    double tolerance = 0.0;     ///< by which numbers of equal keys may differ
    bool keep_present = false;  ///< an update leaves cells that hold data
    bool skip_missing = false;  ///< an update leaves cells that the source has no data for
};

/// Joins each row of the source with a row of the target of the same key, in turn: the first with the
/// first. Rows of the target without a partner have missing cells in the new columns; those that are too
/// many share the last row of the source. Rows of the target keep their order. False after a message, or
/// for Sheets without rows; the target may have changed by then.
bool Merge_Sheets(const Merge_Request& wanted);

/// Ends the restriction of a Sheet's rows.
void Clear_Restriction(Sheet* sheet);

}  // namespace ingester

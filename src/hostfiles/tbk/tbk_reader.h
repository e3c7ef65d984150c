// What the steps of the reader hand to each other.
#pragma once

#include "hostfiles/shared/selection.h"
#include "hostfiles/tbk/book_source.h"
#include "platform/memory_ahead.h"

#include <cstdint>
#include <string>
#include <utility>
#include <vector>

namespace ingester {

/// Cells that columns may have without a record of theirs, and rows that a Sheet may have without columns:
/// no byte of the book stands for them.
constexpr std::int64_t Most_Blank_Cells = std::int64_t{1} << 22;

struct Book_Reading {
    Book_Source source;

    // Where the walk is.
    bool in_book = false;
    bool in_sheet = false;
    bool in_column = false;
    bool in_comments = false;
    bool finished = false;
    std::int32_t sections_ended = 0;
    std::int32_t sheets = 0;  ///< that the section says it has

    // The sheet that was asked for.
    bool chooses = false;
    bool by_number = false;
    bool chosen = false;

    Column_Subset subset = {};

    // The Sheet being read, or the last one; the column likewise.
    Sheet* sheet = nullptr;
    std::int32_t stored_columns = 0;
    Column* column = nullptr;
    std::int32_t stored_length = 0;
    Memory_Ahead ahead = {};
    bool has_cells = false;
    bool no_rows = false;  ///< a selection left none of the Sheet read last
    std::string hidden_map = {};
    std::vector<Column*> columns = {};       ///< by their place in the book; null for one left out
    std::vector<std::int32_t> origins = {};  ///< of the colours of each: a place in the book, 0 for none

    /// Cells that comments take the data from: the column's place in the book (from 0), and the row there.
    std::vector<std::pair<std::size_t, std::int32_t>> dropped_cells = {};

    std::int64_t blank_cells = Most_Blank_Cells;  ///< that are left
    const char* soft_fault = nullptr;             ///< the first
    bool unknown_told = false;

    /// Remembers what doesn't stop the reading.
    void Note(const char* fault)
    {
        if (soft_fault == nullptr)
            soft_fault = fault;
    }
};

/// Reads the payload of the record that the walk is at. False after a message.
using Record_Reader = bool (*)(Book_Reading& reading);

/// Tells that the Sheet could not be made, and why. Always false.
bool Not_Loaded(Book_Reading& reading, const char* fault);

// --- Records of a sheet ----------------------------------------------------------------------------

[[nodiscard]] bool Read_Structure_Name(Book_Reading& reading);
[[nodiscard]] bool Read_Table_Shape(Book_Reading& reading);
[[nodiscard]] bool Read_Table_Factor(Book_Reading& reading);
[[nodiscard]] bool Read_Margin_Label(Book_Reading& reading);
[[nodiscard]] bool Read_Analysis_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Title_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Current_Cell_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Pointer_Record(Book_Reading& reading);
[[nodiscard]] bool Read_DDE_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Split_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Restriction(Book_Reading& reading);
/// Makes the cells missing that comments told so far.
void Drop_Cells(Book_Reading& reading);
[[nodiscard]] bool Read_Hidden_Map(Book_Reading& reading);
[[nodiscard]] bool Read_Sheet_IPRINT(Book_Reading& reading);
[[nodiscard]] bool Read_Cell_Comment(Book_Reading& reading);

// --- Records of a column ---------------------------------------------------------------------------

[[nodiscard]] bool Start_Column(Book_Reading& reading);
[[nodiscard]] bool End_Column(Book_Reading& reading);
[[nodiscard]] bool Read_Old_Factor(Book_Reading& reading);
[[nodiscard]] bool Read_Column_Decimals(Book_Reading& reading);
[[nodiscard]] bool Read_Number_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Text_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Long_Text_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Factor_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Level_Value_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Label_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Reference_Level(Book_Reading& reading);
[[nodiscard]] bool Read_Factor_Colour_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Attached_Text(Book_Reading& reading);
[[nodiscard]] bool Read_Column_Extra(Book_Reading& reading);
[[nodiscard]] bool Read_Range_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Gradient_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Condition_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Column_Option(Book_Reading& reading);
[[nodiscard]] bool Read_Table_Level(Book_Reading& reading);
[[nodiscard]] bool Read_Cell_Colour_Record(Book_Reading& reading);
[[nodiscard]] bool Read_Column_IPRINT(Book_Reading& reading);
[[nodiscard]] bool Read_Colour_Source(Book_Reading& reading);
[[nodiscard]] bool Read_Column_Colour_Record(Book_Reading& reading);

}  // namespace ingester

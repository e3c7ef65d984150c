// What tests of joins build and look at.
#pragma once

#include "model/join/merge.h"
#include "model/number_format.h"
#include "model/told_sheets.h"

namespace ingester {

inline void Look_Like_Dates(Column& column, std::int16_t date_form)
{
    column.format = date_format_mark;
    column.date_format = 2;
    column.date_form = date_form;
}

inline Texts Plain_Cells(const Column& column)
{
    char room[Number_Text_Room];
    Texts cells;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        cells.emplace_back(Cell_Is_Present(column, *cell) ? Format_Cell(column, *cell, room) : "");
    return cells;
}

/// A merge by the first column of both.
inline Merge_Request By_First_Column(Sheet* target, Sheet* source)
{
    return {.target = target,
            .source = source,
            .key_count = 1,
            .target_keys = {Column_At(target, 1)},
            .source_keys = {Column_At(source, 1)}};
}

}  // namespace ingester

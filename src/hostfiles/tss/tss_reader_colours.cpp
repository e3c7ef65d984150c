// The records of Factors and of colours.
#include "hostfiles/tss/tss_reader_extras.h"
#include "model/date_format.h"
#include "model/row_fields.h"
#include "request/messages.h"
#include "support/number_text.h"

#include <algorithm>
#include <string>
#include <vector>

namespace ingester {

namespace {

/// The headings of a Table whose columns stand for dates.
void Print_Date_Headings(Sheet& sheet, std::int32_t code, std::int32_t form)
{
    char text[Number_Text_Room];
    for (Column* column = sheet.first_column->next; column != nullptr; column = column->next) {
        if (column->type != table_column)
            continue;
        double number = column->table_margin_value;
        const std::string_view name = column->name;
        if (!Is_Present(sheet, number)) {
            const Parsed_Number parsed = Parse_Number(name.data(), name.data() + name.size());
            number = parsed.status == Number_Status::good ? parsed.value
                                                          : column->index - sheet.leading_columns + 1;
        }
        char* const end = Format_Date_Time(text, number, form, code);
        column->name = std::string_view(text, end);
        if (column->width < 2)
            Compute_Column_Width(column);
    }
}

void Set_Column_Factor(Sheet& sheet, const Column_Factor_Record& record)
{
    constexpr std::int32_t most_decimals = 18;
    std::int32_t code = record.date_word % Date_Word_Base;
    std::int32_t form = record.date_word / Date_Word_Base;
    sheet.column_factor_format =
        std::clamp(record.format, std::int32_t{significant_digits_format}, std::int32_t{date_format_mark});
    sheet.column_factor_decimals = std::clamp(record.decimals, -1, most_decimals);
    if (code < 0 || code > Greatest_Date_Code) {
        Report_Message("Unknown Date format in table factor.\n");
        code = 1;
    }
    if (sheet.column_factor_format == date_format_mark && code == 0) {
        code = sheet.settings.date_format;
        form = sheet.settings.date_form;
    }
    sheet.column_factor_date = form >= 1 ? -code : code;
    if (sheet.label_state == labels_by_level && sheet.column_factor_format == date_format_mark && code != 0)
        Print_Date_Headings(sheet, code, form >= 1 ? 1 : 0);
}

}  // namespace

bool Read_Column_Factor(TSS_Reading& reading)
{
    std::string description;
    Column_Factor_Record record;
    if (!reading.source.Read_Text(Extra_Width, description))
        return Fail("Spreadsheet Read Error: Invalid Table Column Factor description.\n");
    reading.sheet->column_label_name = description;
    if (!reading.source.Read(record, Column_Factor_Fields))
        return reading.Ends_Early();
    Set_Column_Factor(*reading.sheet, record);
    return true;
}

bool Read_Reference_Levels(TSS_Reading& reading)
{
    std::int32_t count;
    return reading.source.Read_Count(count)
           && Read_Records<Setting_Record>(reading, count, Setting_Fields, [&](const Setting_Record& record) {
                  Column* const column = Column_Of(reading, record.ordinal);
                  if (column != nullptr && column->type == factor_column)
                      column->reference_level = std::min(record.value, column->nlevels);
                  return record.ordinal >= 0 && record.value >= 0;
              });
}

namespace {

/// What follows an ordinal that is no column's by the strict test.
bool Skip_Factor_Colours(TSS_Reading& reading, std::int32_t ordinal)
{
    TSS_Source& source = reading.source;
    std::int32_t count;
    return source.Skip(sizeof(std::int32_t))
           && (reading.sheet->type != table_sheet || ordinal >= reading.factors_read
               || (source.Read_Count(count) && source.Skip(std::int64_t{4} * count)));
}

bool Read_Factor_Colours_Of(TSS_Reading& reading, Column& column)
{
    TSS_Source& source = reading.source;
    std::int32_t origin;
    std::int32_t count;
    if (!source.Read(origin))
        return false;
    Column* const factor = Column_Of(reading, origin);
    if (factor != nullptr && factor->type == factor_column) {
        column.colour_source = factor;
        reading.sheet->has_colour_sources = 1;
    }
    if (column.type != factor_column)
        return true;
    if (!source.Read_Count(count))
        return false;
    if (count > column.nlevels)
        return source.Skip(std::int64_t{4} * count);
    std::vector<std::int32_t> colours;
    for (std::int32_t i = 0; i < count; ++i)
        if (!source.Read(colours.emplace_back()))
            return false;
    column.factor_colours = std::move(colours);
    return true;
}

}  // namespace

bool Read_Factor_Colours(TSS_Reading& reading)
{
    std::int32_t count;
    if (!reading.source.Read_Count(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t ordinal;
        if (!reading.source.Read(ordinal))
            return false;
        Column* const column = ordinal < reading.sheet->column_count ? Column_Of(reading, ordinal) : nullptr;
        if (!(column != nullptr ? Read_Factor_Colours_Of(reading, *column)
                                : Skip_Factor_Colours(reading, ordinal)))
            return false;
    }
    return true;
}

namespace {

// --- Colours ---------------------------------------------------------------------------------------

/// Cells that are all of the same colours are a column of these.
void Set_Cell_Colours(Column& column, std::vector<Cell_Colour>& colours)
{
    const Cell_Colour& first = colours.front();
    const bool alike = std::ranges::all_of(colours, [&](const Cell_Colour& colour) {
        return colour.text_colour == first.text_colour && colour.back_colour == first.back_colour;
    });
    if (!alike || std::ssize(colours) != column.length) {
        column.cell_colours = std::move(colours);
        return;
    }
    column.text_colour = first.text_colour;
    column.back_colour = first.back_colour;
}

bool Read_Cell_Colours_Of(TSS_Reading& reading, Column& column, std::int32_t count)
{
    constexpr std::int32_t nearly_black = 0x010101;  // 0 would be none
    std::vector<Cell_Colour> colours;
    colours.reserve(static_cast<std::size_t>(reading.source.Possible(count, sizeof(Cell_Colour))));
    if (!Read_Records<Cell_Colour>(reading, count, Cell_Colour_Fields, [&](Cell_Colour colour) {
            if (colour.back_colour == 0)
                colour.back_colour = nearly_black;
            colours.push_back(colour);
            return true;
        }))
        return false;
    if (reading.rows.active)
        Move_Cell_Colours(colours, reading.new_rows);
    if (!colours.empty())
        Set_Cell_Colours(column, colours);
    return true;
}

}  // namespace

bool Read_Cell_Colours(TSS_Reading& reading)
{
    std::int32_t columns;
    if (!reading.source.Read_Count(columns))
        return false;
    for (std::int32_t i = 0; i < columns; ++i) {
        std::int32_t ordinal;
        std::int32_t count;
        if (!reading.source.Read(ordinal) || !reading.source.Read_Count(count))
            return false;
        Column* const column = Column_Of(reading, ordinal);
        if (count > 0 && (column == nullptr || !Read_Cell_Colours_Of(reading, *column, count)))
            return false;
    }
    return true;
}

bool Read_Column_Colours(TSS_Reading& reading)
{
    std::int32_t count;
    return reading.source.Read_Count(count)
           && Read_Records<Column_Colours_Record>(
               reading, count, Column_Colours_Fields, [&](const Column_Colours_Record& record) {
                   Column* const column = Column_Of(reading, record.ordinal);
                   if (column != nullptr) {
                       column->text_colour = record.text_colour;
                       column->back_colour = record.back_colour;
                   }
                   return column != nullptr;
               });
}

}  // namespace ingester

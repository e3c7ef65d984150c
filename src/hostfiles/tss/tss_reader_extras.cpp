// The records behind the columns: what the host's window keeps beside the data.
#include "hostfiles/tss/tss_reader_extras.h"
#include "model/calendar.h"
#include "model/row_fields.h"
#include "request/messages.h"

#include <algorithm>
#include <string>

namespace ingester {

Column* Column_Of(const TSS_Reading& reading, std::int32_t ordinal)
{
    const bool known = ordinal >= 1 && ordinal <= std::ssize(reading.columns_read);
    return known ? reading.columns_read[static_cast<std::size_t>(ordinal) - 1] : nullptr;
}

namespace {

// --- View ------------------------------------------------------------------------------------------

bool Read_Current_Cell(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    Current_Cell_Record record;
    if (!reading.source.Read(record, Current_Cell_Fields))
        return false;
    sheet.current_column = std::clamp(record.column, 1, std::max(sheet.column_count, 1));
    sheet.current_row = std::clamp(record.row, 1, std::max(sheet.row_count, 1)) - 1;
    return true;
}

bool Read_Split_Column(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t column;
    if (!reading.source.Read(column))
        return false;
    if (column > sheet.leading_columns && column <= sheet.column_count) {
        sheet.split_set = 1;
        sheet.split_column = column;
    }
    return true;
}

bool Read_IPRINT(TSS_Reading& reading)
{
    constexpr std::int32_t greatest = 2;
    std::int32_t count;
    if (!reading.source.Read(reading.sheet->iprint) || !reading.source.Read_Count(count))
        return false;
    reading.sheet->iprint = std::clamp(reading.sheet->iprint, 0, greatest);
    return Read_Records<Setting_Record>(reading, count, Setting_Fields, [&](const Setting_Record& record) {
        Column* const column = Column_Of(reading, record.ordinal);
        if (column != nullptr)
            column->iprint = std::clamp(record.value, 0, greatest);
        return column != nullptr;
    });
}

bool Read_Hidden_Columns(TSS_Reading& reading)
{
    std::int32_t count;
    if (!reading.source.Read_Count(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t ordinal;
        Column* const column = reading.source.Read(ordinal) ? Column_Of(reading, ordinal) : nullptr;
        if (column == nullptr)
            return false;
        column->hidden = 1;
    }
    return true;
}

// --- Conditions, limits and gradients --------------------------------------------------------------

bool Is_Column_Count(const TSS_Reading& reading, std::int32_t count)
{
    return count >= 0 && count <= reading.sheet->column_count;
}

bool Read_Conditions_Of(TSS_Reading& reading, Column& column)
{
    for (std::size_t rule = 0; rule < Condition_Count; ++rule) {
        Condition_Record record;
        if (!reading.source.Read(record, Condition_Fields))
            return false;
        column.cond_op[rule] = static_cast<std::int16_t>(record.op);
        column.cond_value[rule] = Clean_Number(record.value, reading.sheet->missing_value);
        column.cond_colour[rule] = record.colour;
    }
    column.cond_active = 1;
    return true;
}

bool Read_Conditions(TSS_Reading& reading)
{
    constexpr const char* corrupt =
        "Spreadsheet Read Error: Conditional formatting object contains bad data.\n";
    std::int32_t mode;
    std::int32_t count;
    if (!reading.source.Read(mode) || !reading.source.Read(count))
        return false;
    reading.sheet->cond_mode = static_cast<std::int16_t>(mode);
    if (!Is_Column_Count(reading, count))
        return Fail(corrupt);
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t ordinal;
        if (!reading.source.Read(ordinal))
            return false;
        Column* const column = Column_Of(reading, ordinal);
        if (column == nullptr)
            return Fail(corrupt);
        if (!Read_Conditions_Of(reading, *column))
            return false;
    }
    return true;
}

bool Read_Range_Limits(TSS_Reading& reading)
{
    std::int32_t count;
    return reading.source.Read(count)
           && Read_Records<Range_Record>(reading, count, Range_Fields, [&](const Range_Record& record) {
                  Column* const column = Column_Of(reading, record.ordinal);
                  if (column == nullptr)
                      return Fail("Spreadsheet Read Error: Minimum/Maximum restriction object contains "
                                  "bad data.\n");
                  column->range_low = Clean_Number(record.low, reading.sheet->missing_value);
                  column->range_high = Clean_Number(record.high, reading.sheet->missing_value);
                  return true;
              });
}

bool Read_Gradients(TSS_Reading& reading)
{
    constexpr const char* corrupt =
        "Spreadsheet Read Error: Conditional background formatting object contains bad data.\n";
    std::int32_t count;
    if (!reading.source.Read(count))
        return false;
    if (!Is_Column_Count(reading, count))
        return Fail(corrupt);
    return Read_Records<Gradient_Record>(reading, count, Gradient_Fields, [&](const Gradient_Record& record) {
        Column* const column = Column_Of(reading, record.ordinal);
        if (column == nullptr)
            return Fail(corrupt);
        column->gradient_scale = record.scale;
        column->gradient_reversed = static_cast<std::int16_t>(record.reversed);
        column->gradient_low = Clean_Number(record.low, reading.sheet->missing_value);
        column->gradient_high = Clean_Number(record.high, reading.sheet->missing_value);
        column->gradient_strength = Clean_Number(record.strength, reading.sheet->missing_value);
        return true;
    });
}

// --- Dates -----------------------------------------------------------------------------------------

bool Read_Creation_Dates(TSS_Reading& reading)
{
    constexpr std::uint32_t most_entries = 64000;
    Sheet& sheet = *reading.sheet;
    std::int32_t count;
    double date;
    if (!reading.source.Read(date) || !reading.source.Read(count))
        return false;
    const auto keep = [&](double& kept) {
        if (Is_Surely_Present(date) && date > 0.0)
            kept = date;
    };
    keep(sheet.creation_date);
    if (static_cast<std::uint32_t>(count) > most_entries) {
        Report_Message("Spreadsheet creation date information is corrupt.\n");
        return true;
    }
    Column* column = sheet.first_column->next;
    for (std::int32_t i = 0; i < count; ++i) {
        if (!reading.source.Read(date))
            return false;
        if (column != nullptr) {
            keep(column->creation_date);
            column = column->next;
        }
    }
    return true;
}

/// Without the record everything is as old as the file.
void Date_By_File(TSS_Reading& reading)
{
    constexpr double day_of_seconds = 1.1574074074074073e-5;
    constexpr std::int32_t day_counts = 1;
    Local_Time time;
    if (!reading.source.File().Write_Time(time))
        return;
    const double seconds = time.hour * 3600.0 + time.minute * 60.0 + time.second + time.millisecond * 0.001;
    const double date =
        Date_To_Number(time.day, time.month, time.year, day_counts) + seconds * day_of_seconds;
    reading.sheet->creation_date = date;
    for (Column* column = reading.sheet->first_column->next; column != nullptr; column = column->next)
        column->creation_date = date;
}

// --- Saved restrictions ----------------------------------------------------------------------------

bool Read_Saved_Restrictions(TSS_Reading& reading)
{
    constexpr std::int32_t longest_name = 90;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read(count))
        return false;
    if (count < 0)
        return Fail("Invalid saved restriction count in TSS File.\n");
    for (std::int32_t i = 0; i < count; ++i) {
        Saved_Restriction restriction;
        std::int32_t length;
        std::int32_t rows;
        if (!source.Read(length))
            return false;
        if (length < 0 || length > longest_name)
            return Fail("Invalid Saved Restriction Name length in TSS File.\n");
        if (!source.Read_Letters(length, longest_name, restriction.name) || !source.Read(rows))
            return false;
        if (rows != reading.head.row_count)
            return Fail("Invalid Saved Restriction row count in TSS File.\n");
        const std::int64_t bytes = rows / 8 + 1;
        if (!source.Read_Bytes(bytes, static_cast<std::size_t>(bytes), restriction.bits))
            return false;
        if (reading.rows.active)
            restriction.bits = Moved_Bits(restriction.bits, reading.new_rows, reading.rows.Count(rows));
        reading.sheet->saved_restrictions.push_back(std::move(restriction));
    }
    return true;
}

// --- The records in their order --------------------------------------------------------------------

enum class On_Fault : std::uint8_t { stop, refuse };  ///< the records end; or there is no Sheet

struct Auxiliary_Record {
    Present_Flag flag;
    bool (*read)(TSS_Reading&);
    On_Fault on_fault = On_Fault::stop;
    const char* corrupt = nullptr;  ///< told of any fault
    bool of_colours = false;        ///< a fault keeps `cond_on_background` clear
};

constexpr Auxiliary_Record Auxiliary_Records[] = {
    {print_block_bit, Read_Print_Block, On_Fault::refuse},
    {bookmarks_bit, Read_Bookmarks, On_Fault::stop, "TSS file has corrupt bookmarks.\n"},
    {analysis_bit, Read_Analysis},
    {title_bit, Read_Title},
    {current_cell_bit, Read_Current_Cell},
    {pointers_bit, Read_Pointers},
    {ignored_integers_bit, Read_Ignored_Integers},
    {conditions_bit, Read_Conditions},
    {range_limits_bit, Read_Range_Limits},
    {dde_link_bit, Read_DDE_Link},
    {gradients_bit, Read_Gradients},
    {creation_dates_bit, Read_Creation_Dates},
    {split_column_bit, Read_Split_Column},
    {saved_restrictions_bit, Read_Saved_Restrictions, On_Fault::stop, "TSS file has corrupt cell colours.\n"},
    {page_name_bit, Read_Page_Name, On_Fault::refuse},
    {column_factor_bit, Read_Column_Factor, On_Fault::refuse},
    {reference_levels_bit, Read_Reference_Levels, On_Fault::refuse},
    {cell_colours_bit, Read_Cell_Colours, On_Fault::stop, "TSS file has corrupt cell colours.\n", true},
    {iprint_bit, Read_IPRINT, On_Fault::stop, "TSS file has corrupt IPRINT settings.\n", true},
    {hidden_columns_bit, Read_Hidden_Columns, On_Fault::stop, "TSS file has corrupt hidden columns.\n", true},
    {factor_colours_bit, Read_Factor_Colours, On_Fault::stop, "TSS file has corrupt factor colours.\n", true},
    {trial_seasons_bit, Read_Trial_Seasons, On_Fault::stop, "Trial file has corrupt seasons.\n", true},
    {column_colours_bit, Read_Column_Colours, On_Fault::stop, "TSS file %s has corrupt column colours.\n",
     true},
};

void Tell_Corrupt(TSS_Reading& reading, const Auxiliary_Record& record)
{
    constexpr std::size_t longest_message = 300;
    reading.colours_corrupt = reading.colours_corrupt || record.of_colours;
    if (record.corrupt == nullptr)
        return;
    std::string text = record.corrupt;
    if (const std::size_t mark = text.find("%s"); mark != std::string::npos)
        text.replace(mark, 2, reading.source.File().Name());
    Report_Message(text.substr(0, longest_message));
}

void List_Columns(TSS_Reading& reading)
{
    for (Column* column = reading.sheet->first_column->next; column != nullptr; column = column->next) {
        reading.columns_read.push_back(column);
        reading.factors_read += column->type == factor_column;
    }
}

}  // namespace

bool Read_Auxiliary_Records(TSS_Reading& reading)
{
    List_Columns(reading);
    const auto flags = static_cast<std::uint32_t>(reading.head.present_flags);
    for (const Auxiliary_Record& record : Auxiliary_Records) {
        if ((flags & record.flag) == 0) {
            if (record.flag == creation_dates_bit)
                Date_By_File(reading);
        } else if (!record.read(reading)) {
            Tell_Corrupt(reading, record);
            return record.on_fault == On_Fault::stop;
        }
    }
    return true;
}

}  // namespace ingester

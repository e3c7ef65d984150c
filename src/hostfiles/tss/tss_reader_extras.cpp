// The records behind the columns: what the host's window keeps beside the data.
#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tss/dde_item.h"
#include "hostfiles/tss/tss_reader.h"
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/calendar.h"
#include "model/date_format.h"
#include "model/names.h"
#include "support/number_text.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

Column* Column_Of(TSS_Reading& reading, std::int32_t ordinal)
{
    return ordinal < 1 ? nullptr : Column_At(reading.sheet, ordinal);
}

double Clean_Number(const TSS_Reading& reading, double value)
{
    const double missing = reading.sheet->missing_value;
    return Is_Missing_In_File(value, missing) ? missing : value;
}

/// `count` records of a layout, each given to `take`, until one is refused.
template <class Record, class... Fields, class Take>
bool Read_Records(TSS_Reading& reading, std::int32_t count, const std::tuple<Fields...>& layout, Take take)
{
    for (std::int32_t i = 0; i < count; ++i) {
        Record record{};
        if (!reading.source.Read(record, layout) || !take(record))
            return false;
    }
    return true;
}

// --- Records of old files that are passed over -------------------------------------------------------

bool Read_At_Least(TSS_Source& source, std::initializer_list<std::int32_t> least)
{
    std::int32_t value;
    return std::ranges::all_of(least,
                               [&](std::int32_t limit) { return source.Read(value) && value >= limit; });
}

/// Texts of old records are no longer than their field, whatever length they state.
bool Skip_Limited_Texts(TSS_Source& source, std::initializer_list<std::int32_t> limits)
{
    std::int32_t length;
    return std::ranges::all_of(limits, [&](std::int32_t limit) {
        return source.Read_Count(length) && source.Skip(std::min(length, limit));
    });
}

bool Read_Print_Block(TSS_Reading& reading)
{
    constexpr std::int64_t three_values = 24;
    constexpr std::int32_t most_entries = 25;
    constexpr std::int32_t longest_name = 10;
    TSS_Source& source = reading.source;
    std::int32_t entries;
    if (!Read_At_Least(source, {0, 1, 1, 0, 0, 0, 0})
        || !Skip_Limited_Texts(source, {90, 90, 1024, 60, 60, 60}) || !source.Skip(three_values)
        || !source.Read(entries) || entries < 1 || entries > most_entries)
        return false;
    for (std::int32_t i = 0; i <= entries; ++i) {
        std::int32_t length;
        if (!source.Read(length))
            return false;
        if (length < 0 || length > longest_name)
            return Fail("Trial column type's name is too long.\n");
        if (!source.Skip(length) || !Skip_Limited_Texts(source, {80, 200}))
            return false;
    }
    for (Column* column = reading.sheet->first_column->next; column != nullptr; column = column->next) {
        if (!Read_At_Least(source, {0, 0}) || !source.Skip(sizeof(double)) || !source.Skip_Text())
            return false;
        column->date_form = 1;
    }
    return true;
}

bool Read_Bookmarks(TSS_Reading& reading)
{
    constexpr std::int64_t place_size = 16;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read_Count(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t has_text;
        if (!source.Skip(place_size) || !source.Read(has_text) || (has_text > 0 && !source.Skip_Text()))
            return false;
    }
    return true;
}

bool Read_Ignored_Integers(TSS_Reading& reading)
{
    return reading.source.Skip(4 * sizeof(std::int32_t));
}

bool Read_Trial_Seasons(TSS_Reading& reading)
{
    constexpr std::int32_t longest_text = 40;
    constexpr std::int64_t number_size = 8;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read_Count(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t length;
        if (!source.Read(length) || length < 1 || length > longest_text || !source.Skip(length + number_size))
            return false;
    }
    // What is short from here on was never written whole.
    static_cast<void>(source.Read_Count(count) && source.Skip(std::int64_t{4} * count)
                      && source.Skip(2 * number_size));
    return true;
}

// --- Texts -------------------------------------------------------------------------------------------

struct Block_Messages {
    const char* too_many;
    const char* corrupt;
};

/// Counted texts into a block of `bytes`, a NUL behind each, and how many there were. Empty texts take no
/// room.
bool Read_Text_Block(TSS_Source& source, std::int32_t bytes, std::string& block, std::int32_t& count,
                     const Block_Messages& messages)
{
    const auto size = static_cast<std::size_t>(bytes);
    std::int32_t stated;
    std::string text;
    if (!source.Read(stated))
        return false;
    for (count = 0; count < stated; ++count) {
        std::int32_t length;
        if (block.size() >= size)
            return Fail(messages.too_many);
        if (!source.Read(length))
            return false;
        if (length < 0 || block.size() + static_cast<std::size_t>(length) > size)
            return Fail(messages.corrupt);
        if (!source.Read_Bytes(length, size, text))
            return false;
        if (length > 0)
            block.append(text).push_back('\0');
    }
    block.resize(std::max(block.size(), size));
    return true;
}

/// A block with its size in front; nothing else where that is 0.
bool Read_Commands(TSS_Source& source, std::string& block, std::int32_t& count, const char* bad_size,
                   const Block_Messages& messages)
{
    std::int32_t bytes;
    if (!source.Read(bytes))
        return false;
    if (bytes < 0 || bytes > Greatest_Text_Block)
        return Fail(bad_size);
    return bytes == 0 || Read_Text_Block(source, bytes, block, count, messages);
}

bool Read_Dummy_Name(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t length;
    std::string name;
    if (!reading.source.Read_Count(length) || !reading.source.Read_Bytes(length, Name_Width + 1, name))
        return false;
    const bool marked = name.starts_with('-');
    sheet.analysis_dummy_plain = marked ? 0 : 1;
    if (marked)
        name.erase(0, 1);
    if (length - (marked ? 1 : 0) > static_cast<std::int32_t>(Name_Width))
        Report_Message("Analysis dummy name truncated in reading TSS File.\n");
    if (!name.empty())
        sheet.analysis_dummy = Make_Valid_Name(name.substr(0, Name_Width));
    return true;
}

bool Read_Analysis(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    return Read_Commands(reading.source, sheet.analysis_setup, sheet.analysis_setup_count,
                         "Invalid analysis setup length in TSS File.\n",
                         {"Analysis setup commands longer than specified length in TSS File.\n",
                          "Corrupt Analysis command in TSS file.\n"})
           && Read_Dummy_Name(reading)
           && Read_Commands(reading.source, sheet.analysis_commands, sheet.analysis_command_count,
                            "Invalid analysis command length in TSS File.\n",
                            {"Analysis commands longer than specified length in TSS File.\n",
                             "Corrupt Analysis command in TSS file\n"});
}

bool Read_Title(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t bytes;
    if (!reading.source.Read(bytes))
        return false;
    if (bytes > Greatest_Text_Block)
        return Fail("Invalid title length in TSS file.\n");
    const bool good = bytes <= 0
                      || Read_Text_Block(reading.source, bytes, sheet.title_lines, sheet.title_line_count,
                                         {"Title lines longer than specified length in TSS file.\n",
                                          "Corrupt Description in TSS file.\n"});
    sheet.title_bytes = static_cast<std::int32_t>(sheet.title_lines.size());
    sheet.title_cleared = 0;
    return good;
}

bool Read_Page_Name(TSS_Reading& reading)
{
    std::string name;
    if (!reading.source.Read_Text(decltype(Sheet::sheet_name)::width, name))
        return Fail("Spreadsheet Read Error: Invalid Sheet pagename.\n");
    reading.sheet->sheet_name = name;
    return true;
}

bool Read_DDE_Link(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    for (std::string* const text : {&sheet.dde_topic, &sheet.dde_source, &sheet.dde_item, &sheet.dde_extra}) {
        std::int32_t length;
        if (!reading.source.Read_Count(length))
            return false;
        if (length > Greatest_Text_Block)
            return Fail("Corrupt DDE Link in TSS file\n");
        if (!reading.source.Read_Bytes(length, Greatest_Text_Block, *text))
            return false;
    }
    std::int32_t flag;
    for (std::int16_t& kept : sheet.dde_flags) {
        if (!reading.source.Read(flag))
            return false;
        kept = static_cast<std::int16_t>(flag);
    }
    if (Equal_Ignoring_Case(sheet.dde_topic, "EXCEL"))
        sheet.dde_item = R1C1_Item(sheet.dde_item);
    return reading.source.Read(flag);
}

bool Read_Pointer_Members(TSS_Source& source, Host_Pointer& pointer)
{
    std::int32_t count;
    if (!source.Read(count))
        return false;
    if (count < 0)
        return Fail("Bad pointer object in TSS file.\n");
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t length;
        if (!source.Read(length))
            return false;
        if (length < 0)
            return Fail("Bad pointer object in TSS file.\n");
        if (!source.Read_Bytes(length, Name_Width, pointer.members.emplace_back()))
            return false;
    }
    return true;
}

bool Read_Pointers(TSS_Reading& reading)
{
    constexpr std::int32_t greatest_kind = 7;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read(count))
        return false;
    if (count < 0)
        return Fail("Bad pointer object in TSS file.\n");
    for (std::int32_t i = 0; i < count; ++i) {
        Host_Pointer pointer;
        std::int32_t length;
        if (!source.Read(pointer.kind))
            return false;
        if (pointer.kind < 0 || pointer.kind > greatest_kind)
            return Fail("Bad pointer object in TSS file.\n");
        if (!source.Read(length))
            return false;
        if (length < 0)
            return Fail("Bad pointer object in TSS file.\n");
        if (!source.Read_Bytes(length, Name_Width, pointer.name)
            || (pointer.kind == 0 && !Read_Pointer_Members(source, pointer)))
            return false;
        reading.sheet->pointers.push_back(std::move(pointer));
    }
    return true;
}

// --- View --------------------------------------------------------------------------------------------

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

// --- Conditions, limits and gradients ----------------------------------------------------------------

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
        column.cond_value[rule] = Clean_Number(reading, record.value);
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
                  column->range_low = Clean_Number(reading, record.low);
                  column->range_high = Clean_Number(reading, record.high);
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
        column->gradient_low = Clean_Number(reading, record.low);
        column->gradient_high = Clean_Number(reading, record.high);
        column->gradient_strength = Clean_Number(reading, record.strength);
        return true;
    });
}

// --- Dates -------------------------------------------------------------------------------------------

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

// --- Saved restrictions ------------------------------------------------------------------------------

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
        if (!source.Read_Bytes(length, longest_name, restriction.name) || !source.Read(rows))
            return false;
        if (rows != reading.head.row_count)
            return Fail("Invalid Saved Restriction row count in TSS File.\n");
        const std::int64_t bytes = rows / 8 + 1;
        if (!source.Read_Bytes(bytes, static_cast<std::size_t>(bytes), restriction.bits))
            return false;
        restriction.bits = Kept_Bits(reading.rows, restriction.bits, rows);
        reading.sheet->saved_restrictions.push_back(std::move(restriction));
    }
    return true;
}

// --- Factors -----------------------------------------------------------------------------------------

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

bool Set_Column_Factor(Sheet& sheet, const Column_Factor_Record& record)
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
    return true;
}

bool Read_Column_Factor(TSS_Reading& reading)
{
    std::string description;
    Column_Factor_Record record;
    if (!reading.source.Read_Text(Extra_Width, description))
        return Fail("Spreadsheet Read Error: Invalid Table Column Factor description.\n");
    reading.sheet->column_label_name = description;
    return reading.source.Read(record, Column_Factor_Fields) && Set_Column_Factor(*reading.sheet, record);
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

/// What follows an ordinal that is no column's by the strict test.
bool Skip_Factor_Colours(TSS_Reading& reading, std::int32_t ordinal)
{
    TSS_Source& source = reading.source;
    const Sheet& sheet = *reading.sheet;
    std::int32_t factors = 0;
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        factors += column->type == factor_column;
    std::int32_t count;
    return source.Skip(sizeof(std::int32_t))
           && (sheet.type != table_sheet || ordinal >= factors
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

// --- Colours -----------------------------------------------------------------------------------------

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
    if (count > 0)
        Set_Cell_Colours(column, colours);
    return true;
}

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

// --- The records in their order ----------------------------------------------------------------------

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

}  // namespace

bool Read_Auxiliary_Records(TSS_Reading& reading)
{
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

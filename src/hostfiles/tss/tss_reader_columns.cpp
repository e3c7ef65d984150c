// The records of columns.
#include "hostfiles/tss/tss_reader.h"
#include "model/cell_appender.h"
#include "model/factor_lists.h"
#include "model/names.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/number_text.h"

#include <algorithm>
#include <array>
#include <cmath>
#include <string>

namespace ingester {

namespace {

constexpr std::int32_t Most_Decimals_Read = 20;

/// All of a column's record in front of its levels and cells.
struct Column_Record {
    std::int32_t type = 0;
    std::int32_t length = 0;
    std::string name;
    std::string description;
    Display_Record display;
    std::string attached_text;
    Factor_Record factor;
    std::int32_t decimals = -1;
    std::int32_t label_width = 0;
    std::int32_t text_width = 0;
    double level_value = 0;
};

bool Is_Units_Type(std::int32_t type)
{
    return type == units_text_column || type == units_variate_column;
}

// --- What may stand in which Sheet -------------------------------------------------------------------

bool Is_Known_Type(std::int32_t type)
{
    return Is_Units_Type(type) || (type >= scalar_column && type <= table_column) || type == Row_Marks_Type
           || type == table_margin_column || type == long_text_column;
}

bool Type_Fits_Table(const Sheet& sheet, std::int32_t type, std::int32_t ordinal)
{
    if (sheet.table_ways >= 3 && ordinal < sheet.table_ways && type != factor_column)
        return false;
    if (type == factor_column)
        return ordinal <= std::max(sheet.table_ways - 1, 1);
    return type == table_column || type == Row_Marks_Type
           || (type == table_margin_column && sheet.has_margins != 0);
}

bool Type_Fits(const Sheet& sheet, std::int32_t type, std::int32_t ordinal)
{
    const bool units = Is_Units_Type(type) && ordinal == 1;
    switch (sheet.type) {
    case vector_sheet:
        return type != scalar_column && (type < matrix_column || type > table_column);
    case matrix_sheet:
        return units || type == matrix_column;
    case symmetric_matrix_sheet:
        return units || type == symmetric_matrix_column;
    case diagonal_matrix_sheet:
        return units || type == diagonal_matrix_column;
    case table_sheet:
        return Type_Fits_Table(sheet, type, ordinal);
    default:
        return type == scalar_column;
    }
}

bool Length_Fits(const TSS_Reading& reading, std::int32_t length, std::int32_t ordinal)
{
    const Sheet& sheet = *reading.sheet;
    const std::int32_t rows = reading.head.row_count;
    if (reading.rows.active || length == rows)
        return true;
    if (sheet.type == vector_sheet)
        return length < rows;
    return sheet.type == symmetric_matrix_sheet
           && length == std::int64_t{rows} + sheet.leading_columns - ordinal;
}

// --- Fields ------------------------------------------------------------------------------------------

bool Read_Texts_And_Display(TSS_Source& source, Column_Record& record)
{
    std::int32_t length;
    if (!source.Read(length) || length <= 0 || !source.Read_Letters(length, Name_Width, record.name)
        || record.name.front() == '\0')
        return false;
    if (source.version >= 3 && !source.Read_Text(Extra_Width, record.description))
        return false;
    if (record.description == " ")
        record.description.clear();
    return source.Read(record.display, Display_Fields)
           && (source.version < 3 || source.Read_Text(Greatest_Text_Block, record.attached_text));
}

bool Settle_Display(Column_Record& record)
{
    Display_Record& display = record.display;
    if (display.format > date_format_mark || display.justify < default_side || display.justify > centred)
        return false;
    if (display.format == 0)
        display.format = significant_digits_format;
    if (Is_Text_Like(record.type))
        display.format = general_format;
    else if (record.type != factor_column && display.format == general_format)
        display.format = significant_digits_format;
    constexpr std::int32_t least_width = 2;
    constexpr std::int32_t greatest_width = 90;
    if (display.width != 0)
        display.width = std::clamp(display.width, least_width, greatest_width);
    return true;
}

bool Read_Decimals(TSS_Source& source, Column_Record& record)
{
    if (!source.Read(record.decimals))
        return false;
    record.decimals = std::clamp(record.decimals, -1, Most_Decimals_Read);
    return true;
}

/// What a Factor prints as is the file's wish, as far as the lists are there.
bool Settle_Factor_Kind(const TSS_Source& source, Column_Record& record)
{
    Factor_Record& factor = record.factor;
    if (source.version < 2)
        factor.factor_kind = factor_with_labels;
    if (factor.factor_kind < plain_factor || factor.factor_kind > factor_with_labels)
        return false;
    if (factor.factor_kind == factor_with_labels && factor.label_count == 0)
        factor.factor_kind = factor_with_levels;
    if (factor.factor_kind == factor_with_levels && factor.value_count == 0)
        factor.factor_kind = plain_factor;
    if (factor.factor_kind == factor_with_labels)
        record.display.format = general_format;
    else if (record.display.format == general_format)
        record.display.format = significant_digits_format;
    return true;
}

bool Read_Factor_Fields(TSS_Source& source, Column_Record& record)
{
    Factor_Record& factor = record.factor;
    const auto fits = [&](std::int32_t count) { return count == 0 || count == factor.level_count; };
    return source.Read(factor, Factor_Fields) && factor.level_count >= 0 && fits(factor.value_count)
           && fits(factor.label_count) && Settle_Factor_Kind(source, record)
           && (factor.value_count == 0 || Read_Decimals(source, record))
           && (factor.label_count == 0 || (source.Read(record.label_width) && record.label_width > 0));
}

bool Read_Type_Fields(TSS_Reading& reading, Column_Record& record)
{
    TSS_Source& source = reading.source;
    Sheet& sheet = *reading.sheet;
    if (record.type == factor_column)
        return Read_Factor_Fields(source, record);
    if (Is_Text_Like(record.type))
        return source.Read_Count(record.text_width);
    if (record.type == diagonal_matrix_column)
        sheet.structure_name = record.name;
    // The level value is there for more ways as well, but was never read then.
    const bool has_level = record.type == table_column && sheet.table_ways == 2 && sheet.table_in_columns == 0
                           && sheet.label_state == labels_by_text_and_level;
    return (!has_level || source.Read(record.level_value)) && Read_Decimals(source, record);
}

// --- Columns that are left out -----------------------------------------------------------------------

bool Skip_Texts(TSS_Source& source, std::int32_t count)
{
    for (std::int32_t i = 0; i < count; ++i)
        if (!source.Skip_Text())
            return false;
    return true;
}

bool Skip_TSS_Data(TSS_Source& source, const Column_Record& record)
{
    constexpr std::int64_t number_size = sizeof(double);
    if (Is_Text_Like(record.type))
        return Skip_Texts(source, record.length);
    return source.Skip(number_size * record.factor.value_count)
           && Skip_Texts(source, record.factor.label_count) && source.Skip(number_size * record.length);
}

// --- Levels ------------------------------------------------------------------------------------------

bool Read_Level_Values(TSS_Source& source, Column& column, std::int32_t count)
{
    std::vector<double> values;
    double value;
    values.reserve(static_cast<std::size_t>(source.Possible(count, sizeof(double))));
    for (std::int32_t i = 0; i < count; ++i) {
        if (!source.Read(value))
            return false;
        values.push_back(Clean_Number(value, column.sheet->missing_value));
    }
    return Put_Level_Values(column, values);
}

bool Read_Labels(TSS_Source& source, Column& column, std::int32_t count)
{
    std::vector<const char*> labels;
    std::string label;
    labels.reserve(static_cast<std::size_t>(source.Possible(count, sizeof(std::int32_t))));
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t length;
        if (!source.Read_Count(length) || !source.Read_Letters(length, Text_Cell_Width, label))
            return false;
        labels.push_back(column.texts.Store(label));
        column.label_width = std::max(column.label_width, length);
    }
    return Put_Labels(column, labels);
}

bool Read_Levels(TSS_Source& source, Column& column, const Column_Record& record)
{
    column.nlevels = record.factor.level_count;
    column.factor_kind = record.factor.factor_kind;
    column.label_width = record.label_width;
    return Read_Level_Values(source, column, record.factor.value_count)
           && Read_Labels(source, column, record.factor.label_count);
}

/// Takes the last node off a list. What it held.
Cell_Value Drop_Last(Level_Node* node, std::int32_t& count)
{
    for (; node->next->next != nullptr; node = node->next) {
    }
    const Cell_Value value = node->next->value;
    node->next = nullptr;
    --count;
    return value;
}

/// The margin of a Table counts as a level in the file only.
void Drop_Margin_Level(Sheet& sheet, Column& column)
{
    if (sheet.type != table_sheet || sheet.has_margins == 0 || column.nlevels <= 1)
        return;
    --column.nlevels;
    if (column.level_values_count > 0)
        Drop_Last(column.level_values, column.level_values_count);
    if (column.label_count == 0)
        return;
    const std::string_view label = Text_Arena::View(Drop_Last(column.labels, column.label_count).text);
    if (!label.empty())
        sheet.margin_label = label;
}

// --- Cells -------------------------------------------------------------------------------------------

bool Is_Level(double value, std::int32_t nlevels)
{
    return value >= 1.0 && value <= nlevels && value == std::floor(value);
}

bool Clean_Numbers(const Column& column, std::span<double> numbers)
{
    const double missing = column.sheet->missing_value;
    for (double& number : numbers)
        number = Clean_Number(number, missing);
    return column.type != factor_column || std::ranges::all_of(numbers, [&](double number) {
               return !(number > missing) || Is_Level(number, column.nlevels);
           });
}

bool Read_Number_Cells(TSS_Reading& reading, Column& column, std::int32_t count)
{
    std::array<double, Numbers_Per_Block> block;
    Cell_Appender cells(column, reading.source.Possible(reading.rows.Count(count), sizeof(double)),
                        &reading.ahead);
    std::int32_t kept = 0;
    for (std::int32_t row = 0; row < count;) {
        const auto size = std::min(static_cast<std::size_t>(count - row), block.size());
        const std::span<double> numbers(block.data(), size);
        if (!reading.source.Read_Numbers(numbers) || !Clean_Numbers(column, numbers))
            return false;
        for (const double number : numbers)
            if (reading.rows.Keeps(row++)) {
                cells.Append({.number = number});
                ++kept;
            }
    }
    cells.Finish(kept);
    return true;
}

/// `width` becomes the length of the longest.
bool Read_Text_Cells(TSS_Reading& reading, Column& column, std::int32_t count, std::int32_t& width)
{
    Cell_Appender cells(column, reading.source.Possible(reading.rows.Count(count), sizeof(std::int32_t)));
    std::string text;
    std::int32_t kept = 0;
    for (std::int32_t row = 0; row < count; ++row) {
        std::int32_t length;
        if (!reading.source.Read_Count(length) || !reading.source.Read_Letters(length, Text_Cell_Width, text))
            return false;
        if (!reading.rows.Keeps(row))
            continue;
        cells.Append({.text = column.texts.Store(text)});
        width = std::max(width, length);
        ++kept;
    }
    cells.Finish(kept);
    return true;
}

bool Read_Long_Text_Cells(TSS_Reading& reading, Column& column, std::int32_t count, std::int32_t& width)
{
    constexpr auto greatest = static_cast<std::int32_t>(Long_Text_Width);
    Cell_Appender cells(column, reading.source.Possible(reading.rows.Count(count), sizeof(std::int32_t)));
    std::string text;
    std::int32_t kept = 0;
    bool told = false;
    for (std::int32_t row = 0; row < count; ++row) {
        std::int32_t length;
        if (!reading.source.Read_Count(length) || !reading.source.Read_Letters(length, Long_Text_Width, text))
            return Fail("Error: Negative text length.\n");
        if (!reading.rows.Keeps(row))
            continue;
        if (length > greatest && !told) {
            Report_Message(Format_Text("Warning: Text in %s has been truncated to %li characters.\n",
                                       column.name.c_str(), static_cast<long>(greatest)));
            told = true;
        }
        if (length > greatest) {
            Note_Loss(Loss_Kind::text_cut, column.name, row + 1, text);
            request.losses.Bar_Replacing("texts of it would be cut");
        }
        cells.Append({.text = column.texts.Store(text)});
        width = Wider(width, text);
        ++kept;
    }
    cells.Finish(kept);
    column.nlevels = std::max(column.nlevels, width);
    return true;
}

bool Read_TSS_Cells(TSS_Reading& reading, Column& column, std::int32_t count, std::int32_t& text_width)
{
    if (column.type == long_text_column)
        return Read_Long_Text_Cells(reading, column, count, text_width);
    if (Is_Text_Like(column.type))
        return Read_Text_Cells(reading, column, count, text_width);
    // A Symmetric Matrix may be stored in full; what stands above the diagonal stands below it as well.
    const std::int32_t above = count == reading.head.row_count ? First_Row_Of(column) : 0;
    return reading.source.Skip(std::int64_t{8} * std::min(above, count))
           && Read_Number_Cells(reading, column, std::max(count - above, 0));
}

/// The columns of all Sheets but Vectors have a cell for every row.
bool Is_Length_Lawful(const Column& column)
{
    Sheet& sheet = *column.sheet;
    const bool short_column = column.length != Cells_For_Rows(column, sheet.row_count);
    if (short_column && sheet.type == vector_sheet)
        sheet.has_short_columns = 1;
    return !short_column || sheet.type == vector_sheet;
}

// --- Width -------------------------------------------------------------------------------------------

/// Digits of the greatest and of the least value, as magnitudes; 15 for what prints with an exponent.
std::int32_t Width_Of_Numbers(const Column& column)
{
    constexpr std::int32_t exponent_width = 15;
    constexpr double least = 1e-12;
    constexpr double greatest = 1e12;
    double low = 1.0;
    double high = 1.0;
    bool beyond = false;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const double size = std::fabs(cell->value.number);
        if (size > least && size < greatest) {
            low = std::min(low, size);
            high = std::max(high, size);
        } else {
            beyond = beyond || size != 0.0;
        }
    }
    const double digits = std::max(std::fabs(std::trunc(std::log10(low))), std::trunc(std::log10(high)));
    return std::max(static_cast<std::int32_t>(digits) + 3, beyond ? exponent_width : 3);
}

std::int32_t Width_Of_Cells(const Column& column, std::int32_t text_width)
{
    std::int32_t width = text_width;
    if (!Is_Text_Like(column.type)) {
        width = Width_Of_Numbers(column);
        if (column.type != factor_column || column.factor_kind == factor_with_levels)
            width += column.decimals > 0 ? column.decimals + 1 : column.decimals == -1 ? 4 : 0;
        if (column.type == factor_column && column.factor_kind == factor_with_labels) {
            width = 3;
            for (const Level_Node* label = column.labels; label != nullptr; label = label->next)
                width = Wider(width, label->Text());
        }
    }
    return std::max(width, Wider(0, column.name) + 2);
}

void Set_Width(Column& column, std::int32_t file_width, std::int32_t text_width)
{
    const Sheet& sheet = *column.sheet;
    column.width = file_width != 0 ? file_width : Width_Of_Cells(column, text_width);
    if (column.type == factor_column && sheet.type == table_sheet && sheet.has_margins != 0)
        column.width = Wider(column.width, sheet.margin_label);
}

// --- Columns -----------------------------------------------------------------------------------------

void Set_Dates(Column& column, const Column_Record& record)
{
    const std::int32_t code = record.display.date_word % Date_Word_Base;
    column.date_format = code < 0 || code > Greatest_Date_Code ? 1 : code;
    column.date_form = static_cast<std::int16_t>(record.display.date_word / Date_Word_Base);
    if (record.display.format == date_format_mark && column.date_format == 0)
        column.date_format = column.date_form = 1;
}

void Set_Column_Fields(const TSS_Reading& reading, Column& column, const Column_Record& record)
{
    constexpr std::int32_t most_fixed_decimals = 9;
    const Display_Record& display = record.display;
    const bool fixed = display.format <= significant_digits_format && record.decimals <= most_fixed_decimals;
    if (fixed || display.format > 0)
        column.format = fixed ? fixed_format : display.format;
    column.decimals = record.decimals;
    column.justify = display.justify;
    column.protected_column = static_cast<std::int16_t>(display.flags_word);
    if (reading.source.version >= 3)
        Set_Dates(column, record);
    if (!record.description.empty())
        column.extra = record.description;
    column.attached_text = record.attached_text.substr(0, record.attached_text.find('\0'));
    if (column.type == table_margin_column)
        reading.sheet->margin_label = record.name;
    if (Is_Text_Like(column.type))
        column.nlevels = std::min(record.text_width, static_cast<std::int32_t>(Long_Text_Width));
}

/// Of a Table's body: what the column is labelled by, and the level that it stands for.
void Set_Table_Column(Column& column, const Column_Record& record)
{
    Sheet& sheet = *column.sheet;
    if (column.type != table_column || sheet.table_ways != 2)
        return;
    column.table_label = record.name;
    column.table_margin_value = column.index - sheet.leading_columns + 1;
    sheet.labelled_columns = sheet.label_state >= labels_by_text ? 1 : 0;
    if (sheet.label_state == labels_by_text_and_level) {
        column.table_margin_value = Clean_Number(record.level_value, sheet.missing_value);
    } else if (sheet.label_state == labels_by_level) {
        const std::string_view name = column.table_label;
        const Parsed_Number parsed = Parse_Number(name.data(), name.data() + name.size());
        column.table_margin_value = parsed.status == Number_Status::good ? parsed.value : sheet.missing_value;
    }
}

bool Fill_TSS_Column(TSS_Reading& reading, Column& column, const Column_Record& record)
{
    std::int32_t text_width = 0;
    Set_Column_Fields(reading, column, record);
    if (column.type == factor_column && !Read_Levels(reading.source, column, record))
        return false;
    Set_Table_Column(column, record);
    if (!Read_TSS_Cells(reading, column, record.length, text_width) || !Is_Length_Lawful(column))
        return false;
    if (column.type == factor_column)
        Drop_Margin_Level(*reading.sheet, column);
    Set_Width(column, record.display.width, text_width);
    return true;
}

bool Read_TSS_Row_Marks(TSS_Reading& reading, std::int32_t count)
{
    std::vector<std::uint8_t> marks;
    for (std::int32_t row = 0; row < count; ++row) {
        std::int32_t mark;
        if (!reading.source.Read_Count(mark) || mark > 1)
            return false;
        if (reading.rows.Keeps(row))
            marks.push_back(static_cast<std::uint8_t>(mark));
    }
    reading.row_marks = std::move(marks);
    return true;
}

/// Texts that Text can't hold make a Long Text.
std::int32_t Type_In_Sheet(const Column_Record& record)
{
    const bool long_text =
        Is_Text_Like(record.type) && record.text_width > static_cast<std::int32_t>(Text_Cell_Width);
    return long_text ? long_text_column : record.type;
}

}  // namespace

bool Read_TSS_Column(TSS_Reading& reading, std::int32_t ordinal)
{
    TSS_Source& source = reading.source;
    Column_Record record;
    if (!source.Read(record.type) || !Is_Known_Type(record.type) || !source.Read_Count(record.length)
        || !Type_Fits(*reading.sheet, record.type, ordinal) || !Length_Fits(reading, record.length, ordinal))
        return false;
    if (record.type == Row_Marks_Type)
        return Read_TSS_Row_Marks(reading, record.length);
    if (!Read_Texts_And_Display(source, record) || !Settle_Display(record)
        || !Read_Type_Fields(reading, record))
        return false;
    if (reading.selects_columns && !Is_Column_Selected(reading.subset, ordinal, record.name))
        return Skip_TSS_Data(source, record);
    Column* const column = New_Column(reading.sheet, Type_In_Sheet(record), record.name);
    if (column == nullptr)
        return true;  // the Sheet is full: what follows is looked at as if it were the next record
    column->input_place = reading.selects_columns ? ordinal : 0;
    if (Fill_TSS_Column(reading, *column, record))
        return true;
    Delete_Column(column, false);
    return false;
}

}  // namespace ingester

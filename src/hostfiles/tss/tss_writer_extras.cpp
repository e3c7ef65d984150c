// The records behind the columns: what the host's window keeps beside the data.
#include "hostfiles/tss/tss_writer.h"

#include <algorithm>
#include <string>

namespace ingester {

namespace {

// --- What there is to write --------------------------------------------------------------------------

bool Has_Conditions(const Column& column)
{
    return column.cond_active != 0;
}

bool Has_Gradient(const Column& column)
{
    return column.gradient_scale > 0;
}

bool Has_Reference_Level(const Column& column)
{
    return column.type == factor_column && column.reference_level > 0;
}

bool Has_Cell_Colours(const Column& column)
{
    return !column.cell_colours.empty();
}

bool Has_IPRINT(const Column& column)
{
    return column.iprint > 0;
}

bool Is_Hidden(const Column& column)
{
    return column.hidden != 0;
}

bool Has_Level_Colours(const Column& column)
{
    return column.type == factor_column && !column.factor_colours.empty();
}

bool Has_Factor_Colours(const Column& column)
{
    return column.colour_source != nullptr || Has_Level_Colours(column);
}

bool Has_Column_Colours(const Column& column)
{
    return column.text_colour != 0 || column.back_colour != 0;
}

using Column_Test = bool (*)(const Column&);

struct Column_Flag {
    Present_Flag flag;
    Column_Test test;
};

/// Records for columns that have something to tell.
constexpr Column_Flag Column_Flags[] = {
    {conditions_bit, Has_Conditions},
    {range_limits_bit, Has_Range_Limits},
    {gradients_bit, Has_Gradient},
    {reference_levels_bit, Has_Reference_Level},
    {cell_colours_bit, Has_Cell_Colours},
    {iprint_bit, Has_IPRINT},
    {hidden_columns_bit, Is_Hidden},
    {factor_colours_bit, Has_Factor_Colours},
    {column_colours_bit, Has_Column_Colours},
};

/// The number of columns that `test` holds for, and each of them given to `write`.
template <class Write> void Write_Columns(Sheet& sheet, TSS_Sink& sink, Column_Test test, Write write)
{
    std::int32_t count = 0;
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        count += column->type != row_column && test(*column);
    sink.Put(count);
    for (Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column && test(*column))
            write(*column);
}

// --- Texts -------------------------------------------------------------------------------------------

/// The texts of a block that have a NUL behind each; those that it lacks are empty.
void Write_Texts(std::string_view block, std::int32_t count, TSS_Sink& sink)
{
    for (std::int32_t i = 0; i < count; ++i) {
        const std::string_view text = block.substr(0, block.find('\0'));
        sink.Put_Text(text);
        block.remove_prefix(std::min(text.size() + 1, block.size()));
    }
}

/// Size and count of a block in front of its texts; the size alone for none.
void Write_Text_Block(const std::string& block, std::int32_t count, TSS_Sink& sink)
{
    sink.Put(static_cast<std::int32_t>(Letter_Count(block)));
    if (block.empty())
        return;
    sink.Put(count);
    Write_Texts(block, count, sink);
}

void Write_Analysis(Sheet& sheet, TSS_Sink& sink)
{
    std::string dummy(sheet.analysis_dummy.view());
    if (!dummy.empty() && sheet.analysis_dummy_plain == 0)
        dummy.insert(0, 1, '-');
    Write_Text_Block(sheet.analysis_setup, sheet.analysis_setup_count, sink);
    sink.Put_Text(dummy);
    Write_Text_Block(sheet.analysis_commands, sheet.analysis_command_count, sink);
}

void Write_Title(Sheet& sheet, TSS_Sink& sink)
{
    Write_Text_Block(sheet.title_lines, sheet.title_line_count, sink);
}

void Write_Page_Name(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put_Text(sheet.sheet_name);
}

void Write_Pointers(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(static_cast<std::int32_t>(sheet.pointers.size()));
    for (const Host_Pointer& pointer : sheet.pointers) {
        sink.Put(pointer.kind);
        sink.Put_Text(pointer.name);
        if (pointer.kind != 0)
            continue;
        sink.Put(static_cast<std::int32_t>(pointer.members.size()));
        for (const std::string& member : pointer.members)
            sink.Put_Text(member);
    }
}

// --- View --------------------------------------------------------------------------------------------

void Write_Current_Cell(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(Current_Cell_Record{sheet.current_column, sheet.current_row + 1}, Current_Cell_Fields);
}

void Write_Split_Column(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(std::min(std::max(sheet.split_column, sheet.leading_columns + 1), sheet.column_count));
}

void Write_IPRINT(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(sheet.iprint);
    Write_Columns(sheet, sink, Has_IPRINT, [&](const Column& column) {
        sink.Put(Setting_Record{column.index, column.iprint}, Setting_Fields);
    });
}

void Write_Hidden_Columns(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Is_Hidden, [&](const Column& column) { sink.Put(column.index); });
}

// --- Conditions, limits and gradients ----------------------------------------------------------------

void Write_Conditions(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(std::int32_t{sheet.cond_mode});
    Write_Columns(sheet, sink, Has_Conditions, [&](const Column& column) {
        sink.Put(column.index);
        for (std::size_t rule = 0; rule < Condition_Count; ++rule)
            sink.Put(Condition_Record{column.cond_op[rule], Number_In_File(column.cond_value[rule], sheet),
                                      column.cond_colour[rule]},
                     Condition_Fields);
    });
}

void Write_Range_Limits(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Has_Range_Limits, [&](const Column& column) {
        sink.Put(Range_Record{column.index, Number_In_File(column.range_low, sheet),
                              Number_In_File(column.range_high, sheet)},
                 Range_Fields);
    });
}

void Write_Gradients(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Has_Gradient, [&](const Column& column) {
        sink.Put(Gradient_Record{column.index, column.gradient_scale, column.gradient_reversed,
                                 Number_In_File(column.gradient_low, sheet),
                                 Number_In_File(column.gradient_high, sheet),
                                 Number_In_File(column.gradient_strength, sheet)},
                 Gradient_Fields);
    });
}

// --- Dates and restrictions --------------------------------------------------------------------------

void Write_Creation_Dates(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(Number_In_File(sheet.creation_date, sheet));
    sink.Put(sheet.column_count);
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            sink.Put(Number_In_File(column->creation_date, sheet));
}

void Write_Saved_Restrictions(Sheet& sheet, TSS_Sink& sink)
{
    sink.Put(static_cast<std::int32_t>(sheet.saved_restrictions.size()));
    for (const Saved_Restriction& restriction : sheet.saved_restrictions) {
        std::string bits = restriction.bits;
        bits.resize(static_cast<std::size_t>(sheet.row_count) / 8 + 1);
        sink.Put_Text(restriction.name);
        sink.Put(sheet.row_count);
        sink.Put_Bytes(bits);
    }
}

// --- Factors and colours -----------------------------------------------------------------------------

void Write_Column_Factor(Sheet& sheet, TSS_Sink& sink)
{
    const std::int32_t date = sheet.column_factor_date;
    sink.Put_Text(sheet.column_label_name);
    sink.Put(Column_Factor_Record{sheet.column_factor_format, date < 0 ? Date_Word_Base - date : date,
                                  sheet.column_factor_decimals},
             Column_Factor_Fields);
}

void Write_Reference_Levels(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Has_Reference_Level, [&](const Column& column) {
        sink.Put(Setting_Record{column.index, column.reference_level}, Setting_Fields);
    });
}

void Write_Cell_Colours(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Has_Cell_Colours, [&](const Column& column) {
        sink.Put(column.index);
        sink.Put(static_cast<std::int32_t>(column.cell_colours.size()));
        for (const Cell_Colour& colour : column.cell_colours)
            sink.Put(colour, Cell_Colour_Fields);
    });
}

/// One for each level; where a Factor has more levels than a list of it, no more than it holds: the number
/// of levels alone costs a file nothing.
std::int32_t Colours_To_Write(const Column& column)
{
    const auto held = static_cast<std::int32_t>(column.factor_colours.size());
    return held == 0
               ? 0
               : std::min(column.nlevels, std::max({held, column.label_count, column.level_values_count}));
}

void Write_Factor_Colours(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Has_Factor_Colours, [&](Column& column) {
        // Columns have been counted: a source that has lost its colours is cleared, and told as none.
        if (column.colour_source != nullptr && !Has_Level_Colours(*column.colour_source))
            column.colour_source = nullptr;
        sink.Put(column.index);
        sink.Put(column.colour_source == nullptr ? 0 : column.colour_source->index);
        if (column.type != factor_column)
            return;
        const std::int32_t count = Colours_To_Write(column);
        sink.Put(count);
        for (std::size_t level = 0; level < static_cast<std::size_t>(count); ++level)
            sink.Put(level < column.factor_colours.size() ? column.factor_colours[level] : 0);
    });
}

void Write_Column_Colours(Sheet& sheet, TSS_Sink& sink)
{
    Write_Columns(sheet, sink, Has_Column_Colours, [&](const Column& column) {
        sink.Put(Column_Colours_Record{column.index, column.text_colour, column.back_colour},
                 Column_Colours_Fields);
    });
}

struct Auxiliary_Record {
    Present_Flag flag;
    void (*write)(Sheet&, TSS_Sink&);
};

constexpr Auxiliary_Record Auxiliary_Records[] = {
    {analysis_bit, Write_Analysis},
    {title_bit, Write_Title},
    {current_cell_bit, Write_Current_Cell},
    {pointers_bit, Write_Pointers},
    {conditions_bit, Write_Conditions},
    {range_limits_bit, Write_Range_Limits},
    {gradients_bit, Write_Gradients},
    {creation_dates_bit, Write_Creation_Dates},
    {split_column_bit, Write_Split_Column},
    {saved_restrictions_bit, Write_Saved_Restrictions},
    {page_name_bit, Write_Page_Name},
    {column_factor_bit, Write_Column_Factor},
    {reference_levels_bit, Write_Reference_Levels},
    {cell_colours_bit, Write_Cell_Colours},
    {iprint_bit, Write_IPRINT},
    {hidden_columns_bit, Write_Hidden_Columns},
    {factor_colours_bit, Write_Factor_Colours},
    {column_colours_bit, Write_Column_Colours},
};

}  // namespace

std::uint32_t Present_Flags_Of(const Sheet& sheet)
{
    std::uint32_t flags = current_cell_bit | creation_dates_bit;
    const auto set = [&](bool present, Present_Flag flag) { flags |= present ? flag : 0U; };
    set(!sheet.analysis_setup.empty() || !sheet.analysis_commands.empty(), analysis_bit);
    set(!sheet.title_lines.empty() || sheet.title_cleared != 0, title_bit);
    set(!sheet.pointers.empty(), pointers_bit);
    set(sheet.host_flag_b != 0, host_flag_b_bit);
    set(sheet.host_flag_c != 0, host_flag_c_bit);
    set(sheet.split_set != 0, split_column_bit);
    set(!sheet.saved_restrictions.empty(), saved_restrictions_bit);
    set(!sheet.sheet_name.empty() && sheet.sheet_name != "Sheet1", page_name_bit);
    set(Is_Many_Way_Table(sheet), column_factor_bit);
    set(sheet.iprint > 0, iprint_bit);
    set(sheet.cond_on_background != 0, cond_on_background_bit);
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        for (const Column_Flag& entry : Column_Flags)
            set(column->type != row_column && entry.test(*column), entry.flag);
    return flags;
}

void Write_Auxiliary_Records(Sheet& sheet, TSS_Sink& sink)
{
    const std::uint32_t flags = Present_Flags_Of(sheet);
    for (const Auxiliary_Record& record : Auxiliary_Records)
        if ((flags & record.flag) != 0)
            record.write(sheet, sink);
}

}  // namespace ingester

// The records of a column.
#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tbk/tbk_writer.h"
#include "model/names.h"
#include "support/text.h"

#include <algorithm>
#include <array>

namespace ingester {

namespace {

// --- The start of a column ---------------------------------------------------------------------------

/// Only units may label a Matrix.
std::int32_t Type_In_Book(const Column& column)
{
    const bool table = column.sheet->type == vector_sheet || column.sheet->type == table_sheet;
    return column.type == long_text_column && !table ? std::int32_t{units_text_column} : column.type;
}

std::string Name_In_Book(const Column& column)
{
    const Sheet& sheet = *column.sheet;
    if (const std::string_view name = Name_Or_Label(column); !name.empty())
        return std::string(name);
    return Has_Identifiers(sheet) || sheet.type == table_sheet
               ? Make_Valid_Name({})
               : std::to_string(column.index - sheet.leading_columns + 1);
}

/// The columns of all Sheets have a cell for every row, but for a Symmetric Matrix from the diagonal down.
std::int32_t Length_In_Book(const Column& column)
{
    return std::max(Cells_For_Rows(column, column.sheet->row_count), 0);
}

void Write_Column_Start(const Column& column, Book_Sink& sink)
{
    sink.Start_Record(column_start_record);
    sink.Put_Byte(Type_In_Book(column));
    sink.Put(Length_In_Book(column));
    sink.Put_Short_Text(Name_In_Book(column));
    for (const std::int32_t number : {column.format, std::clamp(column.width, 0, 255), column.justify,
                                      column.date_format, std::int32_t{column.date_form},
                                      std::int32_t{column.protected_column}, std::int32_t{column.extra_flag}})
        sink.Put_Byte(number);
    sink.End_Record();
}

// --- In front of the cells ---------------------------------------------------------------------------

void Write_Extra(const Column& column, Book_Sink& sink)
{
    if (column.extra.empty())
        return;
    sink.Start_Record(column_extra_record);
    sink.Put_Short_Text(column.extra);
    sink.End_Record();
}

void Write_Option(const Column& column, Book_Sink& sink)
{
    if (!Has_Column_Option(column) || column.column_option <= 0)
        return;
    sink.Put_Record_Head(column_option_record, 1);
    sink.Put_Byte(column.column_option);
}

void Write_Attached_Text(const Column& column, Book_Sink& sink)
{
    constexpr std::int32_t most_modes = 2;
    if ((column.type != variate_column && column.type != factor_column) || column.attached_text.empty())
        return;
    sink.Start_Record(attached_text_record);
    sink.Put_Byte(std::clamp(column.attached_mode, 0, most_modes));
    sink.Put_Long_Text(column.attached_text);
    sink.End_Record();
}

void Write_Colour_Source(const Column& column, Book_Sink& sink)
{
    const Column* const source = column.colour_source;
    if (source == nullptr || source->type != factor_column || source->factor_colours.empty())
        return;
    sink.Put_Record_Head(colour_source_record, sizeof(std::int32_t));
    sink.Put(source->index);
}

void Write_Colours(const Column& column, Book_Sink& sink)
{
    if (column.text_colour == 0 && column.back_colour == 0)
        return;
    sink.Put_Record_Head(column_colours_record, 2 * sizeof(std::int32_t));
    sink.Put(column.text_colour, column.back_colour);
}

void Write_Table_Level(const Column& column, Book_Sink& sink)
{
    const std::int32_t state = column.sheet->label_state;
    if (!Is_Labelled_Table_Column(column) || (state != labels_by_level && state != labels_by_text_and_level))
        return;
    sink.Put_Record_Head(table_level_record, sizeof(double));
    sink.Put(column.table_margin_value);
}

// --- Cells -------------------------------------------------------------------------------------------

/// `count` cells of a list, a block at a time; `put` puts a cell, or null for one that a short list lacks,
/// into its `size` bytes.
template <class Put>
void Write_Cells(const Cell_Node* cell, std::int64_t count, std::size_t size, Book_Sink& sink, Put put)
{
    std::array<std::byte, std::size_t{1} << 16> block;
    std::size_t used = 0;
    for (; count > 0; --count) {
        if (used + size > block.size()) {
            sink.Put_Bytes(block.data(), used);
            used = 0;
        }
        put(cell, block.data() + used);
        used += size;
        if (cell == nullptr)
            continue;
        Bring_Nodes_Near(cell);
        cell = cell->next;
    }
    sink.Put_Bytes(block.data(), used);
}

void Write_Decimals(const Column& column, Book_Sink& sink)
{
    if (column.decimals < 0)
        return;
    sink.Put_Record_Head(column_decimals_record, 1);
    sink.Put_Byte(std::min(column.decimals, Greatest_Record_Decimals));
}

void Write_Numbers(const Column& column, Book_Sink& sink)
{
    const std::int32_t length = Length_In_Book(column);
    const Sheet& sheet = *column.sheet;
    sink.Start_Record(number_cells_record);
    sink.Put(length);
    Write_Cells(column.first_cell, length, sizeof(double), sink,
                [&](const Cell_Node* cell, std::byte* bytes) {
                    sink.Put_In_Order(bytes, cell == nullptr ? Missing_Value
                                                             : Number_In_File(cell->value.number, sheet));
                });
    sink.End_Record();
}

void Write_Texts(Column& column, Book_Sink& sink)
{
    const std::int32_t length = Length_In_Book(column);
    const bool long_text = Type_In_Book(column) == long_text_column;
    const std::int32_t widest = Compute_Text_Width(&column);
    sink.Start_Record(long_text ? long_text_cells_record : text_cells_record);
    sink.Put(length);
    if (long_text)
        sink.Put(widest);
    else
        sink.Put_Byte(std::min(widest, static_cast<std::int32_t>(Short_Text_Width)));
    const Cell_Node* cell = column.first_cell;
    for (std::int32_t row = 0; row < length; ++row) {
        sink.Texts().Go_To_Row(row + 1);
        const std::string_view text = cell == nullptr ? std::string_view{} : cell->Text();
        if (long_text)
            sink.Put_Long_Text(text);
        else
            sink.Put_Short_Text(text);
        cell = cell == nullptr ? nullptr : cell->next;
    }
    sink.End_Record();
}

// --- Factors -----------------------------------------------------------------------------------------

/// Below 1 is missing, and there is no level above the last.
std::uint32_t Code_Of(const Cell_Node* cell, std::int64_t levels)
{
    if (cell == nullptr || !(cell->value.number >= 1.0))
        return 0;
    return static_cast<std::uint32_t>(std::min(cell->value.number, static_cast<double>(levels)));
}

/// Several cells share a byte, the first of them in its low bits.
void Write_Small_Codes(const Cell_Node* cell, std::int64_t count, std::int64_t levels, int bits,
                       Book_Sink& sink)
{
    constexpr int byte = 8;
    std::array<std::byte, 4096> block;
    std::size_t used = 0;
    std::uint32_t held = 0;
    int held_bits = 0;
    const auto put_held = [&] {
        if (used == block.size()) {
            sink.Put_Bytes(block.data(), used);
            used = 0;
        }
        block[used++] = static_cast<std::byte>(held);
        held = 0;
        held_bits = 0;
    };
    for (std::int64_t i = 0; i < count; ++i) {
        held |= Code_Of(cell, levels) << held_bits;
        held_bits += bits;
        if (held_bits == byte)
            put_held();
        cell = cell == nullptr ? nullptr : cell->next;
    }
    if (held_bits > 0 || count == 0)
        put_held();
    sink.Put_Bytes(block.data(), used);
}

void Write_Codes(const Column& column, std::int32_t length, std::int64_t levels, Book_Sink& sink)
{
    const int bits = std::ranges::find_if(Factor_Packings, [&](const Factor_Packing& packing) {
                         return levels < packing.below;
                     })->bits;
    const Cell_Node* const cells = column.first_cell;
    if (bits < 8)
        Write_Small_Codes(cells, length, levels, bits, sink);
    else if (bits == 8)
        Write_Cells(cells, length, 1, sink, [&](const Cell_Node* cell, std::byte* bytes) {
            *bytes = static_cast<std::byte>(Code_Of(cell, levels));
        });
    else if (bits == 16)
        Write_Cells(cells, length, 2, sink, [&](const Cell_Node* cell, std::byte* bytes) {
            sink.Put_In_Order(bytes, static_cast<std::uint16_t>(Code_Of(cell, levels)));
        });
    else
        Write_Cells(cells, length, 4, sink, [&](const Cell_Node* cell, std::byte* bytes) {
            sink.Put_In_Order(bytes, Code_Of(cell, levels));
        });
}

void Write_Level_Values(const Column& column, std::int32_t nlevels, Book_Sink& sink)
{
    if (column.level_values_count < 1)
        return;
    sink.Start_Record(level_values_record);
    sink.Put(nlevels);
    sink.Put_Byte(1);
    const Level_Node* node = column.level_values;
    for (std::int32_t level = 1; level <= nlevels; ++level) {
        sink.Put(node == nullptr ? static_cast<double>(level)
                                 : Number_In_File(node->value.number, *column.sheet));
        node = node == nullptr ? nullptr : node->next;
    }
    sink.End_Record();
}

void Write_Labels(Column& column, std::int32_t nlevels, Book_Sink& sink)
{
    if (column.label_count < 1)
        return;
    std::int32_t widest = 0;
    std::vector<std::string> labels;
    const Level_Node* node = column.labels;
    for (long level = 1; level <= nlevels; ++level) {
        const std::string_view label = node == nullptr ? std::string_view{} : node->Text();
        labels.push_back(label.empty() ? Format_Text("<%li>", level) : std::string(label));
        widest = Wider(widest, labels.back());
        node = node == nullptr ? nullptr : node->next;
    }
    sink.Start_Record(level_labels_record);
    sink.Put(nlevels);
    sink.Put_Byte(std::min(widest, static_cast<std::int32_t>(Short_Text_Width)));
    for (const std::string& label : labels)
        sink.Put_Short_Text(label);
    sink.End_Record();
}

void Write_Factor_Colours(const Column& column, std::int32_t nlevels, Book_Sink& sink)
{
    if (column.factor_colours.empty())
        return;
    std::vector<std::int32_t> colours = column.factor_colours;
    colours.resize(static_cast<std::size_t>(nlevels));
    sink.Start_Record(factor_colours_record);
    for (const std::int32_t colour : colours)
        sink.Put(colour);
    sink.End_Record();
}

void Write_Factor(Column& column, Book_Sink& sink)
{
    const std::int32_t length = Length_In_Book(column);
    const std::int32_t nlevels = std::max(column.nlevels, 1);  // the reader refuses a Factor without
    const std::int64_t levels = nlevels + (Levels_Of_Cells(column) - column.nlevels);
    sink.Start_Record(factor_cells_record);
    sink.Put(length, nlevels);
    sink.Put_Byte(column.factor_kind);
    Write_Codes(column, length, levels, sink);
    sink.End_Record();
    Write_Level_Values(column, nlevels, sink);
    Write_Labels(column, nlevels, sink);
    if (column.reference_level > 0) {
        sink.Put_Record_Head(reference_level_record, sizeof(std::int32_t));
        sink.Put(column.reference_level);
    }
    if (column.factor_recoded != 0)
        sink.Put_Mark(recoded_record);
    Write_Factor_Colours(column, nlevels, sink);
}

// --- Behind the cells --------------------------------------------------------------------------------

void Write_Conditions(const Column& column, Book_Sink& sink)
{
    if (column.cond_active == 0)
        return;
    sink.Start_Record(conditional_format_record);
    for (std::size_t rule = 0; rule < Condition_Count; ++rule) {
        sink.Put_Byte(column.cond_op[rule]);
        sink.Put(column.cond_value[rule], column.cond_colour[rule]);
    }
    sink.End_Record();
}

void Write_Range_Limits(const Column& column, Book_Sink& sink)
{
    if (!Has_Range_Limits(column))
        return;
    sink.Put_Record_Head(range_limits_record, 2 * sizeof(double));
    sink.Put(Number_In_File(column.range_low, *column.sheet),
             Number_In_File(column.range_high, *column.sheet));
}

void Write_Gradient(const Column& column, Book_Sink& sink)
{
    if (column.gradient_scale <= 0)
        return;
    sink.Start_Record(gradient_record);
    sink.Put_Byte(column.gradient_scale);
    sink.Put_Byte(column.gradient_reversed);
    sink.Put(column.gradient_low, column.gradient_high, column.gradient_strength);
    sink.End_Record();
}

void Write_Cell_Colours(const Column& column, Book_Sink& sink)
{
    // The reader refuses more colours than cells.
    const auto count = std::min(std::ssize(column.cell_colours), std::ptrdiff_t{Length_In_Book(column)});
    if (count < 1)
        return;
    sink.Start_Record(cell_colours_record);
    sink.Put(static_cast<std::int32_t>(count));
    for (std::ptrdiff_t i = 0; i < count; ++i) {
        const Cell_Colour& colour = column.cell_colours[static_cast<std::size_t>(i)];
        sink.Put(colour.row, colour.text_colour, colour.back_colour);
    }
    sink.End_Record();
}

void Write_IPRINT(const Column& column, Book_Sink& sink)
{
    if (column.iprint <= 0)
        return;
    sink.Put_Record_Head(column_iprint_record, 1);
    sink.Put_Byte(std::min(column.iprint, Greatest_IPRINT));
}

}  // namespace

void Write_Column_Group(Column& column, Book_Sink& sink, Group_Form form)
{
    sink.Texts().Go_To(column.name);
    Write_Column_Start(column, sink);
    Write_Extra(column, sink);
    Write_Option(column, sink);
    Write_Attached_Text(column, sink);
    Write_Colour_Source(column, sink);
    Write_Colours(column, sink);
    Write_Table_Level(column, sink);
    if (!Is_Text_Like(column.type))
        Write_Decimals(column, sink);
    if (column.type == factor_column)
        Write_Factor(column, sink);
    else if (Is_Text_Like(column.type))
        Write_Texts(column, sink);
    else
        Write_Numbers(column, sink);
    Write_Conditions(column, sink);
    Write_Range_Limits(column, sink);
    Write_Gradient(column, sink);
    sink.Put_Record_Head(column_date_record, sizeof(double));
    sink.Put(column.creation_date);
    if (form == Group_Form::of_new_book) {
        Write_Cell_Colours(column, sink);
        Write_IPRINT(column, sink);
    }
    sink.Put_Mark(column_end_record);
}

}  // namespace ingester

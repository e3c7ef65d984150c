// The records of columns.
#include "hostfiles/tss/tss_writer.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <span>

namespace ingester {

namespace {

constexpr std::int32_t Most_Decimals_Written = 18;

/// A Table counts the margin as one more level of its Factors.
std::int32_t Margin_Levels(const Column& column)
{
    const Sheet& sheet = *column.sheet;
    return sheet.type == table_sheet && sheet.has_margins != 0 ? 1 : 0;
}

std::int32_t Decimals_In_File(const Column& column)
{
    return std::clamp(column.decimals, -1, Most_Decimals_Written);
}

// --- Fields ------------------------------------------------------------------------------------------

/// Long Text has no code of its own: the width of its texts tells it. Only units may label a Matrix.
std::int32_t Type_In_File(const Column& column)
{
    if (column.type != long_text_column)
        return column.type;
    const std::int32_t sheet = column.sheet->type;
    return sheet == matrix_sheet || sheet == symmetric_matrix_sheet || sheet == diagonal_matrix_sheet
               ? units_text_column
               : text_column;
}

std::string_view Name_In_File(Column& column)
{
    const std::string_view name = Name_Or_Label(column);
    return name.empty() ? Name_For_File(column.name) : name;
}

Display_Record Display_Of(const Column& column)
{
    constexpr std::int32_t least_width = 2;
    constexpr std::int32_t greatest_width = 80;
    constexpr std::int32_t extra_flag_unit = 2;
    constexpr std::int32_t option_unit = 256;
    const bool text = Is_Text_Like(column.type);
    const bool has_option = (text || column.type == factor_column) && column.column_option > 0;
    const auto in_range = [](std::int32_t code, std::int32_t least, std::int32_t greatest) {
        return code < least || code > greatest ? least : code;
    };
    const auto flags = static_cast<std::uint32_t>(static_cast<std::uint16_t>(column.protected_column))
                       + static_cast<std::uint32_t>(extra_flag_unit * column.extra_flag)
                       + (has_option ? option_unit * static_cast<std::uint32_t>(column.column_option) : 0);
    return {
        .format = text ? std::int32_t{general_format}
                       : in_range(column.format, significant_digits_format, date_format_mark),
        .width = std::clamp(column.width, least_width, greatest_width),
        .justify = in_range(column.justify, default_side, centred),
        .date_word = column.date_form * Date_Word_Base + column.date_format,
        .flags_word = static_cast<std::int32_t>(flags),
    };
}

/// The mode is one more character, of texts that have one.
void Write_Attached_Text(const Column& column, TSS_Sink& sink)
{
    if (column.attached_text.empty() || column.attached_mode == 0) {
        sink.Put_Text(column.attached_text);
        return;
    }
    const std::string_view text = sink.Texts().Cross(column.attached_text);
    const char mode = static_cast<char>(column.attached_mode);
    sink.Put(static_cast<std::int32_t>(text.size()) + 1);
    sink.Put_Bytes(text);
    sink.Put_Bytes({&mode, 1});
}

// --- Numbers -----------------------------------------------------------------------------------------

/// `count` numbers of a list, by blocks; those that a short list lacks are missing.
template <class In_File>
void Write_Numbers(const Cell_Node* node, std::int64_t count, TSS_Sink& sink, In_File in_file)
{
    std::array<double, Numbers_Per_Block> block;
    while (count > 0) {
        const auto size = static_cast<std::size_t>(std::min<std::int64_t>(count, std::ssize(block)));
        for (double& number : std::span(block.data(), size)) {
            number = Missing_Value;
            if (node != nullptr) {
                Bring_Nodes_Near(node);
                number = in_file(node->value.number);
                node = node->next;
            }
        }
        sink.Put_Numbers(std::span(block.data(), size));
        count -= static_cast<std::int64_t>(size);
    }
}

void Write_Number_Column(const Column& column, std::int32_t length, TSS_Sink& sink)
{
    const Sheet& sheet = *column.sheet;
    if (column.type == table_column && Is_Many_Way_Table(sheet)
        && sheet.label_state == labels_by_text_and_level)
        sink.Put(Number_In_File(column.table_margin_value, sheet));
    sink.Put(Decimals_In_File(column));
    Write_Numbers(column.first_cell, length, sink,
                  [&](double value) { return Number_In_File(value, sheet); });
}

// --- Text --------------------------------------------------------------------------------------------

void Write_Text_Column(Column& column, std::int32_t length, TSS_Sink& sink)
{
    sink.Put(Compute_Text_Width(&column));
    const Cell_Node* cell = column.first_cell;
    for (std::int32_t row = 0; row < length; ++row) {
        sink.Texts().Go_To_Row(row + 1);
        sink.Put_Text(cell == nullptr ? std::string_view{} : cell->Text());
        cell = cell == nullptr ? nullptr : cell->next;
    }
}

// --- Factors -----------------------------------------------------------------------------------------

/// Gives labels without text one, in the Column as well.
void Fill_Labels(Column& column)
{
    long level = 0;
    for (Level_Node* label = column.labels; label != nullptr; label = label->next) {
        ++level;
        if (label->Text().empty())
            label->value.text = column.texts.Store(Format_Text("<%li>", level));
    }
}

void Write_Level_Values(const Column& column, TSS_Sink& sink)
{
    const Level_Node* node = column.level_values;
    for (std::int32_t level = 1; level <= column.nlevels + Margin_Levels(column); ++level) {
        const bool listed = level <= column.nlevels && node != nullptr;
        sink.Put(listed ? Number_In_File(node->value.number, *column.sheet) : static_cast<double>(level));
        node = listed ? node->next : node;
    }
}

void Write_Labels(const Column& column, TSS_Sink& sink)
{
    const Level_Node* node = column.labels;
    for (long level = 1; level <= column.nlevels; ++level) {
        sink.Put_Text(node == nullptr ? Format_Text("<%li>", level) : std::string(node->Text()));
        node = node == nullptr ? nullptr : node->next;
    }
    if (Margin_Levels(column) != 0)
        sink.Put_Text(column.sheet->margin_label);
}

void Write_Factor_Column(Column& column, std::int32_t length, TSS_Sink& sink)
{
    const std::int32_t levels = column.nlevels + Margin_Levels(column);
    const Factor_Record factor = {
        .level_count = levels,
        .value_count = column.level_values_count > 0 ? levels : 0,
        .label_count = column.label_count > 0 ? levels : 0,
        .factor_kind = column.factor_kind,
    };
    Fill_Labels(column);
    sink.Put(factor, Factor_Fields);
    if (factor.value_count > 0)
        sink.Put(Decimals_In_File(column));
    if (factor.label_count > 0)
        sink.Put(std::max(Compute_Text_Width(&column), 1));
    if (factor.value_count > 0)
        Write_Level_Values(column, sink);
    if (factor.label_count > 0)
        Write_Labels(column, sink);
    // The reader ends the columns at a level that there is none of.
    Write_Numbers(column.first_cell, length, sink, [&](double value) {
        constexpr double least = 0.5;
        return value >= least && value <= levels ? value : Missing_Value;
    });
}

}  // namespace

void Write_TSS_Column(Column& column, TSS_Sink& sink)
{
    const std::int32_t length = std::clamp(column.length, 0, std::max(column.sheet->row_count, 0));
    sink.Texts().Go_To(column.name);
    sink.Put(Type_In_File(column));
    sink.Put(length);
    sink.Put_Text(Name_In_File(column));
    sink.Put_Text(column.extra);
    sink.Put(Display_Of(column), Display_Fields);
    Write_Attached_Text(column, sink);
    if (column.type == factor_column)
        Write_Factor_Column(column, length, sink);
    else if (Is_Text_Like(column.type))
        Write_Text_Column(column, length, sink);
    else
        Write_Number_Column(column, length, sink);
}

}  // namespace ingester

#include "model/join/cell_transfer.h"

#include "model/calendar.h"
#include "model/cell_text.h"
#include "model/column_printer.h"
#include "model/factors.h"
#include "model/join/factor_levels.h"
#include "model/level_tables.h"
#include "model/number_format.h"
#include "support/number_text.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace ingester {

namespace {

constexpr int Level_Digits = 15;

std::int32_t Plain_Type(std::int32_t type)
{
    return type == units_text_column ? text_column : type == units_variate_column ? variate_column : type;
}

}  // namespace

Column* Copy_Column_Aside(const Column& column)
{
    Sheet* const current = Current_Sheet;
    Sheet* const aside = New_Sheet();
    Current_Sheet = current;
    aside->settings = column.sheet->settings;
    aside->missing_value = column.sheet->missing_value;
    Column* const copy = New_Data_Column(aside, Plain_Type(column.type), column.name, column.length);
    if (copy == nullptr)
        return nullptr;
    const Cell_Node* from = column.first_cell;  // texts stay where they are: the request keeps them
    for (Cell_Node* cell = copy->first_cell; cell != nullptr && from != nullptr; cell = cell->next) {
        cell->value = from->value;
        from = from->next;
    }
    copy->format = column.format;
    copy->decimals = column.decimals;
    copy->date_form = column.date_form;
    copy->date_format = column.date_format;
    aside->row_count = column.length;
    aside->rows_due = true;
    return copy;
}

namespace {

bool Has_Data(const Column& column)
{
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        if (Cell_Is_Present(column, *cell))
            return true;
    return false;
}

/// The type by which a Sheet takes data like those of `source`; `row_column` when it can't.
std::int32_t Type_In(const Sheet& sheet, const Column& source)
{
    const bool has_units = sheet.leading_columns > 1;
    switch (sheet.type) {
    case vector_sheet:
        if (Is_Text_Like(source.type) || source.type == factor_column)
            return has_units ? Plain_Type(source.type) : source.type;
        return variate_column;
    case table_sheet:
        return sheet.has_margins != 0 || Is_Text_Like(source.type) ? row_column : table_column;
    case matrix_sheet:
        return Is_Text_Like(source.type) ? row_column : matrix_column;
    case diagonal_matrix_sheet:
        return row_column;  // it has one column of data
    default:
        return source.type;
    }
}

void Copy_Look(Column& column, const Column& source)
{
    column.format = source.format;
    column.justify = source.justify;
    column.date_format = source.date_format;
    column.date_form = source.date_form;
    column.width = source.width;
    column.extra = source.extra;
    column.range_low = source.range_low;
    column.range_high = source.range_high;
    column.decimals = source.decimals;
    if (column.type == factor_column)
        column.factor_kind = source.factor_kind;
    Change_Missing_Value(&column, column.sheet->missing_value, source.sheet->missing_value);
}

}  // namespace

Column* Add_Column_Like(Sheet& sheet, const Column& source)
{
    const std::int32_t type = Type_In(sheet, source);
    if (type == row_column)
        return nullptr;
    Column_Request wanted{type, source.name, source.decimals, source.nlevels, ""};
    if (source.type == factor_column) {
        wanted.level_values = source.level_values;
        wanted.level_values_count = source.level_values_count;
        wanted.labels = source.labels;
        wanted.label_count = source.label_count;
    }
    Column* const column = Add_Column(&sheet, wanted, sheet.column_count + 1, true);
    if (column == nullptr)
        return nullptr;
    Copy_Look(*column, source);
    if (column->type == factor_column)  // one of the labels may be empty
        for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next)
            cell->value.number = sheet.missing_value;
    return column;
}

bool Cell_Transfer::Prepare(Column& target, const Column& source, double tolerance, bool ignore_case)
{
    target_ = &target;
    source_ = &source;
    levels_.Look_In(target);
    const bool to_factor = target.type == factor_column;
    if (to_factor && Is_Text_Like(source.type) && target.label_count > 0) {
        Column* const copy = Copy_Column_Aside(source);
        if (copy == nullptr || !Text_To_Factor(copy, ignore_case, false, 0))
            return false;
        source_ = copy;
    }
    if (source_->type == factor_column)
        return Prepare_Levels(tolerance, ignore_case);
    if (Is_Text_Like(source.type))
        Prepare_Texts();
    else
        Prepare_Numbers();
    return true;
}

bool Cell_Transfer::Prepare_Levels(double tolerance, bool ignore_case)
{
    Column& target = *target_;
    const Column& source = *source_;
    if (target.type == factor_column) {
        way_ = Way::level;
        if (!Has_Data(source))
            return true;  // and no levels to speak of
        return Merge_Factor_Levels(target, source, level_map_, tolerance, ignore_case);
    }
    if (Is_Text_Like(target.type)) {
        way_ = Way::level_to_text;
        texts_ = Printed_Levels(source, Number_Print::as_said, Level_Digits, target.texts);
        return true;
    }
    way_ = Way::level_to_number;
    numbers_ = Level_Table(source);
    constexpr double no_date = 2000000.0;  // level values from 0 up to it stand as they are
    for (double& value : numbers_)
        if (!Is_Present(*source.sheet, value))
            value = target.sheet->missing_value;
        else if (source.factor_kind != factor_with_levels || value < 0.0 || value >= no_date)
            value = Moved_Date(value);
    if (!numbers_.empty())
        return true;
    Cell_Node cell{};
    for (const char* const label : Label_Table(source)) {
        Set_Cell_From_Text(target, cell, Text_Arena::View(label));
        numbers_.push_back(cell.value.number);
    }
    return true;
}

void Cell_Transfer::Prepare_Numbers()
{
    if (target_->type == factor_column)
        way_ = Way::number_to_level;
    else if (Is_Text_Like(target_->type))
        way_ = Way::print;
    else
        way_ = Moved_Date(1.0) == 1.0 ? Way::number : Way::date;
}

void Cell_Transfer::Prepare_Texts()
{
    way_ = Is_Text_Like(target_->type) ? Way::text : Way::read;
    const bool wider = source_->type == long_text_column && target_->type == text_column;
    if (wider && target_->sheet->type == vector_sheet)
        Set_Column_Type(*target_, long_text_column);
}

/// A date in the form of the target's.
double Cell_Transfer::Moved_Date(double value) const
{
    const Column& from = *source_;
    const Column& to = *target_;
    if (from.format != date_format_mark || to.format != date_format_mark || from.date_form == to.date_form)
        return value;
    if (from.date_form == 0)
        Serial_To_Day_Count(value, to.sheet->missing_value);
    else
        Day_Count_To_Serial(value, to.sheet->missing_value);
    return value;
}

/// Each number is looked for once.
double Cell_Transfer::Level_Of_Number(double value)
{
    std::uint32_t number;
    met_.Number_Keys_Of(&value, 1, &number);
    if (number > met_levels_.size())
        met_levels_.push_back(Find_Level(Moved_Date(value)));
    return met_levels_[number - 1];
}

double Cell_Transfer::Find_Level(double value)
{
    constexpr int all_digits = 20;
    Column& target = *target_;
    const double missing = target.sheet->missing_value;
    if (!Is_Present(*target.sheet, value))
        return missing;
    if (target.level_values_count > 0) {
        const std::int32_t level = levels_.Nearest(value);
        lost_ = lost_ || !Doubles_Equal(levels_.Value_Of(level), value);
        return level;
    }
    if (target.factor_kind == plain_factor) {
        if (!Is_Level_Number(value))
            return missing;
        target.nlevels = std::max(target.nlevels, static_cast<std::int32_t>(value));
        return value;
    }
    char text[Number_Text_Room];
    const std::string_view label(text,
                                 static_cast<std::size_t>(Print_General(text, value, all_digits) - text));
    const std::int32_t level = levels_.Of_Label(label);
    lost_ = lost_ || levels_.Label_Of(level) != label;  // a label that only begins so is another one
    return level > 0 ? level : missing;
}

bool Cell_Transfer::Is_Missing(const Cell_Value& from) const
{
    const Cell_Node cell{nullptr, nullptr, from};
    return !Cell_Is_Present(*source_, cell);
}

void Cell_Transfer::Put_Missing(Cell_Node& to) const
{
    if (Is_Text_Like(target_->type))
        to.value.text = Text_Arena::Empty();
    else
        to.value.number = target_->sheet->missing_value;
}

void Cell_Transfer::Read_Text(Cell_Node& to, std::string_view text)
{
    const bool to_factor = target_->type == factor_column;
    if (to_factor && target_->factor_kind == factor_with_levels) {
        const double value = Number_Or_Date(*target_, text);
        const std::int32_t level = Is_Present(*target_->sheet, value) ? levels_.Nearest(value) : 0;
        to.value.number = level > 0 ? level : target_->sheet->missing_value;
        return;
    }
    Set_Cell_From_Text(*target_, to, text);
    if (to_factor && target_->factor_kind == plain_factor)
        to.value.number = Level_Of_Number(to.value.number);
}

void Cell_Transfer::Put(Cell_Node& to, const Cell_Value& from)
{
    if (Is_Missing(from)) {
        Put_Missing(to);
        return;
    }
    const double missing = target_->sheet->missing_value;
    char room[Number_Text_Room];
    switch (way_) {
    case Way::number:
        to.value = from;
        return;
    case Way::date:
        to.value.number = Moved_Date(from.number);
        break;
    case Way::level:
        to.value.number = level_map_.empty()
                              ? std::floor(from.number)
                              : static_cast<double>(Of_Level<std::int32_t>(level_map_, from.number, 0));
        if (to.value.number < 1.0 || to.value.number > target_->nlevels)
            to.value.number = missing;
        break;
    case Way::level_to_number:
        to.value.number = Of_Level(numbers_, from.number, from.number);
        break;
    case Way::number_to_level:
        to.value.number = Level_Of_Number(from.number);
        break;
    case Way::read:
        Read_Text(to, Text_Arena::View(from.text));
        break;
    case Way::level_to_text:
        if (const char* const text = Of_Level<const char*>(texts_, from.number, nullptr); text != nullptr)
            Set_Text(*target_, to, Text_Arena::View(text));
        else
            Set_Text(*target_, to, {room, Print_General(room, from.number, Level_Digits)});
        return;
    case Way::print:
        Set_Text(*target_, to, {room, Format_Cell_Fully(room, *source_, from.number)});
        return;
    case Way::text:
        Set_Text(*target_, to, Text_Arena::View(from.text));
        return;
    }
    if (!Is_Present(*target_->sheet, to.value.number)) {
        to.value.number = missing;
        lost_ = true;
    }
}

}  // namespace ingester

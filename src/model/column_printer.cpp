#include "model/column_printer.h"

#include "model/level_tables.h"

#include <algorithm>

namespace ingester {

namespace {

Column_Printer::Kind Kind_Of(const Column& column)
{
    if (Is_Text_Like(column.type))
        return Column_Printer::Kind::text;
    return column.type == factor_column ? Column_Printer::Kind::factor : Column_Printer::Kind::number;
}

/// The digits of a column's numbers; 0 where it decides itself.
int Digits_Of(const Column& column, const Printing_Rules& rules)
{
    return rules.numbers == Number_Print::general && column.format != date_format_mark ? rules.digits : 0;
}

Iso_Form Iso_Form_For(const Column& column, Number_Print numbers)
{
    const bool dates = numbers == Number_Print::for_others && column.format == date_format_mark;
    return dates ? Iso_Form_Of(column) : Iso_Form::number;
}

char* Print_Level_Value(char* target, const Column& factor, double value, Number_Print rule, int digits)
{
    if (rule == Number_Print::as_said)
        return Format_Level_Value(target, factor, value);
    return rule == Number_Print::by_format || factor.format == date_format_mark
               ? Format_Cell_Number(target, factor, value)
               : Print_General(target, value, digits);
}

bool Has_Margin(const Column& column, const Printing_Rules& rules)
{
    return rules.margins && column.sheet->type == table_sheet && column.sheet->has_margins != 0;
}

}  // namespace

std::vector<const char*> Printed_Levels(const Column& factor, Number_Print level_values, int digits,
                                        Text_Arena& room)
{
    if (factor.factor_kind == factor_with_labels)
        return Label_Table(factor);
    std::vector<const char*> printed;
    if (factor.factor_kind != factor_with_levels)
        return printed;
    const Iso_Form iso_form = Iso_Form_For(factor, level_values);
    char text[Number_Text_Room];
    for (const Level_Node* node = factor.level_values; node != nullptr; node = node->next) {
        const double value = node->value.number;
        char* const end = level_values == Number_Print::for_others
                              ? Print_For_Others(text, factor, iso_form, value)
                              : Print_Level_Value(text, factor, value, level_values, digits);
        printed.push_back(room.Store({text, end}));
    }
    return printed;
}

Column_Printer::Column_Printer(const Column& column, const Printing_Rules& rules)
    : column_(&column), digits_(Digits_Of(column, rules)), numbers_(rules.numbers),
      iso_form_(Iso_Form_For(column, rules.numbers)), kind_(Kind_Of(column))
{
    if (numbers_ == Number_Print::for_others && column.format != date_format_mark)
        digits_ = Digits_Needed;
    if (kind_ != Kind::factor)
        return;
    const std::int32_t nlevels = std::max(column.nlevels, 0);
    level_end_ = (Has_Margin(column, rules) ? 2.0 : 1.0) + nlevels;
    Text_Arena room;
    for (const char* const level : Printed_Levels(column, rules.level_values, rules.digits, room))
        if (std::ssize(levels_) < nlevels)
            levels_.emplace_back(Text_Arena::View(level));
}

char* Column_Printer::Print_By_Column(char* target, double value) const
{
    if (numbers_ == Number_Print::for_others)
        return Print_For_Others(target, *column_, iso_form_, value);
    return numbers_ == Number_Print::as_said ? Format_Cell_Fully(target, *column_, value)
                                             : Format_Cell_Number(target, *column_, value);
}

std::string_view Column_Printer::Unlisted_Level(std::int32_t level, char* room) const
{
    if (level > column_->nlevels)
        return column_->sheet->margin_label;
    return {room, Print_Integer(room, level)};
}

std::string_view Column_Printer::Print(const Cell_Node& cell, char* room, const Missing_Prints& missing) const
{
    if (kind_ == Kind::text)
        return cell.Text();
    const double value = cell.value.number;
    if (kind_ == Kind::number)
        return Is_Present(*column_->sheet, value) ? std::string_view(room, Print_Number(room, value))
                                                  : missing.number;
    if (Is_Level(value))
        return Level(static_cast<std::int32_t>(value), room);
    return column_->factor_kind == factor_with_labels ? missing.label : missing.number;
}

}  // namespace ingester

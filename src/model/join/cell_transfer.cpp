#include "model/join/cell_transfer.h"

#include "model/calendar.h"
#include "model/cell_text.h"
#include "model/column_printer.h"
#include "model/factor_lists.h"
#include "model/join/column_copies.h"
#include "model/join/factor_levels.h"
#include "model/level_tables.h"
#include "model/number_format.h"
#include "request/people_rules.h"
#include "support/letters.h"
#include "support/number_text.h"

#include <algorithm>
#include <cmath>
#include <utility>

namespace ingester {

/// Levels are matched with levels: of texts that may name labels, and for people of whatever goes to a
/// Factor.
bool Cell_Transfer::Has_To_Be_Factor() const
{
    if (target_->type != factor_column || source_->type == factor_column)
        return false;
    return For_People(People_Rule::kept_levels) || (Is_Text_Like(source_->type) && target_->label_count > 0);
}

/// Dates in the form of the target's, as a Factor's values are compared without a look at theirs.
void Cell_Transfer::Move_Dates(Column& copy)
{
    for (Cell_Node* cell = copy.first_cell; cell != nullptr; cell = cell->next) {
        if (!Cell_Is_Present(copy, *cell))
            continue;
        cell->value.number = Moved_Date(cell->value.number);
        lost_ = lost_ || !Is_Present(*target_->sheet, cell->value.number);
    }
    if (copy.format == date_format_mark && target_->format == date_format_mark)
        copy.date_form = target_->date_form;
}

bool Cell_Transfer::Make_Source_A_Factor()
{
    Column* const copy = Copy_Column_Aside(*source_);
    if (copy == nullptr)
        return false;
    if (Is_Text_Like(copy->type))
        lost_ = source_->nlevels > static_cast<std::int32_t>(Long_Label_Width);  // what is longer is cut
    else
        Move_Dates(*copy);
    source_ = copy;
    return Turn_Into_Factor(*copy, rules_.ignore_case);
}

bool Cell_Transfer::Prepare(Column& target, const Column& source, const Transfer_Rules& rules)
{
    target_ = &target;
    source_ = &source;
    rules_ = rules;
    levels_.Look_In(target);
    if (Has_To_Be_Factor() && !Make_Source_A_Factor())
        return false;
    if (source_->type == factor_column)
        return Prepare_Levels();
    if (Is_Text_Like(source.type))
        Prepare_Texts();
    else
        Prepare_Numbers();
    return true;
}

/// Hosts append the values of a Factor's levels from 0 up to this as they are, in whatever form dates are.
double Cell_Transfer::Value_Of_Level(double value) const
{
    constexpr double no_date = 2000000.0;
    if (!Is_Present(*source_->sheet, value))
        return target_->sheet->missing_value;
    const bool as_it_is = rules_.as_appended && !For_People(People_Rule::kept_levels)
                          && source_->factor_kind == factor_with_levels && value >= 0.0 && value < no_date;
    return as_it_is ? value : Moved_Date(value);
}

void Cell_Transfer::Prepare_Printed_Levels()
{
    way_ = Way::level_to_text;
    texts_ = Printed_Levels(*source_, Number_Print::as_said, 0, target_->texts);
    Make_Target_Long(std::ranges::any_of(
        texts_, [](const char* text) { return Has_More_Letters(Text_Arena::View(text), Text_Cell_Width); }));
}

bool Cell_Transfer::Prepare_Levels()
{
    Column& target = *target_;
    const Column& source = *source_;
    if (target.type == factor_column) {
        way_ = Way::level;
        if (!Has_Data(source))
            return true;  // and no levels to speak of
        return Merge_Factor_Levels(target, source, level_map_, rules_.tolerance, rules_.ignore_case);
    }
    if (Is_Text_Like(target.type)) {
        Prepare_Printed_Levels();
        return true;
    }
    way_ = Way::level_to_number;
    numbers_ = Level_Table(source);
    for (double& value : numbers_)
        value = Value_Of_Level(value);
    if (!numbers_.empty())
        return true;
    Cell_Node cell{};
    for (const char* const label : Label_Table(source)) {
        Set_Cell_From_Text(target, cell, Text_Arena::View(label));
        const auto level = static_cast<double>(numbers_.size() + 1);
        numbers_.push_back(rules_.words_by_number ? level : cell.value.number);
    }
    return true;
}

/// A Factor without lists has as many levels as the greatest number says.
void Cell_Transfer::Make_Levels_For_Numbers()
{
    if (target_->type != factor_column || target_->factor_kind != plain_factor
        || target_->level_values_count > 0)
        return;
    const bool texts = Is_Text_Like(source_->type);
    double greatest = target_->nlevels;
    for (const Cell_Node* cell = source_->first_cell; cell != nullptr; cell = cell->next) {
        const double number = texts ? Number_Or_Date(*target_, cell->Text()) : Moved_Date(cell->value.number);
        if (Is_Level_Number(number))
            greatest = std::max(greatest, number);
    }
    if (greatest > target_->nlevels)
        Set_Level_Count(*target_, static_cast<std::int32_t>(greatest));
}

void Cell_Transfer::Prepare_Numbers()
{
    if (target_->type == factor_column) {
        way_ = Way::number_to_level;
        Make_Levels_For_Numbers();
    } else if (Is_Text_Like(target_->type)) {
        way_ = Way::print;
    } else {
        way_ = Moved_Date(1.0) == 1.0 ? Way::number : Way::date;
    }
}

void Cell_Transfer::Make_Target_Long(bool longer) const
{
    if (longer && target_->type == text_column && target_->sheet->type == vector_sheet)
        Set_Column_Type(*target_, long_text_column);
}

void Cell_Transfer::Prepare_Texts()
{
    way_ = Is_Text_Like(target_->type) ? Way::text : Way::read;
    Make_Levels_For_Numbers();
    Make_Target_Long(source_->type == long_text_column);
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
        met_levels_.push_back(Find_Level(value));
    return met_levels_[number - 1];
}

double Cell_Transfer::Nearest_Of(double value)
{
    const std::int32_t level = levels_.Nearest(value);
    lost_ = lost_ || !Doubles_Equal(levels_.Value_Of(level), value);
    return level > 0 ? level : target_->sheet->missing_value;
}

std::int32_t Level_Labelled_As(Level_Finder& levels, const Column& source, double number)
{
    char text[Number_Text_Room];
    const std::int32_t level = levels.Of_Exact_Label({text, Format_Cell_Fully(text, source, number)});
    return level > 0 ? level : levels.Of_Exact_Label({text, Print_Shortest(text, number)});
}

/// A label that just is the number, however it is spelled, comes before one that only begins so.
double Cell_Transfer::Find_Label(double value)
{
    constexpr int all_digits = 20;
    char room[Number_Text_Room];
    std::string_view spelled;
    std::int32_t level = 0;
    if (rules_.as_appended) {
        spelled = {room, Print_General(room, Moved_Date(value), all_digits)};
        level = levels_.Of_Exact_Label(spelled);
    }
    if (level == 0)
        level = Level_Labelled_As(levels_, *source_, value);
    if (level > 0)
        return level;
    lost_ = true;  // a label that only begins so is another one
    if (spelled.empty())
        spelled = {room, Format_Cell_Fully(room, *source_, value)};
    level = levels_.Of_Label(spelled);
    return level > 0 ? level : target_->sheet->missing_value;
}

double Cell_Transfer::Find_Level(double value)
{
    const double moved = Moved_Date(value);
    if (!Is_Present(*target_->sheet, moved))
        return target_->sheet->missing_value;
    if (target_->level_values_count > 0)
        return Nearest_Of(moved);
    if (target_->factor_kind != plain_factor)
        return Find_Label(value);
    return Is_Level_Number(moved) && moved <= target_->nlevels ? moved : target_->sheet->missing_value;
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
        to.value.number = Is_Present(*target_->sheet, value) ? Nearest_Of(value) : value;
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
            Set_Text(*target_, to, {room, Print_Shortest(room, from.number)});
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

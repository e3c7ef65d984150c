#include "command/column_facts.h"

#include "model/column_printer.h"
#include "model/iso_dates.h"
#include "platform/text_codes.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

namespace {

std::string_view Type_Of(const Column& column)
{
    if (column.type == factor_column)
        return "factor";
    if (Is_Text_Like(column.type))
        return "text";
    if (column.format != date_format_mark)
        return "number";
    switch (Iso_Form_Of(column)) {
    case Iso_Form::date:
        return "date";
    case Iso_Form::date_time:
        return "date-time";
    default:
        return "time";
    }
}

/// A damaged file may claim billions of levels without lists.
constexpr std::int32_t Most_Plain_Levels = 1000;

void Add_Levels(const Column& column, const Column_Printer& printer, Column_Facts& facts)
{
    const std::int32_t unlisted = std::min(column.nlevels, Most_Plain_Levels);
    const Level_Node* value = column.factor_kind == factor_with_labels ? column.level_values : nullptr;
    char room[Number_Text_Room];
    for (std::int32_t level = 1; level <= std::max(printer.Listed_Levels(), unlisted); ++level) {
        facts.levels.push_back({In_Utf8(printer.Level(level, room)), {}, 0});
        if (value == nullptr)
            continue;
        facts.levels.back().value.assign(room, Print_Shortest(room, value->value.number));
        value = value->next;
    }
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const double level = cell->value.number;
        if (level >= 1 && level < static_cast<double>(facts.levels.size()) + 1)
            ++facts.levels[static_cast<std::size_t>(level) - 1].count;
    }
}

void Add_Texts(const Column& column, Column_Facts& facts)
{
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        facts.longest = std::max(facts.longest, Letter_Count(cell->Text()));
}

void Add_Range(const Column& column, const Column_Printer& printer, Column_Facts& facts)
{
    Column_Summary found{};
    char room[Number_Text_Room];
    facts.numeric = column.format != date_format_mark;
    if (!Column_Statistics(&column, found) || facts.missing == column.length)
        return;
    facts.low.assign(room, printer.Print_Number(room, found.min));
    facts.high.assign(room, printer.Print_Number(room, found.max));
}

}  // namespace

Column_Facts Facts_Of(const Column& column)
{
    Column_Facts facts;
    facts.name = In_Utf8(column.name);
    facts.type = Type_Of(column);
    facts.description = In_Utf8(Trim_Copy(column.extra));
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        facts.missing += Cell_Is_Present(column, *cell) ? 0 : 1;
    const Column_Printer printer(
        column, {.numbers = Number_Print::for_others, .level_values = Number_Print::for_others});
    switch (printer.Kind_Of_Cells()) {
    case Column_Printer::Kind::factor:
        Add_Levels(column, printer, facts);
        break;
    case Column_Printer::Kind::text:
        Add_Texts(column, facts);
        break;
    case Column_Printer::Kind::number:
        Add_Range(column, printer, facts);
        break;
    }
    return facts;
}

}  // namespace ingester

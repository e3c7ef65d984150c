#include "model/foreign_dates.h"

#include "model/calendar.h"
#include "request/losses.h"
#include "support/number_text.h"

#include <string_view>

namespace ingester {

Date_Maker::Date_Maker(Column& column, const Foreign_Dates& dates)
    : column_(&column), dates_(dates), missing_(column.sheet->missing_value),
      end_(Max_Date(dates.date_form) + 1.0)
{
    column.format = date_format_mark;
    column.date_format = dates.display;
    column.date_form = static_cast<std::int16_t>(dates.date_form);
    column.decimals = dates.decimals;
}

void Date_Maker::Count_Beyond(double number)
{
    if (beyond_++ == 0)
        first_beyond_ = number;
}

void Date_Maker::Change_Cells()
{
    for (Cell_Node* cell = column_->first_cell; cell != nullptr; cell = cell->next)
        cell->value.number = Date_Of(cell->value.number);
}

void Date_Maker::Note_Losses()
{
    constexpr int all_digits = 15;
    char room[Number_Text_Room];
    if (beyond_ > 0)
        Note_Loss(Loss_Kind::date_out_of_range, column_->name, 0,
                  std::string_view(room, Print_General(room, first_beyond_, all_digits)), beyond_);
    beyond_ = 0;
}

void Make_Dates(Column& column, const Foreign_Dates& dates)
{
    Date_Maker maker(column, dates);
    maker.Change_Cells();
    maker.Note_Losses();
}

}  // namespace ingester

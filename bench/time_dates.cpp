// Times how a text column becomes dates. The texts are those of 40,000 days from 1900 on, over and over,
// as yyyy-mm-dd ("iso") or dd/mm/yyyy ("dmy"). Prints "name value" lines.

#include "interface/process_request.h"
#include "model/date_format.h"
#include "model/sheet.h"
#include "model/text_columns.h"
#include "request/messages.h"
#include "support/number_text.h"
#include "support/text.h"

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <string_view>

using namespace ingester;

int main(int count, char** arguments)
{
    const std::string_view form = count == 3 ? arguments[2] : "";
    const long rows = count == 3 ? Leading_Integer(arguments[1]) : 0;
    if ((form != "iso" && form != "dmy") || rows < 1) {
        std::fputs("usage: time_dates ROWS iso|dmy\n", stderr);
        return 2;
    }
    constexpr double first_day = 109514;  // 1 January 1900
    constexpr long days = 40000;
    const std::int32_t format = form == "iso" ? 27 : day_month_year_format;
    Start_Request();
    Sheet* const sheet = New_Sheet();
    Column* const column = New_Data_Column(sheet, text_column, "dates", static_cast<std::int32_t>(rows));
    if (column == nullptr)
        return 1;
    char text[Number_Text_Room];
    long row = 0;
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next, ++row) {
        const char* const end =
            Format_Date_Time(text, first_day + static_cast<double>(row % days), 1, format);
        Set_Text(*column, *cell, {text, static_cast<std::size_t>(end - text)});
    }
    const auto start = std::chrono::steady_clock::now();
    const bool done = Text_Column_To_Date(column, false);
    const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
    const double last = first_day + static_cast<double>((rows - 1) % days);
    if (!done || column->last_cell->value.number != last) {
        std::fputs("time_dates: the dates are wrong\n", stderr);
        return 1;
    }
    std::printf("convert_seconds %.6f\n", taken.count());
    Free_Sheets();
    return 0;
}

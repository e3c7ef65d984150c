#include "function.h"
#include "model/date_format.h"
#include "model/date_text.h"
#include "model/sheet.h"
#include "support/number_text.h"

namespace ingester {

/// The head: a display code, and the form.
void Try_Function(std::string_view head, std::string_view text)
{
    const std::int32_t format = Choice(head[0], Greatest_Date_Format + 2);
    const std::int32_t form = Choice(head[1], 2);
    double strict;
    double loose;
    const bool strictly = Text_To_Date(text, strict, form, format, Missing_Value, true);
    const bool loosely = Text_To_Date(text, loose, form, format, Missing_Value, false);
    Must(strictly || strict == Missing_Value, "no date has a value");
    Must(!strictly || (loosely && loose == strict), "a strict date reads otherwise");
    Must(loose <= Greatest_Number && loose >= Missing_Value, "a date is beyond all numbers");
    const Strict_Readings readings =
        Read_By_All_Layouts(text);  // in day counts, which end later than serials
    const std::size_t layout = Date_Layout_Of(format);
    double counted;
    const bool as_count = Text_To_Date(text, counted, 1, format, Missing_Value, true);
    Must(readings.blank || layout == No_Layout || (readings.good >> layout & 1) == (as_count ? 1 : 0),
         "all layouts at once say otherwise");
    char shown[Number_Text_Room];
    Must(Format_Date_Time(shown, loose, form, format) <= shown + sizeof shown, "a date is too long");
}

}  // namespace ingester

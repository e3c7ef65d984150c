#include "function.h"
#include "model/sheet.h"
#include "model/text_number.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/text.h"

namespace ingester {

/// The head: the mode, and nothing.
void Try_Function(std::string_view head, std::string_view text)
{
    request.Text_Number_Mode = Choice(head[0], 5);
    bool changed;
    const double number = Text_To_Number(text, Missing_Value, changed);
    Must(number <= Greatest_Number && number >= Missing_Value, "a number is out of range");
    double whole;
    if (!changed)
        Must(Whole_Number_Text(Trim_Copy(text), whole) && whole == number, "a number was changed unseen");
}

}  // namespace ingester

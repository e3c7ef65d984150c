#include "model/join/label_numbers.h"

#include "model/number_format.h"
#include "support/number_text.h"

namespace ingester {

std::int32_t Level_Labelled_As(Level_Finder& levels, const Column& source, double number)
{
    char text[Number_Text_Room];
    const std::int32_t level = levels.Of_Exact_Label({text, Format_Cell_Fully(text, source, number)});
    return level > 0 ? level : levels.Of_Exact_Label({text, Print_Shortest(text, number)});
}

}  // namespace ingester

#include "model/text_columns.h"

#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "model/cell_text.h"
#include "model/text_number.h"

#include <string>

namespace ingester {

namespace {

/// The cells of a text-like column are numbers now: the texts go.
void Become_Variate(Column& column)
{
    column.type = variate_column;
    column.nlevels = 0;
    column.text_cell_width = Text_Cell_Width;
    column.texts = Text_Arena{};
    Mark_Column_Changed(&column, true);
}

/// The words in front of the first warning of their kind.
void Begin_Warnings(bool& begun, std::string_view title)
{
    if (!begun)
        Report_Message(title);
    begun = true;
}

void Warn_Of_Number(const Column& column, long row, std::string_view text, double number)
{
    Begin_Warnings(request.Number_Warnings_Begun, "Text to Number Conversion Warnings\n \n");
    const std::string words(text);
    if (Is_Present(*column.sheet, number))
        Fail("Column %s Row %4li: %s read as %.12g\n", column.name.c_str(), row, words.c_str(), number);
    else
        Fail("Column %s Row %4li: %s read as *\n", column.name.c_str(), row, words.c_str());
}

}  // namespace

bool Text_Column_To_Number(Column* column)
{
    if (column == nullptr || !Is_Text_Like(column->type))
        return false;
    const double missing = column->sheet->missing_value;
    long row = 0;
    for (Cell_Node* cell = column->first_cell; cell != nullptr; cell = cell->next) {
        const std::string_view text = cell->Text();
        ++row;
        double number = missing;
        bool changed = false;
        if (!text.empty() && !Is_Missing_Text(text))
            number = Text_To_Number(text, missing, changed);
        if (changed)
            Warn_Of_Number(*column, row, text, number);
        cell->value.number = number;
    }
    Become_Variate(*column);
    return true;
}

}  // namespace ingester

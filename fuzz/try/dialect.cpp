#include "function.h"
#include "spreadsheet/dialect/field_kind.h"

namespace ingester {

/// The head: what is told of separators, and of lines of names.
void Try_Function(std::string_view head, std::string_view text)
{
    constexpr std::string_view separators[] = {"", ",", " ", "\t;"};
    Told_Dialect told;
    told.separators = separators[Choice(head[0], 4)];
    told.names_lines = Choice(head[1], 4) - 1;
    const Found_Table found = Find_Dialect(text, told);
    Must(found.first <= found.last && found.last <= text.size(), "the table lies outside its text");
    Must(found.dialect.names_lines >= 0 && found.dialect.columns >= 0, "a count is negative");
    Must(Start_Of_Table(text, 3, told) <= text.size(), "a table begins behind its text");
    static_cast<void>(Begins_Other_Table(text, found.dialect));
    const Iso_Moment moment = Read_Iso_Moment(text);
    Must(moment.sense == Field_Sense::text || moment.value >= 0, "a moment is negative");
    static_cast<void>(Evidence_Of(text));
}

}  // namespace ingester

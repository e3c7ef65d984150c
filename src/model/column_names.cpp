#include "model/column_names.h"

#include "model/names.h"
#include "platform/text_codes.h"
#include "request/losses.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <string>

namespace ingester {

void Name_From_Input(Column& column, std::string_view spelled, std::string_view name)
{
    column.name = Make_Valid_Name(name);
    Use_Bracket_Text(column);
    column.input_name = Trim_Copy(spelled);
    if (!request.Names_Kept_As_They_Stand || name.empty() || column.name == name)
        return;
    Note_Loss(Loss_Kind::name_changed, name, 0, column.name);
    if (column.extra.empty())
        column.extra = std::string(" ").append(name);  // the blank tells that it is an old name
}

void Name_By_Choice(Column& column, std::string_view name)
{
    column.name = Make_Valid_Name(name);
    if (request.Names_Kept_As_They_Stand && column.name != name)
        Note_Loss(Loss_Kind::name_changed, name, 0, column.name);
    Use_Bracket_Text(column);
}

std::string Valid_Host_Name(std::string_view name)
{
    if (!Letters_Are_Utf8())
        return Make_Valid_Name(name);
    const std::string held(Sure_Converter(Utf_8_Code(), Windows_1252_Code()).Convert(name));
    letter_code = Letter_Code::windows_1252;
    std::string valid = Make_Valid_Name(held);
    letter_code = Letter_Code::utf_8;
    return valid;
}

void Make_Name_Valid(Column& column)
{
    const std::string old_name(column.name.view());
    const std::string valid = Valid_Host_Name(old_name);
    if (valid == old_name)
        return;
    Note_Loss(Loss_Kind::name_changed, old_name, 0, valid);
    column.name = valid;
    Use_Bracket_Text(column);
    if (column.extra.empty())
        column.extra = std::string(" ").append(old_name);
}

}  // namespace ingester

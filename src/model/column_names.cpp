#include "model/column_names.h"

#include "model/names.h"
#include "request/losses.h"
#include "request/request.h"
#include "support/text.h"

#include <string>

namespace ingester {

void Name_From_File(Column& column, std::string_view given)
{
    const std::string_view bare = Trim_Copy(given);
    column.name = Make_Valid_Name(bare);
    Use_Bracket_Text(column);
    column.input_name = bare;
    if (!request.Names_Kept_As_They_Stand || column.name == bare || bare.empty())
        return;
    Note_Loss(Loss_Kind::name_changed, column.name, 0, bare);
    if (column.extra.empty())
        column.extra = bare;
}

void Make_Name_Valid(Column& column)
{
    const std::string old_name(column.name.view());
    const std::string valid = Make_Valid_Name(old_name);
    if (valid == old_name)
        return;
    Note_Loss(Loss_Kind::name_changed, old_name, 0, valid);
    column.name = valid;
    Use_Bracket_Text(column);
    if (column.extra.empty())
        column.extra = old_name;
}

}  // namespace ingester

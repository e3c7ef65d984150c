// Names of columns on their way from a file, and on their way into one that can't hold every name.
#pragma once

#include "model/sheet.h"

#include <string_view>

namespace ingester {

/// Gives a Column the name that an input has for it, which spells it `spelled` and means `name`, without
/// marks: made valid unless names stand as they are, with the text of a bracketed suffix in `extra`; lists
/// find it under both. The whole of a name that is too wide to stand goes to `extra`. An empty one gives the
/// next automatic name.
void Name_From_Input(Column& column, std::string_view spelled, std::string_view name);

/// A name as hosts hold it: valid, and of their letters, without accents.
[[nodiscard]] std::string Valid_Host_Name(std::string_view name);

/// Gives a Column a name of the user's choice. What the model can't hold of it is a loss.
void Name_By_Choice(Column& column, std::string_view name);

/// Makes a name valid that stood as it was. Where that changes it, the change is a loss and the old name
/// becomes the description of a Column that has none.
void Make_Name_Valid(Column& column);

}  // namespace ingester

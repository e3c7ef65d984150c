// Names of columns on their way from a file, and on their way into one that can't hold every name.
#pragma once

#include "model/sheet.h"

#include <string_view>

namespace ingester {

/// Gives a Column the name that a file has for it: `name`, made valid unless names stand as they are;
/// `input_name`, by which lists find it as well; and the text of a bracketed suffix in `extra`. Of a name
/// beyond the width that stands as it is the whole goes to `extra`. An empty name gives the next automatic
/// one.
void Name_From_File(Column& column, std::string_view given);

/// Makes a name valid that stood as it was. Where that changes it, the change is a loss and the old name
/// becomes the description of a Column that has none.
void Make_Name_Valid(Column& column);

}  // namespace ingester

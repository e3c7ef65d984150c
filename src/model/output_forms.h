// What becomes of a Sheet when its output asks for another form.
#pragma once

#include "model/sheet.h"

#include <string_view>

namespace ingester {

/// Numbers without a format of their own print fixed, with the decimals that the values of their
/// column need, at most 12.
void Find_Decimals(Sheet* sheet);

/// A Vector of Variates with rows becomes a Matrix called `name`; one Text column may be among them and
/// labels the rows. Any other Sheet stays as it is.
void Vector_To_Matrix(Sheet* sheet, std::string_view name);

/// A Vector of one row of Variates becomes a Sheet of Scalars. Any other stays as it is.
void Vector_To_Scalars(Sheet* sheet);

}  // namespace ingester

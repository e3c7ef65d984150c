// The Sheet that a reader makes: it becomes the `Current_Sheet` only when all went well.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// A new Sheet without rows, while the `Current_Sheet` stays what it is. Null for want of memory.
[[nodiscard]] inline Sheet* New_Sheet_Of_Reader()
{
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = New_Sheet();
    Current_Sheet = earlier;
    return sheet;
}

}  // namespace ingester

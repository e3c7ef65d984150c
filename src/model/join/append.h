// The rows of one Sheet beneath those of another.
#pragma once

#include "model/sheet.h"

namespace ingester {

struct Append_Request {
    Sheet* source = nullptr;                         ///< with the rows to add
    bool by_name = true;                             ///< columns pair by name; else by position
    Fixed_Text<Name_Width> source_column_name = {};  ///< of the Factor that tells where a row came from
    Fixed_Text<Text_Cell_Width> new_label = {};      ///< its label for the new rows
    Fixed_Text<Text_Cell_Width> old_label = "Original";
};

/// Adds the rows of a Sheet at the end of `target`; columns without a partner become new ones. Data of a
/// column that can't go into its partner are left out, and told. False for Sheets that have no rows to
/// add, or can't take any: `target` may have changed by then.
bool Append_Sheet(Sheet* target, const Append_Request& wanted);

}  // namespace ingester

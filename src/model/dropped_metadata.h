// What a Sheet tells beside cells and names, for formats that hold nothing else.
#pragma once

#include "model/sheet.h"

namespace ingester {

/// Enters in the ledger the descriptions, the level values behind labels and the title that an output lacks.
void Note_Dropped_Metadata(const Sheet& sheet);

/// Enters the Factors whose levels stand in an order that their texts or numbers don't tell, for outputs that
/// hold these alone.
void Note_Dropped_Orders(const Sheet& sheet);

/// The same without the descriptions, for formats that hold these.
void Note_Dropped_Level_Values(const Sheet& sheet);

}  // namespace ingester

// What the user is told when the processor refuses a calculation.
#pragma once

#include "platform/faults.h"

namespace ingester {

/// Tells of a fault in the message file, which a fatal one closes. True when the request can go on.
bool Report_Float_Fault(Processor_Fault code);

}  // namespace ingester

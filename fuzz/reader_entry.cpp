// The only place of a target that knows its reader: the build names header and entry.
#include FUZZ_HEADER
#include "reader.h"

namespace ingester {

bool Read_Input(Input_File& file)
{
    return FUZZ_ENTRY(file);
}

}  // namespace ingester

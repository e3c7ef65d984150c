#include "interface/float_faults.h"

#include "request/messages.h"

namespace ingester {

namespace {

struct Fault_Words {
    Processor_Fault code;
    bool survived;
    std::string_view words;
};

constexpr Fault_Words Words_Of_Faults[] = {
    {Processor_Fault::float_survivable, true, ""},
    {Processor_Fault::float_invalid, true, "Warning: An Illegal Floating point calculation has occurred.\n"},
    {Processor_Fault::float_division, false, "Error: A Floating point Division by Zero has occurred.\n"},
    {Processor_Fault::integer_division, false, "Error: An Integer Division by Zero has occurred.\n"},
    {Processor_Fault::integer_overflow, false, "Error: An Integer Overflow has occurred.\n"},
    {Processor_Fault::memory, false, "Error: A Memory fault has occurred.\n"},
    {Processor_Fault::other, false, ""},
};

}  // namespace

bool Report_Float_Fault(Processor_Fault code)
{
    for (const Fault_Words& row : Words_Of_Faults)
        if (row.code == code) {
            Report_In_Fault(row.words, !row.survived);
            return row.survived;
        }
    return false;
}

}  // namespace ingester

// Faults of the processor while the library works for a host.
#pragma once

#include <cstdint>
#include <string_view>

namespace ingester {

enum class Processor_Fault : std::uint8_t {
    float_survivable,  ///< denormal, inexact, overflow, underflow
    float_invalid,
    float_division,
    integer_division,
    integer_overflow,
    memory,
    other,
};

/// Told of a fault inside the handler of a signal: kernel calls only, no heap. True: the request can go on.
using Fault_Report = bool (*)(Processor_Fault fault);

/// While it lives, floating-point arithmetic is that of a fresh process, without traps, and a fault is
/// reported before the host's own handler gets it. At the end everything is as the host had it.
/// One at a time.
class Fault_Guard {
public:
    explicit Fault_Guard(Fault_Report report);
    Fault_Guard(const Fault_Guard&) = delete;
    Fault_Guard& operator=(const Fault_Guard&) = delete;
    ~Fault_Guard();
};

/// Makes a scratch file with `text`, by kernel calls alone. `path` is native.
void Write_Scratch_In_Fault(const char* path, std::string_view text);

}  // namespace ingester

// The target of one reader: the build names its header, its entry and what prepares its options.
#include "fuzz_readers.h"

#include FUZZ_HEADER

#include <cstdint>

extern "C" int LLVMFuzzerInitialize(int* /*count*/, char*** /*arguments*/)
{
    ingester::Start_Fuzzing();
    return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    ingester::Fuzz_Reader(FUZZ_ENTRY, FUZZ_PREPARE, std::as_bytes(std::span(data, size)));
    return 0;
}

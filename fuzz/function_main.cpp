// The fuzz target of every function that takes a text; function.h tells what else it takes.
#include "function.h"

#include <cstddef>

extern "C" int LLVMFuzzerTestOneInput(const std::uint8_t* data, std::size_t size)
{
    constexpr std::size_t head_size = 2;
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    if (size >= head_size)
        ingester::Try_Function(bytes.substr(0, head_size), bytes.substr(head_size));
    return 0;
}

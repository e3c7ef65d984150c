// What tests need to see the system refuse anything that is asked of it, or a process end, at any moment.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>

namespace ingester {

/// What is asked of the system.
enum class Asked : std::uint8_t { memory, open, read, seek, write, close, rename, remove };

/// Called each time before the system is asked; false stands for a system that refuses. Null but in tests.
extern bool (*refusal_hook)(Asked what);

[[nodiscard]] inline bool Allowed(Asked what)
{
    return refusal_hook == nullptr || refusal_hook(what);
}

/// As realloc, or malloc for a null `old`: for blocks that the library asks for beside the containers.
[[nodiscard]] inline void* Take_Memory(void* old, std::size_t bytes)
{
    return Allowed(Asked::memory) ? std::realloc(old, bytes) : nullptr;
}

}  // namespace ingester

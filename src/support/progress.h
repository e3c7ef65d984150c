// A hook that long work feeds, for a front end that shows how far it is.
#pragma once

#include <cstdint>

namespace ingester {

/// Told what is being done (a short text that lives on) and how much of it: `done` of `total`,
/// in whatever unit the work counts (bytes read, rows written). `total` 0: not known.
using Progress_Hook = void (*)(const char* what, std::int64_t done, std::int64_t total);

/// Null unless a front end sets it; readers and writers feed it once a block, never once a cell.
extern Progress_Hook progress_hook;

inline void Show_Progress(const char* what, std::int64_t done, std::int64_t total)
{
    if (progress_hook != nullptr)
        progress_hook(what, done, total);
}

}  // namespace ingester

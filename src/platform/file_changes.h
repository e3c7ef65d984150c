// What tests need to see a write fail, or a process end, at any moment.
#pragma once

namespace ingester {

/// Asked each time before the system is given bytes or a new name for a file; false stands for a system
/// that refuses. Null but in tests.
extern bool (*file_change_hook)();

[[nodiscard]] inline bool File_Change_Allowed()
{
    return file_change_hook == nullptr || file_change_hook();
}

}  // namespace ingester

// What every exported function does around its work: the files of the call, a fresh request, the guards
// against faults of memory and processor, and the answer.
#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

namespace ingester {

/// The files of one call.
struct Call_Files {
    std::string pass;
    std::string result;
    std::string stem;  ///< of the message file
};

/// One exported function. Its statuses are its own; the frame only hands them on.
struct Export {
    /// Names the files of a call; `first` is the first argument.
    Call_Files (*find_files)(std::string_view first);
    /// Does the work and gives the status; nothing when no answer may be given. May throw for want of memory.
    std::optional<std::int32_t> (*work)(const Call_Files& files);
    /// The status when there was not memory enough.
    std::int32_t without_memory;
};

/// A name as a host hands it over: an array of characters without a terminator.
[[nodiscard]] std::string_view Argument_Name(const char* name, std::int32_t length);

/// Runs one call. `result_name` replaces the name of the result file unless it is empty. Throws nothing.
void Run_Export(const Export& what, std::string_view first, std::string_view result_name);

}  // namespace ingester

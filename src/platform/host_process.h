// What a program of its own needs of the system, where a library loaded by a host may not touch it:
// a private temporary folder, signals, and the standard streams.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// Readies this process: standard streams that were closed can't be mistaken for files opened later,
/// and a file that outgrows its limit is a failed write, not the end of the process.
void Start_Host_Process();

/// A folder that only this user can enter, in the temporary folder, which it then stands in for.
/// It goes with all in it at the end, and when a signal ends the process. One at a time.
class Private_Folder {
public:
    Private_Folder() = default;
    Private_Folder(const Private_Folder&) = delete;
    Private_Folder& operator=(const Private_Folder&) = delete;
    ~Private_Folder();

    [[nodiscard]] bool Make();

    /// Its request name, with a backslash at its end.
    [[nodiscard]] const std::string& Name() const { return name_; }

private:
    std::string name_;
};

/// A file that goes as well when a signal ends the process; an empty name ends that.
void Remove_On_Signal(std::string_view name);

[[nodiscard]] bool Standard_Error_Is_Terminal();

/// Standard input to its end, into a scratch file of that name.
[[nodiscard]] bool Copy_Standard_Input(std::string_view name);

/// The whole file, to standard output.
[[nodiscard]] bool Copy_To_Standard_Output(std::string_view name);

}  // namespace ingester

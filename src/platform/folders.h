// Names of files and folders, and what the system says of them.
//
// Request strings carry backslashes; only this floor turns them into native paths.
#pragma once

#include <cstdint>
#include <string>
#include <string_view>

namespace ingester {

/// The file that a name stands for in the end, where links lead; the name itself when there is none.
[[nodiscard]] std::string Resolved_Name(std::string_view name);

/// `name` with native separators.
[[nodiscard]] std::string Native_Path(std::string_view name);

/// `name` with backslashes, as requests carry it.
[[nodiscard]] std::string Request_Path(std::string_view native);

/// The temporary folder (TMPDIR, TMP, TEMP, else /tmp), with backslashes and one at its end.
[[nodiscard]] std::string Get_Temp_Folder();

/// This process's number, above 0.
[[nodiscard]] long Process_Id();

[[nodiscard]] bool File_Exists(std::string_view name);
[[nodiscard]] bool Folder_Exists(std::string_view name);

/// Bytes that one scratch file may take in a folder: not all that is free, since others need the disk as
/// well; 0 when that can't be told.
[[nodiscard]] std::uint64_t Scratch_Room(std::string_view folder);

/// Something of that name exists that is no file on a disk: a device, a pipe, a socket.
[[nodiscard]] bool Is_Special_File(std::string_view name);

/// Both names lead to the same existing file.
[[nodiscard]] bool Same_File(std::string_view a, std::string_view b);

/// False when it could not be deleted; a file that isn't there counts as deleted. Takes no memory, so
/// that clearing away works when there is none.
bool Delete_File(std::string_view name) noexcept;

/// Puts `from` in the place of `to` in one step, with the permissions that `to` had; both on one file
/// system.
[[nodiscard]] bool Replace_File(std::string_view from, std::string_view to);

/// Makes `name` a link to an existing file.
[[nodiscard]] bool Make_Link(std::string_view name, std::string_view file);

/// The folder part of a request name, with its last separator; empty when there is none.
[[nodiscard]] std::string_view Folder_Of(std::string_view name);

/// The part behind the last separator.
[[nodiscard]] std::string_view File_Part_Of(std::string_view name);

/// Where the extension begins: at the last "." of the file part, else the size of `name`.
[[nodiscard]] std::size_t Extension_Start(std::string_view name);

/// `name` with its extension replaced, or added.
[[nodiscard]] std::string With_Extension(std::string_view name, std::string_view extension);

/// The name under which a file that goes with another is there: as it stands, or with its extension in
/// small or capital letters; as it stands when there is none.
[[nodiscard]] std::string Find_Companion(const std::string& name);

/// The hour, minute, second, month (1 to 12), day and year of a moment, in local time.
struct Local_Time {
    int hour, minute, second, month, day, year;
    int millisecond = 0;
};
[[nodiscard]] Local_Time Local_Time_Now();

}  // namespace ingester

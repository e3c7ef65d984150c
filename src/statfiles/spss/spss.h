// SPSS files: system files, portable files and those of the PC+ releases.
#pragma once

#include "platform/files.h"

namespace ingester {

/// System files ("$FL2"; for people also "$FL3", whose cases are packed) in either byte order.
[[nodiscard]] bool Read_Spss_System_File(const char* file_name);
[[nodiscard]] bool Read_Spss_System(Input_File& file);

/// Portable files, in lines of ASCII.
[[nodiscard]] bool Read_Spss_Portable(const char* file_name);
[[nodiscard]] bool Read_Spss_Portable(Input_File& file);

/// System files of PC+ releases.
[[nodiscard]] bool Read_Spss_Pc_File(const char* file_name);
[[nodiscard]] bool Read_Spss_Pc(Input_File& file);

}  // namespace ingester

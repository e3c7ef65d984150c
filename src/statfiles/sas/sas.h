// SAS files: transport files, read and written, and data sets of Version 6.
#pragma once

#include "model/sheet.h"
#include "platform/files.h"

#include <optional>
#include <string>
#include <vector>

namespace ingester {

/// Of several members the one that `request.Worksheet_Name` names, else the first; or a list of them.
[[nodiscard]] bool Read_Sas_Transport(const char* file_name);
[[nodiscard]] bool Read_Sas_Transport(Input_File& file);

/// The names of its members; nothing for a file that can't be understood.
[[nodiscard]] std::optional<std::vector<std::string>> Read_Sas_Member_Names(const char* file_name);

[[nodiscard]] bool Write_Sas_Transport(Sheet* sheet, const char* file_name);

[[nodiscard]] bool Read_Sas_Data_Set(const char* file_name);
[[nodiscard]] bool Read_Sas_Data_Set(Input_File& file);

}  // namespace ingester

// Input that is compressed as a whole.
#pragma once

#include <string>
#include <string_view>

namespace ingester {

/// The name of what a file holds whose name ends in ".gz"; any other name as it stands.
[[nodiscard]] std::string_view Name_Inside_Packing(std::string_view file_name);

/// Decompresses a file in gzip form into the temporary folder and reads what it holds, by its own
/// type. False after a message.
[[nodiscard]] bool Read_Compressed_File(const char* file_name);

/// The scratch file that a file is decompressed into; it keeps the extension.
[[nodiscard]] std::string Decompressed_Name(std::string_view file_name);

/// Decompresses a file in gzip form into the scratch file `scratch`. False after a message.
[[nodiscard]] bool Decompress_To(const std::string& scratch, const char* file_name);

}  // namespace ingester

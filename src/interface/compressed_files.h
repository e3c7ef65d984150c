// Input that is compressed as a whole.
#pragma once

namespace ingester {

/// Decompresses a file in gzip form into the temporary folder and reads what it holds, by its own
/// type. False after a message.
[[nodiscard]] bool Read_Compressed_File(const char* file_name);

}  // namespace ingester

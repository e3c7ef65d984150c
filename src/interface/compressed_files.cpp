#include "interface/compressed_files.h"

#include "interface/file_detection.h"
#include "interface/format_drivers.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/gzip_file.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <cstdint>
#include <memory>

namespace ingester {

namespace {

/// Where the extension goes, whatever the length of the process's number: hosts look for it there.
constexpr std::size_t Extension_Place = std::string_view("$Ingester$").size();

/// Copies what `packed` holds. The temporary folder is never filled to the brim: a small file can
/// hold a thousand times its size, and others need the disk as well.
bool Decompress(Gzip_File& packed, Output_File& plain, std::uint64_t most)
{
    constexpr std::size_t block_size = std::size_t{1} << 20;
    const auto block = std::make_unique_for_overwrite<char[]>(block_size);
    std::uint64_t written = 0;
    while (const std::size_t got = packed.Read(block.get(), block_size)) {
        written += got;
        if (written > most)
            return Fail("Compressed file holds more than the temporary folder has room for.\n");
        plain.Write(block.get(), got);
    }
    return true;
}

}  // namespace

std::string_view Name_Inside_Packing(std::string_view file_name)
{
    constexpr std::string_view packed = ".gz";
    return Ends_Ignoring_Case(file_name, packed) ? file_name.substr(0, file_name.size() - packed.size())
                                                 : file_name;
}

std::string Decompressed_Name(std::string_view file_name)
{
    const long pid = Process_Id();
    std::string name = pid > 0 ? Format_Text("$IG%li$.tmp", pid) : "$Ingester$.tmp";
    const std::string_view extension = file_name.substr(Extension_Start(file_name));
    if (!extension.empty())
        name = name.substr(0, Extension_Place).append(extension);
    return Get_Temp_Folder() + name;
}

bool Decompress_To(const std::string& scratch, const char* file_name)
{
    Gzip_File packed;
    Output_File plain;
    if (!packed.Open(file_name))
        return Fail("Cannot open compressed file.\n");
    if (!plain.Open_Scratch(scratch))
        return Fail("Temporary file for decompressing could not be made.\n");
    if (!Decompress(packed, plain, Scratch_Room(Get_Temp_Folder())))
        return false;
    if (!plain.Close())
        return Fail("Temporary file for decompressing could not be written.\n");
    return packed.Close() || Fail("Compressed file is damaged or not complete.\n");
}

bool Read_Compressed_File(const char* file_name)
{
    const Scratch_File scratch(Decompressed_Name(file_name));
    const std::string source_name(request.Current_File_Name);
    if (!Decompress_To(scratch.Name(), file_name))
        return false;
    const std::int32_t type = Detect_File_Type(scratch.Name());
    if (type == compressed_file)
        return Fail("Compressed file holds another compressed file. Decompress it first.\n");
    return Read_Data_File(scratch.Name(), type, source_name);
}

}  // namespace ingester

#include "interface/book_updates.h"

#include "hostfiles/tbk/tbk.h"
#include "interface/compressed_files.h"
#include "interface/file_detection.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/gzip_file.h"
#include "request/messages.h"
#include "support/text.h"

#include <string>

namespace ingester {

namespace {

enum class Book_Kind : std::uint8_t { none, plain, compressed };

Book_Kind Kind_Of(const char* file_name)
{
    const std::int32_t type = Detect_File_Type(file_name);
    if (type == book_file)
        return Book_Kind::plain;
    const bool packed = type == compressed_file && Detect_Compressed_File_Type(file_name) == book_file;
    return packed ? Book_Kind::compressed : Book_Kind::none;
}

/// Packs the changed book beside the old one, which it then replaces.
bool Compress_Over(const std::string& plain, const char* file_name)
{
    const Scratch_File packed(std::string(file_name).append(".$$$"));
    return (Compress_File(plain, packed.Name()) && Replace_File(packed.Name(), file_name))
           || Fail("Document not saved.\n");
}

/// Runs `update` on the book, or on what a compressed one holds.
template <class Update> bool Update_Book(const char* file_name, Book_Kind kind, Update update)
{
    const std::string real = Resolved_Name(file_name);  // a link stays, and its book changes
    if (kind == Book_Kind::plain)
        return update(real.c_str());
    const Scratch_File scratch(Decompressed_Name(file_name));
    return Decompress_To(scratch.Name(), file_name) && update(scratch.Name().c_str())
           && Compress_Over(scratch.Name(), real.c_str());
}

}  // namespace

bool Add_Sheet(Sheet* sheet, const char* file_name)
{
    const Book_Kind kind = Kind_Of(file_name);
    if (kind == Book_Kind::none)
        return Fail("The file, %.80s, you chose to add sheets to is not in Tabulon Workbook (TBK) format.\n",
                    file_name);
    return Update_Book(file_name, kind, [&](const char* plain) {
        return Add_Sheets_To_TBK(plain, std::span<Sheet* const>(&sheet, 1), file_name);
    });
}

bool Replace_Sheet(Sheet* sheet, const char* file_name, std::string_view page)
{
    const Book_Kind kind = Kind_Of(file_name);
    if (kind == Book_Kind::none)
        return Fail(
            "The file, %.80s, you chose to replace sheets in is not in Tabulon Workbook (TBK) format.\n",
            file_name);
    return Update_Book(file_name, kind, [&](const char* plain) {
        return Replace_Sheet_In_TBK(plain, sheet, page, file_name);
    });
}

}  // namespace ingester

// The rows of the host's own files, and of what wraps a file of any format.
#pragma once

#include "hostfiles/script/script.h"
#include "hostfiles/tbk/tbk.h"
#include "hostfiles/tss/tss.h"
#include "interface/book_updates.h"
#include "interface/compressed_files.h"
#include "interface/file_detection.h"
#include "interface/formats/format_driver.h"

namespace ingester {

constexpr Format_Driver Host_Formats[] = {
    {.code = spreadsheet_file,
     .name = "Tabulon Spreadsheet",
     .read = Any_Code<Read_TSS_File>,
     .extensions = ".tss",
     .write = Write_TSS_File,
     .unique_names = true},
    {.code = script_file,
     .name = "command script",
     .extensions = ".gen",
     .clipboard_extensions = ".gen",
     .write = Write_Host_Script,
     .unique_names = true},
    {.code = compressed_file, .name = "gzip, of any format here", .read = Any_Code<Read_Compressed_File>},
    {.code = book_file,
     .name = "Tabulon Book",
     .read = Any_Code<Read_TBK_File>,
     .sheet_names = Read_Page_Names,
     .lists_sheets = true,
     .extensions = ".tbk",
     .write = Write_TBK_File,
     .write_sheets = Write_TBK_File,
     .add = Add_Sheet,
     .replace = Replace_Sheet,
     .unique_names = true,
     .max_columns = Book_Max_Columns},
};

}  // namespace ingester

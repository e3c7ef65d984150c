#include "function.h"
#include "hostfiles/tbk/tbk.h"
#include "interface/process_request.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "request/messages.h"

namespace ingester {

/// A book, to which a sheet is added, or in which one is replaced.
void Try_Function(std::string_view head, std::string_view text)
{
    const std::string folder = Get_Temp_Folder();
    const std::string name = folder + "update.tbk";
    Output_File book(Output_File::small_buffer);
    Must(book.Open(name), "no file can be made");
    book.Write(text);
    Must(book.Close(), "no file can be written");
    Start_Request();
    Sheet* sheet = New_Sheet_With_Rows(2);
    New_Data_Column(sheet, variate_column, "x", 2);
    const auto before = Read_Page_Names(name.c_str());
    const bool replaces = Choice(head[0], 2) == 1;
    const bool good = replaces ? Replace_Sheet_In_TBK(name.c_str(), sheet, "1")
                               : Add_Sheets_To_TBK(name.c_str(), std::span<Sheet* const>(&sheet, 1));
    const auto after = Read_Page_Names(name.c_str());
    Must(!good || (before && after && after->size() == before->size() + (replaces ? 0 : 1)),
         "an update leaves another number of sheets");
    Must(good || before == after, "a failed update changes a book");
    Close_Message_File();
    Free_Sheets();
}

}  // namespace ingester

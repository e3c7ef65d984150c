#include "function.h"
#include "interface/process_request.h"
#include "interface/var_file.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "support/check_sheet.h"

namespace ingester {

/// The head: what names a subset of columns gives, and how names are cleaned. The text is a list of columns
/// for a small table.
void Try_Function(std::string_view head, std::string_view text)
{
    constexpr std::string_view table = "a,b,c!,d\n1,x,p,0.5\n2,3,q,*\n*,4,p,1e9\n";
    Start_Request();
    Input_File data(std::as_bytes(std::span(table)), "fuzz.csv");
    if (!Read_CSV(data))
        std::abort();
    const std::int32_t choice = Choice(head[0], 4);
    request.Subset_Columns = choice > 0;
    request.Subset_By_Number = choice > 1;
    request.Subset_Names = {"3", "2", choice == 2 ? "-7" : "b"};
    request.Names_Kept_As_They_Stand = Choice(head[1], 8) == 0;
    Input_File list(std::as_bytes(std::span(text)), "fuzz.VAR");
    Apply_Var_List(*Current_Sheet, list);
    Close_Message_File();
    const std::string faults = Check_Sheet(*Current_Sheet);
    Must(faults.empty(), faults.c_str());
    Free_Sheets();
}

}  // namespace ingester

#include "interface/process_request.h"

#include "interface/loss_report.h"
#include "interface/paths.h"
#include "interface/pipeline/stages.h"
#include "model/sheet.h"
#include "request/request.h"

namespace ingester {

namespace {

/// Every stage, in the order in which they act; the first that doesn't succeed ends the request.
constexpr Stage Stages[] = {
    Take_Rules_For_People,
    Know_Encodings,
    Expand_Tokens,
    Fetch_Named_Secondary,
    Cut_Genotype_Options,
    Fetch_Map,
    Reflow_Lines,
    Cut_Input_Options,
    Fetch_Input,
    Name_Var_File,
    Take_Clipboard_Input,
    Keep_Stream,
    Find_Source_Base_Name,
    Detect_Input,
    Cut_Output_Options,
    Read_Merge_Keys,
    Choose_Output,
    Refuse_Same_File,
    Keep_Names_As_They_Stand,
    Know_Host_Scratch_File,
    Take_Wanted_Types,
    Require_Output_Folder,
    Take_Sheet_Of_Output,
    Switch_Off_For_List,
    Refuse_Missing_Operations,

    Read_Input,
    Tell_Vain_Options,
    Name_Output_Sheet,
    List_Sheets,
    Find_Sheet_Of_Output,
    Keep_Subset,
    Drop_Empty_Columns,
    Turn_Rows_Into_Columns,
    Note_Source,
    Name_Temporary_Output,
    Change_By_List,
    Mark_Source,
    Fit_Names_To_Output,
    Keep_Manner_Of_Output,
    Join_With_Output,
    Keep_Range_Of_Columns,
    Fit_Names_To_Output,
    Make_Names_Unique,
    Drop_Empty_Rows,
    Mark_Source,
    Find_Fixed_Decimals,
    Tell_Summary,
    Show_Sheet,

    Make_Output_Form,
    Refuse_Losses,
    Forbid_Losses,
    Write_Output,
    Forbid_Losses,
    Report_Losses,
    Write_Column_List,
    Fill_Clipboard,
    Pack_Output,
    Replace_Old_Output,
};

Request_Status Run_Stages(Request_Run& run)
{
    for (const Stage stage : Stages)
        if (const Request_Status status = stage(run); status != Done || run.finished)
            return status;
    return Done;
}

}  // namespace

void Start_Request(std::string_view stem)
{
    Request_Globals fresh;
    static_cast<Lasting_Globals&>(fresh) = request;
    request = std::move(fresh);
    request.Scratch_Stem = stem;
    request.Return_Delete_Marker = Host_Delete_Marker();
    Free_Sheets();
    Init_Library();
    Start_Message_File();
}

Request_Status Process_Request(std::string infile, std::string outfile, std::int32_t& rows)
{
    Request_Run run;
    run.infile = std::move(infile);
    run.outfile = std::move(outfile);
    const Request_Status status = Run_Stages(run);
    if (!run.reported)
        Tell_Losses();
    if (!run.reported && !request.Loss_Report_Name.empty())
        static_cast<void>(Write_Loss_Report(request.Loss_Report_Name));  // the request has failed already
    rows = Current_Sheet == nullptr ? 0 : Current_Sheet->row_count;
    return status;
}

}  // namespace ingester

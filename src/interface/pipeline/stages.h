// The stages of a request, in the order in which they act. Each is one step, and its status ends the
// request unless it is `Done`.
#pragma once

#include "interface/format_drivers.h"
#include "interface/status.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "request/request.h"

#include <cstdint>
#include <string>

namespace ingester {

/// What the stages hand on to each other.
struct Request_Run {
    std::string infile;
    std::string outfile;
    std::string temp_output;  ///< where the writer writes
    bool downloaded = false;  ///< `infile` is the copy of a fetched input
    bool clipboard_input = false;
    bool kept_stream = false;  ///< `infile` is the copy of what a pipe gave
    std::string source_name;   ///< the pipe's own name
    bool clipboard_output = false;
    bool map_downloaded = false;
    bool secondary_downloaded = false;
    bool genotype = false;      ///< the input goes the road of genotype files
    bool host_scratch = false;  ///< the output is a scratch file of the host's own
    bool output_was_there = false;
    bool packed = false;     ///< the output is to be in gzip form, and the writer's file is a scratch file
    bool held_back = false;  ///< `temp_output` goes into a device or a pipe in the end
    bool reported = false;   ///< what was lost is in the report
    bool writing = false;    ///< `temp_output` is begun and not finished
    bool finished = false;   ///< nothing is left to do
    std::int32_t input_code = 0;
    std::int32_t output_code = 0;
    const Format_Driver* output = nullptr;

    /// The name that the user knows the input by.
    [[nodiscard]] std::string_view Source() const
    {
        if (downloaded)
            return request.Source_Url;
        return kept_stream ? source_name : infile;
    }

    /// Whether the Sheet goes into the output that is there, by its format's own way of adding.
    [[nodiscard]] bool Updates_Output() const
    {
        return request.Add_To_Output && output_was_there && output->add != nullptr;
    }

    Request_Run() = default;
    Request_Run(const Request_Run&) = delete;
    Request_Run& operator=(const Request_Run&) = delete;
    /// What was begun and not finished doesn't stay, whatever ended it: an output is complete or
    /// absent. Nor do the copies of what was fetched.
    ~Request_Run();
};

using Stage = Request_Status (*)(Request_Run& run);

constexpr Request_Status Done = Request_Status::success;

/// Reports, and is the status: `return Stop(status, "...")`.
template <class... Arguments>
Request_Status Stop(Request_Status status, const char* words, Arguments... arguments)
{
    Fail(words, arguments...);
    return status;
}

// --- From the two strings to the files they name -------------------------------------------------

Request_Status Take_Rules_For_People(Request_Run& run);
Request_Status Know_Encodings(Request_Run& run);
Request_Status Expand_Tokens(Request_Run& run);
Request_Status Fetch_Named_Secondary(Request_Run& run);
Request_Status Cut_Genotype_Options(Request_Run& run);
Request_Status Fetch_Map(Request_Run& run);
/// "/rewrite=n" in the Outfile: no table, but lines joined until they hold n fields.
Request_Status Reflow_Lines(Request_Run& run);
Request_Status Cut_Input_Options(Request_Run& run);
Request_Status Fetch_Input(Request_Run& run);
Request_Status Name_Var_File(Request_Run& run);
Request_Status Take_Clipboard_Input(Request_Run& run);
Request_Status Keep_Stream(Request_Run& run);
Request_Status Find_Source_Base_Name(Request_Run& run);
Request_Status Detect_Input(Request_Run& run);
Request_Status Cut_Output_Options(Request_Run& run);
Request_Status Read_Merge_Keys(Request_Run& run);
Request_Status Choose_Output(Request_Run& run);
Request_Status Refuse_Same_File(Request_Run& run);
Request_Status Keep_Names_As_They_Stand(Request_Run& run);
Request_Status Know_Host_Scratch_File(Request_Run& run);
Request_Status Take_Wanted_Types(Request_Run& run);
Request_Status Require_Output_Folder(Request_Run& run);
Request_Status Take_Sheet_Of_Output(Request_Run& run);
Request_Status Switch_Off_For_List(Request_Run& run);
Request_Status Refuse_Missing_Operations(Request_Run& run);

// --- The Sheet -----------------------------------------------------------------------------------

Request_Status Read_Input(Request_Run& run);
Request_Status Tell_Vain_Options(Request_Run& run);
Request_Status Name_Output_Sheet(Request_Run& run);
Request_Status List_Sheets(Request_Run& run);
Request_Status Find_Sheet_Of_Output(Request_Run& run);
Request_Status Keep_Subset(Request_Run& run);
Request_Status Drop_Empty_Columns(Request_Run& run);
Request_Status Turn_Rows_Into_Columns(Request_Run& run);
Request_Status Note_Source(Request_Run& run);
Request_Status Name_Temporary_Output(Request_Run& run);
Request_Status Change_By_List(Request_Run& run);
/// Acts twice: on what was read, and on what it was joined with.
Request_Status Mark_Source(Request_Run& run);
/// Acts in front of joins, which go by names, and on the result.
Request_Status Fit_Names_To_Output(Request_Run& run);
Request_Status Keep_Manner_Of_Output(Request_Run& run);
Request_Status Join_With_Output(Request_Run& run);
Request_Status Keep_Range_Of_Columns(Request_Run& run);
Request_Status Make_Names_Unique(Request_Run& run);
Request_Status Drop_Empty_Rows(Request_Run& run);
Request_Status Find_Fixed_Decimals(Request_Run& run);
Request_Status Refuse_Losses(Request_Run& run);
Request_Status Tell_Summary(Request_Run& run);
Request_Status Show_Sheet(Request_Run& run);

// --- The output ----------------------------------------------------------------------------------

Request_Status Make_Output_Form(Request_Run& run);
/// Acts before and after writing: what the reader lost needs no writer.
Request_Status Forbid_Losses(Request_Run& run);
Request_Status Write_Output(Request_Run& run);
/// From here on the file that the writer writes is ours, and goes when the request fails.
void Begin_Writing(Request_Run& run);
Request_Status Write_Column_List(Request_Run& run);
Request_Status Fill_Clipboard(Request_Run& run);
Request_Status Pack_Output(Request_Run& run);
/// Tells what was lost, and writes the report that was asked for, while the old output is there still.
Request_Status Report_Losses(Request_Run& run);
Request_Status Replace_Old_Output(Request_Run& run);

}  // namespace ingester

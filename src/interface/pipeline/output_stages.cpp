// Stages that write the Sheet and put the new file in the place of an old one.
#include "interface/clipboard.h"
#include "interface/file_detection.h"
#include "interface/loss_report.h"
#include "interface/pipeline/stages.h"
#include "interface/var_file.h"
#include "model/output_forms.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "platform/gzip_file.h"
#include "request/losses.h"
#include "request/request.h"

namespace ingester {

namespace {

/// Hands a finished file to a device or a pipe.
bool Copy_Into(const std::string& from, const std::string& special)
{
    constexpr std::size_t block_size = 1 << 16;
    std::vector<char> block(block_size);
    Input_File file;
    Output_File to;
    if (!file.Open(from) || !to.Open(special))
        return false;
    while (const std::size_t got = file.Read(block.data(), block.size()))
        to.Write(block.data(), got);
    return file.Close() && to.Close();
}

}  // namespace

namespace {

std::string Scratch_Output()
{
    return Get_Temp_Folder().append("OUT").append(request.Scratch_Stem).append(".$$$");
}

}  // namespace

/// An existing output is written beside itself, so that it stays whole until the new one is.
Request_Status Name_Temporary_Output(Request_Run& run)
{
    if (run.clipboard_output) {
        run.temp_output = Get_Temp_Folder().append(run.outfile).append(".$$$");
        return Done;
    }
    run.output_was_there = File_Exists(run.outfile);
    // A device or a pipe takes the text itself; a rename would put a file in its place.
    const bool special = Is_Special_File(run.outfile);
    request.Write_Via_Temp = (request.Write_Via_Temp || request.Strict) && run.output_was_there && !special;
    run.temp_output = run.outfile;
    run.packed = run.packed && !run.Updates_Output();
    run.held_back = special && request.Strict;  // it gets nothing before it is known that nothing was lost
    if (run.held_back || run.packed) {
        request.Write_Via_Temp = run.output_was_there;
        run.held_back = special;
        run.temp_output = Scratch_Output();
        return Done;
    }
    if (!request.Write_Via_Temp || run.Updates_Output())
        return Done;
    run.temp_output = With_Extension(run.outfile, ".$$$");
    if (run.temp_output == run.outfile)
        run.temp_output += ".$$$";
    if (Same_File(run.temp_output, run.infile))
        return Stop(Request_Status::output_failed, "Input and output files are the same.\n");
    return Done;
}

/// The host's own structures: one row of numbers is Scalars, and a table of numbers is a Matrix when
/// that is asked for.
Request_Status Make_Output_Form(Request_Run& run)
{
    const bool host_file = Is_Host_File(run.output_code);
    if (host_file && !A_Host_File_Was_Read())
        Vector_To_Scalars(Current_Sheet);
    if (request.Output_Matrix && (host_file || run.output_code == script_file))
        Vector_To_Matrix(Current_Sheet, request.Output_Matrix_Name);
    return Done;
}

void Begin_Writing(Request_Run& run)
{
    run.writing = true;
    if (run.temp_output != run.outfile)
        Delete_File(run.temp_output);  // a link of that name would lead the text elsewhere
}

namespace {

/// A Sheet goes into the file that is there, or into a new one.
bool Write_Or_Add(const Request_Run& run)
{
    if (!run.Updates_Output())
        return run.output->write(Current_Sheet, run.temp_output.c_str());
    return request.Replace_Sheet_Asked || request.Sheet_Already_There
               ? run.output->replace(Current_Sheet, run.outfile.c_str(), request.Output_Sheet_Name)
               : run.output->add(Current_Sheet, run.outfile.c_str());
}

}  // namespace

Request_Status Forbid_Losses(Request_Run&)
{
    return Losses_Are_Allowed() ? Done : Request_Status::output_failed;
}

Request_Status Write_Output(Request_Run& run)
{
    Begin_Writing(run);
    if (Write_Or_Add(run))
        return Done;
    if (request.Add_To_Output && !request.Add_Sheet_Given)
        return Stop(Request_Status::inexact_sheet, "Could add data to Excel file.\n");
    return Stop(Request_Status::output_failed, "Output file not written.\n");
}

Request_Status Write_Column_List(Request_Run& run)
{
    if (request.Write_Var_List && !run.clipboard_output)  // which has no file to stand beside
        Write_Var_File(*Current_Sheet, With_Extension(run.outfile, ".$V$"));
    return Done;
}

Request_Status Fill_Clipboard(Request_Run& run)
{
    if (!run.clipboard_output)
        return Done;
    run.finished = Put_File_On_Clipboard(run.temp_output, true);
    if (!run.finished)
        return Stop(Request_Status::clipboard_failed, "Could not put data on the clipboard.\n");
    run.writing = false;
    return Done;
}

/// What the writer wrote is packed beside the output, whose place it takes then.
Request_Status Pack_Output(Request_Run& run)
{
    if (!run.packed)
        return Done;
    const Scratch_File plain(run.temp_output);
    run.temp_output = With_Extension(run.held_back ? plain.Name() : run.outfile, ".gz$");
    Delete_File(run.temp_output);
    return Pack_File(plain.Name(), run.temp_output)
               ? Done
               : Stop(Request_Status::output_failed, "Output file not written.\n");
}

Request_Status Report_Losses(Request_Run& run)
{
    run.reported = true;
    Tell_Losses();
    return request.Loss_Report_Name.empty() || Write_Loss_Report(request.Loss_Report_Name)
               ? Done
               : Request_Status::output_failed;
}

Request_Status Replace_Old_Output(Request_Run& run)
{
    if (run.held_back)
        return Copy_Into(run.temp_output, run.outfile)
                   ? Done
                   : Stop(Request_Status::output_failed, "Output file not written.\n");
    if (run.temp_output != run.outfile && !Replace_File(run.temp_output, run.outfile))
        return Stop(Request_Status::rename_failed, "Could not rename temporary file.\n");
    run.writing = false;
    return Done;
}

}  // namespace ingester

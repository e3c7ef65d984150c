#include "interface/process_request.h"

#include "interface/file_detection.h"
#include "interface/format_drivers.h"
#include "interface/paths.h"
#include "interface/request/messages.h"
#include "interface/request/request.h"
#include "interface/selection.h"
#include "interface/slash_options.h"
#include "model/names.h"
#include "model/sheet.h"
#include "platform/folders.h"
#include "spreadsheet/text/text.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

namespace {

/// What the stages hand on to each other.
struct Request_Run {
    std::string infile;
    std::string outfile;
    std::string temp_output;  ///< where the writer writes
    bool downloaded = false;
    bool output_was_there = false;
    bool writing = false;  ///< `temp_output` is begun and not finished
    std::int32_t input_code = unknown_file;
    const Output_Driver* output = nullptr;

    /// What was begun and not finished doesn't stay, whatever ended it: an output is complete or
    /// absent. Nor does the copy of a fetched input.
    ~Request_Run()
    {
        if (downloaded)
            Delete_File(infile);
        if (writing && (temp_output != outfile || !output_was_there))
            Delete_File(temp_output);
    }
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

/// "/rewrite=n" in the Outfile: no table, but lines joined until they hold n fields.
struct Reflow_Order {
    bool asked = false;
    bool has_number = false;
    std::int32_t fields = 0;
};

Reflow_Order Take_Reflow_Order(std::string& outfile)
{
    constexpr std::string_view key = "/rewrite=";
    constexpr long most = 2147483647;
    Reflow_Order order;
    const std::size_t at = outfile.find(key);
    if (at == std::string::npos)
        return order;
    const std::size_t number = at + key.size();
    const std::size_t end = std::min(outfile.find_first_not_of("0123456789", number), outfile.size());
    order.asked = true;
    order.has_number = end > number;
    order.fields = static_cast<std::int32_t>(
        std::min(Leading_Integer(std::string_view(outfile).substr(number, end - number)), most));
    outfile.erase(at, end - at);
    outfile = std::string(Trim_Copy(outfile));
    return order;
}

Request_Status Cut_Input_Options(Request_Run& run)
{
    Cut_Options(Input_Options(), run.infile);
    return Done;
}

Request_Status Fetch_Input(Request_Run& run)
{
    std::string source_url;
    if (!Fetch_Url(run.infile, "IN", source_url, run.downloaded))
        return Stop(Request_Status::download_failed, "Could not download input URL:\n%.500s\n",
                    run.infile.c_str());
    request.Source_Url = source_url;
    return Done;
}

/// Names that stand for the clipboard, which must not become files on the way.
constexpr std::string_view Clipboard_Inputs[] = {"clipboard", "clipboard.tab", "clipboard.csv",
                                                 "clipboard.rda"};
constexpr std::string_view Clipboard_Output_Start = "clipboard.";
constexpr std::string_view Clipboard_Output_Extensions[] = {".csv", ".tab", ".txt", ".gen", ".rda"};

Request_Status Stop_At_Clipboard()
{
    return Stop(Request_Status::clipboard_failed, "Using the clipboard is not available in this version.\n");
}

Request_Status Refuse_Clipboard_Input(Request_Run& run)
{
    for (const std::string_view name : Clipboard_Inputs)
        if (Equal_Ignoring_Case(run.infile, name))
            return Stop_At_Clipboard();
    return Done;
}

Request_Status Refuse_Clipboard_Output(Request_Run& run)
{
    if (!Starts_Ignoring_Case(run.outfile, Clipboard_Output_Start))
        return Done;
    for (const std::string_view extension : Clipboard_Output_Extensions)
        if (Ends_Ignoring_Case(run.outfile, extension))
            return Stop_At_Clipboard();
    return Stop(Request_Status::output_failed, "Clipboard format not supported.\n");
}

Request_Status Find_Source_Base_Name(Request_Run& run)
{
    const std::string_view source = run.downloaded ? request.Source_Url.view() : std::string_view(run.infile);
    std::string_view name = File_Part_Of(source);
    name = name.substr(0, Extension_Start(name));
    if (name.empty() || name == "$Std_In$")
        name = "std_in";
    else if (Equal_Ignoring_Case(name, "clipboard"))
        name = "clipbrd";
    request.Source_Base_Name = name;
    return Done;
}

Request_Status Detect_Input(Request_Run& run)
{
    run.input_code = Detect_File_Type(run.infile);
    switch (run.input_code) {
    case unreadable_file:
        return Stop(Request_Status::input_unreadable, "Trial files not supported.\n");
    case unknown_file:
        return Stop(Request_Status::input_unknown, "Files type unknown.\n");
    case zip_file:
        return Stop(Request_Status::zip_unsupported, "Zip files unsupported.\n");
    default:
        return Done;
    }
}

Request_Status Cut_Output_Options(Request_Run& run)
{
    if (run.outfile.empty())
        run.outfile = "Ingester.TBK";
    Cut_Options(Output_Options(), run.outfile);
    if (request.Replace_Sheet_Asked && request.Output_Sheet_Name.empty())
        return Stop(Request_Status::not_imported, "SHEETNAME must be provided with METHOD=replace.\n");
    return Done;
}

/// An operation that an option asks for and that no stage here carries out yet.
struct Missing_Operation {
    bool (*asked)();
    const char* name;
};

constexpr Missing_Operation Missing_Operations[] = {
    {[] { return request.Qtl_Request || request.Qtl_Map_Given; }, "Reading genotype files"},
    {[] { return request.Subset_Columns || request.Subset_Rows; }, "Keeping a subset"},
    {[] { return request.First_Column > 0 || request.Last_Column != 2147483647; },
     "Keeping a range of columns"},
    {[] { return request.Transpose; }, "Transposing"},
    {[] { return request.Use_Var_File || request.Write_Var_List; }, "A list file of columns"},
    {[] { return request.List_Sheets_Only; }, "Listing sheets"},
    {[] { return request.Add_Mode != Add_Modes::none || request.Add_To_Output; },
     "Adding to an existing output"},
    {[] { return request.Output_Matrix; }, "Making a Matrix"},
    {[] { return request.Print_Summary; }, "Printing a summary"},
    {[] { return request.Fixed_Number_Text; }, "Finding decimals"},
};

Request_Status Refuse_Missing_Operations(Request_Run&)
{
    for (const Missing_Operation& operation : Missing_Operations)
        if (operation.asked())
            return Stop(Request_Status::not_imported, "%s is not available in this version.\n",
                        operation.name);
    return Done;
}

Request_Status Choose_Output(Request_Run& run)
{
    run.output = &Output_Driver_Of(run.outfile);
    request.CSV_Output = run.output->code == text_file && !run.output->extension.empty();
    request.Max_Columns = run.output->max_columns;
    if (run.output->write == nullptr)
        return Stop(Request_Status::output_failed,
                    "Files with the extension %s can't be written in this version.\n",
                    std::string(run.output->extension).c_str());
    return Done;
}

Request_Status Refuse_Same_File(Request_Run& run)
{
    if (Equal_Ignoring_Case(run.infile, run.outfile) || Same_File(run.infile, run.outfile))
        return Stop(Request_Status::output_failed, "Input and output files are the same.\n");
    return Done;
}

Request_Status Require_Output_Folder(Request_Run& run)
{
    const std::string folder(Folder_Of(run.outfile));
    if (!folder.empty() && !Folder_Exists(folder))
        return Stop(Request_Status::output_failed, "Output directory %s does not exist.\n", folder.c_str());
    return Done;
}

Request_Status Read_Input(Request_Run& run)
{
    request.Current_File_Name = run.downloaded ? request.Source_Url.view() : std::string_view(run.infile);
    const Reader read = Reader_Of(run.input_code);
    const bool good = read != nullptr && read(run.infile.c_str());
    if (!good)
        return Stop(Request_Status::not_imported, "No data could be imported.\n");
    if (Current_Sheet == nullptr)
        return Stop(Request_Status::no_data, "Data could not be read from input file.\n");
    return Done;
}

Request_Status Drop_Empty_Columns(Request_Run& run)
{
    request.Current_File_Name = run.outfile;
    if (request.Keep_Empty_Columns)
        return Done;
    Delete_Empty_Columns(Current_Sheet);
    if (Current_Sheet->column_count < 1)
        return Stop(Request_Status::no_data, "All columns in the input file are empty.\n");
    return Done;
}

Request_Status Note_Source(Request_Run& run)
{
    Current_Sheet->source_file = run.downloaded ? request.Source_Url.view() : std::string_view(run.infile);
    return Done;
}

/// An existing output is written beside itself, so that it stays whole until the new one is.
Request_Status Name_Temporary_Output(Request_Run& run)
{
    run.output_was_there = File_Exists(run.outfile);
    // A device or a pipe takes the text itself; a rename would put a file in its place.
    request.Write_Via_Temp = request.Write_Via_Temp && run.output_was_there && !Is_Special_File(run.outfile);
    run.temp_output = run.outfile;
    if (!request.Write_Via_Temp || request.Add_To_Output)
        return Done;
    run.temp_output = With_Extension(run.outfile, ".$$$");
    if (Same_File(run.temp_output, run.infile))
        return Stop(Request_Status::output_failed, "Input and output files are the same.\n");
    Delete_File(run.temp_output);  // a link of that name would lead the text elsewhere
    return Done;
}

Request_Status Drop_Empty_Rows(Request_Run&)
{
    if (Get_Settings().delete_empty_rows == 0)
        return Done;
    Delete_Empty_Rows(Current_Sheet);
    if (Current_Sheet->row_count < 1)
        return Stop(Request_Status::no_data,
                    "All rows in the input file are empty.\nUse KEEPEMTPY=rows to return the empty rows.\n");
    return Done;
}

Request_Status Write_Output(Request_Run& run)
{
    run.writing = true;
    if (!run.output->write(Current_Sheet, run.temp_output.c_str()))
        return Stop(Request_Status::output_failed, "Output file not written.\n");
    return Done;
}

Request_Status Replace_Old_Output(Request_Run& run)
{
    if (run.temp_output != run.outfile && !Replace_File(run.temp_output, run.outfile))
        return Stop(Request_Status::rename_failed, "Could not rename temporary file.\n");
    run.writing = false;
    return Done;
}

/// The lines of the input, joined. A fault is told in words alone: the status is always the same.
Request_Status Reflow_Lines(Request_Run& run, const Reflow_Order& order)
{
    if (!order.has_number)
        return Done;
    for (const Stage stage : {Fetch_Input, Refuse_Same_File, Name_Temporary_Output})
        if (const Request_Status status = stage(run); status != Done)
            return status;
    run.writing = true;
    if (!Reflow_Lines_By_Fields(run.infile.c_str(), run.temp_output.c_str(), order.fields)) {
        Report_Message("Output file not written.\n");
        return Done;
    }
    return Replace_Old_Output(run);
}

/// Every stage, in the order in which they act; the first that doesn't succeed ends the request.
constexpr Stage Stages[] = {
    Cut_Input_Options,  Fetch_Input,        Refuse_Clipboard_Input,    Find_Source_Base_Name,
    Detect_Input,       Cut_Output_Options, Refuse_Missing_Operations, Refuse_Clipboard_Output,
    Choose_Output,      Refuse_Same_File,   Require_Output_Folder,     Read_Input,
    Drop_Empty_Columns, Note_Source,        Name_Temporary_Output,     Drop_Empty_Rows,
    Write_Output,       Replace_Old_Output,
};

Request_Status Run_Stages(Request_Run& run)
{
    for (const Stage stage : Stages)
        if (const Request_Status status = stage(run); status != Done)
            return status;
    return Done;
}

}  // namespace

void Start_Request(std::string_view stem)
{
    request = Request_Globals{};
    request.Scratch_Stem = stem;
    Free_Sheets();
    Init_Library();
    Start_Message_File();
}

Request_Status Process_Request(std::string& infile, std::string& outfile, std::int32_t& rows)
{
    Request_Run run;
    run.infile = infile;
    run.outfile = outfile;
    rows = 0;
    Request_Status status = Done;
    if (const Reflow_Order order = Take_Reflow_Order(run.outfile); order.asked)
        status = Reflow_Lines(run, order);
    else
        status = Run_Stages(run);
    infile = run.infile;
    outfile = run.outfile;
    if (Current_Sheet != nullptr)
        rows = Current_Sheet->row_count;
    return status;
}

}  // namespace ingester

// Stages that make the Sheet and bring it into the shape that the output gets.
#include "interface/compressed_files.h"
#include "interface/file_detection.h"
#include "interface/output_joins.h"
#include "interface/output_sheet.h"
#include "interface/pipeline/stages.h"
#include "interface/selection.h"
#include "interface/sheet_viewer.h"
#include "interface/slash_options.h"
#include "interface/var_file.h"
#include "model/column_names.h"
#include "model/column_summary.h"
#include "model/names.h"
#include "model/output_forms.h"
#include "model/sheet.h"
#include "model/sheet_list.h"
#include "model/source_column.h"
#include "model/transpose.h"
#include "platform/file_image.h"
#include "platform/files.h"
#include "request/request.h"
#include "spreadsheet/text/text_manner.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>
#include <utility>

namespace ingester {

namespace {

constexpr const char* No_Columns_Selected =
    "No columns selected from input file (i.e. no matches to specified names).\n";
constexpr const char* No_Rows_Selected =
    "No rows selected from input file (i.e. no matches to specified rows).\n";

/// The host's own files are narrowed while they are read, so that nothing may be left of them.
void Tell_No_Import()
{
    if (!A_Host_File_Was_Read())
        Report_Message("No data could be imported.\n");
    else if (request.Subset_Columns)
        Report_Message(No_Columns_Selected);
    else if (request.Subset_Rows)
        Report_Message(No_Rows_Selected);
}

}  // namespace

Request_Status Read_Input(Request_Run& run)
{
    if (!Read_Data_File(run.infile, run.input_code, run.Source())) {
        Tell_No_Import();
        return Request_Status::not_imported;
    }
    if (Current_Sheet == nullptr)
        return Stop(Request_Status::no_data, "Data could not be read from input file.\n");
    if (request.Found_Text_Dialect != nullptr && Current_Sheet->row_count < 1)
        return Stop(Request_Status::no_rows, "The text holds names, but no rows.\n");
    return Done;
}

namespace {

/// What a user knows an option by.
std::string Shown_Option(const Slash_Option& option)
{
    return option.named.name.empty() ? std::string(option.key) : std::string("--").append(option.named.name);
}

void Tell_Vain(const std::string& option, const Format_Driver& input)
{
    Warn("Warning: %s means nothing to this input, %s, and had no effect.\n", option.c_str(),
         std::string(input.name).c_str());
}

/// Whether the list of what a format's reader acts on holds `key`.
bool Acts_On(const Format_Driver& input, std::string_view key)
{
    const std::string listed = std::string(" ").append(input.options).append(" ");
    return listed.find(std::string(" ").append(key).append(" ")) != std::string::npos;
}

}  // namespace

Request_Status Tell_Vain_Options(Request_Run&)
{
    const Format_Driver* const input = Driver_Of_Code(request.Content_Code);
    if (!For_People(People_Rule::told_options) || input == nullptr)
        return Done;
    for (const Slash_Option& option : Input_Options())
        if (option.of_some_readers && !Acts_On(*input, option.key)
            && std::ranges::find(request.Input_Keys_Given, option.key) != request.Input_Keys_Given.end())
            Tell_Vain(Shown_Option(option), *input);
    if (!request.Worksheet_Name.empty() && input->sheet_names == nullptr && !input->lists_sheets)
        Tell_Vain("--sheet", *input);
    if (!request.Cell_Range.empty() && !Acts_On(*input, "range"))
        Tell_Vain("--range", *input);
    if (!request.Input_Encoding.empty() && !Acts_On(*input, "encoding"))
        Tell_Vain("--encoding", *input);
    if (!request.Named_Secondary_File.empty() && !Acts_On(*input, "secondary"))
        Tell_Vain("--secondary", *input);
    return Done;
}

/// A name that was asked for goes to the Sheet; else the Sheet's own goes to the output.
Request_Status Name_Output_Sheet(Request_Run& run)
{
    constexpr std::string_view automatic = "Sheet";
    Sheet& sheet = *Current_Sheet;
    const bool kept =
        !sheet.sheet_name.empty() && !(run.host_scratch && sheet.sheet_name.view().starts_with(automatic));
    if (!request.Output_Sheet_Name.empty())
        sheet.sheet_name = request.Output_Sheet_Name;
    else if (kept && (request.Add_Mode == Add_Modes::none || !request.Source_Key_Given))
        request.Output_Sheet_Name = sheet.sheet_name;
    return Done;
}

/// A file of one sheet gives a list of one.
Request_Status List_Sheets(Request_Run&)
{
    const Format_Driver* const input = Driver_Of_Code(request.Content_Code);
    if (!request.List_Sheets_Only || (input != nullptr && input->lists_sheets))
        return Done;
    const std::string name(Current_Sheet->sheet_name.empty() ? "Sheet1" : Current_Sheet->sheet_name.view());
    return Make_Sheet_List({name}) ? Done : Request_Status::no_data;
}

/// What is joined with an output takes the place of the sheet that it was joined with.
Request_Status Find_Sheet_Of_Output(Request_Run& run)
{
    if (request.Add_Mode == Add_Modes::none && !request.Source_Key_Given)
        return Done;
    if (!Find_Output_Sheet(run.outfile))
        return Stop(Request_Status::input_unreadable, "Sheets of %.500s could not be listed.\n",
                    run.outfile.c_str());
    if (run.output->add != nullptr)
        request.Add_To_Output = File_Exists(run.outfile);
    if (!request.Merge_Sheet_Name.empty())
        Current_Sheet->sheet_name = request.Merge_Sheet_Name;
    return Done;
}

Request_Status Keep_Subset(Request_Run& run)
{
    request.Current_File_Name = run.outfile;
    if (!request.Subset_Columns && !request.Subset_Rows)
        return Done;
    switch (Apply_Subset(Current_Sheet, request.Content_Code)) {
    case Subset_Result::no_columns:
        return Stop(Request_Status::nothing_selected, No_Columns_Selected);
    case Subset_Result::no_rows:
        return Stop(Request_Status::nothing_selected, No_Rows_Selected);
    case Subset_Result::kept:
        break;
    }
    return Done;
}

Request_Status Drop_Empty_Columns(Request_Run&)
{
    if (request.Keep_Empty_Columns)
        return Done;
    Delete_Empty_Columns(Current_Sheet);
    if (Current_Sheet->column_count < 1)
        return Stop(Request_Status::no_data, "All columns in the input file are empty.\n");
    return Done;
}

Request_Status Turn_Rows_Into_Columns(Request_Run&)
{
    if (request.Transpose && !Transpose_Sheet(Current_Sheet))
        return Stop(Request_Status::not_imported, "Unable to transpose input file.\n");
    return Done;
}

Request_Status Note_Source(Request_Run& run)
{
    Current_Sheet->source_file = run.Source();
    return Done;
}

/// Without the list that was asked for, one is made that a user can fill in.
Request_Status Change_By_List(Request_Run& run)
{
    if (!request.Use_Var_File)
        return Done;
    if (!File_Exists(request.Var_File_Name))
        Write_Var_File(*Current_Sheet, request.Var_File_Name);
    else if (!Apply_Var_File(Current_Sheet, request.Var_File_Name))
        return Request_Status::input_unreadable;
    else if (run.host_scratch)
        Delete_File(request.Var_File_Name);
    if (Current_Sheet->column_count < 1)
        return Stop(Request_Status::no_data, "All columns in the input file are empty.\n");
    return Done;
}

Request_Status Mark_Source(Request_Run&)
{
    if (request.Source_Key_Given)
        static_cast<void>(Add_Source_Column(Current_Sheet));  // an extra: the data stand without it
    return Done;
}

namespace {

/// One way of joining, and what is said when it fails.
struct Output_Join {
    Add_Modes mode;
    Request_Status (*join)(Sheet* sheet, const std::string& path);
    const char* failed;
};

constexpr Output_Join Output_Joins[] = {
    {Add_Modes::append, Append_To_Output, "Could not append data.\n"},
    {Add_Modes::concatenate, Concatenate_With_Output, "Could not concatenate data.\n"},
    {Add_Modes::merge, Merge_With_Output, "Could not merge data.\n"},
};

}  // namespace

namespace {

/// The bytes of a text that may be packed. False after a message.
bool Load_Text(const std::string& name, bool packed, File_Image& image)
{
    const Scratch_File scratch(packed ? Decompressed_Name(name) : std::string());
    if (packed && !Decompress_To(scratch.Name(), name.c_str()))
        return false;
    Input_File file;
    return (file.Open(packed ? scratch.Name() : name) && image.Load(file))
           || Fail("Output file could not be read.\n");
}

}  // namespace

/// Who joins data onto a text wants it back as it was.
Request_Status Keep_Manner_Of_Output(Request_Run& run)
{
    const bool separated = request.CSV_Output || run.output_code == tab_text_file;
    const std::string name(request.Add_File_Name);
    if (!For_People(People_Rule::plain_texts) || request.Add_Mode == Add_Modes::none || !separated
        || !File_Exists(name))
        return Done;
    File_Image image;
    if (!Load_Text(name, run.packed, image))
        return Request_Status::input_unreadable;
    Keep_Manner_Of_Text({image.Bytes(), image.Size()}, Native_Path(name).c_str());
    return Done;
}

Request_Status Join_With_Output(Request_Run&)
{
    for (const Output_Join& way : Output_Joins) {
        if (way.mode != request.Add_Mode)
            continue;
        const std::string path(request.Add_File_Name);
        if (const Request_Status status = way.join(Current_Sheet, path); status != Done)
            return Stop(status, way.failed);
    }
    return Done;
}

Request_Status Keep_Range_Of_Columns(Request_Run&)
{
    if (request.First_Column <= 0 && request.Last_Column >= Current_Sheet->column_count)
        return Done;
    if (!Keep_Column_Range(Current_Sheet, request.First_Column, request.Last_Column))
        return Stop(Request_Status::not_imported, "Could not remove columns.\n");
    return Done;
}

namespace {

/// Keys name columns as the input and the output have them, which are those of hosts now.
void Fit_Key_Names()
{
    for (std::vector<std::string>* const keys : {&request.Merge_Keys, &request.Merge_With_Keys})
        for (std::string& key : *keys)
            key = Valid_Host_Name(key);
    if (request.Merge_Key.empty())
        return;
    request.Merge_Key = Valid_Host_Name(request.Merge_Key);
    if (request.Add_Mode == Add_Modes::merge && !request.Merge_With.empty())
        request.Merge_With = Valid_Host_Name(request.Merge_With);
}

}  // namespace

/// Names that stood as they were become valid where the output needs it.
Request_Status Fit_Names_To_Output(Request_Run& run)
{
    const bool only_summary = request.Print_Summary && Is_Special_File(run.outfile);
    if (!For_People(People_Rule::free_names) || run.output->names != Held_Names::valid || only_summary)
        return Done;
    if (std::exchange(request.Names_Kept_As_They_Stand, false))
        Fit_Key_Names();
    for (Column* column = Current_Sheet->first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            Make_Name_Valid(*column);
    return Done;
}

Request_Status Make_Names_Unique(Request_Run& run)
{
    if (run.output->unique_names)
        Make_Column_Names_Unique(Current_Sheet);
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

/// What could not be kept for want of memory must not be missing in the output.
Request_Status Refuse_Losses(Request_Run&)
{
    return request.Out_Of_Memory ? Request_Status::no_data : Done;
}

Request_Status Find_Fixed_Decimals(Request_Run&)
{
    if (request.Fixed_Number_Text)
        Find_Decimals(Current_Sheet);
    return Done;
}

Request_Status Tell_Summary(Request_Run& run)
{
    if (request.Print_Summary)
        Print_Column_Summary(Current_Sheet,
                             Is_Special_File(run.outfile) ? Native_Path(run.Source()) : run.outfile);
    return Done;
}

Sheet_Viewer sheet_viewer;

Request_Status Show_Sheet(Request_Run& run)
{
    const Format_Driver* const input = Driver_Of_Code(request.Content_Code);
    if (!sheet_viewer || input == nullptr)
        return Done;
    run.finished = true;
    const bool packed = run.input_code == compressed_file;
    const auto names = input->sheet_names == nullptr ? std::nullopt : List_Sheet_Names(run.infile);
    const bool shown =
        sheet_viewer({*Current_Sheet, *input, packed, names.value_or(std::vector<std::string>{})});
    return shown ? Done : Request_Status::output_failed;
}

}  // namespace ingester

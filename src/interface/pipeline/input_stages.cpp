// Stages that take the two strings apart and find out what they name.
#include "interface/clipboard.h"
#include "interface/compressed_files.h"
#include "interface/file_detection.h"
#include "interface/output_joins.h"
#include "interface/paths.h"
#include "interface/people_options.h"
#include "interface/pipeline/stages.h"
#include "interface/slash_options.h"
#include "interface/var_file.h"
#include "model/sheet.h"
#include "platform/files.h"
#include "platform/text_codes.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>
#include <limits>
#include <utility>
#include <vector>

namespace ingester {

Request_Run::~Request_Run()
{
    if (downloaded || clipboard_input || kept_stream)
        Delete_File(infile);
    if (secondary_downloaded)
        Delete_File(request.Secondary_File);
    if (map_downloaded)
        Delete_File(request.Qtl_Map_File);
    if (held_back)
        Delete_File(temp_output);
    else if (writing && (temp_output != outfile || !output_was_there))
        Delete_File(temp_output);
}

/// A pass file's strings have gone through here already, those of other callers haven't.
Request_Status Take_Rules_For_People(Request_Run& run)
{
    Take_People_Options(run.infile, run.outfile);
    return Done;
}

namespace {

/// A code that nobody knows would be taken for none.
bool Encoding_Is_Known(const char* name)
{
    if (*name == '\0' || Find_Text_Code(name) != nullptr)
        return true;
    std::string near;
    for (const std::string_view other : Nearest_Code_Names(name))
        near.append(near.empty() ? "" : ", ").append(other);
    return Fail("Error: The encoding %s is not known. The nearest ones: %s.\n", name, near.c_str());
}

}  // namespace

Request_Status Know_Encodings(Request_Run&)
{
    return Encoding_Is_Known(request.Input_Encoding.c_str())
                   && Encoding_Is_Known(request.Output_Encoding.c_str())
               ? Done
               : Request_Status::not_imported;
}

Request_Status Fetch_Named_Secondary(Request_Run& run)
{
    std::string name(request.Named_Secondary_File.view());
    if (name.empty())
        return Done;
    std::string source_url;
    if (!Fetch_Url(name, "SEC", source_url, Get_Temp_Folder(), run.secondary_downloaded))
        return Stop(Request_Status::download_failed, "Could not download secondary file URL:\n%.500s\n",
                    name.c_str());
    request.Secondary_File = name;
    return Done;
}

Request_Status Expand_Tokens(Request_Run& run)
{
    const std::string temp = Get_Temp_Folder();
    Expand_Path_Tokens(run.infile, temp);
    Expand_Path_Tokens(run.outfile, temp);
    request.Allow_HTML = Read_Host_Setting("Spreadsheet", "Allow HTML Formatting", 0, 1, 0) != 0;
    return Done;
}

Request_Status Cut_Genotype_Options(Request_Run& run)
{
    Cut_Options(Genotype_Options(), run.infile);
    return Done;
}

Request_Status Fetch_Map(Request_Run& run)
{
    std::string map(request.Qtl_Map_File.view());
    std::string source_url;
    if (!Fetch_Url(map, "MAP", source_url, Get_Temp_Folder(), run.map_downloaded))
        return Stop(Request_Status::download_failed, "Could not download map file URL:\n%.500s\n",
                    map.c_str());
    request.Qtl_Map_File = map;
    return Done;
}

Request_Status Reflow_Lines(Request_Run& run)
{
    const Reflow_Order order = Take_Reflow_Order(run.outfile);
    run.finished = order.asked;
    if (!order.has_number)
        return Done;
    for (const Stage stage : {Fetch_Input, Refuse_Same_File, Name_Temporary_Output})
        if (const Request_Status status = stage(run); status != Done)
            return status;
    Begin_Writing(run);
    if (Reflow_Lines_By_Fields(run.infile.c_str(), run.temp_output.c_str(), order.fields))
        return Replace_Old_Output(run);
    Report_Message("Output file not written.\n");  // in words alone: the status is always the same
    return Done;
}

Request_Status Cut_Input_Options(Request_Run& run)
{
    request.Input_Keys_Given = Cut_Options(Input_Options(), run.infile);
    if (Letters_Are_Utf8() && !Is_Ascii(request.Custom_Separators))
        return Stop(Request_Status::not_imported,
                    "Error: Separators beyond ASCII, as %s, can't be used with texts in UTF-8.\n",
                    request.Custom_Separators.c_str());
    return Done;
}

Request_Status Fetch_Input(Request_Run& run)
{
    std::string source_url;
    if (!Fetch_Url(run.infile, "IN", source_url, Get_Temp_Folder(), run.downloaded))
        return Stop(Request_Status::download_failed, "Could not download input URL:\n%.500s\n",
                    run.infile.c_str());
    request.Source_Url = source_url;
    return Done;
}

/// The list file stands beside the input, or under its name in the temporary folder.
Request_Status Name_Var_File(Request_Run& run)
{
    if (!request.Use_Var_File)
        return Done;
    std::string name = Find_Companion(With_Extension(run.infile, ".VAR"));
    if (!File_Exists(name))
        name = Find_Companion(Get_Temp_Folder().append(File_Part_Of(name)));
    request.Var_File_Name = name;
    return Done;
}

/// The clipboard's text becomes a file of its own, with the extension that was asked for.
Request_Status Take_Clipboard_Input(Request_Run& run)
{
    if (!Is_Clipboard_Input(run.infile))
        return Done;
    const std::string extension = run.infile.substr(Extension_Start(run.infile));
    run.infile = Get_Temp_Folder().append("$Clip$").append(extension.empty() ? ".txt" : extension);
    run.clipboard_input = true;
    return Read_Clipboard_To_File(run.infile) ? Done : Request_Status::clipboard_failed;
}

/// A pipe or a device can be read once; what comes out of it is kept until the reader has it.
Request_Status Keep_Stream(Request_Run& run)
{
    if (!Is_Special_File(run.infile))
        return Done;
    std::string copy = Get_Temp_Folder()
                           .append("IN")
                           .append(request.Scratch_Stem)
                           .append(run.infile.substr(Extension_Start(run.infile)));
    run.source_name = std::exchange(run.infile, std::move(copy));
    run.kept_stream = true;
    if (!Copy_File(run.source_name, run.infile, Scratch_Room(Get_Temp_Folder())))
        return Stop(Request_Status::input_unreadable,
                    "Input could not be read to its end and kept in the temporary folder.\n");
    return Done;
}

Request_Status Find_Source_Base_Name(Request_Run& run)
{
    std::string_view name = File_Part_Of(run.Source());
    name = name.substr(0, Extension_Start(name));
    if (name.empty() || name == "$Std_In$")
        name = "std_in";
    else if (run.clipboard_input)
        name = "clipbrd";
    request.Source_Base_Name = name;
    return Done;
}

Request_Status Detect_Input(Request_Run& run)
{
    run.input_code = request.Qtl_Map_Given ? qtl_locus_file : Detect_File_Type(run.infile);
    run.genotype = run.input_code == qtl_locus_file;
    if (run.genotype && !request.Qtl_Request)
        return Stop(Request_Status::qtl_options, "Incorrect options for QTL file.\n");
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
    Cut_Options(Output_Options(), run.outfile);
    if (run.outfile.empty())
        run.outfile = "Ingester.TBK";
    if (request.Add_Mode != Add_Modes::none)
        request.Add_File_Name = run.outfile;
    if (request.Replace_Sheet_Asked && request.Output_Sheet_Name.empty())
        return Stop(Request_Status::not_imported, "SHEETNAME must be provided with METHOD=replace.\n");
    return Done;
}

namespace {

/// Adds "key" or "key=with" to the two lists.
void Take_Merge_Keys(std::string_view line)
{
    const std::size_t equals = std::min(line.find('='), line.size());
    const std::string_view key = Trim_Copy(line.substr(0, equals));
    const std::string_view with = equals < line.size() ? Trim_Copy(line.substr(equals + 1)) : key;
    request.Merge_Keys.emplace_back(key);
    request.Merge_With_Keys.emplace_back(with);
}

/// As many as were counted, and none without a name: the place of a column is no substitute for one.
bool Merge_Keys_Are_Whole()
{
    const auto is_empty = [](const std::string& key) { return key.empty(); };
    return !request.Merge_Keys.empty() && std::ssize(request.Merge_Keys) == request.Merge_Key_Count
           && std::ranges::none_of(request.Merge_Keys, is_empty)
           && std::ranges::none_of(request.Merge_With_Keys, is_empty);
}

}  // namespace

/// The list file of a merge stands beside the input; its first line counts the keys.
Request_Status Read_Merge_Keys(Request_Run& run)
{
    constexpr std::size_t longest_line = 1024;
    if (request.Merge_Key_Count < 1)
        return Done;
    std::string name =
        With_Extension(run.downloaded ? request.Source_Url.view() : std::string_view(run.infile), ".mrg");
    std::string source_url;
    bool downloaded = false;
    if (!Fetch_Url(name, "MRG", source_url, Get_Temp_Folder(), downloaded))
        return Stop(Request_Status::download_failed, "Could not download merge file URL:\n%.500s\n",
                    name.c_str());
    Input_File file;
    std::string line;
    if (file.Open(Find_Companion(name)) && file.Read_Line(line, longest_line))
        request.Merge_Key_Count = std::min<std::int32_t>(
            request.Merge_Key_Count, static_cast<std::int32_t>(std::clamp(Leading_Integer(line), 0L, 9L)));
    std::vector<std::string> lines;
    while (std::ssize(lines) < request.Merge_Key_Count && file.Read_Line(line, longest_line))
        lines.push_back(line);
    Take_Lines_Into_Letters(lines);
    std::ranges::for_each(lines, Take_Merge_Keys);
    const bool whole = file.Close() && Merge_Keys_Are_Whole();
    if (downloaded)
        Delete_File(name);
    if (!whole)
        return Stop(Request_Status::merge_failed, "Merge columns not found in files.\n");
    if (request.Merge_Key_Count > Most_Asked_Keys)
        Report_Message_Long("Warning: A merge has four keys at the most; the first four of %li were used.\n",
                            request.Merge_Key_Count);
    return Done;
}

namespace {

bool Adds_To_Compressed(std::string_view outfile)
{
    const bool adds = request.Add_To_Output || request.Add_Mode != Add_Modes::none;
    return adds && Ends_Ignoring_Case(outfile, ".gz") && File_Exists(outfile);
}

/// A compressed book that is there and added to has its extension in front of the last one.
std::string_view Name_Of_Format(std::string_view outfile)
{
    const std::string_view plain = outfile.substr(0, Extension_Start(outfile));
    const bool book = Adds_To_Compressed(outfile) && Output_Driver_Of(plain).code == book_file;
    return book ? plain : outfile;
}

}  // namespace

namespace {

/// R data go out in their text form where that is asked for, and to the clipboard, which takes texts.
const Format_Driver& Chosen_Driver(const Request_Run& run)
{
    const Format_Driver& by_name = Output_Driver_Of(Name_Of_Format(run.outfile));
    const bool as_text = by_name.code == r_data_file && (request.R_Text_Output || run.clipboard_output);
    return as_text ? *Driver_Of_Code(r_text_file) : by_name;
}

}  // namespace

Request_Status Choose_Output(Request_Run& run)
{
    run.clipboard_output = Is_Clipboard_Output(run.outfile);
    request.R_Text_Output = request.R_Text_Output || run.clipboard_output;
    run.output = &Chosen_Driver(run);
    if (run.clipboard_output && !Ends_With_One_Of(run.outfile, run.output->clipboard_extensions))
        return Stop(Request_Status::output_failed, "Clipboard format not supported.\n");
    run.output_code = run.output->code;
    run.packed = For_People(People_Rule::further_endings) && !run.clipboard_output
                 && Name_Inside_Packing(run.outfile) != run.outfile;
    request.CSV_Output = run.output_code == text_file && !Is_Fixed_Width_Text(*run.output);
    request.Max_Columns = static_cast<std::int32_t>(
        std::min<std::int64_t>(std::int64_t{run.output->max_columns} + std::max(request.First_Column - 1, 0),
                               std::numeric_limits<std::int32_t>::max()));
    if (run.output->write == nullptr && !run.output->instead.empty())
        return Stop(Request_Status::output_failed,
                    "Writing %s is not available in this version; %s is, which most programs read.\n",
                    std::string(run.output->name).c_str(), std::string(run.output->instead).c_str());
    if (run.output->write == nullptr)
        return Stop(Request_Status::output_failed, "Writing %s is not available in this version.\n",
                    std::string(run.output->name).c_str());
    if (run.clipboard_output)
        run.outfile.resize(Extension_Start(run.outfile));
    return Done;
}

Request_Status Refuse_Same_File(Request_Run& run)
{
    if (Equal_Ignoring_Case(run.infile, run.outfile) || Same_File(run.infile, run.outfile))
        return Stop(Request_Status::output_failed, "Input and output files are the same.\n");
    const std::string report(request.Loss_Report_Name.view());
    if (!report.empty()
        && (Same_File(report, run.infile) || Same_File(report, run.outfile) || report == run.outfile)) {
        request.Loss_Report_Name.clear();  // which would be written all the same
        return Stop(Request_Status::output_failed, "The report and the input or output are the same file.\n");
    }
    return Done;
}

/// Formats that hold any text as the name of a column take the names as they are. For people all names stand
/// until an output is found that can't hold them.
Request_Status Keep_Names_As_They_Stand(Request_Run& run)
{
    const bool asked = request.No_Name_Marks || request.Use_Var_File;
    request.Names_Kept_As_They_Stand =
        For_People(People_Rule::free_names) || (asked && run.output->names == Held_Names::free);
    return Done;
}

/// What the host asks for itself has to come back with the shape that it sent.
Request_Status Know_Host_Scratch_File(Request_Run& run)
{
    run.host_scratch = Is_Host_Scratch_File(run.outfile);
    if (run.host_scratch) {
        Get_Settings().delete_empty_rows = 0;
        request.Keep_Empty_Columns = true;
    }
    return Done;
}

Request_Status Take_Wanted_Types(Request_Run&)
{
    if (request.Use_Var_File && !Read_Var_File(request.Var_File_Name))
        return Request_Status::input_unreadable;
    return Done;
}

Request_Status Require_Output_Folder(Request_Run& run)
{
    const std::string folder(Folder_Of(run.outfile));
    if (!folder.empty() && !Folder_Exists(folder))
        return Stop(Request_Status::output_failed, "Output directory %s does not exist.\n", folder.c_str());
    return Done;
}

Request_Status Take_Sheet_Of_Output(Request_Run&)
{
    const bool updates = request.Add_Mode == Add_Modes::append || request.Add_Mode == Add_Modes::concatenate
                         || request.Source_Key_Given;
    if (updates && !request.Merge_Sheet_Name.empty() && request.Worksheet_Name.empty())
        request.Worksheet_Name = request.Merge_Sheet_Name;
    return Done;
}

/// A list of sheets is made of names alone.
Request_Status Switch_Off_For_List(Request_Run&)
{
    if (!request.List_Sheets_Only)
        return Done;
    request.Add_Mode = Add_Modes::none;
    request.Add_To_Output = false;
    request.Subset_Columns = request.Subset_Rows = false;
    request.Keep_Empty_Columns = false;
    request.Transpose = false;
    request.Source_Key_Given = false;
    request.Fixed_Number_Text = false;
    request.Output_Matrix = false;
    request.Print_Summary = false;
    request.Use_Var_File = false;
    request.Column_Wanted_Types.clear();
    request.Column_Wanted_Names.clear();
    request.Column_Wanted_Count = 0;
    request.First_Column = 0;
    request.Last_Column = Every_Column;
    Get_Settings().delete_empty_rows = 0;
    return Done;
}

namespace {

/// An operation that an option asks for and that no stage here carries out yet.
struct Missing_Operation {
    bool (*asked)(const Request_Run& run);
    const char* name;
};

constexpr Missing_Operation Missing_Operations[] = {
    {[](const Request_Run& run) { return run.genotype; }, "Reading genotype files"},
    {[](const Request_Run& run) {
         const bool rewritten = run.packed && !Is_Fixed_Width_Text(*run.output);
         return Adds_To_Compressed(run.outfile) && run.output_code != book_file && !rewritten;
     },
     "Adding to a compressed output"},
    {[](const Request_Run& run) {
         return request.Add_To_Output && run.output->add == nullptr && File_Exists(run.outfile);
     },
     "Adding to an existing output"},
};

}  // namespace

Request_Status Refuse_Missing_Operations(Request_Run& run)
{
    for (const Missing_Operation& operation : Missing_Operations)
        if (operation.asked(run))
            return Stop(Request_Status::not_imported, "%s is not available in this version.\n",
                        operation.name);
    return Done;
}

}  // namespace ingester

#include "command/host.h"

#include "command/look.h"
#include "command/progress_line.h"
#include "command/request_text.h"
#include "command/selection_lists.h"
#include "command/usage.h"
#include "ingester/ingester.h"
#include "interface/clipboard.h"
#include "interface/compressed_files.h"
#include "interface/paths.h"
#include "interface/people_options.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/host_process.h"
#include "platform/text_codes.h"
#include "request/request.h"
#include "support/text.h"
#include "support/utf8.h"

#include <cstddef>
#include <cstdint>
#include <cstdio>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

/// Names in the private folder. The library knows the first one.
constexpr const char* Standard_Input_Name = "$Std_In$";
constexpr const char* Standard_Output_Name = "x.csv";

/// Whose fault it is, as far as a status tells.
enum class Blamed : std::uint8_t { input, output, request };

struct Status_Sentence {
    int status;
    Blamed blamed;
    const char* sentence;
};

constexpr Status_Sentence Status_Sentences[] = {
    {INGESTER_NO_REQUEST, Blamed::request,
     "the request did not reach the library; is there room in the temporary folder?"},
    {INGESTER_INPUT_UNREADABLE, Blamed::input, "the file can't be opened, or is empty"},
    {INGESTER_INPUT_UNKNOWN, Blamed::input, "this is no file of a known type"},
    {INGESTER_NO_DATA, Blamed::input, "no data could be read, or all of them are missing"},
    {INGESTER_NOT_IMPORTED, Blamed::input, "the data could not be imported"},
    {INGESTER_OUTPUT_FAILED, Blamed::output, "the file could not be written"},
    {INGESTER_NO_ROWS, Blamed::input, "the table has no rows"},
    {INGESTER_INEXACT_SHEET, Blamed::input, "no sheet of that name holds data, or data could not be added"},
    {INGESTER_CLIPBOARD_FAILED, Blamed::request, "the clipboard could not be used"},
    {INGESTER_RENAME_FAILED, Blamed::output, "the finished file could not take its name"},
    {INGESTER_ZIP_UNSUPPORTED, Blamed::input, "this is a zip archive; give the files in it one by one"},
    {INGESTER_NOTHING_SELECTED, Blamed::input,
     "no columns or rows were selected, or the data could not be appended"},
    {INGESTER_QTL_FAILED, Blamed::input, "the QTL file could not be converted"},
    {INGESTER_CONCATENATE_FAILED, Blamed::request, "the tables can't stand beside each other"},
    {INGESTER_QTL_OPTIONS, Blamed::input, "these options do not fit a QTL file"},
    {INGESTER_MERGE_FAILED, Blamed::request, "the tables could not be merged"},
    {INGESTER_DOWNLOAD_FAILED, Blamed::input, "the download failed"},
};

/// Comma text for other programs has no padding between its commas.
std::string Packed_Option(const Command_Options& options, std::string_view output)
{
    constexpr std::string_view packed = "/h";
    const bool comma_text = Ends_Ignoring_Case(Name_Inside_Packing(output), ".csv");
    const bool said = options.padded || options.output_options.find(packed) != std::string::npos
                      || options.output_options.find("/rewrite=") != std::string::npos;
    return comma_text && !said ? std::string(packed) : std::string();
}

/// One conversion, in the names of both sides.
struct Conversion {
    const Command_Options& options;
    Sent_Name input;
    Sent_Name output;
    std::string folder;
    Choice_Lists lists;

    [[nodiscard]] bool From_Standard_Input() const { return options.input == Standard_Stream; }
    [[nodiscard]] bool To_Standard_Output() const { return options.output == Standard_Stream; }
    [[nodiscard]] bool Joins() const { return Options_Join_With_Output(options.output_options); }
};

/// What the library answered.
struct Answer {
    int status = INGESTER_NO_REQUEST;
    std::string messages;

    /// The output is what was asked for.
    [[nodiscard]] bool Is_Good() const { return status == INGESTER_SUCCESS || status == INGESTER_NO_ROWS; }
};

void Say(std::string_view about, std::string_view sentence)
{
    const std::string line =
        std::string("ingester: ").append(about).append(": ").append(sentence).append("\n");
    std::fwrite(line.data(), 1, line.size(), stderr);
}

Sent_Name Name_Of(const std::string& given, const char* stream, const std::string& stand_in)
{
    return given == Standard_Stream ? Sent_Name{stream, stand_in} : Sent_Name{given, Request_Path(given)};
}

bool Length_Is_Carried(std::string_view about, std::size_t length, std::size_t longest)
{
    if (length <= longest)
        return true;
    Say(about, Format_Text("a request can carry %zu characters here, with slash options, and these are %zu; "
                           "use a shorter one",
                           longest, length));
    return false;
}

bool Name_Is_Carried(const std::string& given)
{
    const std::string fault = Fault_Of_Name(given);
    if (!fault.empty())
        Say(given, fault);
    return fault.empty();
}

std::string Rules_Of(const Command_Options& options)
{
    return Spell_People_Rules(~options.host_rules);
}

/// What a terminal gives in UTF-8, as the names that it stands for are in the request.
std::string In_Request_Code(const Command_Options& options, const std::string& text)
{
    const bool host_text = options.host_rules.test(static_cast<std::size_t>(People_Rule::utf8_text));
    if (!host_text || !Is_Utf8(text))
        return text;
    return std::string(Sure_Converter(Utf_8_Code(), Windows_1252_Code()).Convert(text));
}

bool Request_Can_Carry(const Conversion& conversion)
{
    const Command_Options& options = conversion.options;
    return Name_Is_Carried(options.input) && Name_Is_Carried(options.output)
           && Length_Is_Carried(conversion.input.native,
                                conversion.input.request.size() + Rules_Of(options).size()
                                    + options.input_options.size(),
                                Long_Name_Width)
           && Length_Is_Carried(conversion.output.native,
                                conversion.output.request.size() + options.output_options.size(),
                                Long_Name_Width)
           && Length_Is_Carried("--sheet", options.sheet.size(), Short_Name_Width)
           && Length_Is_Carried("--range", options.range.size(), Short_Name_Width);
}

/// What the library would take in a way that the user can't have meant.
bool Output_Makes_Sense(const Conversion& conversion)
{
    const char* refusal = nullptr;
    if (conversion.options.task != Task::convert)
        return true;
    if (Equal_Ignoring_Case(conversion.options.output, "clipboard"))
        refusal = "as an output the clipboard needs an extension: clipboard.csv, .tab, .txt or .gen; "
                  "a file of this name is ./clipboard";
    else if (Options_Name_Joined_Sheet(conversion.options.output_options))
        refusal =
            "a table that is joined with a sheet takes the place and the name of that; leave --add-sheet, "
            "--replace-sheet and --sheet-name out, and choose the sheet by --update-sheet";
    else if (conversion.Joins() && Options_Keep_Columns(conversion.options.input_options))
        refusal = "--columns would act on the joined table, and take columns of the old one away; "
                  "choose those of the input by --keep";
    else if (conversion.To_Standard_Output() && Options_Print_Summary(conversion.options.input_options))
        refusal = "the summary would stand in the table; name a file, or run 'ingester summary'";
    if (refusal != nullptr)
        Say(conversion.output.native, refusal);
    return refusal == nullptr;
}

bool Report_May_Be_Written(const Command_Options& options)
{
    const std::string report = Report_Of_Options(options.input_options);
    if (report.empty() || options.force || !File_Exists(report))
        return true;
    Say(Native_Path(report), "the file exists already and was left as it is; give --force to replace it");
    return false;
}

bool Output_May_Be_Written(const Conversion& conversion)
{
    const Command_Options& options = conversion.options;
    const Sent_Name& output = conversion.output;
    const char* refusal = nullptr;
    if (options.task != Task::convert || Is_Clipboard_Output(output.request)
        || (conversion.To_Standard_Output() && !conversion.Joins()))
        return true;
    if (conversion.Joins() && !File_Exists(output.request))
        refusal = "there is no such file that the input could be joined with";
    else if (Folder_Exists(output.request))
        refusal = "this is a folder; name a file in it";
    else if (Is_Special_File(output.request))
        refusal = "this is a device or a pipe, which a finished file can't replace; "
                  "give - to write on standard output";
    else if (!options.force && File_Exists(output.request) && !Options_Add_To_Output(options.output_options))
        refusal = "the file exists already and was left as it is; give --force to replace it";
    if (refusal != nullptr)
        Say(output.native, refusal);
    return refusal == nullptr;
}

/// A list of the user's own would be taken in the place of ours.
bool Change_List_Is_Free(const Conversion& conversion)
{
    const std::string name = Find_Companion(With_Extension(conversion.input.request, ".VAR"));
    const bool asked = conversion.options.input_options.find("/v") != std::string::npos;
    if (conversion.lists.changes.empty() || (!asked && !File_Exists(name)))
        return true;
    Say(Native_Path(name), "a list of columns beside the input can't be used together with --drop, --rename "
                           "and --type; put them into the list, or move it");
    return false;
}

void Write_Text_Record(Output_File& file, std::string_view text)
{
    file.Write_Little<std::int32_t>(0);
    file.Write_Little(static_cast<std::int32_t>(text.size()));
    file.Write(text);
}

std::string Column_List_Name(const Conversion& conversion)
{
    return conversion.folder + "columns";
}

std::string Row_List_Name(const Conversion& conversion)
{
    return conversion.folder + "rows";
}

/// The names of scratch files begin so.
std::string Stem_Of(const Conversion& conversion)
{
    return conversion.folder + Format_Text("IG%li", Process_Id());
}

/// Where a request looks for the list of an input that has none beside it. A fetched one is known by the
/// name of its copy.
std::string Change_List_Name(const Conversion& conversion)
{
    const std::string& input = conversion.input.request;
    const std::string name = Is_Url(input) ? "IN" + std::string(File_Part_Of(Stem_Of(conversion)))
                                           : std::string(File_Part_Of(input));
    return conversion.folder + With_Extension(name, ".VAR");
}

/// The strings of the request, in the order of the pass file.
std::vector<std::string> Request_Records(const Conversion& conversion)
{
    const Command_Options& options = conversion.options;
    const std::string& output = conversion.output.request;
    const Choice_Lists& lists = conversion.lists;
    const bool chosen = !lists.columns.empty() || !lists.rows.empty();
    const std::string asked = Rules_Of(options) + (lists.changes.empty() ? "" : "/v");
    // In front of the options that were written as they stand: a value without an end takes all that follows.
    std::vector<std::string> records = {conversion.input.request + asked + options.input_options,
                                        output + Packed_Option(options, output) + options.output_options};
    if (chosen || !options.sheet.empty() || !options.range.empty())
        records.push_back(In_Request_Code(options, options.sheet));
    if (chosen || !options.range.empty())
        records.push_back(options.range);
    if (!lists.columns.empty())
        records.push_back(Column_List_Name(conversion) + (lists.rows.empty() ? "/s" : "/s/r"));
    if (!lists.rows.empty())
        records.push_back(Row_List_Name(conversion) + (lists.columns.empty() ? "/r" : ""));
    return records;
}

bool Write_List(const Command_Options& options, const std::string& name, const std::string& text)
{
    Output_File file;
    if (text.empty())
        return true;
    if (!file.Open_Scratch(name))
        return false;
    file.Write(In_Request_Code(options, text));
    return file.Close();
}

bool Write_Lists(const Conversion& conversion)
{
    const Choice_Lists& lists = conversion.lists;
    const Command_Options& options = conversion.options;
    return Write_List(options, Column_List_Name(conversion), lists.columns)
           && Write_List(options, Row_List_Name(conversion), lists.rows)
           && Write_List(options, Change_List_Name(conversion), lists.changes);
}

bool Write_Pass_File(const Conversion& conversion, const std::string& name)
{
    const std::vector<std::string> records = Request_Records(conversion);
    Output_File file;
    if (!file.Open_Scratch(name))
        return false;
    file.Write_Little(static_cast<double>(records.size()));
    for (const std::string& record : records)
        Write_Text_Record(file, record);
    return file.Close();
}

/// The list of keys stands beside the input, where it must not replace what the user has there; so the
/// library gets a link to the input, in the private folder. An input that isn't there fails by itself.
bool Put_Merge_Keys(Conversion& conversion, const std::string& folder)
{
    const std::string link = folder + std::string(File_Part_Of(conversion.input.request));
    if (!conversion.From_Standard_Input()) {
        if (!File_Exists(conversion.input.request))
            return true;
        if (!Make_Link(link, conversion.input.request))
            return false;
        conversion.input.request = link;
    }
    std::string lines = Format_Text("%zu\n", conversion.options.merge_keys.size());
    for (const std::string& key : conversion.options.merge_keys)
        lines.append(key).append("\n");
    Output_File file;
    if (!file.Open_Scratch(With_Extension(link, ".mrg")))
        return false;
    file.Write(In_Request_Code(conversion.options, lines));
    return file.Close();
}

void Print_Request(const Conversion& conversion)
{
    constexpr const char* names[] = {"Infile",     "Outfile",        "Worksheet",
                                     "Cell range", "Secondary file", "Subset rows file"};
    const char* const* name = names;
    for (const std::string& record : Request_Records(conversion))
        std::printf("%s: %s\n", *name++, record.c_str());
}

int Read_Status(const std::string& name)
{
    Input_File file;
    std::int32_t status = 0;
    const bool read = file.Open(name) && file.Read_Little(status);
    return read && status >= 0 && status < Usage_Error ? status : INGESTER_NO_REQUEST;
}

std::string Read_Messages(const std::string& name)
{
    std::string text;
    Input_File file;
    if (!file.Open(name))
        return text;
    char part[4096];
    while (const std::size_t got = file.Read(part, sizeof part))
        text.append(part, got);
    constexpr std::string_view end_mark = ":\n";
    if (text.ends_with(end_mark))
        text.resize(text.size() - end_mark.size());
    if (!text.empty() && !text.ends_with('\n'))
        text += '\n';
    return text;
}

Answer Call_Library(const Conversion& conversion)
{
    const std::string stem = Stem_Of(conversion);
    Answer answer;
    if (!Write_Lists(conversion) || !Write_Pass_File(conversion, stem + ".inp"))
        return answer;
    {
        const Progress_Line progress(!conversion.options.quiet);
        INGESTER("", "", 0, 0);
    }
    answer.status = Read_Status(stem + ".out");
    answer.messages = With_Native_Names(Read_Messages(stem + ".ERR"), conversion.input, conversion.output);
    return answer;
}

/// The file that a conversion cut short may leave behind: a new output, or the copy beside an old
/// one. Empty when a file of that name was there before.
std::string Unfinished_File(const Sent_Name& output)
{
    const bool packed = Name_Inside_Packing(output.request) != output.request;
    std::string name = packed                        ? With_Extension(output.request, ".gz$")
                       : File_Exists(output.request) ? With_Extension(output.request, ".$$$")
                                                     : output.request;
    if (File_Exists(name))
        name.clear();
    return name;
}

/// A request that only rewrites lines ends with the status of a table without rows, whatever has happened.
void Settle_Rewriting(const Conversion& conversion, Answer& answer)
{
    const std::int32_t fields = Options_Rewrite_Lines(conversion.options.output_options);
    if (fields < 1 || answer.status != INGESTER_NO_ROWS)
        return;
    const bool written = answer.messages.find("Output file not written.") == std::string::npos;
    answer.status = written                                 ? INGESTER_SUCCESS
                    : File_Exists(conversion.input.request) ? INGESTER_OUTPUT_FAILED
                                                            : INGESTER_INPUT_UNREADABLE;
    if (written)
        Say(conversion.output.native,
            Format_Text("lines were joined until they held %li fields", static_cast<long>(fields)));
}

Answer Convert(const Conversion& conversion)
{
    const std::string unfinished = Unfinished_File(conversion.output);
    Remove_On_Signal(unfinished);
    Answer answer = Call_Library(conversion);
    Settle_Rewriting(conversion, answer);
    if (!answer.Is_Good() && !unfinished.empty())
        Delete_File(unfinished);
    Remove_On_Signal({});
    return answer;
}

/// The library's own words, and a sentence of ours when they don't say which file they are about.
void Tell_Answer(const Conversion& conversion, const Answer& answer)
{
    std::fwrite(answer.messages.data(), 1, answer.messages.size(), stderr);
    if (answer.status == INGESTER_SUCCESS)
        return;
    Status_Sentence told{answer.status, Blamed::request, "the library gave a status of unknown meaning"};
    for (const Status_Sentence& row : Status_Sentences)
        if (row.status == answer.status)
            told = row;
    const std::string& about =
        told.blamed == Blamed::output ? conversion.output.native : conversion.input.native;
    if (answer.messages.find(about) == std::string::npos)
        Say(about, told.sentence);
}

/// A list that was made for the user to fill in comes to stand beside the input, where the next run finds it.
void Hand_Over_Column_List(const Conversion& conversion)
{
    const std::string made = Change_List_Name(conversion);
    const std::string beside = With_Extension(Request_Path(conversion.options.input), ".VAR");
    if (!conversion.lists.changes.empty() || conversion.From_Standard_Input() || Is_Url(beside)
        || !File_Exists(made) || File_Exists(beside))
        return;
    Say(Native_Path(beside), Copy_File(made, beside)
                                 ? "lists the names of the columns; change them there and convert again"
                                 : "the list of columns could not be written");
}

}  // namespace

int Run_Command(const Command_Options& options)
{
    Start_Host_Process();
    Private_Folder folder;
    if (!folder.Make()) {
        Say(Native_Path(Get_Temp_Folder()),
            "no temporary folder can be made here; set TMPDIR to a folder that you can write to");
        return INGESTER_NO_REQUEST;
    }
    std::string fault;
    Conversion conversion{options,
                          Name_Of(options.input, "standard input", folder.Name() + Standard_Input_Name),
                          Name_Of(options.output, "standard output", folder.Name() + Standard_Output_Name),
                          folder.Name(), Make_Lists(options.chosen, fault)};
    if (!fault.empty())
        std::fprintf(stderr, "ingester: %s\nRun with --help for more information.\n", fault.c_str());
    if (!fault.empty() || !Request_Can_Carry(conversion) || !Output_Makes_Sense(conversion)
        || !Change_List_Is_Free(conversion))
        return Usage_Error;
    if (options.dry_run) {
        Print_Request(conversion);
        return INGESTER_SUCCESS;
    }
    if (!Output_May_Be_Written(conversion) || !Report_May_Be_Written(options))
        return INGESTER_OUTPUT_FAILED;
    if (conversion.From_Standard_Input() && !Copy_Standard_Input(conversion.input.request)) {
        Say(conversion.input.native, "could not be read to its end and kept in the temporary folder");
        return INGESTER_INPUT_UNREADABLE;
    }
    if (!options.merge_keys.empty() && !Put_Merge_Keys(conversion, folder.Name())) {
        Say(conversion.input.native, "the keys of the merge could not be kept in the temporary folder");
        return INGESTER_MERGE_FAILED;
    }
    sheet_viewer = Viewer_Of(options);
    const Answer answer = Convert(conversion);
    Tell_Answer(conversion, answer);
    if (answer.Is_Good())
        Hand_Over_Column_List(conversion);
    const bool written = answer.status == INGESTER_SUCCESS || File_Exists(conversion.output.request);
    if (conversion.To_Standard_Output() && answer.Is_Good() && written && !sheet_viewer
        && !Copy_To_Standard_Output(conversion.output.request)) {
        Say(conversion.output.native, "could not be written to its end");
        return INGESTER_OUTPUT_FAILED;
    }
    return answer.status;
}

}  // namespace ingester

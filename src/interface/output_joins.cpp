#include "interface/output_joins.h"

#include "interface/file_detection.h"
#include "interface/format_drivers.h"
#include "model/join/append.h"
#include "model/join/concatenate.h"
#include "model/join/merge.h"
#include "platform/files.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"

#include <algorithm>
#include <utility>

namespace ingester {

namespace {

/// Reads with options of its own in the place of those of the request's input, and puts these back.
class Output_Reading {
public:
    Output_Reading() : asked_(request)
    {
        Request_Globals own;
        static_cast<Lasting_Globals&>(own) = asked_;
        own.settings = asked_.settings;
        own.people = asked_.people;
        own.Scratch_Stem = asked_.Scratch_Stem;
        own.Max_Columns = asked_.Max_Columns;
        own.Worksheet_Name = asked_.Update_Sheet_Name;
        own.Names_Kept_As_They_Stand = asked_.Names_Kept_As_They_Stand;
        // As an output of these options was written before:
        if (!asked_.Missing_Text.empty())
            own.Missing_Input_Text = asked_.Missing_Text.view();
        own.No_Names = asked_.Omit_Header;
        own.Names_Given = asked_.Names_Given && !asked_.Omit_Header;
        request = std::move(own);
    }
    Output_Reading(const Output_Reading&) = delete;
    Output_Reading& operator=(const Output_Reading&) = delete;
    ~Output_Reading()
    {
        const Settings settings = request.settings;  // counters go on
        asked_.Out_Of_Memory = asked_.Out_Of_Memory || request.Out_Of_Memory;
        asked_.losses.Add(request.losses);
        request = std::move(asked_);
        request.settings = settings;
    }

private:
    Request_Globals asked_;
};

/// Only a text in columns of fixed width can lose its cells' places.
bool Cells_Have_Shifted(const std::string& path)
{
    Input_File file;
    return Is_Fixed_Width_Text(Output_Driver_Of(path)) && file.Open(path) && !Fields_Stand_In_Columns(file);
}

/// The Sheet in an existing output becomes the `Current_Sheet`. `refused` when it lacks a part of the file,
/// which the result would replace.
Request_Status Read_Output(const std::string& path, Request_Status refused)
{
    const Output_Reading reading;
    Current_Sheet = nullptr;
    const std::int32_t type = Detect_File_Type(path);
    switch (type) {
    case unreadable_file:
        return Request_Status::input_unreadable;
    case unknown_file:
        return Request_Status::input_unknown;
    case zip_file:
        return Request_Status::zip_unsupported;
    default:
        break;
    }
    if (!Read_Data_File(path, type, path) || Current_Sheet == nullptr)
        return Request_Status::no_data;
    if (request.losses.Barred().empty() && Cells_Have_Shifted(path))
        request.losses.Bar_Replacing(
            "texts with blanks, or empty ones, have put its cells out of their columns");
    if (!request.losses.Barred().empty()) {
        Report_Message_Text("Error: The output was left as it is, since %s.\n",
                            request.losses.Barred().c_str());
        return refused;
    }
    return Request_Status::success;
}

/// Keys by their names; those without one stand at the head.
struct Key_Names {
    std::string target;
    std::string source;
};

Key_Names Names_Of_Key(std::size_t key)
{
    Key_Names names;
    if (key < request.Merge_Keys.size())
        names = {request.Merge_Keys[key], request.Merge_With_Keys[key]};
    else if (key == 0 && request.Merge_Keys.empty())
        names = {std::string(request.Merge_Key), std::string(request.Merge_With)};
    if (names.source.empty())
        names.source = names.target;
    return names;
}

Column* Find_Key(Sheet* sheet, const std::string& name, std::size_t key)
{
    return name.empty() ? Column_At(sheet, static_cast<std::int32_t>(key) + 1) : Find_Column(sheet, name);
}

bool Find_Keys(Merge_Request& wanted, const std::string& path)
{
    for (std::size_t key = 0; key < static_cast<std::size_t>(wanted.key_count); ++key) {
        const Key_Names names = Names_Of_Key(key);
        wanted.target_keys[key] = Find_Key(wanted.target, names.target, key);
        if (wanted.target_keys[key] == nullptr)
            return !names.target.empty()
                   && Fail("Merge key %s in WITH not found in OUTFILE.\n", names.target.c_str());
        wanted.source_keys[key] = Find_Key(wanted.source, names.source, key);
        if (wanted.source_keys[key] == nullptr)
            return !names.source.empty()
                   && Fail("Merge key %s in MATCH not found in %s.\n", names.source.c_str(), path.c_str());
    }
    return true;
}

}  // namespace

Request_Status Concatenate_With_Output(Sheet* sheet, const std::string& path)
{
    if (const Request_Status status = Read_Output(path, Request_Status::concatenate_failed);
        status != Request_Status::success)
        return status;
    if (sheet->column_count < 1)
        return Request_Status::no_data;
    return Concatenate_Sheets(Current_Sheet, sheet, request.Unique_Rows) ? Request_Status::success
                                                                         : Request_Status::concatenate_failed;
}

Request_Status Append_To_Output(Sheet* sheet, const std::string& path)
{
    if (const Request_Status status = Read_Output(path, Request_Status::nothing_selected);
        status != Request_Status::success)
        return status;
    const Append_Request wanted{.source = sheet,
                                .by_name = request.Keep_Sorted,
                                .source_column_name = request.Merge_Key,
                                .new_label = request.Merge_With.view()};
    return Append_Sheet(Current_Sheet, wanted) ? Request_Status::success : Request_Status::nothing_selected;
}

Request_Status Merge_With_Output(Sheet* sheet, const std::string& path)
{
    if (const Request_Status status = Read_Output(path, Request_Status::merge_failed);
        status != Request_Status::success)
        return status;
    Merge_Request wanted;
    wanted.target = Current_Sheet;
    wanted.source = sheet;
    wanted.key_count = std::clamp(request.Merge_Key_Count, 1, Most_Asked_Keys);
    wanted.update_columns = request.Unique_Rows;
    wanted.fill_mode = request.Merge_Fill;
    Sheet* const joined = Current_Sheet;
    const bool merged = Find_Keys(wanted, path) && Merge_Sheets(wanted);
    Current_Sheet = joined;
    return merged ? Request_Status::success : Request_Status::merge_failed;
}

}  // namespace ingester

#include "interface/slash_options.h"

#include "interface/option_values.h"
#include "platform/folders.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <cstdint>

namespace ingester {

namespace {

/// Digits at `at`, as a number; `at` moves behind them. Nothing for none.
bool Take_Digits(std::string_view text, std::size_t& at, std::int32_t& number)
{
    const std::size_t start = at;
    while (at < text.size() && Is_Digit(text[at]))
        ++at;
    if (at > start)
        number =
            static_cast<std::int32_t>(std::min(Leading_Integer(text.substr(start, at - start)), 2147483647L));
    return at > start;
}

/// "=n" behind a key that may stand alone; digits without a "=" belong to the name.
template <auto Flag, auto Number> Taken Take_Flag_And_Number(std::string_view text, std::size_t at)
{
    request.*Flag = true;
    if (!Stands_At(text, at, "="))
        return at;
    Take_Digits(text, ++at, request.*Number);
    return at;
}

// --- Input -------------------------------------------------------------------------------------

/// Without a value the map stands beside the input: its name up to the first option, with ".map".
Taken Take_Map_File(std::string_view text, std::size_t at)
{
    request.Qtl_Map_Given = true;
    if (!Stands_At(text, at, "=")) {
        const std::string_view name = Up_To(text, 0, Option_Start).text;
        request.Qtl_Map_File = With_Extension(Trim_Copy(name), ".map");
        return at;
    }
    const Option_Value value = Quoted_Or_Bare(text, at + 1, Quotes, Option_Start);
    request.Qtl_Map_File = value.text;
    return value.end;
}

Taken Take_Delete_Marker(std::string_view text, std::size_t at)
{
    const Option_Value value = Up_To(text, at, Option_Start);
    if (const long number = Leading_Integer(value.text); number > 0)
        request.Return_Delete_Marker = Format_Text("T%liD", number);
    return value.end;
}

Taken Take_Fixed_Lines(std::string_view text, std::size_t at)
{
    constexpr std::size_t most_digits = 10;
    std::size_t end = at;
    Take_Digits(text.substr(0, std::min(text.size(), at + most_digits)), end, request.Fixed_Lines);
    return end;
}

Taken Take_Lines_Per_Record(std::string_view text, std::size_t at)
{
    if (!Stands_At(text, at, "="))
        return at;
    const Option_Value value = Up_To(text, at + 1, Option_Start);
    const long lines = Leading_Integer(value.text);
    if (lines < 1)
        Report_Message_Long("CSV number of lines per record (%li) is invalid.\n", lines);
    request.Lines_Per_Record = static_cast<std::int32_t>(std::clamp(lines, 1L, 2147483647L));
    return value.end;
}

/// "first:last"; an end left out stays as it was.
Taken Take_Column_Range(std::string_view text, std::size_t at)
{
    constexpr std::size_t most_characters = 100;
    const Option_Value value = Up_To(text, Behind_Equals(text, at), Option_Start);
    const std::string_view range = value.text.substr(0, most_characters);
    const std::size_t colon = range.find(':');
    std::size_t digits = std::min(range.find_first_of("0123456789"), range.size());
    if (digits < colon)
        Take_Digits(range, digits, request.First_Column);
    if (colon != std::string_view::npos) {
        digits = std::min(range.find_first_of("0123456789", colon), range.size());
        Take_Digits(range, digits, request.Last_Column);
    }
    return value.end;
}

/// Up to three codes with commas between them: numbers, or "*".
Taken Take_Missing_Codes(std::string_view text, std::size_t at)
{
    const Option_Value value = Up_To(text, Behind_Equals(text, at), Option_Start);
    std::string_view rest = value.text;
    auto& codes = request.Instat_Missing_Codes;
    auto& count = request.Instat_Missing_Code_Count;
    for (count = 0; !rest.empty() && count < static_cast<std::int32_t>(codes.size()); ++count) {
        const std::size_t comma = std::min(rest.find(','), rest.size());
        double number;
        if (!Whole_Number_Text(Trim_Copy(rest.substr(0, comma)), number))
            number = Star_Code;
        codes[static_cast<std::size_t>(count)] = number;
        rest.remove_prefix(std::min(comma + 1, rest.size()));
    }
    return value.end;
}

Taken Take_Title_Row(std::string_view text, std::size_t at)
{
    request.Use_Title_Row = true;
    if (!Stands_At(text, at, "="))
        return at;
    if (Stands_At(text, ++at, "$")) {
        request.Title_Row_Absolute = true;
        ++at;
    }
    Take_Digits(text, at, request.Title_Row);
    return at;
}

template <auto Member> Taken Take_Prefix(std::string_view text, std::size_t at)
{
    if (!Stands_At(text, at, "="))
        return at;
    const Option_Value value = Up_To(text, at + 1, Option_Start);
    Get_Settings().*Member = value.text;
    return value.end;
}

Taken Take_Column_Prefix(std::string_view text, std::size_t at)
{
    Get_Settings().prefix_given = Stands_At(text, at, "=");
    return Take_Prefix<&Settings::column_prefix>(text, at);
}

Taken Take_Transpose(std::string_view text, std::size_t at)
{
    request.Transpose = true;
    const std::size_t mark = Behind_Equals(text, at);
    if (!Stands_At(text, mark, "N"))
        return mark;
    request.Transpose_Names = false;
    return mark + 1;
}

/// One digit, at most 4.
Taken Take_Text_Number_Mode(std::string_view text, std::size_t at)
{
    if (!Stands_At(text, at, "="))
        return at;
    const std::size_t digit = at + 1;
    if (!Stands_At(text, digit, "0123456789"))
        return digit;
    request.Text_Number_Mode = std::min(text[digit] - '0', 4);
    return digit + 1;
}

Taken Take_Rest_As_Pointer(std::string_view text, std::size_t at)
{
    request.Pointer_Name = Trim_Copy(text.substr(at));
    return text.size();
}

constexpr bool Of_Some_Readers = true;

constexpr Slash_Option Genotype_Table[] = {
    {"/rqtl", Set<&R::Qtl_Request, true>, "genotype files may be read", Flag("qtl")},
    {"/map", Take_Map_File, "map file of a genotype file", {"map", Value_Form::path, "FILE"}},
};

constexpr Slash_Option Input_Table[] = {
    {"/x=", Take_Text<&R::Missing_Input_Text>, "text that means missing"},
    {"/g=", Take_Delete_Marker, "version number in the host's scratch names"},
    {"/lt=", Take_Fixed_Lines, "lines to skip in front of one line that is read as a column",
     Bare("one-record-after", "N"), Of_Some_Readers},
    {"/a", Set<&R::Keep_Probe_Statistics, false>, "leave out statistics of microarray probes",
     Flag("no-probe-statistics"), Of_Some_Readers},
    {"/b", Set_Setting<&Settings::trim_cells, 0>, "texts keep their outer blanks", Flag("keep-blanks")},
    {"/csv", Take_Lines_Per_Record, "lines that make one record of a text", Bare("lines-per-record", "N"),
     Of_Some_Readers},
    {"/c", Take_Column_Range, "columns to keep, first:last", Range("columns", "FIRST:LAST")},
    {"/db", Set<&R::Print_Summary, true>, "print a summary of the columns", Flag("print-summary")},
    {"/m", Take_Missing_Codes, "up to three numbers that mean missing", Bare("missing-codes", "A,B,C"),
     Of_Some_Readers},
    {"/d", Take_Title_Row, "row of column descriptions in a grid", Optional("description-row", "[$]N"),
     Of_Some_Readers},
    {"/f", Set<&R::Keep_Long_Labels, true>, "keep long factor labels", Flag("keep-long-labels"),
     Of_Some_Readers},
    {"/h", Take_Prefix<&Settings::header_prefix>, "prefix of a name made from a number",
     Bare("header-prefix", "TEXT")},
    {"/o", Take_Column_Prefix, "prefix of automatic column names", Bare("column-prefix", "TEXT")},
    {"/k", Set<&R::Keep_Empty_Columns, true>, "keep empty columns", Flag("keep-empty-columns")},
    {"/l", Take_Flag_And_Number<&R::Log_Book, &R::Log_Book_Range>, "the grid is a log book",
     Optional("log-book", "N"), Of_Some_Readers},
    {"/n", Set<&R::No_Names, true>, "there is no row of names", Flag("no-names"), Of_Some_Readers},
    {"/#", Set_Setting<&Settings::bracket_names, 0>, "keep quoted suffixes of names as text",
     Flag("text-suffixes")},
    {"/y",
     Take_Flag_And_Number<&R::Names_Given, &R::Names_Row>,
     "there is a row of names",
     {},
     Of_Some_Readers},
    {"/tr", Take_Transpose, "transpose; N: without names", Optional("transpose", "N")},
    {"/t", Take_Text_Number_Mode, "how texts become numbers, 0 to 4", Bare("text-numbers", "MODE")},
    {"/i", Set_Setting<&Settings::ignore_value_case, 1>,
     "labels differ in more than case; values that users declared missing are kept",
     Flag_Of_Two_Names("ignore-label-case", "keep-user-missing"), Of_Some_Readers},
    {"/r", Set<&R::Add_Unused_Labels, true>, "labels that no row has become levels as well",
     Flag("unused-labels"), Of_Some_Readers},
    {"/u", Set_Setting<&Settings::auto_factors, 0>, "factor levels stay in the order of the data",
     Flag("levels-as-found")},
    {"/v", Set<&R::Use_Var_File, true>, "rename and retype columns by a list file", Flag("column-list")},
    {"/w", Set<&R::List_Sheets_Only, true>, "only list the sheets", Flag("list-sheets")},
    {"/s", Take_Text<&R::Start_Text, true>, "data begin at the line that starts so", Quoted("start", "TEXT"),
     Of_Some_Readers},
    {"/e", Take_Text<&R::End_Text, true>, "data end before the line that starts so", Quoted("end", "TEXT"),
     Of_Some_Readers},
    {"/z=", Take_Text<&R::Custom_Separators>, "separators of fields", Quoted("separators", "TEXT"),
     Of_Some_Readers},
    {"/p=", Take_Rest_As_Pointer, "name of a pointer to the columns", Bare("pointer", "NAME")},
};

// --- Output ------------------------------------------------------------------------------------

Taken Take_Missing_Text(std::string_view text, std::size_t at)
{
    const Option_Value value = Quoted_Or_Bare(text, at, "'", Option_Start);
    request.Missing_Text = value.text;
    request.Missing_Text_Given = true;
    return value.end;
}

Taken Take_Add(std::string_view text, std::size_t at)
{
    request.Add_To_Output = true;
    const Taken end = Take_Name<&R::Output_Sheet_Name>(text, Behind_Equals(text, at));
    request.Add_Sheet_Given = !request.Output_Sheet_Name.empty();
    return end;
}

/// The same name, when "/a" gave none.
Taken Take_Sheet_Name(std::string_view text, std::size_t at)
{
    const Option_Value value = Quoted_Or_Bare(text, at, Quotes, Name_End);
    if (request.Output_Sheet_Name.empty())
        request.Output_Sheet_Name = value.text;
    return value.end;
}

Taken Take_Replace(std::string_view text, std::size_t at)
{
    request.Add_To_Output = true;
    request.Replace_Sheet_Asked = true;
    return Take_Name<&R::Output_Sheet_Name>(text, Behind_Equals(text, at));
}

template <std::int32_t justify> Taken Take_Justify(std::string_view, std::size_t at)
{
    request.Table_Justify = justify;
    return at;
}

Taken Take_Packed(std::string_view, std::size_t at)
{
    request.Packed_Csv_Output = true;
    request.Allow_HTML = true;
    return at;
}

Taken Take_Log_Book_Lines(std::string_view text, std::size_t at)
{
    request.Log_Book_Output = true;
    return Take_Number<&R::Log_Book_Lines>(text, at);
}

Taken Take_Matrix(std::string_view text, std::size_t at)
{
    request.Output_Matrix = true;
    if (!Stands_At(text, at, "="))
        return at;
    const Option_Value value = Up_To(text, at + 1, Option_Start);
    request.Output_Matrix_Name = Trim_Copy(value.text);
    return value.end;
}

Taken Take_No_Header(std::string_view, std::size_t at)
{
    Get_Settings().csv_title = 0;
    request.Omit_Header = true;
    return at;
}

Taken Take_Script_Version(std::string_view text, std::size_t at)
{
    const Taken end = Take_Number<&R::Script_Version>(text, at);
    request.Script_Version = std::clamp(request.Script_Version, 1, 3);
    return end;
}

/// Bare keys end at "/", blank or ",".
std::string_view Take_Key(std::string_view text, std::size_t& at)
{
    const Option_Value value = Quoted_Or_Bare(text, at, Quotes, "/ ,");
    at = value.end;
    return value.text;
}

Taken Take_Append(std::string_view text, std::size_t at)
{
    request.Add_Mode = Add_Modes::append;
    if (Stands_At(text, at, "=") && Stands_At(text, ++at, "N")) {
        request.Keep_Sorted = false;
        ++at;
    }
    if (!Stands_At(text, at, ","))
        return at;
    request.Merge_Key = Take_Key(text, ++at);
    if (Stands_At(text, at, ","))
        request.Merge_With = Take_Key(text, ++at);
    return at;
}

Taken Take_Concatenate(std::string_view text, std::size_t at)
{
    request.Add_Mode = Add_Modes::concatenate;
    if (!Stands_At(text, at, "U"))
        return at;
    request.Unique_Rows = true;
    return at + 1;
}

Taken Take_Source_Key(std::string_view text, std::size_t at)
{
    request.Add_Mode = Add_Modes::concatenate;
    request.Source_Key_Given = true;
    request.Merge_Key = Take_Key(text, at);
    if (Stands_At(text, at, ","))
        request.Merge_With = Take_Key(text, ++at);
    return at;
}

Taken Take_Merge(std::string_view text, std::size_t at)
{
    request.Add_Mode = Add_Modes::merge;
    if (!Stands_At(text, at, "="))
        return at;
    if (Stands_At(text, ++at, "0123456789"))
        request.Merge_Key_Count = text[at++] - '0';
    if (Stands_At(text, at, "U")) {
        request.Unique_Rows = true;
        ++at;
    }
    if (Stands_At(text, at, "NM")) {
        const bool first = (text[at++] == 'N') != request.Unique_Rows;
        request.Merge_Fill = first ? 0 : 1;
    }
    return at;
}

Taken Take_No_Effect(std::string_view, std::size_t at)
{
    return at;
}

constexpr Slash_Option Output_Table[] = {
    {"/mv=", Take_Missing_Text, "how a missing value prints", Quoted_Or_Empty("write-missing", "TEXT")},
    {"/av", Set<&R::Write_Via_Temp, false>, "write over an existing output directly", Flag("write-in-place")},
    {"/*", Set<&R::No_Return, true>, "no RETURN in the script", Flag("no-return")},
    {"/a", Take_Add, "add the sheet to an existing book, under this name", Quoted("add-sheet", "NAME")},
    {"/x=", Take_Sheet_Name, "name of the sheet", Quoted("sheet-name", "NAME")},
    {"/b", Set<&R::End_With_Break, true>, "the script ends with ENDBREAK", Flag("end-with-break")},
    {"/c", Set<&R::Keep_As_Columns, false>, "images and sound in one piece", Flag("images-whole")},
    {"/d", Set<&R::Use_Formats, true>, "numbers print by their columns' formats", Flag("use-formats")},
    {"/e", Set_Setting<&Settings::delete_empty_rows, 0>, "keep empty rows", Flag("keep-empty-rows")},
    {"/f", Set<&R::Fixed_Number_Text, true>, "decimals are found from the data", Flag("find-decimals")},
    {"/g", Set<&R::Table_Grid, true>, "grid lines in tables of pages", Flag("grid")},
    {"/h", Take_Packed, "comma text without padding"},
    {"/i", Set<&R::Excel_Dates_As_Text, true>, "dates as text in workbooks", Flag("dates-as-text")},
    {"/jl", Take_Justify<0>, "tables of pages at the left", Flag("justify-left")},
    {"/jr", Take_Justify<1>, "tables of pages at the right", Flag("justify-right")},
    {"/jc", Take_Justify<2>, "tables of pages in the middle", Flag("justify-centre")},
    {"/l=", Take_Log_Book_Lines, "lines of a log book", Bare("log-book-lines", "N")},
    {"/m", Take_Matrix, "a table of numbers goes out as a Matrix", Optional("matrix", "NAME")},
    {"/n", Take_No_Header, "no line of names", Flag("no-header")},
    {"/o", Set<&R::Replace_Book_Data, true>, "replace the data of a sheet in a book", Flag("replace-data")},
    {"/p", Set<&R::Write_Var_List, true>, "write a list of the columns beside the output",
     Flag("write-column-list")},
    {"/q", Set<&R::Quiet_Read, true>, "the script reads without printing", Flag("quiet-read")},
    {"/r", Take_Replace, "replace the sheet of this name", Quoted("replace-sheet", "NAME")},
    {"/s", Take_No_Effect, "no effect"},
    {"/-", Set_Setting<&Settings::csv_quote_text, 0>, "texts without quotes", Flag("no-quotes")},
    {"/t", Set<&R::R_Text_Output, true>, "R data in their text form", Flag("r-text")},
    {"/u", Set<&R::No_Name_Marks, true>, "no type marks behind names", Flag("no-name-marks")},
    {"/v=", Take_Script_Version, "version of the script language"},
    {"/w", Set<&R::Table_Look, true>, "workbooks with a table's look", Flag("table-look")},
    {"/z", Set_Setting<&Settings::csv_title, 0>, "no title line in fixed-width text", Flag("no-title")},
    {"/.", Set<&R::R_Dot_Names, true>, "no effect"},
    {"/7", Set<&R::Excel_97, true>, "workbooks of the 1997 form", Flag("excel-97")},
    {"/!=", Take_Name<&R::Merge_Sheet_Name>, "sheet of the output that is updated",
     Quoted("update-sheet", "NAME")},
    {"/@", Take_Append, "append to the existing output; KEY: a Factor that tells where rows came from",
     Optional("append", "KEY[,WITH]", ",")},
    {"/&", Take_Concatenate, "put columns behind those of the existing output; U: replace equal names",
     Optional("concatenate", "U", "")},
    {"/^", Take_Source_Key, "the same, with a column that names the source",
     Bare("concatenate-source", "KEY[,WITH]", "")},
    {"/%", Take_Merge, "merge with the existing output: number of keys, U, N or M"},
};

static_assert(No_Key_Hides_A_Later_One(Genotype_Table));
static_assert(No_Key_Hides_A_Later_One(Input_Table));
static_assert(No_Key_Hides_A_Later_One(Output_Table));

}  // namespace

std::span<const Slash_Option> Genotype_Options()
{
    return Genotype_Table;
}

std::span<const Slash_Option> Input_Options()
{
    return Input_Table;
}

std::span<const Slash_Option> Output_Options()
{
    return Output_Table;
}

std::vector<std::string_view> Cut_Options(std::span<const Slash_Option> options, std::string& text)
{
    std::vector<std::string_view> found;
    for (const Slash_Option& option : options) {
        const std::size_t start = text.find(option.key);
        if (start == std::string::npos)
            continue;
        const std::size_t end = option.take(text, start + option.key.size());
        found.push_back(option.key);
        text.erase(start, end - start);
    }
    text = std::string(Trim_Copy(text));
    return found;
}

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

}  // namespace ingester

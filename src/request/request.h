// The globals of one request: what the call asked for, as every floor may read it.
#pragma once

#include "request/input_facts.h"
#include "request/losses.h"
#include "request/people_rules.h"
#include "request/settings.h"
#include "support/fixed_text.h"

#include <array>
#include <bitset>
#include <cstdint>
#include <memory>
#include <optional>
#include <string>
#include <vector>

namespace ingester {

struct Text_Dialect;

/// How the result is joined with an existing output.
enum class Add_Modes : std::int32_t { none = 0, append = 1, concatenate = 2, merge = 3 };

/// Column limit of outputs without one of their own, and that of books, the greatest.
constexpr std::int32_t Default_Max_Columns = 50000;
constexpr std::int32_t Book_Max_Columns = 10000000;

/// Among the missing codes: what is missing already.
constexpr double Star_Code = -1e307;

/// Widths of the strings that a host hands over.
constexpr std::size_t Long_Name_Width = 1120;
constexpr std::size_t Short_Name_Width = 280;

/// The last column of a range without an end.
constexpr std::int32_t Every_Column = 2147483647;

/// What one request leaves to the next in the same process: the host counts on it.
struct Lasting_Globals {
    std::int32_t Text_Number_Mode = 3;  ///< how texts become numbers, 0 to 4
    bool Keep_As_Columns = true;        ///< images and sound become columns
    std::int32_t Made_Up_Factors = 0;   ///< that scripts have named: none meets one of an earlier script
};

/// Everything else a request sets. A fresh value is assigned at the start of each, so nothing lingers.
struct Request_Globals : Lasting_Globals {
    bool Out_Of_Memory = false;             ///< some cells were not made, which has been told
    std::bitset<People_Rule_Count> people;  ///< the rules for people that were asked for
    bool Strict = false;                    ///< a loss makes the request fail
    Fixed_Text<Long_Name_Width> Loss_Report_Name;
    Fixed_Text<Long_Name_Width> Named_Secondary_File;  ///< by an option, beside lists of the pass file
    Fixed_Text<60> Input_Encoding;   ///< the code of the input's letters, as it was declared
    Fixed_Text<60> Output_Encoding;  ///< the code of texts that are written; empty: that of all letters
    bool Write_Marks = false;        ///< types are told behind names, and missing is "*"
    bool Write_Crlf = false;
    char Write_Separator = '\0';   ///< of comma text that was there before; NUL: a comma
    bool Write_Code_Mark = false;  ///< the mark of Unicode comes first

    // What people tell of a text, which is found from its lines otherwise.
    Fixed_Text<20> Told_Separators;          ///< as `Custom_Separators`
    std::optional<char> Told_Quote;          ///< around texts; NUL: none
    char Told_Decimal = '\0';                ///< NUL: not told
    std::int32_t Told_Names_Lines = -1;      ///< below 0: not told
    std::int64_t Told_Skipped_Lines = -1;    ///< lines at the head that are passed over; below 0: not told
    std::int32_t Told_Table = 0;             ///< which of several tables; 0: not told
    std::vector<std::string> Missing_Words;  ///< that mean missing; empty: the usual ones

    // From the pass file.
    Fixed_Text<Short_Name_Width> Worksheet_Name;
    Fixed_Text<Short_Name_Width> Cell_Range;
    Fixed_Text<Long_Name_Width> Secondary_File;
    Add_Modes Add_Mode = Add_Modes::none;
    bool Subset_Columns = false;
    bool Subset_Rows = false;
    std::vector<std::string> Subset_Names;  ///< names, or column numbers as text
    std::int32_t Subset_Name_Count = 0;
    bool Subset_By_Number = false;               ///< the list holds numbers, not variables' names
    std::vector<std::int32_t> Subset_Row_Flags;  ///< one per input row: 0 drops it
    std::int32_t Subset_Row_Count = 0;
    Fixed_Text<60> Scratch_Stem;

    // What the stages find out.
    Fixed_Text<Long_Name_Width> Current_File_Name;  ///< the file messages speak of
    Fixed_Text<Long_Name_Width> Source_Url;         ///< where a fetched input came from
    Fixed_Text<Short_Name_Width> Source_Base_Name;  ///< input name without folder and extension
    Fixed_Text<Short_Name_Width> Used_Sheet_Name;   ///< the sheet really read
    bool Sheet_Name_Was_Exact = false;
    bool Columns_Were_Selected = false;  ///< by the reader: the Sheet holds those of the subset only
    bool Rows_Were_Selected = false;     ///< the same of the rows
    std::int32_t Content_Code = 0;       ///< the type of what was read, inside its compression
    Loss_Ledger losses;                  ///< what could not be kept
    Input_Facts input_facts;             ///< what the reader found of the file's form
    std::shared_ptr<const Text_Dialect> Found_Text_Dialect;  ///< of the text that was read
    std::vector<std::int32_t> Column_Wanted_Types;  ///< by column: 2 Factor, 4 Variate, 3 Text, 0 any
    std::int64_t Column_Wanted_Count = 0;           ///< of the list's lines, as it says; 0 where it doesn't
    std::vector<std::string> Column_Wanted_Names;   ///< whose types they are; empty: by place
    bool Dates_From_1904 = false;                   ///< the dates of what was read count from then
    std::int32_t Max_Columns = Default_Max_Columns;
    Fixed_Text<60> Return_Delete_Marker = "T181D";  ///< starts the host's scratch names
    bool Names_Kept_As_They_Stand = false;          ///< `Make_Valid_Name` leaves names alone
    bool Number_Warnings_Begun = false;    ///< the title over texts that were read as numbers is written
    bool Date_Warnings_Begun = false;      ///< the same for dates
    std::int32_t Current_Date_Form = 0;    ///< of dates that have no Column, as `Column::date_form`
    std::int32_t Current_Date_Format = 1;  ///< their display code

    // Input options.
    std::vector<std::string_view> Input_Keys_Given;  ///< keys of the options that were taken; they live on
    bool Qtl_Request = false;
    bool Qtl_Map_Given = false;
    Fixed_Text<Short_Name_Width> Qtl_Map_File;
    Fixed_Text<80> Missing_Input_Text = "*";
    std::int32_t Fixed_Lines = -1;
    bool Keep_Probe_Statistics = true;
    std::int32_t Lines_Per_Record = 1;
    std::int32_t First_Column = 0;
    std::int32_t Last_Column = Every_Column;
    bool Print_Summary = false;
    std::array<double, 3> Instat_Missing_Codes{};  ///< `Star_Code` for "*"
    std::int32_t Instat_Missing_Code_Count = 0;
    bool Use_Title_Row = false;
    bool Title_Row_Absolute = false;
    std::int32_t Title_Row = 0;
    bool Keep_Long_Labels = false;
    bool Keep_Empty_Columns = false;
    bool Log_Book = false;
    std::int32_t Log_Book_Range = 0;
    bool No_Names = false;
    bool Names_Given = false;
    std::int32_t Names_Row = 0;
    bool Transpose = false;
    bool Transpose_Names = true;
    bool Add_Unused_Labels = false;
    bool Use_Var_File = false;
    Fixed_Text<Long_Name_Width> Var_File_Name;
    bool List_Sheets_Only = false;
    Fixed_Text<80> Start_Text;
    Fixed_Text<80> End_Text;
    Fixed_Text<20> Custom_Separators;
    Fixed_Text<60> Pointer_Name;
    Fixed_Text<Short_Name_Width> Date_Base_Text;
    Fixed_Text<Short_Name_Width> Title_Text;  ///< printed by the host in front of a script's data

    // Output options.
    Fixed_Text<90> Missing_Text = "*";
    bool Missing_Text_Given = false;
    bool Write_Via_Temp = true;
    bool No_Return = false;
    bool Add_To_Output = false;
    bool Add_Sheet_Given = false;  ///< `/a` came with a name
    Fixed_Text<Short_Name_Width> Output_Sheet_Name;
    bool End_With_Break = false;
    bool Use_Formats = false;
    bool Fixed_Number_Text = false;
    bool Table_Grid = false;
    bool Packed_Csv_Output = false;
    bool Allow_HTML = false;
    bool Excel_Dates_As_Text = false;
    std::int32_t Table_Justify = 0;
    bool Log_Book_Output = false;
    std::int32_t Log_Book_Lines = 0;
    bool Output_Matrix = false;
    Fixed_Text<60> Output_Matrix_Name;
    bool Omit_Header = false;
    bool Replace_Book_Data = false;
    bool Write_Var_List = false;
    bool Quiet_Read = false;
    bool Replace_Sheet_Asked = false;
    bool R_Text_Output = false;
    bool No_Name_Marks = false;
    std::int32_t Script_Version = 3;
    bool Table_Look = false;
    bool R_Dot_Names = false;
    bool Excel_97 = false;
    bool CSV_Output = false;
    Fixed_Text<Short_Name_Width> Merge_Sheet_Name;
    Fixed_Text<Short_Name_Width> Update_Sheet_Name;  ///< the sheet of the output that is joined with
    bool Sheet_Already_There = false;                ///< that sheet exists, and gives way to the result
    bool Keep_Sorted = true;
    Fixed_Text<Long_Name_Width> Add_File_Name;  ///< the output that is added to, in full
    Fixed_Text<60> Merge_Key;
    Fixed_Text<60> Merge_With;
    bool Unique_Rows = false;
    bool Source_Key_Given = false;
    std::int32_t Merge_Key_Count = 0;
    std::int32_t Merge_Fill = 2;
    std::vector<std::string> Merge_Keys;       ///< of a list file: keys in the output
    std::vector<std::string> Merge_With_Keys;  ///< the keys in the input that go with them

    Settings settings;
};

extern Request_Globals request;

}  // namespace ingester

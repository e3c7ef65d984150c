// The head of the file, the block of the Sheet's type, and what is done when all has been read.
#include "hostfiles/tss/tss_reader.h"

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tss/tss.h"
#include "model/names.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/request.h"

#include <algorithm>
#include <cmath>
#include <string>

namespace ingester {

namespace {

/// The order of the file read last. Files without a magic word are taken to have the same.
std::endian last_order = std::endian::native;

bool Is_Sheet_Type(std::int32_t type)
{
    return type >= vector_sheet && type <= scalar_sheet;
}

/// Finds version and order, and the Sheet's type where that is the first word.
bool Read_Magic(TSS_Reading& reading)
{
    TSS_Source& source = reading.source;
    std::byte bytes[sizeof(std::uint32_t)];
    const std::int64_t start = source.File().Position();
    if (!source.File().Read_Exactly(bytes, sizeof bytes))
        return reading.Ends_Early();
    for (const TSS_Magic& magic : TSS_Magics)
        for (const std::endian order : {std::endian::little, std::endian::big})
            if (Number_At<std::uint32_t>(bytes, order) == magic.word) {
                source.version = magic.version;
                source.order = last_order = order;
                return true;
            }
    if (!Is_Sheet_Type(Number_At<std::int32_t>(bytes, std::endian::native))
        && !Is_Sheet_Type(Number_At<std::int32_t>(bytes, last_order)))
        return Fail("Spreadsheet Read Error: This file is not a Tabulon spreadsheet.\n");
    source.order = last_order;
    return source.File().Seek(start);
}

// --- Head ------------------------------------------------------------------------------------------

void Limit_Columns(TSS_Reading& reading)
{
    const std::int32_t limit = request.Max_Columns;
    reading.columns = reading.head.column_count;
    if (reading.columns <= limit || reading.columns == limit + 1)
        return;
    Report_Message("Warning too many columns to read in.\n");
    Report_Message_Long("Warning Columns above %li NOT transfered.\n", limit);
    Note_Loss(Loss_Kind::beyond_limit, {}, 0, "columns beyond the greatest number",
              reading.columns - limit - 1);
    request.losses.Bar_Replacing("columns beyond the greatest number would be lost");
    reading.columns = limit + 1;
}

bool Read_Head(TSS_Reading& reading)
{
    Head_Record& head = reading.head;
    const bool complete = reading.source.Read(head, Head_Fields);
    if (!Is_Sheet_Type(head.sheet_type))
        return Fail("Spreadsheet Read Error: Unknown sheet type.\nCheck this is a Tabulon spreadsheet.\n");
    if (head.column_count == 0)
        return false;  // silent by design: a Sheet without columns
    Limit_Columns(reading);
    if (head.row_count < 0)
        return Fail("Spreadsheet Read Error: Number of rows should be positive.\n");
    const std::int64_t beyond_square = std::int64_t{head.column_count} - head.row_count;
    if (head.sheet_type == symmetric_matrix_sheet && beyond_square != 0 && beyond_square != 1)
        return Fail("Spreadsheet Read Error: Symmetric Matrix is not symmetric.\n");
    return complete || reading.Ends_Early();
}

bool Has_Flag(const TSS_Reading& reading, Present_Flag flag)
{
    return (static_cast<std::uint32_t>(reading.head.present_flags) & flag) != 0;
}

bool Start_Sheet(TSS_Reading& reading)
{
    const Head_Record& head = reading.head;
    Sheet* const earlier = Current_Sheet;
    Sheet* const sheet = reading.sheet = New_Sheet();
    Current_Sheet = earlier;
    if (sheet == nullptr)
        return Fail("Internal Spreadsheet Error: Could allocate spreadsheet data structure.\n");
    sheet->type = head.sheet_type;
    sheet->format_version = reading.source.version;
    sheet->missing_value = Missing_Marker(head.missing_value);
    sheet->host_flag_a = head.host_flag_a != 0;
    sheet->read_only = head.read_only != 0;
    sheet->host_flag_b = Has_Flag(reading, host_flag_b_bit);
    sheet->host_flag_c = Has_Flag(reading, host_flag_c_bit);
    sheet->table_in_columns = Has_Flag(reading, table_in_columns_bit);
    // The rows and columns of a Symmetric Matrix go together, so they are left out when all is read.
    const bool symmetric = sheet->type == symmetric_matrix_sheet;
    reading.selects_columns = request.Subset_Columns && !symmetric;
    const std::span<const std::int32_t> flags = request.Subset_Row_Flags;
    const auto rows = static_cast<std::size_t>(head.row_count);
    reading.rows = {request.Subset_Rows && !symmetric, flags.first(std::min(flags.size(), rows))};
    if (reading.rows.active)
        reading.new_rows = reading.rows.New_Rows(head.row_count);
    Expect_Rows(sheet, reading.rows.Count(head.row_count));
    return true;
}

bool Read_Variate_Pointer(TSS_Reading& reading)
{
    constexpr std::int32_t greatest_length = 256;
    constexpr std::int32_t variates = 4;
    const std::int32_t length = reading.head.pointer_length;
    std::string name;
    if (length < 0)
        return false;
    if (!reading.source.Read_Letters(length, greatest_length, name))
        return reading.Ends_Early();
    if (length > greatest_length)
        Report_Message("Pointer to Variate columns was truncated in reading TSS file.\n");
    return length == 0 || Define_Pointer(reading.sheet, Valid_Name_Of_No_Column(name), variates);
}

// --- Blocks of the Sheet types -----------------------------------------------------------------------

bool Read_Name(TSS_Source& source, std::string& name, const char* none, const char* too_long)
{
    std::int32_t length;
    if (!source.Read(length) || length <= 0)
        return Fail(none);
    if (length > static_cast<std::int32_t>(Name_Width))
        Report_Message(too_long);
    return source.Read_Letters(length, Name_Width, name) || Fail(none);
}

bool Read_Matrix_Block(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::string name;
    if (!Read_Name(reading.source, name, "Spreadsheet Read Error: Matrix name length should positive.\n",
                   "Spreadsheet Read Error: Matrix name too INT4 .\n"))
        return false;
    sheet.structure_name = name;
    if (!reading.source.Read_Count(sheet.label_state) || sheet.label_state > 2)
        return Fail("Spreadsheet Read Error: Unknown column label attributes for matrix spreadsheet.\n");
    return true;
}

bool Read_Margin_Flags(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t flag;
    if (reading.source.version < 3)
        return true;
    if (!reading.source.Read_Count(flag))
        return Fail("Spreadsheet Read Error: Table margin 1 flag invalid.\n");
    sheet.has_margins = flag != 0;
    if (sheet.table_ways == 1)
        return true;
    if (!reading.source.Read_Count(flag))
        return Fail("Spreadsheet Read Error: Table margin 2 flag invalid.\n");
    sheet.has_second_margin = flag != 0;
    return true;
}

/// Names that the host makes up for factors without one are made anew.
std::string Factor_Name(const std::string& name)
{
    const bool made_up =
        name.starts_with("vclass['classification'][") || name.starts_with("*['classification'][");
    return made_up ? Default_Column_Name(0) : Valid_Name_Of_No_Column(name);
}

bool Read_Table_Names(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::string name;
    if (!Read_Name(reading.source, name, "Spreadsheet Read Error: Table name length should positive.\n",
                   "Spreadsheet Warning: Table name too INT4 .\n"))
        return false;
    sheet.structure_name = name;
    if (!reading.source.Read_Count(sheet.label_state) || sheet.label_state > labels_by_text_and_level)
        return Fail("Spreadsheet Read Error: Table's classifying factor format is invalid.\n");
    if (!Read_Name(reading.source, name,
                   "Spreadsheet Read Error: Table factor name length should positive.\n",
                   "Spreadsheet Read Error: Table factor name too INT4 .\n"))
        return false;
    sheet.row_label_name = Factor_Name(name);
    return true;
}

bool Read_Table_Block(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    if (!reading.source.Read(sheet.table_ways) || sheet.table_ways <= 0)
        return Fail("Spreadsheet Read Error: Table dimension should positive.\n");
    if (sheet.table_ways > Most_Table_Ways)
        return Fail(
            "Spreadsheet Read Error: Tables with more than 9 classifying factors not yet supported.\n");
    if (!Read_Margin_Flags(reading))
        return false;
    return sheet.table_ways == 1 || sheet.table_in_columns != 0 || Read_Table_Names(reading);
}

bool Read_Type_Block(TSS_Reading& reading)
{
    switch (reading.sheet->type) {
    case matrix_sheet:
    case symmetric_matrix_sheet:
        return Read_Matrix_Block(reading);
    case diagonal_matrix_sheet:
        return reading.head.column_count < 3
               || Fail("Spreadsheet Read Error: Diagonal matrix has too many columns.\n");
    case table_sheet:
        return Read_Table_Block(reading);
    case scalar_sheet:
        return reading.head.row_count == 1
               || Fail("Spreadsheet Read Error: Scalar types should only have one row.\n");
    default:
        return true;
    }
}

// --- When all has been read --------------------------------------------------------------------------

/// A large row count that no column comes near is none to make rows of: a row takes four bytes at least.
void Limit_Rows(TSS_Reading& reading)
{
    constexpr std::int64_t least_cell = 4;
    constexpr std::int32_t large_count = 100000;
    Sheet& sheet = *reading.sheet;
    if (reading.rows.active || sheet.row_count <= large_count
        || least_cell * sheet.row_count <= reading.source.File().Position())
        return;
    auto longest = static_cast<std::int32_t>(reading.row_marks.size());
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        longest = std::max(longest, column->length);
    Expect_Rows(&sheet, longest);
}

bool Set_Row_Marks(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    if (std::ranges::count(reading.row_marks, 1) == 0)
        return true;
    if (!Need_Rows(&sheet))
        return false;
    Row_Node* row = sheet.first_row;
    for (const std::uint8_t mark : reading.row_marks) {
        if (row == nullptr)
            break;
        row->restricted = mark;
        sheet.restricted_rows += mark;
        row = row->next;
    }
    sheet.restriction_active = 1;
    return true;
}

bool Finish_Sheet(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    if (sheet.column_count == 0 && reading.source.Ended())
        return reading.Ends_Early();
    if (sheet.column_count == 0 || (reading.rows.active && sheet.row_count == 0))
        return false;  // silent by design: the pipeline tells what was left out
    if (!Set_Row_Marks(reading) || !Select_Symmetric(sheet))
        return false;
    Use_Usual_Missing_Value(sheet);
    Restore_Pointer_Names(&sheet);
    Set_Margin_Level(sheet);
    Make_Column_Names_Unique(&sheet);
    return true;
}

bool Read_Columns(TSS_Reading& reading)
{
    for (std::int32_t ordinal = 1; ordinal <= reading.columns; ++ordinal)
        if (!Read_TSS_Column(reading, ordinal))
            return false;
    return true;
}

bool Read_Sheet(TSS_Reading& reading)
{
    if (!Read_Magic(reading) || !Read_Head(reading) || !Start_Sheet(reading) || !Read_Variate_Pointer(reading)
        || !Read_Type_Block(reading))
        return false;
    const bool whole = Read_Columns(reading);
    if (!whole)
        request.losses.Note_Unread("what stands behind a fault of it");
    Limit_Rows(reading);
    if (whole && !Read_Auxiliary_Records(reading))
        return false;
    if (Has_Flag(reading, recode_genotypes_bit))
        Recode_Genotype_Factors(reading.sheet);
    if (Has_Flag(reading, cond_on_background_bit) && !reading.colours_corrupt)
        reading.sheet->cond_on_background = 1;
    return Finish_Sheet(reading);
}

}  // namespace

bool Read_TSS(Input_File& file)
{
    TSS_Reading reading{.source = TSS_Source(file)};
    const bool read = Read_Sheet(reading);
    if (file.Failed() || reading.ends_early)
        return Fail_To_Read(file.Name());
    if (!read)
        return false;
    Current_Sheet = reading.sheet;
    return true;
}

bool Read_TSS_File(const char* file_name)
{
    Input_File file;
    if (!file.Open(file_name))
        return Fail("Tabulon Spreadsheet data file %.100s not found.\n", file_name);
    return Read_TSS(file);
}

}  // namespace ingester

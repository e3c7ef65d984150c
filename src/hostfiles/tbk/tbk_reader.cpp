// The walk over a book's records: what may stand where, and which sheet is read.
#include "hostfiles/tbk/tbk_reader.h"

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tbk/page_names.h"
#include "hostfiles/tbk/tbk.h"
#include "model/names.h"
#include "model/row_fields.h"
#include "model/sheet_list.h"
#include "request/messages.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

// --- The sheet that was asked for --------------------------------------------------------------------

struct Best_Page {
    std::size_t index = 0;
    std::size_t common = 0;  ///< characters that it shares with the request
    std::string name;
};

/// The page whose name begins most like the request.
Best_Page Find_Best_Page(Book_Source& source, const Sheet_Offsets& offsets, std::string_view asked)
{
    const std::string wanted = Folded(asked);
    Best_Page best;
    std::string name;
    for (std::size_t i = 0; i < offsets.size(); ++i) {
        if (!source.Peek_Page_Name(offsets[i], name))
            continue;  // the others may be read all the same
        const std::size_t common = Common_Letters(Folded(name), wanted);
        if (common > best.common)
            best = {i, common, name};
        if (Equal_Folded(name, asked))
            break;
    }
    return best;
}

/// Finds the sheet, and goes there.
bool Choose_Sheet(Book_Reading& reading, const Sheet_Offsets& offsets)
{
    const std::string asked(request.Worksheet_Name.view());
    std::size_t number = Sheet_Number_Of(asked, offsets.size());
    reading.by_number = number != 0;
    if (reading.by_number) {
        std::string name;
        request.Sheet_Name_Was_Exact = true;
        if (reading.source.Peek_Page_Name(offsets[number - 1], name))
            request.Used_Sheet_Name = name;
    } else {
        const Best_Page best = Find_Best_Page(reading.source, offsets, asked);
        if (best.common == 0)
            return Fail("Specifed sheet name %s not found in Tabulon TBK file.\n", asked.c_str());
        request.Sheet_Name_Was_Exact = Equal_Folded(best.name, asked);
        if (!request.Sheet_Name_Was_Exact)
            Report_Message(
                Format_Text("Warning: inexact match on sheet name: '%.100s' selected for '%.100s'.\n",
                            best.name.c_str(), asked.c_str()));
        request.Worksheet_Name = request.Used_Sheet_Name = best.name;
        number = best.index + 1;
    }
    reading.chosen = true;
    return reading.source.Jump(offsets[number - 1]);
}

bool Tell_Not_Found(const Book_Reading& reading)
{
    const std::string asked(request.Worksheet_Name.view());
    return reading.by_number
               ? Fail("Specifed sheet number %s not found in Tabulon TBK file.\n", asked.c_str())
               : Fail("Specifed sheet name %s not found in Tabulon TBK file.\n", asked.c_str());
}

// --- Records of the book -----------------------------------------------------------------------------

bool Start_Book(Book_Reading& reading)
{
    std::int32_t end;
    reading.in_book = true;
    return reading.source.Read(reading.sheets, end) && (reading.sheets >= 0 || reading.source.Corrupt());
}

bool End_Book(Book_Reading& reading)
{
    reading.in_book = false;
    reading.finished = ++reading.sections_ended >= reading.source.Sections();
    return true;
}

bool Read_Sheets(Book_Reading& reading)
{
    Sheet_Offsets offsets;
    if (!Read_Sheet_Table(reading.source, reading.sheets, offsets))
        return false;
    return !reading.chooses || reading.chosen || Choose_Sheet(reading, offsets);
}

bool Read_Population(Book_Reading& reading)
{
    std::uint8_t code;
    if (!reading.source.Read(code))
        return false;
    if (reading.in_sheet) {
        reading.sheet->population_set = 1;
        reading.sheet->population_code = code;
    }
    return true;
}

bool Start_Comments(Book_Reading& reading)
{
    reading.in_comments = true;
    return true;
}

bool End_Comments(Book_Reading& reading)
{
    reading.in_comments = false;
    return true;
}

// --- Sheets ------------------------------------------------------------------------------------------

struct Sheet_Facts {
    std::uint8_t type, host_flag_a, read_only, host_flag_b, host_flag_c;
    std::int32_t rows;
    double missing_value;
    std::string name;
};

bool Read_Sheet_Facts(Book_Reading& reading, Sheet_Facts& facts)
{
    Book_Source& source = reading.source;
    if (!source.Read(facts.type, reading.stored_columns, facts.rows, facts.missing_value, facts.host_flag_a,
                     facts.read_only, facts.host_flag_b, facts.host_flag_c)
        || source.Read_Short_Text(&facts.name, Page_Name_Width) < 0)
        return false;
    if (facts.type < vector_sheet || facts.type > scalar_sheet)
        return source.Corrupt("Invalid sheet type in reading Tabulon book");
    return (reading.stored_columns >= 0 && facts.rows >= 0) || source.Corrupt();
}

/// The sheets before were read to see that they are sound; the last one stays.
void Forget_Sheet(Book_Reading& reading)
{
    if (reading.sheet != nullptr)
        Free_Sheet(reading.sheet);
    reading.sheet = nullptr;
    reading.hidden_map.clear();
    reading.dropped_cells.clear();
    reading.columns.clear();
    reading.origins.clear();
}

bool Start_Sheet(Book_Reading& reading)
{
    if (reading.chooses && !reading.chosen)
        return Tell_Not_Found(reading);  // sheets in front of the table that tells where they are
    Sheet_Facts facts;
    if (!Read_Sheet_Facts(reading, facts))
        return false;
    Forget_Sheet(reading);
    Sheet* const sheet = reading.sheet = New_Sheet();
    if (sheet == nullptr)
        return Not_Loaded(reading, "Could not create column in Reading Tabulon Book");
    sheet->type = facts.type;
    sheet->format_version = Book_Version;
    sheet->missing_value = Missing_Marker(facts.missing_value);
    sheet->host_flag_a = facts.host_flag_a;
    sheet->read_only = facts.read_only;
    sheet->host_flag_b = facts.host_flag_b;
    sheet->host_flag_c = facts.host_flag_c;
    sheet->sheet_name = facts.name;
    Expect_Rows(sheet, facts.rows);
    reading.in_sheet = true;
    return true;
}

/// Columns that are painted by a Factor's colours; the Factor may stand behind them.
void Resolve_Colour_Sources(Book_Reading& reading)
{
    for (std::size_t i = 0; i < reading.columns.size(); ++i) {
        const auto origin = static_cast<std::size_t>(std::max(reading.origins[i], 0));
        if (reading.columns[i] == nullptr || origin == 0 || origin > reading.columns.size())
            continue;
        Column* const factor = reading.columns[origin - 1];
        if (factor == nullptr || factor->type != factor_column)
            continue;
        reading.columns[i]->colour_source = factor;
        reading.sheet->has_colour_sources = 1;
    }
}

/// Rows that nothing in the book stands for are not made.
void Limit_Rows(Sheet& sheet)
{
    if (sheet.column_count == 0 && sheet.row_count > Most_Blank_Cells)
        Expect_Rows(&sheet, 0);
    if (sheet.type != symmetric_matrix_sheet)
        return;
    std::int32_t square = std::max(sheet.column_count - sheet.leading_columns + 1, 0);
    for (const Column* column = sheet.first_column->next; column != nullptr; column = column->next)
        square = std::max(square, column->length);  // labels may say more
    if (sheet.row_count > square)
        Expect_Rows(&sheet, square);
}

/// False, silently, when nothing is left: the pipeline tells.
bool Select_Rows(Sheet& sheet)
{
    const Row_Selection rows{request.Subset_Rows, request.Subset_Row_Flags};
    if (sheet.type == symmetric_matrix_sheet)
        return Select_Symmetric(sheet);
    if (!rows.active)
        return true;
    if (rows.Count(sheet.row_count) == 0)
        return false;
    const std::vector<std::int32_t> new_rows = rows.New_Rows(sheet.row_count);
    if (Keep_Rows(&sheet, rows.flags))  // not of a Scalar Sheet, which keeps its one row
        Move_Row_Fields(sheet, new_rows);
    return true;
}

bool End_Sheet(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    Drop_Cells(reading);  // before rows are left out
    reading.in_sheet = false;
    Resolve_Colour_Sources(reading);
    reading.origins.clear();
    Limit_Rows(sheet);
    Set_Margin_Level(sheet);
    Make_Column_Names_Unique(&sheet);
    if (reading.chosen)
        reading.finished = true;
    else
        request.Used_Sheet_Name = sheet.sheet_name;
    if (sheet.type == symmetric_matrix_sheet)
        reading.columns.clear();  // which may go with its rows
    reading.no_rows = !Select_Rows(sheet);
    return true;
}

// --- Records without a reader of their own -----------------------------------------------------------

bool Pass_Over(Book_Reading& reading)
{
    return reading.source.Skip_Rest();
}

bool Pass_Column_Table(Book_Reading& reading)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(std::int32_t));
    return reading.source.Record().length == size * reading.stored_columns ? reading.source.Skip_Rest()
                                                                           : reading.source.Corrupt();
}

/// What is no more than one number of the Sheet or of the column.
template <auto Member> bool Read_Sheet_Number(Book_Reading& reading)
{
    return reading.source.Read(reading.sheet->*Member);
}

template <auto Member> bool Read_Column_Number(Book_Reading& reading)
{
    return reading.source.Read(reading.column->*Member);
}

/// What is true by being there.
template <auto Member> bool Mark_Sheet(Book_Reading& reading)
{
    reading.sheet->*Member = 1;
    return true;
}

template <auto Member> bool Mark_Column(Book_Reading& reading)
{
    reading.column->*Member = 1;
    return true;
}

// --- Which record may stand where --------------------------------------------------------------------

enum class Place : std::uint8_t {
    outside_books,
    book,
    between_sheets,
    sheet,
    between_columns,
    column,
    column_of_book,
    outside_comments,
    comments,
};

enum class Length : std::uint8_t {
    exactly,   ///< as stated
    as_read,   ///< at least as stated, and no more than is read
    at_least,  ///< what isn't read is passed over
};

using Column_Test = bool (*)(const Column& column);

bool Is_Factor(const Column& column)
{
    return column.type == factor_column;
}

bool Is_Text(const Column& column)
{
    return Is_Text_Like(column.type);
}

bool Is_Long_Text(const Column& column)
{
    return column.type == long_text_column;
}

bool Is_No_Text(const Column& column)
{
    return !Is_Text(column);
}

bool Has_Calculation(const Column& column)
{
    return column.type == variate_column || Is_Factor(column);
}

bool Is_In_Table(const Column& column)
{
    return column.sheet->type == table_sheet;
}

struct Record_Rule {
    std::int32_t type;
    Place place;
    Length fit;
    std::int64_t length;
    Record_Reader read;
    Column_Test of_column = nullptr;
    bool of_table = false;
};

constexpr Record_Rule Record_Rules[] = {
    {book_start_record, Place::outside_books, Length::exactly, 8, Start_Book},
    {book_end_record, Place::between_sheets, Length::exactly, 0, End_Book},
    {sheet_table_record, Place::book, Length::at_least, 0, Read_Sheets},
    {old_number_record, Place::book, Length::exactly, 8, Pass_Over},
    {old_words_record, Place::book, Length::exactly, 8, Pass_Over},
    {old_integer_record, Place::book, Length::exactly, 4, Pass_Over},
    {old_mark_a_record, Place::book, Length::exactly, 0, Pass_Over},
    {old_factor_record, Place::column_of_book, Length::at_least, 20, Read_Old_Factor},
    {old_sheet_mark_record, Place::sheet, Length::exactly, 0, Pass_Over},
    {old_mark_b_record, Place::book, Length::exactly, 0, Pass_Over},
    {old_mark_c_record, Place::book, Length::exactly, 0, Pass_Over},
    {population_record, Place::book, Length::exactly, 1, Read_Population},
    {source_file_record, Place::book, Length::at_least, 4, Pass_Over},
    {sheet_start_record, Place::between_sheets, Length::as_read, Sheet_Facts_Size + 1, Start_Sheet},
    {sheet_end_record, Place::between_columns, Length::at_least, 0, End_Sheet},
    {column_table_record, Place::sheet, Length::at_least, 0, Pass_Column_Table},
    {structure_name_record, Place::sheet, Length::as_read, 2, Read_Structure_Name},
    {table_shape_record, Place::sheet, Length::exactly, 3, Read_Table_Shape, nullptr, true},
    {table_factor_record, Place::sheet, Length::as_read, 3, Read_Table_Factor, nullptr, true},
    {margin_label_record, Place::sheet, Length::as_read, 1, Read_Margin_Label, nullptr, true},
    {analysis_record, Place::sheet, Length::at_least, 9, Read_Analysis_Record},
    {title_record, Place::sheet, Length::as_read, 4, Read_Title_Record},
    {current_cell_record, Place::sheet, Length::exactly, 8, Read_Current_Cell_Record},
    {host_pointer_record, Place::sheet, Length::as_read, 2, Read_Pointer_Record},
    {dde_link_record, Place::sheet, Length::at_least, 21, Read_DDE_Record},
    {sheet_date_record, Place::sheet, Length::exactly, 8, Read_Sheet_Number<&Sheet::creation_date>},
    {split_column_record, Place::sheet, Length::exactly, 4, Read_Split_Record},
    {restriction_record, Place::sheet, Length::as_read, 5, Read_Restriction},
    {conditional_mode_record, Place::sheet, Length::exactly, 0, Mark_Sheet<&Sheet::cond_mode>},
    {hidden_map_record, Place::sheet, Length::as_read, 0, Read_Hidden_Map},
    {sheet_iprint_record, Place::sheet, Length::exactly, 1, Read_Sheet_IPRINT},
    {old_sheet_mark_b_record, Place::sheet, Length::exactly, 0, Pass_Over},
    {conditional_background_record, Place::sheet, Length::exactly, 0, Mark_Sheet<&Sheet::cond_on_background>},
    {table_in_columns_record, Place::sheet, Length::exactly, 0, Mark_Sheet<&Sheet::table_in_columns>},
    {column_start_record, Place::between_columns, Length::as_read, 13, Start_Column},
    {column_end_record, Place::column, Length::at_least, 0, End_Column},
    {column_decimals_record, Place::column, Length::exactly, 1, Read_Column_Decimals, Is_No_Text},
    {number_cells_record, Place::column, Length::as_read, 4, Read_Number_Record, Is_Plain_Number},
    {text_cells_record, Place::column, Length::as_read, 5, Read_Text_Record, Is_Short_Text},
    {long_text_cells_record, Place::column, Length::as_read, 8, Read_Long_Text_Record, Is_Long_Text},
    {factor_cells_record, Place::column, Length::as_read, 9, Read_Factor_Record, Is_Factor},
    {level_values_record, Place::column, Length::as_read, 5, Read_Level_Value_Record, Is_Factor},
    {level_labels_record, Place::column, Length::as_read, 5, Read_Label_Record, Is_Factor},
    {reference_level_record, Place::column, Length::exactly, 4, Read_Reference_Level, Is_Factor},
    {recoded_record, Place::column, Length::exactly, 0, Mark_Column<&Column::factor_recoded>, Is_Factor},
    {factor_colours_record, Place::column, Length::as_read, 0, Read_Factor_Colour_Record, Is_Factor},
    {attached_text_record, Place::column, Length::as_read, 5, Read_Attached_Text, Has_Calculation},
    {column_extra_record, Place::column, Length::as_read, 1, Read_Column_Extra},
    {range_limits_record, Place::column, Length::exactly, 16, Read_Range_Record},
    {gradient_record, Place::column, Length::exactly, 26, Read_Gradient_Record},
    {conditional_format_record, Place::column, Length::exactly, 39, Read_Condition_Record},
    {column_date_record, Place::column, Length::exactly, 8, Read_Column_Number<&Column::creation_date>},
    {column_option_record, Place::column, Length::exactly, 1, Read_Column_Option, Has_Column_Option},
    {table_level_record, Place::column, Length::exactly, 8, Read_Table_Level, Is_In_Table},
    {cell_colours_record, Place::column, Length::as_read, 4, Read_Cell_Colour_Record},
    {column_iprint_record, Place::column, Length::exactly, 1, Read_Column_IPRINT},
    {colour_source_record, Place::column, Length::exactly, 4, Read_Colour_Source},
    {column_colours_record, Place::column, Length::exactly, 8, Read_Column_Colour_Record},
    {comments_start_record, Place::outside_comments, Length::exactly, 0, Start_Comments},
    {comments_end_record, Place::comments, Length::exactly, 0, End_Comments},
    {cell_comment_record, Place::comments, Length::at_least, 24, Read_Cell_Comment},
};
static_assert(std::ranges::is_sorted(Record_Rules, {}, &Record_Rule::type));

bool Is_In_Place(const Book_Reading& reading, const Record_Rule& rule)
{
    switch (rule.place) {
    case Place::outside_books:
        return !reading.in_book;
    case Place::book:
        return reading.in_book;
    case Place::between_sheets:
        return reading.in_book && !reading.in_sheet;
    case Place::sheet:
        return reading.in_sheet && (!rule.of_table || reading.sheet->type == table_sheet);
    case Place::between_columns:
        return reading.in_sheet && !reading.in_column;
    case Place::column:
    case Place::column_of_book:
        return reading.in_column && (rule.of_column == nullptr || rule.of_column(*reading.column));
    case Place::outside_comments:
        return reading.in_book && !reading.in_comments;
    case Place::comments:
        return reading.in_comments;
    }
    return false;
}

bool Length_Fits(std::int64_t length, const Record_Rule& rule)
{
    return rule.fit == Length::exactly ? length == rule.length : length >= rule.length;
}

/// Of all records of the book, the first is told of.
bool Pass_Unknown(Book_Reading& reading)
{
    const Book_Record& record = reading.source.Record();
    if (!reading.unknown_told)
        Report_Message(Format_Text(
            "Unknown Record type %i ignored in Tabulon Book:\n %s.\n(record number %li, length %li, at "
            "offset %li)\nThis is probably due to reading a TBK file\nproduced by a newer version of "
            "Tabulon.\n",
            record.type, reading.source.Shown().c_str(), record.number, static_cast<long>(record.length),
            static_cast<long>(record.offset)));
    reading.unknown_told = true;
    return reading.source.Skip_Rest();
}

bool Read_Record(Book_Reading& reading)
{
    const Book_Record& record = reading.source.Record();
    const auto* const rule = std::ranges::lower_bound(Record_Rules, record.type, {}, &Record_Rule::type);
    if (rule == std::end(Record_Rules) || rule->type != record.type)
        return Pass_Unknown(reading);
    if (!Is_In_Place(reading, *rule) || !Length_Fits(record.length, *rule))
        return reading.source.Corrupt();
    if (!rule->read(reading))
        return false;
    return rule->fit == Length::at_least || reading.source.Left() == 0 || reading.source.Corrupt();
}

// --- The whole ---------------------------------------------------------------------------------------

bool Walk_Records(Book_Reading& reading)
{
    while (!reading.finished)
        if (!reading.source.Next_Record() || !Read_Record(reading))
            return false;
    return true;
}

void Tell_Soft_Fault(const Book_Reading& reading)
{
    if (reading.soft_fault != nullptr)
        Report_Message(Format_Text("Text limits were exceeded in %s:\nFault: %s.\n",
                                   reading.source.Shown().c_str(), reading.soft_fault));
}

bool Read_Book(Book_Reading& reading)
{
    if (!reading.source.Read_Head() || !Walk_Records(reading))
        return false;
    Drop_Cells(reading);
    Tell_Soft_Fault(reading);
    if (reading.chooses && (!reading.chosen || reading.sheet == nullptr))
        return Tell_Not_Found(reading);
    if (reading.no_rows)
        return false;
    // The pipeline tells what a selection left out.
    return !request.Subset_Columns || reading.sheet == nullptr || reading.sheet->column_count > 0;
}

/// A Sheet of the names of the sheets.
bool List_Sheets_Of(Input_File& file, const std::string& shown)
{
    Sheet_Offsets offsets;
    std::vector<std::string> names;
    Current_Sheet = nullptr;
    if (!List_Pages(file, offsets, names))
        return Fail("Unable to get Pagenames from Tabulon Book file %.200s.\n", shown.c_str());
    return Make_Sheet_List(names);
}

}  // namespace

bool Not_Loaded(Book_Reading& reading, const char* fault)
{
    return Fail("Tabulon Book %s couldn't be completely loaded:\n%s\n", reading.source.Shown().c_str(),
                fault);
}

bool Read_TBK(Input_File& file)
{
    const std::string shown =
        request.Current_File_Name.empty() ? file.Name() : std::string(request.Current_File_Name.view());
    if (request.List_Sheets_Only)
        return List_Sheets_Of(file, shown);
    Book_Reading reading{.source = Book_Source(file, Book_Walker::reader, shown)};
    reading.chooses = !request.Worksheet_Name.empty();
    const bool good = Read_Book(reading);
    Current_Sheet = good ? reading.sheet : nullptr;
    if (Current_Sheet != nullptr)
        Use_Usual_Missing_Value(*Current_Sheet);
    return good;
}

bool Read_TBK_File(const char* file_name)
{
    Input_File file;
    if (!file.Open(file_name))
        return Fail("Tabulon Book file %s not found.\n", file_name);
    return Read_TBK(file);
}

}  // namespace ingester

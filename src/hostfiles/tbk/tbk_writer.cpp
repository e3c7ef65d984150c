// The book, and the records of its sheets beside those of their columns.
#include "hostfiles/tbk/tbk_writer.h"

#include "hostfiles/shared/host_sheet.h"
#include "hostfiles/tbk/tbk.h"
#include "model/names.h"
#include "request/messages.h"

#include <algorithm>
#include <vector>

namespace ingester {

namespace {

// --- In front of the columns -------------------------------------------------------------------------

/// Cells that are missing are written as `Missing_Value`, which must not lie above the marker.
double Marker_In_File(const Sheet& sheet)
{
    return std::max(sheet.missing_value, Missing_Value);
}

void Write_Sheet_Start(const Sheet& sheet, Book_Sink& sink, std::string_view page)
{
    sink.Start_Record(sheet_start_record);
    sink.Put_Byte(sheet.type);
    sink.Put(sheet.column_count, sheet.row_count, Marker_In_File(sheet));
    for (const std::int16_t flag : {sheet.host_flag_a, sheet.read_only, sheet.host_flag_b, sheet.host_flag_c})
        sink.Put_Byte(flag);
    sink.Put_Short_Text(First_Letters(page, Page_Name_Width));
    sink.End_Record();
}

/// Where the offsets of the columns go.
std::int64_t Write_Column_Table(const Sheet& sheet, Book_Sink& sink)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(std::int32_t));
    sink.Put_Record_Head(column_table_record, size * sheet.column_count);
    const std::int64_t position = sink.Position();
    for (std::int32_t i = 0; i < sheet.column_count; ++i)
        sink.Put(std::int32_t{0});
    return position;
}

void Write_Table_Factor(const Sheet& sheet, Book_Sink& sink)
{
    const std::int32_t date = sheet.column_factor_date;
    if (sheet.row_label_name.empty())
        return;
    sink.Start_Record(table_factor_record);
    sink.Put_Byte(sheet.column_factor_format);
    sink.Put_Byte(date < 0 ? Column_Factor_Date_Base - date : date);
    sink.Put_Short_Text(sheet.row_label_name);
    sink.Put_Byte(std::clamp(sheet.column_factor_decimals, -1, Greatest_Record_Decimals) + 1);
    sink.End_Record();
}

void Write_Table_Records(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.type != table_sheet)
        return;
    sink.Start_Record(table_shape_record);
    sink.Put_Byte(sheet.table_ways);
    sink.Put_Byte(sheet.has_margins);
    sink.Put_Byte(sheet.has_second_margin);
    sink.End_Record();
    Write_Table_Factor(sheet, sink);
    if (sheet.has_margins == 0 || sheet.margin_label.empty())
        return;
    sink.Start_Record(margin_label_record);
    sink.Put_Short_Text(sheet.margin_label);
    sink.End_Record();
}

void Write_Structure_Name(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.type != matrix_sheet && sheet.type != symmetric_matrix_sheet && sheet.type != table_sheet)
        return;
    sink.Start_Record(structure_name_record);
    sink.Put_Short_Text(sheet.structure_name);
    sink.Put_Byte(Label_State_In_File(sheet));
    sink.End_Record();
}

void Write_Hidden_Map(const Sheet& sheet, Book_Sink& sink)
{
    std::string map;
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            map.push_back(column->hidden != 0 ? '\1' : '\0');
    if (map.find('\1') == std::string::npos)
        return;
    sink.Start_Record(hidden_map_record);
    sink.Put_Bytes(map);
    sink.End_Record();
}

// --- Behind the columns ------------------------------------------------------------------------------

void Write_Text_Block(const std::string& block, std::int32_t count, Book_Sink& sink)
{
    const bool empty = block.empty() || count < 1;
    sink.Put(empty ? 0 : count);
    if (!empty)
        sink.Put_Long_Text(block);
}

void Write_Analysis(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.analysis_setup.empty() && sheet.analysis_commands.empty())
        return;
    std::string dummy(sheet.analysis_dummy.view());
    if (!dummy.empty() && sheet.analysis_dummy_plain == 0)
        dummy.insert(0, 1, '-');
    sink.Start_Record(analysis_record);
    Write_Text_Block(sheet.analysis_setup, sheet.analysis_setup_count, sink);
    sink.Put_Short_Text(dummy);
    Write_Text_Block(sheet.analysis_commands, sheet.analysis_command_count, sink);
    sink.End_Record();
}

void Write_Title(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.title_lines.empty() && sheet.title_cleared == 0)
        return;
    sink.Start_Record(title_record);
    Write_Text_Block(sheet.title_lines, sheet.title_line_count, sink);
    sink.End_Record();
}

void Write_Conditional_Mode(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.cond_mode == 0)
        return;
    sink.Put_Mark(conditional_mode_record);
    if (sheet.cond_on_background != 0)
        sink.Put_Mark(conditional_background_record);
}

void Write_Current_Cell(const Sheet& sheet, Book_Sink& sink)
{
    sink.Start_Record(current_cell_record);
    sink.Put(sheet.current_column, sheet.current_row + 1);
    sink.End_Record();
}

void Write_Pointers(const Sheet& sheet, Book_Sink& sink)
{
    for (const Host_Pointer& pointer : sheet.pointers) {
        sink.Start_Record(host_pointer_record);
        sink.Put_Byte(pointer.kind);
        sink.Put_Short_Text(pointer.name);
        if (pointer.kind == 0) {
            sink.Put(static_cast<std::int32_t>(pointer.members.size()));
            for (const std::string& member : pointer.members)
                sink.Put_Short_Text(member);
        }
        sink.End_Record();
    }
}

void Write_Split_Column(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.split_set == 0)
        return;
    sink.Start_Record(split_column_record);
    sink.Put(std::min(std::max(sheet.split_column, sheet.leading_columns + 1), sheet.column_count));
    sink.End_Record();
}

void Write_Restriction(const Sheet& sheet, Book_Sink& sink, std::string_view name, std::string bits)
{
    bits.resize(static_cast<std::size_t>(Bit_Vector_Size(sheet.row_count)));
    sink.Start_Record(restriction_record);
    sink.Put_Short_Text(name);
    sink.Put(sheet.row_count);
    sink.Put_Bytes(bits);
    sink.End_Record();
}

std::string Restriction_In_Force(const Sheet& sheet)
{
    std::string bits(static_cast<std::size_t>(Bit_Vector_Size(sheet.row_count)), '\0');
    std::size_t at = 0;
    for (const Row_Node* row = sheet.first_row; row != nullptr; row = row->next, ++at)
        if (row->restricted != 0)
            bits[at / 8] = static_cast<char>(bits[at / 8] | 1 << at % 8);
    return bits;
}

/// The saved ones, and then the one in force, which has no name.
[[nodiscard]] bool Write_Restrictions(Sheet& sheet, Book_Sink& sink)
{
    for (Saved_Restriction& saved : sheet.saved_restrictions) {
        if (saved.name.empty())
            saved.name = Make_Valid_Name({});
        Write_Restriction(sheet, sink, saved.name, saved.bits);
    }
    if (sheet.restriction_active == 0)
        return true;
    if (!Need_Rows(&sheet))
        return false;
    Write_Restriction(sheet, sink, {}, Restriction_In_Force(sheet));
    return true;
}

void Write_Sheet_IPRINT(const Sheet& sheet, Book_Sink& sink)
{
    if (sheet.iprint <= 0)
        return;
    sink.Start_Record(sheet_iprint_record);
    sink.Put_Byte(std::min(sheet.iprint, Greatest_IPRINT));
    sink.End_Record();
}

Sheet_Offsets Write_Columns(Sheet& sheet, Book_Sink& sink, Group_Form form)
{
    Sheet_Offsets offsets;
    for (Column* column = sheet.first_column; column != nullptr && !sink.Failed(); column = column->next) {
        if (column->type == row_column)
            continue;
        offsets.push_back(sink.In_A_Word(sink.Position()));
        Write_Column_Group(*column, sink, form);
    }
    return offsets;
}

}  // namespace

void Rewrite_Offsets(Book_Sink& sink, std::int64_t position, const Sheet_Offsets& offsets)
{
    for (const std::int32_t offset : offsets) {
        sink.Put_Word_At(position, offset);
        position += static_cast<std::int64_t>(sizeof offset);
    }
}

bool Write_Sheet_Group(Sheet& sheet, Book_Sink& sink, std::string_view page, Group_Form form)
{
    sheet.format_version = Book_Version;
    Write_Sheet_Start(sheet, sink, page);
    const std::int64_t table = Write_Column_Table(sheet, sink);
    sink.Put_Record_Head(sheet_date_record, sizeof(double));
    sink.Put(sheet.creation_date);
    if (sheet.table_in_columns != 0 && form == Group_Form::of_new_book)
        sink.Put_Mark(table_in_columns_record);
    Write_Table_Records(sheet, sink);
    Write_Structure_Name(sheet, sink);
    Write_Hidden_Map(sheet, sink);
    Rewrite_Offsets(sink, table, Write_Columns(sheet, sink, form));
    sink.Texts().Go_To({});
    Write_Analysis(sheet, sink);
    Write_Title(sheet, sink);
    Write_Conditional_Mode(sheet, sink);
    Write_Current_Cell(sheet, sink);
    Write_Pointers(sheet, sink);
    Write_Split_Column(sheet, sink);
    if (!Write_Restrictions(sheet, sink))
        return false;
    if (form == Group_Form::of_new_book)
        Write_Sheet_IPRINT(sheet, sink);
    sink.Put_Mark(sheet_end_record);
    return !sink.Failed();
}

bool Write_One_Sheet(Sheet& sheet, Book_Sink& sink, Sheet_Offsets& table, std::size_t position,
                     std::string_view page)
{
    table[position] = sink.In_A_Word(sink.Position());
    return Write_Sheet_Group(sheet, sink, page, Group_Form::of_update);
}

// --- The book ----------------------------------------------------------------------------------------

namespace {

/// Where the words go that are known at the end only.
struct Places {
    std::int64_t end;
    std::int64_t table;
};

void Write_Source_File(const Sheet& sheet, Book_Sink& sink)
{
    const std::string_view source = sheet.source_file;
    if (source.empty() || source.starts_with(Get_Temp_Folder()))
        return;
    sink.Start_Record(source_file_record);
    sink.Put_Long_Text(source);
    sink.End_Record();
}

Places Write_Book_Start(std::span<Sheet* const> sheets, Book_Sink& sink)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(std::int32_t));
    const Sheet& first = *sheets.front();
    Places places;
    sink.Put_Bytes(Book_Magic);
    sink.Put(Order_Mark, std::uint16_t{1});
    sink.Put_Record_Head(book_start_record, 2 * size);
    sink.Put(static_cast<std::int32_t>(sheets.size()));
    places.end = sink.Position();
    sink.Put(std::int32_t{0});
    if (first.population_set != 0) {
        sink.Put_Record_Head(population_record, 1);
        sink.Put(first.population_code);
    }
    Write_Source_File(first, sink);
    sink.Put_Record_Head(sheet_table_record, size * std::ssize(sheets));
    places.table = sink.Position();
    for (std::size_t i = 0; i < sheets.size(); ++i)
        sink.Put(std::int32_t{0});
    return places;
}

bool Write_Book(std::span<Sheet* const> sheets, Book_Sink& sink)
{
    const Places places = Write_Book_Start(sheets, sink);
    Sheet_Offsets offsets;
    std::vector<std::string> names;
    for (Sheet* const sheet : sheets) {
        offsets.push_back(sink.In_A_Word(sink.Position()));
        if (!Write_Sheet_Group(*sheet, sink, Add_Unique_Page_Name(names, Page_Name_Of(*sheet)),
                               Group_Form::of_new_book))
            return false;
    }
    sink.Put_Mark(book_end_record);
    Rewrite_Offsets(sink, places.table, offsets);
    sink.Put_Word_At(places.end, sink.Position());
    return !sink.Failed();
}

}  // namespace

bool Write_TBK_File(std::span<Sheet* const> sheets, const char* file_name)
{
    if (sheets.empty() || std::ranges::count(sheets, nullptr) > 0 || file_name == nullptr)
        return Fail("Internal Spreadsheet Error: Null BOOK in Save book.\n");
    Output_File file;
    if (!file.Open(file_name))
        return Fail("Tabulon Book file not saved.\n");
    Book_Sink sink(file, std::endian::little);
    const bool written = Write_Book(sheets, sink);
    return file.Close() && written;
}

bool Write_TBK_File(Sheet* sheet, const char* file_name)
{
    return Write_TBK_File(std::span<Sheet* const>(&sheet, 1), file_name);
}

}  // namespace ingester

// The records of a sheet beside those of its columns.
#include "hostfiles/tbk/tbk_reader.h"
#include "model/names.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <limits>

namespace ingester {

bool Read_Structure_Name(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    const std::int32_t most_states = sheet.type == table_sheet ? labels_by_text_and_level : labels_by_text;
    std::string name;
    std::uint8_t state;
    if (reading.source.Read_Short_Text(&name, Name_Width) < 0 || !reading.source.Read(state))
        return false;
    sheet.structure_name = name;
    sheet.label_state = state;
    return state <= most_states || reading.source.Corrupt();
}

bool Read_Table_Shape(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::uint8_t ways;
    std::uint8_t margins;
    std::uint8_t second_margin;
    if (!reading.source.Read(ways, margins, second_margin))
        return false;
    sheet.table_ways = ways;
    sheet.has_margins = margins != 0;
    sheet.has_second_margin = second_margin != 0;
    return true;
}

bool Read_Table_Factor(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::uint8_t format;
    std::uint8_t date;
    std::uint8_t decimals;
    std::string name;
    if (!reading.source.Read(format, date) || reading.source.Read_Short_Text(&name, Name_Width) < 0)
        return false;
    sheet.column_factor_format = format;
    sheet.column_factor_date = date >= Column_Factor_Date_Base ? Column_Factor_Date_Base - date : date;
    sheet.row_label_name = name;
    if (reading.source.Left() == 0)
        return true;
    if (!reading.source.Read(decimals))
        return false;
    sheet.column_factor_decimals = decimals - 1;
    return true;
}

bool Read_Margin_Label(Book_Reading& reading)
{
    std::string label;
    if (reading.source.Read_Short_Text(&label, Text_Cell_Width) < 0)
        return false;
    reading.sheet->margin_label = label;
    return true;
}

namespace {

/// A block of texts with a NUL behind each, and how many there are, whatever the record claims.
bool Read_Text_Block(Book_Source& source, std::string& block, std::int32_t& count)
{
    std::int32_t stated;
    std::int32_t bytes;
    block.clear();
    count = 0;
    if (!source.Read(stated))
        return false;
    if (stated <= 0)
        return stated == 0 || source.Corrupt();
    if (!source.Read(bytes) || (bytes < 0 && !source.Corrupt())
        || !source.Read_Letters(bytes, static_cast<std::size_t>(bytes), block))
        return false;
    if (!block.empty() && block.back() != '\0')
        block.push_back('\0');
    count = static_cast<std::int32_t>(std::ranges::count(block, '\0'));
    return true;
}

bool Read_Dummy_Name(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::string name;
    if (reading.source.Read_Short_Text(&name, Name_Width + 1) < 0)
        return false;
    const bool marked = name.starts_with('-');
    sheet.analysis_dummy_plain = marked ? 0 : 1;
    if (marked)
        name.erase(0, 1);
    sheet.analysis_dummy = name.empty() ? name : Make_Valid_Name(First_Letters(name, Name_Width));
    return true;
}

}  // namespace

bool Read_Analysis_Record(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    constexpr std::int64_t may_be_left = 1;
    return Read_Text_Block(reading.source, sheet.analysis_setup, sheet.analysis_setup_count)
           && Read_Dummy_Name(reading)
           && Read_Text_Block(reading.source, sheet.analysis_commands, sheet.analysis_command_count)
           && (reading.source.Left() <= may_be_left || reading.source.Corrupt());
}

bool Read_Title_Record(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    sheet.title_cleared = 0;
    const bool good = Read_Text_Block(reading.source, sheet.title_lines, sheet.title_line_count);
    sheet.title_bytes = static_cast<std::int32_t>(sheet.title_lines.size());
    return good;
}

bool Read_Current_Cell_Record(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t column;
    std::int32_t row;
    if (!reading.source.Read(column, row))
        return false;
    sheet.current_column = std::clamp(column, 1, std::max(sheet.column_count, 1));
    sheet.current_row = std::clamp(row, 1, std::max(sheet.row_count, 1)) - 1;
    return true;
}

bool Read_Pointer_Record(Book_Reading& reading)
{
    Book_Source& source = reading.source;
    Host_Pointer pointer;
    std::uint8_t kind;
    std::int32_t members = 0;
    if (!source.Read(kind) || (kind > Greatest_Pointer_Kind && !source.Corrupt())
        || source.Read_Short_Text(&pointer.name, Name_Width) < 0)
        return false;
    pointer.kind = kind;
    if (kind == 0 && (!source.Read(members) || (members < 0 && !source.Corrupt())))
        return false;
    for (std::int32_t i = 0; i < members; ++i)
        if (source.Read_Short_Text(&pointer.members.emplace_back(), Name_Width) < 0)
            return false;
    reading.sheet->pointers.push_back(std::move(pointer));
    return true;
}

bool Read_DDE_Record(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    for (std::string* const text : {&sheet.dde_topic, &sheet.dde_source, &sheet.dde_item, &sheet.dde_extra})
        if (!reading.source.Read_Long_Text(*text, text->max_size()))
            return false;
    std::uint8_t flag;
    for (std::int16_t& kept : sheet.dde_flags) {
        if (!reading.source.Read(flag))
            return false;
        kept = flag;
    }
    return reading.source.Read(flag);
}

bool Read_Split_Record(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    std::int32_t column;
    if (!reading.source.Read(column))
        return false;
    sheet.split_set = 1;
    sheet.split_column = std::clamp(column, 1, std::max(sheet.column_count, 1));
    return true;
}

namespace {

/// False when rows that were put off could not be made.
bool Restrict_Rows(Sheet& sheet, const std::string& bits)
{
    if (std::ranges::count(bits, '\0') == std::ssize(bits))
        return true;
    if (!Need_Rows(&sheet))
        return false;
    std::size_t at = 0;
    sheet.restricted_rows = 0;
    for (Row_Node* row = sheet.first_row; row != nullptr; row = row->next, ++at) {
        row->restricted = static_cast<unsigned char>(bits[at / 8]) >> at % 8 & 1;
        sheet.restricted_rows += row->restricted;
    }
    sheet.restriction_active = sheet.restricted_rows > 0;
    return true;
}

}  // namespace

bool Read_Restriction(Book_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    Saved_Restriction restriction;
    std::int32_t rows;
    if (reading.source.Read_Short_Text(&restriction.name, Name_Width) < 0 || !reading.source.Read(rows))
        return false;
    if (rows != sheet.row_count)
        return reading.source.Corrupt("Restriction does not match sheet length");
    const std::int64_t size = Bit_Vector_Size(rows);
    if (!reading.source.Read_Bytes(size, static_cast<std::size_t>(size), restriction.bits))
        return false;
    if (restriction.name.empty())
        return Restrict_Rows(sheet, restriction.bits)
               || Not_Loaded(reading, "Could not create column in Reading Tabulon Book");
    restriction.bits.resize(static_cast<std::size_t>(rows) / 8 + 1);  // as the Sheet holds it
    sheet.saved_restrictions.push_back(std::move(restriction));
    return true;
}

bool Read_Hidden_Map(Book_Reading& reading)
{
    const std::int64_t size = reading.source.Record().length;
    if (size != reading.stored_columns)
        reading.Note("Hidden column array does not match number of columns in sheet");
    return reading.source.Read_Bytes(size, static_cast<std::size_t>(size), reading.hidden_map);
}

bool Read_Sheet_IPRINT(Book_Reading& reading)
{
    std::uint8_t iprint;
    if (!reading.source.Read(iprint))
        return false;
    reading.sheet->iprint = iprint;
    return iprint <= Greatest_IPRINT || reading.source.Corrupt();
}

namespace {

void Drop_Cell(const Column& column, Cell_Node& cell)
{
    if (Is_Text_Like(column.type))
        cell.value.text = Text_Arena::Empty();
    else
        cell.value.number = column.sheet->missing_value;
}

/// Sorts the cells, by the rows that a selection has left them; some are gone with theirs.
void Settle_Dropped_Cells(Book_Reading& reading)
{
    constexpr auto all_rows = std::numeric_limits<std::int32_t>::max();
    auto& cells = reading.dropped_cells;
    const Row_Selection rows{request.Subset_Rows && !reading.in_sheet, request.Subset_Row_Flags};
    if (rows.active) {
        const std::vector<std::int32_t> places = rows.New_Rows(all_rows);
        std::erase_if(cells, [&](auto& cell) {
            const bool listed = cell.second < std::ssize(places);
            cell.second = listed ? places[static_cast<std::size_t>(cell.second)] : -1;
            return cell.second < 0;
        });
    }
    std::ranges::sort(cells);
}

}  // namespace

void Drop_Cells(Book_Reading& reading)
{
    if (reading.dropped_cells.empty())
        return;
    Settle_Dropped_Cells(reading);
    const Column* swept = nullptr;
    Cell_Node* cell = nullptr;
    std::int32_t at = 0;
    for (const auto& [place, row] : reading.dropped_cells) {
        Column* const column = reading.columns[place];
        if (column == nullptr)
            continue;
        if (column != swept) {
            swept = column;
            cell = column->first_cell;
            at = First_Row_Of(*column);
        }
        for (; cell != nullptr && at < row; ++at)
            cell = cell->next;
        if (cell != nullptr && at == row)
            Drop_Cell(*column, *cell);
    }
    reading.dropped_cells.clear();
}

bool Read_Cell_Comment(Book_Reading& reading)
{
    constexpr std::size_t kept = 100;
    constexpr std::int64_t number = sizeof(std::int32_t);
    Book_Source& source = reading.source;
    std::int32_t row;
    std::int32_t column;
    std::int32_t marker;
    std::int32_t length = 0;
    std::string text;
    if (!source.Skip(number) || !source.Read(row, column) || !source.Skip(2 * number) || !source.Read(marker)
        || (marker > 0 && !source.Read(length)) || (length > 0 && !source.Read_Letters(length, kept, text)))
        return false;
    const bool has_cell = row >= 1 && column >= 1 && column <= std::ssize(reading.columns);
    if (request.Replace_Book_Data && has_cell && text.starts_with("*M"))
        reading.dropped_cells.emplace_back(static_cast<std::size_t>(column) - 1, row - 1);
    return true;
}

}  // namespace ingester

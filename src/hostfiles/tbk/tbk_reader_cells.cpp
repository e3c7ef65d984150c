// The records of a column's cells, and of what a Factor's cells stand for.
#include "hostfiles/tbk/tbk_reader.h"
#include "model/cell_appender.h"
#include "model/factors.h"
#include "model/names.h"
#include "support/text.h"

#include <algorithm>
#include <cmath>

namespace ingester {

// --- Cells -------------------------------------------------------------------------------------------

namespace {

/// The one record of a column's cells begins with their number.
bool Start_Cells(Book_Reading& reading, const char* fault)
{
    std::int32_t length;
    if (reading.has_cells)
        return reading.source.Corrupt();
    reading.has_cells = true;
    return reading.source.Read(length) && (length == reading.stored_length || reading.source.Corrupt(fault));
}

/// A Symmetric Matrix may be stored in full; what stands above the diagonal stands below it as well.
std::int32_t Cells_Above(const Book_Reading& reading)
{
    const Column& column = *reading.column;
    return std::max(reading.stored_length - Cells_For_Rows(column, reading.sheet->row_count), 0);
}

}  // namespace

bool Read_Column_Decimals(Book_Reading& reading)
{
    std::uint8_t decimals;
    if (!reading.source.Read(decimals))
        return false;
    reading.column->decimals = decimals;
    return decimals <= Greatest_Record_Decimals || reading.source.Corrupt();
}

bool Read_Number_Record(Book_Reading& reading)
{
    constexpr std::int32_t numbers_at_once = Book_Source::Bytes_At_Once / sizeof(double);
    constexpr auto size = static_cast<std::int64_t>(sizeof(double));
    Book_Source& source = reading.source;
    if (!Start_Cells(reading, nullptr))
        return false;
    if (source.Left() != size * reading.stored_length)
        return source.Corrupt();
    const std::int32_t above = Cells_Above(reading);
    std::int32_t left = reading.stored_length - above;
    if (!source.Skip(size * above))
        return false;
    // No more room is made at first than the file can fill.
    Cell_Appender cells(*reading.column, std::min<std::int64_t>(left, source.Size() / size), &reading.ahead);
    while (left > 0) {
        const std::int32_t count = std::min(left, numbers_at_once);
        const std::byte* bytes = source.Take(static_cast<std::size_t>(count) * sizeof(double));
        if (bytes == nullptr)
            return false;
        for (std::int32_t i = 0; i < count; ++i, bytes += sizeof(double))
            cells.Append({.number = Number_At<double>(bytes, source.Order())});
        left -= count;
    }
    cells.Finish(reading.stored_length - above);
    return true;
}

bool Read_Text_Record(Book_Reading& reading)
{
    Book_Source& source = reading.source;
    Column& column = *reading.column;
    std::uint8_t widest;
    if (!Start_Cells(reading, "Text items do not match specified number of rows") || !source.Read(widest))
        return false;
    Cell_Appender cells(column, std::min<std::int64_t>(reading.stored_length, source.Left()));
    std::string room;
    for (std::int32_t row = 0; row < reading.stored_length; ++row) {
        std::uint8_t length;
        const std::byte* const bytes = source.Read(length) ? source.Take(length) : nullptr;
        if (bytes == nullptr)
            return false;
        if (length > Text_Cell_Width)
            reading.Note("Text column truncated");
        else if (length > widest)
            reading.Note("Text column length exceeds specified maximum");
        const std::size_t kept = std::min<std::size_t>(length, Text_Cell_Width);
        const std::string_view text = From_Host({reinterpret_cast<const char*>(bytes), kept}, room);
        cells.Append({.text = column.texts.Store(text)});
        column.nlevels = std::max(column.nlevels, static_cast<std::int32_t>(kept));
    }
    cells.Finish(reading.stored_length);
    return true;
}

bool Read_Long_Text_Record(Book_Reading& reading)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(std::int32_t));
    Book_Source& source = reading.source;
    Column& column = *reading.column;
    std::int32_t widest;
    if (!Start_Cells(reading, "Text items do not match specified number of rows") || !source.Read(widest))
        return false;
    Cell_Appender cells(column, std::min<std::int64_t>(reading.stored_length, source.Left() / size));
    std::string text;
    for (std::int32_t row = 0; row < reading.stored_length; ++row) {
        std::int32_t length;
        if (!source.Read(length))
            return false;
        if (length < 0)
            return source.Corrupt("Text length is negative");
        if (!source.Read_Letters(length, Long_Text_Width, text))
            return false;
        if (length > static_cast<std::int32_t>(Long_Text_Width)) {
            static const std::string fault =
                Format_Text("Text column truncated at %li characters", static_cast<long>(Long_Text_Width));
            reading.Note(fault.c_str());
        } else if (length > widest) {
            reading.Note("Text column length exceeds specified maximum for column");
        }
        cells.Append({.text = column.texts.Store(text)});
        column.nlevels = Wider(column.nlevels, text);
    }
    cells.Finish(reading.stored_length);
    return true;
}

// --- Factors -----------------------------------------------------------------------------------------

namespace {

/// Levels and length together tell how the cells are packed; null when nothing fits.
const Factor_Packing* Packing_Of(const Book_Reading& reading)
{
    const std::int64_t levels = Levels_Of_Cells(*reading.column);
    for (const Factor_Packing& packing : Factor_Packings)
        if (levels < packing.below
            && reading.source.Record().length == Factor_Record_Length(packing, reading.stored_length))
            return &packing;
    return nullptr;
}

class Cell_Unpacker {
public:
    Cell_Unpacker(Book_Source& source, const Factor_Packing& packing) : source_(&source), bits_(packing.bits)
    {}

    [[nodiscard]] bool Next(std::uint32_t& code)
    {
        constexpr int byte = 8;
        if (bits_ > byte)
            return bits_ == 16 ? Read<std::uint16_t>(code) : source_->Read(code);
        if (held_bits_ == 0) {
            if (!Read<std::uint8_t>(held_))
                return false;
            held_bits_ = byte;
        }
        code = held_ & ((1U << bits_) - 1);
        held_ >>= bits_;
        held_bits_ -= bits_;
        return true;
    }

private:
    template <class T> [[nodiscard]] bool Read(std::uint32_t& code)
    {
        T word;
        if (!source_->Read(word))
            return false;
        code = word;
        return true;
    }

    Book_Source* source_;
    int bits_;
    std::uint32_t held_ = 0;
    int held_bits_ = 0;
};

bool Read_Packed_Cells(Book_Reading& reading, const Factor_Packing& packing)
{
    constexpr int byte = 8;
    Book_Source& source = reading.source;
    Column& column = *reading.column;
    const std::int64_t levels = Levels_Of_Cells(column);
    Cell_Unpacker unpacker(source, packing);
    Cell_Appender cells(column,
                        std::min<std::int64_t>(reading.stored_length, source.Size() * byte / packing.bits));
    std::uint32_t code;
    for (std::int32_t row = 0; row < reading.stored_length; ++row) {
        if (!unpacker.Next(code))
            return false;
        const bool level = code >= 1 && code <= levels;
        cells.Append({.number = level ? static_cast<double>(code) : column.sheet->missing_value});
    }
    cells.Finish(reading.stored_length);
    return source.Skip(source.Left());  // the byte that no cells leave
}

}  // namespace

bool Read_Factor_Record(Book_Reading& reading)
{
    Column& column = *reading.column;
    std::uint8_t kind;
    if (!Start_Cells(reading, "Factor length does not match specified column length")
        || !reading.source.Read(column.nlevels))
        return false;
    if (column.nlevels < 1)
        return reading.source.Corrupt("Number of Factor levels are not positive");
    if (!reading.source.Read(kind))
        return false;
    const Factor_Packing* const packing = Packing_Of(reading);
    if (kind > factor_with_labels || packing == nullptr)
        return reading.source.Corrupt();
    column.factor_kind = kind;
    return Read_Packed_Cells(reading, *packing);
}

namespace {

/// A list for the levels begins with their number. Not more of it is made than the file can fill.
bool Start_List(Book_Reading& reading, std::int64_t size, const char* fault)
{
    std::int32_t count;
    if (!reading.source.Read(count))
        return false;
    if (count != reading.column->nlevels)
        return reading.source.Corrupt(fault);
    return size * count <= reading.source.Left_In_File() || reading.source.Corrupt();
}

}  // namespace

bool Read_Level_Value_Record(Book_Reading& reading)
{
    Column& column = *reading.column;
    std::uint8_t level_flag;
    if (!Start_List(reading, sizeof(double), "Factor levels do not match specified number of ordinals")
        || !reading.source.Read(level_flag) || !Make_Level_Values(column, column.nlevels))
        return false;
    for (Level_Node* node = column.level_values; node != nullptr; node = node->next)
        if (!reading.source.Read(node->value.number))
            return false;
    return true;
}

bool Read_Label_Record(Book_Reading& reading)
{
    Column& column = *reading.column;
    std::uint8_t widest;
    std::string label;
    if (!Start_List(reading, 1, "Factor labels do not match specified number of ordinals")
        || !reading.source.Read(widest) || !Make_Labels(column, column.nlevels))
        return false;
    column.label_width = widest;
    for (Level_Node* node = column.labels; node != nullptr; node = node->next) {
        const std::int32_t length = reading.source.Read_Short_Text(&label, Long_Label_Width);
        if (length < 0)
            return false;
        if (length > static_cast<std::int32_t>(Long_Label_Width))
            reading.Note("Factor labels truncated");
        node->value.text = column.texts.Store(label);
        column.label_width = Wider(column.label_width, label);
    }
    return true;
}

bool Read_Reference_Level(Book_Reading& reading)
{
    std::int32_t level;
    if (!reading.source.Read(level))
        return false;
    if (level >= 1 && level <= reading.column->nlevels)
        reading.column->reference_level = level;
    return true;
}

bool Read_Factor_Colour_Record(Book_Reading& reading)
{
    Column& column = *reading.column;
    if (reading.source.Left() != std::int64_t{4} * column.nlevels)
        return reading.source.Corrupt();
    column.factor_colours.clear();
    for (std::int32_t i = 0; i < column.nlevels; ++i)
        if (!reading.source.Read(column.factor_colours.emplace_back()))
            return false;
    reading.origins.back() = static_cast<std::int32_t>(reading.columns.size());
    return true;
}

namespace {

/// The lists of an old Factor, which are passed over.
bool Skip_Old_Lists(Book_Source& source, std::int32_t values, std::int32_t labels)
{
    constexpr std::uint8_t most_kinds = 2;
    constexpr std::uint8_t most_decimals = 20;
    std::uint8_t byte;
    if (!source.Read(byte) || (byte > most_kinds && !source.Corrupt()))
        return false;
    if (values > 0
        && (!source.Read(byte) || (byte > most_decimals && !source.Corrupt())
            || !source.Skip(std::int64_t{8} * values)))
        return false;
    if (labels > 0 && !source.Read(byte))
        return false;
    for (std::int32_t i = 0; i < labels; ++i)
        if (source.Read_Short_Text(nullptr, 0) < 0)
            return false;
    return true;
}

/// Numbers that became levels may be none.
void Keep_Levels_Only(Column& column)
{
    const auto most = static_cast<double>(Levels_Of_Cells(column));
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const double level = cell->value.number;
        if (!(level >= 1.0 && level <= most && level == std::floor(level)))
            cell->value.number = column.sheet->missing_value;
    }
}

}  // namespace

bool Read_Old_Factor(Book_Reading& reading)
{
    Book_Source& source = reading.source;
    Column& column = *reading.column;
    std::uint8_t byte;
    std::uint8_t type;
    std::string name;
    std::string extra;
    std::int32_t levels;
    std::int32_t values;
    std::int32_t labels;
    if (source.Read_Short_Text(nullptr, 0) < 0 || !source.Read(byte, type)
        || source.Read_Short_Text(&name, Name_Width) < 0 || source.Read_Short_Text(&extra, Extra_Width) < 0
        || !source.Skip(2) || !source.Read(levels, values, labels))
        return false;
    const bool sheet_may = reading.sheet->type == vector_sheet || reading.sheet->type == table_sheet;
    const bool cells_may = !reading.has_cells || !Is_Text_Like(column.type);
    if (type != factor_column || !sheet_may || !cells_may || levels < 1 || (values != 0 && values != levels)
        || (labels != 0 && labels != levels))
        return source.Corrupt();
    if (!Skip_Old_Lists(source, values, labels))
        return false;
    Set_Column_Type(column, factor_column);
    column.name = Make_Valid_Name(name);
    column.extra = extra;
    column.nlevels = levels;
    if (reading.has_cells)
        Keep_Levels_Only(column);
    return true;
}

}  // namespace ingester

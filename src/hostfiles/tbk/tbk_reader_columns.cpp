// The records of a column beside its cells.
#include "hostfiles/tbk/tbk_reader.h"
#include "model/names.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <iterator>

namespace ingester {

namespace {

// --- The start of a column ---------------------------------------------------------------------------

struct Column_Facts {
    std::int8_t type;
    std::int32_t length;
    std::string name;
    std::uint8_t format, width, justify, date_format, date_form, protected_column, extra_flag;
};

bool Read_Column_Facts(Book_Source& source, Column_Facts& facts)
{
    if (!source.Read(facts.type, facts.length) || source.Read_Short_Text(&facts.name, Name_Width) < 0)
        return false;
    facts.name.resize(std::min(facts.name.find('\0'), facts.name.size()));
    return source.Read(facts.format, facts.width, facts.justify, facts.date_format, facts.date_form,
                       facts.protected_column, facts.extra_flag);
}

bool Is_Known_Type(std::int32_t type)
{
    return type == units_text_column || type == units_variate_column
           || (type >= scalar_column && type <= table_column) || type == table_margin_column
           || type == long_text_column;
}

struct Type_Rule {
    std::int32_t sheet;
    bool (*allows)(std::int32_t type);
    bool units;  ///< among the first two columns
    const char* fault;
};

constexpr Type_Rule Type_Rules[] = {
    {vector_sheet,
     [](std::int32_t type) {
         return type == factor_column || type == variate_column || type == units_variate_column
                || Is_Text_Like(type);
     },
     false, "Illegal column type found in Vector sheet"},
    {matrix_sheet, [](std::int32_t type) { return type == matrix_column; }, true,
     "Illegal column type found in Matrix sheet"},
    {symmetric_matrix_sheet, [](std::int32_t type) { return type == symmetric_matrix_column; }, true,
     "Illegal column type found in Symmetric Matrix sheet"},
    {diagonal_matrix_sheet, [](std::int32_t type) { return type == diagonal_matrix_column; }, true,
     "Illegal column type found in Diagonal Matrix sheet"},
    {table_sheet,
     [](std::int32_t type) {
         return type == factor_column || type == table_column || type == table_margin_column;
     },
     false, "Illegal column type found in Table sheet"},
    {scalar_sheet, [](std::int32_t type) { return type == scalar_column; }, false,
     "Non-Scalar column found in Scalar sheet"},
};

/// Why a column of this type can't stand here; null when it can.
const char* Fault_Of_Type(const Book_Reading& reading, std::int32_t type)
{
    constexpr std::size_t first_columns = 2;
    if (!Is_Known_Type(type))
        return "Invalid Column Type in Reading Tabulon Book";
    const auto* const rule = std::ranges::find(Type_Rules, reading.sheet->type, &Type_Rule::sheet);
    const bool units = type < 0 && rule->units && reading.columns.size() < first_columns;
    return units || rule->allows(type) ? nullptr : rule->fault;
}

bool Length_Fits(const Book_Reading& reading, const Column_Facts& facts)
{
    const Sheet& sheet = *reading.sheet;
    const std::int64_t from_diagonal =
        std::int64_t{sheet.leading_columns} - std::ssize(reading.columns) + sheet.row_count - 1;
    return facts.length == sheet.row_count
           || (facts.type == symmetric_matrix_column && facts.length >= 0 && facts.length == from_diagonal);
}

/// A column of a Sheet with labels has one in the book; where it doesn't, its place is its name.
std::string Name_In_Sheet(const Book_Reading& reading, const Column_Facts& facts)
{
    const Sheet& sheet = *reading.sheet;
    const bool cleaned_later = facts.type != table_column && facts.type != table_margin_column;
    if (Has_Identifiers(sheet))
        return cleaned_later ? facts.name : Make_Valid_Name(facts.name);
    return facts.name.empty() ? std::to_string(reading.columns.size() + 1) : facts.name;
}

void Set_Display(Column& column, const Column_Facts& facts)
{
    constexpr std::int32_t least_width = 2;
    constexpr std::int32_t greatest_width = 80;
    constexpr std::int32_t date_codes = 41;
    constexpr std::int32_t usual_date = 9;
    const bool known_format = facts.format >= significant_digits_format && facts.format <= date_format_mark;
    if (known_format)
        column.format = facts.format;
    column.width = facts.width == 0 ? 0 : std::clamp(std::int32_t{facts.width}, least_width, greatest_width);
    column.justify = facts.justify > centred ? std::int32_t{default_side} : facts.justify;
    column.date_format = facts.date_format >= date_codes ? usual_date : facts.date_format;
    column.date_form = facts.date_form;
    column.protected_column = facts.protected_column;
    column.extra_flag = facts.extra_flag;
}

/// What a Table's column is labelled by, and the level that it stands for.
void Set_Table_Labels(Column& column)
{
    if (!Is_Labelled_Table_Column(column))
        return;
    Sheet& sheet = *column.sheet;
    column.table_margin_value = column.index - sheet.leading_columns + 1;
    if (sheet.label_state == labels_by_level) {
        const std::string_view name = column.name;
        const Parsed_Number parsed = Parse_Number(name.data(), name.data() + name.size());
        if (parsed.status == Number_Status::good)
            column.table_margin_value = parsed.value;
    } else if (sheet.label_state == labels_by_text || sheet.label_state == labels_by_text_and_level) {
        sheet.labelled_columns = 1;
        column.table_label = column.name;
    }
}

bool Column_Not_Created(Book_Reading& reading)
{
    const std::int32_t limit = request.Max_Columns;
    if (reading.sheet->column_count < limit)
        return Not_Loaded(reading, "Could not create column in Reading Tabulon Book");
    const std::string fault =
        Format_Text("Maximum number of columns (%li) exceeded.\nIncrease the column limit in Tools | "
                    "Spreadsheet Options",
                    static_cast<long>(limit));
    return Not_Loaded(reading, fault.c_str());
}

}  // namespace

bool Start_Column(Book_Reading& reading)
{
    Column_Facts facts;
    if (!Read_Column_Facts(reading.source, facts))
        return false;
    if (const char* const fault = Fault_Of_Type(reading, facts.type))
        return reading.source.Corrupt(fault);
    if (!Length_Fits(reading, facts))
        return reading.source.Corrupt("Invalid number of rows in column");
    Column* const column = New_Column(reading.sheet, facts.type, Name_In_Sheet(reading, facts));
    if (column == nullptr)
        return Column_Not_Created(reading);
    const std::size_t place = reading.columns.size();
    reading.columns.push_back(column);
    reading.origins.push_back(0);
    reading.column = column;
    reading.stored_length = facts.length;
    reading.has_cells = false;
    reading.in_column = true;
    if (facts.type == diagonal_matrix_column)
        reading.sheet->structure_name = column->name = Make_Valid_Name(facts.name);
    if (facts.type == factor_column)
        column->nlevels = 2;
    Set_Display(*column, facts);
    Set_Table_Labels(*column);
    column->hidden = place < reading.hidden_map.size() && reading.hidden_map[place] != '\0';
    return true;
}

// --- The end of a column -----------------------------------------------------------------------------

namespace {

/// A column without a record of its cells has missing ones.
bool Fill_Blank(Book_Reading& reading)
{
    Column& column = *reading.column;
    const std::int32_t length = Cells_For_Rows(column, reading.sheet->row_count);
    if (reading.has_cells)
        return true;
    reading.blank_cells -= length;
    return (reading.blank_cells >= 0 && Fill_Column(&column, column.type, length, column.nlevels, {}))
           || Not_Loaded(reading, "Could not create column in Reading Tabulon Book");
}

/// A Factor prints as what it has a list for.
void Settle_Factor(Column& column)
{
    if (column.type != factor_column)
        return;
    if (column.label_count != column.nlevels)
        Free_Cell_Nodes(&column, label_nodes);
    if (column.level_values_count != column.nlevels)
        Free_Cell_Nodes(&column, level_value_nodes);
    if (column.factor_kind == factor_with_labels && column.label_count == 0)
        column.factor_kind = factor_with_levels;
    if (column.factor_kind == factor_with_levels && column.level_values_count == 0)
        column.factor_kind = plain_factor;
}

}  // namespace

bool End_Column(Book_Reading& reading)
{
    constexpr std::int32_t least_width = 2;
    Column& column = *reading.column;
    reading.in_column = false;
    if (!Fill_Blank(reading))
        return false;
    Settle_Factor(column);
    if (column.width < least_width)
        Compute_Column_Width(&column);
    const auto ordinal = static_cast<std::int32_t>(reading.columns.size());
    column.input_place = request.Subset_Columns ? ordinal : 0;
    // The rows and columns of a Symmetric Matrix go together, when all are there.
    if (request.Subset_Columns && reading.sheet->type != symmetric_matrix_sheet
        && !Is_Column_Selected(reading.subset, ordinal, column.name)) {
        reading.columns.back() = nullptr;
        Delete_Column(&column, false);
    }
    reading.column = nullptr;
    return true;
}

// --- What the host's window keeps --------------------------------------------------------------------

bool Read_Attached_Text(Book_Reading& reading)
{
    constexpr std::uint8_t most_modes = 2;
    Column& column = *reading.column;
    std::uint8_t mode;
    if (!reading.source.Read(mode) || (mode > most_modes && !reading.source.Corrupt())
        || !reading.source.Read_Long_Text(column.attached_text, column.attached_text.max_size()))
        return false;
    column.attached_mode = mode;
    return true;
}

bool Read_Column_Extra(Book_Reading& reading)
{
    std::string extra;
    const std::int32_t length = reading.source.Read_Short_Text(&extra, Extra_Width);
    if (length < 0)
        return false;
    if (length > static_cast<std::int32_t>(Extra_Width))
        reading.Note("Column extra truncated");
    reading.column->extra = extra;
    return true;
}

bool Read_Range_Record(Book_Reading& reading)
{
    return reading.source.Read(reading.column->range_low, reading.column->range_high);
}

bool Read_Gradient_Record(Book_Reading& reading)
{
    Column& column = *reading.column;
    std::uint8_t scale;
    std::uint8_t reversed;
    if (!reading.source.Read(scale, reversed, column.gradient_low, column.gradient_high,
                             column.gradient_strength))
        return false;
    column.gradient_scale = scale;
    column.gradient_reversed = reversed;
    return true;
}

bool Read_Condition_Record(Book_Reading& reading)
{
    Column& column = *reading.column;
    for (std::size_t rule = 0; rule < Condition_Count; ++rule) {
        std::uint8_t op;
        if (!reading.source.Read(op, column.cond_value[rule], column.cond_colour[rule]))
            return false;
        column.cond_op[rule] = op;
    }
    column.cond_active = 1;
    return true;
}

bool Read_Column_Option(Book_Reading& reading)
{
    std::uint8_t option;
    if (!reading.source.Read(option))
        return false;
    reading.column->column_option = option;
    return true;
}

bool Read_Table_Level(Book_Reading& reading)
{
    return reading.source.Read(reading.column->table_margin_value);
}

bool Read_Cell_Colour_Record(Book_Reading& reading)
{
    constexpr auto size = static_cast<std::int64_t>(sizeof(Cell_Colour));
    Column& column = *reading.column;
    std::int32_t count;
    if (!reading.source.Read(count))
        return false;
    if (count < 1 || count > Cells_For_Rows(column, reading.sheet->row_count))
        return reading.source.Corrupt("Invalid number of coloured cells in column");
    if (reading.source.Left() != size * count)
        return reading.source.Corrupt();
    column.cell_colours.clear();
    for (std::int32_t i = 0; i < count; ++i) {
        Cell_Colour& colour = column.cell_colours.emplace_back();
        if (!reading.source.Read(colour.row, colour.text_colour, colour.back_colour))
            return false;
    }
    return true;
}

bool Read_Column_IPRINT(Book_Reading& reading)
{
    std::uint8_t iprint;
    if (!reading.source.Read(iprint))
        return false;
    reading.column->iprint = iprint;
    return iprint <= Greatest_IPRINT || reading.source.Corrupt();
}

bool Read_Colour_Source(Book_Reading& reading)
{
    return reading.source.Read(reading.origins.back());
}

bool Read_Column_Colour_Record(Book_Reading& reading)
{
    return reading.source.Read(reading.column->text_colour, reading.column->back_colour);
}

}  // namespace ingester

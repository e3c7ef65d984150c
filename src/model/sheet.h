// The one in-memory picture of tabular data: Sheets of Columns of cells.
//
// Handles (Sheet*, Column*, Cell_Node*) never own. A request owns its Sheets, `Free_Sheets` ends
// them. Every operation takes null handles and then returns its failure value.
#pragma once

#include "model/cells.h"
#include "model/host_fields.h"
#include "model/spellings.h"
#include "request/settings.h"
#include "support/fixed_text.h"

#include <cstdint>
#include <memory>
#include <span>
#include <string>
#include <string_view>
#include <vector>

namespace ingester {

/// The number that means "missing" (bits FFAC7B1F3CAC7433). A number is present when it is greater
/// than its Sheet's `missing_value`, which starts as this.
constexpr double Missing_Value = -1e307;

/// Numbers beyond are cut down to it.
constexpr double Greatest_Number = 9.99999e307;

constexpr std::size_t Name_Width = 60;
constexpr std::size_t Extra_Width = 80;
constexpr std::size_t Text_Cell_Width = 90;
constexpr std::size_t Long_Text_Width = 10000;

enum Sheet_Type : std::int32_t {
    vector_sheet = 1,
    matrix_sheet = 2,
    symmetric_matrix_sheet = 3,
    diagonal_matrix_sheet = 4,
    table_sheet = 5,
    scalar_sheet = 6,
};

enum Column_Type : std::int32_t {
    units_variate_column = -4,
    units_text_column = -3,
    row_column = 0,
    scalar_column = 1,
    factor_column = 2,
    text_column = 3,
    variate_column = 4,
    matrix_column = 5,
    diagonal_matrix_column = 6,
    symmetric_matrix_column = 7,
    table_column = 8,
    table_margin_column = 22,
    long_text_column = 33,
    unbuffered_text_column = 34,  ///< asked of `New_Data_Column` only: Text whose cells are null
};

/// How a number prints.
enum Number_Format : std::int32_t {
    significant_digits_format = 1,
    exponent_format = 2,
    fixed_format = 3,
    general_format = 4,
    date_format_mark = 5,
};

enum Justification : std::int32_t { default_side = 0, left_side = 1, right_side = 2, centred = 3 };

/// What a Factor's cell prints as.
enum Factor_Kind : std::int32_t { plain_factor = 0, factor_with_levels = 1, factor_with_labels = 2 };

/// How the columns of a Matrix or a Table, and the rows of a Matrix, are labelled.
enum Label_State : std::int32_t {
    labels_by_position = 0,
    labels_by_level = 1,
    labels_by_text = 2,
    labels_by_text_and_level = 3,
};

/// Text-like cells hold texts, all others numbers.
[[nodiscard]] constexpr bool Is_Text_Like(std::int32_t type)
{
    return type == text_column || type == units_text_column || type == long_text_column
           || type == unbuffered_text_column;
}

struct Sheet;

struct Column : Column_Host_Fields {
    Column* next = nullptr;
    Column* prev = nullptr;
    std::int32_t type = variate_column;
    Sheet* sheet = nullptr;
    Fixed_Text<Name_Width> name;
    Fixed_Text<Extra_Width> extra;                ///< the long description
    Block_Table blocks;                           ///< owns the cells
    Text_Arena texts;                             ///< owns the texts of cells and labels
    std::unique_ptr<Number_Spellings> spellings;  ///< of numbers that came from a text; null: as they print
    std::int32_t changed_display = 0;
    std::int32_t index = 0;        ///< 0 for the `Row` column, then 1, 2, ...
    std::int32_t input_place = 0;  ///< `index` before some columns were left out; 0: none were
    std::string input_name;        ///< where the input spells the name in another way
    std::int32_t length = 0;       ///< number of cells
    std::int32_t decimals = -1;    ///< -1: not set
    std::int32_t width = 0;        ///< display width, see `Compute_Column_Width`
    std::int32_t text_cell_width = Text_Cell_Width;
    std::int32_t cursor_index = -1;  ///< remembered position of `Cell_At`, -1: none
    double table_margin_value = 0;   ///< type 8: what stands for the margin
    double range_low = 0;
    double range_high = 0;
    std::int32_t format = significant_digits_format;
    std::int32_t justify = default_side;
    std::int16_t range_selected = 0;  ///< a writer keeps marked columns only
    std::int16_t modified = 0;
    std::int16_t all_empty = 1;
    std::int16_t protected_column = 0;  ///< not deleted as empty; `Convert_Column` leaves it
    std::int16_t date_form = 0;         ///< 0 spreadsheet serials, 1 day count
    std::int32_t date_format = 1;
    Cell_Node* first_cell = nullptr;
    Cell_Node* last_cell = nullptr;
    Cell_Node* cursor_node = nullptr;
    std::int32_t nlevels = 0;  ///< levels of a Factor; greatest width of a text-like column
    std::int32_t level_values_count = 0;
    std::int32_t label_count = 0;
    std::int32_t label_width = 0;
    Level_Node* level_values = nullptr;
    Level_Node* labels = nullptr;
    std::int32_t factor_kind = plain_factor;
    Block_Table label_blocks;
    Block_Table level_blocks;
};

/// The text that labels a Table's column.
[[nodiscard]] inline std::string_view Label_Text(const Column& column)
{
    return column.table_label.empty() ? column.name.view() : column.table_label.view();
}

struct Sheet : Sheet_Host_Fields {
    std::int32_t type = vector_sheet;
    Column* first_column = nullptr;
    Column* last_column = nullptr;
    Column* cursor_column = nullptr;
    Row_Node* first_row = nullptr;
    Row_Node* last_row = nullptr;
    Row_Node* cursor_row = nullptr;
    std::int32_t label_state = labels_by_position;  ///< also -1: comes from a Matrix
    Settings settings;
    std::string title_lines;  ///< title and comment lines, a NUL behind each
    std::int32_t title_line_count = 0;
    std::int32_t title_bytes = 0;
    Fixed_Text<Name_Width> structure_name;
    Fixed_Text<Name_Width> row_label_name;
    Fixed_Text<Extra_Width> column_label_name;
    Fixed_Text<280> source_file;
    Fixed_Text<Text_Cell_Width> margin_label = "Margin";
    std::int32_t format_version = 0;
    std::int32_t column_count = 0;  ///< without the `Row` column
    std::int32_t row_count = 0;
    std::int32_t restricted_rows = 0;
    std::int32_t leading_columns = 0;  ///< columns at the head that are not data
    std::int32_t current_column = 1;
    std::int32_t current_row = 0;
    std::int32_t top_row = 0;
    std::int32_t table_ways = 0;
    std::int32_t cursor_column_index = -1;
    std::int32_t cursor_row_index = -1;
    std::int16_t restriction_active = 0;
    std::int16_t modified = 0;
    std::int16_t saved = 0;
    std::int16_t has_margins = 0;
    std::int16_t has_table_data = 0;  ///< a Table whose body was given, so empty columns may go
    std::int16_t read_only = 0;
    bool rows_due = false;  ///< rows and `Row` cells are still to be made
    double missing_value = Missing_Value;
    Fixed_Text<32> sheet_name;
    Block_Table row_blocks;
    Block_Table shared_blocks;  ///< cells of many short columns

    Sheet() = default;
    Sheet(const Sheet&) = delete;
    Sheet& operator=(const Sheet&) = delete;
    ~Sheet();
};

/// The Sheet that readers make, stages change and writers empty.
extern Sheet* Current_Sheet;

// --- Life --------------------------------------------------------------------------------------

/// Starts a request's model: fresh `Settings`, automatic names from the beginning.
void Init_Library();

/// Ends every Sheet of the request before.
void Free_Sheets();

/// Ends one Sheet early: nobody may hold a handle to it any more.
void Free_Sheet(Sheet* sheet);

/// A private copy of the request's settings.
[[nodiscard]] Settings Copy_Settings();

/// A Vector Sheet with its `Row` column, no rows; it becomes the `Current_Sheet`.
Sheet* New_Sheet();

/// The same with `rows` rows; null when there is no room for them.
Sheet* New_Sheet_With_Rows(std::int32_t rows);

/// Makes the rows of `row_count` and numbers the `Row` column 1..N. False for no rows.
bool Setup_Rows(Sheet* sheet);

/// Gives a Sheet that has none its number of rows, and puts off making them until somebody needs
/// them: a table that only passes through never does. `Row_At`, `Cell_At` of the `Row` column and
/// all operations on rows make them by themselves; whoever walks from `first_row` calls `Need_Rows`.
void Expect_Rows(Sheet* sheet, std::int32_t rows);

/// Makes rows that were put off. False after a message, when there is no room for them.
bool Need_Rows(Sheet* sheet);

// --- Columns -----------------------------------------------------------------------------------

/// Appends a Column without cells (units columns go to the head of the data). Null at `Max_Columns`.
Column* New_Column(Sheet* sheet, std::int32_t type, std::string_view name,
                   std::int32_t text_width = Text_Cell_Width);

/// `New_Column` with `length` cells: missing numbers or empty texts.
Column* New_Data_Column(Sheet* sheet, std::int32_t type, std::string_view name, std::int32_t length);

/// Gives a Column without cells `length` of them, all holding what `text` says for `type`.
bool Fill_Column(Column* column, std::int32_t type, std::int32_t length, std::int32_t nlevels,
                 std::string_view text);

/// What `Add_Column` is asked for; the Sheet's type may overrule the type.
struct Column_Request {
    std::int32_t type = variate_column;
    std::string_view name;
    std::int32_t decimals = -1;
    std::int32_t nlevels = 0;
    std::string_view fill;
    const Level_Node* level_values = nullptr;
    std::int32_t level_values_count = 0;
    const Level_Node* labels = nullptr;
    std::int32_t label_count = 0;
};

/// Adds a Column by the rules of the Sheet's type, at `position` (from 1), before the column there
/// or, with `insert_after`, behind it. Null after a message when the type isn't allowed.
Column* Add_Column(Sheet* sheet, const Column_Request& wanted, std::int32_t position, bool insert_after);

/// The first Column of that name: outer blanks don't count, and only 32 characters do, or the 32 in
/// front of a bracketed suffix and the suffix.
[[nodiscard]] Column* Find_Column(const Sheet* sheet, std::string_view name);

[[nodiscard]] Column* Column_At(Sheet* sheet, std::int32_t index);
[[nodiscard]] Row_Node* Row_At(Sheet* sheet, std::int32_t index);
[[nodiscard]] Cell_Node* Cell_At(Column* column, std::int32_t index);

bool Unlink_Column(Column* column);
bool Insert_Column_At(Sheet* sheet, Column* column, std::int32_t index);
bool Move_Column(Sheet* sheet, std::int32_t from, std::int32_t to);
/// Changes a type that the cells already fit. A Column that begins or ceases to be a leading one goes
/// to the head or behind it.
void Set_Column_Type(Column& column, std::int32_t type);
/// Takes a Column out of its Sheet and frees it; on a Symmetric Matrix with its row.
bool Delete_Column(Column* column, bool keep_square);
bool Delete_Empty_Columns(Sheet* sheet);
/// Puts a Column of another Sheet, whose indexes then have a gap, in the place of `old`, which is freed.
void Replace_Column(Column* old, Column* column);
/// Takes `first` and the columns behind it out of their Sheet and puts them behind those of `sheet`.
void Take_Columns(Sheet* sheet, Column* first);
/// Deletes the columns whose index is below `first` or above `last`; never the `Row` column. Of a
/// Symmetric Matrix their rows go as well.
void Keep_Columns(Sheet* sheet, std::int32_t first, std::int32_t last);
/// The same for the columns whose flag, in the order of their places, is off or isn't there.
void Keep_Columns(Sheet* sheet, const std::vector<bool>& wanted);

/// Frees the cells of a list: kind 90 the level values, 91 the labels, all others the cells.
void Free_Cell_Nodes(Column* column, std::int32_t kind);

/// Names the columns of a Matrix or Symmetric Matrix by their place, as they are without labels.
void Number_Matrix_Columns(Sheet* sheet);

void Mark_Column_Changed(Column* column, bool clear_saved);

// --- Rows and cells ----------------------------------------------------------------------------

/// Rows that may be added in one go.
constexpr std::int32_t Greatest_Insertion = 33554432;

/// Add blank cells or rows before `position`, or at the end when `position` is there or beyond.
bool Insert_Cells(Column* column, std::int32_t position, std::int32_t count);
bool Insert_Row_Nodes(Sheet* sheet, std::int32_t position, std::int32_t count);
bool Insert_Rows(Sheet* sheet, std::int32_t position, std::int32_t count, bool keep_square);

/// Gives columns that end before the last row (see `has_short_columns`) the blank cells that they lack, as
/// everything that moves rows needs. False for want of memory.
[[nodiscard]] bool Fill_Short_Columns(Sheet* sheet);

bool Remove_Cell(Column* column, std::int32_t index);
/// Not the last row of a Sheet, and none of a Scalar Sheet.
bool Delete_Row(Sheet* sheet, std::int32_t index, bool keep_square);
/// Deletes the rows whose flag, in the order of the rows, is 0 or isn't there; of a Symmetric Matrix
/// their columns go as well. False when nothing would be left, or in a Scalar Sheet: then all stay.
bool Keep_Rows(Sheet* sheet, std::span<const std::int32_t> flags);

/// Mark what holds no data, and count it.
std::int32_t Find_Empty_Rows(Sheet* sheet, bool also_columns);
std::int32_t Find_Empty_Columns(Sheet* sheet, bool also_rows);

/// Keeps `text` in a text-like cell, cut at what the column's type holds, and widens `nlevels`.
void Set_Text(Column& column, Cell_Node& cell, std::string_view text);

/// Replace a Factor's list by one of `count` nodes, missing values or empty labels.
bool Make_Level_Values(Column& column, std::int32_t count);
bool Make_Labels(Column& column, std::int32_t count);

/// The row (from 0) of a column's first cell: 0, but on the diagonal in a Symmetric Matrix, whose
/// columns hold the cells from there down.
[[nodiscard]] std::int32_t First_Row_Of(const Column& column);

/// How many cells a column of `type` has in a Sheet that it would join as its last one.
[[nodiscard]] std::int32_t Cells_For_Rows(const Column& column, std::int32_t rows);

// --- Facts -------------------------------------------------------------------------------------

[[nodiscard]] inline bool Is_Present(const Sheet& sheet, double value)
{
    return value > sheet.missing_value;
}

/// Whether a cell holds data, by its column's type.
[[nodiscard]] bool Cell_Is_Present(const Column& column, const Cell_Node& cell);

/// Equal to a relative 1e-12; zeros are equal to zeros only.
[[nodiscard]] bool Doubles_Equal(double a, double b);

/// The shown name of a type, as "Matrix" or "2-way Table"; "Unknown" for none.
[[nodiscard]] std::string Sheet_Type_Name(const Sheet& sheet);
[[nodiscard]] std::string_view Column_Type_Name(const Column& column);

/// The value of level `level` (from 1): its level value, or the number itself.
[[nodiscard]] double Factor_Level_Value(const Column& column, std::int32_t level);

/// The level (from 1) whose value is nearest to `value`; 0 without level values.
[[nodiscard]] std::int32_t Nearest_Level(const Column& column, double value);

/// The widest cell as a host's file counts it: of texts the longest, kept in `nlevels`; of a Factor the
/// longest label or printed level, kept in `label_width`, and never less than the margin's label.
std::int32_t Compute_Text_Width(Column* column);

/// Sets `width` (and `nlevels` of text, `label_width` of labels) from what the cells print as.
void Compute_Column_Width(Column* column);

struct Column_Summary {
    double min;
    double max;
    double mean;
    std::int32_t missing;
};

/// Of the present values; what there is none of is the Sheet's missing value.
bool Column_Statistics(const Column* column, Column_Summary& summary);

/// Whether a column's values repeat enough for a Factor.
[[nodiscard]] bool Should_Be_Factor(const Column* column);

/// Replaces a missing value by another, wherever a numeric column holds one.
void Change_Missing_Value(Column* column, double new_value, double old_value);

/// Makes `Missing_Value` what tells missing numbers in a Sheet whose file has another marker: numbers that
/// aren't above it become that, in cells, level values and limits.
void Use_Usual_Missing_Value(Sheet& sheet);

/// The data Columns of a type; 99 stands for all types. With `only_selected` those that are marked by
/// `range_selected`.
constexpr std::int32_t Any_Column_Type = 99;
[[nodiscard]] std::int32_t Count_Columns_Of_Type(const Sheet* sheet, std::int32_t type, bool only_selected);

/// The n-th data Column of a type, from 1; null when there are fewer.
[[nodiscard]] Column* Nth_Column_Of_Type(const Sheet* sheet, std::int32_t type, std::int32_t n);

/// Adds each line of `text`, without its control characters, to the Sheet's title.
void Add_Sheet_Comment(Sheet* sheet, std::string_view text);

void Clear_Title(Sheet* sheet);

/// Gives `target` the title of `source`, behind a line that says what was done (`text`, null for none)
/// and when.
void Stamp_Title(Sheet* target, const Sheet* source, const char* text);

}  // namespace ingester

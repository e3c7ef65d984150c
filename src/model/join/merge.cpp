#include "model/join/merge.h"

#include "model/join/column_copies.h"
#include "model/join/column_index.h"
#include "model/join/merge_keys.h"
#include "model/join/merge_rows.h"
#include "model/join/refusals.h"
#include "model/names.h"
#include "model/row_fields.h"
#include "request/losses.h"
#include "request/messages.h"

#include <algorithm>
#include <deque>
#include <vector>

namespace ingester {

namespace {

/// A column of the source on its way into the target.
struct Merged_Column {
    Cell_Transfer* transfer;
    bool is_key;
    bool is_new;
};

bool Can_Be_Merged(const Merge_Request& wanted)
{
    const Sheet* const target = wanted.target;
    const Sheet* const source = wanted.source;
    if (target == nullptr || source == nullptr || target == source)
        return Fail(Nothing_To_Join);
    if (target->read_only != 0)
        return Fail(Output_Is_Read_Only);
    if (target->type == symmetric_matrix_sheet || source->type == symmetric_matrix_sheet)
        return Fail("The rows of a symmetric matrix can't be merged with others.\n");
    if (source->row_count < 1)
        return Fail(No_Rows_To_Join);
    if (target->row_count < 1)
        return Fail("The table in the output has no rows.\n");
    if (target->type == scalar_sheet)
        return Fail("You cannot add a column of that type to this spreadsheet.\n");
    if (wanted.key_count < 1 || wanted.key_count > static_cast<std::int32_t>(Most_Merge_Keys))
        return false;
    for (std::size_t key = 0; key < static_cast<std::size_t>(wanted.key_count); ++key)
        if (wanted.target_keys[key] == nullptr || wanted.source_keys[key] == nullptr)
            return false;
    return true;
}

bool Is_Source_Key(const Merge_Request& wanted, const Column* column)
{
    const auto end = wanted.source_keys.begin() + wanted.key_count;
    return std::find(wanted.source_keys.begin(), end, column) != end;
}

/// Data of one kind go into a column that is there; a Factor takes texts and numbers.
bool Fits_Into(const Column& source, const Column& target)
{
    return target.type == factor_column || Is_Text_Like(target.type) == Is_Text_Like(source.type);
}

Column* Find_Partner(Column_Index& index, const Column& source)
{
    Column* const found = index.Take(source.name);
    return found != nullptr && Fits_Into(source, *found) ? found : nullptr;
}

/// All columns of a merge. Transfers stay where they are made.
class Merged_Columns {
public:
    [[nodiscard]] bool Pair(const Merge_Request& wanted, Merge_Keys& keys)
    {
        Sheet& target = *wanted.target;
        Column_Index index(target);
        for (std::size_t key = 0; key < keys.target.size(); ++key) {
            index.Remove(*wanted.target_keys[key]);
            columns_.push_back({&keys.transfers[key], true, false});
        }
        for (const Column* source = wanted.source->first_column->next; source != nullptr;
             source = source->next) {
            if (Is_Source_Key(wanted, source))
                continue;
            Column* partner = wanted.update_columns ? Find_Partner(index, *source) : nullptr;
            const bool is_new = partner == nullptr;
            if (is_new)
                partner = Add_Column_Like(target, *source);
            if (partner == nullptr)
                return Fail("You cannot add a column of that type to this spreadsheet.\n");
            Cell_Transfer& transfer = transfers_.emplace_back();
            if (!transfer.Prepare(*partner, *source,
                                  {.tolerance = wanted.tolerance, .ignore_case = wanted.ignore_case}))
                return Fail("Column cannot merge factors %s and %s.\n", partner->name.c_str(),
                            source->name.c_str());
            columns_.push_back({&transfer, false, is_new});
        }
        return true;
    }

    [[nodiscard]] const std::vector<Merged_Column>& All() const { return columns_; }

private:
    std::deque<Cell_Transfer> transfers_;
    std::vector<Merged_Column> columns_;
};

std::vector<Cell_Value> Values_Of(const Column& column)
{
    std::vector<Cell_Value> values;
    values.reserve(static_cast<std::size_t>(std::max(column.length, 0)));
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        values.push_back(cell->value);
    return values;
}

/// Puts the blank cells that were added at a column's end where the plan wants them, and copies into those
/// that are copies.
void Spread_New_Cells(Column& column, const std::vector<Merged_Row>& plan, std::int32_t old_rows)
{
    Cell_Node* kept = column.first_cell;
    Cell_Node* fresh = Cell_At(&column, old_rows);
    Cell_Node* before = nullptr;
    for (const Merged_Row& row : plan) {
        Cell_Node*& next = row.kind == Merged_Row::Kind::kept ? kept : fresh;
        Cell_Node* const cell = next;
        next = next->next;
        if (row.kind == Merged_Row::Kind::copied)
            cell->value = before->value;
        cell->prev = before;
        if (before != nullptr)
            before->next = cell;
        before = cell;
    }
    if (before != nullptr)
        before->next = nullptr;
    column.last_cell = before;
    column.cursor_node = nullptr;
    column.cursor_index = -1;
}

void Tell_Lost_Values(const Cell_Transfer& transfer)
{
    const Column& target = transfer.Target();
    Note_Loss(Loss_Kind::label_dropped, target.name, 0, "values without an equal in the output");
    Warn("Warning: some values of %s have no equal in %s, and were not kept as they are.\n",
         transfer.Source().name.c_str(), target.name.c_str());
}

/// Writes the rows of the source into one column of the result.
void Write_Source_Rows(const Merge_Request& wanted, const Merged_Column& merged,
                       const std::vector<Merged_Row>& plan)
{
    Cell_Transfer& transfer = *merged.transfer;
    const std::vector<Cell_Value> values = Values_Of(transfer.Source());
    const bool updates = wanted.update_columns && !merged.is_key && !merged.is_new;
    Cell_Node* cell = transfer.Target().first_cell;
    for (const Merged_Row& row : plan) {
        Cell_Node& to = *cell;
        cell = cell->next;
        if (updates && row.kind == Merged_Row::Kind::copied)
            to.value = to.prev->value;  // as it is now: what an update leaves alone stays so
        const auto from = static_cast<std::size_t>(row.source);
        if (row.source < 0 || from >= values.size() || (merged.is_key && row.kind != Merged_Row::Kind::added))
            continue;
        if (updates && wanted.keep_present && Cell_Is_Present(transfer.Target(), to))
            continue;
        if (updates && wanted.skip_missing && transfer.Is_Missing(values[from]))
            continue;
        transfer.Put(to, values[from]);
    }
    if (transfer.Has_Lost())
        Tell_Lost_Values(transfer);
}

bool Add_Rows_At_End(Sheet& sheet, std::size_t count)
{
    while (count > 0) {
        const std::size_t some = std::min<std::size_t>(count, Greatest_Insertion);
        if (!Insert_Rows(&sheet, sheet.row_count, static_cast<std::int32_t>(some), false))
            return false;
        count -= some;
    }
    return true;
}

/// The margin of a Table stays its last row.
void Keep_Margin_Row_Last(const Sheet& target, std::vector<Merged_Row>& plan)
{
    if (Movable_Rows(target) < target.row_count)
        plan.push_back({Merged_Row::Kind::kept, -1});
}

/// What is kept by row numbers goes with the rows.
void Move_Fields_Of_Kept_Rows(Sheet& sheet, const std::vector<Merged_Row>& plan)
{
    std::vector<std::int32_t> new_rows;
    for (std::size_t row = 0; row < plan.size(); ++row)
        if (plan[row].kind == Merged_Row::Kind::kept)
            new_rows.push_back(static_cast<std::int32_t>(row));
    Move_Row_Fields(sheet, new_rows);
}

bool Carry_Out(const Merge_Request& wanted, const Merged_Columns& columns, std::vector<Merged_Row>& plan)
{
    constexpr std::size_t most_rows = 2147483647;
    Sheet& target = *wanted.target;
    const std::int32_t old_rows = target.row_count;
    Keep_Margin_Row_Last(target, plan);
    if (plan.size() > most_rows)
        return false;
    const std::size_t new_rows = plan.size() - static_cast<std::size_t>(old_rows);
    if (!Add_Rows_At_End(target, new_rows))
        return false;
    if (new_rows > 0)
        for (Column* column = target.first_column->next; column != nullptr; column = column->next)
            Spread_New_Cells(*column, plan, old_rows);
    if (new_rows > 0 && Has_Row_Fields(target))
        Move_Fields_Of_Kept_Rows(target, plan);
    for (const Merged_Column& merged : columns.All())
        if (!merged.is_key || new_rows > 0)
            Write_Source_Rows(wanted, merged, plan);
    return true;
}

void Finish_New_Columns(Sheet& target, const Merged_Columns& columns)
{
    bool first = true;
    for (const Merged_Column& merged : columns.All()) {
        if (!merged.is_new)
            continue;
        Column& column = merged.transfer->Target();
        Compute_Column_Width(&column);
        if (first)
            target.current_column = column.index;
        first = false;
    }
}

}  // namespace

void Clear_Restriction(Sheet* sheet)
{
    if (sheet == nullptr)
        return;
    for (Row_Node* row = sheet->first_row; row != nullptr; row = row->next)
        row->restricted = 0;
    sheet->restricted_rows = 0;
    sheet->restriction_active = 0;
}

bool Merge_Sheets(const Merge_Request& wanted)
{
    Merge_Keys keys;
    Merged_Columns columns;
    if (!Can_Be_Merged(wanted) || !Make_Merge_Keys(wanted, keys) || !columns.Pair(wanted, keys))
        return false;
    std::vector<Merged_Row> plan = Plan_Merged_Rows(wanted, keys);
    if (!Carry_Out(wanted, columns, plan))
        return false;
    Finish_New_Columns(*wanted.target, columns);
    Clear_Restriction(wanted.target);
    Make_Column_Names_Unique(wanted.target);
    return true;
}

}  // namespace ingester

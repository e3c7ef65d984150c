#include "model/join/append.h"

#include "model/column_printer.h"
#include "model/factor_lists.h"
#include "model/factors.h"
#include "model/join/cell_transfer.h"
#include "model/join/column_copies.h"
#include "model/join/column_index.h"
#include "model/join/factor_levels.h"
#include "model/join/refusals.h"
#include "model/level_tables.h"
#include "model/sort.h"
#include "model/source_column.h"
#include "request/losses.h"
#include "request/messages.h"
#include "request/people_rules.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <string>
#include <vector>

namespace ingester {

namespace {

bool Can_Be_Appended(const Sheet* target, const Sheet* source)
{
    if (target == nullptr || source == nullptr || source == target)
        return Fail(Nothing_To_Join);
    if (source->row_count < 1)
        return Fail(No_Rows_To_Join);
    if (target->type == scalar_sheet)
        return Fail("Scalars have one value each, so that no rows can go beneath them.\n");
    if (target->type == symmetric_matrix_sheet)
        return Fail("No rows can go beneath those of a symmetric matrix.\n");
    if (source->type == symmetric_matrix_sheet || source->type == diagonal_matrix_sheet)
        return Fail("The rows of a symmetric or diagonal matrix can't go beneath others.\n");
    return target->read_only == 0 || Fail(Output_Is_Read_Only);
}

/// The Factor that tells where rows came from, and its level for the new ones.
struct Source_Mark {
    Column* column = nullptr;
    double level = 0;
};

/// One more label. A Factor without any gets those that its levels print as.
bool Add_Label(Column& factor, std::string_view label)
{
    constexpr int all_digits = 15;
    char text[Number_Text_Room];
    std::vector<const char*> labels = Printed_Levels(factor, Number_Print::as_said, all_digits, factor.texts);
    labels.resize(std::min(labels.size(), static_cast<std::size_t>(factor.nlevels) - 1));
    while (std::ssize(labels) < factor.nlevels - 1) {
        const char* const end = Print_Integer(text, std::ssize(labels) + 1);
        labels.push_back(factor.texts.Store({text, static_cast<std::size_t>(end - text)}));
    }
    labels.push_back(factor.texts.Store(label));
    factor.factor_kind = factor_with_labels;
    return Put_Labels(factor, labels);
}

bool Add_Level_Value(Column& factor)
{
    std::vector<double> values = Level_Table(factor);
    values.resize(static_cast<std::size_t>(factor.nlevels), factor.nlevels);
    return Put_Level_Values(factor, values);
}

/// A Factor that is there gets one more level for the new rows.
bool Extend_Source_Column(Column& factor, const Append_Request& wanted)
{
    constexpr std::int32_t most_levels = Greatest_Level_Table / sizeof(const char*);
    if (factor.type != factor_column)
        return Fail("Selected column to indicate append source is not a factor.\n");
    const bool labelled = factor.label_count > 0 || !wanted.new_label.empty();
    if (factor.nlevels >= most_levels)
        return Fail("Factor %s has too many levels for one more.\n", factor.name.c_str());
    Set_Level_Count(factor, std::max(factor.nlevels, 0) + 1);
    const std::string label = wanted.new_label.empty() ? Format_Text("%li", static_cast<long>(factor.nlevels))
                                                       : std::string(wanted.new_label);
    return (!labelled || Add_Label(factor, label))
           && (factor.level_values_count < 1 || Add_Level_Value(factor));
}

/// A Factor of two levels: the rows that are there, and those that come.
Column* Make_Source_Column(Sheet& target, const Append_Request& wanted)
{
    Text_Arena texts;
    Level_Node labels[2] = {};
    Column_Request column{factor_column, wanted.source_column_name, -1, 2, "1"};
    if (!wanted.new_label.empty()) {
        labels[0].next = &labels[1];
        labels[0].value.text = texts.Store(wanted.old_label);
        labels[1].value.text = texts.Store(wanted.new_label);
        column.labels = labels;
        column.label_count = 2;
        if (target.type == vector_sheet)
            column.fill = wanted.old_label;  // elsewhere numbers stand for the labels
    }
    return Add_Column(&target, column, target.column_count + 1, true);
}

/// Texts of other programs don't say that a column was a Factor.
void Know_Factor_Again(Column* column)
{
    if (column != nullptr && Is_Text_Like(column->type) && column->sheet->type == vector_sheet
        && For_People(People_Rule::kept_levels))
        Text_To_Factor(column, false, false, 0);
}

bool Ready_Source_Column(Sheet& target, const Append_Request& wanted, Source_Mark& mark)
{
    if (wanted.source_column_name.empty())
        return true;
    mark.column = Find_Source_Column(&target, wanted.source_column_name);
    Know_Factor_Again(mark.column);
    if (mark.column == nullptr) {
        mark.column = Make_Source_Column(target, wanted);
        mark.level = 2;
        return mark.column != nullptr;
    }
    if (!Extend_Source_Column(*mark.column, wanted))
        return false;
    mark.level = mark.column->nlevels;
    return true;
}

/// Where the rows of the source go.
struct New_Rows {
    std::int32_t first;
    std::int32_t count;
};

void Mark_New_Rows(const Source_Mark& mark, New_Rows rows)
{
    if (mark.column == nullptr)
        return;
    for (Cell_Node* cell = Cell_At(mark.column, rows.first); cell != nullptr && rows.count > 0;
         --rows.count) {
        cell->value.number = mark.level;
        cell = cell->next;
    }
}

/// A column with new cells, and where they come from; without a target the data are left out.
struct Column_Pair {
    Column* target;
    const Column* source;
};

std::vector<Column_Pair> Pair_By_Name(const Sheet& target, const Sheet& source)
{
    Column_Index index(target);
    std::vector<Column_Pair> pairs;
    for (const Column* column = source.first_column->next; column != nullptr; column = column->next)
        pairs.push_back({index.Take(column->name), column});
    return pairs;
}

std::vector<Column_Pair> Pair_By_Position(const Sheet& target, const Sheet& source, const Column* passed_over)
{
    std::vector<Column_Pair> pairs;
    Column* partner = target.first_column->next;
    for (const Column* column = source.first_column->next; column != nullptr; column = column->next) {
        if (partner != nullptr && partner == passed_over)
            partner = partner->next;
        pairs.push_back({partner, column});
        partner = partner == nullptr ? nullptr : partner->next;
    }
    return pairs;
}

/// The columns whose data could not be appended as they are.
class Left_Out_List {
public:
    explicit Left_Out_List(const Sheet& sheet) : sheet_(sheet) {}

    void Note(const Column& column)
    {
        constexpr std::size_t longest = 1000;
        any_ = true;
        if (sheet_.type != vector_sheet && sheet_.label_state == 0)
            return;  // numbers would name nothing
        if (names_.ends_with("...") || names_.size() + column.name.size() > longest) {
            names_.append(names_.ends_with("...") ? "" : "...");
            return;
        }
        names_.append(names_.empty() ? "" : ", ").append(column.name);
    }

    void Tell() const
    {
        if (!names_.empty())
            Warn("Some column data has not been appended due to a data type mismatch.\n"
                 "(e.g. text column data cannot be inserted into numeric column).\n"
                 "Columns were:\n%s.\n",
                 names_.c_str());
        else if (any_)
            Report_Message("Some column data has not been appended due to a data type mismatch.\n"
                           "(e.g. text column data cannot be inserted to numeric column).\n");
    }

private:
    const Sheet& sheet_;
    std::string names_;
    bool any_ = false;
};

bool Holds_Words(const Column& factor)
{
    if (factor.type != factor_column || factor.factor_kind != factor_with_labels)
        return false;
    double number;
    for (const Level_Node* label = factor.labels; label != nullptr; label = label->next)
        if (!Whole_Number_Text(Trim_Copy(label->Text()), number))
            return true;
    return false;
}

/// Whether the target has to become a Text for these data. Factors can have new levels for people.
bool Needs_Text(const Column& target, const Column& source)
{
    if (Is_Text_Like(target.type) || target.label_count > 0)
        return false;
    if (!For_People(People_Rule::kept_levels))
        return Is_Text_Like(source.type);
    return target.type != factor_column && (Is_Text_Like(source.type) || Holds_Words(source));
}

/// Texts go into numbers when these can become texts: Variates of a Vector, and Factors without labels.
bool Make_Room_For_Texts(Column& target, const Column& source)
{
    if (!Needs_Text(target, source))
        return true;
    const bool factor = target.type == factor_column;
    if ((!factor && target.type != variate_column) || target.sheet->type != vector_sheet
        || target.sheet->read_only != 0 || target.protected_column != 0)
        return !Is_Text_Like(source.type);
    Warn("Text column %s appended to variate column %s.\nConverting %s to a text for compatibility.\n",
         source.name.c_str(), target.name.c_str(), target.name.c_str());
    return factor ? Factor_To_Text(&target) : Variate_To_Text(&target);
}

void Copy_Cells(Cell_Transfer& transfer, New_Rows rows)
{
    const std::int32_t row = rows.first + First_Row_Of(transfer.Source());
    Cell_Node* to = Cell_At(&transfer.Target(), row);
    for (const Cell_Node* from = transfer.Source().first_cell;
         from != nullptr && to != nullptr && rows.count > 0; from = from->next, --rows.count) {
        transfer.Put(*to, from->value);
        to = to->next;
    }
}

void Note_Left_Out(const Column& source, Left_Out_List& left_out)
{
    left_out.Note(source);
    Note_Loss(Loss_Kind::label_dropped, source.name, 0, "values that the output's column can't hold");
}

/// False when the Sheet has no room for a column.
bool Append_Column(Sheet& target, Column_Pair pair, New_Rows rows, Left_Out_List& left_out)
{
    const bool is_new = pair.target == nullptr;
    const bool never_texts = target.type != vector_sheet && Is_Text_Like(pair.source->type);
    if (is_new && !never_texts)
        pair.target = Add_Column_Like(target, *pair.source);
    if (pair.target == nullptr && !never_texts)
        return false;
    Cell_Transfer transfer;
    if (pair.target == nullptr || !Make_Room_For_Texts(*pair.target, *pair.source)
        || !transfer.Prepare(*pair.target, *pair.source, {.as_appended = true})) {
        Note_Left_Out(*pair.source, left_out);
        return true;
    }
    Copy_Cells(transfer, rows);
    if (transfer.Has_Lost())
        Note_Left_Out(*pair.source, left_out);
    if (is_new)
        Compute_Column_Width(pair.target);
    return true;
}

}  // namespace

bool Append_Sheet(Sheet* target, const Append_Request& wanted)
{
    if (!Can_Be_Appended(target, wanted.source))
        return false;
    Source_Mark mark;
    const New_Rows rows = {Movable_Rows(*target),
                           Movable_Rows(*wanted.source)};  // a margin stays the last row
    if (!Ready_Source_Column(*target, wanted, mark) || !Insert_Rows(target, rows.first, rows.count, false))
        return false;
    Mark_New_Rows(mark, rows);
    if (rows.count < wanted.source->row_count)
        Note_Loss(Loss_Kind::beyond_limit, "", wanted.source->row_count, "the margin of the new table");
    Left_Out_List left_out(*wanted.source);
    for (const Column_Pair& pair : wanted.by_name ? Pair_By_Name(*target, *wanted.source)
                                                  : Pair_By_Position(*target, *wanted.source, mark.column))
        if (!Append_Column(*target, pair, rows, left_out))
            return false;
    left_out.Tell();
    return true;
}

}  // namespace ingester

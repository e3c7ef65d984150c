// The declaration of a Factor: its levels stand in it, or in front of it where there are many.
#include "hostfiles/script/script_parts.h"
#include "request/request.h"
#include "support/text.h"

namespace ingester {

namespace {

/// Most levels that stand in the declaration itself: with values and labels, with one of them, with none.
constexpr std::int32_t Inline_Limits[] = {1000000, 42, 21};

/// A list of another length than the Factor has levels is taken for one of that length.
void Settle_Count(std::int32_t& count, std::int32_t levels)
{
    if (count >= 1)
        count = levels;
}

/// Calls `write(node, level)` for each level; the node is null where the list is too short.
template <class Write> void For_Each_Level(const Column& column, Level_Node* node, Write write)
{
    for (std::int32_t level = 1; level <= column.nlevels; ++level) {
        write(node, level);
        node = node == nullptr ? nullptr : node->next;
    }
}

double Value_Of(const Level_Node* node, std::int32_t level)
{
    return node == nullptr ? level : node->value.number;
}

std::string_view Label_Of(const Level_Node* node)
{
    return node == nullptr ? std::string_view{} : node->Text();
}

void Write_Inline_Values(const Column& column, Script_Buffer& script)
{
    const Script_Number_Form form = Number_Form_Of(column);
    Write_Statement(";levels=!(", script);
    For_Each_Level(column, column.level_values, [&](const Level_Node* node, std::int32_t level) {
        Write_Statement_Number(level == 1 ? "" : ",", Value_Of(node, level), form, script);
    });
    Write_Statement(")", script);
}

void Write_Inline_Labels(const Column& column, Script_Buffer& script)
{
    Write_Statement(";labels=!t(", script);
    For_Each_Level(column, column.labels, [&](const Level_Node* node, std::int32_t level) {
        Write_Quoted(level == 1 ? "" : ",", Label_Of(node), Text_Cell_Width, "", true, script);
    });
    Write_Statement(")", script);
}

void Declare_Values(const Column& column, Script_Buffer& script)
{
    const Script_Number_Form form = Number_Form_Of(column);
    Write_Delete("_levels_", script);
    Write_Statement(Format_Text("VARIATE [nvalues=%li] _levels_", static_cast<long>(column.nlevels)), script);
    Write_Read("_levels_", script);
    For_Each_Level(column, column.level_values, [&](const Level_Node* node, std::int32_t level) {
        Write_Data_Number(Value_Of(node, level), form, script);
    });
    Write_Data_End(script);
}

/// The host takes no empty labels from a Text.
void Declare_Labels(Column& column, Script_Buffer& script)
{
    constexpr std::string_view empty_label = "<Null>";
    Write_Delete("_labels_", script);
    Write_Statement(Format_Text("TEXT [nvalues=%li] _labels_", static_cast<long>(column.nlevels)), script);
    Write_Read("_labels_", script);
    For_Each_Level(column, column.labels, [&](Level_Node* node, std::int32_t) {
        if (node != nullptr && node->Text().empty())
            node->value.text = column.texts.Store(empty_label);
        Write_Quoted("", node == nullptr ? empty_label : node->Text(), Text_Cell_Width, " ", false, script);
    });
    Write_Data_End(script);
}

/// The number of units; the Factors of a Table have none of their own.
void Write_Unit_Count(const Column& column, std::int32_t length, Script_Buffer& script)
{
    if (column.sheet->type == table_sheet)
        return;
    Write_Statement(length > 0 ? Format_Text(";nvalues=%li", static_cast<long>(length)) : ";nvalues=*",
                    script);
}

void Write_Short_Form(const Column& column, std::int32_t length, Script_Buffer& script)
{
    Write_Statement("FACTOR [modify=yes", script);
    Write_Unit_Count(column, length, script);
    if (column.level_values_count > 0)
        Write_Inline_Values(column, script);
    else
        Write_Statement(Format_Text(";levels=%li", static_cast<long>(column.nlevels)), script);
    if (column.label_count > 0)
        Write_Inline_Labels(column, script);
}

void Write_Long_Form(Column& column, std::int32_t length, Script_Buffer& script)
{
    if (column.level_values_count > 0)
        Declare_Values(column, script);
    if (column.label_count > 0)
        Declare_Labels(column, script);
    Write_Statement("FACTOR [modify=yes", script);
    Write_Unit_Count(column, length, script);
    if (column.level_values_count > 0)
        Write_Statement(";levels=!(#_levels_)", script);
    if (column.label_count > 0)
        Write_Statement(";labels=!t(#_labels_)", script);
}

}  // namespace

std::string Factor_Name(const Column& column)
{
    return column.name.empty() ? Format_Text("F%li", static_cast<long>(column.index))
                               : std::string(column.name);
}

void Write_Factor_Declaration(Column& column, std::int32_t length, Script_Buffer& script)
{
    Settle_Count(column.level_values_count, column.nlevels);
    Settle_Count(column.label_count, column.nlevels);
    const int lists = (column.level_values_count > 0 ? 1 : 0) + (column.label_count > 0 ? 1 : 0);
    if (column.nlevels <= Inline_Limits[lists])
        Write_Short_Form(column, length, script);
    else
        Write_Long_Form(column, length, script);
    Write_Statement("] " + Factor_Name(column), script);
    Write_Attributes(column, Small_Words, script);
    Write_Statement("\n", script);
}

}  // namespace ingester

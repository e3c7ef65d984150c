#include "model/cell_text.h"

#include "model/date_text.h"
#include "request/losses.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>

namespace ingester {

bool Is_Missing_Text(std::string_view text)
{
    if (text.data() == nullptr)
        return true;
    if (request.Missing_Input_Text.empty())
        return false;
    text = Trim_Copy(text);
    return text.empty() || Equal_Folded(text, request.Missing_Input_Text);
}

double Cell_Number(std::string_view text, double missing)
{
    text = Trim_Copy(text);
    const char* const last = text.data() + text.size();
    const Parsed_Number parsed = Parse_Number(text.data(), last);
    const bool whole = parsed.end == last || (parsed.end + 1 == last && *parsed.end == '*');
    if (parsed.status != Number_Status::good || !whole)
        return missing;
    return std::min(parsed.value, Greatest_Number);
}

double Number_Or_Date(const Column& column, std::string_view text)
{
    const double missing = column.sheet->missing_value;
    if (column.format != date_format_mark)
        return Cell_Number(text, missing);
    double value;
    static_cast<void>(Text_To_Date(text, value, column.date_form, column.date_format, missing, false));
    return value;
}

namespace {

/// The tests by which a text finds a label, tried in this order over all labels.
constexpr bool (*Label_Tests[])(std::string_view label, std::string_view text) = {
    [](std::string_view label, std::string_view text) { return label == text; },
    [](std::string_view label, std::string_view text) { return Equal_Folded(label, text); },
    [](std::string_view label, std::string_view text) { return label.starts_with(text); },
    [](std::string_view label, std::string_view text) { return Starts_Folded(label, text); },
};

/// The label that shares the longest start with the text, when it is the longest by itself; else 0.
std::int32_t Longest_Common_Start(const Column& column, std::string_view text)
{
    std::size_t longest = 0;
    std::int32_t best = 0;
    std::int32_t level = 0;
    for (const Level_Node* label = column.labels; label != nullptr; label = label->next) {
        ++level;
        const std::size_t common = Common_Letters(label->Text(), text);
        if (common > longest) {
            longest = common;
            best = level;
        } else if (common == longest) {
            best = 0;
        }
    }
    return best;
}

/// The number of the label that `text` names, or 0.
std::int32_t Label_Of_Text(const Column& column, std::string_view text)
{
    for (const auto test : Label_Tests) {
        std::int32_t level = 0;
        for (const Level_Node* label = column.labels; label != nullptr; label = label->next) {
            ++level;
            if (test(label->Text(), text))
                return level;
        }
    }
    return Longest_Common_Start(column, text);
}

/// The level of a Factor with labels or level values that `text` names; missing when there is none.
double Level_Of_Text(const Column& column, std::string_view text)
{
    const double missing = column.sheet->missing_value;
    std::int32_t level = 0;
    if (column.factor_kind == factor_with_labels) {
        level = text.empty() ? 0 : Label_Of_Text(column, text);
    } else {
        const double value = Number_Or_Date(column, text);
        level = value > missing ? Nearest_Level(column, value) : 0;
    }
    return level > 0 ? level : missing;
}

}  // namespace

void Set_Cell_From_Text(Column& column, Cell_Node& cell, std::string_view text)
{
    if (Is_Text_Like(column.type)) {
        Set_Text(column, cell, Is_Missing_Text(text) ? std::string_view{} : text);
        return;
    }
    const double missing = column.sheet->missing_value;
    if (column.type == factor_column && column.factor_kind != plain_factor)
        cell.value.number = Level_Of_Text(column, text);
    else if (text.empty() || text.front() == '*' || Is_Missing_Text(text))
        cell.value.number = missing;
    else
        cell.value.number = Number_Or_Date(column, text);
}

void Set_Wide_Text(Column& column, Cell_Node& cell, std::string_view text, std::int64_t row)
{
    Make_Room_For(column, text);
    Set_Text(column, cell, text);
    if (cell.Text().size() < text.size())
        Note_Loss(Loss_Kind::text_cut, column.name, row, text);
}

bool Set_Cell_From_Text(Column* column, std::int32_t row, std::string_view text)
{
    Cell_Node* const cell = Cell_At(column, row);
    if (cell == nullptr)
        return false;
    Set_Cell_From_Text(*column, *cell, text);
    return true;
}

}  // namespace ingester

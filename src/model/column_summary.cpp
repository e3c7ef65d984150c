#include "model/column_summary.h"

#include "support/text.h"

#include <algorithm>
#include <cmath>
#include <cstdio>
#include <vector>

namespace ingester {

namespace {

/// Cells by level, from 1 at 0, and how many have none.
struct Level_Counts {
    std::vector<long> counts;
    long missing = 0;
};

/// Lines for the levels of a Factor without lists: a damaged file may claim billions.
constexpr std::int32_t Most_Plain_Levels = 1000000;

Level_Counts Count_Levels(const Column& column)
{
    const std::int32_t listed = std::max({column.label_count, column.level_values_count, Most_Plain_Levels});
    Level_Counts counted;
    counted.counts.resize(static_cast<std::size_t>(std::clamp(column.nlevels, 0, listed)));
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const double level = cell->value.number;
        if (!(level >= 1.0))
            ++counted.missing;
        else if (level < static_cast<double>(counted.counts.size()) + 1.0)
            ++counted.counts[static_cast<std::size_t>(level) - 1];
    }
    return counted;
}

void Add_Level_Lines(const Column& column, const std::vector<long>& counts, std::string& text)
{
    const Level_Node* label = column.labels;
    const Level_Node* value = column.level_values;
    long level = 0;
    for (const long count : counts) {
        ++level;
        const std::string name(label == nullptr ? std::string_view() : label->Text());
        if (label != nullptr && value != nullptr)
            text += Format_Text("      %4li: %s, %.12g (x %li)\n", level, name.c_str(), value->value.number,
                                count);
        else if (value != nullptr)
            text += Format_Text("      %4li: %.12g (x %li)\n", level, value->value.number, count);
        else if (label != nullptr)
            text += Format_Text("      %4li: %s (x %li)\n", level, name.c_str(), count);
        else
            text += Format_Text("      %4li: (x %li)\n", level, count);
        label = label == nullptr ? nullptr : label->next;
        value = value == nullptr ? nullptr : value->next;
    }
}

void Describe_Factor(const Column& column, long number, std::string& text)
{
    const Level_Counts counted = Count_Levels(column);
    text += Format_Text("%4li: %s - Factor, %li Levels, NMV: %li\n", number, column.name.c_str(),
                        static_cast<long>(column.nlevels), counted.missing);
    Add_Level_Lines(column, counted.counts, text);
}

void Describe_Numbers(const Column& column, long number, std::string& text)
{
    const std::string type(Column_Type_Name(column));
    Column_Summary found{};
    const bool present = Column_Statistics(&column, found) && found.missing < column.length;
    if (present && !Is_Present(*column.sheet, found.mean))
        found.mean = found.min;  // of one value
    if (present)
        text += Format_Text("%4li: %s - %s\n      Mean: %.12g, Min: %.12g, Max: %.12g, NMV: %li", number,
                            column.name.c_str(), type.c_str(), found.mean, found.min, found.max,
                            static_cast<long>(found.missing));
    else
        text += Format_Text("%4li: %s - %s, an empty column", number, column.name.c_str(), type.c_str());
    text += '\n';
}

void Add_Attributes(const Column& column, std::string& text)
{
    if (!column.extra.empty() || column.protected_column != 0 || column.decimals >= 0) {
        text += "    ";
        if (!column.extra.empty())
            text += Format_Text(" Extra: '%s'", column.extra.c_str());
        if (column.decimals >= 0)
            text += Format_Text(" Decimals: %li", static_cast<long>(column.decimals));
        if (column.protected_column != 0)
            text += " Protected";
        text += '\n';
    }
    if (!column.attached_text.empty())
        text += Format_Text("      Calculation: %s\n", column.attached_text.c_str());
}

void Describe_Column(const Column& column, long number, std::string& text)
{
    if (column.type == factor_column)
        Describe_Factor(column, number, text);
    else if (Is_Text_Like(column.type))  // Long Text as well, of which numbers tell nothing
        text += Format_Text("%4li: %s - Text  Maximum width: %li\n", number, column.name.c_str(),
                            static_cast<long>(column.nlevels));
    else
        Describe_Numbers(column, number, text);
    Add_Attributes(column, text);
}

void Add_Title(const Sheet& sheet, std::string& text)
{
    if (sheet.title_lines.empty())
        return;
    text += "Sheet Title:\n";
    std::int32_t lines = sheet.title_line_count;
    for (std::size_t at = 0; at < sheet.title_lines.size() && lines-- > 0;) {
        const char* const line = sheet.title_lines.c_str() + at;
        text += Format_Text("%s\n", line);
        at += std::string_view(line).size() + 1;
    }
}

}  // namespace

std::string Column_Summary_Text(const Sheet& sheet, std::string_view output_name)
{
    std::string text = Format_Text("\nSummary of Columns output to: %s", std::string(output_name).c_str());
    text += Format_Text("\nSheet of type: %s\n\n", Sheet_Type_Name(sheet).c_str());
    Add_Title(sheet, text);
    long number = 0;
    for (const Column* column = sheet.first_column; column != nullptr; column = column->next)
        if (column->type != row_column)
            Describe_Column(*column, ++number, text);
    return text += '\n';
}

bool Print_Column_Summary(const Sheet* sheet, std::string_view output_name)
{
    if (sheet != nullptr) {
        const std::string text = Column_Summary_Text(*sheet, output_name);
        std::fwrite(text.data(), 1, text.size(), stdout);
        std::fflush(stdout);
    }
    return true;
}

}  // namespace ingester

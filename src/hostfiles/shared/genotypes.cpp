#include "hostfiles/shared/host_sheet.h"
#include "model/factor_lists.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <span>
#include <string_view>
#include <vector>

namespace ingester {

namespace {

constexpr std::int32_t Most_Labels = 6;

/// The codes, in the order of the levels that they become.
constexpr std::array<std::string_view, 7> Codes = {"a", "b", "h", "c", "d", "-", "u"};
enum Code_Place : std::size_t { code_a, code_b, code_h, code_c, code_d, code_dash, code_u };

using Code_Counts = std::array<std::int64_t, Codes.size()>;

constexpr std::int32_t Colours_Of_6[] = {0xFF9595, 0x8C8CFF, 0xFF9FFF, 0xA2FFFF, 0x9DFF3C, 0xE7E7E7};
constexpr std::int32_t Colours_Of_3[] = {0xFF9595, 0x8C8CFF, 0xE7E7E7};

std::size_t Code_Of(std::string_view label)
{
    return static_cast<std::size_t>(
        std::ranges::find_if(Codes, [&](std::string_view code) { return Equal_Ignoring_Case(code, label); })
        - Codes.begin());
}

bool May_Hold_Genotypes(const Column& column)
{
    return column.type == factor_column && column.label_count > 0 && column.nlevels <= Most_Labels;
}

/// Counts the codes of a Factor up to its first label that is none. True when all of them are.
bool Count_Codes(const Column& column, Code_Counts& counts)
{
    for (const Level_Node* label = column.labels; label != nullptr; label = label->next) {
        const std::size_t code = Code_Of(label->Text());
        if (code == Codes.size())
            return false;
        ++counts[code];
    }
    return true;
}

std::vector<std::string_view> Choose_Labels(const Code_Counts& counts)
{
    const auto has = [&](Code_Place code) { return counts[code] > 0; };
    const std::string_view last = counts[code_u] > counts[code_dash] ? "u" : "-";
    if (has(code_c) || has(code_d) || (has(code_a) && has(code_b) && has(code_h)))
        return {"a", "b", "h", "c", "d", last};
    if (!has(code_a))
        return has(code_b) && has(code_h) ? std::vector{std::string_view("b"), std::string_view("h"), last}
                                          : std::vector{std::string_view("a"), std::string_view("h"), last};
    return {"a", has(code_b) ? "b" : "h", last};
}

bool Recode(Column& column, std::span<const std::string_view> labels)
{
    std::vector<double> new_levels;
    for (const Level_Node* label = column.labels; label != nullptr; label = label->next)
        new_levels.push_back(
            std::min(static_cast<double>(Code_Of(label->Text()) + 1), double{Greatest_Genotype_Level}));
    const auto nlevels = static_cast<std::int32_t>(labels.size());
    Free_Cell_Nodes(&column, level_value_nodes);
    column.label_width = 0;
    if (!Put_Labels(column, nlevels,
                    [&, label = labels.begin()]() mutable { return column.texts.Store(*label++); }))
        return false;
    column.nlevels = nlevels;
    column.factor_kind = factor_with_labels;
    for (Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next) {
        const double level = cell->value.number;
        if (level >= 1.0 && level <= nlevels && level <= static_cast<double>(new_levels.size()))
            cell->value.number = new_levels[static_cast<std::size_t>(level) - 1];
    }
    const std::span<const std::int32_t> colours =
        nlevels == Most_Labels ? std::span<const std::int32_t>(Colours_Of_6) : Colours_Of_3;
    column.factor_colours.assign(colours.begin(), colours.end());
    column.factor_recoded = 1;
    column.colour_source = &column;
    column.sheet->has_colour_sources = 1;
    return true;
}

}  // namespace

void Recode_Genotype_Factors(Sheet* sheet)
{
    if (sheet == nullptr)
        return;
    Code_Counts counts{};
    std::vector<Column*> found;
    for (Column* column = sheet->first_column; column != nullptr; column = column->next)
        if (May_Hold_Genotypes(*column) && Count_Codes(*column, counts))
            found.push_back(column);
    if (found.empty())
        return;
    const std::vector<std::string_view> labels = Choose_Labels(counts);
    for (Column* column : found)
        if (!Recode(*column, labels))
            return;
}

}  // namespace ingester

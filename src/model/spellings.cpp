#include "model/spellings.h"

#include "model/sheet.h"
#include "support/number_text.h"

#include <cstring>
#include <memory>

namespace ingester {

namespace {

Number_Spellings& Spellings_Of(Column& column)
{
    if (column.spellings == nullptr)
        column.spellings = std::make_unique<Number_Spellings>();
    return *column.spellings;
}

/// What was kept for a cell; null for nothing.
const char* Find_Kept(const Number_Spellings& spellings, const Cell_Node& cell)
{
    const auto found = std::ranges::lower_bound(spellings.kept, &cell, {}, &Number_Spellings::Kept::cell);
    return found == spellings.kept.end() || found->cell != &cell ? nullptr : found->text;
}

/// Zeros behind a plain number up to so many decimals.
char* Put_Zeros(const char* first, char* last, std::int32_t decimals)
{
    const std::string_view text(first, static_cast<std::size_t>(last - first));
    if (text.find_first_of("en") != std::string_view::npos)
        return last;
    std::size_t point = text.find('.');
    if (point == std::string_view::npos) {
        point = text.size();
        *last++ = '.';
    }
    const auto there = static_cast<std::int32_t>(text.size() - std::min(point + 1, text.size()));
    for (std::int32_t i = there; i < decimals; ++i)
        *last++ = '0';
    return last;
}

}  // namespace

void Keep_Spelling(Column& column, const Cell_Node& cell, std::string_view text)
{
    Number_Spellings& spellings = Spellings_Of(column);
    spellings.kept.push_back({&cell, spellings.texts.Store(text)});
}

void Keep_Decimals(Column& column, std::int32_t decimals)
{
    constexpr std::int32_t most_decimals = 40;
    if (decimals > 0)
        Spellings_Of(column).decimals = std::min(decimals, most_decimals);
}

void Settle_Spellings(Column& column)
{
    if (column.spellings != nullptr)
        std::ranges::sort(column.spellings->kept, {}, &Number_Spellings::Kept::cell);
}

char* Print_Usually(char* target, const Column& column, double value)
{
    char* const end = Print_Shortest(target, value);
    const bool zeros = column.spellings != nullptr && column.spellings->decimals > 0;
    return zeros ? Put_Zeros(target, end, column.spellings->decimals) : end;
}

char* Print_As_Spelled(char* target, const Column& column, const Cell_Node& cell)
{
    const double value = cell.value.number;
    const Number_Spellings* const spellings = column.spellings.get();
    if (const char* const kept = spellings == nullptr ? nullptr : Find_Kept(*spellings, cell)) {
        const std::string_view text = Text_Arena::View(kept);
        double spelled;
        if (Whole_Number_Text(text, spelled) && spelled == value) {
            std::memcpy(target, text.data(), text.size());
            return target + text.size();
        }
    }
    return Print_Usually(target, column, value);
}

}  // namespace ingester

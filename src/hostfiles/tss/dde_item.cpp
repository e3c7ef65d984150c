#include "hostfiles/tss/dde_item.h"

#include "support/text.h"

#include <algorithm>

namespace ingester {

namespace {

struct Reference {
    long row = 0;
    long column = 0;

    [[nodiscard]] bool Found() const { return row > 0 && column > 0; }
    [[nodiscard]] std::string Text() const { return Format_Text("R%liC%li", row, column); }
};

/// Takes the digits off the front of `text`; 0 for none.
long Take_Number(std::string_view& text)
{
    const auto end = std::ranges::find_if_not(text, Is_Digit);
    const auto digits = static_cast<std::size_t>(end - text.begin());
    const long number = Leading_Integer(text.substr(0, digits));
    text.remove_prefix(digits);
    return number;
}

Reference Parse_Numbered(std::string_view text)
{
    Reference reference;
    text.remove_prefix(1);
    reference.row = Take_Number(text);
    if (text.starts_with('C')) {
        text.remove_prefix(1);
        reference.column = Take_Number(text);
    }
    return reference;
}

Reference Parse_Lettered(std::string_view text)
{
    constexpr std::size_t most_letters = 2;
    constexpr long letters = 26;
    Reference reference;
    for (std::size_t i = 0; i < most_letters && !text.empty() && Is_Letter(text.front()); ++i) {
        reference.column = reference.column * letters + (text.front() - 'A' + 1);
        text.remove_prefix(1);
    }
    reference.row = Take_Number(text);
    return reference;
}

Reference Parse_Reference(std::string_view text)
{
    if (text.starts_with('R'))
        if (const Reference numbered = Parse_Numbered(text); numbered.Found())
            return numbered;
    return Parse_Lettered(text);
}

}  // namespace

std::string R1C1_Item(std::string_view item)
{
    std::string upper(item);
    std::ranges::transform(upper, upper.begin(), To_Upper);
    const std::size_t colon = std::min(upper.find(':'), upper.size());
    const std::string_view text = upper;
    const Reference first = Parse_Reference(text.substr(0, colon));
    const Reference second = Parse_Reference(text.substr(std::min(colon + 1, upper.size())));
    if (second.Found())
        return first.Text() + ":" + second.Text();
    return first.Found() ? first.Text() : upper;
}

}  // namespace ingester

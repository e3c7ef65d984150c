#include "model/text_number.h"

#include "model/sheet.h"
#include "request/request.h"
#include "support/number_text.h"
#include "support/text.h"

#include <algorithm>
#include <array>

namespace ingester {

namespace {

/// A label under repair.
struct Label {
    std::array<char, Text_Cell_Width> bytes;
    std::size_t size = 0;
    int repairs = 0;

    [[nodiscard]] std::string_view View() const { return {bytes.data(), size}; }
};

/// What `Repaired` gives for a character that stands for a point, or for nothing behind which one is.
constexpr char Point_Or_Blank = ',';

/// Characters and what they are taken for; the careful mode leaves some alone.
struct Repair {
    std::string_view slips;
    char meant;
    bool careful_too;
};

constexpr Repair Repairs[] = {
    {"Oo", '0', true},           {"@", '0', false},
    {"IiLl", '1', true},         {"Zz", '2', false},
    {"Ss", '5', false},          {"!\"#$%&'()/?[]", ' ', true},
    {",", Point_Or_Blank, true}, {":;<>", Point_Or_Blank, false},
};

using Repair_Table = std::array<char, 256>;

/// By character, 0 for those that stay.
constexpr Repair_Table Make_Repair_Table(bool careful)
{
    Repair_Table table{};
    for (const Repair& repair : Repairs)
        for (const char slip : repair.slips)
            if (!careful || repair.careful_too)
                table[static_cast<unsigned char>(slip)] = repair.meant;
    return table;
}

constexpr Repair_Table All_Repairs = Make_Repair_Table(false);
constexpr Repair_Table Careful_Repairs = Make_Repair_Table(true);

void Repair_Slips(Label& label, const Repair_Table& table)
{
    const std::size_t last_point = label.View().rfind('.');
    for (std::size_t i = 0; i < label.size; ++i) {
        char meant = table[static_cast<unsigned char>(label.bytes[i])];
        if (meant == '\0')
            continue;
        if (meant == Point_Or_Blank)
            meant = last_point != std::string_view::npos && last_point > i ? ' ' : '.';
        label.bytes[i] = meant;
        ++label.repairs;
    }
}

/// Keeps digits, one point, a sign in front of each part and one exponent letter.
void Keep_Number_Characters(Label& label)
{
    bool point = false;
    bool exponent = false;
    bool part_begun = false;
    bool digits = false;
    std::size_t kept = 0;
    for (const char c : label.View()) {  // what is kept never overtakes it
        const bool sign = (c == '-' || c == '+') && !part_begun;
        if (Is_Digit(c)) {
            digits = part_begun = true;
            label.bytes[kept++] = c;
        } else if ((c == '.' && !point && !exponent) || sign) {
            point |= c == '.';
            part_begun = true;
            label.bytes[kept++] = c;
        } else if (std::string_view("eEdD").find(c) != std::string_view::npos && digits && !exponent) {
            exponent = true;
            part_begun = false;
            label.bytes[kept++] = 'e';
            label.repairs += To_Lower(c) == 'd' ? 1 : 0;
        }
    }
    label.repairs += kept < label.size ? 1 : 0;
    label.size = kept;
}

/// Whether a mode puts up with what stands behind the number.
bool Rest_Is_Allowed(std::string_view rest, int mode)
{
    return rest.empty() || mode >= any_slips || (mode != exact_numbers && rest.front() == ' ');
}

}  // namespace

double Text_To_Number(std::string_view text, double missing, bool& changed)
{
    const int mode = request.Text_Number_Mode;
    text = Trim_Copy(text);
    Label label;
    label.size = text.copy(label.bytes.data(), label.bytes.size());
    if (mode != exact_numbers)
        Repair_Slips(label, mode == plain_slips ? Careful_Repairs : All_Repairs);
    if (mode == digits_wherever)
        Keep_Number_Characters(label);
    const std::string_view repaired = Trim_Copy(label.View());
    const Parsed_Number number = Parse_Number(repaired.data(), repaired.data() + repaired.size());
    const std::string_view rest = repaired.substr(static_cast<std::size_t>(number.end - repaired.data()));
    changed = true;
    if (number.status != Number_Status::good || !Rest_Is_Allowed(rest, mode) || !(number.value >= missing)
        || std::count(repaired.begin(), repaired.end(), '.') > 1 || (mode == one_slip && label.repairs > 1))
        return missing;
    changed = label.repairs > 0 || !rest.empty() || text.size() > label.bytes.size()
              || number.value > Greatest_Number;
    return std::min(number.value, Greatest_Number);
}

}  // namespace ingester

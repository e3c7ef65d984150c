#include "model/names.h"

#include "request/losses.h"
#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"

#include <algorithm>
#include <unordered_map>
#include <unordered_set>

namespace ingester {

namespace {

/// The host tells names by this many characters.
constexpr std::size_t Host_Told_Width = 32;

/// Names that stand as they are are told by all of their letters.
std::size_t Told_Width()
{
    const bool whole = request.Names_Kept_As_They_Stand && For_People(People_Rule::free_names);
    return whole ? Name_Width : Host_Told_Width;
}

/// A longer suffix leaves no room for a stem with a number.
constexpr std::size_t Greatest_Kept_Suffix = 50;

/// A name as the host tells it from others.
struct Told_Name {
    std::string stem;
    std::string suffix;
};

[[nodiscard]] Told_Name Tell_Name(std::string_view name)
{
    const std::size_t start = Bracket_Start(name);
    return {std::string(First_Letters(name.substr(0, start), Told_Width())), std::string(name.substr(start))};
}

/// The names of the columns so far. A name without a suffix clashes with all of its stem.
class Taken_Names {
public:
    [[nodiscard]] bool Clashes(const Told_Name& name) const
    {
        if (name.suffix.empty())
            return stems_.contains(name.stem);
        return names_.contains(name.stem) || names_.contains(name.stem + name.suffix);
    }

    void Add(const Told_Name& name)
    {
        stems_.insert(name.stem);
        names_.insert(name.stem + name.suffix);
    }

    /// `name` with the first number behind its stem that clashes with nothing.
    [[nodiscard]] Told_Name Numbered(const Told_Name& name);

private:
    /// Where to go on among the numbers from `first`, of one length, behind `start`.
    [[nodiscard]] std::int32_t& Next_Number(const std::string& start, const std::string& suffix,
                                            std::int32_t first)
    {
        const std::string key = start + '\0' + suffix + '\0' + std::to_string(first);
        return next_numbers_.try_emplace(key, first).first->second;
    }

    std::unordered_set<std::string> stems_;
    std::unordered_set<std::string> names_;
    std::unordered_map<std::string, std::int32_t> next_numbers_;  ///< all below are taken
};

struct Stem_And_Number {
    std::string stem;
    std::int32_t number;
};

[[nodiscard]] Stem_And_Number Stem_To_Number(const std::string& stem)
{
    if (!Has_More_Letters(stem, 2))
        return {stem + '_', 1};
    const std::size_t last = stem.size() - 1;
    if (Is_Digit(stem[last]) && stem[last - 1] == '_')
        return {stem.substr(0, last), stem[last] - '0'};
    return {stem, 1};
}

Told_Name Taken_Names::Numbered(const Told_Name& name)
{
    const std::string suffix =
        !Has_More_Letters(name.suffix, Greatest_Kept_Suffix) ? name.suffix : std::string();
    const std::size_t room = std::min(Told_Width(), Name_Width - Letter_Count(suffix));
    auto [stem, number] = Stem_To_Number(name.stem);
    std::int32_t end = 10;
    for (std::size_t digits = 1;; ++digits, end *= 10) {
        const std::string start(First_Letters(stem, room - digits));
        // Names never come free, so a search goes on where the one before it ended. Numbers of one
        // digit may start anywhere and are tried each time.
        std::int32_t& next = digits == 1 ? number : Next_Number(start, suffix, end / 10);
        for (; next < end; ++next) {
            Told_Name candidate{start + std::to_string(next), suffix};
            if (!Clashes(candidate))
                return candidate;
        }
    }
}

/// Keeps the name that a column had in front of its long description, where there is room.
void Keep_Old_Name(Column& column)
{
    const std::string_view name = column.name;
    const std::string_view extra = column.extra;
    if (extra.empty())
        column.extra = std::string(" ").append(name);
    else if (Letter_Count(name) + Letter_Count(extra) + 2 <= Extra_Width)
        column.extra = std::string(name).append(": ").append(extra);
}

}  // namespace

void Make_Column_Names_Unique(Sheet* sheet)
{
    if (sheet == nullptr)
        return;
    const bool one_way_table = sheet->type == table_sheet && sheet->table_ways == 1;
    if (sheet->type != vector_sheet && sheet->type != scalar_sheet && !one_way_table)
        return;
    Taken_Names taken;
    for (Column* column = sheet->first_column; column != nullptr; column = column->next) {
        if (column->type == row_column)
            continue;
        Told_Name name = Tell_Name(column->name);
        if (taken.Clashes(name)) {
            name = taken.Numbered(name);
            const std::string unique = name.stem + name.suffix;
            Note_Loss(Loss_Kind::name_changed, column->name, 0, unique);
            Keep_Old_Name(*column);
            column->name = unique;
        }
        taken.Add(name);
    }
}

}  // namespace ingester

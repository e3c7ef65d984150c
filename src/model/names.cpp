#include "model/names.h"

#include "request/request.h"
#include "support/letters.h"
#include "support/text.h"
#include "support/windows_1252.h"

#include <algorithm>
#include <utility>
#include <vector>

namespace ingester {

namespace {

constexpr std::string_view Quoted_Open = "['";
constexpr std::string_view Quoted_Close = "']";

/// Bracket numbers run to here, and start again from 1.
constexpr std::int32_t Greatest_Bracket_Number = 999;

/// The members of structures that the host knows by name as well as by number.
struct Known_Suffix {
    std::string_view text;
    std::int32_t number;
};
constexpr Known_Suffix Known_Suffixes[] = {
    {"Vectors", 1},    {"Sums", 1},  {"Orders", 1}, {"Roots", 2}, {"Means", 2},
    {"Parameters", 2}, {"Trace", 3}, {"NUnits", 3}, {"Lags", 3},  {"WMeans", 4},
};

/// Characters that become words.
struct Character_Word {
    std::string_view letter;
    std::string_view word;
};
constexpr Character_Word Character_Words[] = {
    {"<", "lt"},    {">", "gt"},    {"@", "at"},      {"=", "eq"},
    {"\xF2", "ge"}, {"\xF3", "le"}, {"\u2265", "ge"}, {"\u2264", "le"},
};

Name_Counters name_state;  // the number of columns is that of the settings

}  // namespace

// --- Suffixes ------------------------------------------------------------------------------------

Telling_Parts Tell_Parts(std::string_view name)
{
    constexpr std::size_t telling_width = 32;
    name = Trim_Copy(name);
    const std::size_t start = Bracket_Start(name);
    return {First_Letters(name.substr(0, start), telling_width), name.substr(start)};
}

std::size_t Bracket_Start(std::string_view name)
{
    return name.ends_with(']') ? std::min(name.find('['), name.size()) : name.size();
}

std::string Shorten_Bracket_Name(std::string_view name, std::size_t limit)
{
    const std::size_t start = Bracket_Start(name);
    const std::string_view suffix = name.substr(start);
    const std::size_t suffix_letters = Letter_Count(suffix);
    if (!Has_More_Letters(name, limit) || suffix_letters >= limit)
        return std::string(First_Letters(name, limit));
    return std::string(First_Letters(name.substr(0, start), limit - suffix_letters)).append(suffix);
}

void Remember_Bracket_Text(std::string_view text)
{
    name_state.bracket_text = text;
}

void Use_Bracket_Text(Column& column)
{
    if (name_state.bracket_text.empty())
        return;
    if (!column.extra.empty())
        column.extra.append(" ");
    column.extra.append(name_state.bracket_text);
    name_state.bracket_text.clear();
}

void Reset_Name_Counters()
{
    name_state = Name_Counters{};
}

Name_Counters Get_Name_Counters()
{
    Name_Counters counters = name_state;
    counters.next_column_number = Get_Settings().next_column_number;
    return counters;
}

void Set_Name_Counters(const Name_Counters& counters)
{
    name_state = counters;
    Get_Settings().next_column_number = counters.next_column_number;
}

// --- Automatic names -----------------------------------------------------------------------------

std::string Default_Column_Name(std::int32_t number)
{
    Settings& settings = Get_Settings();
    const long shown = number < 1 ? settings.next_column_number++ : number;
    if (settings.prefix_given && settings.bracket_names != 0)
        return Format_Text("%s[%li]", settings.column_prefix.c_str(), shown);
    return std::string(First_Letters(settings.column_prefix, 6)).append(std::to_string(shown));
}

// --- Characters ----------------------------------------------------------------------------------

namespace {

[[nodiscard]] bool Is_Name_Start(char c)
{
    return Is_Letter(c) || c == '_' || c == '%';
}

[[nodiscard]] bool Is_Name_Character(char c)
{
    return Is_Name_Start(c) || Is_Digit(c);
}

/// Whether a name may begin with a letter, which may be of any script in UTF-8.
[[nodiscard]] bool Is_Name_Start(std::string_view letter)
{
    return letter.size() == 1 ? Is_Name_Start(letter.front())
                              : Is_Letter_Of_Any_Script(First_Utf8(letter).character);
}

[[nodiscard]] bool Is_Name_Letter(std::string_view letter)
{
    if (letter.size() == 1)
        return Is_Name_Character(letter.front());
    const char32_t character = First_Utf8(letter).character;
    return Is_Letter_Of_Any_Script(character) || Is_Mark_Of_Any_Script(character)
           || Is_Digit_Of_Any_Script(character);
}

/// Letters of Windows-1252 lose their accents.
[[nodiscard]] bool Is_Folded(char c)
{
    const auto byte = static_cast<unsigned char>(c);
    return !Letters_Are_Utf8() && byte >= 128 && byte <= 254;
}

[[nodiscard]] std::string_view Without_Outer_Quotes(std::string_view name)
{
    const bool quoted =
        name.size() >= 2 && name.front() == name.back() && (name.front() == '\'' || name.front() == '"');
    return quoted ? name.substr(1, name.size() - 2) : name;
}

/// A run of characters that names can't hold is one "_".
void Append_Underscore(std::string& name)
{
    if (!name.ends_with('_'))
        name.push_back('_');
}

[[nodiscard]] char Fold_Quoted_Character(char c)
{
    if (Is_Folded(c))
        return Latin_Fold(static_cast<unsigned char>(c));
    return c >= 32 && c <= 126 ? c : ' ';
}

void Append_Quoted_Letter(std::string& name, std::string_view letter)
{
    if (letter.size() > 1)
        name.append(letter);
    else
        name.push_back(Fold_Quoted_Character(letter.front()));
}

void Append_Folded_Letter(std::string& name, std::string_view letter)
{
    for (const Character_Word& entry : Character_Words)
        if (entry.letter == letter) {
            if (Letter_Count(name) < Name_Width)
                name.append(entry.word);
            return;
        }
    const char c = letter.front();
    if (letter.size() > 1) {
        if (Is_Name_Letter(letter))
            name.append(letter);
        else
            Append_Underscore(name);
        return;
    }
    const char folded = Is_Folded(c) ? Latin_Fold(static_cast<unsigned char>(c)) : c;
    if (c == ']' && name.ends_with('['))
        name.pop_back();  // nothing stood between them
    else if (c == '[' || c == ']' || c == '_' || (folded != '_' && Is_Name_Character(folded)))
        name.push_back(folded);  // a given "_" stays, even in a run
    else
        Append_Underscore(name);
}

/// Every character as names hold it; brackets stay, and text between `['` and `']` keeps its signs.
[[nodiscard]] std::string Fold_Characters(std::string_view given)
{
    std::string name;
    while (!given.empty()) {
        if (!given.starts_with(Quoted_Open)) {
            const std::string_view letter = First_Letter(given);
            Append_Folded_Letter(name, letter);
            given.remove_prefix(letter.size());
            continue;
        }
        name.append(Quoted_Open);
        given.remove_prefix(Quoted_Open.size());
        for (std::string_view letter; !given.empty() && !given.starts_with(Quoted_Close);
             given.remove_prefix(letter.size())) {
            letter = First_Letter(given);
            Append_Quoted_Letter(name, letter);
        }
        const std::string_view close = given.substr(0, Quoted_Close.size());
        name.append(close);
        given.remove_prefix(close.size());
    }
    return name;
}

// --- Brackets ------------------------------------------------------------------------------------

/// One dimension of a suffix.
struct Bracket_Level {
    bool quoted = false;
    bool closed = false;
    std::string_view text;
};

/// A name taken apart. Its views look into the name it was made from.
struct Bracket_Parts {
    std::vector<Bracket_Level> levels;
    bool text_behind = false;  ///< the name goes on behind its last bracket
};

/// Takes a quoted level off the front of `rest`.
[[nodiscard]] Bracket_Level Take_Quoted_Level(std::string_view& rest)
{
    rest.remove_prefix(Quoted_Open.size());
    const std::size_t end = rest.find(Quoted_Close);
    Bracket_Level level{.quoted = true, .closed = end != std::string_view::npos, .text = rest.substr(0, end)};
    rest.remove_prefix(level.closed ? end + Quoted_Close.size() : rest.size());
    if (!level.closed && (level.text.ends_with('\'') || level.text.ends_with(']')))
        level.text.remove_suffix(1);  // half of the closing pair
    return level;
}

/// Takes a level without quotes off the front of `rest`. An opening bracket closes it as well.
[[nodiscard]] Bracket_Level Take_Plain_Level(std::string_view& rest)
{
    rest.remove_prefix(1);
    const std::size_t end = rest.find_first_of("[]");
    Bracket_Level level{
        .quoted = false, .closed = end != std::string_view::npos, .text = rest.substr(0, end)};
    rest.remove_prefix(std::min(end, rest.size()));
    if (rest.starts_with(']'))
        rest.remove_prefix(1);
    return level;
}

/// The levels of what follows a stem, without the empty ones. Text between levels goes.
[[nodiscard]] Bracket_Parts Take_Levels(std::string_view rest)
{
    Bracket_Parts parts;
    while (!rest.empty()) {
        if (rest.front() == '[') {
            const bool quoted = rest.starts_with(Quoted_Open);
            const Bracket_Level level = quoted ? Take_Quoted_Level(rest) : Take_Plain_Level(rest);
            if (!level.text.empty())
                parts.levels.push_back(level);
            parts.text_behind = false;
        } else {
            parts.text_behind = parts.text_behind || rest.front() != ']';
            rest.remove_prefix(1);
        }
    }
    return parts;
}

/// "]" in front of the only "[": the two change places.
void Turn_Swapped_Brackets(std::string& name)
{
    const std::size_t open = name.find('[');
    if (open == std::string::npos || open == 0 || name.find(']', open) != std::string::npos)
        return;
    const std::size_t close = name.rfind(']', open);
    if (close != std::string::npos)
        std::swap(name[open], name[close]);
}

/// The name as if brackets and quotes were any other sign.
[[nodiscard]] std::string Without_Brackets(std::string_view given)
{
    std::string name;
    for (std::string_view letter; !given.empty(); given.remove_prefix(letter.size())) {
        letter = First_Letter(given);
        if (Is_Name_Letter(letter))
            name.append(letter);
        else
            Append_Underscore(name);
    }
    return name;
}

[[nodiscard]] std::int32_t Suffix_Number(std::string_view text)
{
    for (const Known_Suffix& known : Known_Suffixes)
        if (known.text == text)
            return known.number;
    return name_state.next_suffix_number++;
}

[[nodiscard]] std::string Index_Digits(std::string_view text)
{
    std::string digits;
    std::copy_if(text.begin(), text.end(), std::back_inserter(digits), Is_Digit);
    if (!digits.empty())
        return digits;
    const std::int32_t number = name_state.next_bracket_number;
    name_state.next_bracket_number = number % Greatest_Bracket_Number + 1;
    return std::to_string(number);
}

/// The suffix that the levels make, of at most `room` characters; what can't be held goes.
/// The texts that numbers stand for are remembered, with a blank between them.
[[nodiscard]] std::string Make_Suffix(const std::vector<Bracket_Level>& levels, std::size_t room)
{
    const bool numbered = Get_Settings().bracket_names != 0;
    std::string suffix;
    std::string texts;
    for (const Bracket_Level& level : levels) {
        std::string inner;
        if (!level.quoted) {
            inner = Index_Digits(level.text);
        } else if (numbered) {
            inner = std::to_string(Suffix_Number(level.text));
            texts.append(texts.empty() ? "" : " ").append(level.text);
        } else {
            const std::size_t taken = Letter_Count(suffix) + Quoted_Open.size() + Quoted_Close.size();
            const std::string_view held = First_Letters(level.text, room > taken ? room - taken : 0);
            if (held.empty())
                break;
            inner.append("'").append(held).append("'");
        }
        if (Letter_Count(suffix) + Letter_Count(inner) + 2 > room)
            break;
        suffix.append("[").append(inner).append("]");
    }
    if (!texts.empty())
        Remember_Bracket_Text(texts);
    return suffix;
}

/// Leaves no bracket or one well-formed suffix.
[[nodiscard]] std::string Repair_Brackets(std::string name)
{
    Turn_Swapped_Brackets(name);
    const std::size_t start = std::min(name.find('['), name.size());
    const Bracket_Parts parts = Take_Levels(std::string_view(name).substr(start));
    const bool no_room = !parts.levels.empty() && !parts.levels.back().quoted && !parts.levels.back().closed
                         && Letter_Count(name) >= Name_Width;
    if (parts.text_behind || no_room)
        return Without_Brackets(name);
    std::string stem = name.substr(0, start);
    std::replace(stem.begin(), stem.end(), ']', '_');
    const std::string suffix = Make_Suffix(parts.levels, Name_Width - 1);
    return std::string(First_Letters(stem, Name_Width - Letter_Count(suffix))).append(suffix);
}

}  // namespace

// --- Names ---------------------------------------------------------------------------------------

std::string Make_Valid_Name(std::string_view name)
{
    name = name.substr(0, name.find('\0'));  // where a name in a Column ends
    if (request.Names_Kept_As_They_Stand && !(name.empty() && For_People(People_Rule::free_names)))
        return std::string(First_Letters(name, Name_Width));
    const std::string_view given = Without_Outer_Quotes(Trim_Copy(name));
    if (given.empty())
        return Default_Column_Name(0);
    std::string valid = Fold_Characters(Shorten_Bracket_Name(given, Name_Width));
    if (!Is_Name_Start(First_Letter(given)))
        valid.insert(valid.begin(), '%');
    valid = Shorten_Bracket_Name(valid, Name_Width);
    if (valid.ends_with('_') && valid.size() > 1 && !given.ends_with('_'))
        valid.pop_back();
    valid = Repair_Brackets(std::move(valid));
    return valid == "_" ? Default_Column_Name(0) : valid;
}

namespace {

/// Cuts ":" and one of `marks` off the end of `name`.
bool Cut_End_Mark(std::string& name, std::string_view marks)
{
    const std::size_t size = name.size();
    if (size < 2 || name[size - 2] != ':' || marks.find(name[size - 1]) == std::string_view::npos)
        return false;
    name.resize(size - 2);
    return true;
}

}  // namespace

namespace {

/// Takes all marks off the end of `name`; those of number formats mean something in lists only.
Name_Marks Take_End_Marks(std::string_view& name, bool number_formats = true)
{
    constexpr std::pair<char, std::int32_t> type_marks[] = {
        {'!', factor_column}, {'#', variate_column}, {'$', text_column}};
    Name_Marks marks;
    for (bool found = true; std::exchange(found, false);) {
        for (const auto& [mark, type] : type_marks)
            if (marks.type == 0 && name.ends_with(mark)) {
                marks.type = type;
                name.remove_suffix(1);
                found = true;
            }
        if (name.size() < 2 || name[name.size() - 2] != ':')
            continue;
        const char c = To_Upper(name.back());
        if (c != 'D' && c != 'T' && !(number_formats && (c == 'E' || Is_Digit(c))))
            continue;
        marks.date = marks.date || c == 'D';
        marks.time = marks.time || c == 'T';
        marks.exponent = marks.exponent || c == 'E';
        if (Is_Digit(c))
            marks.decimals = c - '0';
        name.remove_suffix(2);
        found = true;
    }
    return marks;
}

/// Hosts know marks of dates and times anywhere in a name.
void Find_Date_Marks(std::string_view name, Name_Marks& marks)
{
    marks.date = Find_Ignoring_Case(name, ":D") != std::string_view::npos;
    marks.time = Find_Ignoring_Case(name, ":T") != std::string_view::npos;
}

}  // namespace

Name_Marks Read_Name_Marks(std::string_view name)
{
    std::string_view bare = name;
    Name_Marks marks = Take_End_Marks(bare);
    if (!For_People(People_Rule::free_names))
        Find_Date_Marks(name, marks);
    marks.time = marks.time && !marks.date;
    return marks;
}

std::string Name_In_Lists(std::string_view name)
{
    std::string bare = Strip_Name_Mark(name);
    if (bare.empty() || bare.find(Quoted_Open) != std::string::npos)
        return bare;
    const Name_Counters counters = Get_Name_Counters();
    std::string valid = Make_Valid_Name(bare);
    Set_Name_Counters(counters);
    return valid;
}

std::string Strip_Name_Mark(std::string_view name)
{
    if (For_People(People_Rule::free_names)) {
        static_cast<void>(Take_End_Marks(name));
        return std::string(name);
    }
    constexpr std::string_view marks_anywhere = "DdTt";
    constexpr std::string_view end_marks = "Ee0123456789";
    std::string stripped;
    for (std::size_t at = 0; at < name.size(); ++at) {
        stripped.push_back(name[at]);
        if (at > 0 && name[at - 1] == ':' && marks_anywhere.find(name[at]) != std::string_view::npos)
            stripped.resize(stripped.size() - 2);
    }
    const bool cut = Cut_End_Mark(stripped, end_marks);
    if (stripped.ends_with('!') || stripped.ends_with('#') || stripped.ends_with('$'))
        stripped.pop_back();
    if (!cut)
        Cut_End_Mark(stripped, end_marks);
    return stripped;
}

std::string Strip_Input_Mark(std::string_view name)
{
    if (!For_People(People_Rule::free_names))
        return Strip_Name_Mark(name);
    std::string_view bare = name;
    static_cast<void>(Take_End_Marks(bare, false));
    return std::string(bare.empty() ? name : bare);
}

}  // namespace ingester

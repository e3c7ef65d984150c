#include "interface/people_options.h"

#include "interface/option_values.h"
#include "request/request.h"
#include "support/text.h"

#include <algorithm>
#include <array>
#include <optional>

namespace ingester {

namespace {

/// Asks for every rule.
constexpr std::string_view All_People_Rules = "/+people";

constexpr std::array<People_Rule_Option, People_Rule_Count> Rules = {{
    {People_Rule::utf8_text, "/+utf8", "host-text", "texts are Windows-1252, whatever the file says"},
    {People_Rule::free_names, "/+names", "host-names", "names are made valid for the host while reading"},
    {People_Rule::told_losses, "/+losses", "host-losses", "don't tell what could not be kept"},
    {People_Rule::told_options, "/+vain", "host-options",
     "don't tell options that mean nothing to the input"},
    {People_Rule::further_endings, "/+endings", "host-endings",
     "outputs are known by the host's endings only"},
    {People_Rule::further_types, "/+types", "host-types", "inputs are recognised as the host does"},
    {People_Rule::kept_levels, "/+levels", "host-levels",
     "joins match Factors by their lists alone, and numbers with the nearest level"},
    {People_Rule::further_dates, "/+dates", "host-dates", "dates are read in the host's forms only"},
    {People_Rule::plain_texts, "/+plain", "host-output",
     "comma text and tabs are written as for a host: marks behind names, * for missing, CR LF"},
    {People_Rule::sniffed_texts, "/+dialect", "host-dialect", "texts are cut and typed as the host does"},
    {People_Rule::calendar_dates, "/+calendar", "host-calendar",
     "dates of statistics files are shifted as for the host"},
    {People_Rule::whole_texts, "/+whole", "host-widths", "texts of statistics files are cut as for the host"},
}};

/// What follows a key: a value in quotes, or bare up to the next option.
Option_Value Value_At(std::string_view text, std::size_t at)
{
    return Quoted_Or_Bare(text, at, Quotes_And_Backquote, Option_Start);
}

/// A character by its own sign or by name.
struct Named_Sign {
    std::string_view name;
    char sign;
};
constexpr Named_Sign Named_Signs[] = {
    {"comma", ','}, {"semicolon", ';'}, {"tab", '\t'},   {"\\t", '\t'},    {"bar", '|'},
    {"pipe", '|'},  {"blank", ' '},     {"blanks", ' '}, {"space", ' '},   {"colon", ':'},
    {"point", '.'}, {"none", '\0'},     {"double", '"'}, {"single", '\''},
};

bool Is_Word_Character(char c)
{
    return Is_Letter(c) || Is_Digit(c);
}

/// The sign that a value means, by its name or by itself; a letter or a digit is none.
std::optional<char> Sign_Of(std::string_view value)
{
    const auto named = std::ranges::find(Named_Signs, value, &Named_Sign::name);
    if (named != std::end(Named_Signs))
        return named->sign;
    const bool sign = value.size() == 1 && !Is_Word_Character(value.front());
    return sign ? std::optional(value.front()) : std::nullopt;
}

/// One sign, or several of which each separates.
Taken Take_Separator(std::string_view text, std::size_t at)
{
    const Option_Value value = Value_At(text, at);
    const std::optional<char> sign = Sign_Of(value.text);
    if (!sign && (value.text.empty() || std::ranges::any_of(value.text, Is_Word_Character)))
        return at;
    request.Told_Separators = sign ? std::string_view(&*sign, 1) : value.text;
    return value.end;
}

Taken Take_Quote(std::string_view text, std::size_t at)
{
    const Option_Value value = Value_At(text, at);
    const std::optional<char> sign = Sign_Of(value.text);
    if (!sign)
        return at;
    request.Told_Quote = sign;
    return value.end;
}

Taken Take_Decimal(std::string_view text, std::size_t at)
{
    const Option_Value value = Value_At(text, at);
    const std::optional<char> sign = Sign_Of(value.text);
    if (sign != '.' && sign != ',')
        return at;
    request.Told_Decimal = *sign;
    return value.end;
}

bool Is_Count(std::string_view value)
{
    return !value.empty() && std::ranges::all_of(value, Is_Digit);
}

/// A number of lines, or "none"; left out it is 1. Of a grid it is the row.
Taken Take_Names_Lines(std::string_view text, std::size_t at)
{
    constexpr long most_lines = 2147483647;
    if (!Stands_At(text, at, "=")) {
        request.Names_Given = true;
        request.Told_Names_Lines = 1;
        return at;
    }
    const Option_Value value = Up_To(text, at + 1, Option_Start);
    if (value.text != "none" && !Is_Count(value.text))
        return at;
    const long lines = std::clamp(Leading_Integer(value.text), 0L, most_lines);
    request.Names_Given = lines > 0;
    request.No_Names = lines == 0;
    request.Told_Names_Lines = request.Names_Row = static_cast<std::int32_t>(lines);
    return value.end;
}

template <auto Member, long Least> Taken Take_Count(std::string_view text, std::size_t at)
{
    const Option_Value value = Up_To(text, at, Option_Start);
    if (!Is_Count(value.text) || Leading_Integer(value.text) < Least)
        return at;
    request.*Member = static_cast<std::int32_t>(std::clamp(Leading_Integer(value.text), 0L, 2147483647L));
    return value.end;
}

/// Words with commas between them.
Taken Take_Missing_Words(std::string_view text, std::size_t at)
{
    const Option_Value value = Value_At(text, at);
    std::string_view rest = value.text;
    request.Missing_Words.clear();
    request.Missing_Input_Text = rest.substr(0, rest.find(','));  // of formats that know one
    for (;;) {
        const std::size_t comma = rest.find(',');
        request.Missing_Words.emplace_back(Trim_Copy(rest.substr(0, comma)));
        if (comma == std::string_view::npos)
            return value.end;
        rest.remove_prefix(comma + 1);
    }
}

constexpr Slash_Option Others[] = {
    {"/+strict", Set<&R::Strict, true>, "fail, and leave the old output, where anything could not be kept",
     Flag("strict")},
    {"/+report=",
     Take_Text<&R::Loss_Report_Name>,
     "write what could not be kept as JSON",
     {"report", Value_Form::path, "FILE"}},
    {"/+encoding=", Take_Text<&R::Input_Encoding>, "code of the input's letters, as UTF-8, latin1 or 850",
     Bare("encoding", "NAME")},
    {"/+marks", Set<&R::Write_Marks, true>,
     "texts get marks behind names, ! for Factors, :D for dates, :T for times, and * for missing",
     Flag("marks")},
    {"/+crlf", Set<&R::Write_Crlf, true>, "lines of texts end with CR LF", Flag("crlf")},
    {"/+write-encoding=", Take_Text<&R::Output_Encoding>, "code of the letters in texts that are written",
     Bare("write-encoding", "NAME")},
    {"/+bom", Set<&R::Write_Code_Mark, true>, "texts begin with the mark of Unicode", Flag("bom")},
    {"/+separator=", Take_Separator,
     "between the fields of a text: a sign, or comma, semicolon, tab, bar, blanks",
     Quoted("separator", "SIGN")},
    {"/+quote=", Take_Quote, "around texts: a sign, or double, single, none", Quoted("quote", "SIGN")},
    {"/+decimal=", Take_Decimal, "decimal mark of a text: point or comma", Quoted("decimal", "SIGN")},
    {"/+header", Take_Names_Lines, "there are names, in one line or several", Optional("names", "N|none")},
    {"/+skip=", Take_Count<&R::Told_Skipped_Lines, 0>, "lines at the head of a text that are passed over",
     Bare("skip-lines", "N")},
    {"/+table=", Take_Count<&R::Told_Table, 1>, "which of the tables of a text, behind empty lines",
     Bare("table", "N")},
    {"/+missing=", Take_Missing_Words, "words that mean missing", Quoted("missing", "A,B")},
    {"/+secondary=",
     Take_Text<&R::Named_Secondary_File>,
     "second file that some inputs need",
     {"secondary", Value_Form::path, "FILE"}},
};

static_assert(No_Key_Hides_A_Later_One(Others));

/// Cuts `key` out of `text`, if it is there.
bool Cut_Key(std::string& text, std::string_view key)
{
    const std::size_t at = text.find(key);
    if (at != std::string::npos)
        text.erase(at, key.size());
    return at != std::string::npos;
}

void Take_From(std::string& text)
{
    if (Cut_Key(text, All_People_Rules))
        request.people.set();
    for (const People_Rule_Option& option : Rules)
        if (Cut_Key(text, option.key))
            request.people.set(static_cast<std::size_t>(option.rule));
    static_cast<void>(Cut_Options(Others, text));
}

}  // namespace

std::span<const People_Rule_Option> People_Rule_Options()
{
    return Rules;
}

std::string Spell_People_Rules(const std::bitset<People_Rule_Count>& wanted)
{
    if (wanted.all())
        return std::string(All_People_Rules);
    std::string keys;
    for (const People_Rule_Option& option : Rules)
        if (wanted.test(static_cast<std::size_t>(option.rule)))
            keys += option.key;
    return keys;
}

std::span<const Slash_Option> People_Options()
{
    return Others;
}

void Take_People_Options(std::string& infile, std::string& outfile)
{
    for (std::string* const text : {&infile, &outfile})
        if (text->find("/+") != std::string::npos)
            Take_From(*text);
    Use_Utf8_Text(For_People(People_Rule::utf8_text));
}

}  // namespace ingester

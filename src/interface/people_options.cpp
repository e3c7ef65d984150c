#include "interface/people_options.h"

#include "interface/option_values.h"
#include "request/request.h"

#include <array>

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
    {People_Rule::calendar_dates, "/+dates", "host-dates",
     "dates of statistics files are shifted as for the host"},
    {People_Rule::whole_texts, "/+whole", "host-widths", "texts of statistics files are cut as for the host"},
}};

constexpr Slash_Option Others[] = {
    {"/+strict", Set<&R::Strict, true>, "fail, and leave the old output, where anything could not be kept",
     Flag("strict")},
    {"/+report=",
     Take_Text<&R::Loss_Report_Name>,
     "write what could not be kept as JSON",
     {"report", Value_Form::path, "FILE"}},
    {"/+encoding=", Take_Text<&R::Input_Encoding>, "code of the input's letters, as UTF-8, latin1 or 850",
     Bare("encoding", "NAME")},
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

#include "command/named_options.h"

#include "interface/paths.h"
#include "platform/folders.h"
#include "request/request.h"
#include "support/text.h"

#include <CLI/CLI.hpp>
#include <algorithm>

namespace ingester {

namespace {

/// What the parser of the command line gives for an optional value that was left out.
constexpr std::string_view Left_Out = "true";

std::string Help_Of(const Slash_Option& option)
{
    const Named_Option& named = option.named;
    std::string help(option.help);
    if (named.form == Value_Form::optional)
        help.append("; or --").append(named.name).append("=").append(named.value);
    return help.append("  (").append(option.key).append(")");
}

void Offer(CLI::App& app, const char* group, Given_Option& given)
{
    const Named_Option& named = given.option->named;
    std::string name = "--" + std::string(named.name);
    if (!named.other_name.empty())
        name.append(",--").append(named.other_name);
    const std::string help = Help_Of(*given.option);
    const bool flag = named.form == Value_Form::none || named.form == Value_Form::optional;
    CLI::Option* const offered =
        flag ? app.add_flag(name, given.value, help) : app.add_option(name, given.value, help);
    if (named.form == Value_Form::none)
        offered->disable_flag_override();
    else if (!flag)
        offered->type_name(std::string(named.value));
    offered->group(group)->each([&given](const std::string&) { given.given = true; });
}

bool Has_Value(const Given_Option& given)
{
    const Value_Form form = given.option->named.form;
    return form != Value_Form::none && !(form == Value_Form::optional && given.value == Left_Out);
}

bool Is_Quoted(const Given_Option& given)
{
    const Value_Form form = given.option->named.form;
    return form == Value_Form::quoted || form == Value_Form::path;
}

/// The value as the option language carries it.
std::string Carried_Value(const Given_Option& given)
{
    const bool path = given.option->named.form == Value_Form::path;
    std::string value = path ? Request_Path(given.value) : given.value;
    if (!Is_Quoted(given))
        return value;
    const char quote = value.find('\'') == std::string::npos ? '\'' : '"';
    return quote + value + quote;
}

std::string Spelled(const Given_Option& given)
{
    const Slash_Option& option = *given.option;
    std::string text(option.key);
    if (!Has_Value(given))
        return text;
    if (!option.key.ends_with('='))
        text.append(option.named.join);
    return text.append(Carried_Value(given));
}

/// An option that is searched before `given` and would be found in its value.
const Slash_Option* Option_In_Value(const Given_Options& all, const Given_Option& given)
{
    const std::string value = Carried_Value(given);
    for (const Given_Option& earlier : all) {
        if (earlier.option == given.option)
            break;
        if (value.find(earlier.option->key) != std::string::npos)
            return earlier.option;
    }
    return nullptr;
}

/// Whether the option takes all that it is given; the rest would stay in the name of the file.
bool Is_Taken_Whole(const Given_Option& given)
{
    const std::string text = Spelled(given);
    const std::size_t end = given.option->take(text, given.option->key.size());
    request = Request_Globals{};
    return end == text.size();
}

/// "2:5", "2:" or ":5". Of other values the option would take what it knows, and be silent.
bool Is_Range(std::string_view value)
{
    return std::ranges::count(value, ':') == 1 && value.size() > 1
           && value.find_first_not_of("0123456789:") == std::string_view::npos;
}

std::string Fault_Of(const Given_Options& all, const Given_Option& given)
{
    const std::string_view value = given.value;
    if (!given.given || !Has_Value(given))
        return {};
    if (value.empty() && !given.option->named.takes_empty)
        return "the value is empty";
    if (!Is_Quoted(given) && value.find('/') != std::string_view::npos)
        return "this value can't hold a '/', which begins an option";
    // The text for missing values is the one that knows a single quote only.
    const bool single = value.find('\'') != std::string_view::npos;
    if (Is_Quoted(given) && single && given.option->key == "/mv=")
        return "this value can't hold a single quote";
    if (Is_Quoted(given) && single && value.find('"') != std::string_view::npos)
        return "this value can't hold both kinds of quotes";
    if (Holds_Path_Token(value) || value.find("/rewrite=") != std::string_view::npos)
        return "this value holds a name between per cent signs or '/rewrite=', which a request acts on";
    const bool range = given.option->named.form == Value_Form::range;
    if (!Is_Taken_Whole(given) || (range && !Is_Range(value)))
        return "this value is not of the form that the option takes";
    if (const Slash_Option* const other = Option_In_Value(all, given))
        return std::string("this value can't hold '")
            .append(other->key)
            .append("', which is an option itself");
    return {};
}

}  // namespace

void Offer_Named_Options(CLI::App& app, const char* group,
                         std::span<const std::span<const Slash_Option>> tables, Given_Options& given)
{
    for (const auto table : tables)
        for (const Slash_Option& option : table)
            given.push_back({&option, false, {}});
    for (Given_Option& one : given)  // their places are settled now
        if (!one.option->named.name.empty())
            Offer(app, group, one);
}

std::string Spell_Options(const Given_Options& given)
{
    std::string text;
    for (const Given_Option& one : given)
        if (one.given)
            text += Spelled(one);
    return text;
}

std::string Fault_Of_Options(const Given_Options& given)
{
    for (const Given_Option& one : given)
        if (std::string fault = Fault_Of(given, one); !fault.empty())
            return std::string("--").append(one.option->named.name).append(": ").append(fault);
    return {};
}

std::string_view Key_Given_Twice(std::string_view text, const Given_Options& given)
{
    for (const Given_Option& one : given)
        if (one.given && text.find(one.option->key) != std::string_view::npos)
            return one.option->key;
    return {};
}

}  // namespace ingester

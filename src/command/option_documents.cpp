#include "command/option_documents.h"

#include "command/options.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <functional>
#include <iterator>
#include <string>
#include <vector>

namespace ingester {

namespace {

/// One option, as it is documented.
struct Told_Option {
    std::vector<std::string> names;  ///< with their dashes, the long one last
    std::string value;               ///< what stands behind it; empty for a flag
    std::string help;
    std::string group;
    bool positional = false;
};

Told_Option Tell_Option(const CLI::Option& option)
{
    Told_Option told;
    for (const std::string& name : option.get_snames())
        told.names.push_back("-" + name);
    for (const std::string& name : option.get_lnames())
        told.names.push_back("--" + name);
    told.positional = told.names.empty();
    if (told.positional)
        told.names.push_back(option.get_name());
    if (option.get_items_expected_max() > 0)
        told.value = option.get_type_name();
    told.help = option.get_description();
    told.group = option.get_group();
    return told;
}

std::vector<Told_Option> Options_Of(Task task)
{
    CLI::App app;
    Command_Options options;
    options.task = task;
    Offer_Options(app, options);
    std::vector<Told_Option> told;
    for (const CLI::Option* const option : app.get_options())
        told.push_back(Tell_Option(*option));
    return told;
}

/// What `text` is once `special` characters have a backslash in front of them.
std::string Escaped(std::string_view text, std::string_view special)
{
    std::string escaped;
    for (const char c : text) {
        if (special.find(c) != std::string_view::npos)
            escaped += '\\';
        escaped += c;
    }
    return escaped;
}

// --- The man page --------------------------------------------------------------------------------

/// Text of a page: no word of it is a request, and dashes stay such.
std::string Roff(std::string_view text)
{
    std::string roff;
    bool starts_line = true;
    for (const char c : text) {
        if (starts_line && (c == '.' || c == '\''))
            roff += "\\&";
        roff += c == '-' ? "\\-" : c == '\\' ? "\\e" : std::string(1, c);
        starts_line = c == '\n';
    }
    return roff;
}

void Print_Roff_Option(const Told_Option& option)
{
    std::printf(".TP\n");
    for (const std::string& name : option.names)
        std::printf("%s\\fB%s\\fR", &name == &option.names.front() ? "" : ", ", Roff(name).c_str());
    std::printf(option.value.empty() || option.positional ? "\n" : " \\fI%s\\fR\n",
                Roff(option.value).c_str());
    std::printf("%s\n", Roff(option.help).c_str());
}

void Print_Roff_Options(const std::vector<Told_Option>& options)
{
    std::vector<std::string> groups;
    for (const Told_Option& option : options)
        if (std::ranges::find(groups, option.group) == groups.end())
            groups.push_back(option.group);
    for (const std::string& group : groups) {
        std::printf(".SS %s\n", Roff(group).c_str());
        for (const Told_Option& option : options)
            if (option.group == group)
                Print_Roff_Option(option);
    }
}

bool Is_Among(const Told_Option& option, const std::vector<Told_Option>& others)
{
    return std::ranges::any_of(others, [&](const Told_Option& other) { return other.names == option.names; });
}

void Print_Man()
{
    const std::vector<Told_Option> options = Options_Of(Task::convert);
    std::printf(".TH INGESTER 1 \"\" \"ingester %s\"\n.SH NAME\n"
                "ingester \\- moves tables between the files of many programs\n.SH SYNOPSIS\n"
                ".B ingester\n[\\fIOPTION\\fR]... \\fIINPUT OUTPUT\\fR\n",
                INGESTER_VERSION);
    for (const Task_Name& task : Task_Names())
        if (task.task != Task::convert)
            std::printf(".br\n.B ingester %s\n[\\fIOPTION\\fR]...%s\n", std::string(task.name).c_str(),
                        task.task == Task::formats ? "" : " \\fIFILE\\fR");
    std::printf(".SH DESCRIPTION\n%s\n.SH OPTIONS\n", Roff(Task_Names().front().description).c_str());
    Print_Roff_Options(options);
    std::printf(".SH COMMANDS\nThese take the options of the input, and some of their own.\n");
    for (const Task_Name& task : Task_Names()) {
        if (task.task == Task::convert)
            continue;
        std::printf(".SS %s\n%s\n", std::string(task.name).c_str(), Roff(task.description).c_str());
        if (task.task != Task::formats)
            for (const Told_Option& option : Options_Of(task.task))
                if (!option.positional && !Is_Among(option, options))
                    Print_Roff_Option(option);
    }
    std::printf(".SH EXAMPLES\n.nf\n%s\n.fi\n", Roff(Command_Examples()).c_str());
}

// --- Completions ---------------------------------------------------------------------------------

std::string Task_Words()
{
    std::string words;
    for (const Task_Name& task : Task_Names())
        if (!task.name.empty())
            words.append(words.empty() ? "" : " ").append(task.name);
    return words;
}

/// Options of tasks that aren't made from the tables.
std::vector<Told_Option> Completed_Options(Task task)
{
    if (task == Task::formats)
        return {{{"--json"}, "", "", "", false},
                {{"--markdown"}, "", "", "", false},
                {{"--all"}, "", "", "", false}};
    std::vector<Told_Option> options = Options_Of(task);
    std::erase_if(options, [](const Told_Option& option) { return option.positional; });
    return options;
}

std::string Pattern_Of(const Task_Name& task)
{
    return task.name.empty() ? "*" : std::string(task.name);
}

/// Calls `print` for each task, that without a name last.
void For_Each_Task(const std::function<void(const Task_Name&)>& print)
{
    for (const Task_Name& task : Task_Names())
        if (!task.name.empty())
            print(task);
    print(Task_Names().front());
}

void Print_Bash()
{
    std::printf("_ingester()\n{\n    local current=${COMP_WORDS[COMP_CWORD]} options\n    case "
                "${COMP_WORDS[1]} in\n");
    For_Each_Task([](const Task_Name& task) {
        std::printf("    %s) options=' ", Pattern_Of(task).c_str());
        for (const Told_Option& option : Completed_Options(task.task))
            for (const std::string& name : option.names)
                std::printf("%s ", name.c_str());
        std::printf("' ;;\n");
    });
    std::printf(
        "    esac\n    COMPREPLY=()\n    if [[ $current == -* ]]; then\n"
        "        mapfile -t COMPREPLY < <(compgen -W \"$options\" -- \"$current\")\n"
        "    elif [[ $COMP_CWORD == 1 ]]; then\n"
        "        mapfile -t COMPREPLY < <(compgen -W '%s' -- \"$current\"; compgen -f -- \"$current\")\n"
        "    fi\n}\ncomplete -o filenames -o bashdefault -o default -F _ingester ingester\n",
        Task_Words().c_str());
}

/// In single quotes, where a quote ends them for itself.
std::string Zsh_Quoted(const std::string& text)
{
    std::string quoted = "'";
    for (const char c : text)
        quoted += c == '\'' ? "'\\''" : std::string(1, c);
    return quoted + "'";
}

void Print_Zsh_Option(const Told_Option& option)
{
    const std::string value = option.value.empty() ? "" : ":" + Escaped(option.value, ":") + ":_files";
    for (const std::string& name : option.names)
        std::printf("            %s\n",
                    Zsh_Quoted("*" + name + "[" + Escaped(option.help, "[]:\\") + "]" + value).c_str());
}

void Print_Zsh()
{
    std::printf("#compdef ingester\n_ingester()\n{\n    local -a options\n    case $words[2] in\n");
    For_Each_Task([](const Task_Name& task) {
        std::printf("    %s)\n        options=(\n", Pattern_Of(task).c_str());
        for (const Told_Option& option : Completed_Options(task.task))
            Print_Zsh_Option(option);
        std::printf("        ) ;;\n");
    });
    std::printf(
        "    esac\n    (( CURRENT == 2 )) && compadd -- %s\n    _arguments $options '*:file:_files'\n}\n"
        "_ingester \"$@\"\n",
        Task_Words().c_str());
}

struct Document {
    std::string_view option;
    void (*print)();
};
constexpr Document Documents[] = {
    {"--make-man", Print_Man}, {"--make-bash", Print_Bash}, {"--make-zsh", Print_Zsh}};

}  // namespace

bool Print_Option_Document(std::string_view word)
{
    const auto* const found = std::ranges::find(Documents, word, &Document::option);
    if (found == std::end(Documents))
        return false;
    found->print();
    return true;
}

}  // namespace ingester

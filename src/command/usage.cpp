#include "command/usage.h"

#include "interface/paths.h"
#include "platform/folders.h"
#include "support/edit_distance.h"

#include <CLI/CLI.hpp>
#include <algorithm>
#include <cstdio>
#include <vector>

namespace ingester {

namespace {

/// Of more, nobody means the word that is there.
constexpr std::size_t Longest_Word = 40;

/// How much a word may differ from the one that was meant.
std::size_t Likely_Distance(std::string_view word)
{
    return word.size() < 4 ? 1 : word.size() < 8 ? 2 : 3;
}

/// The name nearest to `word`; empty when none is near.
std::string Nearest_Name(std::string_view word, const std::vector<std::string>& names)
{
    std::size_t least = Likely_Distance(word) + 1;
    std::string nearest;
    for (const std::string& name : names)
        if (const std::size_t distance = Edit_Distance(word, name); distance < least) {
            least = distance;
            nearest = name;
        }
    const auto begins = [word](const std::string& name) { return name.starts_with(word); };
    if (nearest.empty())  // or the only one that begins so
        if (const auto found = std::ranges::find_if(names, begins);
            found != names.end() && std::ranges::count_if(names, begins) == 1)
            nearest = *found;
    return nearest;
}

std::vector<std::string> Long_Names(const CLI::App& app)
{
    std::vector<std::string> names;
    for (const CLI::Option* const option : app.get_options())
        names.insert(names.end(), option->get_lnames().begin(), option->get_lnames().end());
    return names;
}

/// Of the arguments that no option took, tells those that look like one.
bool Tell_Unknown_Options(const CLI::App& app)
{
    const std::vector<std::string> names = Long_Names(app);
    bool told = false;
    for (const std::string& argument : app.remaining()) {
        const std::string word = argument.substr(0, argument.find('='));
        if (!word.starts_with("-") || word.size() < 2)
            continue;
        const std::size_t dashes = word.find_first_not_of('-');
        const std::string bare = dashes == word.npos ? "" : word.substr(dashes, Longest_Word);
        const std::string nearest = bare.empty() ? "" : Nearest_Name(bare, names);
        std::fprintf(stderr, "ingester: there is no option %s%s%s%s\n", word.c_str(),
                     nearest.empty() ? "" : "; did you mean --", nearest.c_str(), nearest.empty() ? "" : "?");
        told = true;
    }
    return told;
}

}  // namespace

int End_Parsing(const CLI::App& app, const CLI::ParseError& end)
{
    if (end.get_exit_code() == 0)
        return app.exit(end);
    if (!Tell_Unknown_Options(app))
        return app.exit(end), Usage_Error;
    std::fprintf(stderr, "Run with --help for more information.\n");
    return Usage_Error;
}

std::string_view Probable_Task(std::string_view word)
{
    std::vector<std::string> names;
    for (const Task_Name& task : Task_Names())
        if (!task.name.empty())
            names.emplace_back(task.name);
    if (word.empty() || word.size() > Longest_Word || word.find_first_of("./-") != word.npos
        || File_Exists(Request_Path(word)))
        return {};
    const std::string nearest = Nearest_Name(word, names);
    const auto found = std::ranges::find(Task_Names(), nearest, &Task_Name::name);
    return nearest.empty() ? std::string_view() : found->name;
}

void Print_Usage()
{
    std::fputs("ingester INPUT OUTPUT   converts a table: ingester crops.tss crops.csv\n"
               "ingester info FILE      tells what a file and its columns hold\n"
               "ingester head FILE      shows the first rows of a table\n"
               "\n"
               "ingester --help lists all options, with examples; ingester formats lists the formats.\n",
               stderr);
}

}  // namespace ingester

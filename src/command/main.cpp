#include "command/formats.h"
#include "command/host.h"
#include "command/options.h"
#include "command/sheets.h"

#include <string_view>
#include <vector>

namespace {

struct Subcommand {
    std::string_view name;
    int (*run)(int argc, const char* const* argv);
};

/// A conversion into nothing, by which the library tells what the columns hold.
int Run_Summary(int argc, const char* const* argv)
{
    std::vector<const char*> words = {"ingester"};
    words.insert(words.end(), argv + 1, argv + argc);
    words.insert(words.end(), {"/dev/null", "--print-summary"});
    ingester::Command_Options options;
    options.summary = true;
    if (const auto early_end =
            ingester::Parse_Command_Line(static_cast<int>(words.size()), words.data(), options))
        return *early_end;
    return ingester::Run_Command(options);
}

/// First words that are no names of files. A file of such a name is reached as "./formats".
constexpr Subcommand Subcommands[] = {
    {"formats", ingester::Run_Formats},
    {"sheets", ingester::Run_Sheets},
    {"summary", Run_Summary},
};

}  // namespace

int main(int argc, char** argv)
{
    for (const Subcommand& subcommand : Subcommands)
        if (argc > 1 && argv[1] == subcommand.name)
            return subcommand.run(argc - 1, argv + 1);
    ingester::Command_Options options;
    if (const auto early_end = ingester::Parse_Command_Line(argc, argv, options))
        return *early_end;
    return ingester::Run_Command(options);
}

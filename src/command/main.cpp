#include "command/formats.h"
#include "command/host.h"
#include "command/options.h"
#include "command/sheets.h"

#include <string_view>

namespace {

struct Subcommand {
    std::string_view name;
    int (*run)(int argc, const char* const* argv);
};

/// First words that are no names of files. A file of such a name is reached as "./formats".
constexpr Subcommand Subcommands[] = {
    {"formats", ingester::Run_Formats},
    {"sheets", ingester::Run_Sheets},
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

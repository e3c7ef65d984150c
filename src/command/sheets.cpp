#include "command/sheets.h"

#include "command/host.h"
#include "command/options.h"

#include <CLI/CLI.hpp>

namespace ingester {

namespace {

constexpr const char* Description = "Lists the sheets of a file, a line each, in their order.\n"
                                    "A file of a format that holds one table has one sheet.";

}  // namespace

int Run_Sheets(int argc, const char* const* argv)
{
    CLI::App app{Description, "ingester sheets"};
    Command_Options options;
    app.add_option("FILE", options.input, "File or URL to look at; - is standard input")->required();
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& end) {
        return app.exit(end);
    }
    // The list is a table of one column: its cells alone, without names and quotes.
    options.output = Standard_Stream;
    options.input_options = "/w";
    options.output_options = "/h/n/-";
    options.quiet = options.lines = true;
    return Run_Command(options);
}

}  // namespace ingester

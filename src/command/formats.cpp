#include "command/formats.h"

#include "command/usage.h"
#include "interface/format_drivers.h"

#include <CLI/CLI.hpp>
#include <cstdio>
#include <string>

namespace ingester {

namespace {

bool Is_Built(const Format_Driver& format)
{
    return format.read != nullptr || format.write != nullptr;
}

std::string Extensions_Of(const Format_Driver& format)
{
    const bool any_other = format.write != nullptr && format.extensions.empty();
    return any_other ? "any other" : std::string(format.extensions);
}

void Print_Row(const char* pattern, const Format_Driver& format)
{
    std::printf(pattern, std::string(format.name).c_str(), format.read != nullptr ? "yes" : "-",
                format.write != nullptr ? "yes" : "-", Extensions_Of(format).c_str());
}

void Print_Table(bool all)
{
    std::size_t hidden = 0;
    std::printf("%-36s %-6s %-7s %s\n", "FORMAT", "READS", "WRITES", "EXTENSIONS");
    for (const Format_Driver& format : All_Formats()) {
        if (!all && !Is_Built(format)) {
            ++hidden;
            continue;
        }
        Print_Row("%-36s %-6s %-7s %s\n", format);
    }
    if (hidden > 0)
        std::printf("\n%zu more are recognised and refused with a message; --all lists them.\n", hidden);
}

void Print_Markdown()
{
    std::puts("| Format | Reads | Writes | Extensions |\n|---|---|---|---|");
    for (const Format_Driver& format : All_Formats())
        if (Is_Built(format))
            Print_Row("| %s | %s | %s | %s |\n", format);
}

/// Names and extensions of the table need no escapes.
void Print_JSON()
{
    const char* before = "[";
    for (const Format_Driver& format : All_Formats()) {
        std::string extensions;
        for (const char c : "\"" + std::string(format.extensions) + "\"")
            extensions += c == ' ' ? std::string("\", \"") : std::string(1, c);
        std::printf(
            "%s\n  {\"code\": %d, \"name\": \"%s\", \"reads\": %s, \"writes\": %s, \"extensions\": [%s], "
            "\"max_columns\": %d}",
            before, format.code, std::string(format.name).c_str(), format.read != nullptr ? "true" : "false",
            format.write != nullptr ? "true" : "false", format.extensions.empty() ? "" : extensions.c_str(),
            format.max_columns);
        before = ",";
    }
    std::printf("\n]\n");
}

}  // namespace

int Run_Formats(int argc, const char* const* argv)
{
    CLI::App app{std::string(Name_Of(Task::formats).description), "ingester formats"};
    bool json = false;
    bool markdown = false;
    bool all = false;
    app.add_flag("--json", json, "Print all formats as JSON, for programs");
    app.add_flag("--markdown", markdown, "Print what is read and written as a table in Markdown");
    app.add_flag("--all", all, "List formats that are only recognised as well");
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& end) {
        return End_Parsing(app, end);
    }
    if (json)
        Print_JSON();
    else if (markdown)
        Print_Markdown();
    else
        Print_Table(all);
    return 0;
}

}  // namespace ingester

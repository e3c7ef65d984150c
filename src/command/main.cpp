#include "command/host.h"
#include "command/options.h"

int main(int argc, char** argv)
{
    ingester::Command_Options options;
    if (const auto early_end = ingester::Parse_Command_Line(argc, argv, options))
        return *early_end;
    return ingester::Run_Command(options);
}

#include "command/formats.h"
#include "command/host.h"
#include "command/option_documents.h"
#include "command/options.h"
#include "command/usage.h"

#include <algorithm>
#include <cstdio>
#include <string_view>

namespace {

using namespace ingester;

int Run_Task(Task task, int argc, const char* const* argv)
{
    Command_Options options;
    options.task = task;
    if (const auto early_end = Parse_Command_Line(argc, argv, options))
        return *early_end;
    return Run_Command(options);
}

/// A word that was misspelt would be taken for the name of a file.
bool Is_Misspelt_Task(std::string_view word)
{
    const std::string_view meant = Probable_Task(word);
    if (!meant.empty())
        std::fprintf(stderr, "ingester: there is no file %s; did you mean ingester %s?\n",
                     std::string(word).c_str(), std::string(meant).c_str());
    return !meant.empty();
}

}  // namespace

int main(int argc, char** argv)
{
    if (argc < 2)
        return Print_Usage(), Usage_Error;
    const std::string_view word = argv[1];
    if (Print_Option_Document(word))
        return 0;
    const auto tasks = Task_Names();
    const auto task = std::ranges::find(tasks, word, &Task_Name::name);
    if (task == tasks.end() || word.empty())
        return Is_Misspelt_Task(word) ? Usage_Error : Run_Task(Task::convert, argc, argv);
    return task->task == Task::formats ? Run_Formats(argc - 1, argv + 1)
                                       : Run_Task(task->task, argc - 1, argv + 1);
}

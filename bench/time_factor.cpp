// Times the conversion of a column of texts to a Factor. Makes FILE first when it isn't there: ROWS lines
// with one of LABELS texts each. Prints "name value" lines: seconds, levels, and a sum over all cells, so
// that another program's levels can be held against ours.

#include "interface/process_request.h"
#include "model/factors.h"
#include "request/messages.h"
#include "request/request.h"
#include "spreadsheet/text/text.h"

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <random>
#include <string>

namespace {

using namespace ingester;

bool Make_File(const std::string& name, long rows, long labels)
{
    std::FILE* const file = std::fopen(name.c_str(), "wb");
    if (file == nullptr)
        return false;
    std::mt19937_64 random(1);
    for (long row = 0; row < rows; ++row)
        std::fprintf(file, "site %07ld\n",
                     static_cast<long>(random() % static_cast<std::uint64_t>(labels)) * 7919 % 10000000);
    return std::fclose(file) == 0;
}

/// The sum of level times place, the places counted round to a thousand.
double Sum_Of_Levels(const Column& column)
{
    double sum = 0;
    long row = 0;
    for (const Cell_Node* cell = column.first_cell; cell != nullptr; cell = cell->next)
        sum += cell->value.number * static_cast<double>(++row % 1000);
    return sum;
}

}  // namespace

int main(int count, char** arguments)
{
    if (count != 4) {
        std::fputs("usage: time_factor FILE ROWS LABELS\n", stderr);
        return 2;
    }
    const std::string name = arguments[1];
    if (!std::filesystem::exists(name) && !Make_File(name, std::atol(arguments[2]), std::atol(arguments[3])))
        return 1;
    Start_Request();
    request.No_Names = true;
    request.Custom_Separators = "|";
    if (!Read_CSV_File(name.c_str()) || Current_Sheet == nullptr) {
        Close_Message_File();
        std::fprintf(stderr, "time_factor: %s could not be read\n", name.c_str());
        return 1;
    }
    Column* const column = Current_Sheet->first_column->next;
    const auto start = std::chrono::steady_clock::now();
    const bool converted = Text_To_Factor(column, false, true, 0);
    const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
    std::printf("factor_seconds %.6f\nrows %ld\nlevels %ld\nsum %.0f\n", taken.count(),
                static_cast<long>(column->length), static_cast<long>(column->nlevels),
                Sum_Of_Levels(*column));
    Free_Sheets();
    return converted ? 0 : 1;
}

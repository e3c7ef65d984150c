// Times sorting, merging and transposing of Sheets in memory.
//
// time_joins sort ROWS FILE     a text and a number as keys; FILE gets the rows as lines, for other programs
// time_joins merge ROWS         as many rows onto as many by both keys, and both sorts alone
// time_joins transpose ROWS COLUMNS    and a copy of the cells
// time_joins levels LABELS      as many labels onto as many others
// time_joins append COLUMNS     one row onto another by name

#include "interface/process_request.h"
#include "model/cell_appender.h"
#include "model/join/append.h"
#include "model/join/factor_levels.h"
#include "model/join/merge.h"
#include "model/sort.h"
#include "model/transpose.h"
#include "request/request.h"

#include <chrono>
#include <cstdint>
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <random>
#include <string>
#include <string_view>

namespace {

using namespace ingester;

template <class Work> void Time(const char* name, Work work)
{
    const auto start = std::chrono::steady_clock::now();
    const std::clock_t processor = std::clock();
    const bool good = work();
    const double processor_seconds = static_cast<double>(std::clock() - processor) / CLOCKS_PER_SEC;
    const std::chrono::duration<double> taken = std::chrono::steady_clock::now() - start;
    if (!good)
        std::exit(1);
    std::printf("%s_seconds %.6f\n%s_processor_seconds %.6f\n", name, taken.count(), name, processor_seconds);
}

/// A text of one of many sites, and a number of few digits, so that each key has equal ones.
Sheet* Keyed_Sheet(std::int32_t rows, unsigned seed)
{
    std::mt19937 random(seed);
    Sheet* const sheet = New_Sheet_With_Rows(rows);
    Column* const site = New_Data_Column(sheet, text_column, "site", rows);
    Column* const number = New_Data_Column(sheet, variate_column, "number", rows);
    Cell_Node* cell = number->first_cell;
    char text[32];
    for (Cell_Node* name = site->first_cell; name != nullptr; name = name->next, cell = cell->next) {
        std::snprintf(text, sizeof text, "site %06u", static_cast<unsigned>(random() % 100000));
        Set_Text(*site, *name, text);
        cell->value.number = static_cast<double>(random() % 1000000) / 100.0;
    }
    return sheet;
}

bool Write_Lines(const Sheet& sheet, const char* name)
{
    std::FILE* const file = std::fopen(name, "wb");
    if (file == nullptr)
        return false;
    const Column* const site = sheet.first_column->next;
    const Cell_Node* number = site->next->first_cell;
    for (const Cell_Node* cell = site->first_cell; cell != nullptr; cell = cell->next, number = number->next)
        std::fprintf(file, "%s,%.2f\n", cell->value.text, number->value.number);
    return std::fclose(file) == 0;
}

bool Sort_By_Both(Sheet* sheet)
{
    return Sort_Sheet({.sheet = sheet, .key_index = {1, 2}});
}

void Time_Merge(std::int32_t rows)
{
    Sheet* const copies[] = {Keyed_Sheet(rows, 1), Keyed_Sheet(rows, 2)};
    Time("sorts", [&] { return Sort_By_Both(copies[0]) && Sort_By_Both(copies[1]); });
    Free_Sheets();
    Sheet* const target = Keyed_Sheet(rows, 1);
    Sheet* const source = Keyed_Sheet(rows, 2);
    Time("merge", [&] {
        return Merge_Sheets({.target = target,
                             .source = source,
                             .key_count = 2,
                             .target_keys = {Column_At(target, 1), Column_At(target, 2)},
                             .source_keys = {Column_At(source, 1), Column_At(source, 2)}});
    });
}

void Time_Transpose(std::int32_t rows, std::int32_t columns)
{
    Sheet* const sheet = New_Sheet_With_Rows(rows);
    for (std::int32_t i = 0; i < columns; ++i)
        New_Data_Column(sheet, variate_column, "c" + std::to_string(i), rows);
    Time("copy", [&] {
        Sheet* const copy = New_Sheet_With_Rows(rows);
        for (Column* column = sheet->first_column->next; column != nullptr; column = column->next) {
            Column* const to = New_Data_Column(copy, variate_column, column->name, rows);
            Cell_Node* cell = to->first_cell;
            for (const Cell_Node* from = column->first_cell; from != nullptr; from = from->next) {
                cell->value = from->value;
                cell = cell->next;
            }
        }
        return true;
    });
    Time("transpose", [&] { return Transpose_Sheet(sheet); });
}

void Time_Levels(std::int32_t labels)
{
    Sheet* const sheet = New_Sheet_With_Rows(1);
    Column* factors[2];
    std::int32_t first = 0;
    for (Column*& factor : factors) {
        factor = New_Data_Column(sheet, factor_column, "f", 1);
        factor->nlevels = labels;
        factor->factor_kind = factor_with_labels;
        if (!Make_Labels(*factor, labels))
            std::exit(1);
        std::int32_t number = first;
        for (Level_Node* node = factor->labels; node != nullptr; node = node->next)
            node->value.text = factor->texts.Store("label " + std::to_string(number++));
        first = labels / 2;
    }
    std::vector<std::int32_t> map;
    Time("levels", [&] { return Merge_Factor_Levels(*factors[0], *factors[1], map, 0.0, false); });
}

void Time_Append(std::int32_t columns)
{
    Sheet* const sheets[] = {New_Sheet_With_Rows(1), New_Sheet_With_Rows(1)};
    for (std::int32_t i = 0; i < columns; ++i) {
        New_Data_Column(sheets[0], variate_column, "c" + std::to_string(i), 1);
        New_Data_Column(sheets[1], variate_column, "c" + std::to_string(i + columns / 2), 1);
    }
    Time("append", [&] { return Append_Sheet(sheets[0], {.source = sheets[1]}); });
}

}  // namespace

int main(int count, char** arguments)
{
    const std::string_view kind = count > 2 ? arguments[1] : "";
    const std::int32_t size = count > 2 ? std::atoi(arguments[2]) : 0;
    Start_Request();
    request.Max_Columns = 1000000;
    if (kind == "sort" && count == 4) {
        Sheet* const sheet = Keyed_Sheet(size, 1);
        if (!Write_Lines(*sheet, arguments[3]))
            return 1;
        Time("sort", [&] { return Sort_By_Both(sheet); });
    } else if (kind == "merge") {
        Time_Merge(size);
    } else if (kind == "transpose" && count == 4) {
        Time_Transpose(size, std::atoi(arguments[3]));
    } else if (kind == "levels") {
        Time_Levels(size);
    } else if (kind == "append") {
        Time_Append(size);
    } else {
        std::fputs("usage: time_joins sort|merge|transpose|levels|append SIZE [FILE|COLUMNS]\n", stderr);
        return 2;
    }
    Free_Sheets();
    return 0;
}

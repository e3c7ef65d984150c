// The requests of faults_below_test.cpp: tables that grow with every format, and nothing else.
#pragma once

#include "support/request_fixture.h"

#include <utility>

namespace ingester {

/// One kind of request: its records, and the files that are there before. "pipe" and "url" bring
/// what is in "in.csv".
struct Request_Kind {
    Texts records;
    Texts before;
};

inline const Request_Kind Kinds[] = {
    {{"in.csv", "new.tab"}, {"in.csv"}},
    {{"pipe", "o.csv"}, {"in.csv", "o.csv"}},
    {{"url", "o.csv"}, {"in.csv", "o.csv"}},
    {{"in.csv/tr", "o.csv"}, {"in.csv", "o.csv"}},
    {{"in.csv/lt=1/z=;", "o.csv"}, {"in.csv", "o.csv"}},
    {{"in.csv/c=2:3/s=3/e=5", "o.txt"}, {"in.csv", "o.txt"}},
    {{"in.csv", "o.csv/rewrite=7"}, {"in.csv", "o.csv"}},
    {{"in.csv/v", "o.csv"}, {"in.csv", "in.VAR", "o.csv"}},
    {{"in.csv/v", "o.csv"}, {"in.csv", "o.csv"}},
    {{"in.csv", "o.csv", "", "", "columns/s"}, {"in.csv", "columns", "o.csv"}},
    {{"in.csv", "o.csv", "", "", "rows/r"}, {"in.csv", "rows", "o.csv"}},
    {{"in.csv.gz", "o.csv"}, {"in.csv.gz", "o.csv"}},
    {{"in.csv", "new.tss"}, {"in.csv"}},
    {{"in.csv", "o.tss"}, {"in.csv", "o.tss"}},
    {{"in.tss/db", "o.csv"}, {"in.tss", "o.csv"}},
    {{"long.tss", "o.csv"}, {"long.tss", "o.csv"}},
    {{"in.csv", "new.tbk"}, {"in.csv"}},
    {{"in.tbk", "o.csv"}, {"in.tbk", "o.csv"}},
    {{"in.tbk/w", "o.csv"}, {"in.tbk", "o.csv"}},
    {{"in.tbk.gz", "o.csv"}, {"in.tbk.gz", "o.csv"}},
    {{"long.tbk", "o.csv"}, {"long.tbk", "o.csv"}},
    {{"in.csv", "o.tbk/a=Added"}, {"in.csv", "o.tbk"}},
    {{"in.csv", "long.tbk/a=Added"}, {"in.csv", "long.tbk"}},
    {{"in.csv", "o.tbk/r=Second"}, {"in.csv", "o.tbk"}},
    {{"in.csv", "o.tbk.gz/a=Added"}, {"in.csv", "o.tbk.gz"}},
    {{"in.csv", "o.gen/p"}, {"in.csv", "o.gen", "o.$V$"}},
    {{"in.csv", "o.csv/@"}, {"in.csv", "o.csv"}},
    {{"in.csv", "o.tss/@,from"}, {"in.csv", "o.tss"}},
    {{"in.csv", "o.tbk/@/!=Second"}, {"in.csv", "o.tbk"}},
    {{"in.csv", "o.csv/&"}, {"in.csv", "o.csv"}},
    {{"in.csv", "o.csv/%=1"}, {"in.csv", "in.mrg", "o.csv"}},
    {{"in.csv", "o.tss/%=1"}, {"in.csv", "in.mrg", "o.tss"}},
    {{"in.csv", "o.tbk/%=1U/!=Second"}, {"in.csv", "in.mrg", "o.tbk"}},
    {{"in.csv", "new.tpt"}, {"in.csv"}},
    {{"in.csv", "o.tpt"}, {"in.csv", "o.tpt"}},
    {{"in.tpt", "o.csv"}, {"in.tpt", "o.csv"}},
    {{"in.tpt/w", "o.csv"}, {"in.tpt", "o.csv"}},
    {{"long.tpt/+calendar", "o.csv"}, {"long.tpt", "o.csv"}},
    {{"in.sav", "o.csv"}, {"in.sav", "o.csv"}},
    {{"in.zsav/+types", "o.csv"}, {"in.zsav", "o.csv"}},
    {{"in.por/+types", "o.csv"}, {"in.por", "o.csv"}},
    {{"in.csv/+people", "o.tss"}, {"in.csv", "o.tss"}},
    {{"in.csv/+people/+encoding=932", "o.csv"}, {"in.csv", "o.csv"}},
    {{"in.csv/+people", "new.csv.gz"}, {"in.csv"}},
    {{"in.csv/+people", "o.csv.gz/@"}, {"in.csv", "o.csv.gz"}},
    {{"in.csv/+people/+strict", "o.tbk/a=Added"}, {"in.csv", "o.tbk"}},
};

/// Inputs that nothing here writes: seeds of fuzz targets, behind the two characters that choose options.
inline constexpr std::pair<const char*, const char*> Taken_Seeds[] = {
    {"spss_system/plain", "in.sav"},
    {"spss_system/packed", "in.zsav"},
    {"spss_portable/cases", "in.por"},
};

/// What is converted to have the files that are there before; in this order.
constexpr std::pair<const char*, const char*> Made[] = {
    {"in.csv", "in.tss"},
    {"in.csv", "in.tbk/a=First"},
    {"in.csv", "in.tbk/a=Second"},
    {"o.csv", "o.tss"},
    {"o.csv", "o.tbk/a=First"},
    {"o.csv", "o.tbk/a=Second"},
    {"o.csv", "o.tbk/a=Third"},
    {"in.csv", "in.tpt"},
    {"o.csv", "o.tpt"},
    {"long.csv", "long.tpt"},
    {"long.csv", "long.tss"},
    {"long.csv", "long.tbk/a=First"},
    {"in.csv", "long.tbk/a=Last"},
};

}  // namespace ingester

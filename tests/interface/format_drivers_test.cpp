// The table of formats.
#include "interface/format_drivers.h"

#include <gtest/gtest.h>

#include <tuple>

namespace ingester {
namespace {

TEST(Format_Drivers, Outputs_Are_Chosen_By_Their_Extension)
{
    const std::tuple<const char*, std::int32_t, std::int32_t> cases[] = {
        {"a.XLSX", 59, 50000},    {"a.xls", 5, 255},     {"a.tbk", 58, 10000000}, {"a.wor", 15, 224},
        {"a.dbf", 3, 511},        {"a.wq1", 8, 255},     {"a.ods", 67, 255},      {"a.ssd01", 37, 50000},
        {"a.rdata", 42, 50000},   {"a.html", 31, 50000}, {"a.gen.bak", 6, 50000}, {"", 6, 50000},
        {"a.csv.tab", 29, 50000}, {"csv", 6, 50000},
    };
    for (const auto& [name, code, columns] : cases) {
        EXPECT_EQ(Output_Driver_Of(name).code, code) << name;
        EXPECT_EQ(Output_Driver_Of(name).max_columns, columns) << name;
    }
    ASSERT_NE(Driver_Of_Code(43), nullptr);
    EXPECT_EQ(Driver_Of_Code(43)->code, 43);
    EXPECT_FALSE(Read_Data_File("a", 3, "a") || Read_Data_File("a", 99, "a")) << "there are no such readers";
}

}  // namespace
}  // namespace ingester

// The frame of exported functions, with an export of the test's own and statuses of its own.
#include "interface/export_frame.h"

#include "interface/host_fixture.h"
#include "model/sheet.h"

#include <new>

namespace ingester {
namespace {

class Export_Frame : public Host_Test {};

enum Toy_Status : std::int32_t { worked = 40, no_memory = 41 };

Call_Files Toy_Files(std::string_view first)
{
    const std::string temp = Get_Temp_Folder();
    return {temp + "toy.inp", temp + "toy.out", std::string("toy").append(first)};
}

std::optional<std::int32_t> Run_Toy(const Call_Files& files)
{
    New_Sheet_With_Rows(3);
    if (files.stem == "toy-silent")
        return std::nullopt;
    if (files.stem == "toy-greedy")
        throw std::bad_alloc();
    Report_Message("said\n");
    return worked;
}

TEST_F(Export_Frame, Serves_Any_Export)
{
    constexpr Export toy = {Toy_Files, Run_Toy, no_memory};
    Run_Export(toy, "", "");
    EXPECT_EQ(Take_Answer("toy", "toy.out"), Host_Answer(worked, "said\n:\n"));
    Run_Export(toy, "-greedy", "");
    EXPECT_EQ(Take_Answer("toy-greedy", "toy.out"),
              Host_Answer(no_memory, "Error: Not enough memory to read data.\n:\n"));
    Run_Export(toy, "-silent", "");
    EXPECT_EQ(Files(), "") << "no answer was to be given";
    Run_Export(toy, "", Request_Name("other.out"));
    EXPECT_EQ(Take_Answer("toy", "other.out").first, worked);
    EXPECT_EQ(Current_Sheet, nullptr) << "no Sheet outlives its call";
}

}  // namespace
}  // namespace ingester

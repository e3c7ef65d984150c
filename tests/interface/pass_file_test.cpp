// How a host and the library meet: pass files, carrier files, result files, list files.
#include "interface/pass_file.h"

#include "host_fixture.h"

#include <cmath>
#include <limits>

namespace ingester {
namespace {

using Pass_File_Test = Host_Test;

TEST_F(Pass_File_Test, Each_Fault_Has_Its_Words_And_Leaves_The_File)
{
    const std::tuple<std::string, std::uint32_t, std::string> records[] = {
        // with what stands before them
        {"Infile", 1120, Little(2.0)},
        {"Outfile", 1120, Pass_Bytes(2, {"i"})},
        {"Worksheet", 280, Pass_Bytes(3, {"i", ""})},
        {"Cell range", 280, Pass_Bytes(4, {"i", "o", "w"})},
        {"Secondary file", 1120, Pass_Bytes(5, {"i", "o", "w", "r"})},
        {"Subset file", 1120, Pass_Bytes(6, {"i", "o", "w", "r", "no\\x/a/s"})},
        {"Subset rows file", 1120, Pass_Bytes(6, {"i", "o", "w", "r", "no\\x/s/r"})},
    };
    std::vector<std::pair<std::string, std::string>> cases = {
        {"", "Number of arguments missing.\n"},
        {Little(2.0).substr(1), "Number of arguments missing.\n"},
        {Little(6.9), "Infile type missing.\n"},
    };
    for (const double count : {1.9, 7.0, -2.0, 1e300, std::nan(""), std::numeric_limits<double>::infinity()})
        cases.emplace_back(Pass_Bytes(count, {"i", "o"}), "Incorrect number of arguments.\n");
    for (const auto& [name, limit, before] : records) {
        const bool odd = name == "Outfile";
        const std::string most = std::string(limit, 'x');
        cases.emplace_back(before, name + " type missing.\n");
        cases.emplace_back(before + Word(0).substr(1), name + " type missing.\n");
        cases.emplace_back(before + Word(1) + Word(1) + "x", (odd ? "Infile" : name) + " type not text.\n");
        cases.emplace_back(before + Word(0), name + " length missing.\n");
        for (const std::uint32_t length : {limit + 1, 0x80000000U, 0xFFFFFFFFU})
            cases.emplace_back(before + Word(0) + Word(length) + most, name + " length invalid.\n");
        cases.emplace_back(before + Record(most).substr(0, 7 + limit),
                           (odd ? "Output file" : name) + " missing.\n");
    }
    cases.emplace_back(Pass_Bytes(2, {std::string(1120, 'x')}), "Outfile type missing.\n");
    for (const auto& [bytes, said] : cases) {
        EXPECT_EQ(Call_With_Bytes(bytes), (Host_Answer{1, said + ":\n"}));
        EXPECT_EQ(Get(Stem() + ".inp"), bytes) << said;
        EXPECT_EQ(Files(), Stem() + ".inp") << said;
    }
}

TEST_F(Pass_File_Test, A_Secondary_File_That_Cannot_Be_Fetched_Gets_No_Answer)
{
    EXPECT_EQ(Call({"i", "o", "", "", "http:\\\\h\\x.csv/s"}),
              (Host_Answer{-1, "Could not download secondary file URL:\nhttp:\\\\h\\x.csv\n:\n"}));
    EXPECT_EQ(Files(), Stem() + ".inp");
}

/// Words of a carrier's head; those that are looked at come from `changed`.
std::string Carrier_Bytes(std::size_t changed, std::uint32_t value, double id)
{
    std::uint32_t words[] = {1, 9, 9, 9, 9, 9, 1, 0, 3, 0, 1, 2, 9, 9};
    words[changed] = value;
    std::string bytes;
    for (const std::uint32_t word : words)
        bytes += Word(word);
    return bytes + Little(id);
}

TEST_F(Pass_File_Test, A_Carrier_Names_The_Files_By_Its_Id)
{
    constexpr std::size_t skipped = 5;
    std::vector<std::pair<std::string, std::int64_t>> cases = {
        {Carrier_Bytes(skipped, 0, 6699.9), 6699},
        {Carrier_Bytes(skipped, 7, 2147483647.0), 2147483647},
        {Carrier_Bytes(7, 0xFFFFFFFE, 10.0), 10},
        {Carrier_Bytes(7, 0xFFFFFFFD, 10.0), 0},  // both counts cancel out
        {Carrier_Bytes(skipped, 7, 10.0).substr(0, 63), 0},
    };
    for (const double id : {2147483648.0, 0.5, -3.0, std::nan("")})
        cases.emplace_back(Carrier_Bytes(skipped, 7, id), 0);
    for (const auto& [word, value] : {std::pair(0U, 2U), {6U, 0U}, {8U, 0U}, {9U, 1U}, {10U, 0U}, {11U, 1U}})
        cases.emplace_back(Carrier_Bytes(word, value, 10.0), 0);
    for (const auto& [bytes, id] : cases) {
        Put("carrier.bin", bytes);
        EXPECT_EQ(Read_Carrier_Id(Request_Name("carrier.bin")), id);
    }
    std::filesystem::create_directory(Path("sub"));
    std::string name = Request_Name("sub\\carrier.bin");
    for (std::size_t at = 0; (at = name.find('\\', at)) != std::string::npos; at += 2)
        name.insert(at, 1, '\\');  // as a host writes it
    Put("sub/carrier.bin", Carrier_Bytes(skipped, 0, 6699.9));
    const auto answer = [&] {
        INGESTER(name.data(), nullptr, static_cast<std::int32_t>(name.size()), 5);
        return Take_Answer("IG1A2B", "IG1A2B.out");
    };
    EXPECT_EQ(answer(), (Host_Answer{1, "Pass file " + Request_Name("IG1A2B.tmp") + " not found./n:\n"}));
    Put("IG1A2B.tmp", Pass_Bytes(2, {"", "o.tab"}));
    EXPECT_EQ(answer(), (Host_Answer{3, "Input file name is NULL or empty.\nFiles type unknown.\n:\n"}));
    EXPECT_EQ(Files(), "carrier.bin sub sub/carrier.bin");
}

TEST_F(Pass_File_Test, The_Result_Goes_Where_It_Is_Asked_For)
{
    const std::string name = Path("given.res") + "behind the name";
    Put(Stem() + ".inp", Pass_Bytes(2, {"none.csv", "o.tab"}));
    INGESTER("none", name.data(), 4, static_cast<std::int32_t>(Path("given.res").size()));
    EXPECT_EQ(Take_Answer(Stem(), "given.res").first, 2);
    EXPECT_EQ(Files(), "");
    Put(Stem() + ".inp", Pass_Bytes(1, {}));
    const std::string nowhere = Path("no/given.res");
    EXPECT_EQ(INGESTER(nullptr, nowhere.data(), -1, static_cast<std::int32_t>(nowhere.size())), 0);
    EXPECT_EQ(Files(), Stem() + ".ERR " + Stem() + ".inp");
}

TEST_F(Pass_File_Test, Markers_And_Lists_Of_The_Secondary_File)
{
    using enum Add_Modes;
    const std::string folder = Request_Name("");
    // The record, the count, lists in records behind it; then what it leaves, the mode, and the numbers of
    // names and flags that were read, below 0 for no subset.
    const std::tuple<std::string, double, Texts, std::string, Add_Modes, int, int> cases[] = {
        {"d.csv/a", 5, {}, "d.csv", append, -1, -1},
        {"/m/c/a d.csv", 5, {}, " d.csv", merge, -1, -1},
        {"columns/s", 5, {}, "columns", none, 2, -1},
        {"rows/r", 5, {}, "rows", none, -1, 3},
        {"columns/r/s", 6, {"rows"}, "columns", none, 2, 3},
        {"columns/r/s", 5, {}, "columns", none, 2, -1},
        {"d.csv/c/s", 6, {"columns"}, "d.csv", concatenate, 2, -1},
        {"d.csv/c/s", 5, {}, "d.csv", concatenate, -1, -1},
        {"d.csv/a/r", 5, {"rows"}, "d.csv", append, -1, 3},
        {"d.csv/a/r/s", 6, {"columns", "rows"}, "d.csv", append, 2, 3},
    };
    for (const auto& [secondary, count, lists, rest, mode, names, flags] : cases) {
        SCOPED_TRACE(secondary);
        Start_Request("t");
        Put("columns", "2\nVariate\n a \nb\nc\n");
        Put("rows", "3\n1\n0\n1\n");
        Texts records = {"i", "o", "w", "r", secondary.empty() ? "" : folder + secondary};
        for (const std::string& list : lists)
            records.push_back(folder + list);
        const std::string bytes = Pass_Bytes(count, records);
        Input_File file(std::as_bytes(std::span(bytes)));
        Pass_Request asked;
        ASSERT_TRUE(Read_Pass_File(file, asked)) << Messages();
        EXPECT_EQ(file.Position(), std::ssize(bytes));
        EXPECT_EQ(request.Secondary_File.view(), secondary.empty() ? "" : folder + rest);
        EXPECT_EQ(request.Add_Mode, mode);
        EXPECT_EQ(request.Subset_Columns ? request.Subset_Name_Count : -1, names);
        EXPECT_EQ(request.Subset_Rows ? request.Subset_Row_Count : -1, flags);
    }
}

}  // namespace
}  // namespace ingester

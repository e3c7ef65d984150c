// What files are taken for, by their heads and names.
#include "interface/file_detection.h"

#include "interface/detection_tests.h"
#include "interface/format_drivers.h"
#include "platform/gzip_file.h"
#include "support/request_fixture.h"

namespace ingester {
namespace {

using namespace std::string_literals;

std::string Zeros(std::size_t count)
{
    return std::string(count, '\0');
}

const std::string Fortran = "Dune meadow\n(I4,2X,5(I4,F5.1))\n5\n" + std::string(100, ' ');

class File_Detection_Test : public Request_Test {
protected:
    [[nodiscard]] std::string Gzipped(const std::string& text) const
    {
        Put("plain", text);
        EXPECT_TRUE(Compress_File(Request_Name("plain"), Request_Name("packed")));
        return Get("packed");
    }
};

// Signatures that stand for themselves aren't told again: what is here is where rules meet.
TEST_F(File_Detection_Test, Signatures_Come_Before_Names_And_Both_Before_The_Look_Of_Text)
{
    const std::tuple<std::int32_t, const char*, std::string> cases[] = {
        {58, "x", "TBK\1KVX\0"s},
        {18, "x.DHT", "\xDA\xDA"s},
        {0, "x.dh", "\xDA\xDA"s},
        {18, "x", "\xDD\xDD"s + Zeros(6) + "\x86\0"s},
        {76, "x.mat", "MATLAB 5"},
        {25, "x.txt", "MATLAB 5\n"},
        {5, "x.xls", "\x09\0\x04\0"s},
        {0, "x.csv", "\x09\0\x04\0"s},
        {5, "x", "\x09\4\6\0\0\0\x10\0"s},
        {0, "x.xls", "\x09\4\6\0\1\0\x10\0"s},
        {23, "x", "\x70\1\2"s},
        {23, "x", "\x72\2\1"s},
        {8, "x", "\0\0\2\0\2\x10"s},
        {2, "x", "\0\0\2\0\3\x10"s},
        {37, "x", "SAS\1" + Zeros(60) + "sparc"},
        {10, "x", "SAS\1"},
        {37, "x", Zeros(84) + "SAS" + Zeros(34) + "\1"},
        {45, "x", std::string(40, '\1') + "ASCII SPSS PORT FILE  "},
        {59, "book.XLSX", "PK\3\4"},
        {56, "data.zip", "PK\3\4"},
        {80, "x.gdt", "\x1F\x8B\x08\0\0\0\0\0"s},
        {57, "x.gdt", "\x1F\x8B\x08\0\1\0\0\0"s},
        {57, "x", "\x1F\xA0"s},
        {0, "x", "\x1F\x9D"s},
        {52, "x", "\x41\0\0\0\4\0\0\0"s},
        {0, "x", "\x41\0\0\0\5\0\0\0"s},
        {53, "x.CEL", "[cel]\n"},
        {25, "x.txt", "[CEL]\n"},
        {82, "x", "<?xml version='1.0'?>\n<!--doctype SSS"},
        {80, "x", "<?xml version='1.0'?>\n<!DOCTYPE gretldata"},
        {3, "x", "\x83\x50\x0C\x1F"s},
        {0, "x", "\x83\x50\x0D\x1F"s},
        {3, "x", "\2\0\0\1\1\x50"s},
        {72, "x.cep", Fortran},
        {25, "x.txt", Fortran},
        {25, "x.cep", "a" + std::string(80, 'b') + Fortran},
        {3, "x.DBF", "\x08\xFF"s},
        {25, "x.csv", "a,b,c\n"},
        {25, "x.csv", std::string(55, 'a') + "\xFF"},
        {0, "x.csv", "a,b,c"},
        {0, "x.csv", "a,\xE9\n"},
        {0, "x.csv", "a,\x0B\n"},
        {25, "x.csv", "a,\t\x0C\n"},
    };
    for (const auto& [code, name, bytes] : cases) {
        Put(name, bytes);
        EXPECT_EQ(Detect_File_Type(Request_Name(name)), code) << name << testing::PrintToString(bytes);
    }
    EXPECT_EQ(Messages(), "");
    Put("dune.spe", Fortran);
    EXPECT_TRUE(Looks_Like_Cornell(Request_Name("dune.spe")));
    EXPECT_FALSE(Looks_Like_Cornell(Request_Name("none.spe")));
}

TEST_F(File_Detection_Test, Compressed_Files_Are_Read_Whole_Or_Refused)
{
    const std::string table = "plot,yield\n1,2.5\n2,3.5\n";
    const std::string packed = Gzipped(table);
    std::string spoilt = packed;
    spoilt[packed.size() - 6] ^= 1;  // in the check value
    Put("good.gz", packed);
    const std::tuple<const char*, std::string, std::string> cases[] = {
        {"good.gz", packed, ""},
        {"two.gz", Gzipped("plot,yield\n1,2.5\n") + Gzipped("2,3.5\n"), ""},
        {"padded.gz", packed + Zeros(300), ""},
        {"cut.gz", packed.substr(0, packed.size() - 9), "Compressed file is damaged or not complete.\n:\n"},
        {"spoilt.gz", spoilt, "Compressed file is damaged or not complete.\n:\n"},
        {"head.gz", packed.substr(0, 12), "Compressed file is damaged or not complete.\n:\n"},
        {"other.z", "\x1F\xA0 not gzip", "Cannot open compressed file.\n:\n"},
        {"twice.gz", Gzipped(packed),
         "Compressed file holds another compressed file. Decompress it first.\n:\n"},
        {"void.gz", Gzipped(""), "Input file is empty.\n:\n"},
    };
    for (const auto& [name, bytes, said] : cases) {
        Start_Request("t");
        Put(name, bytes);
        const std::string file = Request_Name(name);
        EXPECT_EQ(Read_Data_File(file, 57, "its source"), said.empty()) << name;
        EXPECT_EQ(Messages(), said) << name;
        EXPECT_EQ(Current_Sheet == nullptr ? 0 : Current_Sheet->row_count, said.empty() ? 2 : 0) << name;
        EXPECT_EQ(request.Current_File_Name, "its source");
    }
    EXPECT_EQ(Files().find("$IG"), std::string::npos) << "a scratch file was left";
}

}  // namespace
}  // namespace ingester

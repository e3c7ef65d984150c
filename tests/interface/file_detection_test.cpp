// What files are taken for, by their heads and names.
#include "interface/file_detection.h"

#include "interface/detection_tests.h"
#include "interface/format_drivers.h"
#include "support/request_fixture.h"

#include <cstring>

#include <zlib.h>

namespace ingester {
namespace {

using namespace std::string_literals;

/// `text` with zeros in front, so that it stands at an offset.
std::string At(std::size_t offset, const std::string& text, const std::string& start = "")
{
    return start + std::string(offset - start.size(), start.empty() ? '\1' : '\0') + text;
}

std::string Zeros(std::size_t count)
{
    return std::string(count, '\0');
}

std::string Gzipped(const std::string& text)
{
    z_stream stream{};
    std::string packed(text.size() + 1000, '\0');
    deflateInit2(&stream, 6, Z_DEFLATED, 15 + 16, 8, Z_DEFAULT_STRATEGY);
    stream.next_in = reinterpret_cast<Bytef*>(const_cast<char*>(text.data()));
    stream.avail_in = static_cast<uInt>(text.size());
    stream.next_out = reinterpret_cast<Bytef*>(packed.data());
    stream.avail_out = static_cast<uInt>(packed.size());
    deflate(&stream, Z_FINISH);
    packed.resize(stream.total_out);
    deflateEnd(&stream);
    return packed;
}

const std::string Calvin = "\x3B\x01\0\0\0\x01"s + Zeros(4);
const std::string Fortran = "Dune meadow\n(I4,2X,5(I4,F5.1))\n5\n" + std::string(100, ' ');

class File_Detection_Test : public Request_Test {
protected:
    void Expect(std::int32_t code, const std::string& name, const std::string& bytes) const
    {
        Put(name, bytes);
        EXPECT_EQ(Detect_File_Type(Request_Name(name)), code)
            << name << ": " << testing::PrintToString(bytes.substr(0, 30));
        std::filesystem::remove(Path(name));
    }
};

TEST_F(File_Detection_Test, Signatures_Come_Before_Names_And_Both_Before_The_Look_Of_Text)
{
    const std::tuple<std::int32_t, const char*, std::string> cases[] = {
        {58, "x", "TBK\1KVX\0"s},
        {1, "x", "QP>\3"s},
        {1, "x", "\3\x2D\xAE\x14"s},
        {13, "x", "\0S data\1"s},
        {21, "x", "\x4B\6\x1E\0\0\0\0\0"s},
        {18, "x", "\xFF\xFF\xFF\xFF\0\0\0\0"s},
        {18, "x.DHT", "\xDA\xDA"s},
        {0, "x.dh", "\xDA\xDA"s},
        {18, "x", "\xDD\xDD"s + Zeros(6) + "\x86\0"s},
        {18, "x", "\xDA\xEE\1\0\0\0\0\0"s},
        {18, "x", "\0\0\0\0\xCA\xCA\xCA\xEE"s},
        {16, "x", "12345\0004.00/EV"s},
        {20, "x.sav", Zeros(10)},
        {76, "x.mat", "MATLAB 5"},
        {25, "x.txt", "MATLAB 5\n"},
        {5, "x", "\x09\0\x04\0\7\5\x10\0"s},
        {5, "x", "\x09\0\x04\0\7\0\x10\0"s},
        {5, "x.xls", "\x09\0\x04\0"s},
        {0, "x.csv", "\x09\0\x04\0"s},
        {5, "x", "\x09\4\6\0\0\0\x10\0"s},
        {0, "x.xls", "\x09\4\6\0\1\0\x10\0"s},
        {5, "x.txt", "\xD0\xCF\x11\xE0\xA1\xB1"s},
        {23, "x", "\x70\1\2"s},
        {23, "x", "\x72\2\1"s},
        {8, "x", "\0\0\2\0\2\x10"s},
        {2, "x", "\0\0\2\0\3\x10"s},
        {26, "x", "\0\0\x27\x0A"s + Zeros(17) + "\1"s},
        {22, "x", "$FL2@(#) SPSS"},
        {15, "x", "\x40\x0D"s},
        {7, "x", "WORKSHEET"},
        {35, "x", "css 12\xFF\xFF"s},
        {36, "x", "\0\4\0\0\0\1\0\0\0\3\0\0\0"s},
        {68, "x", "\x80\6\0\0\0\0\0\0"s + Zeros(5)},
        {37, "x", At(64, "sparc", "SAS\1")},
        {10, "x", "SAS\1"},
        {37, "x", "\0\0\xFF\xFF\0\0"s},
        {46, "x", "\xC3\xFF\xFF\xFF"s},
        {49, "x", "\0\0\0\1\0\0\0\1"s},
        {37, "x", Zeros(84) + "SAS" + Zeros(34) + "\1"},
        {28, "x", "HEADER RECORD*******LIBRARY HEADER RECORD!!!!!!!000000"},
        {45, "x", At(40, "ASCII SPSS PORT FILE  ")},
        {59, "book.XLSX", "PK\3\4"},
        {67, "x.ods", "PK\3\4"},
        {56, "data.zip", "PK\3\4"},
        {80, "x.gdt", "\x1F\x8B\x08\0\0\0\0\0"s},
        {57, "x.gdt", "\x1F\x8B\x08\0\1\0\0\0"s},
        {57, "x", "\x1F\xA0"s},
        {0, "x", "\x1F\x9D"s},
        {81, "x", "K\6\x14\0"s},
        {38, "x", "minitab portable worksheet"},
        {40, "x", "#!/usr/explorer/bin/explorer cxTablet binary"},
        {41, "x", "## Dump S Version 4 Dump ##"},
        {42, "x", "RDX2\nX\n"},
        {43, "x", "RDA2\r\nA\r\n"},
        {25, "x", "RDA2 \n"},
        {50, "x", "\x40\0\0\0\4\0\0\0"s},
        {51, "x", "\x43\0\0\0\4\0\0\0"s},
        {52, "x", "\x41\0\0\0\1\0\0\0"s},
        {0, "x", "\x41\0\0\0\5\0\0\0"s},
        {55, "x", "GeneChip Sequence"},
        {53, "x.CEL", "[cel]\n"},
        {25, "x.txt", "[CEL]\n"},
        {69, "x", Calvin + "\0\0\0\x1B"s + "affymetrix-calvin-intensity"},
        {70, "x", Calvin + "\0\0\0\x22"s + "affymetrix-quantification-analysis"},
        {0, "x", Calvin + "\0\0\0\x23"s + "affymetrix-quantification-analysis"},
        {44, "x.sav", "\2\0\0\0\0\0\0\0"s},
        {82, "x", "<?xml version='1.0'?>\n<!--doctype SSS"},
        {80, "x", "<?xml version='1.0'?>\n<!DOCTYPE gretldata"},
        {27, "x.mif", "version 300\n"},
        {3, "x", "\x83\x50\x0C\x1F"s},
        {0, "x", "\x83\x50\x0D\x1F"s},
        {3, "x", "\2\0\0\1\1\x50"s},
        {71, "x", "\1\0\0\0\xFF\xFF\xFF\xFF\1\0\0\0\0\0\0\0\1\0\0\0"s},
        {75, "x", "[Dictionary]\n"},
        {77, "x.wf1", "EViews File V01"},
        {78, "x.dta", "<stata_dta>"},
        {79, "x.rat", "RAT4"},
        {72, "x.cep", Fortran},
        {25, "x.txt", Fortran},
        {25, "x.cep", "a" + std::string(80, 'b') + Fortran},
        {33, "x.wav", "RIFF\xFF"s},
        {0, "x.wav", "RIFX\xFF"s},
        {3, "x.DBF", "\x08\xFF"s},
        {17, "x.rec", "a\n"},
        {66, "x.wbmp", "a\n"},
        {73, "x.loc", "a\n"},
        {74, "x.qda", "a\n"},
        {25, "x.csv", "a,b,c\n"},
        {25, "x.csv", std::string(55, 'a') + "\xFF"},
        {0, "x.csv", "a,b,c"},
        {0, "x.csv", "a,\xE9\n"},
        {0, "x.csv", "a,\x0B\n"},
        {25, "x.csv", "a,\t\x0C\n"},
    };
    for (const auto& [code, name, bytes] : cases)
        Expect(code, name, bytes);
    EXPECT_EQ(Messages(), "");
}

TEST_F(File_Detection_Test, Compressed_Files_Are_Known_By_What_They_Hold)
{
    Put("t.gz", Gzipped("TBK\1KVX\0"s + std::string(300, 'x')));
    Put("c.gz", Gzipped("a,b\n1,2\n"));
    Put("plain", "a,b\n");
    EXPECT_EQ(Detect_Compressed_File_Type(Request_Name("t.gz")), 58);
    EXPECT_EQ(Detect_Compressed_File_Type(Request_Name("c.gz")), 25);
    EXPECT_EQ(Messages(), "");
    EXPECT_EQ(Detect_Compressed_File_Type(Request_Name("plain")), 0);
    EXPECT_EQ(Detect_Compressed_File_Type(Request_Name("none")), 0);
    EXPECT_EQ(Messages(), "Cannot open compressed file.\nCannot open compressed file.\n:\n");
    Put("dune.spe", Fortran);
    EXPECT_TRUE(Looks_Like_Cornell(Request_Name("dune.spe")));
    EXPECT_FALSE(Looks_Like_Cornell(Request_Name("t.gz")));
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

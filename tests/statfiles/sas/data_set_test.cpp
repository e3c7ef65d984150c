// Data sets of Version 6 in both layouts.
#include "statfiles/sas/sas.h"
#include "statfiles/shared/stat_fixture.h"

namespace ingester {

namespace {

using namespace std::string_literals;

template <class T> std::string Little_Bytes(T value)
{
    return Bytes_Of(value, std::endian::little);
}

template <class T> void Put_At(std::string& bytes, std::size_t at, T value)
{
    bytes.replace(at, sizeof value, Little_Bytes(value));
}

/// The last bytes of a double, which are its first in size.
std::string Short_Double(double value, std::size_t width)
{
    return Little_Bytes(value).substr(8 - width);
}

std::string Short_File(const std::string& version = "6.04")
{
    std::string head = Padded("SAS     " + version, 216, '\0');
    Put_At(head, 122, std::int16_t{9});
    Put_At(head, 124, std::int16_t{2});
    Put_At(head, 126, std::int32_t{2});
    std::string number(106, ' ');
    std::string text(106, ' ');
    Put_At(number, 0, std::int16_t{1});
    Put_At(number, 4, std::int16_t{4});
    number.replace(8, 5, "YIELD").replace(16, 5, "Label");
    Put_At(text, 0, std::int16_t{2});
    Put_At(text, 4, std::int16_t{5});
    return head + number + text + Short_Double(2.5, 4) + " abc " + Short_Double(-1e308, 4) + "\0    "s;
}

/// Two pages: the first describes two variables and holds a row, the second holds two.
std::string Paged_File(std::int32_t rows = 3)
{
    std::string head = Padded("SAS     6.08", 256, '\0');
    Put_At(head, 92, std::int32_t{512});
    std::string page(512, '\0');
    Put_At(page, 8, std::int16_t{3});
    Put_At(page, 10, std::int16_t{512});
    const auto place = [&](int i, std::int32_t offset, std::int32_t length) {
        Put_At(page, 16 + static_cast<std::size_t>(i) * 12, offset);
        Put_At(page, 20 + static_cast<std::size_t>(i) * 12, length);
    };
    place(0, 480, 28);
    place(1, 64, 72);
    place(2, 320, 72);
    Put_At(page, 480 + 8, std::int32_t{2});
    Put_At(page, 480 + 20, std::int32_t{11});
    Put_At(page, 480 + 24, rows);
    const auto variable = [&](std::size_t at, const std::string& name, std::int16_t type, std::int16_t length,
                              std::int32_t offset, std::int16_t number) {
        page.replace(at, 12, "NAME" + Padded(name, 8));
        Put_At(page, at + 12, type);
        Put_At(page, at + 64, offset);
        Put_At(page, at + 68, length);
        Put_At(page, at + 70, number);
    };
    variable(64, "T", 2, 3, 8, 2);
    variable(320, "", 1, 8, 0, 1);
    const std::string row = Little_Bytes(7.25) + "xyz";
    page.replace(52, row.size(), row);
    std::string more(512, '\0');
    more.replace(16, 22,
                 Little_Bytes(std::numeric_limits<double>::infinity()) + "ab "
                     + Little_Bytes(std::numeric_limits<double>::quiet_NaN()) + "   ");
    return head + page + more;
}

class Sas_Data_Set : public Stat_Test {
protected:
    static std::string Read(const std::string& bytes)
    {
        return Render(Read_Bytes(Read_Sas_Data_Set, bytes, "t.ssd", {}));
    }
};

TEST_F(Sas_Data_Set, Both_Layouts)
{
    EXPECT_EQ(Read(Short_File()), "YIELD V2.5|*; C2 Tabc|");
    EXPECT_EQ(Column_At(Current_Sheet, 1)->extra, "Label");
    EXPECT_EQ(Read(Short_File("6.03")), "YIELD V2.5|*; C2 Tabc|");
    EXPECT_EQ(Read(Paged_File()), "C1 V7.25|9.99999e+307|*; T Txyz|ab|");
}

TEST_F(Sas_Data_Set, What_Is_Refused)
{
    EXPECT_EQ(Read(Short_File("6.05")), "");
    EXPECT_EQ(Messages(), "");
    const std::string unreadable = "Cannot successfully read SAS transport file.\n:\n";
    EXPECT_EQ(Read(Paged_File(100)), "");
    EXPECT_EQ(Messages(), unreadable);
    std::string packed = Paged_File();
    packed.replace(256 + 480, 3, "CMP");
    EXPECT_EQ(Read(packed), "");
    EXPECT_EQ(Messages(), unreadable);
    std::string long_pointer = Paged_File();
    Put_At(long_pointer, 256 + 20, std::int32_t{512});
    EXPECT_EQ(Read(long_pointer), "");
    EXPECT_EQ(Render(Read_Bytes(Read_Sas_Data_Set, Short_File(), "t", [] { request.Max_Columns = 1; })),
              "YIELD V2.5|*");
    EXPECT_EQ(Messages(), "Warning Columns above 1 NOT transfered.\n:\n");
    Damage(Read_Sas_Data_Set, Short_File(), "t.ssd");
    Damage(Read_Sas_Data_Set, Paged_File(), "t.ssd", All_For_People);
}

}  // namespace

}  // namespace ingester

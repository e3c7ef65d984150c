// Typed fields on their way in and out, in both byte orders.
#include "platform/field_sink.h"
#include "platform/field_source.h"

#include "support/request_fixture.h"

namespace ingester {
namespace {

using Fields_Test = Request_Test;

struct Point {
    std::int16_t kind = 0;
    double x = 0;
    std::uint8_t mark = 0;

    bool operator==(const Point&) const = default;
};
constexpr std::tuple Point_Fields{&Point::mark, &Point::kind, &Point::x};

Field_Source Source_Of(Input_File& file, std::endian order = std::endian::little)
{
    return Field_Source(file, order);
}

TEST_F(Fields_Test, Both_Orders_As_They_Stand_In_The_File)
{
    const std::pair<std::endian, std::string> cases[] = {
        {std::endian::little, std::string("\x02\x01\x04\x03\x02\x01\x00\x00\xC0\x3F"
                                          "\x07\xFE\xFF\x00\x00\x00\x00\x00\x00\x04\x40"
                                          "\x03\x00xyz\x05\x00\x06\x00"
                                          "ab__",
                                          34)},
        {std::endian::big, std::string("\x01\x02\x01\x02\x03\x04\x3F\xC0\x00\x00"
                                       "\x07\xFF\xFE\x40\x04\x00\x00\x00\x00\x00\x00"
                                       "\x00\x03xyz\x00\x05\x00\x06"
                                       "ab__",
                                       34)},
    };
    for (const auto& [order, bytes] : cases) {
        Output_File out;
        ASSERT_TRUE(out.Open(Request_Name("out")));
        Field_Sink sink(out, order);
        std::int16_t pair[] = {5, 6};
        sink.Put(std::uint16_t{0x0102}, std::uint32_t{0x01020304}, 1.5F);
        sink.Put_Record(Point{-2, 2.5, 7}, Point_Fields);
        sink.Put_Text<std::uint16_t>("xyz");
        sink.Put_Numbers(std::span(pair));
        sink.Put_Padded("ab", 4, '_');
        ASSERT_TRUE(out.Close());
        EXPECT_EQ(Get("out"), bytes);

        Input_File file(std::as_bytes(std::span(bytes)));
        Field_Source source(file, order);
        std::uint16_t half = 0;
        std::uint32_t word = 0;
        float real = 0;
        Point point;
        std::string text;
        std::string padded;
        EXPECT_TRUE(source.Read(half, word, real) && source.Read_Record(point, Point_Fields)
                    && source.Read_Text<std::uint16_t>(9, text) && source.Read_Numbers(std::span(pair))
                    && source.Read_Bytes(4, 2, padded));
        EXPECT_EQ(std::tuple(half, word, real, point, text, pair[0], pair[1], padded),
                  std::tuple(0x0102, 0x01020304U, 1.5F, Point{-2, 2.5, 7}, "xyz", 5, 6, "ab"));
        EXPECT_FALSE(source.Ended());
        EXPECT_TRUE(!source.Read(half) && source.Ended());
    }
}

TEST_F(Fields_Test, No_Length_Is_Believed)
{
    struct Case {
        const char* of;
        std::string bytes;
        bool (*read)(Field_Source& source, std::string& text);
        bool good;
        std::string text;
        std::int64_t position;
    };
    const std::string claims_2g("\xFF\xFF\xFF\x7F", 4);
    const Case cases[] = {
        {"a text of two gigabytes", claims_2g + "abc",
         [](Field_Source& source, std::string& text) { return source.Read_Text(90, text); }, false, "abc", 7},
        {"a text of a negative length", std::string("\xFF\xFF\xFF\xFF", 4) + "abc",
         [](Field_Source& source, std::string& text) { return source.Read_Text(90, text); }, false, "", 4},
        {"no more is kept than was asked", std::string("\x05", 1) + "abcdef",
         [](Field_Source& source, std::string& text) { return source.Read_Text<std::uint8_t>(2, text); },
         true, "ab", 6},
        {"bytes without number, all kept", "abc",
         [](Field_Source& source, std::string& text) {
             return source.Read_Bytes(std::numeric_limits<std::int64_t>::max(),
                                      std::numeric_limits<std::size_t>::max(), text);
         },
         false, "abc", 3},
        {"a skip to the end", std::string(40000, 'x'),
         [](Field_Source& source, std::string&) { return source.Skip(40000); }, true, "", 40000},
        {"a skip beyond it", std::string(40000, 'x'),
         [](Field_Source& source, std::string&) { return source.Skip(40001); }, false, "", 40000},
        {"a skip backwards is none", "abc",
         [](Field_Source& source, std::string&) { return source.Skip(-2); }, true, "", 0},
        {"the end is a position", "abc", [](Field_Source& source, std::string&) { return source.Seek(3); },
         true, "", 3},
        {"nothing behind it is", "abc", [](Field_Source& source, std::string&) { return source.Seek(4); },
         false, "", 0},
        {"nor in front of the file", "abc",
         [](Field_Source& source, std::string&) { return source.Seek(-1); }, false, "", 0},
    };
    for (const Case& c : cases) {
        const auto check = [&c](Input_File& file, const char* kind) {
            Field_Source source = Source_Of(file);
            std::string text;
            EXPECT_EQ(c.read(source, text), c.good) << c.of << kind;
            EXPECT_EQ(text.substr(0, c.text.size()), c.text) << c.of << kind;
            EXPECT_LT(text.capacity(), 100000U) << c.of << kind;
            EXPECT_EQ(file.Position(), c.position) << c.of << kind;
        };
        Input_File memory(std::as_bytes(std::span(c.bytes)));
        check(memory, " in memory");
        Put("f", c.bytes);
        Input_File file;
        ASSERT_TRUE(file.Open(Request_Name("f")));
        check(file, " in a file");
    }
}

TEST_F(Fields_Test, What_A_File_Can_Hold)
{
    const std::string bytes(100, 'x');
    Input_File file(std::as_bytes(std::span(bytes)));
    Field_Source source = Source_Of(file);
    ASSERT_TRUE(source.Skip(20));
    EXPECT_EQ(source.Possible(1000000, 8), 10);
    EXPECT_EQ(source.Possible(9, 8), 9);
}

TEST_F(Fields_Test, Room_That_Was_Left_Is_Filled)
{
    Output_File out(Output_File::small_buffer);
    ASSERT_TRUE(out.Open(Request_Name("out")));
    Field_Sink sink(out, std::endian::big);
    sink.Put_Bytes("ab");
    const std::int64_t place = sink.Leave_Room<std::uint16_t>();
    sink.Fill(10000, '-');
    sink.Put_At(place, std::uint16_t{0x4142});
    ASSERT_TRUE(out.Close());
    EXPECT_EQ(Get("out"), "abAB" + std::string(10000, '-'));
}

}  // namespace
}  // namespace ingester

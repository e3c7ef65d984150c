// Whole spreadsheet files: every version and order, what the writer makes of them, and broken ones.
#include "hostfiles/tss/tss_fixture.h"

#include <limits>

namespace ingester {

namespace {

using TSS_Files = TSS_Test;

TEST_F(TSS_Files, Every_Version_And_Order_Reads_The_Same)
{
    for (const std::int32_t version : {3, 2, 1, 0})
        for (const std::endian order : {std::endian::big, std::endian::little})
            for (const Small_File& small : Small_Files(version)) {
                SCOPED_TRACE(small.what + ", version " + std::to_string(version));
                if (version == 0)  // has the order of the file in front of it
                    Read(Encode(Maker{1}.Head(1, 1, 1), order));
                const Sheet* const sheet = Read(Encode(small.items, order));
                ASSERT_EQ(Messages(), "");
                ASSERT_NE(sheet, nullptr);
                EXPECT_EQ(Render(sheet), small.cells);
                EXPECT_EQ(sheet->format_version, version);
            }
}

/// The bytes were put together by hand, so this holds the writer against the layout as well.
TEST_F(TSS_Files, Are_Written_As_They_Were)
{
    for (const Small_File& small : Small_Files(3)) {
        SCOPED_TRACE(small.what);
        const std::string bytes = Encode(small.items);
        Sheet* const sheet = Read(bytes);
        ASSERT_NE(sheet, nullptr);
        const std::string written = Written(sheet);
        EXPECT_EQ(written == bytes, small.comes_back);
        ASSERT_NE(Read(written), nullptr);
        EXPECT_EQ(Render(Current_Sheet), small.cells);
    }
}

TEST_F(TSS_Files, Old_Versions_Come_Back_In_The_New_One)
{
    for (const std::int32_t version : {0, 1, 2})
        for (const Small_File& small : Small_Files(version)) {
            SCOPED_TRACE(small.what);
            ASSERT_NE(Read(Written(Read(Encode(small.items)))), nullptr);
            EXPECT_EQ(Render(Current_Sheet), small.cells);
            EXPECT_EQ(Current_Sheet->format_version, 3);
        }
}

/// All kinds of files that there are, and one with all records.
std::vector<Items> All_Kinds()
{
    std::vector<Items> kinds;
    for (const std::int32_t version : {0, 1, 2, 3})
        for (const Small_File& small : Small_Files(version))
            kinds.push_back(small.items);
    const Items text_block = Of(4, 2, "a", "b");
    kinds.push_back(With_Records({
        {1, Of(1, Raw{std::string(16, 'x')}, 1, "mark")},
        {2, Of(text_block, "-d", text_block)},
        {3, text_block},
        {5, Of(2, 0, "p", 1, "x", 4, "q")},
        {6, Of(0, 0, 0, 0)},
        {9, Of(1, 1, 2, 1, 0.0, 0, 1, 0.0, 0, 1, 0.0, 0)},
        {10, Of(1, 2, 0.0, 1.0)},
        {11, Of("EXCEL", "s", "a1:b2", "", 1, 0, 0, 0, 0)},
        {12, Of(1, 2, 1, 0, 0.0, 1.0, 0.5)},
        {15, Of(2)},
        {16, Of(1, "r", 3, Raw{"\5"})},
        {18, Of("Page")},
        {20, Of(1, 1, 2)},
        {21, Of(1, 2, 2, 1, 3, 4, 2, 5, 6)},
        {22, Of(1, 1, 2, 1)},
        {23, Of(1, 2)},
        {24, Of(2, 2, 1, 1, 0, 3, 1, 2, 3)},
        {25, Items()},
        {27, Of(1, "s", 0.0, 1, 7, 0.0, 0.0)},
        {28, Of(1, 2, 3, 4)},
    }));
    Items trial =
        With_Records({{0, Of(0, 1, 1, 0, 0, 0, 0, "", "", "", "", "", "", Raw{std::string(24, 'x')}, 1)}});
    kinds.push_back(trial);
    return kinds;
}

TEST_F(TSS_Files, Cut_Anywhere_They_Give_What_Stood_In_Front)
{
    for (const Items& items : All_Kinds()) {
        const std::string bytes = Encode(items);
        for (std::size_t length = 0; length < bytes.size(); ++length)
            EXPECT_TRUE(Read(bytes.substr(0, length)) == nullptr || Current_Sheet->column_count > 0);
    }
}

/// Any number of a file may be a lie: what is read has to be sound, and to be written again.
TEST_F(TSS_Files, Every_Number_May_Lie)
{
    constexpr auto greatest = std::numeric_limits<std::int32_t>::max();
    constexpr auto least = std::numeric_limits<std::int32_t>::min();
    for (Items items : All_Kinds())
        for (auto& item : items)
            if (auto* const number = std::get_if<std::int32_t>(&item); number != nullptr) {
                const std::int32_t right = *number;
                for (const std::int32_t lie :
                     {-1, 0, 1, 5, 33, right + 1, right - 1, 65536, greatest, least}) {
                    *number = lie;
                    Sheet* const sheet = Read(Encode(items));
                    if (sheet != nullptr && sheet->table_in_columns == 0)
                        Read(Written(sheet));
                }
                *number = right;
            } else if (auto* const real = std::get_if<double>(&item); real != nullptr) {
                const double right = *real;
                for (const double lie : {-1e308, -1e37, 0.5, 1e308, std::numeric_limits<double>::infinity(),
                                         std::numeric_limits<double>::quiet_NaN()}) {
                    *real = lie;
                    Read(Encode(items));
                }
                *real = right;
            }
}

}  // namespace

}  // namespace ingester

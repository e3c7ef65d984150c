// Reads and writes spreadsheet files, each in a request of its own.
#pragma once

#include "hostfiles/tss/tss.h"
#include "hostfiles/tss/tss_bytes.h"
#include "support/reader_fixture.h"

#include <sstream>

namespace ingester {

class TSS_Test : public Reader_Test {
protected:
    /// Reads bytes under the options that `prepare` sets; null when they were refused.
    static Sheet* Read(const std::string& bytes, const Change& prepare = {})
    {
        return Read_Bytes(Read_TSS, bytes, "small.tss", prepare);
    }
    static Sheet* Read(const Items& items, const Change& prepare = {})
    {
        return Read(Encode(items), prepare);
    }

    [[nodiscard]] std::string Written(Sheet* sheet) const
    {
        // Emptying a file makes some systems wait for the disk.
        std::filesystem::remove(Path("written.tss"));
        EXPECT_TRUE(Write_TSS_File(sheet, Path("written.tss").c_str()));
        return Get("written.tss");
    }
};

inline const Column& Col(std::int32_t index)
{
    return *Column_At(Current_Sheet, index);
}

/// Values with a blank between.
template <class... Values> std::string Text_Of(const Values&... values)
{
    std::ostringstream text;
    ((text << (text.tellp() > 0 ? " " : "") << values), ...);
    return text.str();
}

inline std::string Hex(const std::string& bytes)
{
    std::string text;
    for (const char c : bytes)
        text += "0123456789ABCDEF"[(c >> 4) & 15], text += "0123456789ABCDEF"[c & 15];
    return text;
}

}  // namespace ingester

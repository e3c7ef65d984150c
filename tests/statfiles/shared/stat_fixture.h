// Files of statistics packages: what becomes of damaged ones, and Factors as texts.
#pragma once

#include "model/level_tables.h"
#include "support/items.h"
#include "support/reader_fixture.h"

#include <cstring>
#include <sstream>

namespace ingester {

/// The levels of a Factor, as "10=ten 20=twenty"; without values "a b".
inline std::string Levels_Of(const Sheet* sheet, std::int32_t index = 1)
{
    const Column& column = *Column_At(const_cast<Sheet*>(sheet), index);
    const std::vector<double> values = Level_Table(column);
    const std::vector<const char*> labels = Label_Table(column);
    std::ostringstream text;
    for (std::size_t i = 0; i < std::max(values.size(), labels.size()); ++i) {
        text << (i > 0 ? " " : "");
        if (i < values.size())
            text << values[i] << (labels.empty() ? "" : "=");
        if (i < labels.size())
            text << Text_Arena::View(labels[i]);
    }
    return text.str();
}

inline std::string Padded(std::string text, std::size_t width, char filler = ' ')
{
    text.resize(width, filler);
    return text;
}

class Stat_Test : public Reader_Test {
protected:
    /// Cut anywhere, and with any four bytes a number that is one too few, too many or without end, a file is
    /// read or refused, and the Sheet is sound.
    static void Damage(File_Reader read, const std::string& bytes, const char* name,
                       const Change& change = {})
    {
        for (std::size_t length = 0; length < bytes.size(); ++length)
            Read_Bytes(read, bytes.substr(0, length), name, change);
        constexpr std::int32_t numbers[] = {-2147483647 - 1, -1, 0, 1, 2, 255, 32767, 65536, 2147483647};
        for (std::size_t at = 0; at + 4 <= bytes.size(); ++at)
            for (const std::int32_t number : numbers)
                for (const std::endian order : {std::endian::little, std::endian::big}) {
                    std::string damaged = bytes;
                    damaged.replace(at, 4, Bytes_Of(number, order));
                    Read_Bytes(read, damaged, name, change);
                }
    }
};

inline void All_For_People()
{
    request.people.set();
    Use_Utf8_Text(true);
}

}  // namespace ingester

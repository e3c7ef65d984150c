// Records that only old files have: most are passed over.
#include "hostfiles/tss/dde_item.h"
#include "hostfiles/tss/tss_reader_extras.h"
#include "request/messages.h"

#include <algorithm>
#include <initializer_list>
#include <string>

namespace ingester {

namespace {

bool Read_At_Least(TSS_Source& source, std::initializer_list<std::int32_t> least)
{
    std::int32_t value;
    return std::ranges::all_of(least,
                               [&](std::int32_t limit) { return source.Read(value) && value >= limit; });
}

/// Texts of old records are no longer than their field, whatever length they state.
bool Skip_Limited_Texts(TSS_Source& source, std::initializer_list<std::int32_t> limits)
{
    std::int32_t length;
    return std::ranges::all_of(limits, [&](std::int32_t limit) {
        return source.Read_Count(length) && source.Skip(std::min(length, limit));
    });
}

}  // namespace

bool Read_Print_Block(TSS_Reading& reading)
{
    constexpr std::int64_t three_values = 24;
    constexpr std::int32_t most_entries = 25;
    constexpr std::int32_t longest_name = 10;
    TSS_Source& source = reading.source;
    std::int32_t entries;
    if (!Read_At_Least(source, {0, 1, 1, 0, 0, 0, 0})
        || !Skip_Limited_Texts(source, {90, 90, 1024, 60, 60, 60}) || !source.Skip(three_values)
        || !source.Read(entries) || entries < 1 || entries > most_entries)
        return false;
    for (std::int32_t i = 0; i <= entries; ++i) {
        std::int32_t length;
        if (!source.Read(length))
            return false;
        if (length < 0 || length > longest_name)
            return Fail("Trial column type's name is too long.\n");
        if (!source.Skip(length) || !Skip_Limited_Texts(source, {80, 200}))
            return false;
    }
    for (Column* column = reading.sheet->first_column->next; column != nullptr; column = column->next) {
        if (!Read_At_Least(source, {0, 0}) || !source.Skip(sizeof(double)) || !source.Skip_Text())
            return false;
        column->date_form = 1;
    }
    return true;
}

bool Read_Bookmarks(TSS_Reading& reading)
{
    constexpr std::int64_t place_size = 16;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read_Count(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t has_text;
        if (!source.Skip(place_size) || !source.Read(has_text) || (has_text > 0 && !source.Skip_Text()))
            return false;
    }
    return true;
}

bool Read_Ignored_Integers(TSS_Reading& reading)
{
    return reading.source.Skip(4 * sizeof(std::int32_t));
}

bool Read_Trial_Seasons(TSS_Reading& reading)
{
    constexpr std::int32_t longest_text = 40;
    constexpr std::int64_t number_size = 8;
    TSS_Source& source = reading.source;
    std::int32_t count;
    if (!source.Read_Count(count))
        return false;
    for (std::int32_t i = 0; i < count; ++i) {
        std::int32_t length;
        if (!source.Read(length) || length < 1 || length > longest_text || !source.Skip(length + number_size))
            return false;
    }
    // What is short from here on was never written whole.
    static_cast<void>(source.Read_Count(count) && source.Skip(std::int64_t{4} * count)
                      && source.Skip(2 * number_size));
    return true;
}

bool Read_DDE_Link(TSS_Reading& reading)
{
    Sheet& sheet = *reading.sheet;
    for (std::string* const text : {&sheet.dde_topic, &sheet.dde_source, &sheet.dde_item, &sheet.dde_extra}) {
        std::int32_t length;
        if (!reading.source.Read_Count(length))
            return false;
        if (length > Greatest_Text_Block)
            return Fail("Corrupt DDE Link in TSS file\n");
        if (!reading.source.Read_Letters(length, Greatest_Text_Block, *text))
            return false;
    }
    std::int32_t flag;
    for (std::int16_t& kept : sheet.dde_flags) {
        if (!reading.source.Read(flag))
            return false;
        kept = static_cast<std::int16_t>(flag);
    }
    if (Equal_Ignoring_Case(sheet.dde_topic, "EXCEL"))
        sheet.dde_item = R1C1_Item(sheet.dde_item);
    return reading.source.Read(flag);
}

}  // namespace ingester
